// Colour: ILU_D6510 as the interface has it, and the batch conversion of
// NumPy arrays of spectra.

#include <pybind11/numpy.h>
#include <pybind11/stl.h>

#include "binding.hpp"
#include "records.hpp"

namespace kvdata::python {
namespace {

using Spectra = py::array_t<Single, py::array::c_style | py::array::forcecast>;

std::vector<Single> values(const Array<Single>& a) {
  return {a.begin(), a.end()};
}

Array<Single> array_of(const std::vector<Single>& v) {
  Array<Single> a(0, static_cast<Long>(v.size()) - 1);
  std::copy(v.begin(), v.end(), a.begin());
  return a;
}

using Results = py::array_t<Single, py::array::c_style>;

// `given` when it is a writable C-contiguous float32 N x 3 array, or a new one.
Results results_for(const py::object& given, py::ssize_t n, const char* name) {
  if (given.is_none()) return Results({n, py::ssize_t{3}});
  const bool fits =
      py::isinstance<Results>(given) && (given.cast<py::array>().flags() & py::array::c_style) != 0;
  Results out = fits ? given.cast<Results>() : Results();
  if (!fits || out.ndim() != 2 || out.shape(0) != n || out.shape(1) != 3 || !out.writeable()) {
    throw py::value_error(std::string(name) +
                          ": expected a writable C-contiguous float32 array of N x 3");
  }
  return out;
}

py::tuple batch(const Spectra& spectra, const py::object& xyz_given, const py::object& lab_given) {
  if (spectra.ndim() != 2 || spectra.shape(1) != kBandCount) {
    throw py::value_error("expected an N x 40 array of spectra");
  }
  const auto n = static_cast<std::size_t>(spectra.shape(0));
  Results xyz = results_for(xyz_given, spectra.shape(0), "xyz");
  Results lab = results_for(lab_given, spectra.shape(0), "lab");
  const std::span<const Single> in(spectra.data(), n * kBandCount);
  const std::span<Single> xyz_out(xyz.mutable_data(), 3 * n);
  const std::span<Single> lab_out(lab.mutable_data(), 3 * n);
  {
    // Overlapping arrays raise error 5 before anything is written.
    py::gil_scoped_release unlocked;
    (void)calc_xyz_lab_d6510(in, xyz_out, lab_out);
  }
  return py::make_tuple(std::move(xyz), std::move(lab));
}

}  // namespace

void bind_colour(py::module_& m) {
  py::enum_<eXYZ>(m, "eXYZ")
      .value("Xaxis", eXYZ::Xaxis)
      .value("Yaxis", eXYZ::Yaxis)
      .value("Zaxis", eXYZ::Zaxis);

  py::class_<ILU_D6510, std::shared_ptr<ILU_D6510>>(m, "ILU_D6510", R"(
CIE colorimetry under D65 with the 1964 10-degree observer, 40 bands from
360 nm, reflectance in percent. Lists of values stand for the interface's
arrays (index 0 first).)")
      .def_static("create", &ILU_D6510::create)
      .def(py::init(&ILU_D6510::create))
      .def_property_readonly("Illuminant", &ILU_D6510::Illuminant)
      .def(
          "Weights", [](const ILU_D6510& i, eXYZ c) { return values(i.Weights(c)); },
          py::arg("XYZ"), "The 40 weights of one component.")
      .def("PWD", &ILU_D6510::PWD, py::arg("XYZ"), "The white point's component.")
      .def_property(
          "Reflectance", [](const ILU_D6510&) { return py::none(); },
          [](ILU_D6510& i, const py::handle& spectrum) {
            tSpectrum s;
            value_in(s, spectrum);
            i.Reflectance(s);
          },
          "Setting a spectrum (tSpectrum or 40 values) computes XYZ and LAB.")
      .def_property_readonly("XYZ", [](const ILU_D6510& i) { return values(i.XYZ()); })
      .def_property_readonly("LAB", [](const ILU_D6510& i) { return values(i.LAB()); })
      .def(
          "calcXYZ",
          [](const ILU_D6510& i, const py::handle& spectrum) {
            tSpectrum s;
            value_in(s, spectrum);
            Array<Single> xyz(0, 2);
            i.calcXYZ(s, xyz);
            return values(xyz);
          },
          py::arg("RefIn"), "X, Y, Z of a spectrum (error 6 when a sum overflows a Single).")
      .def(
          "calcLAB",
          [](const ILU_D6510& i, const std::vector<Single>& xyz) {
            Array<Single> lab(0, 2);
            i.calcLAB(array_of(xyz), lab);
            return values(lab);
          },
          py::arg("XYZIn"), "L*, a*, b* of X, Y, Z.")
      .def(
          "Deltas",
          [](const ILU_D6510& i, const std::vector<Single>& standard,
             const std::vector<Single>& trial) {
            Array<Single> d(0, 2);
            Single de = 0.0f;
            i.Deltas(array_of(standard), array_of(trial), d, de);
            return py::make_tuple(values(d), de);
          },
          py::arg("LABStandard"), py::arg("LABTrial"), "(dL, da, db), dE of two CIELAB values.");

  m.def("calc_xyz_lab_d6510", &batch, py::arg("spectra"), py::kw_only(),
        py::arg("xyz") = py::none(), py::arg("lab") = py::none(), R"(
XYZ and CIELAB of many spectra at once: spectra is an N x 40 array of
percent reflectance (float32, C-contiguous: used without a copy; anything
else is converted first). Returns (xyz, lab), two N x 3 float32 arrays,
bit for bit what ILU_D6510.calcXYZ followed by calcLAB gives; a spectrum
whose conversion overflows a Single or meets a NaN gets NaN in its six
results. The GIL is released during the work. xyz= and lab= take two
N x 3 float32 C-contiguous arrays to fill instead of new ones (for repeated
calls on blocks of one size).)");
}

}  // namespace kvdata::python
