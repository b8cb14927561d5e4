// The zv tool's tracing into SVG: thresholding and inversion, the path text of exact and fitted
// contours, and the area filter. The tool's sources are not part of the library, so they are
// compiled into this test.
#include "tools/zv/trace_svg.cpp"

#include <gtest/gtest.h>

namespace {
std::string Data(const std::string& svg) {
  const std::size_t at = svg.find(" d=\"") + 4;
  return svg.substr(at, svg.find('"', at) - at);
}
}  // namespace

TEST(TraceSvg, ThresholdAndInversionChooseTheRegion) {
  // One dark pixel at (1, 0) on a 3x2 grey raster whose other pixels sit at the threshold.
  ZvRaster<unsigned char> grey(3, 2, 128);
  grey.SetVal(1, 0, 127);
  ZvTraceOptions o;
  unsigned int contours = 0;
  const std::string svg = ZvTraceToSvg(grey, o, contours);
  EXPECT_EQ(contours, 1u);
  EXPECT_NE(svg.find("width=\"3\" height=\"2\" viewBox=\"0 0 3 2\""), std::string::npos);
  EXPECT_NE(svg.find("fill-rule=\"evenodd\""), std::string::npos);
  EXPECT_EQ(Data(svg), "M1 0 L1 1 L2 1 L2 0 L1 0 Z");
  // Inverted, the light pixels round it: an outer contour with a notch, no hole.
  o.invert = true;
  EXPECT_EQ(Data(ZvTraceToSvg(grey, o, contours)),
            "M0 0 L0 2 L3 2 L3 0 L2 0 L2 1 L1 1 L1 0 L0 0 Z");
  // With the threshold at 128 nothing is dark; at 129 everything is.
  o.invert = false;
  o.threshold = 129;
  EXPECT_EQ(Data(ZvTraceToSvg(grey, o, contours)), "M0 0 L0 2 L3 2 L3 0 L0 0 Z");
  o.threshold = 0;
  EXPECT_EQ(Data(ZvTraceToSvg(grey, o, contours)), "");
  EXPECT_EQ(contours, 0u);
}

TEST(TraceSvg, FittingWritesCubicsAndTheAreaFilterDropsDots) {
  ZvRaster<unsigned char> grey(40, 40, 255);
  for (int y = 0; y < 40; ++y)
    for (int x = 0; x < 40; ++x)
      if ((x - 20) * (x - 20) + (y - 20) * (y - 20) < 15 * 15) grey.SetVal(x, y, 0);
  grey.SetVal(0, 39, 0);  // a dot of one pixel
  ZvTraceOptions o;
  unsigned int contours = 0;
  ZvTraceToSvg(grey, o, contours);
  EXPECT_EQ(contours, 2u);
  o.minArea = 2;
  o.fit = 2;
  const std::string d = Data(ZvTraceToSvg(grey, o, contours));
  EXPECT_EQ(contours, 1u);
  EXPECT_NE(d.find(" C"), std::string::npos);
  EXPECT_EQ(d.substr(d.size() - 2), " Z");
  EXPECT_NE(d.find('.'), std::string::npos);
}
