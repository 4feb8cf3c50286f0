// Streams: creation, the predeclared instance and the dispatch of every
// Stream_ operation to its writer or reader. Each public operation traps its
// failures here, at one boundary, and answers False.

#include "kvdata/streams/streams.hpp"

#include "automation/detail/failure.hpp"
#include "streams/detail/record_streams.hpp"

namespace kvdata {
namespace {

// ToStream runs the writer, FromStream the reader; any other Direction
// does nothing and answers False.
template <class Write, class Read>
bool dispatch(const eStreamDirection& direction, const Write& write, const Read& read) {
  return detail::false_on_failure([&] {
    switch (direction) {
      case eStreamDirection::ToStream:
        return write();
      case eStreamDirection::FromStream:
        return read();
    }
    return false;
  });
}

}  // namespace

std::shared_ptr<Streams> Streams::create() {
  return std::shared_ptr<Streams>(new Streams());
}

Streams& Streams::instance() {
  static const std::shared_ptr<Streams> predeclared = create();
  return *predeclared;
}

bool Streams::Stream_SCPair(const eStreamDirection& Direction, ByteArray& Stream, Long& Position,
                            tSCPair& SCP) {
  return dispatch(
      Direction, [&] { return detail::write_sc_pair(SCP, Stream, Position); },
      [&] { return detail::read_sc_pair(Stream, Position, SCP); });
}

bool Streams::Stream_TileSetCalibration(const eStreamDirection& Direction, ByteArray& Stream,
                                        Long& Position, tTileSet& TS, tTileSetCalibration& TSC) {
  return dispatch(
      Direction, [&] { return detail::write_tile_set_calibration(TS, TSC, Stream, Position); },
      [&] { return detail::read_tile_set_calibration(Stream, Position, TS, TSC); });
}

bool Streams::Stream_Profile(const eStreamDirection& Direction, ByteArray& Stream, Long& Position,
                             tOVProfile& pro) {
  return dispatch(
      Direction, [&] { return detail::write_profile(pro, Stream, Position); },
      [&] { return detail::read_profile(Stream, Position, pro); });
}

bool Streams::Stream_Station(const eStreamDirection& Direction, ByteArray& Stream, Long& Position,
                             tStation& Station) {
  return dispatch(
      Direction, [&] { return detail::write_station(Station, Stream, Position); },
      [&] { return detail::read_station(Stream, Position, Station); });
}

bool Streams::Stream_TestRun(const eStreamDirection& Direction, ByteArray& Stream, Long& Position,
                             tTestRun1& TR) {
  return dispatch(
      Direction, [&] { return detail::write_test_run(TR, Stream, Position); },
      [&] { return detail::read_test_run(Stream, Position, TR); });
}

bool Streams::Stream_User(const eStreamDirection& Direction, ByteArray& Stream, Long& Position,
                          tUser& User) {
  return dispatch(
      Direction, [&] { return detail::write_user_block(User, Stream, Position); },
      [&] { return detail::read_user_block(Stream, Position, User); });
}

bool Streams::Stream_Organization(const eStreamDirection& Direction, ByteArray& Stream,
                                  Long& Position, tOrganization& Org) {
  return dispatch(
      Direction, [&] { return StreamOrgTo(Org, Stream, Position); },
      [&] { return StreamOrgFrom(Org, Stream, Position); });
}

bool Streams::StreamOrgTo(const tOrganization& Org, ByteArray& Stream, Long& Position) {
  return detail::false_on_failure(
      [&] { return detail::write_organization_block(Org, Stream, Position); });
}

bool Streams::StreamOrgFrom(tOrganization& Org, const ByteArray& Stream, Long& Position) {
  return detail::false_on_failure(
      [&] { return detail::read_organization_block(Stream, Position, Org); });
}

}  // namespace kvdata
