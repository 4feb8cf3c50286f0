#include "kvdata/objects/kv_user.hpp"

#include <array>
#include <cassert>
#include <span>

#include "automation/detail/failure.hpp"
#include "kvdata/automation/error.hpp"
#include "kvdata/automation/text.hpp"
#include "kvdata/streams/field_codec.hpp"
#include "objects/detail/object_stream.hpp"
#include "streams/detail/checked_codec.hpp"
#include "streams/detail/fixed_text.hpp"
#include "streams/detail/little_endian.hpp"

namespace kvdata {
namespace {

constexpr Single kStamp = 1.2f;
constexpr std::size_t kStampBytes = 4;

// The block after the stamp, as offsets from its start.
constexpr std::size_t kUserIdOffset = 0;
constexpr std::size_t kUserIdUnits = 30;
constexpr std::size_t kUserNumberOffset = 60;
constexpr std::size_t kLastNameOffset = 64;
constexpr std::size_t kLastNameUnits = 50;
constexpr std::size_t kFirstNameOffset = 164;
constexpr std::size_t kFirstNameUnits = 50;
constexpr std::size_t kUserPwdOffset = 264;
constexpr std::size_t kUserPwdUnits = 30;
constexpr std::size_t kUserMailOffset = 324;
constexpr std::size_t kUserMailUnits = 255;
constexpr std::size_t kGapOffset = 834;  // alignment gap, 2 bytes, written as 0
constexpr std::size_t kOrgIdOffset = 836;
constexpr std::size_t kRoleCodeOffset = 840;
constexpr std::size_t kDisabledOffset = 842;
constexpr std::size_t kBlockBytes = 844;

static_assert(kUserNumberOffset == kUserIdOffset + 2 * kUserIdUnits);
static_assert(kFirstNameOffset == kLastNameOffset + 2 * kLastNameUnits);
static_assert(kUserPwdOffset == kFirstNameOffset + 2 * kFirstNameUnits);
static_assert(kUserMailOffset == kUserPwdOffset + 2 * kUserPwdUnits);
static_assert(kGapOffset == kUserMailOffset + 2 * kUserMailUnits);
static_assert(kOrgIdOffset == kGapOffset + 2);
static_assert(kDisabledOffset + 2 == kBlockBytes);
static_assert(kStampBytes + kBlockBytes == KVUser::kStreamBytes);

using Block = std::array<Byte, kBlockBytes>;

// Failures of the stream operations, each with its own number.
constexpr Long kStreamTooSmall = 1;
constexpr Long kVersionMismatch = 2;
constexpr Long kPositionInvalid = 3;
constexpr char16_t kSourceIn[] = u"KVData.KVUser.StreamIn";
constexpr char16_t kSourceOut[] = u"KVData.KVUser.StreamOut";

Block encode(const tUser& user) {
  Block block{};
  const bool inside =
      detail::store_fixed_text(block, kUserIdOffset, kUserIdUnits, user.USERID) &&
      detail::store_le(std::span<Byte>(block), kUserNumberOffset, user.UserNumber) &&
      detail::store_fixed_text(block, kLastNameOffset, kLastNameUnits, user.LastName) &&
      detail::store_fixed_text(block, kFirstNameOffset, kFirstNameUnits, user.FirstName) &&
      detail::store_fixed_text(block, kUserPwdOffset, kUserPwdUnits, user.UserPWD) &&
      detail::store_fixed_text(block, kUserMailOffset, kUserMailUnits, user.UserMail) &&
      detail::store_le(std::span<Byte>(block), kOrgIdOffset, user.OrgID) &&
      detail::store_fixed_text(block, kRoleCodeOffset, 1, user.RoleCode) &&
      detail::store_fixed_text(block, kDisabledOffset, 1, user.Disabled);
  assert(inside);
  static_cast<void>(inside);
  return block;
}

tUser decode(const Block& block) {
  tUser user;
  const bool inside =
      detail::load_fixed_text(block, kUserIdOffset, kUserIdUnits, user.USERID) &&
      detail::load_le(std::span<const Byte>(block), kUserNumberOffset, user.UserNumber) &&
      detail::load_fixed_text(block, kLastNameOffset, kLastNameUnits, user.LastName) &&
      detail::load_fixed_text(block, kFirstNameOffset, kFirstNameUnits, user.FirstName) &&
      detail::load_fixed_text(block, kUserPwdOffset, kUserPwdUnits, user.UserPWD) &&
      detail::load_fixed_text(block, kUserMailOffset, kUserMailUnits, user.UserMail) &&
      detail::load_le(std::span<const Byte>(block), kOrgIdOffset, user.OrgID) &&
      detail::load_fixed_text(block, kRoleCodeOffset, 1, user.RoleCode) &&
      detail::load_fixed_text(block, kDisabledOffset, 1, user.Disabled);
  assert(inside);
  static_cast<void>(inside);
  // Disabled keeps its unit as it is, a blank included.
  for (String* text : {&user.USERID, &user.LastName, &user.FirstName, &user.UserPWD, &user.UserMail,
                       &user.RoleCode}) {
    *text = trim_blanks(*text);
  }
  return user;
}

// The user's failure policy: False, with the failure's description in ErrMsg.
auto keeping_message_in(String& err_msg) {
  return [&err_msg](Long number, const Error* e) {
    err_msg = e != nullptr ? e->description() : standard_description(number);
    return false;
  };
}

}  // namespace

std::shared_ptr<KVUser> KVUser::create() {
  return std::make_shared<KVUser>();
}

String KVUser::IKVObj_ObjType() const {
  return u"User";
}
String KVUser::IKVObj_Description() const {
  return u"User";
}
Variant KVUser::IKVObj_ID() const {
  return {};
}
Variant KVUser::IKVObj_DateCreated() const {
  return {};
}

Long KVUser::IKVStream_StreamLen() const {
  return static_cast<Long>(kStreamBytes);
}

bool KVUser::IKVStream_StreamOut(ByteArray& bytStream, Long& Position) {
  return detail::on_failure(keeping_message_in(err_msg_), [&] {
    if (Position < 0) {
      raise(kPositionInvalid, kSourceOut, u"Position value was not initialized properly");
    }
    const Long end = detail::index_after(Position, kStreamBytes);
    const Block block = encode(user_);
    detail::resize_stream(bytStream, end);
    if (!checked::write_single(kStamp, bytStream, Position) ||
        !detail::put_block(bytStream, Position, block)) {
      raise(kSubscriptOutOfRange);
    }
    return true;
  });
}

bool KVUser::IKVStream_StreamIn(const ByteArray& bytStream, Long& Position) {
  return detail::on_failure(keeping_message_in(err_msg_), [&] {
    // The array must reach one index beyond the encoding, as StreamOut leaves it.
    if (static_cast<long long>(bytStream.ubound()) <
        static_cast<long long>(Position) + static_cast<long long>(kStreamBytes)) {
      raise(kStreamTooSmall, kSourceIn, u"Stream is too small to contain user structure");
    }
    Single stamp = 0;  // stays 0 when the stamp cannot be read
    SingleFromArray(bytStream, Position, stamp);
    if (stamp != kStamp) {
      raise(kVersionMismatch, kSourceIn, u"Client and Server KVData.DLL versions don't match");
    }
    Block block{};
    if (!detail::take_block(bytStream, Position, block)) raise(kSubscriptOutOfRange);
    user_ = decode(block);
    return true;
  });
}

}  // namespace kvdata
