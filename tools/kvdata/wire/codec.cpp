#include "wire/codec.hpp"

#include "json/fields.hpp"
#include "kvdata/automation/error.hpp"
#include "kvdata/automation/text.hpp"
#include "support/errors.hpp"
#include "support/library_log.hpp"
#include "wire/codec_parts.hpp"

namespace kvdata::cli {
namespace codec {

ByteArray to_array(std::span<const Byte> bytes) {
  ByteArray a(0, static_cast<Long>(bytes.size()) - 1);
  std::copy(bytes.begin(), bytes.end(), a.begin());
  return a;
}

std::vector<Byte> from_array(const ByteArray& a, Long from, Long to) {
  std::vector<Byte> out;
  for (Long i = from; i < to; ++i) out.push_back(a(i));
  return out;
}

std::vector<Byte> whole_array(const ByteArray& a) {
  if (!a.has_bounds()) return {};
  return std::vector<Byte>(a.begin(), a.end());
}

void object_in(IKVStream& object, const ByteArray& a, const char* what,
               const std::string& message) {
  Long pos = 0;
  LibraryLog log;
  if (!object.StreamIn(a, pos)) {
    bad_input(std::string("the library's ") + what + " reader refused the stream" +
              (message.empty() ? std::string() : ": " + message) + log.summary());
  }
}

std::vector<Byte> object_out(IKVStream& object, const char* what) {
  ByteArray a(0, -1);
  Long pos = 0;
  LibraryLog log;
  if (!object.StreamOut(a, pos)) {
    bad_input(std::string("the library's ") + what + " writer refused the object" + log.summary());
  }
  return whole_array(a);
}

void check_width(const String& text, std::size_t units, const std::string& path) {
  if (text.size() > units) {
    bad_input(path + ": " + std::to_string(text.size()) +
              " UTF-16 code units, but the field holds " + std::to_string(units) +
              "; the library would cut the text");
  }
}

}  // namespace codec

StreamKind document_kind(const Json& doc, std::optional<StreamKind> kind) {
  if (!doc.is_object())
    bad_input("expected a JSON object {\"kind\": ..., ...}, found " + describe(doc));
  const auto it = doc.find("kind");
  if (it == doc.end() || !it->is_string()) {
    if (kind) bad_input("kind: missing; expected \"" + std::string(kind_name(*kind)) + "\"");
    bad_input("kind: missing; expected one of: " + kind_list());
  }
  const std::string& word = it->get_ref<const std::string&>();
  const auto named = parse_kind(word);
  if (!named)
    bad_input("kind: \"" + word + "\" is not a kind of stream; expected one of: " + kind_list());
  if (kind && *named != *kind) {
    bad_input("kind: the document holds a \"" + word + "\" stream, not \"" +
              std::string(kind_name(*kind)) + "\"");
  }
  return *named;
}

Json decode_stream(StreamKind kind, std::span<const Byte> bytes) {
  const ByteArray a = codec::to_array(bytes);
  Json doc = Json::object();
  doc["kind"] = std::string(kind_name(kind));
  try {
    if (codec::decode_record_stream(kind, a, doc) || codec::decode_user_objects(kind, a, doc) ||
        codec::decode_tile_objects(kind, a, doc) || codec::decode_profile_objects(kind, a, doc)) {
      return doc;
    }
  } catch (const Error& e) {
    bad_input("the " + std::string(kind_name(kind)) + " reader failed: " + e.what());
  }
  // Every kind belongs to one of the groups above.
  bad_usage("internal error: no reader for " + std::string(kind_name(kind)) + " streams");
}

std::vector<Byte> encode_stream(StreamKind kind, const Json& doc) {
  document_kind(doc, kind);
  std::vector<Byte> out;
  try {
    if (codec::encode_record_stream(kind, doc, out) || codec::encode_user_objects(kind, doc, out) ||
        codec::encode_tile_objects(kind, doc, out) ||
        codec::encode_profile_objects(kind, doc, out)) {
      return out;
    }
  } catch (const Error& e) {
    bad_input("the " + std::string(kind_name(kind)) + " writer failed: " + e.what());
  }
  bad_usage("internal error: no writer for " + std::string(kind_name(kind)) + " streams");
}

}  // namespace kvdata::cli
