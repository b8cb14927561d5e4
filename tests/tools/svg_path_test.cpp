// The zv tool's reader of SVG path data. The tool's sources are not part of the library, so the
// reader is compiled into this test.
#include "tools/zv/svg_path.cpp"
#include "tools/zv/svg_arc.cpp"

#include <gtest/gtest.h>

#include <cmath>
#include <vector>

namespace {
std::vector<float> Coordinates(const ZvPath2f& path) {
  std::vector<float> v;
  for (unsigned int i = 0; i < path.NumPoints(); ++i) {
    const ZvPoint2<float> p = path.GetPoint(i);
    v.push_back(p.x);
    v.push_back(p.y);
  }
  return v;
}

ZvPath2f Parse(const std::string& d) {
  ZvPath2f path;
  std::string error;
  EXPECT_TRUE(ZvParseSvgPath(d, path, error)) << d << ": " << error;
  return path;
}

std::string Error(const std::string& d) {
  ZvPath2f path;
  std::string error;
  EXPECT_FALSE(ZvParseSvgPath(d, path, error)) << d;
  return error;
}
}  // namespace

TEST(SvgPath, AbsoluteAndRelativeLinesWithImplicitRepeats) {
  const std::vector<float> expected = {1, 2, 4, 2, 4, 6, 1, 6};
  EXPECT_EQ(Coordinates(Parse("M1 2 L4 2 4 6 H1")), expected);
  EXPECT_EQ(Coordinates(Parse("m1,2 3,0 v4 h-3")), expected);
  EXPECT_EQ(Coordinates(Parse("M1-2-3.5.5")), (std::vector<float>{1, -2, -3.5f, 0.5f}));
  EXPECT_EQ(Coordinates(Parse("M1e1 2E-1")), (std::vector<float>{10, 0.2f}));
}

TEST(SvgPath, SmoothCurvesReflectTheLastControlPoint) {
  const ZvPath2f c = Parse("M0 0 C0 1 2 1 2 0 S4 -1 4 0");
  EXPECT_EQ(c.NumPoints(), 7u);
  EXPECT_EQ(c.GetPoint(4).x, 2);
  EXPECT_EQ(c.GetPoint(4).y, -1);  // (2, 0) * 2 - (2, 1)
  const ZvPath2f q = Parse("M0 0 Q1 1 2 0 t2 0");
  EXPECT_EQ(Coordinates(q), (std::vector<float>{0, 0, 1, 1, 2, 0, 3, -1, 4, 0}));
  // S after a line starts at the current point.
  EXPECT_EQ(Parse("M0 0 L1 0 S2 1 3 0").GetPoint(2).x, 1);
}

TEST(SvgPath, CloseReturnsToTheStartAndRelativeMovesFollowIt) {
  const ZvPath2f p = Parse("M1 1 l2 0 0 2 z m1 1 l1 0 1 1 Z");
  EXPECT_EQ(p.NumSubpaths(), 2u);
  EXPECT_TRUE(p.IsSubpathClosed(0));
  EXPECT_TRUE(p.IsSubpathClosed(p.NumPoints() - 1));
  unsigned int first = 0, last = 0;
  ASSERT_TRUE(p.GetSubpathIndices(p.NumPoints() - 1, first, last));
  EXPECT_EQ(p.GetPoint(first).x, 2);
  EXPECT_EQ(p.GetPoint(first).y, 2);
}

TEST(SvgPath, MalformedDataNamesTheProblemAndItsOffset) {
  EXPECT_EQ(Error(""), "path data is empty at offset 0");
  EXPECT_EQ(Error("L1 1"), "path data must start with M or m at offset 0");
  EXPECT_EQ(Error("M1 1 L2"), "path data ends in the middle of a command at offset 7");
  EXPECT_EQ(Error("M1 1 L2 x"), "path data expects a number, not 'x' at offset 8");
  EXPECT_EQ(Error("M0 0 A1 1 0 2 1 2 2"),
            "path data expects an arc flag (0 or 1), not '2' at offset 12");
  EXPECT_EQ(Error("M0 0 a1 1 0 0"), "path data ends in the middle of a command at offset 13");
  EXPECT_EQ(Error("M0 0 A1 1 0 0 1 2"), "path data ends in the middle of a command at offset 17");
  EXPECT_EQ(Error("M0 0 K1 1"), "path data has an unknown command 'K' at offset 5");
  EXPECT_EQ(Error("M0 0 L1 1 Z 3"), "path data has an unexpected '3' at offset 12");
  EXPECT_EQ(Error("M1e999 0"), "path data has a number out of range at offset 1");
}

