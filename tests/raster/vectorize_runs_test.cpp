// Rows of runs against a plain pixel-by-pixel encoding: every row width up to a few chunks of the
// block scan, so that runs start and end at every position in a chunk and across chunks, and
// the row's end falls at every position too.
#include "raster/ob_context.h"

#include <gtest/gtest.h>

#include <random>
#include <vector>

namespace {
std::vector<std::uint16_t> PlainRuns(const std::vector<unsigned char>& pixels,
                                     unsigned char value) {
  std::vector<std::uint16_t> runs;
  const int width = static_cast<int>(pixels.size());
  for (int x = 0; x < width; ++x) {
    if (pixels[x] != value) continue;
    const int start = x;
    while (x + 1 < width && pixels[x + 1] == value)
      ++x;
    runs.push_back(static_cast<std::uint16_t>(start + 2));
    runs.push_back(static_cast<std::uint16_t>(x + 2));
  }
  return runs;
}
}  // namespace

TEST(VectorizeRuns, EveryWidthAndDensityEncodesAsPixelByPixel) {
  std::mt19937 rng(21);
  // Both ends of the byte and the middle: a signed compare would confuse 127 and 128, 0 and 255.
  const unsigned char values[] = {0, 127, 128, 255};
  for (int width = 1; width <= 260; ++width)
    for (int trial = 0; trial < 12; ++trial) {
      const unsigned char value = values[trial % 4];
      // From single pixels to long runs, so that whole words and chunks are one run or none.
      const unsigned int longest = 1u << (trial % 7);
      std::vector<unsigned char> pixels;
      bool on = rng() % 2;
      while (static_cast<int>(pixels.size()) < width) {
        const unsigned int length = 1 + rng() % longest;
        for (unsigned int k = 0; k < length && static_cast<int>(pixels.size()) < width; ++k)
          pixels.push_back(on ? value : static_cast<unsigned char>(value ^ (1u << (rng() % 8))));
        on = !on;
      }
      const std::vector<std::uint16_t> want = PlainRuns(pixels, value);
      // The row's own entries, then guards that must stay untouched.
      const unsigned int entries = ObRowEntries(width);
      std::vector<std::uint16_t> row(entries + 8, 0xbeef);
      ObEncodeRow(pixels.data(), width, value, row.data());
      ASSERT_LE(want.size() + 2, entries) << width;
      const std::vector<std::uint16_t> got(row.begin(), row.begin() + want.size());
      ASSERT_EQ(got, want) << "width " << width << " trial " << trial;
      EXPECT_EQ(row[want.size()], 0) << width;
      EXPECT_EQ(row[want.size() + 1], 0) << width;
      for (unsigned int i = entries; i < row.size(); ++i)
        ASSERT_EQ(row[i], 0xbeef) << width;
    }
}
