// The evaluation path of the standard curve, which shares searches and keeps the setup of the
// last segment, against a plain evaluation that snaps with the nearest-key search alone and
// builds every segment anew. Random curves with every handle flag, segment kind and
// extrapolation method, key counts on both sides of the neighbourhood search, keys closer than
// the snap tolerance, and edits between evaluations; the two must agree to the bit.
#include <gtest/gtest.h>

#include <zv/std_fcurve.h>

#include "fcurve/std_fcurve_impl.h"

#include <cmath>
#include <cstdint>
#include <cstring>
#include <random>
#include <vector>

namespace {

using C = ZvBaseFCurve;

// The inversion of the X cubic, round by round.
double PlainInvert(double x, double x0, double x1, double x2, double x3) {
  if (x - x0 < 1e-20) return 0.0;
  if (x3 - x < 1e-20) return 1.0;
  const double a = 3.0 * x1 + x3 - 3.0 * x2 - x0;
  const double b = 3.0 * (x0 - 2.0 * x1 + x2);
  const double c = 3.0 * (x1 - x0);
  const double d = x0 - x;
  double u = 0.5;
  double f = ((a * u + b) * u + c) * u + d;
  double low = 0.0, high = 1.0;
  double anchor = f < 0.0 ? 1.0 : 0.0;
  for (int round = 0; round < 100; ++round) {
    const double slope = (3.0 * a * u + 2.0 * b) * u + c;
    double step;
    if (((low - u) * slope + f) * ((high - u) * slope + f) < 0.0) {
      step = f / slope;
    } else {
      step = (u - anchor) * 0.5;
    }
    u -= step;
    if (step >= -1e-9 && 1e-9 >= step) break;
    f = ((a * u + b) * u + c) * u + d;
    if (std::fabs(f) <= 1e-29) break;
    if (f >= 0.0) {
      anchor = low;
      high = u;
    } else {
      anchor = high;
      low = u;
    }
  }
  return u < 0.0 ? 0.0 : (u > 1.0 ? 1.0 : u);
}

// The segment from key i, built from the evaluated handles every time.
double PlainSegment(const ZvStdFCurveImpl& s, unsigned int i, double t) {
  const CFCStdKey& k = s.keys[i];
  const CFCStdKey& next = s.keys[i + 1];
  switch (k.segmentKind) {
    case C::ConstantSegment:
      return k.rightValue;
    case C::LinearSegment:
      return k.rightValue +
             (next.leftValue - k.rightValue) * (t - k.parameter) / (next.parameter - k.parameter);
    case C::CubicSegment: {
      const double x0 = k.parameter, x3 = next.parameter;
      double x2 = next.leftTangent.x;
      if (next.flags & CFCFlag_CollapsedTangent) {
        x2 = x3;
      } else if (next.flags & CFCFlag_AutoTangent) {
        x2 = x3 + (x0 - x3) / 3.0;
      }
      const double u = PlainInvert(t, x0, s.GetEvaluatedRightTgt(i).x, x2, x3);
      const double y0 = k.rightValue, y1 = s.GetEvaluatedRightTgtY(i);
      const double y2 = s.GetEvaluatedLeftTgtY(i + 1), y3 = next.leftValue;
      return (((y3 - y0 - 3.0 * (y2 - y1)) * u + 3.0 * (y2 - y1) - 3.0 * (y1 - y0)) * u +
              3.0 * (y1 - y0)) *
                 u +
             y0;
    }
    default:
      return 0.0;
  }
}

// Snap with the nearest-key search from whatever hint the store holds, then evaluate.
double PlainEval(const ZvStdFCurveImpl& s, double t, bool left) {
  if (s.keys.size == 0) return s.valueWhenNoKeys;
  unsigned int i;
  if (s.GetClosestKeyIndexInCenteredInterval(t, kCFCSnapTolerance, i)) t = s.keys[i].parameter;
  return left ? s.EvalLeftUsingExtrapolationMethod(t) : s.EvalRightUsingExtrapolationMethod(t);
}

bool SameBits(double a, double b) {
  std::uint64_t x, y;
  std::memcpy(&x, &a, sizeof x);
  std::memcpy(&y, &b, sizeof y);
  return x == y;
}

class RandomCurves {
 public:
  explicit RandomCurves(unsigned int seed) : m_rng(seed) {}

  double Uniform(double lo, double hi) {
    return std::uniform_real_distribution<double>(lo, hi)(m_rng);
  }
  unsigned int Below(unsigned int n) { return static_cast<unsigned int>(m_rng() % n); }

