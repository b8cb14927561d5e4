// Interactive handle operations of the three-corner frame, and the handle geometry behind them.
#include <zv/rect2f.h>

#include <cmath>
#include <initializer_list>

#include "shape/frame2f.h"

namespace {

bool Coincide(const ZvPoint2<float>& p, const ZvPoint2<float>& q) {
  return std::fabs(p.x - q.x) <= 1e-7f && std::fabs(p.y - q.y) <= 1e-7f;
}

double Distance2(const ZvPoint2<float>& p, const ZvPoint2<float>& q) {
  const double dx = double(p.x) - q.x, dy = double(p.y) - q.y;
  return dx * dx + dy * dy;
}

int Project(const ZvPoint2<float>& p, const ZvPoint2<float>& a, const ZvPoint2<float>& b,
            const ZvPoint2<float>& direction, ZvPoint2<float>& out) {
  return ZvPoint2_ParallelProjectionOnLineAB(p, a, b, direction, out);
}

}  // namespace

int ComputePointWithSameRatio(const ZvPoint2<float>& a, const ZvPoint2<float>& b,
                              const ZvPoint2<float>& c, const ZvPoint2<float>& d,
                              ZvPoint2<float>& out) {
  const double B = Distance2(a, b), D = Distance2(a, d);
  if (D < 1e-7) {
    if (B < 1e-7) {
      out = c;
      return 1;
    }
    // b moved away from a point that had no length to compare with: only a c on a can follow.
    if (Distance2(a, c) >= 1e-7) return 0;
    out = b;
    return 1;
  }
  if (B < 1e-7) {
    out = a;
    return 1;
  }
  const double s = std::sqrt(B / D);
  const double dot =
      (double(b.x) - a.x) * (double(d.x) - a.x) + (double(b.y) - a.y) * (double(d.y) - a.y);
  // b on the far side of a from d mirrors c through a as well.
  const double k = dot >= 0 ? s : -s;
  out = {static_cast<float>(a.x + (double(c.x) - a.x) * k),
         static_cast<float>(a.y + (double(c.y) - a.y) * k)};
  return 1;
}

int ComputeMidPointNewPositions(const ZvPoint2<float>& a, const ZvPoint2<float>& b,
                                const ZvPoint2<float>& c, const ZvPoint2<float>& d,
                                const ZvPoint2<float>& e, ZvPoint2<float>& outA,
                                ZvPoint2<float>& outB) {
  // a anchor, b where the handle d is dragged, c the edge's direction, e the opposite handle.
  if (Coincide(a, d)) return 0;
  ZvPoint2<float> handle, opposite;
  if (!Project(b, a, d, c, handle) || !Project(e, a, d, c, opposite)) return 0;
  ZvPoint2<float> moved;
  if (!ComputePointWithSameRatio(a, handle, opposite, d, moved)) return 0;
  outA = handle;
  outB = moved;
  return 1;
}

int ComputeNewPosition(const ZvPoint2<float>& a, const ZvPoint2<float>& b, const ZvPoint2<float>& c,
                       const ZvPoint2<float>& d, const ZvPoint2<float>& e, const ZvPoint2<float>& f,
                       ZvPoint2<float>& out) {
  // c scaled on the line b-c about the anchor a, by the ratio that takes e to f, all three
  // measured on that line along direction d.
  if (Coincide(b, c)) {
    out = c;
    return 1;
  }
  ZvPoint2<float> pa, pe, pf;
  if (!Project(a, b, c, d, pa) || !Project(e, b, c, d, pe) || !Project(f, b, c, d, pf)) return 0;
  return ComputePointWithSameRatio(pa, pf, c, pe, out);
}

ZvPoint2<float> ZvFrame2f::FixedPoint(unsigned int i, int style) const {
  if (style == 0) return Handle(0);
  if (style == 1) return Handle(((i + 3) & 7) + 1);
  return {0.0f, 0.0f};
}

bool ZvFrame2f::Collapsed() const {
  if (Coincide(a, b) || Coincide(a, c)) return true;
  const double area =
      (double(b.x) - a.x) * (double(c.y) - a.y) - (double(b.y) - a.y) * (double(c.x) - a.x);
  return std::fabs(area) < 1e-7;
}

int ZvFrame2f::Skew(unsigned int i, const ZvPoint2<float>& p) {
  if (i == 0 || i > 8) return 1;
  const ZvPoint2<float> v = p - Handle(i);
  // The corners on the dragged handle's side follow it; the others stay.
  switch (i) {
    case 1:
    case 2:
      b += v;
      break;
    case 3:
    case 4:
      c += v;
      break;
    case 5:
    case 6:
      a += v;
      c += v;
      break;
    default:
      a += v;
      b += v;
      break;
  }
  return 1;
}

int ZvFrame2f::CheckedSkew(unsigned int i, const ZvPoint2<float>& p) {
  if (Collapsed()) return 0;
  const ZvFrame2f kept = *this;
  Skew(i, p);
  if (!Collapsed()) return 1;
  *this = kept;
  return 0;
}

