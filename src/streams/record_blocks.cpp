// The two fixed-size record blocks: users (261 bytes) and organisations (133
// bytes). Each is the image of a flat record with fixed-width UTF-16 text,
// built in a local buffer and then copied into the stream at Position.

#include <algorithm>
#include <array>
#include <cstddef>
#include <span>
#include <utility>

#include "kvdata/foundation/record_fields.hpp"
#include "kvdata/streams/stream_observer.hpp"
#include "streams/detail/block_layout.hpp"
#include "streams/detail/fixed_text.hpp"
#include "streams/detail/little_endian.hpp"
#include "streams/detail/observe.hpp"
#include "streams/detail/record_streams.hpp"

namespace kvdata::detail {
namespace {

// The flat user image. Only its first 261 bytes travel: the high byte of
// RoleCode and the whole of Disabled are left out.
constexpr auto kUserImage = block_layout<9>({
    text_cell(field_name<&tUser::USERID>(), 8),
    long_cell(field_name<&tUser::UserNumber>()),
    text_cell(field_name<&tUser::LastName>(), 30),
    text_cell(field_name<&tUser::FirstName>(), 30),
    text_cell(field_name<&tUser::UserPWD>(), 8),
    text_cell(field_name<&tUser::UserMail>(), 50),
    long_cell(field_name<&tUser::OrgID>()),
    text_cell(field_name<&tUser::RoleCode>(), 1),
    text_cell(field_name<&tUser::Disabled>(), 1),
});
constexpr const Cell& kRoleCode = kUserImage.at(field_name<&tUser::RoleCode>());
static_assert(kUserImage.bytes == 264);
static_assert(kUserStreamBlockBytes == kRoleCode.offset + 1);
// The cells that travel whole: all before RoleCode.
constexpr std::span<const Cell> kUserWholeCells = std::span(kUserImage.cells).first(7);
static_assert(kUserWholeCells.back().offset + kUserWholeCells.back().bytes() == kRoleCode.offset);

// The organisation block; its last three bytes are zero.
constexpr auto kOrganizationBlock = block_layout<7>({
    long_cell(field_name<&tOrganization::ID>()),
    text_cell(field_name<&tOrganization::Organization>(), 50),
    long_cell(field_name<&tOrganization::ParentOrgID>()),
    long_cell(field_name<&tOrganization::RootOrgID>()),
    text_cell(field_name<&tOrganization::Alias>(), 8),
    text_cell(field_name<&tOrganization::Avail>(), 1),
    gap_cell(stream_names::kZeroBytes, 3),
});
static_assert(kOrganizationBlock.bytes == kOrganizationBlockBytes);

// Bytes of a block that fit in the stream from Position on, capped so that
// Position + count stays a Long.
std::size_t room_for(const ByteArray& stream, Long position, std::size_t block) {
  const std::size_t room = std::min(bytes_from(stream, position), block);
  return std::min(room, static_cast<std::size_t>(static_cast<long long>(kLongMax) - position));
}

// Copies as much of `block` as fits from Position on, without growing the
// stream, and moves Position past it. True when the whole block fit.
bool copy_out(std::span<const Byte> block, ByteArray& stream, Long& position) {
  const std::size_t n = room_for(stream, position, block.size());
  if (n > 0) {
    const auto target = window(stream, position, n);
    if (!target || !store_bytes(*target, 0, block.first(n))) return false;
    position += static_cast<Long>(n);
  }
  return n == block.size();
}

// Fills `block` (zeroed beforehand) from Position on with as many bytes as
// the stream holds and moves Position past them. True when the whole block
// was read.
bool copy_in(const ByteArray& stream, Long& position, std::span<Byte> block) {
  const std::size_t n = room_for(stream, position, block.size());
  if (n > 0) {
    const auto source = window(stream, position, n);
    if (!source || !store_bytes(block, 0, *source)) return false;
    position += static_cast<Long>(n);
  }
  return n == block.size();
}

// Reports the user block read from `present` (as many of its 261 bytes as
// the stream held): the whole cells, then the one byte of RoleCode.
void observe_user_block(StreamObserver& observer, std::span<const Byte> present, Long position) {
  if (!observe_block(observer, kUserWholeCells, present, position)) return;
  const Long at = position + static_cast<Long>(kRoleCode.offset);
  if (present.size() <= kRoleCode.offset) {
    refuse(&observer, at, kRoleCode.name,
           [] { return "the low byte of RoleCode's one code unit: " + shortfall(1, 0); });
    return;
  }
  const String unit(1, static_cast<char16_t>(present[kRoleCode.offset]));
  report(&observer, kRoleCode.name, at, 1, std::u16string_view(unit), std::nullopt, 1);
}

}  // namespace

bool write_user_block(const tUser& user, ByteArray& stream, Long& position) {
  StreamObserver* const observer = stream_observer();
  const ObservedRecord record(observer, kUserArgument);
  std::array<Byte, kUserImage.bytes> image{};
  const std::span<Byte> out(image);
  // The whole cells are reported as they are stored; of RoleCode only the
  // low byte travels, so it is reported with the one byte it takes (a
  // watcher can tell a unit above U+00FF would be lost); Disabled does not
  // travel and is stored unreported.
  const std::span<const Cell> cells(kUserImage.cells);
  if (!store_fields(user, kUserWholeCells, out, observer, position) ||
      !store_fields(user, cells.subspan(kUserWholeCells.size()), out)) {
    return false;
  }
  report(observer, kRoleCode.name, position + static_cast<Long>(kRoleCode.offset), 1,
         std::u16string_view(user.RoleCode), std::nullopt, kRoleCode.count);
  return copy_out(out.first(kUserStreamBlockBytes), stream, position);
}

bool read_user_block(const ByteArray& stream, Long& position, tUser& user) {
  StreamObserver* const observer = stream_observer();
  const ObservedRecord record(observer, kUserArgument);
  std::array<Byte, kUserImage.bytes> image{};  // bytes past the block stay zero
  const Long start = position;
  const bool whole = copy_in(stream, position, std::span<Byte>(image).first(kUserStreamBlockBytes));
  if (observer != nullptr) {
    const auto taken = static_cast<std::size_t>(static_cast<long long>(position) - start);
    observe_user_block(*observer, std::span<const Byte>(image).first(taken), start);
  }
  if (!whole) return false;
  tUser fresh;
  if (!load_fields(image, kUserImage.cells, fresh)) return false;
  user = std::move(fresh);
  return true;
}

bool write_organization_block(const tOrganization& org, ByteArray& stream, Long& position) {
  StreamObserver* const observer = stream_observer();
  const ObservedRecord record(observer, kOrganizationArgument);
  std::array<Byte, kOrganizationBlock.bytes> block{};  // the padding stays zero
  if (!store_fields(org, kOrganizationBlock.cells, block, observer, position)) return false;
  return copy_out(block, stream, position);
}

bool read_organization_block(const ByteArray& stream, Long& position, tOrganization& org) {
  StreamObserver* const observer = stream_observer();
  const ObservedRecord record(observer, kOrganizationArgument);
  std::array<Byte, kOrganizationBlock.bytes> block{};
  const Long start = position;
  const bool whole = copy_in(stream, position, block);
  if (observer != nullptr) {
    const auto taken = static_cast<std::size_t>(static_cast<long long>(position) - start);
    static_cast<void>(observe_block(*observer, kOrganizationBlock.cells,
                                    std::span<const Byte>(block).first(taken), start));
  }
  if (!whole) return false;
  tOrganization fresh;
  if (!load_fields(block, kOrganizationBlock.cells, fresh)) return false;
  org = std::move(fresh);
  return true;
}

}  // namespace kvdata::detail
