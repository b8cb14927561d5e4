// LinearMorph: point-by-point blending along arc length, subpath by subpath or, when the
// subpath counts differ, along one shared scale of steps.
#include <zv/bezier_fit.h>
#include <zv/gc.h>
#include <zv/morpher.h>
#include <zv/path2f_prop1d.h>
#include <zv/polyline.h>

#include <algorithm>
#include <cmath>
#include <vector>

#include "core/vec.h"
#include "shape/morpher_impl.h"

namespace {

// A subpath resampled into `steps` even steps (steps + 1 points) on the shared scale.
struct ZvMorphShare {
  ZvPoint2fArray points;
  unsigned int start = 0;
  unsigned int steps = 0;
};

// Every subpath of `path`, flattened at the step; the result is the sum of their lengths.
double FlattenAll(const ZvMorpherImpl& impl, const ZvPath2f& path,
                  std::vector<ZvMorphFlat>& flats) {
  flats.resize(path.NumSubpaths());
  ZvPath2fIter it(path);
  unsigned int first = 0, last = 0;
  double sum = 0.0;
  for (ZvMorphFlat& flat : flats) {
    if (!it.GetNextSubPathIndices(first, last)) break;
    impl.FlattenSubpath(path, first, flat);
    sum += flat.length;
  }
  return sum;
}

// Shares N steps out over the subpaths of one side in proportion to their lengths, in order. A
// subpath no longer than one step of the whole gets a single step (an even share when the whole
// side has no length), every other one at least one, and none so many that a later subpath is
// left without; the last takes what remains.
void ShareSteps(const std::vector<ZvMorphFlat>& flats, double sum, unsigned int n,
                std::vector<ZvMorphShare>& shares) {
  const long long u = static_cast<long long>(flats.size());
  const long long total = n;
  const double unit = sum / n;
  long long shortOnes = 0;  // subpaths still to come that are too short for a step of their own
  for (const ZvMorphFlat& flat : flats)
    if (flat.length <= unit) ++shortOnes;
  long long allocated = 0;
  double lengthUsed = 0.0;
  shares.reserve(flats.size());
  for (long long i = 0; i < u && allocated < total; ++i) {
    const ZvMorphFlat& flat = flats[i];
    const long long behind = u - 1 - i;
    long long k = 1;
    if (flat.length <= unit) {
      if (std::fabs(sum) <= 1e-9) k = std::max(1LL, total / u);
      shortOnes -= k;
    } else {
      // Clamped as a double first: a vanishing remaining length must not overflow the cast, and
      // a share that is no number (rounding left no length: 0 / 0) counts as one step.
      const double fair =
          (static_cast<double>(total - allocated - shortOnes) * flat.length) / (sum - lengthUsed);
      k = fair >= 1.0 ? static_cast<long long>(std::min(fair, static_cast<double>(total))) : 1;
      k = std::min(std::max(k, 1LL), (total - allocated) - behind);
    }
    if (allocated + k > total || (i == u - 1 && allocated + k < total)) k = total - allocated;
    if (k < 1) break;  // cannot happen while N is at least the subpath count
    shares.emplace_back();
    ZvMorphShare& share = shares.back();
    share.start = flat.start;
    share.steps = static_cast<unsigned int>(k);
    ZvPoint2fArraySingleComponent_EvenSubdivide(flat.points, flat.chords, share.steps,
                                                share.points);
    allocated += k;
    lengthUsed += flat.length;
  }
}

}  // namespace

int ZvMorpherImpl::LinearMorph(double t, ZvPath2fProp1d& output) {
  if (!UsableStep()) return 0;
  if (pathA->IsSiblingOf(*pathB)) {
    // Same topology: blending control points is exact and needs no flattening or refit.
    output.SetToLerpAB(*pathA, *pathB, t, gc.pointMergeDistance, gc.propertyTolerance);
    return 1;
  }
  if (pathA->NumSubpaths() == pathB->NumSubpaths()) return EqualCountMorph(t, output);
  return UnequalCountMorph(t, output);
}

