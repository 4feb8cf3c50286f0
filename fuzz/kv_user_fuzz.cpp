// KVUser::StreamIn on a framed stream, with its round trip. A failure leaves
// the record as it was and a message in ErrMsg; a stream too short for the
// 848 bytes (and the one spare element after them) leaves Position alone.

#include "object_target.hpp"

using namespace kvdata;

namespace {

std::shared_ptr<KVUser> known_user() {
  auto user = KVUser::create();
  tUser record;
  record.USERID = u"KNOWN";
  record.UserNumber = 77;
  record.LastName = u"Before";
  record.OrgID = 5;
  record.RoleCode = u"R";
  record.Disabled = u"N";
  user->v1User(record);
  return user;
}

fuzz::ObjectStream<KVUser> ops() {
  fuzz::ObjectStream<KVUser> ops;
  ops.fresh = [] { return KVUser::create(); };
  ops.known = known_user;
  ops.whole_or_nothing = true;
  ops.after_read = [](const KVUser& user, bool ok, Long start, Long end) {
    const long long moved = static_cast<long long>(end) - start;
    if (ok) {
      KVDATA_FUZZ_CHECK(moved == 848, "a user read took other than 848 bytes");
      return;
    }
    KVDATA_FUZZ_CHECK(!user.ErrMsg().empty(), "a failed user read left no message");
    KVDATA_FUZZ_CHECK(moved == 0 || moved == 4, "a failed user read moved Position too far");
  };
  return ops;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  fuzz::quiet_event_log();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const fuzz::ObjectStream<KVUser> kOps = ops();
  return fuzz::object_target(data, size, kOps);
}
