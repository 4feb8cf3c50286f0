#pragma once
// The kvdata application as a whole: its subcommands, the options every run
// takes (-v, -q, --version), `kvdata help [SUBCOMMAND]`, the layout of its
// help (a command's stream arguments shown as "[KIND] FILE") and the words a
// shell completes, all taken from the one description of the command line.
//
//   auto app = make_app("1.2.0");
//   check_subcommand(*app, argc, argv);  app->parse(argc, argv);

#include <CLI/CLI.hpp>
#include <memory>
#include <string>

namespace kvdata::cli {

std::unique_ptr<CLI::App> make_app(const std::string& version);

// UsageError naming the first word that is not an option when it is no
// subcommand, with the list of subcommands.
void check_subcommand(const CLI::App& app, int argc, const char* const* argv);

// One line per command: its name ("kvdata" for the application itself) and
// the words that may follow it: subcommands, option names and, after a
// command that reads a stream, the KIND words.
std::string completion_words(const CLI::App& app);

}  // namespace kvdata::cli
