// Moving single points of ZvPath2f while the G1 locks and closed subpaths keep their shape.
#include <zv/path2f.h>

#include "core/vec.h"
#include "shape/path_codes.h"
#include "shape/shape_lock.h"

using namespace zv_path;

namespace {
using P2f = ZvPoint2<float>;

// Moves x onto the line through a and b, orthogonally; nothing when a and b (nearly) coincide.
void ProjectOnLine(P2f& x, const P2f& a, const P2f& b) {
  const double abx = static_cast<double>(b.x) - a.x, aby = static_cast<double>(b.y) - a.y;
  const double l2 = abx * abx + aby * aby;
  if (!(l2 > 1e-7)) return;
  const double u =
      ((static_cast<double>(x.x) - a.x) * abx + (static_cast<double>(x.y) - a.y) * aby) / l2;
  x.x = static_cast<float>(a.x * (1.0 - u) + b.x * u);
  x.y = static_cast<float>(a.y * (1.0 - u) + b.y * u);
}

// A handle of the locked node `node` goes from `handle` to p: its partner on the other side of
// the node turns to point straight away from p. With `scale` the partner's length keeps its
// ratio to the handle's; without, the partner keeps its own length.
void TurnPartner(P2f& partner, const P2f& node, const P2f& handle, const P2f& p, int scale) {
  double dx = static_cast<double>(p.x) - node.x, dy = static_cast<double>(p.y) - node.y;
  double r = zvGuardedLength2(static_cast<double>(partner.x) - node.x,
                              static_cast<double>(partner.y) - node.y);
  if (scale) {
    // A handle lying on its node has no length to compare with: the new vector is then simply
    // scaled by the partner's length. A handle shorter than the guard counts as lying there.
    const double h = zvGuardedLength2(static_cast<double>(handle.x) - node.x,
                                      static_cast<double>(handle.y) - node.y);
    if (!Coincide(handle, node) && h > 0.0) r /= h;
  } else if (!(std::fabs(dx) <= 1e-9 && std::fabs(dy) <= 1e-9)) {
    const double l = zvGuardedLength2(dx, dy);
    if (l > 0.0) {
      dx /= l;
      dy /= l;
    }
  }
  partner.x = static_cast<float>(node.x - dx * r);
  partner.y = static_cast<float>(node.y - dy * r);
}
}  // namespace

void ZvPath2f::ReplacePoint(unsigned int i, const ZvPoint2<float>& p, int scale) {
  ZvShapeLock guard(*this);
  if (i >= points.size) return;
  const unsigned char byte = codes[i];
  if (IsSubpathBoundary(i)) {
    const unsigned int s = SubpathStart(i), e = SubpathEnd(i);
    // A block read from outside may mark any point; a lock needs a subpath around it.
    if ((byte & kG1Lock) && e > s) {
      // A locked start and end are one smooth node: both points and both handles move.
      const P2f d = p - points[i];
      points[e] = p;
      points[s] = p;
      points[e - 1] += d;
      points[s + 1] += d;
      if (!IsG1Continuous(i)) ProjectOnLine(points[e - 1], points[s + 1], points[s]);
    } else if (IsClosedEnd(codes[e] & kCodeMask)) {
      points[e] = p;
      points[s] = p;
    } else {
      points[i] = p;
    }
    return;
  }
  if (IsNode(byte)) {
    if (byte & kG1Lock) {
      const P2f d = p - points[i];
      points[i] = p;
      points[i - 1] += d;
      points[i + 1] += d;
      // Rounding may tilt the handles apart: the outgoing one goes back in line.
      if (!IsG1Continuous(i)) ProjectOnLine(points[i + 1], points[i - 1], points[i]);
    } else {
      points[i] = p;
    }
    return;
  }
  // A handle: its partner across a locked node follows. At a closed subpath's start the partner
  // is the closing segment's last handle, at its end the first segment's first handle.
  const unsigned int code = byte & kCodeMask;
  if (InHandleMask(kFirstHandleMask, code) && (codes[i - 1] & kG1Lock)) {
    const unsigned int node = i - 1;
    const bool start = node == 0 || (codes[node] & kCodeMask) == kStart;
    const unsigned int partner = start ? SubpathEnd(i) - 1 : i - 2;
    TurnPartner(points[partner], points[node], points[i], p, scale);
  } else if (InHandleMask(kLastHandleMask, code) && (codes[i + 1] & kG1Lock)) {
    const unsigned int node = i + 1;
    const bool inside = node + 1 < points.size && (codes[node + 1] & kCodeMask) != kStart;
    const unsigned int partner = inside ? node + 1 : SubpathStart(i) + 1;
    TurnPartner(points[partner], points[node], points[i], p, scale);
  }
  points[i] = p;
}

void ZvPath2f::ReplacePointIgnoringLock(unsigned int index, const ZvPoint2<float>& p) {
  ZvShapeLock guard(*this);
  if (index < points.size) points[index] = p;
}

int ZvPath2f::ReplaceTangentVectorDirections(unsigned int node, const ZvPoint2<float>& v) {
  ZvShapeLock guard(*this);
  if (node >= points.size || !IsNode(codes[node])) return 0;
  unsigned int in = node - 1, out = node + 1;
  if (IsSubpathBoundary(node)) {
    const unsigned int s = SubpathStart(node), e = SubpathEnd(node);
    if (!IsClosedEnd(codes[e] & kCodeMask) || e - s < 2) return 0;
    in = e - 1;
    out = s + 1;
  }
  // Only handles take a direction: a line on either side would have its own end moved, which
  // could tear a closed subpath apart.
  if (IsNode(codes[in]) || IsNode(codes[out])) return 0;
  const P2f at = points[node];
  points[in] = at - v;
  points[out] = at + v;
  return 1;
}
