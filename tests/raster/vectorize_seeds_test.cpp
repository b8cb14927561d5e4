// The seed corpus of the tracing fuzz target is written from the rasters below.
#include "trace_support.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>
#include <iterator>
#include <string>

TEST(VectorizeSeeds, FuzzSeedsAreTheWrittenRasters) {
  // ZV_WRITE_FUZZ_SEEDS=1 rewrites the committed seeds; otherwise they must match.
  std::string dir = __FILE__;
  for (int up = 0; up < 3; ++up)
    dir = dir.substr(0, dir.find_last_of('/'));
  dir += "/fuzz/corpus/fuzz_vectorize/";
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
  const bool write = std::getenv("ZV_WRITE_FUZZ_SEEDS") != nullptr;
  for (const auto& seed : seeds) {
    const std::string file = dir + seed.name;
    if (write)
      std::ofstream(file, std::ios::binary)
          .write(reinterpret_cast<const char*>(seed.bytes.data()),
                 static_cast<std::streamsize>(seed.bytes.size()));
    std::ifstream in(file, std::ios::binary);
    ASSERT_TRUE(in.good()) << file;
    const std::vector<unsigned char> stored((std::istreambuf_iterator<char>(in)),
                                            std::istreambuf_iterator<char>());
    EXPECT_EQ(stored, seed.bytes) << file;
    // The decoder gives back the raster the seed was made from.
    const TraceInput back = DecodeTraceInput(stored.data(), stored.size());
    EXPECT_EQ(back.raster.GetSize(), static_cast<int>(seed.bytes.size()) - 5) << file;
  }
}
