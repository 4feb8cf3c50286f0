// The library's readers while someone watches, as `kvdata explain` and the
// identification of a stream run them: fuzzed bytes are walked as every kind
// of stream. The fields reported must lie one after another inside the
// stream from its first byte, the place where a walk stops must lie inside
// the stream or just past it, and the words of what was expected must not
// be empty. Identification must come to a conclusion without failing.

#include <string>

#include "fuzz_support.hpp"
#include "wire/identify.hpp"
#include "wire/stream_walk.hpp"

using namespace kvdata;

namespace {

class Tiling : public cli::WalkSink {
 public:
  explicit Tiling(std::size_t size) : size_(size) {}
  void field(std::string_view path, const StreamField& f) override {
    KVDATA_FUZZ_CHECK(!path.empty(), "a field without a name");
    KVDATA_FUZZ_CHECK(f.width > 0, "a field of no bytes");
    KVDATA_FUZZ_CHECK(static_cast<std::size_t>(f.position) == end, "a field away from the last");
    end += static_cast<std::size_t>(f.width);
    KVDATA_FUZZ_CHECK(end <= size_, "a field past the end of the stream");
  }
  std::size_t end = 0;

 private:
  std::size_t size_;
};

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  fuzz::quiet_event_log();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  ByteArray bytes(0, static_cast<Long>(size) - 1);
  std::copy(data, data + size, bytes.begin());
  for (const cli::KindInfo& k : cli::all_kinds()) {
    Tiling tiling(size);
    const cli::WalkEnd end = cli::walk_stream(k.kind, bytes, tiling);
    if (end.problem) {
      KVDATA_FUZZ_CHECK(end.problem->offset <= size, "a walk that stops past the stream");
      KVDATA_FUZZ_CHECK(!end.problem->expected.empty(), "a stop without what was expected");
    } else {
      KVDATA_FUZZ_CHECK(tiling.end == size, "a walk without a problem that leaves bytes unread");
    }
  }
  const cli::Identification id = cli::identify(bytes);
  KVDATA_FUZZ_CHECK(!id.reason.empty(), "an identification without its reason");
  return 0;
}
