#pragma once
// Expected stream images for the object tests, read from the sections of
// tests/data/object-images.txt (its header lists the tokens).
//
//   const std::vector<kvdata::Byte> image = ImageFromData("user");

#include <gtest/gtest.h>

#include <algorithm>
#include <cstddef>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

#include "kvdata/automation/array.hpp"

inline std::vector<kvdata::Byte> ImageFromData(const std::string& section) {
  std::ifstream in(std::string(KVDATA_SOURCE_DIR) + "/tests/data/object-images.txt");
  std::vector<kvdata::Byte> all;
  bool inside = false;
  for (std::string line; std::getline(in, line);) {
    line = line.substr(0, line.find('#'));
    if (!line.empty() && line[0] == '[') {
      inside = line.substr(1, line.find(']') - 1) == section;
      continue;
    }
    std::istringstream tokens(line);
    for (std::string t; inside && tokens >> t;) {
      std::size_t n = 0;
      std::string word;
      if (t == "zeros" && tokens >> n) {
        all.insert(all.end(), n, 0);
      } else if (t == "ascii" && tokens >> word) {
        all.insert(all.end(), word.begin(), word.end());
      } else if (t == "text" && tokens >> word >> n) {
        if (word == "-") word.clear();
        std::replace(word.begin(), word.end(), '_', ' ');
        for (std::size_t i = 0; i < n; ++i) {
          all.push_back(i < word.size() ? static_cast<kvdata::Byte>(word[i]) : kvdata::Byte{0x20});
          all.push_back(0);
        }
      } else if (t == "units" && tokens >> word >> n) {
        for (std::size_t i = 0; i < n; ++i) {
          all.push_back(static_cast<kvdata::Byte>(std::stoi(word, nullptr, 16)));
          all.push_back(0);
        }
      } else {
        all.push_back(static_cast<kvdata::Byte>(std::stoi(t, nullptr, 16)));
      }
    }
  }
  EXPECT_FALSE(all.empty()) << "no image [" << section << "]";
  return all;
}
