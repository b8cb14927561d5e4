// Byte blocks in tests: the block an object writes, literal bytes written as hex, and the fuzz
// targets' seed corpora, which are the blocks the tests' own writers make, so that a format
// change shows up here first.
#ifndef ZV_TESTS_SUPPORT_BYTE_BLOCKS_H
#define ZV_TESTS_SUPPORT_BYTE_BLOCKS_H

#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

using Bytes = std::vector<unsigned char>;

// The whole block a persistent object writes (GetBufferSize, then WriteToBuffer); bytes the
// writer would skip show as 0xEE, and a writer that reports another length fails the test.
template <class T>
Bytes Block(const T& object) {
  Bytes block(object.GetBufferSize(), 0xEE);
  EXPECT_EQ(object.WriteToBuffer(block.data()), block.size());
  return block;
}

// "0a 1b ...": pairs of hex digits; spaces and line breaks are ignored.
inline std::vector<unsigned char> HexBytes(const std::string& text) {
  std::vector<unsigned char> out;
  for (std::size_t i = 0; i < text.size();) {
    if (text[i] == ' ' || text[i] == '\n') {
      ++i;
      continue;
    }
    out.push_back(static_cast<unsigned char>(std::stoi(text.substr(i, 2), nullptr, 16)));
    i += 2;
  }
  return out;
}

// Expects seed `name` of fuzz target `target` in the source tree to hold `bytes`. With
// ZV_WRITE_FUZZ_SEEDS set in the environment the seed is rewritten first.
inline void ExpectFuzzSeed(const std::string& target, const std::string& name,
                           const std::vector<unsigned char>& bytes) {
  const std::string file = std::string(ZV_SOURCE_DIR) + "/fuzz/corpus/" + target + "/" + name;
  if (std::getenv("ZV_WRITE_FUZZ_SEEDS") != nullptr) {
    std::ofstream(file, std::ios::binary)
        .write(reinterpret_cast<const char*>(bytes.data()),
               static_cast<std::streamsize>(bytes.size()));
  }
  std::ifstream in(file, std::ios::binary);
  ASSERT_TRUE(in.good()) << file;
  const std::vector<unsigned char> stored((std::istreambuf_iterator<char>(in)),
                                          std::istreambuf_iterator<char>());
  EXPECT_EQ(stored, bytes) << file;
}

#endif
