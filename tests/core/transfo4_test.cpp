#include <zv/transfo4.h>

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <sstream>

namespace {

const double kPi = 3.14159265358979323846;

ZvTransfo4 FromRows(const double rows[4][4]) {
  double m[16];
  for (int r = 0; r < 4; ++r) {
    for (int c = 0; c < 4; ++c)
      m[r + 4 * c] = rows[r][c];
  }
  return ZvTransfo4(m);
}

void ExpectNear(const ZvTransfo4& a, const ZvTransfo4& b, double tol) {
  for (int i = 0; i < 16; ++i) {
    EXPECT_NEAR(a.GetMatrixPtr()[i], b.GetMatrixPtr()[i], tol) << "element " << i;
  }
}

void ExpectNear(const ZvPoint3<double>& a, const ZvPoint3<double>& b, double tol) {
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

TEST(Transfo4Composition, EditsActInTheLocalFrame) {
  ZvTransfo4 t;
  t.Scale(2).Translate(1, 2, 3);
  const ZvPoint3<double> p = t.Map(ZvPoint3<double>{0, 0, 0});
  ExpectNear(p, {2, 4, 6}, 0);
  // The edit equals post-multiplication by its local matrix.
  ZvTransfo4 expected;
  expected.Scale(2).PostMultiply(ZvTransfo4().Translate(1, 2, 3));
  ExpectNear(t, expected, 0);
}

TEST(Transfo4Composition, PostAndPreMultiplyOrder) {
  ZvTransfo4 a, b;
  a.Translate(5, 0, 0);
  b.Scale(3);
  const ZvPoint3<double> p{1, 1, 1};
  // Mapped by a then by b is the product b a.
  ZvTransfo4 ba(b);
  ba.PostMultiply(a);
  ExpectNear(ba.Map(p), b.Map(a.Map(p)), 1e-12);
  ZvTransfo4 pre(a);
  pre.PreMultiply(b);
  ExpectNear(pre, ba, 0);
  ExpectNear(ba.Map(p), {18, 3, 3}, 0);
}

TEST(Transfo4Composition, EditsMatchTheirLocalMatrices) {
  const ZvTransfo4 g = General();
  struct Case {
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
  for (const Case& c : cases)
    ExpectNear(c.edited, ZvTransfo4(g).PostMultiply(FromRows(c.local)), 1e-12);
}

TEST(Transfo4Composition, CentredFormsKeepTheirCentre) {
  const ZvPoint3<double> c{2, -1, 3};
  ZvTransfo4 edits[] = {ZvTransfo4().Scale(2, 3, 4, c), ZvTransfo4().ShearXY(0.5, 2, c),
                        ZvTransfo4().ShearXZ(0.5, 2, c), ZvTransfo4().ShearYZ(0.5, 2, c),
                        ZvTransfo4().Rotate(37, c, c + ZvPoint3<double>{1, 2, 2})};
  for (const ZvTransfo4& t : edits)
    ExpectNear(t.Map(c), c, 1e-12);
  // ScaleXY about a plane point scales offsets from it.
  const ZvPoint2<double> q =
      ZvTransfo4().ScaleXY(2, 3, ZvPoint2<double>{1, 1}).Map(ZvPoint2<double>{2, 2});
  EXPECT_DOUBLE_EQ(q.x, 3);
  EXPECT_DOUBLE_EQ(q.y, 4);
  // The float centre and the 2-D translations agree with their double forms.
  ExpectNear(ZvTransfo4().Scale(2, 3, 4, ZvPoint3<float>{2, -1, 3}), edits[0], 0);
  ExpectNear(ZvTransfo4().Translate(ZvPoint2<float>{1, 2}, 3.0f),
             ZvTransfo4().Translate(ZvPoint3<double>{1, 2, 3}), 0);
  ExpectNear(ZvTransfo4().Translate(ZvPoint2<double>{1, 2}),
             ZvTransfo4().Translate(ZvPoint3<float>{1, 2, 0}), 0);
}

TEST(Transfo4Rotation, QuarterTurnsAreExact) {
  ZvTransfo4 t;
  t.Rotate(90, 0, 0, 1);
  const double* m = t.GetMatrixPtr();
  EXPECT_EQ(m[0], 0.0);
  EXPECT_EQ(m[1], 1.0);
  EXPECT_EQ(m[4], -1.0);
  EXPECT_EQ(m[5], 0.0);
  // Half turns and Euler quarter turns give matrices of exact zeros and ones.
  ZvTransfo4 half;
  half.Rotate(180, 1, 0, 0);
  const double flip[4][4] = {{1, 0, 0, 0}, {0, -1, 0, 0}, {0, 0, -1, 0}, {0, 0, 0, 1}};
  ExpectNear(half, FromRows(flip), 0);
  ZvTransfo4 xyz;
  xyz.RotateXYZ(ZvPoint3<double>{90, -90, 180});
  for (int i = 0; i < 16; ++i) {
    const double v = xyz.GetMatrixPtr()[i];
    EXPECT_TRUE(v == 0 || v == 1 || v == -1) << i << ": " << v;
  }
}

TEST(Transfo4Rotation, AxisAngleAndEulerOrder) {
  // A general angle about a non-unit axis: the axis is fixed, angles add up.
  ZvTransfo4 r;
  r.Rotate(25, 1, 2, 2);
  ExpectNear(r.Map(ZvPoint3<double>{1, 2, 2}), {1, 2, 2}, 1e-12);
  ExpectNear(ZvTransfo4(r).Rotate(35, 2, 4, 4), ZvTransfo4().Rotate(60, 1, 2, 2), 1e-12);
  // About z by 30 degrees.
  const ZvPoint2<double> p = ZvTransfo4().Rotate(30, 0, 0, 5).Map(ZvPoint2<double>{1, 0});
  EXPECT_NEAR(p.x, std::sqrt(3.0) / 2, 1e-15);
  EXPECT_NEAR(p.y, 0.5, 1e-15);
  // RotateXYZ is Rz Ry Rx: the x turn acts first.
  ZvTransfo4 composed;
  composed.Rotate(50, 0, 0, 1).Rotate(-20, 0, 1, 0).Rotate(35, 1, 0, 0);
  ExpectNear(ZvTransfo4().RotateXYZ(ZvPoint3<double>{35, -20, 50}), composed, 1e-14);
  // A null axis is not guarded.
  EXPECT_TRUE(std::isnan(ZvTransfo4().Rotate(10, 0, 0, 0).GetMatrixElement(0, 0)));
}

TEST(Transfo4Rotation, PlaneRotations) {
  const ZvPoint2<double> c{3, 4};
  const ZvTransfo4 byAngle = ZvTransfo4().RotateXY(90, c);
  const ZvPoint2<double> q = byAngle.Map(ZvPoint2<double>{4, 4});
  EXPECT_EQ(q.x, 3.0);
  EXPECT_EQ(q.y, 5.0);
  // From the direction of a to that of b about c: 135 degrees here.
  ZvTransfo4 byPoints;
  byPoints.RotateXY(c, ZvPoint2<double>{5, 4}, ZvPoint2<double>{2, 5});
  ExpectNear(byPoints, ZvTransfo4().RotateXY(135, c), 1e-12);
  // A null direction leaves the transform as it was.
  ZvTransfo4 kept = General();
  kept.RotateXY(c, c, ZvPoint2<double>{0, 0});
  ExpectNear(kept, General(), 0);
  // The float line form is the double one.
  ExpectNear(ZvTransfo4().Rotate(33, ZvPoint3<float>{1, 2, 3}, ZvPoint3<float>{1, 2, 4}),
             ZvTransfo4().RotateXY(33, ZvPoint2<double>{1, 2}), 1e-12);
}

TEST(Transfo4Map, PointsIgnoreTheBottomRowVectorsUseIt) {
  ZvTransfo4 t = General();
  double m[16];
  t.GetMatrix(m);
  m[3] = 7;
  m[7] = 8;
  m[11] = 9;
  m[15] = 10;
  t.SetMatrix(m);
  const ZvPoint3<double> p = t.Map(ZvPoint3<double>{1, 2, 3});
  ExpectNear(p, {1.5 - 0.5 + 1.5 + 3, 0.75 + 4 - 1.5 - 4, 0.1 + 0.6 + 3.6 + 5}, 1e-12);
  double v[4] = {1, 2, 3, 1};
  t.Map(v, v);  // in place
  EXPECT_NEAR(v[0], p.x, 1e-12);
  EXPECT_NEAR(v[1], p.y, 1e-12);
  EXPECT_NEAR(v[2], p.z, 1e-12);
  EXPECT_EQ(v[3], 7 + 16 + 27 + 10);
  EXPECT_EQ(t.GetMatrixElement(3, 2), 9);
  EXPECT_EQ(t.GetMatrixElement(0, 3), 3);
}

TEST(Transfo4Map, PlanePointsSeeOnlySixElements) {
  const double rows[4][4] = {{2, 3, 99, 5}, {4, 6, 99, 7}, {99, 99, 99, 99}, {99, 99, 99, 99}};
  const ZvTransfo4 t = FromRows(rows);
  const ZvPoint2<double> p = t.Map(ZvPoint2<double>{1, 10});
  EXPECT_EQ(p.x, 2 + 30 + 5);
  EXPECT_EQ(p.y, 4 + 60 + 7);
}

TEST(Transfo4Map, FloatResultsNarrowOnlyAtTheEnd) {
  // 1 + 2^-30 is not a float, but 2^24 * (1 + 2^-30) - 2^24 computed in double is 2^-6.
  ZvTransfo4 t;
  t.Translate(-16777216.0, 0, 0).Scale(16777216.0 * (1 + std::ldexp(1.0, -30)), 1, 1);
  const ZvPoint2<float> p = t.Map(ZvPoint2<float>{1, 0});
  EXPECT_EQ(p.x, static_cast<float>(16777216.0 * (1 + std::ldexp(1.0, -30)) - 16777216.0));
  EXPECT_NE(p.x, 0.0f);
}

TEST(Transfo4Map, AllFormsAgree) {
  const ZvTransfo4 t = General();
  ZvPoint3<float> f3[3] = {{1, 2, 3}, {-4, 5, 0.5f}, {0, 0, 0}};
  ZvPoint3<float> out3[3];
  t.Map(f3, 3, out3);
  ZvPoint2<double> d2[2] = {{1, 2}, {-3, 0.25}};
  ZvPoint2<double> out2[2];
  t.Map(d2, 2, out2);
  for (int i = 0; i < 3; ++i) {
    const ZvPoint3<float> one = t.Map(f3[i]);
    ZvPoint3<float> into;
    t.Map(f3[i], into);
    EXPECT_EQ(one.x, out3[i].x);
    EXPECT_EQ(one.y, out3[i].y);
    EXPECT_EQ(one.z, out3[i].z);
    EXPECT_EQ(into.z, out3[i].z);
  }
  t.MapInPlace(f3, 3);
  t.MapInPlace(d2, 2);
  for (int i = 0; i < 3; ++i)
    EXPECT_EQ(f3[i].y, out3[i].y);
  for (int i = 0; i < 2; ++i) {
    EXPECT_EQ(d2[i].x, out2[i].x);
    EXPECT_EQ(d2[i].y, out2[i].y);
  }
  ZvPoint3<double> single{1, 1, 1};
  t.MapInPlace(single);
  ExpectNear(single, t.Map(ZvPoint3<double>{1, 1, 1}), 0);
}

TEST(Transfo4Map, Extents) {
  ZvTransfo4 rot;
  rot.Rotate(45, 0, 0, 1);
  // A rotated square gives its axis-aligned hull.
  const ZvExtent2<double> e = rot.Map(ZvExtent2<double>(-1, -1, 1, 1));
  EXPECT_EQ(e.kind, ZvExtent2<double>::Regular);
  EXPECT_NEAR(e.xmin, -std::sqrt(2.0), 1e-15);
  EXPECT_NEAR(e.ymax, std::sqrt(2.0), 1e-15);
  // A mirror swaps min and max.
  ZvExtent2<float> f(1, 2, 3, 5);
  ZvTransfo4().Scale(-1, 2, 1).MapInPlace(f);
  EXPECT_EQ(f.xmin, -3);
  EXPECT_EQ(f.xmax, -1);
  EXPECT_EQ(f.ymin, 4);
  EXPECT_EQ(f.ymax, 10);
  // Empty and Infinite pass unchanged, coordinates included.
  ZvExtent2<double> inf(7, 8, 9, 10, ZvExtent2<double>::Infinite), out;
  ZvTransfo4().Translate(1, 1, 0).Map(inf, out);
  EXPECT_EQ(out.kind, ZvExtent2<double>::Infinite);
  EXPECT_EQ(out.xmin, 7);
  ZvExtent2<float> several[2] = {ZvExtent2<float>(), ZvExtent2<float>(0, 0, 1, 1)};
  ZvTransfo4().Translate(1, 1, 0).MapInPlace(several, 2);
  EXPECT_EQ(several[0].kind, ZvExtent2<float>::Empty);
  EXPECT_EQ(several[1].xmin, 1);
}

TEST(Transfo4Inverse, RoundTrips) {
  ZvTransfo4 t = General();
  t.RotateXYZ(ZvPoint3<double>{10, 20, 30}).ShearXY(0.2, 0.1);
  ZvTransfo4 inv;
  ASSERT_EQ(t.Inverse(inv), 1);
  EXPECT_EQ(t.TestInverse(), 1);
  EXPECT_EQ(t.IsSingular(), 0);
  const ZvPoint3<double> p{0.3, -7, 2};
  ExpectNear(inv.Map(t.Map(p)), p, 1e-12);
  // A matrix needing row swaps (zero leading pivot) inverts too; out may be the object itself.
  const double rows[4][4] = {{0, 1, 0, 2}, {1, 0, 0, 3}, {0, 0, 2, 0}, {0, 0, 0, 1}};
  ZvTransfo4 swap = FromRows(rows), copy = FromRows(rows);
  ASSERT_EQ(swap.Inverse(swap), 1);
  ExpectNear(copy.PostMultiply(swap), ZvTransfo4(), 1e-15);
}

TEST(Transfo4Inverse, SingularThreshold) {
  ZvTransfo4 t;
  t.Scale(1, 1, 1e-15);
  EXPECT_EQ(t.IsSingular(), 1);
  EXPECT_EQ(t.TestInverse(), 0);
  ZvTransfo4 out = General();
  EXPECT_EQ(t.Inverse(out), 0);
  // The partial result: the first two pivots were 1 and left the identity there.
  EXPECT_EQ(out.GetMatrixElement(0, 0), 1.0);
  EXPECT_EQ(out.GetMatrixElement(0, 3), 0.0);
  ZvTransfo4 fine;
  fine.Scale(1, 1, 1e-14);
  EXPECT_EQ(fine.IsSingular(), 0);
  ASSERT_EQ(fine.Inverse(out), 1);
  EXPECT_NEAR(out.GetMatrixElement(2, 2), 1e14, 1);
  // A perspective row matters for the inverse although Map ignores it.
  double m[16] = {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 0};
  EXPECT_EQ(ZvTransfo4(m).IsSingular(), 1);
}

TEST(Transfo4Predicates, TolerancesPerElement) {
  EXPECT_EQ(ZvTransfo4().IsIdentity(), 1);
  EXPECT_EQ(ZvTransfo4().Translate(2e-7, 0, 0).IsIdentity(), 0);
  EXPECT_EQ(ZvTransfo4().Translate(0.5e-7, 0, 0).IsIdentity(), 1);
  EXPECT_EQ(ZvTransfo4().Scale(1 + 2e-10).IsIdentity(), 0);
  EXPECT_EQ(ZvTransfo4().Scale(1 + 0.5e-10).IsIdentity(), 1);
  // Translation: diagonal near 1, linear off-diagonal within 1e-15 strictly.
  EXPECT_EQ(ZvTransfo4().Translate(100, -5, 3).IsTranslation(), 1);
  EXPECT_EQ(ZvTransfo4().ShearXY(1e-15, 0).IsTranslation(), 0);
  EXPECT_EQ(ZvTransfo4().ShearXY(0.9e-15, 0).IsTranslation(), 1);
  EXPECT_EQ(ZvTransfo4().Scale(2).IsTranslation(), 0);
  // Scaling and translation: only m[15] is tied to 1.
  EXPECT_EQ(ZvTransfo4().Scale(2).IsScalingAndTranslation(), 1);
  EXPECT_EQ(ZvTransfo4().Scale(2, -3, 0).Translate(1, 2, 3).IsScalingAndTranslation(), 1);
  EXPECT_EQ(ZvTransfo4().Rotate(1, 0, 0, 1).IsScalingAndTranslation(), 0);
  double m[16] = {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 1e-15, 0, 0, 0, 1};
  EXPECT_EQ(ZvTransfo4(m).IsScalingAndTranslation(), 0);
}

TEST(Transfo4Frames, PointFrames) {
  const ZvPoint3<double> p[4] = {{1, 2, 3}, {4, 2, 3}, {1, 7, 4}, {0, 0, 9}};
  ZvTransfo4 t;
  t.SetTo4PointTransform(p[0], p[1], p[2], p[3]);
  const ZvPoint3<double> unit[4] = {{0, 0, 0}, {1, 0, 0}, {0, 1, 0}, {0, 0, 1}};
  for (int i = 0; i < 4; ++i)
    ExpectNear(t.Map(unit[i]), p[i], 0);
  EXPECT_EQ(t.GetMatrixElement(3, 3), 1);
  EXPECT_EQ(t.GetMatrixElement(3, 0), 0);
  t.SetTo3PointTransformXY(p[0], p[1], p[2]);
  ExpectNear(t.Map(unit[3]), {1, 2, 1}, 0);

  const ZvPoint2<double> from[3] = {{1, 1}, {3, 1}, {1, 4}};
  const ZvPoint2<double> to[3] = {{-2, 5}, {0, 9}, {6, 0}};
  ASSERT_EQ(t.SetTo3PointTransformXY(from, to), 1);
  for (int i = 0; i < 3; ++i) {
    const ZvPoint2<double> q = t.Map(from[i]);
    EXPECT_NEAR(q.x, to[i].x, 1e-12);
    EXPECT_NEAR(q.y, to[i].y, 1e-12);
  }
  EXPECT_EQ(t.GetMatrixElement(2, 2), 1);  // reset to the identity first
  // A flat source triangle fails and leaves the matrix alone.
  const ZvPoint2<double> flat[3] = {{0, 0}, {1, 1}, {2, 2}};
  const ZvTransfo4 before = t;
  EXPECT_EQ(t.SetTo3PointTransformXY(flat, to), 0);
  ExpectNear(t, before, 0);
}

TEST(Transfo4Parts, DecomposeRecomposeRoundTrip) {
  const ZvPoint2<double> center{3, -2};
  const struct {
    double sx, sy, shear, degrees, tx, ty;
  } cases[] = {{2, 3, 0.5, 30, 1, 2}, {0.5, -1.5, -0.2, 250, -4, 0}, {1, 1, 0, 359, 0, 0}};
  for (const auto& c : cases) {
    ZvTransfo4 t;
    t.RecomposeXY(center, c.sx, c.sy, c.shear, c.degrees, ZvPoint2<double>{c.tx, c.ty});
    double sx, sy, shear, degrees;
    ZvPoint2<double> tr;
    ASSERT_EQ(t.DecomposeXY(center, sx, sy, shear, degrees, tr), 1);
    EXPECT_NEAR(sx, c.sx, 1e-12);
    EXPECT_NEAR(sy, c.sy, 1e-12);
    EXPECT_NEAR(shear, c.shear, 1e-12);
    EXPECT_NEAR(degrees, c.degrees, 1e-10);
    EXPECT_NEAR(tr.x, c.tx, 1e-12);
    EXPECT_NEAR(tr.y, c.ty, 1e-12);
    // Recompose equals the edits R H S about the centre, then the translation: the shear acts
    // after the scale, adding shear * y to x.
    ZvTransfo4 edits;
    edits.Translate(ZvPoint2<double>{c.tx, c.ty})
        .RotateXY(c.degrees, center)
        .ShearXZ(c.shear, 0, ZvPoint3<double>{center.x, center.y, 0})
        .ScaleXY(c.sx, c.sy, center);
    ExpectNear(t, edits, 1e-12);
  }
}

TEST(Transfo4Parts, DecomposeBranchesAndFailures) {
  double sx, sy, shear, degrees;
  ZvPoint2<double> tr;
  ZvTransfo4 quarter;
  quarter.RotateXY(90, ZvPoint2<double>{0, 0}).Scale(2, 5, 1);
  ASSERT_EQ(quarter.DecomposeXY(ZvPoint2<double>{0, 0}, sx, sy, shear, degrees, tr), 1);
  EXPECT_EQ(degrees, 90);
  EXPECT_EQ(sx, 2);
  EXPECT_EQ(sy, 5);  // -m[4]
  ZvTransfo4 mirror;
  mirror.Scale(-2, 3, 1);
  ASSERT_EQ(mirror.DecomposeXY(ZvPoint2<double>{1, 1}, sx, sy, shear, degrees, tr), 1);
  EXPECT_EQ(sx, -2);
  EXPECT_EQ(degrees, 0);
  EXPECT_EQ(tr.x, -3);
  EXPECT_EQ(tr.y, 2);
  // Rank one: fails, outputs untouched.
  ZvTransfo4 flat;
  flat.RotateXY(30, ZvPoint2<double>{0, 0}).Scale(1, 0, 1);
  sx = sy = shear = degrees = 42;
  EXPECT_EQ(flat.DecomposeXY(ZvPoint2<double>{0, 0}, sx, sy, shear, degrees, tr), 0);
  EXPECT_EQ(sx, 42);
  EXPECT_EQ(degrees, 42);
}

TEST(Transfo4Extraction, NearestEulerTriple) {
  const ZvPoint3<double> truth{0.4, -0.7, 2.5};
  ZvTransfo4 r;
  r.RotateXYZ(truth * (180 / kPi));
  ZvPoint3<double> a{0.3, -0.6, 2.4};
  r.ExtractXYZRotationAngles(a);
  ExpectNear(a, truth, 1e-12);
  // The other triple (x + pi, pi - y, z + pi) describes the same matrix; a seed near it wins.
  const ZvPoint3<double> other{truth.x - kPi, kPi - truth.y, truth.z - kPi};
  ExpectNear(ZvTransfo4().RotateXYZ(other * (180 / kPi)), r, 1e-12);
  a = other + ZvPoint3<double>{0.1, 0.1, -0.1};
  r.ExtractXYZRotationAngles(a);
  ExpectNear(a, other, 1e-12);
  // Results stay within pi of unwrapped seeds.
  ZvPoint3<double> turned{2 * kPi, 0, 0};
  ZvTransfo4().ExtractXYZRotationAngles(turned);
  EXPECT_EQ(turned.x, 2 * kPi);
  EXPECT_EQ(turned.y, 0);
  turned = {0.4 + 4 * kPi, -0.7 - 2 * kPi, 2.5};
  r.ExtractXYZRotationAngles(turned);
  ExpectNear(turned, {0.4 + 4 * kPi, -0.7 - 2 * kPi, 2.5}, 1e-11);
}

TEST(Transfo4Extraction, GimbalLockKeepsTheSeedsSplit) {
  for (double y : {90.0, -90.0}) {
    ZvTransfo4 r;
    r.RotateXYZ(ZvPoint3<double>{30, y, 10});
    ZvPoint3<double> a{0.4, 1.5, 0.1};
    r.ExtractXYZRotationAngles(a);
    ExpectNear(ZvTransfo4().RotateXYZ(a * (180 / kPi)), r, 1e-12);
    EXPECT_NEAR(a.y, y * kPi / 180, 1e-12);
    // Only x - z (or x + z) is known; the correction is shared evenly from the seeds.
    if (y > 0) {
      EXPECT_NEAR(a.x - 0.4, -(a.z - 0.1), 1e-12);
    } else {
      EXPECT_NEAR(a.x - 0.4, a.z - 0.1, 1e-12);
    }
  }
}

TEST(Transfo4Extraction, ExtractTransforms) {
  ZvTransfo4 t;
  t.Translate(1, 2, 3).RotateXYZ(ZvPoint3<double>{20, -35, 120}).Scale(2, 0.5, 3);
  ZvPoint3<double> scale, degrees{0, 0, 0}, translation;
  t.ExtractTransforms(scale, degrees, translation);
  ExpectNear(scale, {2, 0.5, 3}, 1e-12);
  ExpectNear(degrees, {20, -35, 120}, 1e-10);
  ExpectNear(translation, {1, 2, 3}, 0);
  // The seed is read as radians: 2 pi "degrees" keeps x near 2 pi radians, i.e. 380 degrees.
  degrees = {2 * kPi, 0, 2 * kPi};
  t.ExtractTransforms(scale, degrees, translation);
  ExpectNear(degrees, {380, -35, 120 + 360}, 1e-10);
}

TEST(Transfo4Measures, XYOnly) {
  const ZvTransfo4 g = General();
  EXPECT_DOUBLE_EQ(g.GetXYUnitVectorSquaredLength(), 1.25 * 1.25 + 2.75 * 2.75);
  EXPECT_DOUBLE_EQ(g.GetXYZUnitVectorSquaredLength(), 1.75 * 1.75 + 2.25 * 2.25);
  EXPECT_DOUBLE_EQ(ZvTransfo4().Scale(3).GetXYUnitVectorSquaredLength(), 18);
}

TEST(Transfo4Print, RowsInBraces) {
  ZvTransfo4 t;
  t.Translate(5, 6.5, -7).Scale(2, 1, 1);
  std::ostringstream os;
  os << t;
  EXPECT_EQ(os.str(), "{2 0 0 5}\n{0 1 0 6.5}\n{0 0 1 -7}\n{0 0 0 1}\n");
}
