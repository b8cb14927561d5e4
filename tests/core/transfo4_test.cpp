#include <zv/transfo4.h>

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <sstream>
#include <vector>

namespace {

const double kPi = 3.14159265358979323846;
typedef ZvPoint2<double> P2;
typedef ZvPoint3<double> P3;

ZvTransfo4 FromRows(const double rows[4][4]) {
  double m[16];
  for (int i = 0; i < 16; ++i)
    m[i] = rows[i % 4][i / 4];
  return ZvTransfo4(m);
}

void ExpectNear(const ZvTransfo4& a, const ZvTransfo4& b, double tol) {
  for (int i = 0; i < 16; ++i)
    EXPECT_NEAR(a.GetMatrixPtr()[i], b.GetMatrixPtr()[i], tol) << i;
}

void ExpectNear(const P3& a, const P3& b, double tol) {
  EXPECT_NEAR(a.x, b.x, tol);
  EXPECT_NEAR(a.y, b.y, tol);
  EXPECT_NEAR(a.z, b.z, tol);
}

// A general affine transform with every element of the upper three rows in play.
ZvTransfo4 General() {
  const double rows[4][4] = {
      {1.5, -0.25, 0.5, 3}, {0.75, 2, -0.5, -4}, {0.1, 0.3, 1.2, 5}, {0, 0, 0, 1}};
  return FromRows(rows);
}

}  // namespace

TEST(Transfo4Composition, ProductsAndEditsOrder) {
  // Edits act in the local frame: the translate happens before the scale.
  ExpectNear(ZvTransfo4().Scale(2).Translate(1, 2, 3).Map(P3{0, 0, 0}), {2, 4, 6}, 0);
  // Mapped by a then by b is b a.
  ZvTransfo4 a, b;
  a.Translate(5, 0, 0);
  b.Scale(3);
  ExpectNear(ZvTransfo4(b).PostMultiply(a).Map(P3{1, 1, 1}), {18, 3, 3}, 0);
  ExpectNear(ZvTransfo4(a).PreMultiply(b), ZvTransfo4(b).PostMultiply(a), 0);
  // Every edit is post-multiplication by its local matrix.
  const ZvTransfo4 g = General();
  const struct {
    ZvTransfo4 edited;
    double local[4][4];
  } cases[] = {
      {ZvTransfo4(g).Translate(1, -2, 3),
       {{1, 0, 0, 1}, {0, 1, 0, -2}, {0, 0, 1, 3}, {0, 0, 0, 1}}},
      {ZvTransfo4(g).Scale(2, 3, 4), {{2, 0, 0, 0}, {0, 3, 0, 0}, {0, 0, 4, 0}, {0, 0, 0, 1}}},
      {ZvTransfo4(g).ShearXY(0.5, 2), {{1, 0, 0.5, 0}, {0, 1, 2, 0}, {0, 0, 1, 0}, {0, 0, 0, 1}}},
      {ZvTransfo4(g).ShearXZ(0.5, 2), {{1, 0.5, 0, 0}, {0, 1, 0, 0}, {0, 2, 1, 0}, {0, 0, 0, 1}}},
      {ZvTransfo4(g).ShearYZ(0.5, 2), {{1, 0, 0, 0}, {0.5, 1, 0, 0}, {2, 0, 1, 0}, {0, 0, 0, 1}}},
  };
  for (const auto& c : cases)
    ExpectNear(c.edited, ZvTransfo4(g).PostMultiply(FromRows(c.local)), 1e-12);
  // Centred forms leave their centre in place.
  const P3 o{2, -1, 3};
  for (const ZvTransfo4& t : {ZvTransfo4().Scale(2, 3, 4, o), ZvTransfo4().ShearXY(0.5, 2, o),
                              ZvTransfo4().ShearXZ(0.5, 2, o), ZvTransfo4().ShearYZ(0.5, 2, o),
                              ZvTransfo4().Rotate(37, o, o + P3{1, 2, 2})}) {
    ExpectNear(t.Map(o), o, 1e-12);
  }
}

