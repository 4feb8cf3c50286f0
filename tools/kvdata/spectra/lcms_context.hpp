#pragma once
// A Little CMS context whose error messages are collected instead of lost,
// so that a failed parse can say what Little CMS found wrong. Internal to
// spectra/.
//
//   LcmsContext ctx;  cmsHANDLE h = cmsIT8LoadFromMem(ctx.get(), text.data(), size);
//   if (!h) bad_input(path + ": not a readable CGATS file: " + ctx.explained());

#include <lcms2.h>

#include <cstddef>
#include <string>
#include <vector>

namespace kvdata::cli {

// The most sets (and fields) of a CGATS table that Little CMS reads; it
// refuses a larger table whole.
inline constexpr std::size_t kCgatsMostSets = 32766;

class LcmsContext {
 public:
  LcmsContext();
  ~LcmsContext();
  LcmsContext(const LcmsContext&) = delete;
  LcmsContext& operator=(const LcmsContext&) = delete;

  cmsContext get() const { return context_; }
  // The messages reported so far in the command's words, joined with "; ":
  // "line 12: ..." for a message that names its line, and what a message
  // about Little CMS's internals means for the file.
  std::string explained() const;

 private:
  static void collect(cmsContext context, cmsUInt32Number code, const char* text);

  cmsContext context_;
  std::vector<std::string> messages_;
};

// Owns an IT8 handle.
class It8Handle {
 public:
  explicit It8Handle(cmsHANDLE h) : h_(h) {}
  ~It8Handle() {
    if (h_ != nullptr) cmsIT8Free(h_);
  }
  It8Handle(const It8Handle&) = delete;
  It8Handle& operator=(const It8Handle&) = delete;
  cmsHANDLE get() const { return h_; }
  explicit operator bool() const { return h_ != nullptr; }

 private:
  cmsHANDLE h_;
};

}  // namespace kvdata::cli
