#include "kvdata/objects/kv_calibration.hpp"

#include <cstddef>

#include "automation/detail/failure.hpp"
#include "kvdata/automation/error.hpp"
#include "kvdata/automation/text.hpp"
#include "kvdata/objects/kv_cal_tile.hpp"
#include "objects/detail/object_stream.hpp"
#include "objects/detail/record_image.hpp"
#include "streams/detail/fixed_text.hpp"
#include "streams/detail/little_endian.hpp"

namespace kvdata {
namespace {

// The calibration block, offsets from its start, multi-byte values little-endian:
//
//   0                  16  TSN, 8 UTF-16 code units
//   16                  8  date of certification (Date)
//   24                  4  TempCalibrated (Single)
//   28 + 320 (t - 1)  160  tile t (1 to 13): SCE, 40 Singles, band 1 first
//   188 + 320 (t - 1) 160  tile t: SCI, 40 Singles
using detail::kWireWidth;
constexpr std::size_t kTSNOffset = 0;
constexpr std::size_t kTSNUnits = 8;
constexpr std::size_t kCertifiedOffset = 16;
constexpr std::size_t kTempCalibratedOffset = 24;
constexpr std::size_t kTilesOffset = 28;
constexpr std::size_t kSpectrumBytes = static_cast<std::size_t>(kBandCount) * kWireWidth<Single>;
constexpr std::size_t kSlotBytes = 2 * kSpectrumBytes;
constexpr Integer kTileCount = 13;
constexpr std::size_t kBlockBytes = kTilesOffset + kTileCount * kSlotBytes;
static_assert(kCertifiedOffset == kTSNOffset + detail::text_bytes(kTSNUnits));
static_assert(kTempCalibratedOffset == kCertifiedOffset + kWireWidth<Date>);
static_assert(kTilesOffset == kTempCalibratedOffset + kWireWidth<Single>);
static_assert(kSlotBytes == 320 && kBlockBytes == 4188);

bool is_tile_index(Integer idx) {
  return idx >= 1 && idx <= kTileCount;
}

// Offset of value (sc, band) of tile slot `idx`, 1 to 13.
constexpr std::size_t value_offset(Long idx, Long sc, Long band) {
  return kTilesOffset + static_cast<std::size_t>(idx - 1) * kSlotBytes +
         static_cast<std::size_t>(sc) * kSpectrumBytes +
         static_cast<std::size_t>(band - 1) * kWireWidth<Single>;
}
static_assert(value_offset(13, 1, 40) == 4184);

void store_slot(std::span<Byte> block, Long idx, const tSCPair& pair) {
  for (Long sc = 0; sc <= 1; ++sc) {
    for (Long band = 1; band <= kBandCount; ++band) {
      detail::set_field<Single>(block, value_offset(idx, sc, band), pair.Spectrum(sc).Data(band));
    }
  }
}

tSCPair load_slot(std::span<const Byte> block, Long idx) {
  tSCPair pair;
  for (Long sc = 0; sc <= 1; ++sc) {
    for (Long band = 1; band <= kBandCount; ++band) {
      pair.Spectrum(sc).Data(band) = detail::get_field<Single>(block, value_offset(idx, sc, band));
    }
  }
  return pair;
}

}  // namespace

std::shared_ptr<KVCalibration> KVCalibration::create() {
  static_assert(std::tuple_size_v<decltype(block_)> == kBlockBytes);
  return std::shared_ptr<KVCalibration>(new KVCalibration());
}

void KVCalibration::v1Calibration(const tTileSetCalibration& value) {
  detail::set_text_field(block_, kTSNOffset, kTSNUnits, value.TSN);
  detail::set_field<Date>(block_, kCertifiedOffset, value.Certified);
  detail::set_field<Single>(block_, kTempCalibratedOffset, value.TempCalibrated);
  for (Integer idx = 1; idx <= kTileCount; ++idx) {
    store_slot(block_, idx, value.Tiles(idx));  // error 9 at the first index missing
  }
}

tTileSetCalibration KVCalibration::v1Calibration() const {
  tTileSetCalibration record;
  record.TSN = trim_blanks(IKVCalibration_TSN());
  record.Certified = IKVCalibration_DateCertified();
  record.TempCalibrated = IKVCalibration_TempCalibrated();
  record.Tiles.redim(1, kTileCount);
  for (Integer idx = 1; idx <= kTileCount; ++idx) record.Tiles(idx) = load_slot(block_, idx);
  return record;
}

String KVCalibration::IKVObj_ObjType() const {
  return u"Calibration";
}
String KVCalibration::IKVObj_Description() const {
  return u"Tile Set Calibration";
}
Variant KVCalibration::IKVObj_ID() const {
  return Variant(IKVCalibration_TSN());
}
Variant KVCalibration::IKVObj_DateCreated() const {
  return Variant(IKVCalibration_DateCertified());
}

String KVCalibration::IKVCalibration_TSN() const {
  return detail::get_raw_text_field(block_, kTSNOffset, kTSNUnits);
}

void KVCalibration::IKVCalibration_TSN(const String& value) {
  detail::set_text_field(block_, kTSNOffset, kTSNUnits, value);
}

Date KVCalibration::IKVCalibration_DateCertified() const {
  return detail::get_field<Date>(block_, kCertifiedOffset);
}

void KVCalibration::IKVCalibration_DateCertified(Date value) {
  detail::set_field<Date>(block_, kCertifiedOffset, value);
}

Single KVCalibration::IKVCalibration_TempCalibrated() const {
  return detail::get_field<Single>(block_, kTempCalibratedOffset);
}

void KVCalibration::IKVCalibration_TempCalibrated(Single value) {
  detail::set_field<Single>(block_, kTempCalibratedOffset, value);
}

void KVCalibration::IKVCalibration_Tiles(Integer idx, const std::shared_ptr<IKVCalTile>& tile) {
  if (!tile) raise(kObjectNotSet);
  const auto source = std::dynamic_pointer_cast<KVCalTile>(tile);
  if (!source) raise(kTypeMismatch);
  if (!is_tile_index(idx)) return;
  store_slot(block_, idx, source->v1Tile());
}

std::shared_ptr<IKVCalTile> KVCalibration::IKVCalibration_Tiles(Integer idx) {
  auto tile = KVCalTile::create();
  if (is_tile_index(idx)) tile->v1Tile(load_slot(block_, idx));
  tile->set_parent(std::dynamic_pointer_cast<IKVCalibration>(shared_from_this()));
  // With the parent set, this stores the unchanged tile back into its slot.
  tile->Order(idx);
  return tile;
}

bool KVCalibration::IKVStream_StreamIn(const ByteArray& bytStream, Long& Position) {
  std::array<Byte, kBlockBytes> scratch{};
  if (!detail::take_block(bytStream, Position, scratch)) return false;
  block_ = scratch;
  return true;
}

bool KVCalibration::IKVStream_StreamOut(ByteArray& bytStream, Long& Position) {
  return detail::false_on_failure([&] {
    if (Position < 0) return false;  // before any array a writer makes
    detail::resize_stream(bytStream, detail::index_after(Position, kBlockBytes));
    return detail::put_block(bytStream, Position, block_);
  });
}

Long KVCalibration::IKVStream_StreamLen() const {
  return static_cast<Long>(kBlockBytes);
}

}  // namespace kvdata
