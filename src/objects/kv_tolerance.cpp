#include "kvdata/objects/kv_tolerance.hpp"

#include <algorithm>
#include <string_view>

#include "kvdata/automation/error.hpp"
#include "kvdata/streams/stream_observer.hpp"
#include "objects/detail/object_stream.hpp"
#include "objects/detail/property_names.hpp"
#include "objects/detail/record_image.hpp"
#include "streams/detail/block_layout.hpp"

namespace kvdata {
namespace {

using detail::property_name;

// The record's byte image, and the byte the stream carries after it.
constexpr auto kStreamLayout = detail::block_layout<10>({
    detail::long_cell(property_name<KVTolerance>("ID")),
    detail::text_cell(property_name<KVTolerance>("TolName"), 50),
    detail::text_cell(property_name<KVTolerance>("Description"), 255),
    detail::gap_cell(stream_names::kAlignmentGap, 2),
    detail::double_cell(property_name<KVTolerance>("MinFail")),
    detail::double_cell(property_name<KVTolerance>("MinWarn")),
    detail::double_cell(property_name<KVTolerance>("MaxWarn")),
    detail::double_cell(property_name<KVTolerance>("MaxFail")),
    detail::text_cell(property_name<KVTolerance>("Misc"), 50),
    detail::gap_cell(stream_names::kTrailingByte, 1),
});
static_assert(kStreamLayout.bytes == KVTolerance::kStreamBytes);
static_assert(kStreamLayout.at(stream_names::kTrailingByte).offset == KVTolerance::kRecordBytes);

constexpr const detail::Cell& kId = kStreamLayout.at("ID");
constexpr const detail::Cell& kTolName = kStreamLayout.at("TolName");
constexpr const detail::Cell& kDescription = kStreamLayout.at("Description");
constexpr const detail::Cell& kMinFail = kStreamLayout.at("MinFail");
constexpr const detail::Cell& kMinWarn = kStreamLayout.at("MinWarn");
constexpr const detail::Cell& kMaxWarn = kStreamLayout.at("MaxWarn");
constexpr const detail::Cell& kMaxFail = kStreamLayout.at("MaxFail");
constexpr const detail::Cell& kMisc = kStreamLayout.at("Misc");

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
  const Long start = Position;
  const bool whole = detail::take_block(bytStream, Position, image);
  if (StreamObserver* const observer = stream_observer()) {
    const auto taken = static_cast<std::size_t>(static_cast<long long>(Position) - start);
    static_cast<void>(detail::observe_block(*observer, kStreamLayout.cells,
                                            std::span<const Byte>(image).first(taken), start));
  }
  if (!whole) return false;
  std::copy_n(image.begin(), kRecordBytes, record_.begin());
  return true;
}

Long KVTolerance::IKVStream_StreamLen() const {
  return static_cast<Long>(kRecordBytes);
}

Long KVTolerance::IKVTolerance_ID() const {
  return detail::get_field<Long>(record_, kId);
}
void KVTolerance::IKVTolerance_ID(Long value) {
  detail::set_field(record_, kId, value);
}

String KVTolerance::IKVTolerance_TolName() const {
  return detail::get_text_field(record_, kTolName);
}
void KVTolerance::IKVTolerance_TolName(const String& value) {
  detail::set_text_field(record_, kTolName, value);
}

String KVTolerance::IKVTolerance_Description() const {
  return detail::get_text_field(record_, kDescription);
}
void KVTolerance::IKVTolerance_Description(const String& value) {
  detail::set_text_field(record_, kDescription, value);
}

Double KVTolerance::IKVTolerance_MinFail() const {
  return detail::get_field<Double>(record_, kMinFail);
}
void KVTolerance::IKVTolerance_MinFail(Double value) {
  detail::set_field(record_, kMinFail, value);
}

Double KVTolerance::IKVTolerance_MinWarn() const {
  return detail::get_field<Double>(record_, kMinWarn);
}
void KVTolerance::IKVTolerance_MinWarn(Double value) {
  detail::set_field(record_, kMinWarn, value);
}

Double KVTolerance::IKVTolerance_MaxWarn() const {
  return detail::get_field<Double>(record_, kMaxWarn);
}
void KVTolerance::IKVTolerance_MaxWarn(Double value) {
  detail::set_field(record_, kMaxWarn, value);
}

Double KVTolerance::IKVTolerance_MaxFail() const {
  return detail::get_field<Double>(record_, kMaxFail);
}
void KVTolerance::IKVTolerance_MaxFail(Double value) {
  detail::set_field(record_, kMaxFail, value);
}

String KVTolerance::IKVTolerance_Misc() const {
  return detail::get_text_field(record_, kMisc);
}
void KVTolerance::IKVTolerance_Misc(const String& value) {
  detail::set_text_field(record_, kMisc, value);
}

}  // namespace kvdata
