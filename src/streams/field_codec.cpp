// The field codec: the public operations, which report nothing, over checked
// operations that return whether the value went through. Each operation traps
// its failures at one boundary (trap) and writes exactly one event-log entry.

#include "kvdata/streams/field_codec.hpp"

#include <optional>
#include <span>
#include <string_view>
#include <utility>
#include <vector>

#include "automation/detail/failure.hpp"
#include "kvdata/automation/ansi.hpp"
#include "kvdata/automation/error.hpp"
#include "kvdata/automation/event_log.hpp"
#include "kvdata/automation/variant.hpp"
#include "streams/detail/checked_codec.hpp"
#include "streams/detail/little_endian.hpp"

namespace kvdata {

using namespace std::string_view_literals;

namespace {

using detail::kLongMax;
using detail::kWireWidth;

// Trace texts of the two string operations: the step last begun is named in
// the failure's entry.
constexpr std::u16string_view kTraceNone = u"";
constexpr std::u16string_view kTraceConvertOut =
    u"Calling StrConv (StringToArray, VIZuvuvadiRoruzu)";
constexpr std::u16string_view kTraceCountOut =
    u"Calling LongToArray - (StringToArray, VIZuvuvadiRoruzu)";
constexpr std::u16string_view kTraceCopyOut = u"CopyMemory - (StringToArray, VIZuvuvadiRoruzu)";
constexpr std::u16string_view kTraceCopyIn =
    u"Calling CopyMemory - (StringFromArray - VIZuvuvadiRoruzu)";
constexpr std::u16string_view kTraceConvertIn =
    u"Calling StrConv - (StringFromArray - VIZuvuvadiRoruzu)";
constexpr std::u16string_view kLineBreak = u"\r\n";

String number_text(Long n) {
  return Variant(n).to_string();
}

// Number "-" Description ". (" Source ")."
String error_text(const Error& e) {
  String text = number_text(e.number());
  text += u"-";
  text += e.description();
  text += u". (";
  text += e.source();
  text += u").";
  return text;
}

// "Error in SUB <op> - Value = <value>. <error>"
String common_text(std::u16string_view op, const String& value, const Error& e) {
  String text = u"Error in SUB ";
  text += op;
  text += u" - Value = ";
  text += value;
  text += u". ";
  text += error_text(e);
  return text;
}

// Writes the entry composed for `e`. The event log is the codec's only
// channel, so a failure to compose or write the entry has nowhere to go.
template <class Compose>
void log_failure(const Compose& compose, const Error& e) {
  try {
    EventLog::Write(compose(e));
  } catch (...) {
  }
}

template <class Compose>
void log_standard_failure(const Compose& compose, Long number) {
  try {
    log_failure(compose, Error(number, kDefaultErrorSource, standard_description(number)));
  } catch (...) {
  }
}

// The one failure boundary of every codec operation: runs `body` (which
// raises on failure or returns false when a nested operation already logged
// its own entry) and logs the trapped failure as composed by `compose`.
template <class Body, class Compose>
bool trap(const Body& body, const Compose& compose) {
  const auto log = [&](Long number, const Error* e) {
    if (e != nullptr) {
      log_failure(compose, *e);
    } else {
      log_standard_failure(compose, number);
    }
    return false;
  };
  return detail::on_failure(log, body);
}

// Makes indices position .. position + width - 1 exist: the array grows to
// end exactly there, lower bound and contents kept. Raises, changing
// nothing, for an array without bounds, a Position below the lower bound or
// a Position + width beyond the Long range.
void grow_to_hold(ByteArray& stream, Long position, Long width) {
  if (!stream.has_bounds()) raise(kSubscriptOutOfRange);
  if (position > kLongMax - width) raise(kOverflow);
  if (position < stream.lbound()) raise(kSubscriptOutOfRange);
  const Long last = position + width - 1;
  if (stream.ubound() < last) stream.redim_preserve(stream.lbound(), last);
}

// Fixed-width writer, the path that grows the array or fails: `wire` is the
// value's image type, `shown` what the entry renders as Value. Kept out of
// line so that the short path below carries none of its set-up.
template <class T, class Shown>
[[gnu::noinline]] bool write_fixed_growing(std::u16string_view op, T wire, Shown shown,
                                           ByteArray& stream, Long& position) {
  return trap(
      [&] {
        constexpr Long width = static_cast<Long>(kWireWidth<T>);
        grow_to_hold(stream, position, width);
        if (!detail::store_le(stream, position, wire)) raise(kSubscriptOutOfRange);
        position += width;
        return true;
      },
      [&](const Error& e) { return common_text(op, Variant(shown).to_string(), e); });
}

// Fixed-width writer. Two short paths cover nearly every write, and nothing
// can fail on them: an array that already holds every byte of the value (a
// pre-sized stream), and an array whose spare elements take the growth (a
// stream written value by value). Either way the array ends up as the
// growing path would leave it.
template <class T, class Shown>
bool write_fixed(std::u16string_view op, T wire, Shown shown, ByteArray& stream, Long& position) {
  constexpr Long width = static_cast<Long>(kWireWidth<T>);
  if (position <= kLongMax - width && stream.rank() == 1) {
    auto bytes = detail::window(stream, position, kWireWidth<T>);
    if (!bytes && position >= stream.lbound() && stream.try_extend(position + width - 1)) {
      bytes = detail::window(stream, position, kWireWidth<T>);
    }
    if (bytes) {
      static_cast<void>(detail::store_le(*bytes, 0, wire));
      position += width;
      return true;
    }
  }
  return write_fixed_growing(op, wire, shown, stream, position);
}

// Fixed-width reader, the path that fails. Value and Position change only
// once all bytes are in.
template <class T>
[[gnu::noinline]] bool read_fixed_failing(std::u16string_view op, const ByteArray& stream,
                                          Long& position, T& value) {
  return trap(
      [&] {
        constexpr Long width = static_cast<Long>(kWireWidth<T>);
        T read{};
        if (!detail::load_le(stream, position, read)) raise(kSubscriptOutOfRange);
        if (position > kLongMax - width) raise(kOverflow);
        value = read;
        position += width;
        return true;
      },
      // Nothing is assigned before all bytes are in: the value read so far is zero.
      [&](const Error& e) { return common_text(op, Variant(T{}).to_string(), e); });
}

// Fixed-width reader. Bytes that lie inside the array take the short path.
template <class T>
bool read_fixed(std::u16string_view op, const ByteArray& stream, Long& position, T& value) {
  constexpr Long width = static_cast<Long>(kWireWidth<T>);
  if (position <= kLongMax - width) {
    if (const auto bytes = detail::window(stream, position, kWireWidth<T>)) {
      static_cast<void>(detail::load_le(*bytes, 0, value));
      position += width;
      return true;
    }
  }
  return read_fixed_failing(op, stream, position, value);
}

}  // namespace

namespace checked {

std::optional<std::span<Byte>> reserve_run(ByteArray& stream, Long position,
                                           std::size_t n) noexcept {
  if (n == 0 || n > static_cast<std::size_t>(kLongMax)) return std::nullopt;
  const auto width = static_cast<Long>(n);
  if (stream.rank() != 1 || position < stream.lbound() || position > kLongMax - width) {
    return std::nullopt;
  }
  const Long last = position + width - 1;
  if (stream.ubound() < last && !stream.try_extend(last)) {
    try {
      stream.redim_preserve(stream.lbound(), last);
    } catch (...) {
      return std::nullopt;  // unchanged: the values one by one will log the failure
    }
  }
  return detail::window(stream, position, n);
}

std::optional<std::span<const Byte>> peek_run(const ByteArray& stream, Long position,
                                              std::size_t n) noexcept {
  if (n == 0 || n > static_cast<std::size_t>(kLongMax)) return std::nullopt;
  if (position > kLongMax - static_cast<Long>(n)) return std::nullopt;
  return detail::window(stream, position, n);
}

bool write_integer(Integer value, ByteArray& stream, Long& position) {
  return write_fixed(u"IntegerToArray"sv, value, value, stream, position);
}
bool read_integer(const ByteArray& stream, Long& position, Integer& value) {
  return read_fixed(u"IntegerFromArray"sv, stream, position, value);
}

bool write_long(Long value, ByteArray& stream, Long& position) {
  return write_fixed(u"LongToArray"sv, value, value, stream, position);
}
bool read_long(const ByteArray& stream, Long& position, Long& value) {
  return read_fixed(u"LongFromArray"sv, stream, position, value);
}

bool write_single(Single value, ByteArray& stream, Long& position) {
  return write_fixed(u"SingleToArray"sv, value, value, stream, position);
}
bool read_single(const ByteArray& stream, Long& position, Single& value) {
  return read_fixed(u"SingleFromArray"sv, stream, position, value);
}

bool write_date(Date value, ByteArray& stream, Long& position) {
  return write_fixed(u"DateToArray"sv, value, value, stream, position);
}
bool read_date(const ByteArray& stream, Long& position, Date& value) {
  return read_fixed(u"DateFromArray"sv, stream, position, value);
}

bool write_boolean(bool value, ByteArray& stream, Long& position) {
  return write_fixed(u"BooleanToArray"sv, Byte{value ? Byte{1} : Byte{0}}, value, stream, position);
}

bool read_boolean(const ByteArray& stream, Long& position, bool& value) {
  if (position < kLongMax) {
    if (const auto byte = detail::window(stream, position, 1)) {
      value = (*byte)[0] == 1;
      ++position;
      return true;
    }
  }
  return trap(
      [&] {
        Byte read = 0;
        if (!detail::load_le(stream, position, read)) raise(kSubscriptOutOfRange);
        if (position == kLongMax) raise(kOverflow);
        value = read == 1;
        ++position;
        return true;
      },
      [&](const Error& e) {
        // No separator between the Position and the error number.
        String text = u"Error in SUB BooleanFromArray - Value = ";
        text += Variant(value).to_string();
        text += u". SourceArray Position = ";
        text += number_text(position);
        text += error_text(e);
        return text;
      });
}

bool write_string(const String& value, ByteArray& stream, Long& position) {
  std::u16string_view trace = kTraceNone;
  return trap(
      [&] {
        trace = kTraceConvertOut;
        const std::vector<Byte> bytes = ansi::encode(value);
        if (bytes.size() > static_cast<std::size_t>(kLongMax)) raise(kOverflow);
        const auto n = static_cast<Long>(bytes.size());
        trace = kTraceCountOut;
        // A count that cannot be written has logged its own entry; the body
        // would fail for the same reason, so nothing more is attempted.
        if (!write_long(n, stream, position)) return false;
        if (n == 0) return true;
        grow_to_hold(stream, position, n);
        trace = kTraceCopyOut;
        const auto body = detail::window(stream, position, bytes.size());
        if (!body || !detail::store_bytes(*body, 0, bytes)) raise(kSubscriptOutOfRange);
        position += n;
        return true;
      },
      [&](const Error& e) {
        String text(trace);
        text += kLineBreak;
        text += common_text(u"StringToArray"sv, value, e);
        return text;
      });
}

bool read_string(const ByteArray& stream, Long& position, String& value) {
  Long n = 0;
  if (!read_long(stream, position, n)) {
    value.clear();
    return false;
  }
  if (n == 0) {
    value.clear();
    return true;
  }
  std::u16string_view trace = kTraceNone;
  return trap(
      [&] {
        if (n < 0) raise(kSubscriptOutOfRange);
        // The whole body must lie inside the array before anything is
        // allocated for it: a hostile count costs nothing.
        trace = kTraceCopyIn;
        const auto body = detail::window(stream, position, static_cast<std::size_t>(n));
        if (!body) raise(kSubscriptOutOfRange);
        if (position > kLongMax - n) raise(kOverflow);
        trace = kTraceConvertIn;
        String text = ansi::decode(*body);
        value = std::move(text);
        position += n;
        return true;
      },
      [&](const Error& e) {
        String text(trace);
        text += kLineBreak;
        text += u"Error in SUB StringFromArray - Value = ";
        text += value;
        text += u". String Size = ";
        text += number_text(n);
        text += u" ";
        text += error_text(e);
        return text;
      });
}

}  // namespace checked

void IntegerToArray(Integer Value, ByteArray& Stream, Long& Position) {
  static_cast<void>(checked::write_integer(Value, Stream, Position));
}
void IntegerFromArray(const ByteArray& Stream, Long& Position, Integer& Value) {
  static_cast<void>(checked::read_integer(Stream, Position, Value));
}
void LongToArray(Long Value, ByteArray& Stream, Long& Position) {
  static_cast<void>(checked::write_long(Value, Stream, Position));
}
void LongFromArray(const ByteArray& Stream, Long& Position, Long& Value) {
  static_cast<void>(checked::read_long(Stream, Position, Value));
}
void SingleToArray(Single Value, ByteArray& Stream, Long& Position) {
  static_cast<void>(checked::write_single(Value, Stream, Position));
}
void SingleFromArray(const ByteArray& Stream, Long& Position, Single& Value) {
  static_cast<void>(checked::read_single(Stream, Position, Value));
}
void DateToArray(Date Value, ByteArray& Stream, Long& Position) {
  static_cast<void>(checked::write_date(Value, Stream, Position));
}
void DateFromArray(const ByteArray& Stream, Long& Position, Date& Value) {
  static_cast<void>(checked::read_date(Stream, Position, Value));
}
void BooleanToArray(bool Value, ByteArray& Stream, Long& Position) {
  static_cast<void>(checked::write_boolean(Value, Stream, Position));
}
void BooleanFromArray(const ByteArray& Stream, Long& Position, bool& Value) {
  static_cast<void>(checked::read_boolean(Stream, Position, Value));
}
void StringToArray(const String& Value, ByteArray& Stream, Long& Position) {
  static_cast<void>(checked::write_string(Value, Stream, Position));
}
void StringFromArray(const ByteArray& Stream, Long& Position, String& Value) {
  static_cast<void>(checked::read_string(Stream, Position, Value));
}

}  // namespace kvdata
