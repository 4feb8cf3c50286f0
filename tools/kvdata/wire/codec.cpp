#include "wire/codec.hpp"

#include <array>
#include <tuple>

#include "json/records.hpp"
#include "kvdata/automation/error.hpp"
#include "kvdata/automation/text.hpp"
#include "kvdata/objects/object_fields.hpp"
#include "kvdata/streams/streams.hpp"
#include "support/errors.hpp"
#include "support/library_log.hpp"
#include "wire/width_check.hpp"

namespace kvdata::cli {
namespace {

std::string member_path(const std::string& path, std::string_view name) {
  return path.empty() ? std::string(name) : path + "." + std::string(name);
}

// The library's entries about the refusal stay with the run's log.
[[noreturn]] void refused(StreamKind kind, const char* what, const std::string& message,
                          LibraryLog& log) {
  log.keep();
  bad_input("the library's " + std::string(kind_name(kind)) + " " + what +
            (message.empty() ? std::string() : ": " + message));
}

// --- Spectra ------------------------------------------------------------------------

// Calls `visit` for every spectrum and every pair of spectra inside `v`, at
// its path in the document. `name` and `colour` are the first text and Long
// of the record whose field `v` is (a tile's name and display colour).
template <class Index = void, class T>
void visit_spectra(const T& v, const std::string& path, const String* name, const Long* colour,
                   const SpectrumVisitor& visit) {
  if constexpr (std::is_same_v<T, tSpectrum>) {
    visit(SpectrumSeries{path, {{"", &v}}, name, colour});
  } else if constexpr (FixedArrayValue<T> && !std::is_void_v<Index>) {
    if constexpr (std::is_same_v<typename FixedArrayTraits<T>::element_type, tSpectrum>) {
      SpectrumSeries s{path, {}, name, colour};
      for (const auto& m : EnumDescription<Index>::kMembers)
        s.lines.emplace_back(m.name, &v(m.value));
      visit(s);
    }
  } else if constexpr (FixedArrayValue<T>) {
    Long i = FixedArrayTraits<T>::kLower;
    for (const auto& item : v) visit_spectra(item, element(path, i++), nullptr, nullptr, visit);
  } else if constexpr (DynamicArrayValue<T>) {
    if (!v.has_bounds()) return;
    Long i = v.lbound();
    for (const auto& item : v) visit_spectra(item, element(path, i++), nullptr, nullptr, visit);
  } else if constexpr (DescribedRecord<T> && kStandsForArray<T>) {
    for_each_field(v, [&](const auto& d, const auto& member) {
      visit_spectra<typename DescriptionOf<decltype(d)>::index_type>(member, path, name, colour,
                                                                     visit);
    });
  } else if constexpr (DescribedRecord<T>) {
    const String* own_name = nullptr;
    const Long* own_colour = nullptr;
    for_each_field(v, [&](const auto&, const auto& member) {
      using M = std::remove_cvref_t<decltype(member)>;
      if constexpr (std::is_same_v<M, String>) {
        if (own_name == nullptr) own_name = &member;
      } else if constexpr (std::is_same_v<M, Long>) {
        if (own_colour == nullptr) own_colour = &member;
      }
    });
    for_each_field(v, [&](const auto& d, const auto& member) {
      // A field no stream carries holds nothing a stream could show.
      if (!d.streamed) return;
      using D = DescriptionOf<decltype(d)>;
      const std::string at = member_path(path, d.name);
      if constexpr (!std::is_void_v<typename D::holds_type>) {
        if (const auto* held = member.template get_if<typename D::holds_type>()) {
          visit_spectra(*held, at, nullptr, nullptr, visit);
        }
      } else {
        visit_spectra<typename D::index_type>(member, at, own_name, own_colour, visit);
      }
    });
  }
}

// --- Record streams ---------------------------------------------------------------------

// The records of one Streams operation, under the names of its arguments.
template <class... R>
class RecordState final : public StreamState {
 public:
  using Op = bool (Streams::*)(const eStreamDirection&, ByteArray&, Long&, R&...);

