#include "kvdata/objects/kv_profile.hpp"

#include <array>
#include <bit>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

#include "kvdata/foundation/record_fields.hpp"
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

// The stamp that opens every profile stream; a reader refuses any other.
constexpr Single kStreamStamp = 1.4f;
static_assert(std::bit_cast<std::uint32_t>(kStreamStamp) == 0x3FB33333u);

// Room reserved after Position before the encoding is written.
constexpr Long kWorkingRoom = 2000;

// The value of `table` at geometry `sc` and band `WL`; error 9 outside SCE..SCI or 1..40.
Single& at(FixedArray<tSpectrum, 0, 1>& table, const eSC& sc, const Long& WL) {
  return table(sc).Data(WL);
}
const Single& at(const FixedArray<tSpectrum, 0, 1>& table, const eSC& sc, const Long& WL) {
  return table(sc).Data(WL);
}

using detail::property_name;

// The profile's properties hold the record stream's fields: the record and
// its ProfileData are no levels of their own, and each table is the
// correction property that holds it.
std::optional<std::string_view> property_of_record(std::string_view name) {
  if (name == detail::kProfileArgument || name == field_name<&tOVProfile::ProfileData>()) {
    return std::nullopt;
  }
  if (name == field_name<&tOVProfileDataV1::wCal>()) {
    return property_name<KVProfile>("WhiteCorrection");
  }
  if (name == field_name<&tOVProfileDataV1::wave>()) {
    return property_name<KVProfile>("WaveCorrection");
  }
  if (name == field_name<&tOVProfileDataV1::Linear>()) {
    return property_name<KVProfile>("LinearCorrection");
  }
  if (name == field_name<&tOVProfileDataV1::Dark>()) {
    return property_name<KVProfile>("DarkCorrection");
  }
  return name;
}

// The record reader only reads the stream; the record stream's signature
// takes it by plain reference for both directions.
bool read_profile_record(const ByteArray& stream, Long& position, tOVProfile& record) {
  return Streams::instance().Stream_Profile(eStreamDirection::FromStream,
                                            const_cast<ByteArray&>(stream), position, record);
}

}  // namespace

std::shared_ptr<KVProfile> KVProfile::create() {
  return std::shared_ptr<KVProfile>(new KVProfile());
}

// --- IKVStream ----------------------------------------------------------------

bool KVProfile::IKVStream_StreamOut(ByteArray& bytStream, Long& Position) {
  return write_stream(bytStream, Position);
}

bool KVProfile::write_stream(ByteArray& stream, Long& position) const {
  const auto room_end = detail::working_end(position, kWorkingRoom);
  if (!room_end) return false;
  detail::resize_stream(stream, *room_end);

  detail::FieldWriter head(stream, position);
  head.put_single(kStreamStamp).put_long(start_wl_).put_long(end_wl_).put_long(interval_);
  bool ok = head.ok();
  if (ok) {
    tOVProfile record{isn_, created_, validated_, Variant(tables_)};
    ok = Streams::instance().Stream_Profile(eStreamDirection::ToStream, stream, position, record);
  }
  if (ok) {
    // Band-width values after a record that failed would land at a Position
    // the reader never reaches, so they are written only after a whole record.
    detail::FieldWriter tail(stream, position);
    for (const tSpectrum& spectrum : band_width_) tail.put_spectrum(spectrum);
    ok = tail.ok();
  }
  detail::resize_stream(stream, position);
  return ok;
}

