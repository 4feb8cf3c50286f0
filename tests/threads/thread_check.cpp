// The library under threads, as a station program uses it: eight threads at
// once, each on its own objects and arrays, sharing the predeclared Streams
// instance, the class table, the colour tables and the event log, while one
// of them swaps the log's sink in a loop. Built with ThreadSanitizer by the
// tsan preset; it also checks every result against one worked out before the
// threads start, and the log's promises:
//  - entries reach a sink one at a time;
//  - no entry reaches a sink after SetSink has replaced it and returned.
//
//   thread_check [ROUNDS]     (exit code 0 when every check held)
#include <syslog.h>
#include <unistd.h>

#include <atomic>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <functional>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "kvdata/kvdata.hpp"

// This program stands in for the host's system log, so that the entries
// written while no sink is set are counted here instead of filling the
// machine's log.
namespace {
std::atomic<long> system_log_entries{0};
}
extern "C" {
void syslog(int, const char*, ...) {
  ++system_log_entries;
}
void __syslog_chk(int, int, const char*, ...) {
  ++system_log_entries;
}
}

namespace {

using namespace kvdata;

std::atomic<long> failures{0};

void check(bool ok, const char* what) {
  if (!ok && failures++ < 10) std::fprintf(stderr, "thread_check: %s\n", what);
}

tSpectrum spectrum(float base) {
  tSpectrum s;
  for (Long b = 1; b <= 40; ++b) s.Data(b) = base + 0.5f * static_cast<float>(b);
  return s;
}

// A set of two tolerances streamed out and back in: the same bytes again.
void objects(int rounds) {
  for (int r = 0; r < rounds; ++r) {
    auto set = KVTolSet::create();
    set->ID(r);
    set->Description(u"Bench spectrophotometers");
    for (Long id : {Long{5}, Long{9}}) {
      auto tol = KVTolerance::create();
      tol->ID(id);
      tol->MaxFail(0.5 * id);
      set->Add(tol, Variant(id).to_string());
    }
    ByteArray out;
    check(set->StreamOut(out), "KVTolSet StreamOut");
    auto back = KVTolSet::create();
    check(back->StreamIn(out), "KVTolSet StreamIn");
    ByteArray again;
    check(back->StreamOut(again) && again == out, "KVTolSet round trip");
  }
}

// The predeclared Streams instance, shared by every thread.
void streams(int rounds) {
  Streams& s = Streams::instance();
  for (int r = 0; r < rounds; ++r) {
    tSCPair pair;
    pair.Spectrum(eSC::SCE) = spectrum(static_cast<float>(r));
    pair.Spectrum(eSC::SCI) = spectrum(static_cast<float>(r) + 4.0f);
    tStation station{u"{GUID}", u"Bench " + Variant(Long{r}).to_string(), u"bench@example.org"};
    ByteArray bytes(0, -1);
    Long at = 0;
    check(s.Stream_SCPair(eStreamDirection::ToStream, bytes, at, pair) &&
              s.Stream_Station(eStreamDirection::ToStream, bytes, at, station),
          "Streams writers");
    tSCPair pair_back;
    tStation station_back;
    at = 0;
    check(s.Stream_SCPair(eStreamDirection::FromStream, bytes, at, pair_back) &&
              s.Stream_Station(eStreamDirection::FromStream, bytes, at, station_back) &&
              pair_back == pair && station_back == station,
          "Streams readers");
  }
}

// StreamSave and StreamLoad, each thread on a file of its own.
void files(int rounds, const std::filesystem::path& folder, int id) {
  const String name = from_utf8((folder / ("stream" + std::to_string(id) + ".kvs")).string());
  for (int r = 0; r < rounds / 4; ++r) {
    ByteArray bytes(0, 63);
    for (Byte& b : bytes) b = static_cast<Byte>(r + id);
    ByteArray loaded;
    check(
        Streams::instance().StreamSave(name, bytes) && Streams::instance().StreamLoad(name, loaded),
        "StreamSave and StreamLoad");
    check(loaded.size() == 64 && loaded(1) == static_cast<Byte>(r + id), "the file's bytes");
  }
}

// The colour entry points against results worked out before the threads start.
void colour(int rounds, const Array<Single>& want_xyz, const std::vector<Single>& want_batch) {
  const auto ilu = ILU_D6510::create();
  const std::vector<tSpectrum> spectra{spectrum(10.0f), spectrum(40.0f), spectrum(70.0f)};
  for (int r = 0; r < rounds; ++r) {
    Array<Single> xyz(0, 2);
    ilu->calcXYZ(spectra[0], xyz);
    check(xyz == want_xyz, "calcXYZ");
    std::vector<Single> batch_xyz(9);
    std::vector<Single> batch_lab(9);
    check(calc_xyz_lab_d6510(spectra, batch_xyz, batch_lab) == 0 && batch_lab == want_batch,
          "calc_xyz_lab_d6510");
  }
}

void create_objects(int rounds) {
  for (int r = 0; r < rounds; ++r) {
    for (const CreatableClass& c : CreatableClasses()) {
      check(CreateObject(c.progid) != nullptr, "CreateObject");
    }
  }
}

// Failed reads, one event-log entry each: to a sink or to the system log,
// whichever is set at the time.
void failing_reads(int rounds) {
  const ByteArray short_stream(0, 1);
  for (int r = 0; r < rounds; ++r) {
    Long at = 0;
    Long value = 0;
    LongFromArray(short_stream, at, value);
    String text;
    at = 0;
    StringFromArray(short_stream, at, text);
  }
}

// The sinks the swapping thread sets, one fresh sink each round.
struct SinkState {
  std::atomic<bool> retired{false};
  std::atomic<long> entries{0};
};
std::atomic<int> inside_a_sink{0};
std::atomic<long> sink_entries{0};

EventLog::Sink counting_sink(const std::shared_ptr<SinkState>& state) {
  return [state](const String&) {
    check(inside_a_sink.fetch_add(1) == 0, "two entries in sinks at once");
    check(!state->retired.load(), "an entry reached a sink after SetSink replaced it");
    ++state->entries;
    ++sink_entries;
    std::this_thread::yield();  // a window for another entry or SetSink to come in
    check(!state->retired.load(), "SetSink returned while its sink was still running");
    inside_a_sink.fetch_sub(1);
  };
}

std::atomic<bool> writers_done{false};

// Waits until `reached` holds, or no more entries will come.
template <class Reached>
void wait_for(const Reached& reached) {
  while (!reached() && !writers_done) std::this_thread::yield();
}

// Sets a fresh sink and restores the previous destination (the system log),
// over and over while the failing reads go on: each sink stays until an
// entry has reached it, and the system log until one has reached that.
void swap_sinks() {
  while (!writers_done) {
    const auto state = std::make_shared<SinkState>();
    const EventLog::Sink previous = EventLog::SetSink(counting_sink(state));
    wait_for([&] { return state->entries > 0; });
    const long logged = system_log_entries;
    EventLog::SetSink(previous);
    state->retired = true;
    wait_for([&] { return system_log_entries > logged; });
  }
}

}  // namespace

