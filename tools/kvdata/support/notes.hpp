#pragma once
// What the command says on standard error besides its results and its
// errors: notes (the identification of a stream) that -q silences, and
// whether -v asked for the library's own log under the command's messages.
//
//   set_quiet(true);
//   note(file + ": identified as a user stream ...");   // nothing is written

#include <string>

namespace kvdata::cli {

void set_quiet(bool quiet);
void set_verbose(bool verbose);
bool verbose();

// "kvdata: <text>" on standard error, unless quiet.
void note(const std::string& text);

}  // namespace kvdata::cli
