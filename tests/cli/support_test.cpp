// Tables, CSV cells and raw bytes.
#include <gtest/gtest.h>

#include "support/text_table.hpp"
#include "wire/explain_render.hpp"

namespace kvdata::cli {
namespace {

TEST(Support, TablesAlignByCharactersAndCsvQuotesOnlyWhatNeedsIt) {
  TextTable t({{"sample", Align::Left}, {"L*"}});
  t.add_row({"Caf\xC3\xA9", "95.120"});
  t.add_row({"Deep Blue", "7.5"});
  t.add_row({"x"});
  EXPECT_EQ(t.render(),
            "sample         L*\n"
            "Caf\xC3\xA9       95.120\n"
            "Deep Blue     7.5\n"
            "x\n");
  TextTable c({{"name", Align::Left}, {"v"}});
  c.add_row({"White, glossy", "1"});
  c.add_row({"say \"hi\"", "2"});
  c.add_row({"two\nlines", "3"});
  EXPECT_EQ(c.render_csv(),
            "name,v\n\"White, glossy\",1\n\"say \"\"hi\"\"\",2\n\"two\nlines\",3\n");
  EXPECT_EQ(fixed(-0.0004, 3), "0.000");
  EXPECT_EQ(fixed(-0.0006, 3), "-0.001");
  EXPECT_EQ(fixed(95.1204, 3), "95.120");
}

TEST(Support, RawBytesAreShownUpToALimit) {
  const std::vector<Byte> b = {0x00, 0x9A, 0xFF, 0x10, 0x20};
  EXPECT_EQ(hex_bytes(b), "00 9A FF 10 20");
  EXPECT_EQ(hex_bytes(b, 2), "00 9A +3");
  EXPECT_EQ(hex_bytes({}), "");
}

}  // namespace
}  // namespace kvdata::cli
