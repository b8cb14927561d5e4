// LinearMotionPathMorph: a section of each shape carried along two motion paths, and the
// similarity that carries it.
#include <zv/gc.h>
#include <zv/morpher.h>
#include <zv/path2f_prop1d.h>
#include <zv/polyline.h>
#include <zv/transfo4.h>

#include <algorithm>
#include <cmath>

#include "core/vec.h"
#include "shape/morpher_impl.h"

namespace {

using P2f = ZvPoint2<float>;
using P2d = ZvPoint2<double>;

P2d Widen(const P2f& p) {
  return P2d{p.x, p.y};
}

// Where a section end has got to at t on its way from a (in A) to b (in B). The motion path's
// own ends are not used: at 0 and at its full length the end is a or b exactly, so a motion path
// only has to give the route, not touch the shapes.
P2f MovedEnd(const MPathData& record, const P2f& a, const P2f& b, double t, double s) {
  if (!record.motionPath) {
    return P2f{static_cast<float>(a.x + (double(b.x) - a.x) * t),
               static_cast<float>(a.y + (double(b.y) - a.y) * t)};
  }
  ZvPoint2fArray flat;
  ZvPointTagArray tags;
  record.motionPath->AltFlatten(s, flat, tags);
  ZvDoubleArray chords;
  const double length = ZvPoint2fArraySingleComponent_ComputeChordLength(flat, chords);
  double target = length * t;
  if (!(target > 0.0)) return a;
  target = std::min(target, length);
  if (std::fabs(target) <= 1e-9) return a;
  if (std::fabs(target - length) <= 1e-15) return b;
  unsigned int j = 1;
  while (j + 1 < chords.size && chords[j] < target)
    ++j;
  const double edge = chords[j] - chords[j - 1];
  const double f = edge > 0.0 ? (target - chords[j - 1]) / edge : 0.0;
  const P2f& p = flat[j - 1];
  const P2f& q = flat[j];
  return P2f{static_cast<float>(p.x + (double(q.x) - p.x) * f),
             static_cast<float>(p.y + (double(q.y) - p.y) * f)};
}

// The section first..last of `path`, carried by `transform`, flattened at s and measured.
void FlattenSection(const ZvPath2f& path, unsigned int first, unsigned int last,
                    const ZvTransfo4& transform, double s, ZvMorphFlat& flat) {
  ZvPath2f section(path, first, last);
  section.Transform(transform);
  ZvPointTagArray tags;
  section.AltFlatten(s, flat.points, tags);
  flat.length = ZvPoint2fArraySingleComponent_ComputeChordLength(flat.points, flat.chords);
}

}  // namespace

int SetToSimilarityXY(ZvTransfo4& transform, const P2d& a, const P2d& b, const P2d& c,
                      const P2d& d) {
  const P2d from = c - a, to = d - b;
  const double p = zvGuardedLength(from), q = zvGuardedLength(to);
  if (p < 1e-7 || q < 1e-7) return 0;
  double degrees = 0.0;
  if (!ZvPoint2_AngleInDegrees(from, to, degrees)) return 0;
  // Edits post-multiply, so the last one acts first: a is moved onto b, then turned and scaled
  // about b, which takes c onto d.
  transform.ResetToIdentity();
  transform.ScaleXY(q / p, q / p, b);
  transform.RotateXY(degrees, b);
  transform.Translate(b - a);
  return 1;
}

int ZvMorpherImpl::LinearMotionPathMorph(double t, ZvPath2fProp1d& output) {
  if (!UsableStep() || motionPaths.size < 2) return 0;
  const double s = gc.pointMergeDistance;
  const MPathData& r0 = motionPaths[0];
  const MPathData& r1 = motionPaths[1];
  P2f a0, a1, b0, b1;
  if (!pathA->GetPoint(r0.indexA, a0) || !pathA->GetPoint(r1.indexA, a1) ||
      !pathB->GetPoint(r0.indexB, b0) || !pathB->GetPoint(r1.indexB, b1))
    return 0;
  const P2f m0 = MovedEnd(r0, a0, b0, t, s);
  const P2f m1 = MovedEnd(r1, a1, b1, t, s);
  // A side whose ends coincide cannot be scaled onto the moved ends; it stays where it is.
  ZvTransfo4 toA, toB;
  SetToSimilarityXY(toA, Widen(a0), Widen(m0), Widen(a1), Widen(m1));
  SetToSimilarityXY(toB, Widen(b0), Widen(m0), Widen(b1), Widen(m1));

  ZvMorphFlat sectionA, sectionB;
  FlattenSection(*pathA, r0.indexA, r1.indexA, toA, s, sectionA);
  FlattenSection(*pathB, r0.indexB, r1.indexB, toB, s, sectionB);
  // A section that holds no segment (ends reversed, or between two control points) is refused.
  return BlendOpen(t, sectionA, sectionB, &ZvPoint2fArraySingleComponent_Lerp, output);
}