  RecordState(StreamKind kind, Op op, std::array<std::string_view, sizeof...(R)> names,
              std::optional<std::size_t> fixed)
      : StreamState(kind), op_(op), names_(names), fixed_(fixed) {}

  std::optional<std::size_t> fixed_bytes() const override { return fixed_; }

  bool read_library(ByteArray& bytes, Long& end, std::string& /*message*/) override {
    end = bytes.has_bounds() ? bytes.lbound() : 0;
    return call(eStreamDirection::FromStream, bytes, end);
  }

  void read_stream(ByteArray& bytes) override {
    LibraryLog log;
    Long end = 0;
    std::string message;
    if (!read_library(bytes, end, message)) refused(kind(), "reader refused the stream", {}, log);
  }

  void read_members(Fields& f) override {
    each(*this, [&](std::string_view name, auto& record) {
      read_value(f.get(name), std::string(name), record);
    });
  }

  void write_members(JsonWriter& w) const override {
    each(*this, [&](std::string_view name, const auto& record) {
      w.key(name);
      write_value(w, record);
    });
  }

  // A fixed-size block does not grow the stream and stops at its end: it is
  // written again into twice the room until it fits. Writers of sequences
  // grow the stream themselves.
  ByteArray write_stream(std::size_t room) override {
    WidthCheck check;
    ObservedStreams watch(check);
    for (std::size_t size = std::max<std::size_t>(room, 256);; size *= 2) {
      ByteArray bytes(0, static_cast<Long>(size) - 1);
      Long pos = 0;
      LibraryLog log;
      const bool ok = call(eStreamDirection::ToStream, bytes, pos);
      check.verify();
      const bool out_of_room = pos > bytes.ubound();
      if (!ok && (!out_of_room || size > (std::size_t{1} << 30))) {
        refused(kind(), "writer refused the record", {}, log);
      }
      if (ok) {
        bytes.redim_preserve(0, pos - 1);
        return bytes;
      }
    }
  }

  void find_spectra(const SpectrumVisitor& visit) const override {
    each(*this, [&](std::string_view name, const auto& record) {
      visit_spectra(record, std::string(name), nullptr, nullptr, visit);
    });
  }

 private:
  bool call(eStreamDirection direction, ByteArray& bytes, Long& pos) {
    return std::apply(
        [&](R&... records) {
          return (Streams::instance().*op_)(direction, bytes, pos, records...);
        },
        records_);
  }

  // f(name, record) for every record; the records are const when `self` is.
  template <class Self, class F>
  static void each(Self& self, F&& f) {
    [&]<std::size_t... I>(std::index_sequence<I...>) {
      (f(self.names_[I], std::get<I>(self.records_)), ...);
    }
    (std::index_sequence_for<R...>{});
  }

  Op op_;
  std::array<std::string_view, sizeof...(R)> names_;
  std::optional<std::size_t> fixed_;
  std::tuple<R...> records_;
};

template <class... R>
std::unique_ptr<StreamState> records(StreamKind kind,
                                     bool (Streams::*op)(const eStreamDirection&, ByteArray&, Long&,
                                                         R&...),
                                     std::array<std::string_view, sizeof...(R)> names,
                                     std::optional<std::size_t> fixed = std::nullopt) {
  return std::make_unique<RecordState<R...>>(kind, op, names, fixed);
}

// --- Object streams ---------------------------------------------------------------------

template <class Class>
struct PropertyValues;

template <class P>
struct ValueOf {
  using type = typename P::value_type;
};
template <class P>
requires requires {
  typename P::member_class;
}
struct ValueOf<P> {
  using type = std::vector<PropertyValues<typename P::member_class>>;
};

template <class Tuple>
struct ValuesOf;
template <class... P>
struct ValuesOf<std::tuple<P...>> {
  using type = std::tuple<typename ValueOf<P>::type...>;
};

template <class P>
concept MembersProperty = requires {
  typename P::member_class;
};

// The value of every property of an object, in the order the description
// lists them; a property holding objects keeps theirs.
template <class Class>
struct PropertyValues {
  using Properties = std::remove_const_t<decltype(ObjectDescription<Class>::kProperties)>;
  typename ValuesOf<Properties>::type values;

