// KVTolSet::StreamIn on a framed stream, with its round trip. The member
// count comes from the stream, so a hostile count must cost no more than the
// members the stream really holds; a repeated member ID stops the read.

#include "object_target.hpp"

using namespace kvdata;

namespace {

std::shared_ptr<KVTolSet> known_set() {
  auto set = KVTolSet::create();
  IKVTolSet& s = *set;
  s.ID(3);
  s.InstTypeID(9);
  auto tol = KVTolerance::create();
  tol->ID(12);
  s.Add(tol, u"12");
  return set;
}

fuzz::ObjectStream<KVTolSet> ops() {
  fuzz::ObjectStream<KVTolSet> ops;
  ops.fresh = [] { return KVTolSet::create(); };
  ops.known = known_set;
  ops.after_read = [](const KVTolSet& set, bool ok, Long start, Long end) {
    const long long moved = static_cast<long long>(end) - start;
    const IKVTolSet& s = set;
    const long long members = s.count();
    if (ok) {
      KVDATA_FUZZ_CHECK(moved == 533 + 749 * members, "a set read took other than its bytes");
    } else {
      // Only whole members are kept.
      KVDATA_FUZZ_CHECK(moved >= 533 * (members > 0 ? 1 : 0) + 749 * members,
                        "a failed set read kept members it did not read");
    }
    // Every member is reachable under its ID.
    for (const auto& member : set) {
      const auto found = const_cast<IKVTolSet&>(s).Item(Variant(member->ID()));
      KVDATA_FUZZ_CHECK(found == member, "a member read is not under its ID");
    }
  };
  return ops;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  fuzz::quiet_event_log();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const fuzz::ObjectStream<KVTolSet> kOps = ops();
  return fuzz::object_target(data, size, kOps);
}
