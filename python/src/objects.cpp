// The objects and their interfaces as Python classes: the properties each
// object streams (from the objects' description), the stream members as the
// interfaces have them, and the Python way to stream (to_bytes, from_bytes).

#include <pybind11/stl.h>

#include "kvdata/objects/object_fields.hpp"
#include "records.hpp"

namespace kvdata::python {
namespace {

template <class I>
using Interface = py::class_<I, std::shared_ptr<I>>;

// Reads `data` into a fresh object; StreamError with the event-log entries
// of the read when it fails. Bytes after the object are left unread, as the
// object's own StreamIn leaves them.
template <class C>
std::shared_ptr<C> from_bytes(const py::handle& data) {
  const ByteSource bytes(data);
  const ByteArray& a = bytes.array();
  auto object = C::create();
  Long position = a.has_bounds() ? a.lbound() : 0;
  const Collected read = collect_log([&] { return object->StreamIn(a, position); });
  if (!read.ok) {
    std::string message = "the stream does not hold a valid object";
    if constexpr (std::is_same_v<C, KVUser>) {
      if (!object->ErrMsg().empty())
        message += ": " + py::cast(object->ErrMsg()).template cast<std::string>();
    }
    raise_stream_error(message, read.entries);
  }
  return object;
}

// How many indices reach a single value of T: 2 for a table of spectra by
// eSC and band.
template <class T>
constexpr std::size_t index_depth() {
  if constexpr (kFixed<T> || kDynamic<T>) {
    return 1 + index_depth<typename T::value_type>();
  } else if constexpr (DescribedRecord<T>) {
    if constexpr (cli::kStandsForArray<T>) {
      using Fields = std::remove_cvref_t<decltype(RecordDescription<T>::kFields)>;
      return index_depth<typename std::tuple_element_t<0, Fields>::member_type>();
    } else {
      return 0;
    }
  } else {
    return 0;
  }
}

// The interface's indexed member of a fixed-array property, on the object
// `o`: called with the indices it gives one value, with the indices and a
// value it stores that value (the whole property written back), each time
// on the object's value of the moment. An index out of range raises error
// 9 and changes nothing.
template <class P, class O>
py::object indexed_member(const P& p, O& o, const py::args& args) {
  using T = typename P::value_type;
  constexpr std::size_t depth = index_depth<T>();
  if (args.size() != depth && args.size() != depth + 1) {
    throw py::type_error(std::string(p.name) + " takes " + std::to_string(depth) +
                         " indices, and a value to store");
  }
  const auto value = Ref<T>::own(p.get(o));
  py::object at = value_out<typename P::index_type>(value);
  for (std::size_t k = 0; k + 1 < depth; ++k) at = at[py::object(args[k])];
  const py::object last = args[depth - 1];
  if (args.size() == depth) return at[last];
  at[last] = py::object(args[depth]);
  p.set(o, value.get());
  return py::none();
}

// The properties the object streams, as its description lists them, on the
// Python class of the description's Interface.
template <class C, class Cls>
void add_described_properties(Cls& cls) {
  for_each_property<C>([&](const auto& p) {
    using P = std::remove_cvref_t<decltype(p)>;
    using O = typename P::object_type;
    const std::string name(p.name);
    if constexpr (requires { p.members; }) {
      cls.def_property_readonly(
          name.c_str(),
          [p](const O& o) {
            py::list out;
            for (const auto& member : p.members(o)) out.append(py::cast(member));
            return out;
          },
          "The members, in order (a list of objects).");
    } else {
      using T = typename P::value_type;
      using Index = typename P::index_type;
      std::string doc =
          type_name<T, Index>() + ". Reading gives a copy; assign the whole value to change it.";
      const auto set = [p](O& o, const py::handle& value) {
        T v{};
        value_in(v, value);
        p.set(o, v);
      };
      if constexpr (kFixed<T>) {
        doc += " Called with indices, " + name +
               "(...) gives one value of the object's own; with the indices and a value it "
               "stores that value in the object.";
        cls.def_property(
            name.c_str(),
            [p](const std::shared_ptr<O>& o) {
              auto view = FixedView<T, Index>{Ref<T>::own(p.get(*o)), {}};
              view.member = [p, o](const py::args& args) { return indexed_member(p, *o, args); };
              return py::cast(std::move(view));
            },
            set, doc.c_str());
      } else {
        cls.def_property(
            name.c_str(), [p](const O& o) { return value_copy_out<Index>(p.get(o)); }, set,
            doc.c_str());
      }
    }
  });
}

template <class C, class... Bases>
py::class_<C, std::shared_ptr<C>, Bases...> bind_object(py::module_& m, const char* name,
                                                        const char* doc) {
  py::class_<C, std::shared_ptr<C>, Bases...> cls(m, name, doc);
  cls.def_static("create", &C::create, "A fresh object.");
  if constexpr (std::is_base_of_v<IKVStream, C>) {
    cls.def_static("from_bytes", &from_bytes<C>, py::arg("data"), R"(
The object read from a whole stream (bytes, bytearray, memoryview or
ByteArray, read from its lower bound). Raises StreamError, with the
event-log entries of the read, when the stream is not valid. Bytes after
the object are not read.)");
  }
  if constexpr (DescribedObject<C>) {
    if constexpr (std::is_same_v<typename ObjectDescription<C>::Interface, C>) {
      add_described_properties<C>(cls);
    }
  }
  return cls;
}

std::pair<bool, Long> stream_in(IKVStream& s, const py::handle& data, Long position) {
  const ByteSource bytes(data);
  py::gil_scoped_release unlocked;
  const bool ok = s.StreamIn(bytes.array(), position);
  return {ok, position};
}

std::pair<bool, Long> stream_out(IKVStream& s, PyByteArray& data, Long position) {
  data.check_resizable();
  py::gil_scoped_release unlocked;
  const bool ok = s.StreamOut(data.array, position);
  return {ok, position};
}

py::bytes to_bytes(IKVStream& s) {
  ByteArray a;
  Long position = 0;
  const Collected written = collect_log([&] { return s.StreamOut(a, position); });
  if (!written.ok) raise_stream_error("the object cannot be streamed out", written.entries);
  // The array ends where StreamOut left its upper bound, which may be past Position.
  return {reinterpret_cast<const char*>(a.data()), a.size()};
}

}  // namespace

void bind_objects(py::module_& m) {
  Interface<IKVObj>(m, "IKVObj", "What every stored object tells about itself.")
      .def_property_readonly("ObjType", &IKVObj::ObjType)
      .def_property_readonly("Description", [](const IKVObj& o) { return o.Description(); })
      .def_property_readonly("ID", [](const IKVObj& o) { return from_variant(o.ID()); })
      .def_property_readonly("DateCreated",
                             [](const IKVObj& o) { return from_variant(o.DateCreated()); });

  Interface<IKVStream>(m, "IKVStream", "An object that reads and writes its byte stream.")
      .def("StreamIn", &stream_in, py::arg("bytStream"), py::arg("Position") = 0, R"(
Reads the object from bytStream (a ByteArray or any bytes-like object) at
Position, the array's own index. Returns (result, new Position); on False
the object and Position are as the interface leaves them.)")
      .def("StreamOut", &stream_out, py::arg("bytStream"), py::arg("Position") = 0, R"(
Writes the object into the ByteArray bytStream at Position, growing it as
needed. Returns (result, new Position).)")
      .def_property_readonly("StreamLen", &IKVStream::StreamLen, "Bytes the stream takes.")
      .def("to_bytes", &to_bytes, R"(
The object's stream as bytes. Raises StreamError, with the event-log
entries of the write, when the object cannot be streamed out.)");

  Interface<IKVTile>(m, "IKVTile", "A reference tile.")
      .def_property("Order", py::overload_cast<>(&IKVTile::Order, py::const_),
                    py::overload_cast<Integer>(&IKVTile::Order))
      .def_property("ColorName", py::overload_cast<>(&IKVTile::ColorName, py::const_),
                    py::overload_cast<const String&>(&IKVTile::ColorName))
      .def_property("ColorRGB", py::overload_cast<>(&IKVTile::ColorRGB, py::const_),
                    py::overload_cast<Long>(&IKVTile::ColorRGB))
      .def("TempCompWL", py::overload_cast<const Integer&>(&IKVTile::TempCompWL, py::const_),
           py::arg("idx"), "The temperature compensation of band idx (1 to 40).")
      .def("TempCompWL", py::overload_cast<const Integer&, const Double&>(&IKVTile::TempCompWL),
           py::arg("idx"), py::arg("value"), "Sets the temperature compensation of band idx.");

  Interface<IKVTileSet>(m, "IKVTileSet", "A reference tile set.")
      .def_property("TSN", py::overload_cast<>(&IKVTileSet::TSN, py::const_),
                    py::overload_cast<const String&>(&IKVTileSet::TSN))
      .def("Tiles", py::overload_cast<Integer>(&IKVTileSet::Tiles), py::arg("idx"),
           "The tile at idx (1 to count), the set's own object.")
      .def("Tiles", py::overload_cast<Integer, const std::shared_ptr<IKVTile>&>(&IKVTileSet::Tiles),
           py::arg("idx"), py::arg("tile"), "Puts tile at idx.")
      .def_property_readonly("count", &IKVTileSet::count);

  Interface<IKVTolerance> tolerance(m, "IKVTolerance", "One tolerance of a tolerance set.");
  add_described_properties<KVTolerance>(tolerance);

  Interface<IKVCalTile>(m, "IKVCalTile", "One tile's certified SCE and SCI spectra.")
      .def_property("Order", py::overload_cast<>(&IKVCalTile::Order, py::const_),
                    py::overload_cast<Integer>(&IKVCalTile::Order),
                    "Position in the calibration; setting it writes the tile back there.")
      .def("SCWL", py::overload_cast<const eSC&, const Integer&>(&IKVCalTile::SCWL, py::const_),
           py::arg("sc"), py::arg("WL"),
           "The value of band WL (1 to 40) of spectrum sc; 0 for any other band (error 9 for "
           "an sc other than SCE or SCI).")
      .def("SCWL", py::overload_cast<const eSC&, const Integer&, const Double&>(&IKVCalTile::SCWL),
           py::arg("sc"), py::arg("WL"), py::arg("value"),
           "Stores the value of band WL of spectrum sc and writes the tile back into its "
           "calibration.");

  Interface<IKVCalibration>(m, "IKVCalibration", "A certification of a tile set.")
      .def_property("TSN", py::overload_cast<>(&IKVCalibration::TSN, py::const_),
                    py::overload_cast<const String&>(&IKVCalibration::TSN),
                    "The tile set's serial number, 8 characters (cut or padded with blanks).")
      .def_property("DateCertified",
                    py::overload_cast<>(&IKVCalibration::DateCertified, py::const_),
                    py::overload_cast<Date>(&IKVCalibration::DateCertified))
      .def_property("TempCalibrated",
                    py::overload_cast<>(&IKVCalibration::TempCalibrated, py::const_),
                    py::overload_cast<Single>(&IKVCalibration::TempCalibrated))
      .def("Tiles", py::overload_cast<Integer>(&IKVCalibration::Tiles), py::arg("idx"),
           "A new tile holding the spectra of slot idx (1 to 13), attached to this calibration: "
           "its changes are written back.")
      .def("Tiles",
           py::overload_cast<Integer, const std::shared_ptr<IKVCalTile>&>(&IKVCalibration::Tiles),
           py::arg("idx"), py::arg("tile"),
           "Copies the tile's spectra into slot idx (1 to 13; other indexes are ignored).");

  Interface<IKVProfile> profile(m, "IKVProfile", R"(
An instrument profile. Each correction table (WhiteCorrection, ...) reads as
a copy indexed by SC member and band; called as the interface's member,
profile.WhiteCorrection(SC.SCI, 40) gives one value and
profile.WhiteCorrection(SC.SCI, 40, 1.25) stores one.)");
  add_described_properties<KVProfile>(profile);

  Interface<IKVTolSet>(m, "IKVTolSet", "A set of tolerances keyed by text.")
      .def("Add", &IKVTolSet::Add, py::arg("newTol"), py::arg("sKey") = String(),
           "Adds a tolerance under sKey (error 457 for a key already held, 91 for None).")
      .def(
          "Item", [](IKVTolSet& s, const py::handle& key) { return s.Item(to_variant(key)); },
          py::arg("vntIndexKey"), "The tolerance at a position (1-based) or under a key.")
      .def(
          "Remove", [](IKVTolSet& s, const py::handle& key) { s.Remove(to_variant(key)); },
          py::arg("vntIndexKey"))
      .def_property_readonly("count", &IKVTolSet::count)
      .def("__len__", &IKVTolSet::count);

  bind_object<KVUser, IKVObj, IKVStream>(m, "KVUser", "A user of the system (v1User).")
      .def_property_readonly("ErrMsg", &KVUser::ErrMsg,
                             "The description of the last failed stream.");
  bind_object<KVTolerance, IKVStream, IKVTolerance>(m, "KVTolerance", "One tolerance.");
  bind_object<KVTolSet, IKVObj, IKVTolSet, IKVStream>(
      m, "KVTolSet", "A tolerance set: its header and its tolerances keyed by ID.")
      .def("__iter__", [](const KVTolSet& s) {
        return py::iter(py::cast(std::vector<std::shared_ptr<IKVTolerance>>(s.begin(), s.end())));
      });
  bind_object<KVTile, IKVTile, IKVStream>(m, "KVTile", "A reference tile (v1Tile).");
  bind_object<KVCalTile, IKVCalTile>(m, "KVCalTile",
                                     "One tile's certified spectra (no stream of its own).")
      .def_property("v1Tile", py::overload_cast<>(&KVCalTile::v1Tile, py::const_),
                    py::overload_cast<const tSCPair&>(&KVCalTile::v1Tile),
                    "Both spectra (a copy); setting it writes the tile back into its calibration.");
  bind_object<KVTileSet, IKVObj, IKVStream, IKVTileSet>(
      m, "KVTileSet", "A reference tile set of 13 tiles (v1TileSet).");
  bind_object<KVCalibration, IKVObj, IKVCalibration, IKVStream>(
      m, "KVCalibration", "A certification of a tile set (v1Calibration).");
  bind_object<KVProfile, IKVStream, IKVObj, IKVProfile>(m, "KVProfile", "An instrument profile.");
  bind_object<KVTestRun, IKVObj, IKVStream>(m, "KVTestRun",
                                            "A test run of an instrument (v1TestRun).");
}

}  // namespace kvdata::python
