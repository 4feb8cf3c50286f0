#pragma once
// Runs the built kvdata command for the scenario tests and captures its exit
// code, standard output and standard error.
//
//   Run r = kvdata({"decode", example("streams/user.kvs")});
//   EXPECT_EQ(r.code, 0);

#include <fcntl.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <sstream>
#include <string>
#include <vector>

extern char** environ;

namespace kvdata::cli::test {

struct Run {
  int code = -1;
  std::string out;
  std::string err;
};

inline std::string slurp(const std::filesystem::path& p) {
  std::ifstream in(p, std::ios::binary);
  return std::string((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
}

inline void spill(const std::filesystem::path& p, const std::string& bytes) {
  std::ofstream(p, std::ios::binary) << bytes;
}

inline std::string example(const std::string& relative) {
  return std::string(KVDATA_SOURCE_DIR) + "/examples/" + relative;
}

// The rows of a table in tests/cli/data: the cells of each line that is
// neither blank nor a comment, split at "|" and trimmed.
inline std::vector<std::vector<std::string>> table_rows(const std::string& name) {
  std::ifstream in(std::string(KVDATA_SOURCE_DIR) + "/tests/cli/data/" + name);
  std::vector<std::vector<std::string>> rows;
  for (std::string line; std::getline(in, line);) {
    if (line.empty() || line[0] == '#') continue;
    std::vector<std::string> cells;
    std::stringstream parts(line + " ");
    for (std::string cell; std::getline(parts, cell, '|');) {
      const auto first = cell.find_first_not_of(' ');
      cells.push_back(first == std::string::npos
                          ? ""
                          : cell.substr(first, cell.find_last_not_of(' ') - first + 1));
    }
    rows.push_back(std::move(cells));
  }
  return rows;
}

// A scratch folder of its own for each test, removed afterwards.
class Scratch {
 public:
  Scratch() {
    std::string pattern = (std::filesystem::temp_directory_path() / "kvdata-cli-XXXXXX").string();
    dir_ = ::mkdtemp(pattern.data());
  }
  ~Scratch() {
    std::error_code ec;
    std::filesystem::remove_all(dir_, ec);
  }
  Scratch(const Scratch&) = delete;
  Scratch& operator=(const Scratch&) = delete;
  std::string path(const std::string& name) const { return (dir_ / name).string(); }
  const std::filesystem::path& dir() const { return dir_; }

 private:
  std::filesystem::path dir_;
};

inline Run kvdata(const std::vector<std::string>& args) {
  Scratch scratch;
  const std::string out = scratch.path("stdout");
  const std::string err = scratch.path("stderr");
  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  posix_spawn_file_actions_addopen(&actions, STDIN_FILENO, "/dev/null", O_RDONLY, 0);
  posix_spawn_file_actions_addopen(&actions, STDOUT_FILENO, out.c_str(),
                                   O_WRONLY | O_CREAT | O_TRUNC, 0600);
  posix_spawn_file_actions_addopen(&actions, STDERR_FILENO, err.c_str(),
                                   O_WRONLY | O_CREAT | O_TRUNC, 0600);
  std::vector<std::string> owned = {KVDATA_CLI_PATH};
  owned.insert(owned.end(), args.begin(), args.end());
  std::vector<char*> argv;
  for (auto& a : owned) argv.push_back(a.data());
  argv.push_back(nullptr);
  pid_t pid = 0;
  Run run;
  if (posix_spawn(&pid, KVDATA_CLI_PATH, &actions, nullptr, argv.data(), environ) == 0) {
    int status = 0;
    ::waitpid(pid, &status, 0);
    run.code = WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
  }
  posix_spawn_file_actions_destroy(&actions);
  run.out = slurp(out);
  run.err = slurp(err);
  return run;
}

}  // namespace kvdata::cli::test
