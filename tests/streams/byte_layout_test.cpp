#include <gtest/gtest.h>

#include <array>
#include <cstdint>
#include <span>
#include <vector>

#include "kvdata/kvdata.hpp"
#include "streams/detail/fixed_text.hpp"
#include "streams/detail/little_endian.hpp"
#include "streams/stream_test_support.hpp"

namespace kvdata {
namespace {

using Bytes = std::vector<Byte>;

TEST(ByteLayout, ScalarsAreLittleEndianAndBoundsChecked) {
  std::array<Byte, 8> buf{};
  const std::span<Byte> out(buf);
  EXPECT_TRUE(detail::store_le(out, 4, Long{-2}));
  EXPECT_TRUE(detail::store_le(out, 0, Integer{0x0102}));
  EXPECT_TRUE(detail::store_le(out, 2, u'\u20ac'));
  EXPECT_EQ(Bytes(buf.begin(), buf.end()), (Bytes{0x02, 0x01, 0xAC, 0x20, 0xFE, 0xFF, 0xFF, 0xFF}));
  EXPECT_FALSE(detail::store_le(out, 5, Long{1}));         // would end past the buffer
  EXPECT_FALSE(detail::store_le(out, SIZE_MAX, Byte{1}));  // offset overflow
  EXPECT_FALSE(detail::store_le(out, 1, Date{1.0}));
  EXPECT_EQ(buf[7], 0xFF);  // untouched by the refusals

  Long l = 0;
  EXPECT_TRUE(detail::load_le(std::span<const Byte>(buf), 4, l));
  EXPECT_EQ(l, -2);
  l = 5;
  EXPECT_FALSE(detail::load_le(std::span<const Byte>(buf), 6, l));
  EXPECT_EQ(l, 5);
}

TEST(ByteLayout, RunsOfSinglesAreTheirImagesInOrderWithOneCheck) {
  // 1.0f = 00 00 80 3F, -2.0f = 00 00 00 C0, 0.5f = 00 00 00 3F, 3.0f = 00 00 40 40.
  const std::array<Single, 2> a{1.0f, -2.0f};
  const std::array<Single, 2> b{0.5f, 3.0f};
  std::array<Byte, 18> buf{};
  buf.fill(0xEE);
  const std::span<Byte> out(buf);
  EXPECT_TRUE(
      detail::store_le_interleaved(out, 1, std::span<const Single>(a), std::span<const Single>(b)));
  EXPECT_EQ(Bytes(buf.begin(), buf.end()),
            (Bytes{0xEE, 0x00, 0x00, 0x80, 0x3F, 0x00, 0x00, 0x00, 0x3F, 0x00, 0x00, 0x00, 0xC0,
                   0x00, 0x00, 0x40, 0x40, 0xEE}));
  std::array<Byte, 10> flat{};
  flat.fill(0xEE);
  EXPECT_TRUE(detail::store_le_run(std::span<Byte>(flat), 1, std::span<const Single>(b)));
  EXPECT_EQ(Bytes(flat.begin(), flat.end()),
            (Bytes{0xEE, 0x00, 0x00, 0x00, 0x3F, 0x00, 0x00, 0x40, 0x40, 0xEE}));

  // A run that would end past the buffer, or halves of different lengths,
  // write nothing.
  const std::array<Byte, 18> before = buf;
  EXPECT_FALSE(detail::store_le_run(out, 11, std::span<const Single>(b)));
  EXPECT_FALSE(
      detail::store_le_interleaved(out, 3, std::span<const Single>(a), std::span<const Single>(b)));
  EXPECT_FALSE(detail::store_le_interleaved(out, 0, std::span<const Single>(a),
                                            std::span<const Single>(b).first(1)));
  EXPECT_FALSE(detail::store_le_run(out, SIZE_MAX, std::span<const Single>(b)));
  EXPECT_EQ(buf, before);

  std::array<Single, 2> a_in{7.0f, 7.0f};
  std::array<Single, 2> b_in{7.0f, 7.0f};
  const std::span<const Byte> in(buf);
  EXPECT_TRUE(detail::load_le_interleaved(in, 1, std::span<Single>(a_in), std::span<Single>(b_in)));
  EXPECT_EQ(a_in, a);
  EXPECT_EQ(b_in, b);
  std::array<Single, 2> run_in{};
  EXPECT_TRUE(detail::load_le_run(std::span<const Byte>(flat), 1, std::span<Single>(run_in)));
  EXPECT_EQ(run_in, b);
  const std::array<Single, 2> kept = run_in;
  EXPECT_FALSE(detail::load_le_run(std::span<const Byte>(flat), 3, std::span<Single>(run_in)));
  EXPECT_FALSE(
      detail::load_le_interleaved(in, 3, std::span<Single>(a_in), std::span<Single>(b_in)));
  EXPECT_EQ(run_in, kept);  // untouched by the refusals
  EXPECT_EQ(a_in, a);
  EXPECT_EQ(b_in, b);
}

TEST(ByteLayout, StreamPositionsIndexTheArrayWhateverItsLowerBound) {
  ByteArray loaded = testing::stream_of({1, 2, 3, 4, 5}, 1);
  Integer i = 0;
  EXPECT_TRUE(detail::load_le(loaded, 4, i));
  EXPECT_EQ(i, 0x0504);
  EXPECT_FALSE(detail::load_le(loaded, 5, i));
  EXPECT_FALSE(detail::load_le(loaded, 0, i));
  EXPECT_EQ(detail::bytes_from(loaded, 1), 5u);
  EXPECT_EQ(detail::bytes_from(loaded, 5), 1u);
  EXPECT_EQ(detail::bytes_from(loaded, 6), 0u);
  EXPECT_EQ(detail::bytes_from(loaded, 0), 0u);
  EXPECT_EQ(detail::bytes_from(ByteArray(), 0), 0u);
  EXPECT_TRUE(detail::window(loaded, 6, 0).has_value());  // just past the end
  EXPECT_FALSE(detail::window(loaded, 5, 2).has_value());
  EXPECT_FALSE(detail::window(ByteArray(), 0, 0).has_value());
  EXPECT_TRUE(detail::store_le(loaded, 2, Integer{-1}));
  EXPECT_EQ(testing::contents(loaded), (Bytes{1, 0xFF, 0xFF, 4, 5}));
}

TEST(ByteLayout, FixedTextIsCutOrPaddedAndReadRaw) {
  std::array<Byte, 10> buf{};
  const std::span<Byte> out(buf);
  EXPECT_TRUE(detail::store_fixed_text(out, 0, 3, u"a"));
  EXPECT_TRUE(detail::store_fixed_text(out, 6, 2, u"xyz"));
  EXPECT_EQ(Bytes(buf.begin(), buf.end()), (Bytes{'a', 0, ' ', 0, ' ', 0, 'x', 0, 'y', 0}));
  EXPECT_FALSE(detail::store_fixed_text(out, 8, 2, u"no"));

  std::array<Byte, 6> raw{'h', 0, 0, 0, ' ', 0};
  String text = u"old";
  EXPECT_TRUE(detail::load_fixed_text(std::span<const Byte>(raw), 0, 3, text));
  EXPECT_EQ(text, String(u"h\0 ", 3));
  EXPECT_EQ(trim_blanks(text), String(u"h\0", 2));  // U+0000 stays
  EXPECT_FALSE(detail::load_fixed_text(std::span<const Byte>(raw), 2, 3, text));
  EXPECT_EQ(text, String(u"h\0 ", 3));
}

}  // namespace
}  // namespace kvdata