bool KVProfile::IKVStream_StreamIn(const ByteArray& bytStream, Long& Position) {
  Single stamp = 0.0f;
  detail::FieldReader head(bytStream, Position);
  StreamObserver* const observer = head.observer();
  const Long stamp_at = Position;
  if (!head.get_single(stamp, stream_names::kStreamVersion).ok()) return false;
  if (stamp != kStreamStamp) {
    detail::refuse(observer, stamp_at, stream_names::kStreamVersion,
                   [&] { return detail::stamp_expected("profile", kStreamStamp, stamp); });
    return false;
  }

  if (!head.get_long(start_wl_, property_name<KVProfile>("StartWL"))
           .get_long(end_wl_, property_name<KVProfile>("EndWl"))
           .get_long(interval_, property_name<KVProfile>("Interval"))
           .ok()) {
    return false;
  }

  // The record starts from the object's own identity, so that a record
  // stream that stops early replaces only what it read.
  tOVProfile record{isn_, created_, validated_, Variant()};
  bool record_ok = false;
  if (observer == nullptr) {
    record_ok = read_profile_record(bytStream, Position, record);
  } else {
    detail::RenamingObserver as_properties(*observer, property_of_record);
    const ObservedStreams watch(as_properties);
    record_ok = read_profile_record(bytStream, Position, record);
  }
  isn_ = std::move(record.ISN);
  created_ = record.Created;
  validated_ = record.Validated;
  // Reading on after a failed record would take the band-width values from
  // the bytes of the correction tables.
  if (!record_ok) return false;
  const auto* tables = record.ProfileData.get_if<tOVProfileDataV1>();
  if (tables == nullptr) return false;
  tables_ = *tables;

  detail::FieldReader tail(bytStream, Position);
  const detail::ObservedRecord band_width(observer,
                                          property_name<KVProfile>("BandWidthCorrection"));
  for (const eSC sc : {eSC::SCE, eSC::SCI}) {
    tail.get_spectrum(band_width_(sc), detail::FieldReader::sc_name(sc));
  }
  return tail.ok();
}

Long KVProfile::IKVStream_StreamLen() const {
  ByteArray scratch;
  Long position = 0;
  static_cast<void>(write_stream(scratch, position));
  return position;
}

// --- IKVObj -------------------------------------------------------------------

String KVProfile::IKVObj_ObjType() const {
  return u"Profile";
}

String KVProfile::IKVObj_Description() const {
  return u"Profile";
}

Variant KVProfile::IKVObj_ID() const {
  return Variant(isn_);
}

Variant KVProfile::IKVObj_DateCreated() const {
  return Variant(created_);
}

// --- IKVProfile corrections ---------------------------------------------------

Single KVProfile::IKVProfile_WhiteCorrection(const eSC& sc, const Long& WL) const {
  return at(tables_.wCal, sc, WL);
}
void KVProfile::IKVProfile_WhiteCorrection(const eSC& sc, const Long& WL, const Single& value) {
  at(tables_.wCal, sc, WL) = value;
}

Single KVProfile::IKVProfile_WaveCorrection(const eSC& sc, const Long& WL) const {
  return at(tables_.wave, sc, WL);
}
void KVProfile::IKVProfile_WaveCorrection(const eSC& sc, const Long& WL, const Single& value) {
  at(tables_.wave, sc, WL) = value;
}

Single KVProfile::IKVProfile_LinearCorrection(const eSC& sc, const Long& WL) const {
  return at(tables_.Linear, sc, WL);
}
void KVProfile::IKVProfile_LinearCorrection(const eSC& sc, const Long& WL, const Single& value) {
  at(tables_.Linear, sc, WL) = value;
}

Single KVProfile::IKVProfile_DarkCorrection(const eSC& sc, const Long& WL) const {
  return at(tables_.Dark, sc, WL);
}
void KVProfile::IKVProfile_DarkCorrection(const eSC& sc, const Long& WL, const Single& value) {
  at(tables_.Dark, sc, WL) = value;
}

Single KVProfile::IKVProfile_BandWidthCorrection(const eSC& sc, const Long& WL) const {
  return at(band_width_, sc, WL);
}
void KVProfile::IKVProfile_BandWidthCorrection(const eSC& sc, const Long& WL, const Single& value) {
  at(band_width_, sc, WL) = value;
}

}  // namespace kvdata
