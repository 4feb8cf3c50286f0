#pragma once
// The field codec with a result: each operation behaves exactly as its public
// counterpart (same bytes, same growth, same event-log entry on failure) and
// also returns whether the value was written or read. Record streams and
// object streams use these so that they can stop at the first value that
// fails instead of reporting success for bytes they never had.
//
//   kvdata::Long n = 0;
//   if (!kvdata::checked::read_long(bytes, pos, n)) return false;   // entry already logged

#include <cstddef>
#include <optional>
#include <span>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"

namespace kvdata::checked {

// Room for a run of fixed-width values that take `n` bytes from Position on,
// made as writing them one by one would make it: the array grows (lower
// bound and contents kept) to end no earlier than Position + n - 1. Gives
// those bytes, or nothing when one of those writes would fail (an array
// that is not one-dimensional, a Position below the lower bound or past the
// Long range, no memory); then the array is unchanged and nothing is logged,
// and the caller writes the values one by one, the failing one logging its
// entry. Position is not moved.
[[nodiscard]] std::optional<std::span<Byte>> reserve_run(ByteArray& stream, Long position,
                                                         std::size_t n) noexcept;

// The `n` bytes of a run of fixed-width values from Position on, or nothing
// when reading them one by one would fail on one of them (the caller then
// reads them one by one). Position is not moved.
[[nodiscard]] std::optional<std::span<const Byte>> peek_run(const ByteArray& stream, Long position,
                                                            std::size_t n) noexcept;

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
