#include "json/json_file.hpp"

#include <sys/stat.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <iterator>
#include <memory>
#include <vector>

#include "support/errors.hpp"

namespace kvdata::cli {
namespace {

struct FileCloser {
  void operator()(std::FILE* f) const {
    if (f != stdin) std::fclose(f);
  }
};

// The document's characters from the file, a block at a time, for the
// parser. A text or number longer than kMaxJsonToken is refused as it is
// read, before the parser's token can grow to hold it.
class Characters {
 public:
  Characters(std::FILE* file, const std::string& name) : file_(file), name_(name) { refill(); }

  bool at_end() const { return at_ == size_; }
  const char& current() const { return block_[at_]; }
  void advance() {
    take(block_[at_]);
    if (++at_ == size_) refill();
  }

  // An input iterator over the characters, as the parser reads them.
  class Iterator {
   public:
    using iterator_category = std::input_iterator_tag;
    using value_type = char;
    using difference_type = std::ptrdiff_t;
    using pointer = const char*;
    using reference = const char&;
    Iterator() = default;
    explicit Iterator(Characters* source) : source_(source) {}
    reference operator*() const { return source_->current(); }
    Iterator& operator++() {
      source_->advance();
      return *this;
    }
    bool operator==(const Iterator& other) const { return done() == other.done(); }

   private:
    bool done() const { return source_ == nullptr || source_->at_end(); }
    Characters* source_ = nullptr;
  };

 private:
  void refill() {
    at_ = 0;
    size_ = std::fread(block_, 1, sizeof block_, file_);
    if (size_ == 0 && std::ferror(file_))
      bad_input(name_ + ": read error: " + std::strerror(errno));
  }

  // Follows texts (with their escapes) and the runs of characters between
  // structural ones (numbers, literals), counting their length.
  void take(char c) {
    ++offset_;
    if (in_text_) {
      if (escaped_) {
        escaped_ = false;
      } else if (c == '\\') {
        escaped_ = true;
      } else if (c == '"') {
        in_text_ = false;
        run_ = 0;
        return;
      }
    } else if (c == '"') {
      in_text_ = true;
      run_ = 0;
      return;
    } else if (std::strchr("[]{}:, \t\r\n", c) != nullptr) {
      run_ = 0;
      return;
    }
    if (++run_ > kMaxJsonToken) {
      bad_input(name_ + ": byte " + std::to_string(offset_) + ": a " +
                (in_text_ ? "text" : "value") + " longer than " + std::to_string(kMaxJsonToken) +
                " bytes; no document of a stream holds one");
    }
  }

  std::FILE* file_;
  const std::string& name_;
  char block_[1 << 16];
  std::size_t at_ = 0;
  std::size_t size_ = 0;
  std::size_t offset_ = 0;
  std::size_t run_ = 0;
  bool in_text_ = false;
  bool escaped_ = false;
};

// Follows the parser's events to know where in the document it is, and
// refuses a container opened deeper than kMaxJsonDepth there.
class Nesting {
 public:
  explicit Nesting(const std::string& file) : file_(file) {}

  bool operator()(int depth, Json::parse_event_t event, Json& parsed) {
    using Event = Json::parse_event_t;
    switch (event) {
      case Event::object_start:
      case Event::array_start:
        if (depth >= kMaxJsonDepth) {
          bad_input(file_ + ": " + path() + ": nested deeper than " +
                    std::to_string(kMaxJsonDepth) + " levels; no document of a stream is");
        }
        frames_.push_back({event == Event::array_start, 0, {}});
        break;
      case Event::key:
        frames_.back().key = parsed.get<std::string>();
        break;
      case Event::object_end:
      case Event::array_end:
        frames_.pop_back();
        next_element();
        break;
      case Event::value:
        next_element();
        break;
    }
    return true;
  }

 private:
  struct Frame {
    bool array;
    std::size_t index;
    std::string key;
  };

  void next_element() {
    if (!frames_.empty() && frames_.back().array) ++frames_.back().index;
  }

  // Where the next value goes: "TR.Tiles[3]", cut short when long.
  std::string path() const {
    std::string p;
    for (const Frame& f : frames_) {
      if (f.array) {
        p.append("[").append(std::to_string(f.index)).append("]");
      } else {
        if (!p.empty()) p.append(".");
        p.append(shortened(f.key));
      }
    }
    return p.empty() ? "the document" : shortened(p);
  }

  const std::string& file_;
  std::vector<Frame> frames_;
};

// The parser's message with the text it last read cut short.
std::string parse_message(const std::string& what) {
  static constexpr std::string_view kLastRead = "last read: '";
  const std::size_t at = what.find(kLastRead);
  if (at == std::string::npos) return shortened(what);
  const std::size_t from = at + kLastRead.size();
  return what.substr(0, from) + shortened(what.substr(from));
}

}  // namespace

Json read_json_file(const std::string& path) {
  const bool standard = path == "-";
  const std::string name = standard ? "standard input" : path;
  const std::unique_ptr<std::FILE, FileCloser> file(standard ? stdin
                                                             : std::fopen(path.c_str(), "rb"));
  if (!file) bad_input(path + ": cannot open: " + std::strerror(errno));
  struct stat st {};
  if (::fstat(::fileno(file.get()), &st) == 0 && S_ISDIR(st.st_mode)) {
    bad_input(name + ": is a directory, not a file");
  }
  const Activity reading(name + ": reading the JSON document");
  Nesting nesting(name);
  const auto source = std::make_unique<Characters>(file.get(), name);
  try {
    return Json::parse(Characters::Iterator(source.get()), Characters::Iterator(),
                       [&](int depth, Json::parse_event_t event, Json& parsed) {
                         return nesting(depth, event, parsed);
                       });
  } catch (const Json::exception& e) {
    // Syntax errors, and also numbers beyond the range of a double ("1E400"),
    // which the parser reports as out of range rather than as a parse error.
    bad_input(name + ": not valid JSON: " + parse_message(e.what()));
  }
}

}  // namespace kvdata::cli
