// The seed corpus of the tracing fuzz target is written from the rasters below.
#include "tests/support/byte_blocks.h"
#include "trace_support.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>
#include <iterator>
#include <string>

TEST(VectorizeSeeds, FuzzSeedsAreTheWrittenRasters) {
  // ZV_WRITE_FUZZ_SEEDS=1 rewrites the committed seeds; otherwise they must match.
  std::mt19937 rng(5);
  ZvRaster<unsigned char> shapes(32, 24, 0), noise(16, 16, 0), pixel(1, 1, 1);
  PaintShapes(shapes, rng, 8);
  for (int i = 0; i < noise.GetSize(); ++i)
    noise.SetVal(i, static_cast<unsigned char>(rng() % 2));
  const struct {
    const char* name;
    std::vector<unsigned char> bytes;
  } seeds[] = {{"pixel", EncodeTraceInput(pixel, 1, 0, 0)},
               {"shapes", EncodeTraceInput(shapes, 1, 0, 0)},
               {"shapes_background", EncodeTraceInput(shapes, 0, 8, 3)},
               {"noise", EncodeTraceInput(noise, 1, 0, 2)}};
  for (const auto& seed : seeds) {
    ExpectFuzzSeed("fuzz_vectorize", seed.name, seed.bytes);
    // The decoder gives back the raster the seed was made from.
    const TraceInput back = DecodeTraceInput(seed.bytes.data(), seed.bytes.size());
    EXPECT_EQ(back.raster.GetSize(), static_cast<int>(seed.bytes.size()) - 5) << seed.name;
  }
}
