// The spread test of repeated white- and blue-tile readings.

#include "binding.hpp"

namespace kvdata::python {
namespace {

using Spread = KVTestRunSpreadTestData;

py::list items(const std::shared_ptr<Collection>& c) {
  py::list out;
  if (c) {
    for (const Variant& v : *c) out.append(from_variant(v));
  }
  return out;
}

}  // namespace

void bind_stats(py::module_& m) {
  py::class_<Spread, std::shared_ptr<Spread>>(m, "KVTestRunSpreadTestData", R"(
Repeatability of the white and the blue tile: the spectra of repeated
readings go in per tile, the average, lowest, highest, spread and standard
deviation per band come out. Status results: 0 success, -1 a caught error,
-2 not initialised, -5 no samples. Spectra are sequences of numbers (or
NumPy arrays); results are lists.)")
      .def_static("create", &Spread::create)
      .def(py::init(&Spread::create))
      .def("KVRR_Initialize", &Spread::KVRR_Initialize, py::arg("nNumberOfSpectralDataPts"))
      .def("KVRR_SetCurrentTestToWhiteTile",
           [](Spread& s) { return from_variant(s.KVRR_SetCurrentTestToWhiteTile()); })
      .def("KVRR_SetCurrentTestToBlueTile",
           [](Spread& s) { return from_variant(s.KVRR_SetCurrentTestToBlueTile()); })
      .def("KVRR_GetCurrentTestIndex", &Spread::KVRR_GetCurrentTestIndex)
      .def("KVRR_GetNumberOfSpectralDataPoints", &Spread::KVRR_GetNumberOfSpectralDataPoints)
      .def(
          "KVRR_AddSpectralData",
          [](Spread& s, const py::handle& data) {
            return s.KVRR_AddSpectralData(to_variant(data));
          },
          py::arg("vReflectaceData"), "Adds one reading of the current tile.")
      .def("KVRR_CalculateSpreadTestData", &Spread::KVRR_CalculateSpreadTestData)
      .def(
          "KVRR_SetStdDev",
          [](Spread& s, const py::handle& data) { return s.KVRR_SetStdDev(to_variant(data)); },
          py::arg("vData"), "Sets the standard deviation per band of the current tile.")
      .def("KVRR_GetAverageWL", [](const Spread& s) { return from_variant(s.KVRR_GetAverageWL()); })
      .def("KVRR_GetLowestWL", [](const Spread& s) { return from_variant(s.KVRR_GetLowestWL()); })
      .def("KVRR_GetHighestWL", [](const Spread& s) { return from_variant(s.KVRR_GetHighestWL()); })
      .def("KVRR_GetSpreadOfEachWL",
           [](const Spread& s) { return from_variant(s.KVRR_GetSpreadOfEachWL()); })
      .def("KVRR_GetStdDev", [](const Spread& s) { return from_variant(s.KVRR_GetStdDev()); })
      .def("KVRR_GetWhiteRepeatibilitySpectralData",
           [](const Spread& s) { return items(s.KVRR_GetWhiteRepeatibilitySpectralData()); })
      .def("KVRR_GetBlueRepeatibilitySpectralData",
           [](const Spread& s) { return items(s.KVRR_GetBlueRepeatibilitySpectralData()); })
      .def("KVRR_Copy", &Spread::KVRR_Copy, py::arg("obj"))
      .def("KVRR_ReleaseSpreadTestData", &Spread::KVRR_ReleaseSpreadTestData)
      .def("KVRR_SetTolerance", &Spread::KVRR_SetTolerance, py::arg("Tolerance"));
}

}  // namespace kvdata::python
