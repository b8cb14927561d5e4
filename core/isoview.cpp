// ZvIsoView: a 2-D view held as two mutually inverse transforms.
#include <zv/gc.h>

#include "core/vec.h"

ZvIsoView::ZvIsoView(double width, double scaleX, double height, double scaleY, double scaleZ)
    : viewWidth(width), viewHeight(height) {
  // The view's centre sits on the world origin.
  const double ox = width * scaleX * -0.5, oy = height * scaleY * -0.5;
  viewToWorld.SetTo4PointTransform(
      ZvPoint3<double>{ox, oy, 0.0}, ZvPoint3<double>{ox + scaleX, oy, 0.0},
      ZvPoint3<double>{ox, oy + scaleY, 0.0}, ZvPoint3<double>{ox, oy, scaleZ});
  viewToWorld.Inverse(worldToView);
}

int ZvIsoView::IsValid() const {
  return viewWidth >= 0.0 && viewHeight >= 0.0 && !viewToWorld.IsSingular() &&
         !worldToView.IsSingular();
}

void ZvIsoView::InvertOrRestore(const ZvIsoView& saved) {
  if (!viewToWorld.Inverse(worldToView)) *this = saved;
}

void ZvIsoView::Pan(const ZvPoint2<double>& delta) {
  const ZvIsoView saved(*this);
  // Post-multiplied: the move is in view coordinates.
  viewToWorld.Translate(delta, 0.0);
  InvertOrRestore(saved);
}

void ZvIsoView::Zoom(double sx, double sy, double sz, const ZvPoint2<double>& center) {
  const ZvIsoView saved(*this);
  viewToWorld.Scale(sx, sy, sz, ZvPoint3<double>{center.x, center.y, 0.0});
  InvertOrRestore(saved);
}

void ZvIsoView::SetFromExtent(const ZvExtent2<double>& extent) {
  if (viewWidth >= -1e-9 && viewWidth <= 1e-9) return;
  if (viewHeight >= -1e-9 && viewHeight <= 1e-9) return;
  const ZvIsoView saved(*this);
  const double ew = extent.xmax - extent.xmin, eh = extent.ymax - extent.ymin;
  const double fx = viewWidth / ew, fy = viewHeight / eh;
  viewToWorld.Translate(ZvPoint2<double>{extent.xmin, extent.ymin}, 0.0);
  viewToWorld.Scale(1.0 / (fx < fy ? fx : fy));
  InvertOrRestore(saved);
}

void ZvIsoView::GetViewExtentInViewCS(ZvExtent2<double>& extent) const {
  const double w = viewWidth, h = viewHeight;
  extent =
      ZvExtent2<double>(w < 0.0 ? w : 0.0, h < 0.0 ? h : 0.0, w < 0.0 ? 0.0 : w, h < 0.0 ? 0.0 : h);
}

void ZvIsoView::GetViewExtentInWorldCS(ZvExtent2<double>& extent) const {
  GetViewExtentInViewCS(extent);
  viewToWorld.MapInPlace(extent);
}

namespace {
double UnitDiagonalLength(const ZvTransfo4& t) {
  const ZvPoint2<double> a = t.Map(ZvPoint2<double>{1.0, 1.0});
  const ZvPoint2<double> b = t.Map(ZvPoint2<double>{0.0, 0.0});
  return zvGuardedLength(a - b);
}
}  // namespace

double ZvIsoView::GetViewUnitVectorLengthInWorld() const {
  return UnitDiagonalLength(viewToWorld);
}

double ZvIsoView::GetWorldUnitVectorLengthInView() const {
  return UnitDiagonalLength(worldToView);
}