  // f(description, value) for every property; the values are const when
  // `self` is.
  template <class Self, class F>
  static void each(Self& self, F&& f) {
    [&]<std::size_t... I>(std::index_sequence<I...>) {
      (f(std::get<I>(ObjectDescription<Class>::kProperties), std::get<I>(self.values)), ...);
    }
    (std::make_index_sequence<std::tuple_size_v<Properties>>{});
  }
};

template <class Class>
using InterfaceOf = typename ObjectDescription<Class>::Interface;

template <class Class>
void take_values(const InterfaceOf<Class>& object, PropertyValues<Class>& out) {
  PropertyValues<Class>::each(out, [&](const auto& p, auto& value) {
    using P = DescriptionOf<decltype(p)>;
    if constexpr (MembersProperty<P>) {
      for (const auto& member : p.members(object)) {
        take_values<typename P::member_class>(*member, value.emplace_back());
      }
    } else {
      value = p.get(object);
    }
  });
}

// A new object cannot take a dynamic array of another length than the one
// it starts with (a tile set's tiles): the library's own count is what a
// document must give.
template <class T>
void check_counts(const T& given, const T& fresh, const std::string& path, StreamKind kind) {
  if constexpr (DynamicArrayValue<T>) {
    const std::size_t n = given.has_bounds() ? given.size() : 0;
    if (fresh.has_bounds() && n != fresh.size()) {
      bad_input(path + ": " + std::to_string(n) + " elements, but a " +
                std::string(kind_name(kind)) + " always holds " + std::to_string(fresh.size()));
    }
  } else if constexpr (DescribedRecord<T> && !kStandsForArray<T>) {
    for_each_field(given, [&](const auto& d, const auto& member) {
      check_counts(member, d.of(fresh), member_path(path, d.name), kind);
    });
  }
}

// A new object given the values; they are spent on the way.
template <class Class>
std::shared_ptr<Class> make_object(PropertyValues<Class>& values, const std::string& path,
                                   StreamKind kind) {
  std::shared_ptr<Class> object = Class::create();
  InterfaceOf<Class>& o = *object;
  PropertyValues<Class>::each(values, [&](const auto& p, auto& value) {
    using P = DescriptionOf<decltype(p)>;
    const std::string at = member_path(path, p.name);
    if constexpr (MembersProperty<P>) {
      Long i = 1;
      for (auto& member_values : value) {
        // A watching observer (the width check) hears the member's texts under its path.
        StreamObserver* const watching = stream_observer();
        if (watching != nullptr) watching->enter(p.name, i);
        const std::string item = element(at, i++);
        auto member = make_object<typename P::member_class>(member_values, item, kind);
        if (watching != nullptr) watching->leave();
        try {
          p.add(o, member);
        } catch (const Error& e) {
          bad_input(item + ": the " + std::string(kind_name(kind)) +
                    " does not take this member: " + e.what());
        }
      }
    } else {
      check_counts(value, p.get(o), at, kind);
      p.set(o, value);
    }
    value = {};
  });
  return object;
}

template <class Class>
void write_values(JsonWriter& w, const PropertyValues<Class>& values) {
  PropertyValues<Class>::each(values, [&](const auto& p, const auto& value) {
    using P = DescriptionOf<decltype(p)>;
    w.key(p.name);
    if constexpr (MembersProperty<P>) {
      w.begin_array();
      for (const auto& member : value) {
        w.begin_object();
        write_values(w, member);
        w.end_object();
      }
      w.end_array();
    } else {
      write_value<typename P::index_type>(w, value);
    }
  });
}

template <class Class>
void read_values(Fields& f, PropertyValues<Class>& values) {
  PropertyValues<Class>::each(values, [&](const auto& p, auto& value) {
    using P = DescriptionOf<decltype(p)>;
    const std::string at = f.at(p.name);
    const Json& given = f.get(p.name);
    if constexpr (MembersProperty<P>) {
      read_array(given, at);
      Long i = 1;
      for (const Json& item : given) {
        Fields member(item, element(at, i++));
        read_values(member, value.emplace_back());
        member.done();
      }
    } else {
      read_value<typename P::index_type>(given, at, value);
    }
  });
}

template <class Class>
void visit_values(const PropertyValues<Class>& values, const std::string& path,
                  const SpectrumVisitor& visit) {
  PropertyValues<Class>::each(values, [&](const auto& p, const auto& value) {
    using P = DescriptionOf<decltype(p)>;
    const std::string at = member_path(path, p.name);
    if constexpr (MembersProperty<P>) {
      Long i = 1;
      for (const auto& member : value) visit_values(member, element(at, i++), visit);
    } else {
      visit_spectra<typename P::index_type>(value, at, nullptr, nullptr, visit);
    }
  });
}

template <class Class>
class ObjectState final : public StreamState {
 public:
  explicit ObjectState(StreamKind kind) : StreamState(kind) {}

