#include "spectra/lcms_context.hpp"

namespace kvdata::cli {

LcmsContext::LcmsContext() : context_(cmsCreateContext(nullptr, this)) {
  if (context_ != nullptr) cmsSetLogErrorHandlerTHR(context_, &LcmsContext::collect);
}

LcmsContext::~LcmsContext() {
  if (context_ != nullptr) cmsDeleteContext(context_);
}

void LcmsContext::collect(cmsContext context, cmsUInt32Number /*code*/, const char* text) {
  auto* self = static_cast<LcmsContext*>(cmsGetContextUserData(context));
  if (self == nullptr || text == nullptr) return;
  if (!self->messages_.empty()) self->messages_ += "; ";
  self->messages_ += text;
}

}  // namespace kvdata::cli
