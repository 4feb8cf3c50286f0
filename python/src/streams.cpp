// Streams, the predeclared instance of the record streams and stream files.

#include <utility>

#include "binding.hpp"

namespace kvdata::python {
namespace {

// A record stream member: (result, new Position); the record is read into
// or written from in place.
template <class... Records>
auto record_stream(bool (Streams::*member)(const eStreamDirection&, ByteArray&, Long&,
                                           Records&...)) {
  return [member](Streams& s, eStreamDirection direction, PyByteArray& stream, Long position,
                  Records&... records) {
    if (direction == eStreamDirection::ToStream) stream.check_resizable();
    py::gil_scoped_release unlocked;
    const bool ok = (s.*member)(direction, stream.array, position, records...);
    return std::pair{ok, position};
  };
}

constexpr const char* kRecordStreamDoc = R"(
Direction ToStream writes the record(s) into the ByteArray Stream at
Position (growing it), FromStream reads them from it. Returns (result, new
Position); each value that failed wrote its own event-log entry.)";

}  // namespace

void bind_streams(py::module_& m) {
  py::enum_<eStreamDirection>(m, "eStreamDirection")
      .value("ToStream", eStreamDirection::ToStream)
      .value("FromStream", eStreamDirection::FromStream);

  py::class_<Streams, std::shared_ptr<Streams>>(
      m, "Streams", "The record streams and stream files. Streams.instance() is the one to use.")
      .def_static("instance",
                  [] {
                    // The predeclared instance lives as long as the program.
                    return std::shared_ptr<Streams>(&Streams::instance(), [](Streams*) {});
                  })
      .def("Stream_SCPair", record_stream(&Streams::Stream_SCPair), py::arg("Direction"),
           py::arg("Stream"), py::arg("Position"), py::arg("SCP"), kRecordStreamDoc)
      .def("Stream_TileSetCalibration", record_stream(&Streams::Stream_TileSetCalibration),
           py::arg("Direction"), py::arg("Stream"), py::arg("Position"), py::arg("TS"),
           py::arg("TSC"), kRecordStreamDoc)
      .def("Stream_Profile", record_stream(&Streams::Stream_Profile), py::arg("Direction"),
           py::arg("Stream"), py::arg("Position"), py::arg("pro"), kRecordStreamDoc)
      .def("Stream_Station", record_stream(&Streams::Stream_Station), py::arg("Direction"),
           py::arg("Stream"), py::arg("Position"), py::arg("Station"), kRecordStreamDoc)
      .def("Stream_TestRun", record_stream(&Streams::Stream_TestRun), py::arg("Direction"),
           py::arg("Stream"), py::arg("Position"), py::arg("TR"), kRecordStreamDoc)
      .def("Stream_User", record_stream(&Streams::Stream_User), py::arg("Direction"),
           py::arg("Stream"), py::arg("Position"), py::arg("User"), kRecordStreamDoc)
      .def("Stream_Organization", record_stream(&Streams::Stream_Organization),
           py::arg("Direction"), py::arg("Stream"), py::arg("Position"), py::arg("Org"),
           kRecordStreamDoc)
      .def(
          "StreamSave",
          [](Streams& s, const py::handle& filename, const py::handle& a) {
            const String name = path_text(filename);
            const ByteSource bytes(a);
            py::gil_scoped_release unlocked;
            return s.StreamSave(name, bytes.array());
          },
          py::arg("Filename"), py::arg("a"), R"(
Saves the bytes a (ByteArray or bytes-like) to Filename (str or
os.PathLike): the file is the old one or the whole new stream. Returns the
result.)")
      .def(
          "StreamLoad",
          [](Streams& s, const py::handle& filename, PyByteArray& a) {
            const String name = path_text(filename);
            a.check_resizable();
            py::gil_scoped_release unlocked;
            return s.StreamLoad(name, a.array);
          },
          py::arg("Filename"), py::arg("a"),
          "Loads the file Filename (str or os.PathLike) into the ByteArray a. Returns the "
          "result.");
}

}  // namespace kvdata::python