  // A class of fixed stream size says so; its writer leaves one spare byte.
  std::optional<std::size_t> fixed_bytes() const override {
    if constexpr (requires { Class::kStreamBytes; }) return Class::kStreamBytes + 1;
    return std::nullopt;
  }

  bool read_library(ByteArray& bytes, Long& end, std::string& message) override {
    read_ = Class::create();
    end = bytes.has_bounds() ? bytes.lbound() : 0;
    if (static_cast<IKVStream&>(*read_).StreamIn(bytes, end)) return true;
    if constexpr (requires { read_->ErrMsg(); }) message = to_utf8(read_->ErrMsg());
    return false;
  }

  void read_stream(ByteArray& bytes) override {
    LibraryLog log;
    Long end = 0;
    std::string message;
    if (!read_library(bytes, end, message)) {
      refused(kind(), "reader refused the stream", message, log);
    }
    take_values<Class>(*read_, values_);
    read_.reset();
  }

  void read_members(Fields& f) override { read_values(f, values_); }

  void write_members(JsonWriter& w) const override { write_values(w, values_); }

  ByteArray write_stream(std::size_t room) override {
    WidthCheck check;
    ObservedStreams watch(check);
    auto object = make_object(values_, "", kind());
    ByteArray bytes(0, -1);
    bytes.reserve(room);
    Long pos = 0;
    LibraryLog log;
    const bool ok = static_cast<IKVStream&>(*object).StreamOut(bytes, pos);
    check.verify();
    if (!ok) {
      refused(kind(), "writer refused the object", {}, log);
    }
    return bytes;
  }

  void find_spectra(const SpectrumVisitor& visit) const override {
    visit_values(values_, "", visit);
  }