int ZvMorpherImpl::EqualCountMorph(double t, ZvPath2fProp1d& output) {
  std::vector<ZvMorphFlat> flatsA, flatsB;
  FlattenAll(*this, *pathA, flatsA);
  FlattenAll(*this, *pathB, flatsB);
  const size_t count = std::min(flatsA.size(), flatsB.size());
  std::vector<unsigned int> steps(count);
  // Every step count is known before anything is appended, so a refusal leaves output as it was.
  for (size_t i = 0; i < count; ++i) {
    steps[i] = StepsFor(std::max(flatsA[i].length, flatsB[i].length));
    if (!steps[i]) return 0;
  }
  ZvBezierTool tool;
  ZvPoint2fArray evenA, evenB, work;
  for (size_t i = 0; i < count; ++i) {
    const ZvMorphFlat& a = flatsA[i];
    const ZvMorphFlat& b = flatsB[i];
    evenA.Chop(0);
    evenB.Chop(0);
    if (!ZvPoint2fArraySingleComponent_EvenSubdivide(a.points, a.chords, steps[i], evenA) ||
        !ZvPoint2fArraySingleComponent_EvenSubdivide(b.points, b.chords, steps[i], evenB))
      continue;
    work = evenA;
    ZvPoint2fArraySingleComponent_Lerp(evenA, evenB, t, work);
    unsigned int outputIndex = 0;
    if (Fit(tool, work, a.closed && b.closed, output, outputIndex))
      SetThePropertyCurve(t, output, steps[i], a.start, b.start, outputIndex);
  }
  return 1;
}

int ZvMorpherImpl::UnequalCountMorph(double t, ZvPath2fProp1d& output) {
  std::vector<ZvMorphFlat> flatsA, flatsB;
  const double sumA = FlattenAll(*this, *pathA, flatsA);
  const double sumB = FlattenAll(*this, *pathB, flatsB);
  unsigned int n = StepsFor(std::max(sumA, sumB));
  if (!n) return 0;
  // Every subpath needs a step of its own to face anything.
  n = std::max<size_t>(n, std::max(flatsA.size(), flatsB.size()));
  std::vector<ZvMorphShare> sharesA, sharesB;
  ShareSteps(flatsA, sumA, n, sharesA);
  ShareSteps(flatsB, sumB, n, sharesB);

  ZvBezierTool tool;
  ZvPoint2fArray work;
  const double s = gc.pointMergeDistance;
  size_t ia = 0, ib = 0;
  unsigned int pa = 0, pb = 0;
  while (ia < sharesA.size() && ib < sharesB.size()) {
    const ZvMorphShare& a = sharesA[ia];
    const ZvMorphShare& b = sharesB[ib];
    if (a.points.size < 2 || b.points.size < 2) break;  // a subpath that would not flatten
    // The stretch where subpath ia of A faces subpath ib of B.
    const unsigned int m = std::min(a.points.size - 1 - pa, b.points.size - 1 - pb);
    ZvPoint2fArraySingleComponent_Lerp(a.points, pa, pa + m, b.points, pb, pb + m, t, work);
    const ZvPoint2<float> head = work[0], tail = work[work.size - 1];
    const double gap =
        zvGuardedLength2(double(tail.x) - double(head.x), double(tail.y) - double(head.y));
    // Ends that come within a step of each other close the piece.
    const int closed = gap <= s;
    if (closed && !(std::fabs(head.x - tail.x) <= 1e-7f && std::fabs(head.y - tail.y) <= 1e-7f))
      work.Add(head);
    unsigned int outputIndex = 0;
    if (Fit(tool, work, closed, output, outputIndex))
      SetThePropertyCurve(t, a.start, pa, a.steps, b.start, pb, b.steps, m + 1, output,
                          outputIndex);
    pa += m;
    pb += m;
    if (pa + 1 >= a.points.size) {
      pa = 0;
      ++ia;
    }
    if (pb + 1 >= b.points.size) {
      pb = 0;
      ++ib;
    }
  }
  return 1;
}