TEST(Transfo4Rotation, SnappedAndOrdered) {
  const ZvTransfo4 quarter = ZvTransfo4().Rotate(90, 0, 0, 1);
  const double* m = quarter.GetMatrixPtr();
  EXPECT_TRUE(m[0] == 0 && m[1] == 1 && m[4] == -1 && m[5] == 0);
  const double flip[4][4] = {{1, 0, 0, 0}, {0, -1, 0, 0}, {0, 0, -1, 0}, {0, 0, 0, 1}};
  ExpectNear(ZvTransfo4().Rotate(180, 1, 0, 0), FromRows(flip), 0);
  // About a non-unit axis: the axis stays fixed and angles add up.
  ZvTransfo4 r;
  r.Rotate(25, 1, 2, 2);
  ExpectNear(r.Map(P3{1, 2, 2}), {1, 2, 2}, 1e-12);
  ExpectNear(r.Rotate(35, 2, 4, 4), ZvTransfo4().Rotate(60, 1, 2, 2), 1e-12);
  // RotateXYZ is Rz Ry Rx: the x turn acts first.
  ZvTransfo4 composed;
  composed.Rotate(50, 0, 0, 1).Rotate(-20, 0, 1, 0).Rotate(35, 1, 0, 0);
  ExpectNear(ZvTransfo4().RotateXYZ(P3{35, -20, 50}), composed, 1e-14);
  EXPECT_TRUE(std::isnan(ZvTransfo4().Rotate(10, 0, 0, 0).GetMatrixElement(0, 0)));
  // Plane rotations about a centre, by angle or from one direction to another.
  const P2 c{3, 4};
  const P2 q = ZvTransfo4().RotateXY(90, c).Map(P2{4, 4});
  EXPECT_TRUE(q.x == 3 && q.y == 5);
  ExpectNear(ZvTransfo4().RotateXY(c, P2{5, 4}, P2{2, 5}), ZvTransfo4().RotateXY(135, c), 1e-12);
  ExpectNear(ZvTransfo4(General()).RotateXY(c, c, P2{0, 0}), General(), 0);  // null: unchanged
}

TEST(Transfo4Map, WhichElementsAct) {
  double m[16];
  General().GetMatrix(m);
  m[3] = 7, m[7] = 8, m[11] = 9, m[15] = 10;
  const ZvTransfo4 t(m);
  // Points ignore the bottom row; the homogeneous form uses it, and may work in place.
  const P3 p = t.Map(P3{1, 2, 3});
  ExpectNear(p, {1.5 - 0.5 + 1.5 + 3, 0.75 + 4 - 1.5 - 4, 0.1 + 0.6 + 3.6 + 5}, 1e-12);
  double v[4] = {1, 2, 3, 1};
  t.Map(v, v);
  ExpectNear(P3{v[0], v[1], v[2]}, p, 1e-12);
  EXPECT_TRUE(v[3] == 7 + 16 + 27 + 10 && t.GetMatrixElement(3, 2) == 9);
  // A plane point has z = 0: only m[0], m[1], m[4], m[5], m[12], m[13] act on it.
  m[2] = m[6] = m[8] = m[9] = m[10] = m[14] = 99;
  const P2 q = ZvTransfo4(m).Map(P2{1, 2});
  EXPECT_TRUE(q.x == 1.5 - 0.5 + 3 && q.y == 0.75 + 4 - 4);
  // Float results are narrowed only at the end: 2^24 (1 + 2^-30) - 2^24 in double is 2^-6.
  const double k = 16777216.0 * (1 + std::ldexp(1.0, -30));
  EXPECT_EQ(ZvTransfo4().Translate(-16777216.0, 0, 0).Scale(k, 1, 1).Map(ZvPoint2<float>{1, 0}).x,
            std::ldexp(1.0f, -6));
}

