// Value scales and row order of ZvRasterConvert.
#include <zv/raster.h>

#include <gtest/gtest.h>

#include <vector>

namespace {
template <class D, class S>
D ConvertOne(S v) {
  ZvRaster<S> src(1, 1, v);
  ZvRaster<D> dst(1, 1, D(0));
  ZvRasterConvert(dst, src);
  return dst.GetVal(0);
}
}  // namespace

TEST(RasterConvert, ShortToBytesSaturatesAndTreatsNegativesAsFull) {
  EXPECT_EQ((ConvertOne<unsigned char, short>(-1)), 255);
  EXPECT_EQ((ConvertOne<unsigned char, short>(-32768)), 255);
  EXPECT_EQ((ConvertOne<unsigned char, short>(16384)), 255);
  EXPECT_EQ((ConvertOne<unsigned char, short>(32767)), 255);
  EXPECT_EQ((ConvertOne<unsigned char, short>(0)), 0);
  EXPECT_EQ((ConvertOne<unsigned char, short>(8224)), 128);
}

TEST(RasterConvert, FloatMappingsTruncateOrRoundWithoutClamping) {
  EXPECT_EQ((ConvertOne<unsigned char, float>(0.999f)), 254);
  EXPECT_EQ((ConvertOne<unsigned char, float>(1.0f)), 255);
  EXPECT_EQ((ConvertOne<unsigned char, float>(2.0f)), 254);    // 510, low 8 bits
  EXPECT_EQ((ConvertOne<unsigned char, float>(-0.01f)), 254);  // -2.55 truncates to -2
  EXPECT_EQ((ConvertOne<short, float>(1.0f)), 16384);
  EXPECT_EQ((ConvertOne<short, float>(0.5f / 16384.0f)), 1);   // rounds
  EXPECT_EQ((ConvertOne<short, float>(2.0f)), 32768 - 65536);  // wraps, no clamp
  EXPECT_EQ((ConvertOne<float, short>(16384)), 1.0f);
  EXPECT_EQ((ConvertOne<float, short>(32767)), 1.0f);
  EXPECT_EQ((ConvertOne<float, short>(-5)), 0.0f);
  EXPECT_EQ((ConvertOne<float, short>(8192)), 0.5f);
  EXPECT_EQ((ConvertOne<float, unsigned char>(0)), 0.0f);
}

TEST(RasterConvert, BytesToShortAndBackThroughFloat) {
  EXPECT_EQ((ConvertOne<short, unsigned char>(255)), 16384);
  EXPECT_EQ((ConvertOne<short, unsigned char>(128)), 8224);
  EXPECT_EQ((ConvertOne<float, short>(ConvertOne<short, unsigned char>(255))), 1.0f);
  for (int v = 0; v < 256; ++v) {
    const unsigned char b = static_cast<unsigned char>(v);
    EXPECT_EQ((ConvertOne<unsigned char, short>(ConvertOne<short, unsigned char>(b))), b) << v;
    EXPECT_EQ((ConvertOne<unsigned char, unsigned char>(b)), b);
  }
}

TEST(RasterConvert, ResizesTheTargetAndReversesRowsWhenFlagsDiffer) {
  ZvRaster<short> src(2, 3, 0);
  for (int y = 0; y < 3; ++y)
    src.SetValOnSpan(0, 1, y, static_cast<short>(y * 100));
  std::vector<short> memory(1, 0);
  ZvRaster<short> dst(memory.data(), 1, 1, 0, 0);  // a wrapper, to be abandoned
  dst.SetOrientationFlag(2);
  src.SetOrientationFlag(1);  // 1 and 2 count as different
  ZvRasterConvert(dst, src);
  EXPECT_EQ(dst.GetWidth(), 2);
  EXPECT_EQ(dst.GetHeight(), 3);
  EXPECT_NE(dst.GetRaster(), memory.data());
  EXPECT_EQ(dst.GetOrientationFlag(), 2);
  EXPECT_EQ(dst.GetVal(1, 0), 200);
  EXPECT_EQ(dst.GetVal(0, 2), 0);

  // Equal flags keep the row order, and a raster of the right size keeps its buffer.
  ZvRaster<float> same(2, 3, 9.0f);
  same.SetOrientationFlag(1);
  float* const before = same.GetRaster();
  ZvRasterConvert(same, src);
  EXPECT_EQ(same.GetRaster(), before);
  EXPECT_FLOAT_EQ(same.GetVal(0, 2), 200.0f / 16384.0f);
}
