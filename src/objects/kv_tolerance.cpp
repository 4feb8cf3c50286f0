#include "kvdata/objects/kv_tolerance.hpp"

#include <algorithm>
#include <string_view>

#include "kvdata/automation/error.hpp"
#include "objects/detail/object_stream.hpp"
#include "objects/detail/record_image.hpp"

namespace kvdata {
namespace {

// The record, as offsets into its byte image.
constexpr std::size_t kIdOffset = 0;
constexpr std::size_t kTolNameOffset = 4;
constexpr std::size_t kTolNameUnits = 50;
constexpr std::size_t kDescriptionOffset = 104;
constexpr std::size_t kDescriptionUnits = 255;
constexpr std::size_t kGapOffset = 614;  // alignment gap, 2 bytes
constexpr std::size_t kMinFailOffset = 616;
constexpr std::size_t kMinWarnOffset = 624;
constexpr std::size_t kMaxWarnOffset = 632;
constexpr std::size_t kMaxFailOffset = 640;
constexpr std::size_t kMiscOffset = 648;
constexpr std::size_t kMiscUnits = 50;

static_assert(kTolNameOffset == kIdOffset + 4);
static_assert(kDescriptionOffset == kTolNameOffset + 2 * kTolNameUnits);
static_assert(kGapOffset == kDescriptionOffset + 2 * kDescriptionUnits);
static_assert(kMinFailOffset == kGapOffset + 2);
static_assert(kMiscOffset == kMaxFailOffset + 8);
static_assert(kMiscOffset + 2 * kMiscUnits == KVTolerance::kRecordBytes);

// Steps of StreamOut, named in the error it raises.
constexpr std::u16string_view kStepConvert = u"converting tolerance to an array";
constexpr std::u16string_view kStepReallocate = u"reallocating stream";
constexpr std::u16string_view kStepCopy = u"copying tolerance to stream";

}  // namespace

std::shared_ptr<KVTolerance> KVTolerance::create() {
  return std::make_shared<KVTolerance>();
}

bool KVTolerance::IKVStream_StreamOut(ByteArray& bytStream, Long& Position) {
  std::u16string_view step = kStepConvert;
  try {
    std::array<Byte, kStreamBytes> image{};  // the trailing byte stays 0
    std::copy(record_.begin(), record_.end(), image.begin());

    step = kStepReallocate;
    detail::grow_stream(bytStream, detail::index_after(Position, kStreamBytes));

    step = kStepCopy;
    if (!detail::put_block(bytStream, Position, image)) raise(kSubscriptOutOfRange);
    return true;
  } catch (const Error& e) {
    String text = u"Error ";
    text += step;
    text += u" while streaming out tolerance: ";
    text += e.description();
    raise(e.number(), e.source(), std::move(text));
  }
}

bool KVTolerance::IKVStream_StreamIn(const ByteArray& bytStream, Long& Position) {
  std::array<Byte, kStreamBytes> image{};
  if (!detail::take_block(bytStream, Position, image)) return false;
  std::copy_n(image.begin(), kRecordBytes, record_.begin());
  return true;
}

Long KVTolerance::IKVStream_StreamLen() const {
  return static_cast<Long>(kRecordBytes);
}

Long KVTolerance::IKVTolerance_ID() const {
  return detail::get_field<Long>(record_, kIdOffset);
}
void KVTolerance::IKVTolerance_ID(Long value) {
  detail::set_field(record_, kIdOffset, value);
}

String KVTolerance::IKVTolerance_TolName() const {
  return detail::get_text_field(record_, kTolNameOffset, kTolNameUnits);
}
void KVTolerance::IKVTolerance_TolName(const String& value) {
  detail::set_text_field(record_, kTolNameOffset, kTolNameUnits, value);
}

String KVTolerance::IKVTolerance_Description() const {
  return detail::get_text_field(record_, kDescriptionOffset, kDescriptionUnits);
}
void KVTolerance::IKVTolerance_Description(const String& value) {
  detail::set_text_field(record_, kDescriptionOffset, kDescriptionUnits, value);
}

Double KVTolerance::IKVTolerance_MinFail() const {
  return detail::get_field<Double>(record_, kMinFailOffset);
}
void KVTolerance::IKVTolerance_MinFail(Double value) {
  detail::set_field(record_, kMinFailOffset, value);
}

Double KVTolerance::IKVTolerance_MinWarn() const {
  return detail::get_field<Double>(record_, kMinWarnOffset);
}
void KVTolerance::IKVTolerance_MinWarn(Double value) {
  detail::set_field(record_, kMinWarnOffset, value);
}

Double KVTolerance::IKVTolerance_MaxWarn() const {
  return detail::get_field<Double>(record_, kMaxWarnOffset);
}
void KVTolerance::IKVTolerance_MaxWarn(Double value) {
  detail::set_field(record_, kMaxWarnOffset, value);
}

Double KVTolerance::IKVTolerance_MaxFail() const {
  return detail::get_field<Double>(record_, kMaxFailOffset);
}
void KVTolerance::IKVTolerance_MaxFail(Double value) {
  detail::set_field(record_, kMaxFailOffset, value);
}

String KVTolerance::IKVTolerance_Misc() const {
  return detail::get_text_field(record_, kMiscOffset, kMiscUnits);
}
void KVTolerance::IKVTolerance_Misc(const String& value) {
  detail::set_text_field(record_, kMiscOffset, kMiscUnits, value);
}

}  // namespace kvdata