TEST(Transfo4Map, ArraysRoundLikeSinglePoints) {
  // Long enough for any vectorised loop body and its tail: every element must be the same bits
  // as the single-point form, so no path may fuse or reorder the products.
  ZvTransfo4 t;
  t.RotateXY(31, P2{0.3, 7}).ScaleXY(1.1, 0.7, P2{1, 1}).RotateXYZ(P3{3, 5, 7});
  const unsigned int n = 1037;
  std::vector<ZvPoint2<float>> in2(n), out2(n);
  std::vector<P3> in3(n), out3(n);
  for (unsigned int i = 0; i < n; ++i) {
    in2[i] = {0.37f * i - 100, 1.0f / (i + 1)};
    in3[i] = {0.11 * i, -1.0 / (i + 3), 1e3 - i};
  }
  t.Map(in2.data(), n, out2.data());
  t.Map(in3.data(), n, out3.data());
  for (unsigned int i = 0; i < n; ++i) {
    const ZvPoint2<float> one2 = t.Map(in2[i]);
    const P3 one3 = t.Map(in3[i]);
    ASSERT_EQ(std::memcmp(&one2, &out2[i], sizeof one2), 0) << i;
    ASSERT_EQ(std::memcmp(&one3, &out3[i], sizeof one3), 0) << i;
  }
  t.MapInPlace(in2.data(), n);
  EXPECT_EQ(std::memcmp(in2.data(), out2.data(), n * sizeof out2[0]), 0);
}

TEST(Transfo4Map, Extents) {
  // A rotated square gives its axis-aligned hull; a mirror swaps min and max.
  const ZvExtent2<double> e = ZvTransfo4().Rotate(45, 0, 0, 1).Map(ZvExtent2<double>(-1, -1, 1, 1));
  EXPECT_EQ(e.kind, ZvExtent2<double>::Regular);
  EXPECT_NEAR(e.xmin, -std::sqrt(2.0), 1e-15);
  EXPECT_NEAR(e.ymax, std::sqrt(2.0), 1e-15);
  ZvExtent2<float> f(1, 2, 3, 5);
  ZvTransfo4().Scale(-1, 2, 1).MapInPlace(f);
  EXPECT_TRUE(f.xmin == -3 && f.xmax == -1 && f.ymin == 4 && f.ymax == 10);
  // Infinite passes unchanged, coordinates included.
  ZvExtent2<double> inf(7, 8, 9, 10, ZvExtent2<double>::Infinite), out;
  ZvTransfo4().Translate(1, 1, 0).Map(inf, out);
  EXPECT_TRUE(out.kind == ZvExtent2<double>::Infinite && out.xmin == 7);
}

TEST(Transfo4Inverse, RoundTripsAndSingularity) {
  ZvTransfo4 t = General(), inv;
  t.RotateXYZ(P3{10, 20, 30}).ShearXY(0.2, 0.1);
  ASSERT_EQ(t.Inverse(inv), 1);
  EXPECT_EQ(t.TestInverse(), 1);
  ExpectNear(inv.Map(t.Map(P3{0.3, -7, 2})), {0.3, -7, 2}, 1e-12);
  // A zero leading pivot needs a row swap; out may be the object itself.
  const double rows[4][4] = {{0, 1, 0, 2}, {1, 0, 0, 3}, {0, 0, 2, 0}, {0, 0, 0, 1}};
  ZvTransfo4 swap = FromRows(rows);
  ASSERT_EQ(swap.Inverse(swap), 1);
  ExpectNear(FromRows(rows).PostMultiply(swap), ZvTransfo4(), 1e-15);
  // A pivot of 1e-15 is singular, ten times that is not.
  ZvTransfo4 out = General();
  EXPECT_EQ(ZvTransfo4().Scale(1, 1, 1e-15).Inverse(out), 0);
  EXPECT_EQ(out.GetMatrixElement(0, 3), 0.0);  // the identity it started from, partly reduced
  EXPECT_EQ(ZvTransfo4().Scale(1, 1, 1e-15).TestInverse(), 0);
  EXPECT_EQ(ZvTransfo4().Scale(1, 1, 1e-14).IsSingular(), 0);
  // The bottom row matters to the inverse although Map ignores it.
  const double persp[16] = {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 0};
  EXPECT_EQ(ZvTransfo4(persp).IsSingular(), 1);
}

