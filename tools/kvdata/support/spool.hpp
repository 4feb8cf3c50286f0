#pragma once
// Bytes set aside while a command streams, for output whose head needs
// figures known only at the end (a count, column widths). Held in memory up
// to a few megabytes, then moved to an unnamed temporary file, so memory
// stays bounded however much is set aside.
//
//   Spool spool;  spool.append(text);  ...
//   spool.rewind();  while (spool.read(buf, n)) ...

#include <cstddef>
#include <cstdio>
#include <string>
#include <string_view>

namespace kvdata::cli {

class Spool {
 public:
  Spool() = default;
  ~Spool();
  Spool(const Spool&) = delete;
  Spool& operator=(const Spool&) = delete;

  // InputError when the temporary file cannot be made or written.
  void append(std::string_view bytes);
  // Starts reading from the beginning; nothing may be appended afterwards.
  void rewind();
  // The next `n` bytes into `to`; false when fewer than `n` are left.
  bool read(char* to, std::size_t n);
  // Up to `n` next bytes into `to`; how many.
  std::size_t read_some(char* to, std::size_t n);

 private:
  void spill();

  std::string memory_;
  std::FILE* file_ = nullptr;
  std::size_t offset_ = 0;  // reading position in memory_
};

}  // namespace kvdata::cli
