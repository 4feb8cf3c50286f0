#pragma once
// One user record (tUser) in the form in which it travels between a client
// and the server: an 848-byte stream that begins with the version stamp 1.2.
// A reader of another library version refuses it instead of misreading it.
//
//   auto user = kvdata::KVUser::create();
//   user->v1User(record);  user->StreamOut(bytes, pos);   // pos += 848, array ends at pos

#include <cstddef>
#include <memory>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/automation/variant.hpp"
#include "kvdata/foundation/ikv_obj.hpp"
#include "kvdata/foundation/ikv_stream.hpp"
#include "kvdata/foundation/records.hpp"

namespace kvdata {

// Stream: the Single 1.2 (9A 99 99 3F), then an 844-byte block of the record:
// USERID (30 UTF-16 code units), UserNumber, LastName (50), FirstName (50),
// UserPWD (30), UserMail (255), two zero gap bytes, OrgID, RoleCode (1),
// Disabled (1); texts cut to their widths or padded with blanks, numbers
// little-endian. StreamLen is 848.
//  - StreamOut sets the array to run from index 0 to Position + 848, one
//    spare element after the encoding (a longer array is cut, an array never
//    given bounds counts as empty), and leaves Position at the encoding's end.
//  - StreamIn needs the array to reach Position + 848, checks the stamp, and
//    replaces the record: texts without leading and trailing blanks, except
//    Disabled, which keeps its one code unit as it is.
// Neither raises to the caller: a failure returns False and leaves its text in
// ErrMsg (a later success does not clear it). A short array or a Position
// below 0 changes nothing; a wrong stamp leaves Position past it and the
// record unchanged.
class KVUser final : public IKVObj, public IKVStream {
 public:
  static constexpr std::size_t kStreamBytes = 848;

  static std::shared_ptr<KVUser> create();

  // A copy of the user record.
  tUser v1User() const { return user_; }
  // Replaces the user record with a copy of `value`.
  void v1User(const tUser& value) { user_ = value; }
  // The text of the most recent failure of StreamIn or StreamOut.
  String ErrMsg() const { return err_msg_; }

 private:
  String IKVObj_ObjType() const override;
  String IKVObj_Description() const override;
  Variant IKVObj_ID() const override;
  Variant IKVObj_DateCreated() const override;

  bool IKVStream_StreamIn(const ByteArray& bytStream, Long& Position) override;
  bool IKVStream_StreamOut(ByteArray& bytStream, Long& Position) override;
  Long IKVStream_StreamLen() const override;

  tUser user_;
  String err_msg_;
};

}  // namespace kvdata
