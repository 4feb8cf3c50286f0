#include "kvdata/objects/kv_user.hpp"

#include <algorithm>
#include <array>
#include <cassert>
#include <span>
#include <string>
#include <string_view>

#include "automation/detail/failure.hpp"
#include "kvdata/automation/error.hpp"
#include "kvdata/automation/text.hpp"
#include "kvdata/foundation/record_fields.hpp"
#include "kvdata/streams/stream_observer.hpp"
#include "objects/detail/object_stream.hpp"
#include "objects/detail/property_names.hpp"
#include "streams/detail/block_layout.hpp"
#include "streams/detail/checked_codec.hpp"
#include "streams/detail/field_cursor.hpp"
#include "streams/detail/little_endian.hpp"
#include "streams/detail/observe.hpp"

namespace kvdata {
namespace {

constexpr Single kStamp = 1.2f;
constexpr std::size_t kStampBytes = 4;

// The block after the stamp.
constexpr auto kBlock = detail::block_layout<10>({
    detail::text_cell(field_name<&tUser::USERID>(), 30),
    detail::long_cell(field_name<&tUser::UserNumber>()),
    detail::text_cell(field_name<&tUser::LastName>(), 50),
    detail::text_cell(field_name<&tUser::FirstName>(), 50),
    detail::text_cell(field_name<&tUser::UserPWD>(), 30),
    detail::text_cell(field_name<&tUser::UserMail>(), 255),
    detail::gap_cell(stream_names::kAlignmentGap, 2),
    detail::long_cell(field_name<&tUser::OrgID>()),
    detail::text_cell(field_name<&tUser::RoleCode>(), 1),
    detail::text_cell(field_name<&tUser::Disabled>(), 1),
});
static_assert(kBlock.bytes == 844);
static_assert(kStampBytes + kBlock.bytes == KVUser::kStreamBytes);

constexpr std::string_view kProperty = detail::property_name<KVUser>("v1User");

using Block = std::array<Byte, kBlock.bytes>;

// Failures of the stream operations, each with its own number.
constexpr Long kStreamTooSmall = 1;
constexpr Long kVersionMismatch = 2;
constexpr Long kPositionInvalid = 3;
constexpr char16_t kSourceIn[] = u"KVData.KVUser.StreamIn";
constexpr char16_t kSourceOut[] = u"KVData.KVUser.StreamOut";

// The block of `user`; the observer installed on this thread sees each
// text as given, at stream index `position` plus its offset.
Block encode(const tUser& user, Long position) {
  Block block{};
  StreamObserver* const observer = stream_observer();
  const detail::ObservedRecord property(observer, kProperty);
  [[maybe_unused]] const bool inside =
      detail::store_fields(user, kBlock.cells, block, observer, position);
  assert(inside);
  return block;
}

tUser decode(const Block& block) {
  tUser user;
  // Disabled keeps its unit as it is, a blank included.
  [[maybe_unused]] const bool inside =
      detail::load_fields(block, kBlock.cells, user, field_name<&tUser::Disabled>());
  assert(inside);
  return user;
}

// The user's failure policy: False, with the failure's description in ErrMsg.
auto keeping_message_in(String& err_msg) {
  return [&err_msg](Long number, const Error* e) {
    err_msg = e != nullptr ? e->description() : standard_description(number);
    return false;
  };
}

// Tells the observer where a stream too short for StreamIn ends: in the
// stamp, in a field of the block, or where the spare byte should be. The
// reader takes nothing from such a stream.
void refuse_short(StreamObserver& observer, const ByteArray& stream, Long position) {
  const long long ends = std::max<long long>(position, stream.ubound() + 1LL);
  const auto held = static_cast<std::size_t>(ends - position);
  const std::string nothing_taken =
      "; the user reader takes nothing from a stream that does not reach one byte past the "
      "encoding, where the writer leaves a spare byte";
  if (held == KVUser::kStreamBytes) {
    detail::refuse(&observer, static_cast<Long>(ends), stream_names::kSpareByte,
                   [&] { return "one more byte" + nothing_taken; });
    return;
  }
  if (held < kStampBytes) {
    detail::refuse(&observer, position, stream_names::kStreamVersion, [&] {
      return "a Single: " + detail::shortfall(kStampBytes, held) + nothing_taken;
    });
    return;
  }
  const std::size_t in_block = held - kStampBytes;
  for (const detail::Cell& cell : kBlock.cells) {
    if (in_block < cell.offset + cell.bytes()) {
      const detail::ObservedRecord property(&observer, kProperty);
      detail::refuse(
          &observer, position + static_cast<Long>(kStampBytes + cell.offset), cell.name, [&] {
            return detail::cell_words(cell) + ": " +
                   detail::shortfall(cell.bytes(), in_block - cell.offset) + nothing_taken;
          });
      return;
    }
  }
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
    const Block block = encode(user_, end - static_cast<Long>(kBlock.bytes));
    detail::resize_stream(bytStream, end);
    if (!checked::write_single(kStamp, bytStream, Position) ||
        !detail::put_block(bytStream, Position, block)) {
      raise(kSubscriptOutOfRange);
    }
    return true;
  });
}

bool KVUser::IKVStream_StreamIn(const ByteArray& bytStream, Long& Position) {
  StreamObserver* const observer = stream_observer();
  return detail::on_failure(keeping_message_in(err_msg_), [&] {
    // The array must reach one index beyond the encoding, as StreamOut leaves it.
    const long long needed_end = static_cast<long long>(Position) + static_cast<long long>(kStreamBytes);
    if (static_cast<long long>(bytStream.ubound()) < needed_end) {
      if (observer != nullptr) refuse_short(*observer, bytStream, Position);
      raise(kStreamTooSmall, kSourceIn, u"Stream is too small to contain user structure");
    }
    Single stamp = 0;  // stays 0 when the stamp cannot be read
    const Long stamp_at = Position;
    detail::FieldReader(bytStream, Position).get_single(stamp, stream_names::kStreamVersion);
    if (stamp != kStamp) {
      detail::refuse(observer, stamp_at, stream_names::kStreamVersion,
                     [&] { return detail::stamp_expected("user", kStamp, stamp); });
      raise(kVersionMismatch, kSourceIn, u"Client and Server KVData.DLL versions don't match");
    }
    Block block{};
    const Long start = Position;
    const bool whole = detail::take_block(bytStream, Position, block);
    if (observer != nullptr) {
      const detail::ObservedRecord property(observer, kProperty);
      const auto taken = static_cast<std::size_t>(static_cast<long long>(Position) - start);
      static_cast<void>(detail::observe_block(*observer, kBlock.cells,
                                              std::span<const Byte>(block).first(taken), start));
    }
    if (!whole) raise(kSubscriptOutOfRange);
    user_ = decode(block);
    return true;
  });
}

}  // namespace kvdata
