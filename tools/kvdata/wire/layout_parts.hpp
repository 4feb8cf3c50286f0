#pragma once
// Pieces shared by the layout walks (internal to wire/).

#include <string>

#include "wire/cursor.hpp"

namespace kvdata::cli::layout {

// The single stamps that open versioned streams.
inline constexpr Single kUserStamp = 1.2f;
inline constexpr Single kProfileStamp = 1.4f;

// Bytes per element of the record streams, for the checks that a count fits.
inline constexpr std::size_t kSpectrumBytes = 40 * 4;
inline constexpr std::size_t kPairBytes = 2 * kSpectrumBytes;
inline constexpr std::size_t kIIATileBytes = 2 * kPairBytes;  // Trial and TrialProfiled
inline constexpr std::size_t kToleranceBytes = 749;           // record and its trailing byte

// The record stream of a profile (ISN, Created, Validated, record name, the
// 320 interleaved table values). `object` names the tables as the profile
// object's properties; otherwise as the record's fields under `prefix`.
void profile_record(Cursor& c, const std::string& prefix, bool object);

// The record stream of a test run, fields named under `prefix`.
void testrun_record(Cursor& c, const std::string& prefix);

// The end of a stream: up to `spare` bytes that the writer leaves after the
// encoding (shown, not read); `required` when the reader needs that byte to
// be there.
void finish(Cursor& c, std::size_t spare, bool required, const std::string& kind);

}  // namespace kvdata::cli::layout
