#pragma once
// The field codec: one scalar value written into or read out of a byte stream
// at a running Position, which then moves past it. Streams are plain
// concatenations of these encodings, without tags, padding or separators:
//
//   Integer  2 bytes   two's complement, little-endian
//   Long     4 bytes   two's complement, little-endian
//   Single   4 bytes   IEEE 754 binary32, little-endian
//   Date     8 bytes   IEEE 754 binary64 day count, little-endian
//   Boolean  1 byte    1 for True, 0 for False; only the byte 1 reads as True
//   String   4 + n     a Long n, then n Windows-1252 bytes (no terminator)
//
// Position indexes the array itself, not an offset from its lower bound.
// Writers grow the array (lower bound kept) to end exactly at the value they
// wrote; an array that was never given bounds is not created.
//
// None of the operations reports to its caller. A failure (an index outside
// the array, a Position that would overflow, no memory) is written to the
// event log as one entry and the operation returns; a fixed-width or Boolean
// value that fails leaves Value, Position and the array's elements unchanged.
//
//   kvdata::ByteArray bytes(0, -1);  kvdata::Long pos = 0;
//   kvdata::StringToArray(u"abc", bytes, pos);   // 03 00 00 00 61 62 63, pos == 7

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"

namespace kvdata {

void IntegerToArray(Integer Value, ByteArray& Stream, Long& Position);
void IntegerFromArray(const ByteArray& Stream, Long& Position, Integer& Value);

void LongToArray(Long Value, ByteArray& Stream, Long& Position);
void LongFromArray(const ByteArray& Stream, Long& Position, Long& Value);

void SingleToArray(Single Value, ByteArray& Stream, Long& Position);
void SingleFromArray(const ByteArray& Stream, Long& Position, Single& Value);

void DateToArray(Date Value, ByteArray& Stream, Long& Position);
void DateFromArray(const ByteArray& Stream, Long& Position, Date& Value);

void BooleanToArray(bool Value, ByteArray& Stream, Long& Position);
void BooleanFromArray(const ByteArray& Stream, Long& Position, bool& Value);

// Writes the count and then the body. When the count cannot be written,
// nothing more is written (the count's entry is the one entry logged); a
// later failure leaves the count written and Position just after it.
void StringToArray(const String& Value, ByteArray& Stream, Long& Position);

// A count that cannot be read yields the empty string. A count of 0 yields
// the empty string. A negative count, or one that runs past the array's end,
// is a failure found before anything is allocated or copied: Value keeps its
// content and Position stays just after the count.
void StringFromArray(const ByteArray& Stream, Long& Position, String& Value);

}  // namespace kvdata
