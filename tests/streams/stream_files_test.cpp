#include <gtest/gtest.h>
#include <sys/stat.h>
#include <sys/sysmacros.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <random>
#include <string>
#include <vector>

#include "kvdata/kvdata.hpp"
#include "streams/stream_test_support.hpp"

namespace kvdata {
namespace {

namespace fs = std::filesystem;
using testing::contents;
using testing::stream_of;
using Bytes = std::vector<Byte>;

Streams& streams() {
  return Streams::instance();
}

// A fresh directory of its own for each test.
class StreamFiles : public ::testing::Test {
 protected:
  void SetUp() override {
    const auto* info = ::testing::UnitTest::GetInstance()->current_test_info();
    dir_ = fs::temp_directory_path() / (std::string("kvdata_stream_files_") + info->name() + "_" +
                                        std::to_string(std::random_device()()));
    fs::remove_all(dir_);
    fs::create_directories(dir_);
  }
  void TearDown() override { fs::remove_all(dir_); }

  fs::path path(const std::string& name) const { return dir_ / name; }
  static String name_of(const fs::path& p) { return from_utf8(p.string()); }

  static Bytes file_bytes(const fs::path& p) {
    std::ifstream in(p, std::ios::binary);
    return Bytes(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
  }
  static void write_file(const fs::path& p, const Bytes& bytes) {
    std::ofstream out(p, std::ios::binary);
    out.write(reinterpret_cast<const char*>(bytes.data()),
              static_cast<std::streamsize>(bytes.size()));
  }
  std::size_t entries_in_dir() const {
    return static_cast<std::size_t>(
        std::distance(fs::directory_iterator(dir_), fs::directory_iterator()));
  }

  fs::path dir_;
};

TEST_F(StreamFiles, SavedBytesLoadBackWithLowerBoundOne) {
  const Bytes ten{0, 1, 2, 3, 4, 5, 6, 7, 8, 0xFF};
  const ByteArray a = stream_of(ten);
  ASSERT_TRUE(streams().StreamSave(name_of(path("s.bin")), a));
  EXPECT_EQ(file_bytes(path("s.bin")), ten);  // no header, no length

  ByteArray back = stream_of({9});
  ASSERT_TRUE(streams().StreamLoad(name_of(path("s.bin")), back));
  EXPECT_EQ(back.lbound(), 1);
  EXPECT_EQ(back.ubound(), 10);
  EXPECT_EQ(contents(back), ten);

  // Whatever the lower bound, only the elements are written.
  ASSERT_TRUE(streams().StreamSave(name_of(path("t.bin")), stream_of({7, 8}, -5)));
  EXPECT_EQ(file_bytes(path("t.bin")), (Bytes{7, 8}));
  // A name near the length limit still gets its temporary file; a name
  // beyond ASCII (U+00A9, two bytes in UTF-8) names the same file.
  ASSERT_TRUE(streams().StreamSave(name_of(path(std::string(250, 'n'))), a));
  EXPECT_EQ(file_bytes(path(std::string(250, 'n'))), ten);
  ASSERT_TRUE(streams().StreamSave(name_of(path("s\xC2\xA9.bin")), a));
  EXPECT_EQ(file_bytes(path("s\xC2\xA9.bin")), ten);
  EXPECT_EQ(entries_in_dir(), 4u);  // no temporary file left beside them
}

TEST_F(StreamFiles, SavingReplacesALongerFileWhole) {
  write_file(path("s.bin"), Bytes(100, 0xAB));
  ASSERT_TRUE(streams().StreamSave(name_of(path("s.bin")), stream_of({1, 2, 3})));
  EXPECT_EQ(file_bytes(path("s.bin")), (Bytes{1, 2, 3}));
  // An empty stream (bounds 0 to -1) saves an empty file.
  ASSERT_TRUE(streams().StreamSave(name_of(path("s.bin")), ByteArray(0, -1)));
  EXPECT_EQ(file_bytes(path("s.bin")), Bytes{});
}

TEST_F(StreamFiles, AFailedSaveLeavesTheEarlierFileIntact) {
  const Bytes earlier{5, 6, 7};
  write_file(path("s.bin"), earlier);
  EXPECT_FALSE(streams().StreamSave(name_of(path("s.bin")), ByteArray()));  // no bounds
  EXPECT_EQ(file_bytes(path("s.bin")), earlier);
  EXPECT_EQ(entries_in_dir(), 1u);

  // A directory under the name cannot be replaced by a file.
  fs::create_directory(path("d"));
  EXPECT_FALSE(streams().StreamSave(name_of(path("d")), stream_of({1})));
  EXPECT_TRUE(fs::is_directory(path("d")));
  EXPECT_EQ(entries_in_dir(), 2u);  // the temporary file is gone again

  EXPECT_FALSE(streams().StreamSave(name_of(path("missing/s.bin")), stream_of({1})));
  EXPECT_FALSE(streams().StreamSave(u"", stream_of({1})));
  EXPECT_FALSE(
      streams().StreamSave(name_of(path("nul")) + String(1, u'\0') + u"x", stream_of({1})));
  EXPECT_EQ(entries_in_dir(), 2u);
}

TEST_F(StreamFiles, SavingKeepsPermissionsFollowsLinksAndWritesDevicesInPlace) {
  write_file(path("secret.bin"), Bytes(9, 1));
  fs::permissions(path("secret.bin"), fs::perms::owner_read | fs::perms::owner_write);
  fs::create_symlink("secret.bin", path("link.bin"));
  ASSERT_TRUE(streams().StreamSave(name_of(path("link.bin")), stream_of({1, 2})));
  EXPECT_TRUE(fs::is_symlink(path("link.bin")));
  EXPECT_EQ(file_bytes(path("secret.bin")), (Bytes{1, 2}));
  EXPECT_EQ(fs::status(path("secret.bin")).permissions(),
            fs::perms::owner_read | fs::perms::owner_write);
  // A device node of its own (when this process may make one) stays a device.
  if (::mknod(path("null").c_str(), S_IFCHR | 0666, ::makedev(1, 3)) == 0) {
    ASSERT_TRUE(streams().StreamSave(name_of(path("null")), stream_of({1, 2})));
    EXPECT_TRUE(fs::is_character_file(path("null")));
  }
  EXPECT_EQ(entries_in_dir(), fs::exists(path("null")) ? 3u : 2u);  // no temporary file left
}

TEST_F(StreamFiles, LoadingNothingLeavesTheArrayAlone) {
  const ByteArray before = stream_of({4, 5}, 0);
  ByteArray a = before;
  write_file(path("empty.bin"), {});
  EXPECT_FALSE(streams().StreamLoad(name_of(path("empty.bin")), a));
  EXPECT_FALSE(streams().StreamLoad(name_of(path("missing.bin")), a));
  EXPECT_FALSE(streams().StreamLoad(name_of(dir_), a));  // a directory
  EXPECT_FALSE(streams().StreamLoad(u"", a));
  EXPECT_EQ(a, before);
}

}  // namespace
}  // namespace kvdata
