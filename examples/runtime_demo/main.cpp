// A small tour of the runtime that every KVData object stands on: arrays with
// their own bounds, Variants, the keyed collection and Windows-1252 text.
#include <kvdata/kvdata.hpp>

#include <cstdio>

int main() {
  using namespace kvdata;

  ByteArray stream(0, -1);
  for (Long i = 0; i < 8; ++i) {
    stream.redim_preserve(0, i);
    stream(i) = static_cast<Byte>(0x10 + i);
  }
  std::printf("byte stream: bounds %d..%d, %zu bytes\n", stream.lbound(), stream.ubound(),
              stream.size());

  Collection tiles;
  tiles.Add(String(u"White"), u"1");
  tiles.Add(String(u"Blue"), u"2");
  for (const Variant& name : tiles) std::printf("tile: %s\n", to_utf8(name.to_string()).c_str());
  std::printf("tile under key \"2\": %s\n", to_utf8(tiles.Item(u"2").to_string()).c_str());

  const String text = u"Caf\u00e9 \u20ac5";
  const auto bytes = ansi::encode(text);
  std::printf("Windows-1252 bytes of \"%s\":", to_utf8(text).c_str());
  for (Byte b : bytes) std::printf(" %02X", b);
  std::printf("\n");

  tSCPair pair;
  pair.Spectrum(eSC::SCI).Data(40) = 87.5f;
  std::printf("SCI band 40 (750 nm): %s\n",
              to_utf8(Variant(pair.Spectrum(eSC::SCI).Data(40)).to_string()).c_str());

  try {
    (void)pair.Spectrum(2);
  } catch (const Error& e) {
    std::printf("index 2 of a pair: error %d, %s\n", e.number(), e.what());
  }
  return 0;
}
