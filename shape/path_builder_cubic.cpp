// ZvCubicPathBuilder: one cubic per input edge, its handles along tangents estimated from the
// neighbouring points. The tangent at a point needs the point after it, so the last edge is
// only drawn once that point is known, or at the end of the subpath.
#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/path_builder.h>

#include "core/vec.h"
#include "shape/path_builder_steps.h"

namespace {
// Hermite-like cubic from a to b with handles 0.4 of the chord along the unit tangents.
void DrawEdge(ZvPath2f* path, const ZvPoint2<float>& a, const ZvPoint2<float>& b,
              const ZvPoint2<float>& ta, const ZvPoint2<float>& tb) {
  const float chord = static_cast<float>(zvGuardedLength2(double(b.x) - a.x, double(b.y) - a.y));
  const float h = 0.4f * chord;
  path->Curveto(a + ta * h, b - tb * h, b);
}
}  // namespace

ZvCubicPathBuilder::ZvCubicPathBuilder(const ZvGC& gc, ZvPath2f* path)
    : ZvBasePathBuilder(gc, path) {}

void ZvCubicPathBuilder::AddInputPoint(const ZvPoint2<float>& input, int force) {
  const ZvPoint2<float> p = MapInput(input);
  if (force != 1 && inputPoints.size && zvBuilderNear(gc, p, inputPoints[inputPoints.size - 1]))
    return;
  inputPoints.Add(p);
}

void ZvCubicPathBuilder::AddTrailingInputPoints(int close, int final) {
  zvMovetoOnce(path, inputPoints, firstPointPending, firstPathIndex);
  if (inputPoints.size < 2) return;
  if (close && final && !zvBuilderCoincide(inputPoints[inputPoints.size - 1], inputPoints[0]))
    inputPoints.Add(inputPoints[0]);
  const ZvPoint2fArray& p = inputPoints;
  const unsigned int n = p.size, i = lastProcessedIndex;
  ZvPoint2<float> kept;  // the tangent at the end of the last edge drawn
  if (n - i >= 2) {
    if (i != 0) {
      kept = EstimateTangentDirection(p, i, 0, 0, 0);
      DrawEdge(path, p[i - 1], p[i], EstimateTangentDirection(p, i - 1, i == 1, 0, 0), kept);
    } else {
      kept = EstimateTangentDirection(p, 0, 1, 0, 0);
    }
    for (unsigned int j = i + 1; j < n - 1; ++j) {
      const ZvPoint2<float> t = EstimateTangentDirection(p, j, 0, 0, 0);
      DrawEdge(path, p[j - 1], p[j], kept, t);
      kept = t;
    }
  } else if (final || close) {
    kept = EstimateTangentDirection(p, n - 2, n == 2, 0, 0);
  } else {
    return;
  }
  if (!final) return;
  // Whatever was drawn, the edge into the last point is still missing.
  const unsigned int k = n - 1;
  if (close) {
    DrawEdge(path, p[k - 1], p[0], kept, EstimateTangentDirection(p, 0, 1, 0, 0));
    path->Closeto();
  } else {
    DrawEdge(path, p[k - 1], p[k], kept, EstimateTangentDirection(p, k, 0, 1, 0));
  }
}

const ZvPoint2fArray& ZvCubicPathBuilder::Commit(int close, int final) {
  const unsigned int firstNew = path->NumPoints();
  if (inputPoints.size)
    SmoothTrailingInputPoints(gc, lastProcessedIndex, inputPoints.size - 1, inputPoints);
  AddTrailingInputPoints(close, final);
  ZvPoint2fArray work(32);
  ZvBezierTool tool;
  ComputeTrailingSamplePoints(firstNew, final, tool, work);
  return samples;
}

const ZvPoint2fArray& ZvCubicPathBuilder::GetTrailingSamples() {
  return Commit(0, 0);
}

const ZvPoint2fArray& ZvCubicPathBuilder::EndSubpath(const ZvPoint2<float>& p, int close) {
  AddEndPoint(p);
  return Commit(close, 1);
}