  unsigned short RandomFlags() {
    static const unsigned short kHandleFlags[] = {CFCFlag_FlatTangent, CFCFlag_FlatAtExtremum,
                                                  CFCFlag_AutoTangent, CFCFlag_CollapsedTangent,
                                                  CFCFlag_ChordTangent};
    unsigned short f = CFCFlag_TangentContinuity;
    if (Below(2) == 0) return f;  // half the keys keep their stored handles
    for (unsigned short bit : kHandleFlags)
      if (Below(3) == 0) f = static_cast<unsigned short>(f | bit);
    return f;
  }

  // Handles inside their segments, now and then beyond, so that X folds back and the
  // inversion has to halve its bracket.
  void RandomHandles(ZvStdFCurveImpl& s, unsigned int i) {
    CFCStdKey& k = s.keys[i];
    const double before = i > 0 ? k.parameter - s.keys[i - 1].parameter : 1.0;
    const double after = i + 1 < s.keys.size ? s.keys[i + 1].parameter - k.parameter : 1.0;
    const double reach = Below(6) == 0 ? 1.3 : 0.6;
    k.leftTangent = {k.parameter - Uniform(0.0, reach) * before, k.leftValue + Uniform(-2.0, 2.0)};
    k.rightTangent = {k.parameter + Uniform(0.0, reach) * after, k.rightValue + Uniform(-2.0, 2.0)};
  }

  ZvStdFCurveImpl Curve(unsigned int n) {
    ZvStdFCurveImpl s(Uniform(-1.0, 1.0), C::CubicSegment);
    double p = Uniform(-3.0, 3.0);
    for (unsigned int i = 0; i < n; ++i) {
      s.InsertKey(i, p, Uniform(-2.0, 2.0));
      CFCStdKey& k = s.keys[i];
      if (Below(5) == 0) k.leftValue = Uniform(-2.0, 2.0);  // a discontinuity
      // Mostly cubic; linear, constant and the unknown kind 0 now and then.
      static const unsigned char kKinds[] = {3, 3, 3, 3, 3, 3, 3, 3, 2, 2, 1, 0};
      k.segmentKind = kKinds[Below(12)];
      k.flags = RandomFlags();
      // Mostly ordinary gaps; some below the snap tolerance or just above it.
      const unsigned int gap = Below(16);
      p += gap == 0 ? 4e-13 : (gap == 1 ? 2.5e-12 : Uniform(0.05, 1.0));
    }
    for (unsigned int i = 0; i < n; ++i)
      RandomHandles(s, i);
    s.extrapolation = static_cast<unsigned char>(1 + Below(4));
    return s;
  }

  // First t and points across its segment, where a kept segment would be used again; then
  // sweeps in both directions beyond the keys, jumps, the keys themselves and parameters
  // around them at the scales of the parameter epsilon and the snap tolerance.
  std::vector<double> Parameters(const ZvStdFCurveImpl& s, double start) {
    std::vector<double> t{start};
    int found;
    const unsigned int at = s.LocateParameter(start, found);
    if (at > 0 && at < s.keys.size) {
      const double a = s.keys[at - 1].parameter, b = s.keys[at].parameter;
      for (int i = 1; i < 16; ++i)
        t.push_back(a + (b - a) * i / 16.0);
    }
    const double first = s.keys[0].parameter, last = s.keys[s.keys.size - 1].parameter;
    const double lo = first - 2.0 - (last - first), hi = last + 2.0 + (last - first);
    for (int i = 0; i <= 300; ++i)
      t.push_back(lo + (hi - lo) * i / 300.0);
    for (int i = 300; i >= 0; --i)
      t.push_back(lo + (hi - lo) * i / 300.0);
    static const double kNear[] = {0.0,           1e-16,   6e-16, 1e-15,   2e-15, 1e-12,
                                   1e-12 + 5e-16, 1.5e-12, 2e-12, 2.1e-12, 3e-12};
    for (int i = 0; i < 400; ++i) {
      const double key = s.keys[Below(s.keys.size)].parameter;
      const double off = kNear[Below(sizeof kNear / sizeof *kNear)];
      t.push_back(Below(2) ? key + off : key - off);
      t.push_back(Uniform(lo, hi));
    }
    return t;
  }

