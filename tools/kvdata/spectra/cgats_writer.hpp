#pragma once
// Writes a table as a CGATS.17 file through Little CMS, for results that
// other colour software reads (`kvdata colour --format cgats`).
//
//   std::string text = write_cgats("colour of white.csv", {"SAMPLE_ID", "LAB_L"}, rows);

#include <string>
#include <vector>

namespace kvdata::cli {

// `fields` are the DATA_FORMAT names, `rows` the sets (each as many cells as
// fields). Texts with blanks are quoted by Little CMS.
std::string write_cgats(const std::string& descriptor, const std::vector<std::string>& fields,
                        const std::vector<std::vector<std::string>>& rows);

}  // namespace kvdata::cli
