// ZvGC defaults and its owned feather profile; ZvIsoView edits and their undoing.
#include <zv/gc.h>

#include <gtest/gtest.h>

#include <cmath>

TEST(GC, DefaultsInOrder) {
  const ZvGC gc;
  EXPECT_EQ(gc.flattenTolerance, 1.0);
  EXPECT_EQ(gc.sampleSpacing, 1.0);
  EXPECT_EQ(gc.propertyTolerance, 0.1);
  EXPECT_EQ(gc.defaultProperty, 1.0);
  EXPECT_EQ(gc.pointMergeDistance, 0.5);
  EXPECT_EQ(gc.fitTolerance, 0.82139380484);
  EXPECT_EQ(gc.miterLimit, 1.0);
  EXPECT_EQ(gc.lineWidth, 1.0);
  EXPECT_EQ(gc.featherInner, 0.0);
  EXPECT_EQ(gc.featherOuter, 0.0);
  EXPECT_EQ(gc.featherRadius, 0);
  EXPECT_EQ(gc.samplingRate, 4);
  EXPECT_EQ(gc.opacity, 1.0);
  EXPECT_EQ(gc.fillRule, 1);
  EXPECT_EQ(gc.capStyle, 2);
  EXPECT_EQ(gc.joinStyle, 1);
  EXPECT_EQ(gc.taper, 0);
  EXPECT_EQ(gc.clipToShape, 1);
  EXPECT_EQ(gc.transform.IsIdentity(), 1);
  // The profile falls from 1 at the centre to 0 at the edge.
  EXPECT_DOUBLE_EQ(gc.featherProfile.Eval(0.0, 0), 1.0);
  EXPECT_DOUBLE_EQ(gc.featherProfile.Eval(1.0, 0), 0.0);
  EXPECT_NEAR(gc.featherProfile.Eval(0.25, 0), 0.75, 1e-9);
}

TEST(GC, CopiesOwnTheirProfile) {
  ZvGC source;
  source.lineWidth = 3.0;
  source.transform.Translate(1.0, 2.0, 0.0);
  ZvGC copy(source);
  EXPECT_EQ(copy.lineWidth, 3.0);
  EXPECT_EQ(copy.transform.GetMatrixElement(0, 3), 1.0);
  for (double t = -0.5; t <= 1.5; t += 0.125)
    EXPECT_EQ(copy.featherProfile.Eval(t, 0), source.featherProfile.Eval(t, 0)) << t;
  copy.featherProfile.CreateKey(0.5, 7.0);
  EXPECT_NEAR(source.featherProfile.Eval(0.5, 0), 0.5, 1e-9);
  ZvGC assigned;
  assigned = copy;
  copy.featherProfile.CreateKey(0.5, -1.0);
  EXPECT_NEAR(assigned.featherProfile.Eval(0.5, 0), 7.0, 1e-9);
}

namespace {
ZvPoint2<double> Map(const ZvTransfo4& t, double x, double y) {
  return t.Map(ZvPoint2<double>{x, y});
}
void ExpectSameMatrix(const ZvTransfo4& a, const ZvTransfo4& b) {
  for (int i = 0; i < 16; ++i)
    EXPECT_EQ(a.GetMatrixPtr()[i], b.GetMatrixPtr()[i]) << i;
}
}  // namespace

TEST(IsoView, CentredOnTheWorldOrigin) {
  const ZvIsoView view(100, 2, 50, 2, 1);
  EXPECT_EQ(view.IsValid(), 1);
  EXPECT_TRUE(Map(view.viewToWorld, 0, 0).x == -100.0 && Map(view.viewToWorld, 0, 0).y == -50.0);
  EXPECT_EQ(Map(view.viewToWorld, 50, 25).x, 0.0);
  EXPECT_DOUBLE_EQ(Map(view.worldToView, 0, 0).y, 25.0);
  EXPECT_DOUBLE_EQ(view.GetViewUnitVectorLengthInWorld(), std::sqrt(8.0));
  EXPECT_DOUBLE_EQ(view.GetWorldUnitVectorLengthInView(), std::sqrt(0.5));
  ZvExtent2<double> world;
  view.GetViewExtentInWorldCS(world);
  EXPECT_TRUE(world.kind == ZvExtent2<double>::Regular && world.xmin == -100 && world.ymax == 50);
}

TEST(IsoView, PanAndZoomWorkInViewCoordinates) {
  ZvIsoView view(100, 2, 50, 2, 1);
  view.Pan(ZvPoint2<double>{10, 0});
  EXPECT_DOUBLE_EQ(Map(view.viewToWorld, 0, 0).x, -80.0);
  EXPECT_NEAR(Map(view.worldToView, -80, -50).x, 0.0, 1e-12);
  view.Zoom(2, 2, 1, ZvPoint2<double>{50, 25});
  EXPECT_DOUBLE_EQ(Map(view.viewToWorld, 50, 25).x, 20.0);  // the centre stays
  EXPECT_DOUBLE_EQ(Map(view.viewToWorld, 51, 25).x, 24.0);
  EXPECT_EQ(view.IsValid(), 1);

  // A zoom by 0 has no inverse: both transforms stay as they were.
  const ZvIsoView before(view);
  view.Zoom(0, 1, 1, ZvPoint2<double>{3, 4});
  ExpectSameMatrix(view.viewToWorld, before.viewToWorld);
  ExpectSameMatrix(view.worldToView, before.worldToView);
}

TEST(IsoView, SetFromExtent) {
  ZvIsoView view(100, 1, 50, 1, 1);
  // The uniform factor is the smaller of 100 / 10 and 50 / 10.
  view.SetFromExtent(ZvExtent2<double>(10, 20, 20, 30));
  EXPECT_DOUBLE_EQ(Map(view.viewToWorld, 50, 25).x, -30.0);
  EXPECT_DOUBLE_EQ(Map(view.viewToWorld, 50, 25).y, 0.0);
  EXPECT_NEAR(Map(view.worldToView, -30, 0).x, 50.0, 1e-12);

  const ZvIsoView before(view);
  view.SetViewWidth(0);
  view.SetFromExtent(ZvExtent2<double>(0, 0, 1, 1));  // no width: ignored
  ExpectSameMatrix(view.viewToWorld, before.viewToWorld);
  view.SetViewWidth(100);
  view.SetFromExtent(ZvExtent2<double>(0, 0, 0, 0));  // a point: scale 0, undone
  ExpectSameMatrix(view.viewToWorld, before.viewToWorld);
  ExpectSameMatrix(view.worldToView, before.worldToView);
}

TEST(IsoView, ViewExtentAndValidity) {
  ZvIsoView view(100, 1, 50, 1, 1);
  view.SetViewWidth(-1);
  EXPECT_EQ(view.IsValid(), 0);
  ZvExtent2<double> e;
  view.GetViewExtentInViewCS(e);
  EXPECT_TRUE(e.kind == ZvExtent2<double>::Regular && e.xmin == -1 && e.xmax == 0 && e.ymax == 50);
  const ZvIsoView flat(100, 1, 50, 1, 0);  // no depth: singular, kept as it comes
  EXPECT_EQ(flat.IsValid(), 0);
}
