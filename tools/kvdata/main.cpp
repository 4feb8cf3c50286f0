// kvdata: inspect, convert, compute and plot the streams and measurements of
// a measuring station.
#include <CLI/CLI.hpp>

#include <exception>
#include <iostream>
#include <new>

#include "commands/commands.hpp"
#include "kvdata/automation/error.hpp"
#include "kvdata/automation/event_log.hpp"
#include "kvdata/automation/text.hpp"
#include "support/errors.hpp"
#include "support/files.hpp"

int main(int argc, char** argv) {
  using namespace kvdata::cli;
  install_signal_cleanup();
  // The library's event-log entries (field-codec failures) go to standard
  // error rather than the system log: they belong to this run.
  kvdata::EventLog::SetSink([](const kvdata::String& text) {
    std::cerr << "kvdata: library: " << kvdata::to_utf8(text) << '\n';
  });

  CLI::App app{"kvdata: inspect, convert, compute and plot KVData streams and measurements"};
  app.require_subcommand(1);
  app.footer("Run 'kvdata SUBCOMMAND --help' for the options and an example of each.");
  add_decode(app);
  add_encode(app);
  add_explain(app);
  add_plot(app);
  add_colour(app);
  add_spread(app);

  try {
    app.parse(argc, argv);
  } catch (const CLI::ParseError& e) {
    const int code = app.exit(e);
    return code == 0 ? kExitOk : kExitBadUsage;
  } catch (const UsageError& e) {
    std::cerr << "kvdata: " << e.what() << '\n';
    return kExitBadUsage;
  } catch (const InputError& e) {
    std::cerr << "kvdata: " << e.what() << '\n';
    return kExitBadInput;
  } catch (const kvdata::Error& e) {
    std::cerr << "kvdata: " << e.what() << '\n';
    return kExitBadInput;
  } catch (const std::bad_alloc&) {
    const std::string what = Activity::current();
    std::cerr << "kvdata: " << (what.empty() ? "" : what + ": ") << "out of memory\n";
    return kExitBadInput;
  } catch (const std::exception& e) {
    std::cerr << "kvdata: " << e.what() << '\n';
    return kExitBadInput;
  }
  return kExitOk;
}
