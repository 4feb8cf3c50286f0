#pragma once
// Expected stream images for the object tests, written out piece by piece
// from the layout tables: literal bytes, and fixed-width text fields as their
// UTF-16LE units followed by blank units (20 00).
//
//   ExpectedBytes e;  e.bytes({0x05, 0x00, 0x00, 0x00});  e.text("dE", 50);

#include <gtest/gtest.h>

#include <cstddef>
#include <initializer_list>
#include <string_view>
#include <vector>

#include "kvdata/automation/array.hpp"

struct ExpectedBytes {
  std::vector<kvdata::Byte> all;

  ExpectedBytes& bytes(std::initializer_list<int> literal) {
    for (int b : literal) all.push_back(static_cast<kvdata::Byte>(b));
    return *this;
  }
  ExpectedBytes& zeros(std::size_t n) {
    all.insert(all.end(), n, 0);
    return *this;
  }
  // ASCII text as UTF-16LE units, then blank units up to `units`.
  ExpectedBytes& text(std::string_view ascii, std::size_t units) {
    for (std::size_t i = 0; i < units; ++i) {
      all.push_back(i < ascii.size() ? static_cast<kvdata::Byte>(ascii[i]) : kvdata::Byte{0x20});
      all.push_back(0);
    }
    return *this;
  }
  ExpectedBytes& append(const std::vector<kvdata::Byte>& more) {
    all.insert(all.end(), more.begin(), more.end());
    return *this;
  }
};

// Compares the elements at indices from .. from + expected.size() - 1,
// reporting the first index that differs.
inline ::testing::AssertionResult HoldsAt(const kvdata::ByteArray& stream, kvdata::Long from,
                                          const std::vector<kvdata::Byte>& expected) {
  for (std::size_t i = 0; i < expected.size(); ++i) {
    const kvdata::Long index = from + static_cast<kvdata::Long>(i);
    if (!stream.contains(index)) {
      return ::testing::AssertionFailure() << "index " << index << " outside the stream";
    }
    if (stream(index) != expected[i]) {
      return ::testing::AssertionFailure()
             << "index " << index << " (offset " << i << ") holds " << int{stream(index)}
             << ", expected " << int{expected[i]};
    }
  }
  return ::testing::AssertionSuccess();
}