namespace {
// Where the cubics of an arc path lie: each sampled point mapped into the frame of the ellipse
// (centre c, radii rx, ry, turned by `degrees`) should have unit radius; answers the largest
// miss in units of the radius, and the signed angle the arc turns through.
struct ArcCheck {
  double worst = 0;
  double turned = 0;
};

ArcCheck Check(const ZvPath2f& path, double cx, double cy, double rx, double ry, double degrees) {
  const double phi = degrees * 3.14159265358979323846 / 180;
  auto angle = [&](double x, double y, double& r) {
    const double dx = x - cx, dy = y - cy;
    const double u = (std::cos(phi) * dx + std::sin(phi) * dy) / rx;
    const double v = (-std::sin(phi) * dx + std::cos(phi) * dy) / ry;
    r = std::hypot(u, v);
    return std::atan2(v, u);
  };
  ArcCheck out;
  double r = 0;
  double previous = angle(path.GetPoint(0).x, path.GetPoint(0).y, r);
  for (unsigned int i = 1; i + 2 < path.NumPoints(); i += 3) {
    const ZvPoint2<float> p[4] = {path.GetPoint(i - 1), path.GetPoint(i), path.GetPoint(i + 1),
                                  path.GetPoint(i + 2)};
    for (int k = 1; k <= 16; ++k) {
      const double t = k / 16.0, s = 1 - t;
      const double x =
          s * s * s * p[0].x + 3 * s * s * t * p[1].x + 3 * s * t * t * p[2].x + t * t * t * p[3].x;
      const double y =
          s * s * s * p[0].y + 3 * s * s * t * p[1].y + 3 * s * t * t * p[2].y + t * t * t * p[3].y;
      const double a = angle(x, y, r);
      out.worst = std::max(out.worst, std::fabs(r - 1));
      out.turned += std::remainder(a - previous, 2 * 3.14159265358979323846);
      previous = a;
    }
  }
  return out;
}
}  // namespace

TEST(SvgPath, ArcsFollowTheirEllipseWithEachFlagCombination) {
  const double pi = 3.14159265358979323846;
  // Ends on a known ellipse, centre (50, 50), radii 20 and 10, turned by 30 degrees: the large
  // and sweep flags pick the arc around that centre in either direction.
  const double t0 = 0.3, t1 = 2.0, phi = pi / 6;
  auto on = [&](double t) {
    return ZvPoint2<double>{
        50 + 20 * std::cos(t) * std::cos(phi) - 10 * std::sin(t) * std::sin(phi),
        50 + 20 * std::cos(t) * std::sin(phi) + 10 * std::sin(t) * std::cos(phi)};
  };
  const ZvPoint2<double> a = on(t0), b = on(t1);
  for (int sweep = 0; sweep < 2; ++sweep) {
    const int large = sweep ? 0 : 1;  // the short way round runs at increasing angle
    char d[160];
    std::snprintf(d, sizeof d, "M%.9g %.9g A20 10 30 %d %d %.9g %.9g", a.x, a.y, large, sweep, b.x,
                  b.y);
    const ZvPath2f path = Parse(d);
    const ArcCheck c = Check(path, 50, 50, 20, 10, 30);
    EXPECT_LT(c.worst, 1e-3) << d;
    EXPECT_NEAR(c.turned, sweep ? t1 - t0 : t1 - t0 - 2 * pi, 1e-3) << d;
    // One cubic per quarter turn or less.
    EXPECT_EQ(path.NumSegments(), sweep ? 2u : 3u) << d;
  }
  // Between (0, 0) and (10, 0) a radius of 10 allows two centres; each flag pair picks one arc.
  const double h = std::sqrt(75.0);
  const struct {
    const char* d;
    double cy, turned;
  } arcs[] = {{"M0 0 A10 10 0 0 1 10 0", h, pi / 3},
              {"M0 0 A10 10 0 0 0 10 0", -h, -pi / 3},
              {"M0 0 A10 10 0 1 1 10 0", -h, 5 * pi / 3},
              {"M0 0 a10 10 0 1 0 10 0", h, -5 * pi / 3},
              // Radii too small to reach grow until the chord is a diameter.
              {"M0 0 A1 1 0 0 1 10 0", 0, pi},
              // Flags written without separators.
              {"M0 0 a10,10 0 1110,0", -h, 5 * pi / 3}};
  for (const auto& arc : arcs) {
    const double r = arc.cy == 0 ? 5 : 10;
    const ArcCheck c = Check(Parse(arc.d), 5, arc.cy, r, r, 0);
    EXPECT_LT(c.worst, 1e-3) << arc.d;
    EXPECT_NEAR(c.turned, arc.turned, 1e-3) << arc.d;
  }
}

TEST(SvgPath, DegenerateArcsDrawALineOrNothing) {
  // A zero radius is a straight line; coincident ends draw nothing.
  EXPECT_EQ(Coordinates(Parse("M1 1 A0 5 0 0 1 4 5")), (std::vector<float>{1, 1, 4, 5}));
  EXPECT_EQ(Coordinates(Parse("M1 1 a5 5 0 1 1 0 0 L2 2")), (std::vector<float>{1, 1, 2, 2}));
  // The arc ends exactly on its end point, so relative commands after it start there.
  const ZvPath2f p = Parse("M0 0 a7 3 45 1 0 10 4 l1 1");
  EXPECT_EQ(p.GetPoint(p.NumPoints() - 2).x, 10);
  EXPECT_EQ(p.GetPoint(p.NumPoints() - 2).y, 4);
  EXPECT_EQ(p.GetPoint(p.NumPoints() - 1).x, 11);
}
