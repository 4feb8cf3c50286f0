#pragma once
// Writes a table as a CGATS.17 file through Little CMS, for results that
// other colour software reads (`kvdata colour --format cgats`).
//
//   std::string text = write_cgats("colour of white.csv", {"SAMPLE_ID", "LAB_L"}, rows);

#include <string>
#include <vector>

namespace kvdata::cli {

// `fields` are the DATA_FORMAT names, `rows` the sets (each as many cells as
// fields). Every cell reads back from the file as the text given: cells that
// would not (empty ones, ones with tabs, '#', quotes or bytes beyond ASCII,
// or numbers the reader would print otherwise) are quoted. A cell holding a
// double quote or a line break cannot be written: InputError. Quotes and
// line breaks in the descriptor become single quotes and blanks.
std::string write_cgats(const std::string& descriptor, const std::vector<std::string>& fields,
                        const std::vector<std::vector<std::string>>& rows);

}  // namespace kvdata::cli
