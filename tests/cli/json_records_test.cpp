// Documents the command reads: every case of tests/cli/data/documents.json
// is a shipped example changed by a JSON patch, and is either refused with
// the given message or read, written to its stream and decoded back to
// exactly the changed document. Texts longer than their fixed-width fields
// are refused through the library writers' reports of the texts they write.
#include <gtest/gtest.h>

#include <string>

#include "command_runner.hpp"
#include "kvdata/automation/error.hpp"
#include "support/errors.hpp"
#include "wire/codec.hpp"

namespace kvdata::cli {
namespace {

using test::example;
using test::slurp;

void run_cases(const char* group) {
  const Json cases =
      Json::parse(slurp(std::string(KVDATA_SOURCE_DIR) + "/tests/cli/data/documents.json"))
          .at(group);
  ASSERT_FALSE(cases.empty());
  for (const Json& c : cases) {
    const Json doc =
        Json::parse(slurp(example("json/" + c.at("document").get<std::string>() + ".json")))
            .patch(c.at("patch"));
    SCOPED_TRACE(c.dump());
    std::string refusal;
    std::string back;
    try {
      ByteArray bytes = read_document(doc, std::nullopt)->write_stream();
      back = document_text(*decode_stream(document_kind(doc, std::nullopt), bytes));
    } catch (const InputError& e) {
      refusal = e.what();
    }
    if (c.contains("refused")) {
      // One fragment of the message, or several.
      const Json& expected = c["refused"];
      for (const Json& part : expected.is_array() ? expected : Json::array({expected})) {
        EXPECT_NE(refusal.find(part.get<std::string>()), std::string::npos) << refusal;
      }
    } else {
      EXPECT_EQ(refusal, "");
      EXPECT_EQ(back, doc.dump(2));
    }
  }
}

TEST(JsonDocuments, EachChangedExampleIsRefusedWithItsFieldOrComesBackUnchanged) {
  run_cases("documents");
}

TEST(JsonDocuments, ATextLongerThanItsFieldIsRefusedWithItsPath) {
  run_cases("texts_too_long");
}

}  // namespace
}  // namespace kvdata::cli
