// The parts the streaming commands are built from: CSV records read in
// pieces, CGATS written in pieces, output files and
// the spool.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <filesystem>
#include <fstream>

#include "command_runner.hpp"
#include "spectra/cgats_reader.hpp"
#include "spectra/cgats_writer.hpp"
#include "spectra/csv_records.hpp"
#include "support/errors.hpp"
#include "support/files.hpp"
#include "support/spool.hpp"

namespace kvdata::cli {
namespace {

using test::Scratch;
using test::slurp;
using test::spill;

struct Record {
  std::size_t line;
  std::vector<std::string> cells;
  friend bool operator==(const Record&, const Record&) = default;
};

std::vector<Record> records_of(CsvRecords records) {
  std::vector<Record> out;
  while (records.next()) {
    out.push_back({records.line(), {records.cells().begin(), records.cells().end()}});
  }
  return out;
}

// A source that hands out the text `step` bytes at a time.
CsvRecords::Source trickle(const std::string& text, std::size_t step) {
  return [&text, step, at = std::size_t{0}](char* to, std::size_t room) mutable {
    const std::size_t n = std::min({step, room, text.size() - at});
    std::memcpy(to, text.data() + at, n);
    at += n;
    return n;
  };
}

TEST(StreamingParts, CsvRecordsInPiecesAsWhole) {
  const std::string text =
      "# head\r\nname;a;b\r\n\r\n\"x;y\";\"say \"\"hi\"\"\";3\rplain;\"two\nlines\";\r\n"
      "\"\"\"q\";\"\"\"\";q\"x\n#skip;\"\n\";1\n;\n\"#quoted\";2;3\n\"\"\nlast;1;2";
  const std::vector<Record> expected = {
      {2, {"name", "a", "b"}},
      {4, {"x;y", "say \"hi\"", "3"}},
      {5, {"plain", "two\nlines", ""}},
      {7, {"\"q", "\"", "q\"x"}},
      {10, {"", ""}},
      {11, {"#quoted", "2", "3"}},
      {13, {"last", "1", "2"}},
  };
  // The separator comes from the first line alone.
  CsvRecords whole("t.csv", std::string_view(text));
  EXPECT_EQ(whole.separator(), ',');
  // With ';' on the first line:
  const std::string semi = "name;a;b\n" + text.substr(text.find("\r\n\r\n") + 4);
  EXPECT_EQ(CsvRecords("t.csv", std::string_view(semi)).separator(), ';');

  const std::string body = "#;\n" + text.substr(text.find('\n') + 1);
  const auto all = records_of(CsvRecords("t.csv", std::string_view(body)));
  ASSERT_EQ(all, expected);
  for (std::size_t step : {1u, 2u, 3u, 7u}) {
    EXPECT_EQ(records_of(CsvRecords("t.csv", trickle(body, step))), expected) << step;
    // Blocks smaller than a record: the buffer grows and keeps its place.
    EXPECT_EQ(records_of(CsvRecords("t.csv", trickle(body, step), 4)), expected) << step;
  }

  // A record longer than the reading buffer grows it, up to the limit.
  const std::string huge =
      "a,b\n\"" + std::string(CsvRecords::kMaxRecordBytes - 8, 'z') + "\",1\nc,2\n";
  const auto big = records_of(CsvRecords("t.csv", trickle(huge, 1 << 16), 1 << 16));
  ASSERT_EQ(big.size(), 3u);
  EXPECT_EQ(big[1].cells[0].size(), CsvRecords::kMaxRecordBytes - 8);
  EXPECT_EQ(big[2], (Record{3, {"c", "2"}}));
  const std::string past = "a,b\n" + std::string(CsvRecords::kMaxRecordBytes + 8, 'z') + "\n";
  EXPECT_THROW(records_of(CsvRecords("t.csv", trickle(past, 1 << 16))), InputError);

  // An open quote names the line it starts on, however the text arrives.
  const std::string open = "a,b\n1,2\n3,\"4\n5\n";
  for (std::size_t step : {1u, 100u}) {
    try {
      records_of(CsvRecords("o.csv", trickle(open, step)));
      ADD_FAILURE() << "no error";
    } catch (const InputError& e) {
      EXPECT_STREQ(e.what(), "o.csv line 3: a quoted cell is not closed");
    }
  }
}

TEST(StreamingParts, CgatsWithoutSets) {
  const std::vector<std::string> fields = {"SAMPLE_NAME", "SPECTRAL_NM360"};
  // No sets: no data section (Little CMS refuses an empty one), and the file
  // reads back as a table without sets.
  const std::string none = write_cgats("none", fields, {});
  const std::string end =
      "NUMBER_OF_SETS\t0\nBEGIN_DATA_FORMAT\n SAMPLE_NAME\tSPECTRAL_NM360\nEND_DATA_FORMAT\n";
  ASSERT_GE(none.size(), end.size());
  EXPECT_EQ(none.substr(none.size() - end.size()), end);
  Scratch s;
  const std::string empty = s.path("empty.cgats");
  spill(empty, none);
  EXPECT_TRUE(read_cgats(empty).rows.empty());
  // A set with another number of cells than there are fields is refused.
  EXPECT_THROW(write_cgats("d", fields, {{"only a name"}}), InputError);
}

TEST(StreamingParts, OutputFileAllOrNothing) {
  Scratch s;
  const std::string target = s.path("out.txt");
  spill(target, "before");
  {
    OutputFile out(target);
    out.write(std::string(3 << 20, 'a'));
    out.write("tail");
  }  // dropped: a failure part way
  EXPECT_EQ(slurp(target), "before");
  EXPECT_EQ(std::distance(std::filesystem::directory_iterator(s.dir()),
                          std::filesystem::directory_iterator()),
            1);
  OutputFile out(target);
  out.write(std::string(3 << 20, 'a'));
  out.write("tail");
  out.commit();
  EXPECT_EQ(slurp(target), std::string(3 << 20, 'a') + "tail");
  EXPECT_THROW({ OutputFile missing(s.path("absent/out.txt")); }, InputError);
}

TEST(StreamingParts, SpoolGivesBackWhatWasSetAside) {
  // Held in memory, and past the 8 MB that memory holds before a file takes the rest.
  for (std::size_t total : {std::size_t{10}, std::size_t{9} << 20}) {
    Spool spool;
    std::string expected;
    for (std::size_t i = 0; expected.size() < total; ++i) {
      const std::string piece = std::to_string(i) + std::string(i % 64, ';');
      spool.append(piece);
      expected += piece;
    }
    spool.rewind();
    std::string back(expected.size(), '\0');
    ASSERT_TRUE(spool.read(back.data(), 3));
    EXPECT_EQ(spool.read_some(back.data() + 3, back.size()), back.size() - 3);
    EXPECT_EQ(back, expected) << total;
    char more = 0;
    EXPECT_FALSE(spool.read(&more, 1));
  }
}

}  // namespace
}  // namespace kvdata::cli
