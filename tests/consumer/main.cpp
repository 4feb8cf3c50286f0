// Links against the installed KVData package and exercises its runtime.
#include <kvdata/kvdata.hpp>

#include <cstdio>

int main() {
  kvdata::Collection members;
  members.Add(kvdata::Long{5}, u"five");
  kvdata::ByteArray bytes(0, -1);
  const auto encoded = kvdata::ansi::encode(u"caf\u00e9");
  if (members.Item(u"FIVE").to_long() != 5 || encoded.size() != 4 || encoded[3] != 0xE9) {
    std::puts("consumer: unexpected result");
    return 1;
  }
  std::puts("consumer: KVData package found and working");
  return 0;
}
