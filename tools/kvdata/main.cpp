// kvdata: inspect, convert, compute and plot the streams and measurements of
// a measuring station.
#include <CLI/CLI.hpp>

#include <exception>
#include <iostream>
#include <new>
#include <string>
#include <string_view>

#include "commands/app.hpp"
#include "kvdata/automation/error.hpp"
#include "support/errors.hpp"
#include "support/files.hpp"
#include "support/library_log.hpp"
#include "support/notes.hpp"

namespace {

// The command's message, with the library's log entries of this run folded
// under it.
int failed(const kvdata::cli::RunLog& log, const char* message, int code) {
  std::cerr << "kvdata: " << message << '\n' << log.folded(kvdata::cli::verbose());
  return code;
}

}  // namespace

int main(int argc, char** argv) {
  using namespace kvdata::cli;
  install_signal_cleanup();
  // The library's event-log entries (field-codec failures) belong to this
  // run: they are kept for the end rather than sent to the system log.
  const RunLog log;
  const auto app = make_app(KVDATA_VERSION);
  if (argc == 2 && std::string_view(argv[1]) == "--completion-words") {
    std::cout << completion_words(*app);
    return kExitOk;
  }
  try {
    check_subcommand(*app, argc, argv);
    app->parse(argc, argv);
  } catch (const CLI::ParseError& e) {
    const int code = app->exit(e);
    return code == 0 ? kExitOk : kExitBadUsage;
  } catch (const UsageError& e) {
    return failed(log, e.what(), kExitBadUsage);
  } catch (const InputError& e) {
    return failed(log, e.what(), kExitBadInput);
  } catch (const kvdata::Error& e) {
    return failed(log, e.what(), kExitBadInput);
  } catch (const std::bad_alloc&) {
    const std::string what = Activity::current();
    return failed(log, ((what.empty() ? "" : what + ": ") + "out of memory").c_str(),
                  kExitBadInput);
  } catch (const std::exception& e) {
    return failed(log, e.what(), kExitBadInput);
  }
  std::cerr << log.folded(verbose());
  return kExitOk;
}
