// ZvBezierFitPathBuilder: pen input densified, smoothed between corners and fitted by
// least-squares Bezier segments as it is committed.
#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/path_builder.h>
#include <zv/polyline.h>

#include <cmath>

#include "shape/path_builder_fit_steps.h"
#include "shape/path_builder_steps.h"

unsigned int cAddPts = 0;
unsigned int cFitPts = 0;

namespace {
// The turn test takes every turn of more than 90 degrees as a corner: the squared cosine it
// must exceed is 0 whatever the chord lengths.
constexpr double kCornerCos2 = 0.0;

// Is input point i, between two neighbours, a corner?
int IsCorner(const ZvPoint2fArray& p, unsigned int i, double e) {
  const ZvPoint2<float>&q = p[i - 1], &r = p[i], &s = p[i + 1];
  // Edges within the fit tolerance carry no reliable direction.
  if (std::fabs(double(q.x) - r.x) <= e && std::fabs(double(q.y) - r.y) <= e) return 0;
  if (std::fabs(double(s.x) - r.x) <= e && std::fabs(double(s.y) - r.y) <= e) return 0;
  const double ux = double(r.x) - q.x, uy = double(r.y) - q.y;
  const double vx = double(s.x) - r.x, vy = double(s.y) - r.y;
  const double dot = uy * vy + ux * vx;
  if (dot >= 0.0) return 0;
  return dot * dot > (ux * ux + uy * uy) * kCornerCos2 * (vx * vx + vy * vy);
}

// Octagonal length of input edge i.
double EdgeOctagonal(const ZvPoint2fArray& p, unsigned int i) {
  return zvOctagonalDistance(p[i], p[i + 1]);
}
}  // namespace

ZvBezierFitPathBuilder::ZvBezierFitPathBuilder(const ZvGC& gc, ZvPath2f* path,
                                               double longChordDistance, double densifySpacing,
                                               double fitError, unsigned int fitDegree)
    : ZvBasePathBuilder(gc, path),
      longChordDistance(longChordDistance),
      densifySpacing(densifySpacing),
      fitDegree(zvClampFitDegree(fitDegree)),
      fitError(fitError),
      chordLengths(128),
      cornerFlags(128),
      flattenedWork(64) {}

void ZvBezierFitPathBuilder::Reset() {
  ZvBasePathBuilder::Reset();
  chordLengths.Chop(0);
  cornerFlags.Chop(0);
  flattenedWork.Chop(0);
}

void ZvBezierFitPathBuilder::ReserveInput(unsigned int count) {
  ZvBasePathBuilder::ReserveInput(count);
  zvReserve(chordLengths, count);
  zvReserve(cornerFlags, count);
}

void ZvBezierFitPathBuilder::AddInputPoint(const ZvPoint2<float>& input, int force) {
  zvAddDensifiedInputPoint(gc, inputPoints, MapInput(input), force, densifySpacing,
                           longChordDistance, [](unsigned int, double) {});
}

void ZvBezierFitPathBuilder::AddTrailingInputPoints(int close) {
  zvMovetoOnce(path, inputPoints, firstPointPending, firstPathIndex);
  zvFitTrailingInputPoints(gc, longChordDistance, fitError, fitDegree, lastProcessedIndex, close,
                           inputPoints, chordLengths, cornerFlags, bezierTool, path);
}

void zvFitTrailingInputPoints(const ZvGC& gc, double longChordDistance, double fitError,
                              unsigned int fitDegree, unsigned int lastProcessed, int close,
                              ZvPoint2fArray& p, ZvDoubleArray& chordLengths,
                              ZvBoolArray& cornerFlags, ZvBezierTool& tool, ZvPath2f* path) {
  if (p.size < 2) return;
  if (close && !zvBuilderCoincide(p[p.size - 1], p[0])) p.Add(p[0]);
  const unsigned int n = p.size, i = lastProcessed;
  int startCorner = i != 0 && i < n - 1 ? IsCorner(p, i, fitError) : 0;
  if (i < n - 1 && i == cornerFlags.size) cornerFlags.Add(startCorner);
  // Smoothing stops at corners, so that they stay sharp.
  unsigned int s = i;
  for (unsigned int j = i; j + 1 < n - 1; ++j) {
    const int corner = IsCorner(p, j + 1, fitError);
    cornerFlags.Add(corner);
    if (corner) {
      SmoothTrailingInputPoints(gc, s, j + 1, p);
      s = j + 1;
    }
  }
  SmoothTrailingInputPoints(gc, s, n - 1, p);
  ZvPoint2fArray_ComputeIncrementalChordLength(p, i, n - 1, chordLengths);
  if (i == n - 1) {
    if (close) path->Closeto();
    return;
  }
  for (unsigned int a = i; a < n - 1;) {
    unsigned int b;
    int endCorner = 0;
    if (EdgeOctagonal(p, a) < longChordDistance) {
      // A run of short edges up to a corner, a long edge or the end.
      unsigned int m = 0;
      while (a + m + 1 < n - 1 && EdgeOctagonal(p, a + m + 1) < longChordDistance) {
        endCorner = cornerFlags[a + m + 1];
        if (endCorner) break;
        ++m;
      }
      b = a + m + 1;
      const unsigned int count = m + 1;
      const int closeHere = close && b == n - 1;
      if (count >= fitDegree) {
        cFitPts += m + 2;
        FitBezierCurve(p, chordLengths, fitError, fitDegree, a, startCorner, b, endCorner,
                       closeHere, tool, path);
      } else if (count < 2) {
        CubicInterpolation(p, chordLengths, fitError, a, startCorner, b, endCorner, closeHere,
                           path);
      } else {
        FindBezierCurve(p, fitDegree, a, startCorner, b, endCorner, closeHere, path);
      }
    } else {
      // A run of long edges, drawn edge by edge.
      b = a + 1;
      while (b < n - 1 && chordLengths[b + 1] - chordLengths[b] >= longChordDistance) {
        endCorner = cornerFlags[b];
        if (endCorner) break;
        ++b;
      }
      CubicInterpolation(p, chordLengths, fitError, a, startCorner, b, endCorner,
                         close && b + 1 == n, path);
    }
    a = b;
    startCorner = endCorner;
  }
}

const ZvPoint2fArray& ZvBezierFitPathBuilder::GetTrailingSamples() {
  const unsigned int firstNew = path->NumPoints();
  AddTrailingInputPoints(0);
  ComputeTrailingSamplePoints(firstNew, 0, bezierTool, flattenedWork);
  return samples;
}

const ZvPoint2fArray& ZvBezierFitPathBuilder::EndSubpath(const ZvPoint2<float>& p, int close) {
  AddEndPoint(p);
  const unsigned int firstNew = path->NumPoints();
  AddTrailingInputPoints(close);
  ComputeTrailingSamplePoints(firstNew, 1, bezierTool, flattenedWork);
  return samples;
}
