#pragma once
// Writes a table as a CGATS.17 file through Little CMS, for results that
// other colour software reads (`kvdata colour --format cgats`).
//
//   std::string text = write_cgats("colour of white.csv", {"SAMPLE_ID", "LAB_L"}, rows);

#include <cstddef>
#include <string>
#include <vector>

namespace kvdata::cli {

// `fields` are the DATA_FORMAT names, `rows` the sets (each as many cells as
// fields). Every cell reads back from the file as the text given: cells that
// would not (empty ones, ones with tabs, '#', quotes or bytes beyond ASCII,
// or numbers the reader would print otherwise) are quoted. A cell holding a
// double quote or a line break cannot be written: InputError. Quotes and
// line breaks in the descriptor become single quotes and blanks. A set with
// another number of cells than `fields` is refused. The file is built from
// the pieces below, so a file written whole and one written in pieces agree.
std::string write_cgats(const std::string& descriptor, const std::vector<std::string>& fields,
                        const std::vector<std::vector<std::string>>& rows);

// The same file written in pieces, for more sets than are worth holding at
// once: cgats_head() (the properties, NUMBER_OF_SETS `sets`, the data format
// and BEGIN_DATA), then append_cgats_set() for each set, then cgats_tail().
// A file without sets has no data section at all: Little CMS refuses an
// empty one. A table of more sets than check_cgats_sets() allows is refused.
std::string cgats_head(const std::string& descriptor, const std::vector<std::string>& fields,
                       std::size_t sets);
template <class Cells>
void append_cgats_set(std::string& out, const Cells& cells);
inline const char* cgats_tail(std::size_t sets) {
  return sets > 0 ? "END_DATA\n" : "";
}

// InputError when a table of `sets` sets could not be read back: Little CMS
// reads at most kCgatsMostSets. A writer that learns the count as it goes
// calls this as it goes, so that it stops before doing all the work.
void check_cgats_sets(std::size_t sets);

// One cell of a set as it stands in the file.
void append_cgats_cell(std::string& out, const std::string& cell);

template <class Cells>
void append_cgats_set(std::string& out, const Cells& cells) {
  out += ' ';
  bool first = true;
  for (const std::string& cell : cells) {
    if (!first) out += '\t';
    first = false;
    append_cgats_cell(out, cell);
  }
  out += '\n';
}

}  // namespace kvdata::cli
