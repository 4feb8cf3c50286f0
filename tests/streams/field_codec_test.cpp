#include <gtest/gtest.h>

#include <functional>
#include <limits>
#include <string>
#include <type_traits>
#include <vector>

#include "kvdata/kvdata.hpp"
#include "streams/stream_test_support.hpp"

namespace kvdata {
namespace {

using testing::contents;
using testing::LogCapture;
using testing::stream_of;
using testing::Wire;
using Bytes = std::vector<Byte>;

constexpr Long kLongMax = std::numeric_limits<Long>::max();

// One value of a codec type, its writer and reader, and its image.
struct Sample {
  std::string name;
  std::function<void(ByteArray&, Long&)> write;
  std::function<bool(const ByteArray&, Long&)> reads_back;
  Bytes image;
};

template <class T, class To, class From>
Sample sample(std::string name, T value, To to, From from, Bytes image) {
  return {std::move(name), [=](ByteArray& s, Long& p) { to(value, s, p); },
          [=](const ByteArray& s, Long& p) {
            T read{};  // never the sample's value, so the reader must store
            if constexpr (std::is_same_v<T, bool>) read = !value;
            if constexpr (std::is_same_v<T, String>) read = u"old";
            from(s, p, read);
            return read == value;
          },
          std::move(image)};
}

TEST(FieldCodec, EachTypeWritesAndReadsItsLittleEndianImage) {
  LogCapture log;
  const std::vector<Sample> samples = {
      sample("Long 1", Long{1}, LongToArray, LongFromArray, {0x01, 0x00, 0x00, 0x00}),
      sample("Long min", std::numeric_limits<Long>::min(), LongToArray, LongFromArray,
             {0x00, 0x00, 0x00, 0x80}),
      sample("Long", Long{0x12345678}, LongToArray, LongFromArray, {0x78, 0x56, 0x34, 0x12}),
      sample("Integer -2", Integer{-2}, IntegerToArray, IntegerFromArray, {0xFE, 0xFF}),
      sample("Integer", Integer{0x1234}, IntegerToArray, IntegerFromArray, {0x34, 0x12}),
      sample("True", true, BooleanToArray, BooleanFromArray, {0x01}),
      sample("False", false, BooleanToArray, BooleanFromArray, {0x00}),
      sample("Single 1", 1.0f, SingleToArray, SingleFromArray, {0x00, 0x00, 0x80, 0x3F}),
      sample("Single -2.5", -2.5f, SingleToArray, SingleFromArray, {0x00, 0x00, 0x20, 0xC0}),
      sample("Date 1.5", Date{1.5}, DateToArray, DateFromArray,
             {0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0xF8, 0x3F}),
      sample("String", String(u"abc"), StringToArray, StringFromArray,
             {0x03, 0x00, 0x00, 0x00, 0x61, 0x62, 0x63}),
      sample("empty String", String(u""), StringToArray, StringFromArray,
             {0x00, 0x00, 0x00, 0x00})};
  ByteArray all(0, -1);
  Long end = 0;
  Bytes images;
  for (const Sample& c : samples) {
    // Alone in an empty stream: it grows to end exactly at the value.
    ByteArray stream(0, -1);
    Long pos = 0;
    c.write(stream, pos);
    EXPECT_EQ(contents(stream), c.image) << c.name;
    EXPECT_EQ(pos, static_cast<Long>(c.image.size())) << c.name;
    EXPECT_EQ(stream.lbound(), 0) << c.name;
    // Read from a loaded stream (lower bound 1).
    const ByteArray loaded = stream_of(c.image, 1);
    pos = 1;
    EXPECT_TRUE(c.reads_back(loaded, pos)) << c.name;
    EXPECT_EQ(pos, 1 + static_cast<Long>(c.image.size())) << c.name;
    // One after another in one stream.
    c.write(all, end);
    images.insert(images.end(), c.image.begin(), c.image.end());
  }
  EXPECT_EQ(contents(all), images);
  EXPECT_EQ(end, static_cast<Long>(images.size()));
  EXPECT_TRUE(log.entries.empty());
}

TEST(FieldCodec, WritersGrowToTheExactEndAndKeepTheLowerBound) {
  LogCapture log;
  ByteArray gap = stream_of({0xAA, 0xBB, 0xCC, 0xDD});
  Long pos = 10;
  SingleToArray(1.0f, gap, pos);
  EXPECT_EQ(contents(gap),
            (Bytes{0xAA, 0xBB, 0xCC, 0xDD, 0, 0, 0, 0, 0, 0, 0x00, 0x00, 0x80, 0x3F}));
  EXPECT_EQ(pos, 14);

  ByteArray loaded(1, 1);
  pos = 1;
  DateToArray(Date{0}, loaded, pos);
  BooleanToArray(true, loaded, pos);
  EXPECT_EQ(loaded.lbound(), 1);
  EXPECT_EQ(loaded.ubound(), 9);
  EXPECT_EQ(pos, 10);

  // A stream already long enough is written in place, never shrunk.
  ByteArray big(0, 99);
  pos = 0;
  IntegerToArray(1, big, pos);
  StringToArray(u"xy", big, pos);
  EXPECT_EQ(big.ubound(), 99);
  EXPECT_EQ(pos, 8);

  EXPECT_TRUE(log.entries.empty());
}

TEST(FieldCodec, TextTravelsAsWindows1252Bytes) {
  ByteArray stream(0, -1);
  Long pos = 0;
  // The count is in bytes; a character outside the code page (CJK, a
  // surrogate pair as one character, a lone surrogate, U+0100) becomes '?'.
  StringToArray(u"caf\u00e9 \u20ac\u4e2d\U0001F600x\xD800\u0100", stream, pos);
  EXPECT_EQ(
      contents(stream),
      Wire().l32(11).raw({0x63, 0x61, 0x66, 0xE9, 0x20, 0x80, '?', '?', 'x', '?', '?'}).bytes);
  String back;
  pos = 0;
  StringFromArray(stream, pos, back);
  EXPECT_EQ(back, u"caf\u00e9 \u20ac??x??");
  EXPECT_EQ(pos, 15);
}

TEST(FieldCodec, FixedWidthFailuresChangeNothingAndLogOneEntry) {
  LogCapture log;
  // Reading across the end of the array, or from below its lower bound.
  const ByteArray three = stream_of({1, 2, 3});
  const ByteArray loaded = stream_of({1, 2, 3, 4, 5, 6, 7, 8, 9}, 1);
  Long pos = 0;
  Long l = 99;
  LongFromArray(three, pos, l);
  EXPECT_EQ(pos, 0);
  Date d{3.0};
  DateFromArray(loaded, pos, d);
  Integer i = 5;
  pos = 9;
  IntegerFromArray(loaded, pos, i);
  EXPECT_EQ(pos, 9);
  Single f = 2.0f;
  pos = -4;
  SingleFromArray(loaded, pos, f);
  EXPECT_EQ(pos, -4);
  EXPECT_EQ(l, 99);
  EXPECT_EQ(d, Date{3.0});
  EXPECT_EQ(i, 5);
  EXPECT_EQ(f, 2.0f);

  // Writers into an array that was never given bounds: it is not created.
  ByteArray none;
  pos = 0;
  LongToArray(5, none, pos);
  IntegerToArray(-7, none, pos);
  SingleToArray(1.5f, none, pos);
  DateToArray(Date{45000.5}, none, pos);
  BooleanToArray(true, none, pos);
  EXPECT_FALSE(none.has_bounds());
  EXPECT_EQ(pos, 0);

  // A writer's Position below the lower bound neither grows nor writes.
  ByteArray small = stream_of({1, 2}, 5);
  pos = 3;
  LongToArray(-1, small, pos);
  EXPECT_EQ(contents(small), (Bytes{1, 2}));
  EXPECT_EQ(small.lbound(), 5);
  EXPECT_EQ(pos, 3);

  const String out_of_range = u" 9-Subscript out of range. (KVData).";
  const std::vector<String> expected = {
      u"Error in SUB LongFromArray - Value = 0." + out_of_range,
      u"Error in SUB DateFromArray - Value = 1899-12-30." + out_of_range,
      u"Error in SUB IntegerFromArray - Value = 0." + out_of_range,
      u"Error in SUB SingleFromArray - Value = 0." + out_of_range,
      u"Error in SUB LongToArray - Value = 5." + out_of_range,
      u"Error in SUB IntegerToArray - Value = -7." + out_of_range,
      u"Error in SUB SingleToArray - Value = 1.5." + out_of_range,
      u"Error in SUB DateToArray - Value = 2023-03-15 12:00:00." + out_of_range,
      u"Error in SUB BooleanToArray - Value = True." + out_of_range,
      u"Error in SUB LongToArray - Value = -1." + out_of_range};
  EXPECT_EQ(log.entries, expected);
}

TEST(FieldCodec, BooleanReaderEntryShowsTheCurrentValueAndPosition) {
  LogCapture log;
  const ByteArray stream = stream_of({1, 1, 1, 1, 1});
  Long pos = 5;
  bool b = true;
  BooleanFromArray(stream, pos, b);
  EXPECT_TRUE(b);
  EXPECT_EQ(pos, 5);
  ASSERT_EQ(log.entries.size(), 1u);
  // No separator between the Position and the error number.
  EXPECT_EQ(
      log.entries[0],
      u"Error in SUB BooleanFromArray - Value = True. SourceArray Position = 59-Subscript out "
      u"of range. (KVData).");
}

TEST(FieldCodec, PositionOverflowIsAFailure) {
  LogCapture log;
  // Arrays whose indices reach the top of the Long range.
  ByteArray top(kLongMax - 3, kLongMax);
  Long pos = kLongMax - 3;
  Long l = 1;
  LongFromArray(top, pos, l);  // all four bytes exist, but Position + 4 does not
  EXPECT_EQ(l, 1);
  EXPECT_EQ(pos, kLongMax - 3);
  bool b = false;
  pos = kLongMax;
  BooleanFromArray(top, pos, b);
  EXPECT_EQ(pos, kLongMax);

  ByteArray tail(kLongMax - 1, kLongMax - 1);
  pos = kLongMax - 1;
  LongToArray(7, tail, pos);
  EXPECT_EQ(tail.ubound(), kLongMax - 1);
  EXPECT_EQ(pos, kLongMax - 1);
  ASSERT_EQ(log.entries.size(), 3u);
  EXPECT_EQ(log.entries[0], u"Error in SUB LongFromArray - Value = 0. 6-Overflow. (KVData).");
  EXPECT_EQ(log.entries[1],
            u"Error in SUB BooleanFromArray - Value = False. SourceArray Position = "
            u"21474836476-Overflow. (KVData).");
  EXPECT_EQ(log.entries[2], u"Error in SUB LongToArray - Value = 7. 6-Overflow. (KVData).");
}

TEST(FieldCodec, StringReaderFailures) {
  LogCapture log;
  // A count of 10 with only 6 bytes after it: nothing beyond the array is read.
  const ByteArray short_body = stream_of(Wire().l32(10).raw({'a', 'b', 'c', 'd', 'e', 'f'}).bytes);
  Long pos = 0;
  String value = u"keep";
  StringFromArray(short_body, pos, value);
  EXPECT_EQ(value, u"keep");
  EXPECT_EQ(pos, 4);
  ASSERT_EQ(log.entries.size(), 1u);
  EXPECT_EQ(log.entries[0],
            u"Calling CopyMemory - (StringFromArray - VIZuvuvadiRoruzu)\r\n"
            u"Error in SUB StringFromArray - Value = keep. String Size = 10 9-Subscript out of "
            u"range. (KVData).");

  // Fewer than 4 bytes left: the count's own entry, and the empty string.
  const ByteArray stub = stream_of({3, 0, 0});
  pos = 0;
  StringFromArray(stub, pos, value);
  EXPECT_EQ(value, u"");
  EXPECT_EQ(pos, 0);
  ASSERT_EQ(log.entries.size(), 2u);
  EXPECT_EQ(log.entries[1],
            u"Error in SUB LongFromArray - Value = 0. 9-Subscript out of range. (KVData).");

  // A negative count fails before any step is traced.
  const ByteArray negative = stream_of(Wire().l32(-1).raw({'x'}).bytes);
  pos = 0;
  value = u"old";
  StringFromArray(negative, pos, value);
  EXPECT_EQ(value, u"old");
  EXPECT_EQ(pos, 4);
  ASSERT_EQ(log.entries.size(), 3u);
  EXPECT_EQ(log.entries[2],
            u"\r\nError in SUB StringFromArray - Value = old. String Size = -1 "
            u"9-Subscript out of range. (KVData).");
}

TEST(FieldCodec, StringWriterFailures) {
  LogCapture log;
  // No bounds: the count cannot be written, and nothing more is tried.
  ByteArray none;
  Long pos = 0;
  StringToArray(u"abc", none, pos);
  EXPECT_FALSE(none.has_bounds());
  EXPECT_EQ(pos, 0);
  ASSERT_EQ(log.entries.size(), 1u);
  EXPECT_EQ(log.entries[0],
            u"Error in SUB LongToArray - Value = 3. 9-Subscript out of range. (KVData).");

  // The body would end past the Long range: the count stays written and
  // Position just after it.
  ByteArray top(kLongMax - 10, kLongMax - 10);
  pos = kLongMax - 10;
  StringToArray(u"abcdefghij", top, pos);
  EXPECT_EQ(pos, kLongMax - 6);
  EXPECT_EQ(top.ubound(), kLongMax - 7);
  EXPECT_EQ(contents(top), (Bytes{10, 0, 0, 0}));
  ASSERT_EQ(log.entries.size(), 2u);
  EXPECT_EQ(log.entries[1],
            u"Calling LongToArray - (StringToArray, VIZuvuvadiRoruzu)\r\n"
            u"Error in SUB StringToArray - Value = abcdefghij. 6-Overflow. (KVData).");
}

}  // namespace
}  // namespace kvdata
