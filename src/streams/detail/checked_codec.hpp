#pragma once
// The field codec with a result: each operation behaves exactly as its public
// counterpart (same bytes, same growth, same event-log entry on failure) and
// also returns whether the value was written or read. Record streams and
// object streams use these so that they can stop at the first value that
// fails instead of reporting success for bytes they never had.
//
//   kvdata::Long n = 0;
//   if (!kvdata::checked::read_long(bytes, pos, n)) return false;   // entry already logged

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"

namespace kvdata::checked {

[[nodiscard]] bool write_integer(Integer value, ByteArray& stream, Long& position);
[[nodiscard]] bool read_integer(const ByteArray& stream, Long& position, Integer& value);

[[nodiscard]] bool write_long(Long value, ByteArray& stream, Long& position);
[[nodiscard]] bool read_long(const ByteArray& stream, Long& position, Long& value);

[[nodiscard]] bool write_single(Single value, ByteArray& stream, Long& position);
[[nodiscard]] bool read_single(const ByteArray& stream, Long& position, Single& value);

[[nodiscard]] bool write_date(Date value, ByteArray& stream, Long& position);
[[nodiscard]] bool read_date(const ByteArray& stream, Long& position, Date& value);

[[nodiscard]] bool write_boolean(bool value, ByteArray& stream, Long& position);
[[nodiscard]] bool read_boolean(const ByteArray& stream, Long& position, bool& value);

[[nodiscard]] bool write_string(const String& value, ByteArray& stream, Long& position);
// False also when the count could not be read (value is then the empty string).
[[nodiscard]] bool read_string(const ByteArray& stream, Long& position, String& value);

}  // namespace kvdata::checked
