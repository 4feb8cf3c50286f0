// Tables, CSV cells and all-or-nothing output files.
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <filesystem>
#include <fstream>
#include <iterator>

#include "support/errors.hpp"
#include "support/files.hpp"
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

TEST(Support, AtomicWritesReplaceWholeOrLeaveTheTargetAlone) {
  const auto dir = std::filesystem::temp_directory_path() / "kvdata_support_test";
  std::filesystem::remove_all(dir);
  std::filesystem::create_directories(dir);
  const std::string target = (dir / "out.kvs").string();
  write_atomically(target, std::string_view("first version, longer"));
  write_atomically(target, std::string_view("second"));
  std::ifstream in(target, std::ios::binary);
  EXPECT_EQ(std::string((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>()),
            "second");
  struct stat st {};
  ASSERT_EQ(::stat(target.c_str(), &st), 0);
  const mode_t mask = ::umask(0);
  ::umask(mask);
  EXPECT_EQ(st.st_mode & 0777, 0666 & ~mask);

  // A target that cannot be replaced (a directory) stays; no temporary file is left.
  const std::string blocked = (dir / "sub").string();
  std::filesystem::create_directories(dir / "sub" / "inner");
  EXPECT_THROW(write_atomically(blocked, std::string_view("x")), InputError);
  EXPECT_TRUE(std::filesystem::is_directory(dir / "sub" / "inner"));
  std::size_t files = 0;
  for (const auto& e : std::filesystem::directory_iterator(dir)) {
    (void)e;
    ++files;
  }
  EXPECT_EQ(files, 2u);  // out.kvs and sub
  EXPECT_THROW(read_bytes((dir / "sub").string()), InputError);
  EXPECT_THROW(read_bytes((dir / "absent").string()), InputError);
  std::filesystem::remove_all(dir);
}

TEST(Support, RawBytesAreShownUpToALimit) {
  const std::vector<Byte> b = {0x00, 0x9A, 0xFF, 0x10, 0x20};
  EXPECT_EQ(hex_bytes(b), "00 9A FF 10 20");
  EXPECT_EQ(hex_bytes(b, 2), "00 9A +3");
  EXPECT_EQ(hex_bytes({}), "");
}

}  // namespace
}  // namespace kvdata::cli