int ZvFrame2f::Scale(unsigned int i, const ZvPoint2<float>& p, int style) {
  const ZvPoint2<float> f = FixedPoint(i, style);
  const ZvPoint2<float> h = Handle(i);
  if (std::fabs(h.x - f.x) < 1e-7f && std::fabs(h.y - f.y) < 1e-7f) return Skew(i, p);
  if (i == 0 || i > 8) return 0;
  const ZvFrame2f t = *this;
  if (i & 1) {
    // A middle handle moves its edge along the line from the fixed point through it.
    const ZvPoint2<float> direction = t.Handle(i + 1) - t.Handle(i == 1 ? 8 : i - 1);
    ZvPoint2<float> q;
    if (!Project(p, f, h, direction, q)) return 0;
    const ZvPoint2<float> delta = q - f;
    if (style == 0) {
      // delta is the new half extent across the edge; the centre stays.
      const ZvPoint2<float> t1 = t.Handle(1), t3 = t.Handle(3), t5 = t.Handle(5), t7 = t.Handle(7);
      const ZvPoint2<float> s = i == 1 || i == 3 ? delta : -delta;
      if (i == 1 || i == 5) {
        a = t7 - s;
        b = t7 + s;
        c = t3 - s;
      } else {
        a = t5 - s;
        b = t1 - s;
        c = t5 + s;
      }
    } else {
      // delta is the whole extent across the edge, from the fixed opposite edge.
      const ZvPoint2<float> t2 = t.Handle(2);
      if (i == 1) {
        b = a + delta;
      } else if (i == 3) {
        c = a + delta;
      } else if (i == 5) {
        a = b + delta;
        c = t2 + delta;
      } else {
        a = c + delta;
        b = t2 + delta;
      }
    }
    return 1;
  }
  // A corner goes to p with both edge directions kept; its opposite corner stays, or with the
  // centre fixed moves by the mirrored offset.
  const ZvPoint2<float> u = t.b - t.a, v = t.c - t.a;
  const unsigned int opposite = ((i + 3) & 7) + 1;
  const ZvPoint2<float> o = style == 0 ? f * 2.0f - p : t.Handle(opposite);
  // The corner's neighbour across the width edge lies on the v line through p and the u line
  // through the opposite corner, and the other way round.
  ZvPoint2<float> onU, onV;
  if (!Project(p, o, o + u, v, onU) || !Project(p, o, o + v, u, onV)) return 0;
  switch (i) {
    case 2:  // d at p, a opposite
      a = o;
      b = onU;
      c = onV;
      break;
    case 4:  // c at p, b opposite
      a = onU;
      b = o;
      c = p;
      break;
    case 6:  // a at p, d opposite
      a = p;
      b = onV;
      c = onU;
      break;
    default:  // b at p, c opposite
      a = onV;
      b = p;
      c = o;
      break;
  }
  return 1;
}

int ZvFrame2f::Scale(unsigned int i, const ZvPoint2<float>& p, const ZvPoint2<float>& q) {
  if (Collapsed() || i == 0 || i > 8) return 0;
  ZvFrame2f n = *this;
  const ZvPoint2<float> h = Handle(i);
  if (i & 1) {
    const unsigned int opposite = ((i + 3) & 7) + 1;
    const ZvPoint2<float> edge = i == 1 || i == 5 ? c - a : b - a;
    ZvPoint2<float> newH, newO;
    if (!ComputeMidPointNewPositions(q, p, edge, h, Handle(opposite), newH, newO)) return 0;
    const ZvPoint2<float> dh = newH - h, dO = newO - Handle(opposite);
    // The corners on the handle's edge move with it, those on the opposite edge with that.
    const bool aOnHandleSide = i == 5 || i == 7;
    const bool bOnHandleSide = i == 1 || i == 7;
    const bool cOnHandleSide = i == 3 || i == 5;
    n.a += aOnHandleSide ? dh : dO;
    n.b += bOnHandleSide ? dh : dO;
    n.c += cOnHandleSide ? dh : dO;
  } else {
    // A scaling along the two edge directions about q that takes the corner to p: each
    // coordinate of the oblique frame is scaled on its own.
    const ZvPoint2<float> u = b - a, v = c - a;
    const double det = double(u.x) * v.y - double(u.y) * v.x;
    const auto coords = [&](const ZvPoint2<float>& x, double& s, double& t) {
      const double dx = double(x.x) - q.x, dy = double(x.y) - q.y;
      s = (dx * v.y - dy * v.x) / det;
      t = (double(u.x) * dy - double(u.y) * dx) / det;
    };
    double sh, th, sp, tp;
    coords(h, sh, th);
    coords(p, sp, tp);
    if (std::fabs(sh) < 1e-7 || std::fabs(th) < 1e-7) return 0;
    const double ks = sp / sh, kt = tp / th;
    for (ZvPoint2<float>* x : {&n.a, &n.b, &n.c}) {
      double s, t;
      coords(*x, s, t);
      s *= ks;
      t *= kt;
      *x = {static_cast<float>(q.x + s * u.x + t * v.x),
            static_cast<float>(q.y + s * u.y + t * v.y)};
    }
  }
  if (n.Collapsed()) return 0;
  *this = n;
  return 1;
}