  // An edit of the kind the editing operations make, written into the store directly, to key
  // `near` or the key after it: the segment evaluated last is the one that may be kept.
  void Edit(ZvStdFCurveImpl& s, unsigned int near) {
    const unsigned int n = s.keys.size;
    const unsigned int pick = near + Below(2);
    const unsigned int i = pick < n ? pick : n - 1;
    CFCStdKey& k = s.keys[i];
    // One ulp of a value that the segment from `near` is built from.
    double* const fields[] = {&k.parameter,      i == near ? &k.rightValue : &k.leftValue,
                              &k.rightTangent.x, &k.rightTangent.y,
                              &k.leftTangent.x,  &k.leftTangent.y};
    const unsigned int what = Below(8);
    if (what < 4) {
      double& v = *fields[i == near ? Below(4) : (Below(4) + 4) % 6];
      v = std::nextafter(v, Below(2) ? 1e300 : -1e300);
    } else if (what == 4) {
      k.flags = RandomFlags();
    } else if (what == 5) {
      k.segmentKind = static_cast<unsigned char>(1 + Below(3));
    } else if (what == 6 && n > 2) {
      s.DropKeys(i, i);
    } else if (what == 7 && i + 1 < n) {
      s.InsertKey(i + 1, 0.5 * (k.parameter + s.keys[i + 1].parameter), Uniform(-2.0, 2.0));
      s.keys[i + 1].segmentKind = C::CubicSegment;
      RandomHandles(s, i + 1);
    }
    s.extrapolation = static_cast<unsigned char>(1 + Below(4));
  }

 private:
  std::mt19937 m_rng;
};

TEST(StdCurveEvalReference, InversionMatchesThePlainIteration) {
  RandomCurves r(3);
  for (int i = 0; i < 20000; ++i) {
    const double scale = std::pow(10.0, r.Uniform(-6.0, 6.0));
    const double x0 = r.Uniform(-1.0, 1.0) * scale, x3 = x0 + r.Uniform(1e-9, 2.0) * scale;
    const double x1 = x0 + r.Uniform(-0.2, 1.4) * (x3 - x0);
    const double x2 = x3 - r.Uniform(-0.2, 1.4) * (x3 - x0);
    const double x = x0 + r.Uniform(-0.1, 1.1) * (x3 - x0);
    ASSERT_TRUE(SameBits(InvertParamCubic(x, x0, x1, x2, x3), PlainInvert(x, x0, x1, x2, x3)))
        << x << " in " << x0 << " " << x1 << " " << x2 << " " << x3;
  }
}

TEST(StdCurveEvalReference, EvaluationMatchesThePlainPathBitForBit) {
  RandomCurves r(17);
  static const unsigned int kCounts[] = {1, 2, 3, 11, 12, 13, 40};
  for (int round = 0; round < 70; ++round) {
    ZvStdFCurveImpl fast = r.Curve(kCounts[round % 7]);
    double t = fast.keys[0].parameter + 0.5;
    for (int edit = 0; edit < 10; ++edit) {
      // The plain store starts from the same hint as the fast one.
      ZvStdFCurveImpl plain = fast;
      const bool left = (round + edit) % 2 == 1;
      for (double next : r.Parameters(fast, t)) {
        t = next;
        const double got = fast.EvalSnapped(t, left);
        const double want = PlainEval(plain, t, left);
        ASSERT_TRUE(SameBits(got, want))
            << "round " << round << " edit " << edit << " left " << left << " method "
            << int(fast.extrapolation) << " t " << t << ": " << got << " vs " << want;
        ASSERT_EQ(fast.searchHint, plain.searchHint) << "t " << t;
        int found;
        const unsigned int at = fast.LocateParameter(t, found);
        if (at > 0 && at < fast.keys.size) {
          ASSERT_TRUE(SameBits(fast.EvalJustAfterIndex(t, at - 1), PlainSegment(fast, at - 1, t)))
              << "segment " << at - 1 << " t " << t;
        }
        plain.searchHint = fast.searchHint;
      }
      // The next round starts again at t, in the segment that the edit touches.
      int found;
      const unsigned int at = fast.LocateParameter(t, found);
      r.Edit(fast, at > 0 ? at - 1 : 0);
    }
  }
}

// The snap searches from the hint the previous call left. t - 1e-12 rounds to one ulp above
// key 5: the neighbourhood of a near hint finds key 5 there within the parameter epsilon and
// snaps t onto it, while the exact bisection from a far hint finds no key within the
// tolerance, t being a little more than 1e-12 above the key.
TEST(StdCurveEvalReference, SnapSearchesFromTheHintOfThePreviousCall) {
  ZvStdFCurve curve(0.0, C::LinearSegment);
  for (int i = 0; i < 20; ++i)
    curve.CreateKey(i, i * i);
  const double t = std::nextafter(5.0 + 1e-12, 6.0);
  curve.Eval(5.3, 0);
  EXPECT_EQ(curve.Eval(t, 0), 25.0);
  curve.Eval(15.5, 0);
  const double unsnapped = curve.Eval(t, 0);
  EXPECT_GT(unsnapped, 25.0);
  EXPECT_LT(unsnapped, 25.0 + 1e-10);
}

}  // namespace
