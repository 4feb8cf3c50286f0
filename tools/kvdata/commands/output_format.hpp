#pragma once
// The --format choice of the computing commands and how numbers are written
// in each: fixed decimals in the aligned table (for people), the shortest
// exact text of the Single in CSV and JSON (for programs).
//
//   cmd->add_option("--format", o->format)->check(format_check(true));
//   std::string cell = number_cell(value, format, 3);

#include <CLI/CLI.hpp>

#include <string>

#include "kvdata/automation/types.hpp"

namespace kvdata::cli {

// table, csv, json, and cgats when `with_cgats`.
CLI::Validator format_check(bool with_cgats);

// A Single for a table cell (fixed `decimals`) or a CSV/CGATS cell (shortest
// exact text); NaN as "NaN".
std::string number_cell(Single value, const std::string& format, int decimals);

// The same text appended to `out`, without a string of its own: `table`
// for the table's fixed decimals, otherwise the shortest exact text.
void append_number_cell(std::string& out, Single value, bool table, int decimals);

}  // namespace kvdata::cli