int main(int argc, char** argv) {
  const int rounds = argc > 1 ? std::atoi(argv[1]) : 1000;
  const std::filesystem::path folder = std::filesystem::temp_directory_path() /
                                       ("kvdata_thread_check_" + std::to_string(::getpid()));
  std::filesystem::create_directories(folder);

  const auto ilu = ILU_D6510::create();
  Array<Single> want_xyz(0, 2);
  ilu->calcXYZ(spectrum(10.0f), want_xyz);
  const std::vector<tSpectrum> spectra{spectrum(10.0f), spectrum(40.0f), spectrum(70.0f)};
  std::vector<Single> xyz(9);
  std::vector<Single> want_batch(9);
  check(calc_xyz_lab_d6510(spectra, xyz, want_batch) == 0, "calc_xyz_lab_d6510");

  std::vector<std::thread> threads;
  threads.emplace_back(objects, rounds);
  threads.emplace_back(streams, rounds);
  threads.emplace_back(files, rounds, folder, 1);
  threads.emplace_back(colour, rounds, want_xyz, want_batch);
  threads.emplace_back(create_objects, rounds);
  std::thread writer_a(failing_reads, rounds);
  std::thread writer_b(failing_reads, rounds);
  threads.emplace_back(swap_sinks);
  writer_a.join();
  writer_b.join();
  writers_done = true;
  for (std::thread& t : threads) t.join();
  std::filesystem::remove_all(folder);

  check(sink_entries > 0, "no entry reached a sink");
  check(system_log_entries > 0, "no entry reached the system log");
  std::printf(
      "thread_check: %d rounds, %ld entries to sinks, %ld to the system log, %ld failures\n",
      rounds, sink_entries.load(), system_log_entries.load(), failures.load());
  return failures == 0 ? 0 : 1;
}
