// Streams::Stream_TileSetCalibration reading a framed stream, with its round
// trip. Both records are replaced only as a whole, and every stream the
// reader accepts is written back byte for byte.

#include "record_target.hpp"

using namespace kvdata;

namespace {

// The two records that travel together in one stream.
struct TileSetWithCalibration {
  tTileSet set;
  tTileSetCalibration calibration;
  friend bool operator==(const TileSetWithCalibration&, const TileSetWithCalibration&) = default;
};

fuzz::RecordStream<TileSetWithCalibration> ops() {
  fuzz::RecordStream<TileSetWithCalibration> ops;
  ops.read = [](ByteArray& s, Long& p, TileSetWithCalibration& r) {
    return Streams::instance().Stream_TileSetCalibration(eStreamDirection::FromStream, s, p, r.set,
                                                         r.calibration);
  };
  ops.write = [](ByteArray& s, Long& p, TileSetWithCalibration& r) {
    return Streams::instance().Stream_TileSetCalibration(eStreamDirection::ToStream, s, p, r.set,
                                                         r.calibration);
  };
  ops.whole_or_nothing = true;
  ops.canonical = true;
  return ops;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  fuzz::quiet_event_log();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const fuzz::RecordStream<TileSetWithCalibration> kOps = ops();
  return fuzz::record_target(data, size, kOps);
}
