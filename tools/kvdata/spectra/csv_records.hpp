#pragma once
// The records of a CSV text, one at a time, read from a source in blocks so
// that a file of any length needs only a block and the current record in
// memory. Quoted cells may hold separators, doubled quotes and line breaks;
// a quote opens a quoted cell only as the cell's first character. Lines end
// in LF, CRLF or CR. Empty lines and lines that start with # are skipped
// (a quoted first cell that starts with # is data). The separator is a
// comma, or a semicolon or tab when the first line has no comma.
//
//   CsvRecords records(path, [&](char* to, std::size_t room) { return read(fd, to, room); });
//   while (records.next()) for (std::string_view cell : records.cells()) ...

#include <array>
#include <cstddef>
#include <functional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace kvdata::cli {

class CsvRecords {
 public:
  // Puts up to `room` bytes at `to`; returns how many, 0 at the end.
  using Source = std::function<std::size_t(char* to, std::size_t room)>;

  // `path` names the file in messages. Reads the first line to choose the
  // separator. The source is read in blocks of `block_bytes` (a record
  // longer than that grows the buffer).
  CsvRecords(std::string path, Source source, std::size_t block_bytes = std::size_t{1} << 20);
  // Over a text held whole: one block the size of the text.
  CsvRecords(std::string path, std::string_view text);

  char separator() const { return separator_; }

  // Moves to the next record that is neither empty nor a comment; false at
  // the end. InputError names the line of a quoted cell that is not closed.
  bool next();
  // The current record's cells, valid until the next call to next().
  std::span<const std::string_view> cells() const { return cells_; }
  // True when the current record's cells are views into the block read: then
  // kReadAhead bytes after the end of each cell may be read (their values
  // are whatever follows in the block, or unspecified).
  bool cells_in_block() const { return in_block_; }
  static constexpr std::size_t kReadAhead = 8;
  // A record longer than this or with more cells is refused, naming its
  // line, rather than held: no measurement file comes near either.
  static constexpr std::size_t kMaxRecordBytes = std::size_t{1} << 20;
  static constexpr std::size_t kMaxCells = 2048;
  // The line on which the current record starts (1-based).
  std::size_t line() const { return record_line_; }
  // Bytes taken from the source so far.
  std::size_t bytes_read() const { return bytes_read_; }
  // The bytes read but not yet parsed, at most `n` of them, for a look at
  // what a file holds.
  std::string_view peek(std::size_t n) const;

 private:
  enum class Step { Record, NeedMore, End };
  Step parse_plain();
  Step parse_quoted();
  bool more();
  void finish(std::size_t next_begin, std::size_t next_line);
  [[noreturn]] void too_large(const char* what, std::size_t limit) const;

  std::string path_;
  Source source_;
  std::vector<char> buffer_;
  std::size_t begin_ = 0;  // start of the unparsed bytes
  std::size_t end_ = 0;    // end of the bytes read
  bool at_end_ = false;    // the source has nothing more
  std::size_t bytes_read_ = 0;
  std::size_t line_ = 1;  // line at begin_
  std::size_t record_line_ = 0;
  char separator_ = ',';
  std::array<bool, 256> ends_cell_{};  // the separator, CR and LF
  std::vector<std::string_view> cells_;
  std::vector<std::string> owned_;  // cells of a record with quoted cells
  bool in_block_ = false;
};

}  // namespace kvdata::cli