TEST(Transfo4Predicates, TolerancesPerElement) {
  EXPECT_EQ(ZvTransfo4().Translate(2e-7, 0, 0).IsIdentity(), 0);
  EXPECT_EQ(ZvTransfo4().Translate(0.5e-7, 0, 0).IsIdentity(), 1);
  EXPECT_EQ(ZvTransfo4().Scale(1 + 2e-10).IsIdentity(), 0);
  EXPECT_EQ(ZvTransfo4().Scale(1 + 0.5e-10).IsIdentity(), 1);
  EXPECT_EQ(ZvTransfo4().Translate(100, -5, 3).IsTranslation(), 1);
  EXPECT_EQ(ZvTransfo4().ShearXY(1e-15, 0).IsTranslation(), 0);  // strict
  EXPECT_EQ(ZvTransfo4().ShearXY(0.9e-15, 0).IsTranslation(), 1);
  EXPECT_EQ(ZvTransfo4().Scale(2).IsTranslation(), 0);
  EXPECT_EQ(ZvTransfo4().Scale(2, -3, 0).Translate(1, 2, 3).IsScalingAndTranslation(), 1);
  EXPECT_EQ(ZvTransfo4().Rotate(1, 0, 0, 1).IsScalingAndTranslation(), 0);
}

TEST(Transfo4Frames, PointFrames) {
  const P3 p[4] = {{1, 2, 3}, {4, 2, 3}, {1, 7, 4}, {0, 0, 9}};
  const P3 unit[4] = {{0, 0, 0}, {1, 0, 0}, {0, 1, 0}, {0, 0, 1}};
  ZvTransfo4 t;
  t.SetTo4PointTransform(p[0], p[1], p[2], p[3]);
  for (int i = 0; i < 4; ++i)
    ExpectNear(t.Map(unit[i]), p[i], 0);
  EXPECT_TRUE(t.GetMatrixElement(3, 3) == 1 && t.GetMatrixElement(3, 0) == 0);
  ExpectNear(t.SetTo3PointTransformXY(p[0], p[1], p[2]).Map(unit[3]), {1, 2, 1}, 0);
  // Three plane points onto three others; a flat source fails and changes nothing.
  const P2 from[3] = {{1, 1}, {3, 1}, {1, 4}}, to[3] = {{-2, 5}, {0, 9}, {6, 0}};
  ASSERT_EQ(t.SetTo3PointTransformXY(from, to), 1);
  for (int i = 0; i < 3; ++i)
    ExpectNear(t.Map(P3{from[i].x, from[i].y, 0}), {to[i].x, to[i].y, 0}, 1e-12);
  const P2 flat[3] = {{0, 0}, {1, 1}, {2, 2}};
  const ZvTransfo4 before = t;
  EXPECT_EQ(t.SetTo3PointTransformXY(flat, to), 0);
  ExpectNear(t, before, 0);
}

TEST(Transfo4Parts, DecomposeRecompose) {
  const P2 center{3, -2};
  const double cases[][6] = {
      {2, 3, 0.5, 30, 1, 2}, {0.5, -1.5, -0.2, 250, -4, 0}, {1, 1, 0, 359, 0, 0}};
  double sx, sy, shear, degrees;
  P2 tr;
  for (const double* c : cases) {
    ZvTransfo4 t;
    t.RecomposeXY(center, c[0], c[1], c[2], c[3], P2{c[4], c[5]});
    // Recompose is R H S about the centre, then the translation (H adds shear * y to x).
    ZvTransfo4 edits;
    edits.Translate(P2{c[4], c[5]}).RotateXY(c[3], center);
    edits.ShearXZ(c[2], 0, P3{center.x, center.y, 0}).ScaleXY(c[0], c[1], center);
    ExpectNear(t, edits, 1e-12);
    ASSERT_EQ(t.DecomposeXY(center, sx, sy, shear, degrees, tr), 1);
    ExpectNear(P3{sx, sy, shear}, {c[0], c[1], c[2]}, 1e-12);
    ExpectNear(P3{degrees, tr.x, tr.y}, {c[3], c[4], c[5]}, 1e-10);
  }
  // Quarter turn: the second branch, scaleY = -m[4]. Mirror: the first, signs kept.
  ZvTransfo4()
      .RotateXY(90, P2{0, 0})
      .Scale(2, 5, 1)
      .DecomposeXY(center, sx, sy, shear, degrees, tr);
  EXPECT_TRUE(degrees == 90 && sx == 2 && sy == 5);
  ASSERT_EQ(ZvTransfo4().Scale(-2, 3, 1).DecomposeXY(P2{1, 1}, sx, sy, shear, degrees, tr), 1);
  EXPECT_TRUE(sx == -2 && degrees == 0 && tr.x == -3 && tr.y == 2);
  // Rank one fails with the outputs untouched.
  sx = degrees = 42;
  const ZvTransfo4 flat = ZvTransfo4().RotateXY(30, center).Scale(1, 0, 1);
  EXPECT_EQ(flat.DecomposeXY(center, sx, sy, shear, degrees, tr), 0);
  EXPECT_TRUE(sx == 42 && degrees == 42);
}

