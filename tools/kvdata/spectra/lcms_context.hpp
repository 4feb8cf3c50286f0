#pragma once
// A Little CMS context whose error messages are collected instead of lost,
// so that a failed parse can say what Little CMS found wrong. Internal to
// spectra/.
//
//   LcmsContext ctx;  cmsHANDLE h = cmsIT8LoadFromFile(ctx.get(), path);
//   if (!h) bad_input(path + ": " + ctx.messages());

#include <lcms2.h>

#include <string>

namespace kvdata::cli {

class LcmsContext {
 public:
  LcmsContext();
  ~LcmsContext();
  LcmsContext(const LcmsContext&) = delete;
  LcmsContext& operator=(const LcmsContext&) = delete;

  cmsContext get() const { return context_; }
  // The messages reported so far, joined with "; ".
  const std::string& messages() const { return messages_; }

 private:
  static void collect(cmsContext context, cmsUInt32Number code, const char* text);

  cmsContext context_;
  std::string messages_;
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
