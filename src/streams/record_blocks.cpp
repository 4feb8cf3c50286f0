// The two fixed-size record blocks: users (261 bytes) and organisations (133
// bytes). Each is the image of a flat record with fixed-width UTF-16 text,
// built in a local buffer and then copied into the stream at Position.

#include <algorithm>
#include <array>
#include <cstddef>
#include <span>
#include <utility>

#include "kvdata/automation/text.hpp"
#include "streams/detail/fixed_text.hpp"
#include "streams/detail/little_endian.hpp"
#include "streams/detail/record_streams.hpp"

namespace kvdata::detail {
namespace {

// The flat user image. Only its first 261 bytes travel: the high byte of
// RoleCode and the whole of Disabled are left out.
constexpr std::size_t kUserIdOffset = 0;
constexpr std::size_t kUserIdUnits = 8;
constexpr std::size_t kUserNumberOffset = 16;
constexpr std::size_t kLastNameOffset = 20;
constexpr std::size_t kLastNameUnits = 30;
constexpr std::size_t kFirstNameOffset = 80;
constexpr std::size_t kFirstNameUnits = 30;
constexpr std::size_t kUserPwdOffset = 140;
constexpr std::size_t kUserPwdUnits = 8;
constexpr std::size_t kUserMailOffset = 156;
constexpr std::size_t kUserMailUnits = 50;
constexpr std::size_t kOrgIdOffset = 256;
constexpr std::size_t kRoleCodeOffset = 260;
constexpr std::size_t kDisabledOffset = 262;
constexpr std::size_t kFlagUnits = 1;
constexpr std::size_t kUserImageBytes = 264;

static_assert(kUserNumberOffset == kUserIdOffset + text_bytes(kUserIdUnits));
static_assert(kLastNameOffset == kUserNumberOffset + 4);
static_assert(kFirstNameOffset == kLastNameOffset + text_bytes(kLastNameUnits));
static_assert(kUserPwdOffset == kFirstNameOffset + text_bytes(kFirstNameUnits));
static_assert(kUserMailOffset == kUserPwdOffset + text_bytes(kUserPwdUnits));
static_assert(kOrgIdOffset == kUserMailOffset + text_bytes(kUserMailUnits));
static_assert(kRoleCodeOffset == kOrgIdOffset + 4);
static_assert(kDisabledOffset == kRoleCodeOffset + text_bytes(kFlagUnits));
static_assert(kUserImageBytes == kDisabledOffset + text_bytes(kFlagUnits));
static_assert(kUserStreamBlockBytes == kRoleCodeOffset + 1);

// The organisation block; its last three bytes are zero.
constexpr std::size_t kOrgIdFieldOffset = 0;
constexpr std::size_t kOrganizationOffset = 4;
constexpr std::size_t kOrganizationUnits = 50;
constexpr std::size_t kParentOrgIdOffset = 104;
constexpr std::size_t kRootOrgIdOffset = 108;
constexpr std::size_t kAliasOffset = 112;
constexpr std::size_t kAliasUnits = 8;
constexpr std::size_t kAvailOffset = 128;
constexpr std::size_t kOrgPaddingOffset = 130;
constexpr std::size_t kOrgPaddingBytes = 3;

static_assert(kOrganizationOffset == kOrgIdFieldOffset + 4);
static_assert(kParentOrgIdOffset == kOrganizationOffset + text_bytes(kOrganizationUnits));
static_assert(kRootOrgIdOffset == kParentOrgIdOffset + 4);
static_assert(kAliasOffset == kRootOrgIdOffset + 4);
static_assert(kAvailOffset == kAliasOffset + text_bytes(kAliasUnits));
static_assert(kOrgPaddingOffset == kAvailOffset + text_bytes(kFlagUnits));
static_assert(kOrganizationBlockBytes == kOrgPaddingOffset + kOrgPaddingBytes);

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

// A text field of a block read back without its blank padding.
bool load_trimmed(std::span<const Byte> in, std::size_t offset, std::size_t units, String& text) {
  String raw;
  if (!load_fixed_text(in, offset, units, raw)) return false;
  text = trim_blanks(raw);
  return true;
}

}  // namespace

bool write_user_block(const tUser& user, ByteArray& stream, Long& position) {
  std::array<Byte, kUserImageBytes> image{};
  const std::span<Byte> out(image);
  const bool built = store_fixed_text(out, kUserIdOffset, kUserIdUnits, user.USERID) &&
                     store_le(out, kUserNumberOffset, user.UserNumber) &&
                     store_fixed_text(out, kLastNameOffset, kLastNameUnits, user.LastName) &&
                     store_fixed_text(out, kFirstNameOffset, kFirstNameUnits, user.FirstName) &&
                     store_fixed_text(out, kUserPwdOffset, kUserPwdUnits, user.UserPWD) &&
                     store_fixed_text(out, kUserMailOffset, kUserMailUnits, user.UserMail) &&
                     store_le(out, kOrgIdOffset, user.OrgID) &&
                     store_fixed_text(out, kRoleCodeOffset, kFlagUnits, user.RoleCode) &&
                     store_fixed_text(out, kDisabledOffset, kFlagUnits, user.Disabled);
  if (!built) return false;
  return copy_out(out.first(kUserStreamBlockBytes), stream, position);
}

bool read_user_block(const ByteArray& stream, Long& position, tUser& user) {
  std::array<Byte, kUserImageBytes> image{};  // bytes past the block stay zero
  if (!copy_in(stream, position, std::span<Byte>(image).first(kUserStreamBlockBytes))) return false;
  const std::span<const Byte> in(image);
  tUser fresh;
  const bool parsed = load_trimmed(in, kUserIdOffset, kUserIdUnits, fresh.USERID) &&
                      load_le(in, kUserNumberOffset, fresh.UserNumber) &&
                      load_trimmed(in, kLastNameOffset, kLastNameUnits, fresh.LastName) &&
                      load_trimmed(in, kFirstNameOffset, kFirstNameUnits, fresh.FirstName) &&
                      load_trimmed(in, kUserPwdOffset, kUserPwdUnits, fresh.UserPWD) &&
                      load_trimmed(in, kUserMailOffset, kUserMailUnits, fresh.UserMail) &&
                      load_le(in, kOrgIdOffset, fresh.OrgID) &&
                      load_trimmed(in, kRoleCodeOffset, kFlagUnits, fresh.RoleCode) &&
                      load_trimmed(in, kDisabledOffset, kFlagUnits, fresh.Disabled);
  if (!parsed) return false;
  user = std::move(fresh);
  return true;
}

bool write_organization_block(const tOrganization& org, ByteArray& stream, Long& position) {
  std::array<Byte, kOrganizationBlockBytes> block{};  // the padding stays zero
  const std::span<Byte> out(block);
  const bool built =
      store_le(out, kOrgIdFieldOffset, org.ID) &&
      store_fixed_text(out, kOrganizationOffset, kOrganizationUnits, org.Organization) &&
      store_le(out, kParentOrgIdOffset, org.ParentOrgID) &&
      store_le(out, kRootOrgIdOffset, org.RootOrgID) &&
      store_fixed_text(out, kAliasOffset, kAliasUnits, org.Alias) &&
      store_fixed_text(out, kAvailOffset, kFlagUnits, org.Avail);
  if (!built) return false;
  return copy_out(out, stream, position);
}

bool read_organization_block(const ByteArray& stream, Long& position, tOrganization& org) {
  std::array<Byte, kOrganizationBlockBytes> block{};
  if (!copy_in(stream, position, block)) return false;
  const std::span<const Byte> in(block);
  tOrganization fresh;
  const bool parsed =
      load_le(in, kOrgIdFieldOffset, fresh.ID) &&
      load_trimmed(in, kOrganizationOffset, kOrganizationUnits, fresh.Organization) &&
      load_le(in, kParentOrgIdOffset, fresh.ParentOrgID) &&
      load_le(in, kRootOrgIdOffset, fresh.RootOrgID) &&
      load_trimmed(in, kAliasOffset, kAliasUnits, fresh.Alias) &&
      load_trimmed(in, kAvailOffset, kFlagUnits, fresh.Avail);
  if (!parsed) return false;
  org = std::move(fresh);
  return true;
}

}  // namespace kvdata::detail
