// The extension module kvdata._kvdata; the package kvdata re-exports it.

#include "binding.hpp"

PYBIND11_MODULE(_kvdata, m) {
  m.doc() = "KVData for Python: records, objects, byte streams, colorimetry, spread test.";
  kvdata::python::bind_runtime(m);
  kvdata::python::bind_records(m);
  kvdata::python::bind_streams(m);
  kvdata::python::bind_objects(m);
  kvdata::python::bind_colour(m);
  kvdata::python::bind_stats(m);
}
