#include "spectra/csv_records.hpp"

#include <algorithm>
#include <cstring>
#include <initializer_list>

#include "support/errors.hpp"

namespace kvdata::cli {
CsvRecords::CsvRecords(std::string path, Source source, std::size_t block_bytes)
    : path_(std::move(path)),
      source_(std::move(source)),
      buffer_(std::max<std::size_t>(block_bytes, 1) + kReadAhead) {
  // The separator comes from the first line, up to its LF (or the whole text).
  const char* newline = nullptr;
  while (newline == nullptr) {
    newline = static_cast<const char*>(std::memchr(buffer_.data(), '\n', end_));
    if (newline == nullptr && !more()) break;
  }
  const std::string_view first(
      buffer_.data(),
      newline == nullptr ? end_ : static_cast<std::size_t>(newline - buffer_.data()));
  if (first.find(',') != std::string_view::npos) {
    separator_ = ',';
  } else if (first.find(';') != std::string_view::npos) {
    separator_ = ';';
  } else if (first.find('\t') != std::string_view::npos) {
    separator_ = '\t';
  }
  for (const char c : {separator_, '\n', '\r'}) ends_cell_[static_cast<unsigned char>(c)] = true;
}

CsvRecords::CsvRecords(std::string path, std::string_view text)
    : CsvRecords(
          std::move(path),
          [text, at = std::size_t{0}](char* to, std::size_t room) mutable {
            const std::size_t n = std::min(room, text.size() - at);
            std::memcpy(to, text.data() + at, n);
            at += n;
            return n;
          },
          text.size() + 1) {}

std::string_view CsvRecords::peek(std::size_t n) const {
  return std::string_view(buffer_.data() + begin_, std::min(n, end_ - begin_));
}

// Reads another block behind the unparsed bytes (moved to the front, the
// buffer grown when a record fills it); false when the source has ended.
bool CsvRecords::more() {
  if (at_end_) return false;
  // Only an unfinished record asks for more: [begin_, end_) is its start.
  if (end_ - begin_ > kMaxRecordBytes) too_large("bytes", kMaxRecordBytes);
  if (begin_ > 0) {
    std::memmove(buffer_.data(), buffer_.data() + begin_, end_ - begin_);
    end_ -= begin_;
    begin_ = 0;
  }
  // The last kReadAhead bytes are never filled: cells may be read past their end.
  const std::size_t room = buffer_.size() - kReadAhead;
  if (end_ == room) buffer_.resize(2 * room + kReadAhead);
  const std::size_t n = source_(buffer_.data() + end_, buffer_.size() - kReadAhead - end_);
  if (n == 0) {
    at_end_ = true;
  }
  end_ += n;
  bytes_read_ += n;
  return true;
}

void CsvRecords::too_large(const char* what, std::size_t limit) const {
  bad_input(path_ + " line " + std::to_string(line_) + ": more than " + std::to_string(limit) +
            " " + what + " in one record; no measurement file holds such a line");
}

void CsvRecords::finish(std::size_t next_begin, std::size_t next_line) {
  if (next_begin - begin_ > kMaxRecordBytes + 2) too_large("bytes", kMaxRecordBytes);
  record_line_ = line_;
  begin_ = next_begin;
  line_ = next_line;
}

// A record without quoted cells: cells are views into the buffer. Hands over
// to parse_quoted() at the first cell that starts with a quote.
CsvRecords::Step CsvRecords::parse_plain() {
  const char* const base = buffer_.data();
  const char* p = base + begin_;
  const char* const e = base + end_;
  if (p == e) return at_end_ ? Step::End : Step::NeedMore;
  cells_.clear();
  const char sep = separator_;
  for (;;) {
    if (p < e && *p == '"') return parse_quoted();
    const char* const cell = p;
    while (p < e && !ends_cell_[static_cast<unsigned char>(*p)]) ++p;
    if (p == e) {
      if (!at_end_) return Step::NeedMore;
      cells_.emplace_back(cell, static_cast<std::size_t>(p - cell));
      in_block_ = true;
      finish(end_, line_);
      return Step::Record;
    }
    cells_.emplace_back(cell, static_cast<std::size_t>(p - cell));
    if (cells_.size() > kMaxCells) too_large("cells", kMaxCells);
    if (*p == sep) {
      ++p;
      continue;
    }
    if (*p == '\r') {
      if (p + 1 == e && !at_end_) return Step::NeedMore;
      if (p + 1 < e && p[1] == '\n') ++p;
    }
    in_block_ = true;
    finish(static_cast<std::size_t>(p + 1 - base), line_ + 1);
    return Step::Record;
  }
}

// A record with quoted cells, character by character from its start; its
// cells are copied out with their quotes resolved.
CsvRecords::Step CsvRecords::parse_quoted() {
  const char* const base = buffer_.data();
  const char* const e = base + end_;
  owned_.clear();
  std::string cell;
  bool quoted = false;
  std::size_t line = line_;
  const char sep = separator_;
  auto done = [&](const char* next) {
    in_block_ = false;
    owned_.push_back(std::move(cell));
    cells_.assign(owned_.begin(), owned_.end());
    finish(static_cast<std::size_t>(next - base), line);
    return Step::Record;
  };
  for (const char* p = base + begin_; p < e; ++p) {
    if (static_cast<std::size_t>(p - base) - begin_ > kMaxRecordBytes) {
      too_large("bytes", kMaxRecordBytes);
    }
    const char c = *p;
    if (quoted) {
      if (c == '"' && p + 1 == e && !at_end_) return Step::NeedMore;
      if (c == '"' && p + 1 < e && p[1] == '"') {
        cell += '"';
        ++p;
      } else if (c == '"') {
        quoted = false;
      } else {
        if (c == '\n') ++line;
        cell += c;
      }
    } else if (c == '"' && cell.empty()) {
      quoted = true;
    } else if (c == sep) {
      owned_.push_back(std::move(cell));
      cell.clear();
      if (owned_.size() > kMaxCells) too_large("cells", kMaxCells);
    } else if (c == '\n' || c == '\r') {
      if (c == '\r' && p + 1 == e && !at_end_) return Step::NeedMore;
      if (c == '\r' && p + 1 < e && p[1] == '\n') ++p;
      ++line;
      return done(p + 1);
    } else {
      cell += c;
    }
  }
  if (!at_end_) return Step::NeedMore;
  if (quoted) {
    bad_input(path_ + " line " + std::to_string(line_) + ": a quoted cell is not closed");
  }
  return done(e);
}

bool CsvRecords::next() {
  for (;;) {
    // Where the record starts: parsing leaves the bytes in place, so its
    // first byte is still there once it has been read.
    const std::size_t start = begin_;
    const Step step = parse_plain();
    if (step == Step::End) return false;
    if (step == Step::NeedMore) {
      more();
      continue;
    }
    const bool blank = cells_.size() == 1 && cells_[0].empty();
    // Only a # as the line's first byte makes a comment: a quoted first cell
    // that starts with # is data (the way to write a sample named "#3").
    const bool comment = buffer_[start] == '#';
    if (!blank && !comment) return true;
  }
}

}  // namespace kvdata::cli
