// The kvdata command's JSON reader (encode): fuzzed text is parsed, its kind
// told and its record or object encoded with the library's writers. Where
// that succeeds, the stream is decoded back to JSON and encoded again: both
// streams must be the same bytes, or, where the objects tidied a field on
// reading, the second stream must come back unchanged from a further trip. Every refusal must be an
// InputError (or a JSON parse error), never another exception or a crash.

#include <algorithm>
#include <string>

#include "fuzz_support.hpp"
#include "support/errors.hpp"
#include "wire/codec.hpp"

using namespace kvdata;

namespace {

// The document `kvdata decode` writes for the stream.
std::string decoded(cli::StreamKind kind, const std::vector<Byte>& bytes) {
  ByteArray a(0, static_cast<Long>(bytes.size()) - 1);
  std::copy(bytes.begin(), bytes.end(), a.begin());
  return cli::document_text(*cli::decode_stream(kind, a));
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  fuzz::quiet_event_log();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::string text(reinterpret_cast<const char*>(data), size);
  cli::Json doc;
  try {
    doc = cli::Json::parse(text);
  } catch (const cli::Json::exception&) {
    return 0;  // what the command reports as "not valid JSON"
  }
  std::vector<Byte> first;
  cli::StreamKind kind{};
  try {
    kind = cli::document_kind(doc, std::nullopt);
    first = cli::encode_stream(kind, doc);
  } catch (const cli::InputError&) {
    return 0;
  } catch (const cli::UsageError&) {
    return 0;
  }
  std::vector<Byte> second;
  try {
    second = cli::encode_stream(kind, cli::Json::parse(decoded(kind, first)));
  } catch (const std::exception& e) {
    std::fprintf(stderr, "%s\n", e.what());
    KVDATA_FUZZ_CHECK(false, "a stream the command wrote cannot be read back and written again");
  }
  if (first == second) return 0;
  // The objects tidy some fields as they read them (a name loses its leading
  // blanks), which `decode` warns about; the tidied stream must then be a
  // fixed point: it decodes to the same document and encodes to itself.
  std::vector<Byte> third;
  try {
    third = cli::encode_stream(kind, cli::Json::parse(decoded(kind, second)));
  } catch (const std::exception& e) {
    std::fprintf(stderr, "%s\n", e.what());
    KVDATA_FUZZ_CHECK(false, "a tidied stream cannot be read back and written again");
  }
  KVDATA_FUZZ_CHECK(third == second, "a document changed on its round trip through its stream");
  return 0;
}
