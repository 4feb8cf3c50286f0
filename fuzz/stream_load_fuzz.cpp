// Streams::StreamLoad on fuzzed file contents. The input is written to a
// file as it is; loading must give exactly those bytes from index 1 (or
// False, with the array untouched, for an empty file). The loaded stream is
// then saved, loaded again and compared, and decoded from index 1 by the
// readers that take any stream (tolerance set and user), which must stay
// inside it.

#include <cstdio>
#include <cstdlib>
#include <string>

#include "fuzz_support.hpp"

using namespace kvdata;

namespace {

const std::string& directory() {
  return fuzz::scratch_directory("kvdata-stream-load", {"in.bin", "out.bin"});
}

String file_name(const char* leaf) {
  return from_utf8(directory() + "/" + leaf);
}

bool write_file(const String& name, const std::uint8_t* data, std::size_t size) {
  std::FILE* file = std::fopen(to_utf8(name).c_str(), "wb");
  if (file == nullptr) return false;
  const bool ok = size == 0 || std::fwrite(data, 1, size, file) == size;
  return std::fclose(file) == 0 && ok;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  fuzz::quiet_event_log();
  directory();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  Streams& streams = Streams::instance();
  const String in_name = file_name("in.bin");
  if (!write_file(in_name, data, size)) std::abort();

  ByteArray loaded(5, 6);
  loaded(5) = 0xAB;
  const bool ok = streams.StreamLoad(in_name, loaded);
  if (size == 0) {
    KVDATA_FUZZ_CHECK(!ok, "an empty file loaded");
    KVDATA_FUZZ_CHECK(loaded.lbound() == 5 && loaded.ubound() == 6 && loaded(5) == 0xAB,
                      "a failed load changed the array");
    return 0;
  }
  KVDATA_FUZZ_CHECK(ok, "a file could not be loaded");
  KVDATA_FUZZ_CHECK(loaded.lbound() == 1 && loaded.size() == size,
                    "a loaded stream does not run from index 1 to the file's length");
  KVDATA_FUZZ_CHECK(std::memcmp(loaded.data(), data, size) == 0,
                    "loaded bytes differ from the file");

  // Saved and loaded again, the stream is the same.
  const String out_name = file_name("out.bin");
  KVDATA_FUZZ_CHECK(streams.StreamSave(out_name, loaded), "a loaded stream could not be saved");
  ByteArray again;
  KVDATA_FUZZ_CHECK(streams.StreamLoad(out_name, again), "a saved stream could not be loaded");
  KVDATA_FUZZ_CHECK(again == loaded, "a stream changed through a save and a load");

  // Readers of loaded streams start at index 1 and stay inside the array.
  const long long end = 1 + static_cast<long long>(size);
  Long position = 1;
  auto set = KVTolSet::create();
  static_cast<void>(set->StreamIn(loaded, position));
  KVDATA_FUZZ_CHECK(position >= 1 && position <= end, "a set read from a loaded stream left it");
  position = 1;
  auto user = KVUser::create();
  static_cast<void>(user->StreamIn(loaded, position));
  KVDATA_FUZZ_CHECK(position >= 1 && position <= end, "a user read from a loaded stream left it");
  return 0;
}