TEST(Transfo4Extraction, NearestEulerTriple) {
  const P3 truth{0.4, -0.7, 2.5};
  const ZvTransfo4 r = ZvTransfo4().RotateXYZ(truth * (180 / kPi));
  P3 a{0.3, -0.6, 2.4};
  r.ExtractXYZRotationAngles(a);
  ExpectNear(a, truth, 1e-12);
  // The other triple (x + pi, pi - y, z + pi) makes the same matrix; a seed near it wins.
  const P3 other{truth.x - kPi, kPi - truth.y, truth.z - kPi};
  ExpectNear(ZvTransfo4().RotateXYZ(other * (180 / kPi)), r, 1e-12);
  a = other + P3{0.1, 0.1, -0.1};
  r.ExtractXYZRotationAngles(a);
  ExpectNear(a, other, 1e-12);
  // Results stay within pi of seeds that are whole turns away.
  P3 turned{2 * kPi, 0, 0};
  ZvTransfo4().ExtractXYZRotationAngles(turned);
  EXPECT_TRUE(turned.x == 2 * kPi && turned.y == 0);
  turned = {0.4 + 4 * kPi, -0.7 - 2 * kPi, 2.5};
  r.ExtractXYZRotationAngles(turned);
  ExpectNear(turned, {0.4 + 4 * kPi, -0.7 - 2 * kPi, 2.5}, 1e-11);
  // Gimbal lock: only x - z (y up) or x + z (y down) is known; the seeds' split is kept and
  // the correction shared evenly.
  for (double y : {90.0, -90.0}) {
    const ZvTransfo4 locked = ZvTransfo4().RotateXYZ(P3{30, y, 10});
    P3 g{0.4, 1.5, 0.1};
    locked.ExtractXYZRotationAngles(g);
    ExpectNear(ZvTransfo4().RotateXYZ(g * (180 / kPi)), locked, 1e-12);
    EXPECT_NEAR(g.y, y * kPi / 180, 1e-12);
    EXPECT_NEAR(g.x - 0.4, y > 0 ? 0.1 - g.z : g.z - 0.1, 1e-12);
  }
}

TEST(Transfo4Extraction, ExtractTransforms) {
  const ZvTransfo4 t = ZvTransfo4().Translate(1, 2, 3).RotateXYZ(P3{20, -35, 120}).Scale(2, 0.5, 3);
  P3 scale, degrees{0, 0, 0}, translation;
  t.ExtractTransforms(scale, degrees, translation);
  ExpectNear(scale, {2, 0.5, 3}, 1e-12);
  ExpectNear(degrees, {20, -35, 120}, 1e-10);
  ExpectNear(translation, {1, 2, 3}, 0);
  // The seed is read as radians: a seed of 2 pi keeps x near 2 pi radians, i.e. 380 degrees.
  degrees = {2 * kPi, 0, 2 * kPi};
  t.ExtractTransforms(scale, degrees, translation);
  ExpectNear(degrees, {380, -35, 480}, 1e-10);
}

TEST(Transfo4Text, MeasuresAndDump) {
  EXPECT_DOUBLE_EQ(General().GetXYUnitVectorSquaredLength(), 1.25 * 1.25 + 2.75 * 2.75);
  EXPECT_DOUBLE_EQ(General().GetXYZUnitVectorSquaredLength(), 1.75 * 1.75 + 2.25 * 2.25);
  std::ostringstream os;
  os << ZvTransfo4().Translate(5, 6.5, -7).Scale(2, 1, 1);
  EXPECT_EQ(os.str(), "{2 0 0 5}\n{0 1 0 6.5}\n{0 0 1 -7}\n{0 0 0 1}\n");
}
