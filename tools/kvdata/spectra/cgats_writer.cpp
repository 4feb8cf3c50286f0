#include "spectra/cgats_writer.hpp"

#include "spectra/lcms_context.hpp"
#include "support/errors.hpp"

namespace kvdata::cli {

std::string write_cgats(const std::string& descriptor, const std::vector<std::string>& fields,
                        const std::vector<std::vector<std::string>>& rows) {
  LcmsContext context;
  It8Handle it8(context.get() == nullptr ? nullptr : cmsIT8Alloc(context.get()));
  auto fail = [&] { bad_input("cannot write CGATS: " + context.messages()); };
  if (!it8) fail();
  bool ok =
      cmsIT8SetSheetType(it8.get(), "CGATS.17") &&
      cmsIT8SetPropertyStr(it8.get(), "ORIGINATOR", "kvdata") &&
      cmsIT8SetPropertyStr(it8.get(), "DESCRIPTOR", descriptor.c_str()) &&
      cmsIT8SetPropertyDbl(it8.get(), "NUMBER_OF_FIELDS", static_cast<double>(fields.size())) &&
      cmsIT8SetPropertyDbl(it8.get(), "NUMBER_OF_SETS", static_cast<double>(rows.size()));
  for (std::size_t f = 0; ok && f < fields.size(); ++f) {
    ok = cmsIT8SetDataFormat(it8.get(), static_cast<int>(f), fields[f].c_str());
  }
  for (std::size_t r = 0; ok && r < rows.size(); ++r) {
    for (std::size_t f = 0; ok && f < fields.size(); ++f) {
      ok = cmsIT8SetDataRowCol(it8.get(), static_cast<int>(r), static_cast<int>(f),
                               rows[r][f].c_str());
    }
  }
  cmsUInt32Number size = 0;
  if (!ok || !cmsIT8SaveToMem(it8.get(), nullptr, &size)) fail();
  std::string text(size, '\0');
  if (!cmsIT8SaveToMem(it8.get(), text.data(), &size)) fail();
  text.resize(size);
  while (!text.empty() && text.back() == '\0') text.pop_back();
  return text;
}

}  // namespace kvdata::cli
