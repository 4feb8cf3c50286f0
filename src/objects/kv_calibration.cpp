#include "kvdata/objects/kv_calibration.hpp"

#include <algorithm>
#include <cassert>
#include <cstddef>
#include <new>
#include <string_view>

#include "automation/detail/failure.hpp"
#include "kvdata/automation/error.hpp"
#include "kvdata/automation/text.hpp"
#include "kvdata/foundation/record_fields.hpp"
#include "kvdata/objects/kv_cal_tile.hpp"
#include "kvdata/streams/stream_observer.hpp"
#include "kvdata/streams/streams.hpp"
#include "objects/detail/object_stream.hpp"
#include "objects/detail/property_names.hpp"
#include "objects/detail/record_image.hpp"
#include "streams/detail/block_layout.hpp"
#include "streams/detail/fixed_text.hpp"
#include "streams/detail/little_endian.hpp"
#include "streams/detail/observe.hpp"

namespace kvdata {
namespace {

// The calibration block, offsets from its start, multi-byte values little-endian:
//
//   0                  16  TSN, 8 UTF-16 code units
//   16                  8  date of certification (Date)
//   24                  4  TempCalibrated (Single)
//   28 + 320 (t - 1)  160  tile t (1 to 13): SCE, 40 Singles, band 1 first
//   188 + 320 (t - 1) 160  tile t: SCI, 40 Singles
constexpr auto kHeader = detail::block_layout<3>({
    detail::text_cell(field_name<&tTileSetCalibration::TSN>(), 8),
    detail::date_cell(field_name<&tTileSetCalibration::Certified>()),
    detail::single_cell(field_name<&tTileSetCalibration::TempCalibrated>()),
});
// One tile's slot, relative to its own start.
constexpr auto kSlot = detail::block_layout<2>({
    detail::singles_cell(*member_name(eSC::SCE), kBandCount),
    detail::singles_cell(*member_name(eSC::SCI), kBandCount),
});
constexpr const detail::Cell& kTSN = kHeader.at(field_name<&tTileSetCalibration::TSN>());
constexpr const detail::Cell& kCertified =
    kHeader.at(field_name<&tTileSetCalibration::Certified>());
constexpr const detail::Cell& kTempCalibrated =
    kHeader.at(field_name<&tTileSetCalibration::TempCalibrated>());
constexpr Integer kTileCount = 13;
constexpr std::size_t kBlockBytes = kHeader.bytes + kTileCount * kSlot.bytes;
static_assert(kSlot.bytes == Streams::kSCPairBytes && kBlockBytes == KVCalibration::kStreamBytes);

constexpr std::string_view kProperty = detail::property_name<KVCalibration>("v1Calibration");
constexpr std::string_view kTiles = field_name<&tTileSetCalibration::Tiles>();

bool is_tile_index(Integer idx) {
  return idx >= 1 && idx <= kTileCount;
}

// Offset of tile slot `idx`, 1 to 13.
constexpr std::size_t slot_offset(Long idx) {
  return kHeader.bytes + static_cast<std::size_t>(idx - 1) * kSlot.bytes;
}
static_assert(slot_offset(13) + kSlot.cells[1].offset + 39 * 4 == 4184);

void store_slot(std::span<Byte> block, Long idx, const tSCPair& pair) {
  const std::span<Byte> slot = block.subspan(slot_offset(idx), kSlot.bytes);
  for (Long sc = 0; sc <= 1; ++sc) {
    [[maybe_unused]] const bool inside =
        detail::store_le_run(slot, kSlot.cells[static_cast<std::size_t>(sc)].offset,
                             std::span<const Single>(pair.Spectrum(sc).Data));
    assert(inside);
  }
}

tSCPair load_slot(std::span<const Byte> block, Long idx) {
  const std::span<const Byte> slot = block.subspan(slot_offset(idx), kSlot.bytes);
  tSCPair pair;
  for (Long sc = 0; sc <= 1; ++sc) {
    [[maybe_unused]] const bool inside =
        detail::load_le_run(slot, kSlot.cells[static_cast<std::size_t>(sc)].offset,
                            std::span<Single>(pair.Spectrum(sc).Data));
    assert(inside);
  }
  return pair;
}

// Reports the block read from `present` (as many of its bytes as the
// stream held), starting at stream index `position`.
void observe_calibration(StreamObserver& observer, std::span<const Byte> present, Long position) {
  const detail::ObservedRecord property(&observer, kProperty);
  if (!detail::observe_block(observer, kHeader.cells, present, position)) return;
  for (Long idx = 1; idx <= kTileCount; ++idx) {
    const std::size_t offset = slot_offset(idx);
    const detail::ObservedRecord tile(&observer, kTiles, idx);
    const std::span<const Byte> slot =
        present.size() > offset ? present.subspan(offset) : std::span<const Byte>();
    if (!detail::observe_block(observer, kSlot.cells,
                               slot.first(std::min(slot.size(), kSlot.bytes)),
                               position + static_cast<Long>(offset))) {
      return;
    }
  }
}

}  // namespace

std::shared_ptr<KVCalibration> KVCalibration::create() {
  static_assert(std::tuple_size_v<decltype(block_)> == kBlockBytes);
  return std::shared_ptr<KVCalibration>(new KVCalibration());
}

void KVCalibration::v1Calibration(const tTileSetCalibration& value) {
  const detail::ObservedRecord property(stream_observer(), kProperty);
  detail::set_text_field(block_, kTSN, value.TSN);
  detail::set_field<Date>(block_, kCertified, value.Certified);
  detail::set_field<Single>(block_, kTempCalibrated, value.TempCalibrated);
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
  return detail::get_raw_text_field(block_, kTSN);
}

void KVCalibration::IKVCalibration_TSN(const String& value) {
  detail::set_text_field(block_, kTSN, value);
}

Date KVCalibration::IKVCalibration_DateCertified() const {
  return detail::get_field<Date>(block_, kCertified);
}

void KVCalibration::IKVCalibration_DateCertified(Date value) {
  detail::set_field<Date>(block_, kCertified, value);
}

Single KVCalibration::IKVCalibration_TempCalibrated() const {
  return detail::get_field<Single>(block_, kTempCalibrated);
}

void KVCalibration::IKVCalibration_TempCalibrated(Single value) {
  detail::set_field<Single>(block_, kTempCalibrated, value);
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
  const Long start = Position;
  const bool whole = detail::take_block(bytStream, Position, scratch);
  if (StreamObserver* const observer = stream_observer()) {
    const auto taken = static_cast<std::size_t>(static_cast<long long>(Position) - start);
    observe_calibration(*observer, std::span<const Byte>(scratch).first(taken), start);
  }
  if (!whole) return false;
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