 private:
  std::shared_ptr<Class> read_;  // the object the library reader filled
  PropertyValues<Class> values_;
};

template <class Class>
std::unique_ptr<StreamState> object(StreamKind kind) {
  return std::make_unique<ObjectState<Class>>(kind);
}

}  // namespace

// The one table of kinds: each object kind's class, each record kind's
// Streams operation and the names of its record arguments.
std::unique_ptr<StreamState> stream_state(StreamKind kind) {
  using S = Streams;
  switch (kind) {
    case StreamKind::User:
      return object<KVUser>(kind);
    case StreamKind::Tolerance:
      return object<KVTolerance>(kind);
    case StreamKind::TolSet:
      return object<KVTolSet>(kind);
    case StreamKind::Tile:
      return object<KVTile>(kind);
    case StreamKind::TileSet:
      return object<KVTileSet>(kind);
    case StreamKind::Calibration:
      return object<KVCalibration>(kind);
    case StreamKind::Profile:
      return object<KVProfile>(kind);
    case StreamKind::TestRun:
      return object<KVTestRun>(kind);
    case StreamKind::SCPair:
      return records(kind, &S::Stream_SCPair, {"SCP"}, S::kSCPairBytes);
    case StreamKind::TileSetCalibration:
      return records(kind, &S::Stream_TileSetCalibration, {"TS", "TSC"});
    case StreamKind::ProfileRecord:
      return records(kind, &S::Stream_Profile, {"pro"});
    case StreamKind::Station:
      return records(kind, &S::Stream_Station, {"Station"});
    case StreamKind::TestRunRecord:
      return records(kind, &S::Stream_TestRun, {"TR"});
    case StreamKind::UserBlock:
      return records(kind, &S::Stream_User, {"User"}, S::kUserBlockBytes);
    case StreamKind::Organization:
      return records(kind, &S::Stream_Organization, {"Org"}, S::kOrganizationBlockBytes);
  }
  bad_usage("internal error: no stream of kind " + std::to_string(static_cast<int>(kind)));
}

std::unique_ptr<StreamState> decode_stream(StreamKind kind, ByteArray& bytes) {
  auto state = stream_state(kind);
  try {
    state->read_stream(bytes);
  } catch (const Error& e) {
    bad_input("the " + std::string(kind_name(kind)) + " reader failed: " + e.what());
  }
  return state;
}

void write_document(const StreamState& state, JsonWriter& w) {
  w.begin_object();
  w.key("kind");
  w.value(Json(kind_name(state.kind())));
  state.write_members(w);
  w.end_object();
}

std::string document_text(const StreamState& state) {
  std::string text;
  JsonWriter w([&](std::string_view piece) { text += piece; });
  write_document(state, w);
  w.flush();
  return text;
}

StreamKind document_kind(const Json& doc, std::optional<StreamKind> kind) {
  if (!doc.is_object())
    bad_input("expected a JSON object {\"kind\": ..., ...}, found " + describe(doc));
  const auto it = doc.find("kind");
  if (it == doc.end() || !it->is_string()) {
    if (kind) bad_input("kind: missing; expected \"" + std::string(kind_name(*kind)) + "\"");
    bad_input("kind: missing; expected one of: " + kind_list());
  }
  const std::string& word = it->get_ref<const std::string&>();
  const auto named = parse_kind(word);
  if (!named)
    bad_input("kind: " + quote(word) + " is not a kind of stream; expected one of: " + kind_list());
  if (kind && *named != *kind) {
    bad_input("kind: the document holds a " + quote(word) + " stream, not \"" +
              std::string(kind_name(*kind)) + "\"");
  }
  return *named;
}

std::unique_ptr<StreamState> read_document(const Json& doc, std::optional<StreamKind> kind) {
  const StreamKind k = document_kind(doc, kind);
  auto state = stream_state(k);
  Fields f(doc, "");
  f.get("kind");
  state->read_members(f);
  f.done();
  return state;
}

std::span<const Byte> bytes_of(const ByteArray& a) {
  if (!a.has_bounds()) return {};
  return {a.data(), a.size()};
}

std::vector<Byte> encode_stream(StreamKind kind, const Json& doc) {
  auto state = read_document(doc, kind);
  try {
    const ByteArray bytes = state->write_stream();
    const auto span = bytes_of(bytes);
    return {span.begin(), span.end()};
  } catch (const Error& e) {
    bad_input("the " + std::string(kind_name(kind)) + " writer failed: " + e.what());
  }
}

}  // namespace kvdata::cli
