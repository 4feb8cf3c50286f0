#include "kvdata/objects/kv_test_run.hpp"

#include <bit>
#include <cstdint>
#include <optional>
#include <string_view>
#include <utility>

#include "kvdata/streams/stream_observer.hpp"
#include "kvdata/streams/streams.hpp"
#include "objects/detail/object_stream.hpp"
#include "objects/detail/property_names.hpp"
#include "objects/detail/working_room.hpp"
#include "streams/detail/checked_codec.hpp"
#include "streams/detail/field_cursor.hpp"
#include "streams/detail/observe.hpp"
#include "streams/detail/record_streams.hpp"

namespace kvdata {
namespace {

// The version a new run writes, 1.4, has the image 33 33 B3 3F.
static_assert(std::bit_cast<std::uint32_t>(1.4f) == 0x3FB33333u);

// Room reserved after Position before the encoding is written.
constexpr Long kWorkingRoom = 20000;

// The encoding of StreamOut. The record stream's writer only reads `record`;
// its signature takes it by plain reference for both directions.
bool write_test_run_stream(Single version, tTestRun1& record, const String& light_level_data,
                           ByteArray& stream, Long& position) {
  const auto room_end = detail::working_end(position, kWorkingRoom);
  if (!room_end) return false;
  detail::resize_stream(stream, *room_end);

  bool ok = checked::write_single(version, stream, position);
  if (ok) {
    ok = Streams::instance().Stream_TestRun(eStreamDirection::ToStream, stream, position, record);
  }
  if (ok) ok = checked::write_string(light_level_data, stream, position);
  detail::resize_stream(stream, position);
  return ok;
}

// The run's v1TestRun property holds the record stream's record.
std::optional<std::string_view> property_of_record(std::string_view name) {
  if (name == detail::kTestRunArgument) return detail::property_name<KVTestRun>("v1TestRun");
  return name;
}

// The record reader only reads the stream; the record stream's signature
// takes it by plain reference for both directions.
bool read_test_run_record(const ByteArray& stream, Long& position, tTestRun1& record) {
  return Streams::instance().Stream_TestRun(eStreamDirection::FromStream,
                                            const_cast<ByteArray&>(stream), position, record);
}

}  // namespace

std::shared_ptr<KVTestRun> KVTestRun::create() {
  return std::shared_ptr<KVTestRun>(new KVTestRun());
}

// --- IKVObj -------------------------------------------------------------------

String KVTestRun::IKVObj_ObjType() const {
  return u"TestRun";
}

String KVTestRun::IKVObj_Description() const {
  return u"Test Run";
}

Variant KVTestRun::IKVObj_ID() const {
  return Variant(record_.ISN);
}

Variant KVTestRun::IKVObj_DateCreated() const {
  return Variant(record_.TestDate);
}

// --- IKVStream ----------------------------------------------------------------

bool KVTestRun::IKVStream_StreamOut(ByteArray& bytStream, Long& Position) {
  return write_test_run_stream(version_, record_, light_level_data_, bytStream, Position);
}

bool KVTestRun::IKVStream_StreamIn(const ByteArray& bytStream, Long& Position) {
  if (Position < 0) return false;
  detail::FieldReader head(bytStream, Position);
  StreamObserver* const observer = head.observer();
  if (!head.get_single(version_, detail::property_name<KVTestRun>("StreamVersion")).ok()) {
    return false;
  }
  bool record_ok = false;
  if (observer == nullptr) {
    record_ok = read_test_run_record(bytStream, Position, record_);
  } else {
    detail::RenamingObserver as_property(*observer, property_of_record);
    const ObservedStreams watch(as_property);
    record_ok = read_test_run_record(bytStream, Position, record_);
  }
  if (!record_ok) return false;
  // Read aside so that a text that cannot be read leaves the old one in place.
  String text;
  detail::FieldReader tail(bytStream, Position);
  if (!tail.get_string(text, detail::property_name<KVTestRun>("LightLevelData")).ok()) {
    return false;
  }
  light_level_data_ = std::move(text);
  return true;
}

Long KVTestRun::IKVStream_StreamLen() const {
  tTestRun1 record = record_;
  ByteArray scratch;
  Long position = 0;
  static_cast<void>(write_test_run_stream(version_, record, light_level_data_, scratch, position));
  return position;
}

}  // namespace kvdata
