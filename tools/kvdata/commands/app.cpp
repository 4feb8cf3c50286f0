#include "commands/app.hpp"

#include <algorithm>
#include <cstdint>
#include <iostream>
#include <string_view>

#include "commands/commands.hpp"
#include "support/errors.hpp"
#include "support/notes.hpp"
#include "wire/stream_kind.hpp"

namespace kvdata::cli {
namespace {

// Shows a positional argument by its option text ("[KIND] FILE"), when it
// has one, in the usage line and the list of positionals.
class Formatter : public CLI::Formatter {
 public:
  std::string make_option_usage(const CLI::Option* opt) const override {
    if (!opt->get_option_text().empty()) return opt->get_option_text();
    return CLI::Formatter::make_option_usage(opt);
  }
  std::string make_option_name(const CLI::Option* opt, bool positional) const override {
    if (positional && !opt->get_option_text().empty()) return opt->get_option_text();
    return CLI::Formatter::make_option_name(opt, positional);
  }
  std::string make_option_opts(const CLI::Option* opt) const override {
    if (opt->get_positional()) return "";
    return CLI::Formatter::make_option_opts(opt);
  }
};

std::vector<const CLI::App*> subcommands_of(const CLI::App& app) {
  return app.get_subcommands([](const CLI::App*) { return true; });
}

std::string subcommand_list(const CLI::App& app) {
  std::string list;
  for (const CLI::App* sub : subcommands_of(app)) {
    if (!list.empty()) list += ", ";
    list += sub->get_name();
  }
  return list;
}

void add_help(CLI::App& app) {
  auto topic = std::make_shared<std::string>();
  CLI::App* cmd = app.add_subcommand("help", "Show the help of kvdata or of one subcommand");
  cmd->add_option("SUBCOMMAND", *topic, "The subcommand to show the help of");
  // Its word is a subcommand's name, not a subcommand to run.
  cmd->fallthrough(false);
  cmd->footer("Example:\n  kvdata help decode");
  cmd->callback([&app, topic] {
    if (topic->empty()) {
      // Not app.help(): that is the help of the subcommand given, this one.
      std::cout << app.get_formatter()->make_help(&app, app.get_name(), CLI::AppFormatMode::Normal);
      return;
    }
    for (const CLI::App* sub : subcommands_of(app)) {
      if (sub->get_name() == *topic) {
        std::cout << sub->help(app.get_name());
        return;
      }
    }
    bad_usage("unknown subcommand \"" + *topic +
              "\"; the subcommands are: " + subcommand_list(app));
  });
}

// Adds the option names of a command ("-o", "--output") to `words`, each
// once; positionals and hidden options are left out.
void add_option_words(const CLI::App& app, std::vector<std::string>& words) {
  const auto add = [&](const std::string& word) {
    if (std::find(words.begin(), words.end(), word) == words.end()) words.push_back(word);
  };
  for (const CLI::Option* opt : app.get_options()) {
    if (opt->get_positional() || opt->get_group().empty()) continue;
    for (const std::string& name : opt->get_snames()) add("-" + name);
    for (const std::string& name : opt->get_lnames()) add("--" + name);
  }
}

}  // namespace

std::unique_ptr<CLI::App> make_app(const std::string& version) {
  auto app = std::make_unique<CLI::App>(
      "kvdata: inspect, convert, compute and plot KVData streams and measurements", "kvdata");
  // Set before the subcommands are added: they take these over.
  app->formatter(std::make_shared<Formatter>());
  app->fallthrough();
  app->require_subcommand(1);
  app->set_version_flag("--version", "kvdata " + version, "Show the version of kvdata and exit");
  app->add_flag_function(
      "-q,--quiet", [](std::int64_t) { set_quiet(true); },
      "Say nothing on standard error but warnings and errors (no identification note)");
  app->add_flag_function(
      "-v,--verbose", [](std::int64_t) { set_verbose(true); },
      "Show the library's own log entries under the command's messages");
  app->footer(
      "Run 'kvdata help SUBCOMMAND' or 'kvdata SUBCOMMAND --help' for the options and an example "
      "of each.");
  add_decode(*app);
  add_encode(*app);
  add_explain(*app);
  add_plot(*app);
  add_colour(*app);
  add_spread(*app);
  add_help(*app);
  return app;
}

void check_subcommand(const CLI::App& app, int argc, const char* const* argv) {
  for (int i = 1; i < argc; ++i) {
    const std::string_view word = argv[i];
    if (word.starts_with('-')) continue;
    for (const CLI::App* sub : subcommands_of(app)) {
      if (sub->get_name() == word) return;
    }
    bad_usage("unknown subcommand \"" + std::string(word) +
              "\"; the subcommands are: " + subcommand_list(app));
  }
}

std::string completion_words(const CLI::App& app) {
  std::vector<std::string> names;
  for (const CLI::App* sub : subcommands_of(app)) names.push_back(sub->get_name());
  const auto line = [](const std::string& name, const std::vector<std::string>& words) {
    std::string text = name;
    for (const std::string& w : words) text += " " + w;
    return text + "\n";
  };
  std::vector<std::string> words = names;
  add_option_words(app, words);
  std::string text = line(app.get_name(), words);
  for (const CLI::App* sub : subcommands_of(app)) {
    words.clear();
    add_option_words(*sub, words);
    add_option_words(app, words);  // the options every run takes
    for (const CLI::Option* opt : sub->get_options()) {
      if (opt->get_positional() && opt->get_option_text().starts_with("[KIND]")) {
        for (const KindInfo& k : all_kinds()) words.emplace_back(k.name);
      }
    }
    if (sub->get_name() == "help") words.insert(words.end(), names.begin(), names.end());
    text += line(sub->get_name(), words);
  }
  return text;
}

}  // namespace kvdata::cli
