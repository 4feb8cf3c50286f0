#pragma once
// The subcommands of kvdata. Each adds itself to the application with its
// options, help text and example; its callback does the work and reports
// failure by raising InputError or UsageError (support/errors.hpp).
//
//   CLI::App app{"kvdata"};
//   add_decode(app);  add_explain(app);

#include <CLI/CLI.hpp>

namespace kvdata::cli {

void add_decode(CLI::App& app);
void add_encode(CLI::App& app);
void add_explain(CLI::App& app);
void add_colour(CLI::App& app);
void add_spread(CLI::App& app);
void add_plot(CLI::App& app);

}  // namespace kvdata::cli
