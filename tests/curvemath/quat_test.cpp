#include <zv/quat.h>

#include <gtest/gtest.h>

#include <cmath>
#include <random>
#include <vector>

#include "curvemath/quat_ops.h"

namespace {

constexpr double kPi = 3.141592653589793;

double Dot(const ZvQuat& a, const ZvQuat& b) {
  return a.w * b.w + a.x * b.x + a.y * b.y + a.z * b.z;
}

ZvQuat Unit(ZvQuat q) {
  const double n = std::sqrt(Dot(q, q));
  return ZvQuat(q.w / n, q.x / n, q.y / n, q.z / n);
}

// The rotation angle between two rotations, whatever their signs and lengths; through atan2 so
// that small angles keep their precision.
double AngleBetween(const ZvQuat& a, const ZvQuat& b) {
  const ZvQuat ua = Unit(a);
  const ZvQuat r = ZvQuat(ua.w, -ua.x, -ua.y, -ua.z) * Unit(b);
  return 2.0 * std::atan2(std::sqrt(r.x * r.x + r.y * r.y + r.z * r.z), std::fabs(r.w));
}

double Wrapped(double a) {
  return a - 2 * kPi * std::floor(a / (2 * kPi) + 0.5);
}

ZvPoint3<double> RandomAngles(std::mt19937& rng, double limit) {
  std::uniform_real_distribution<double> d(-limit, limit);
  return {d(rng), d(rng), d(rng)};
}

TEST(Quat, EulerRoundTripAwayFromGimbalLock) {
  std::mt19937 rng(7);
  std::uniform_real_distribution<double> y(-1.45, 1.45);
  for (int i = 0; i < 2000; ++i) {
    ZvPoint3<double> a = RandomAngles(rng, kPi);
    a.y = y(rng);
    ZvPoint3<double> r;
    ZvQuat(a).Get(r, a);
    EXPECT_NEAR(Wrapped(r.x - a.x), 0.0, 1e-9);
    EXPECT_NEAR(Wrapped(r.y - a.y), 0.0, 1e-9);
    EXPECT_NEAR(Wrapped(r.z - a.z), 0.0, 1e-9);
    // Without a seed the answer is another triple of the same rotation.
    ZvQuat(a).Get(r);
    EXPECT_LT(AngleBetween(ZvQuat(r), ZvQuat(a)), 1e-9);
  }
}

TEST(Quat, SeedPicksTheNearestSolutionAcrossTurns) {
  // A seed of 6.28 near a true 0 stays near 6.28, per angle and for the other branch.
  ZvPoint3<double> r;
  ZvQuat(ZvPoint3<double>{0.0, 0.3, 0.0}).Get(r, ZvPoint3<double>{6.28, 0.3, -6.28});
  EXPECT_NEAR(r.x, 2 * kPi, 1e-12);
  EXPECT_NEAR(r.z, -2 * kPi, 1e-12);
  // The second solution (x + pi, pi - y, z + pi) wins when the seed lies near it.
  const ZvPoint3<double> a{0.2, 0.4, -0.1};
  ZvQuat(a).Get(r, ZvPoint3<double>{0.2 + kPi, kPi - 0.4, -0.1 + kPi});
  EXPECT_NEAR(r.x, 0.2 + kPi, 1e-9);
  EXPECT_NEAR(r.y, kPi - 0.4, 1e-9);
  EXPECT_NEAR(r.z, -0.1 + kPi, 1e-9);
}

TEST(Quat, GimbalLockKeepsTheRotationAndStaysNearTheSeed) {
  for (double y : {kPi / 2, -kPi / 2}) {
    const ZvPoint3<double> a{0.7, y, -0.2};
    const ZvPoint3<double> seed{0.5, y, 0.1};
    ZvPoint3<double> r;
    ZvQuat(a).Get(r, seed);
    EXPECT_LT(AngleBetween(ZvQuat(r), ZvQuat(a)), 1e-6) << y;
    // Of the family of answers the one that moves x and z by equal amounts from the seed.
    EXPECT_NEAR(std::fabs(r.x - seed.x), std::fabs(r.z - seed.z), 1e-6) << y;
    // The seed itself, when it is already an answer, comes back unchanged.
    ZvQuat(a).Get(r, a);
    EXPECT_NEAR(r.x, a.x, 1e-6);
    EXPECT_NEAR(r.z, a.z, 1e-6);
  }
}

TEST(Quat, NormalizeAndProduct) {
  ZvQuat zero(0, 0, 0, 0);
  zero.Normalize();
  EXPECT_EQ(zero.w, 1.0);
  EXPECT_EQ(zero.x + zero.y + zero.z, 0.0);
  ZvQuat q(2, 0, 0, 0);
  q.Normalize();
  EXPECT_EQ(q.w, 1.0);
  // Rz(a) Rx(b) composed as a product is the Euler triple (b, 0, a).
  const ZvQuat p = ZvQuat(ZvPoint3<double>{0, 0, 0.5}) * ZvQuat(ZvPoint3<double>{0.3, 0, 0});
  EXPECT_LT(AngleBetween(p, ZvQuat(ZvPoint3<double>{0.3, 0, 0.5})), 1e-12);
}

TEST(QuatKey, FlagsPackSignedSpinsAndTwoLocks) {
  ZvQuatKey k(1.0, ZvPoint3<double>{0, 0, 0}, 0.f, 0.f, 0.f, -3);
  EXPECT_EQ(k.GetSpins(), -3);
  EXPECT_EQ(k.flags, 16381);  // -3 masked to 14 bits, locks clear
  k.SetValueLock(true);
  k.SetParamLock(true);
  EXPECT_EQ(k.GetSpins(), -3);
  EXPECT_EQ(k.flags, 0xc000 | 16381);
  k.SetSpins(8191);
  EXPECT_EQ(k.GetSpins(), 8191);
  EXPECT_TRUE(k.IsParamLocked() && k.IsValueLocked());
  // Equality tolerates rounding of the stored values but no flag difference.
  ZvQuatKey a(1.0, ZvPoint3<double>{0.1, 0.2, 0.3}, 0.5f, 0.f, 0.f, 0), b = a;
  b.time += 1e-10;
  b.angles.y -= 1e-10;
  EXPECT_TRUE(a == b);
  b.SetParamLock(true);
  EXPECT_FALSE(a == b);
  EXPECT_TRUE(ZvQuatKey() < a);
}

// Random keys with tension, continuity and bias over [-1, 1], some with spins.
std::vector<ZvQuatKey> RandomKeys(std::mt19937& rng, int n) {
  std::uniform_real_distribution<float> tcb(-1.f, 1.f);
  std::uniform_real_distribution<double> gap(0.2, 2.0);
  std::uniform_int_distribution<int> spin(-2, 2);
  std::vector<ZvQuatKey> keys;
  double t = -1.0;
  for (int i = 0; i < n; ++i) {
    t += gap(rng);
    keys.emplace_back(t, RandomAngles(rng, 2 * kPi), tcb(rng), tcb(rng), tcb(rng),
                      i % 3 == 1 ? spin(rng) : 0);
  }
  return keys;
}

double LogLength(const ZvQuat& v) {
  return std::sqrt(v.x * v.x + v.y * v.y + v.z * v.z);
}

TEST(QuatSpline, InterpolatesKeysAndMovesContinuously) {
  std::mt19937 rng(11);
  for (int trial = 0; trial < 40; ++trial) {
    const std::vector<ZvQuatKey> keys = RandomKeys(rng, 2 + trial % 7);
    const ZvQuatSpline s(static_cast<int>(keys.size()), keys.data(), 1);
    ASSERT_EQ(s.GetNumSegments(), keys.size() - 1);
    for (const ZvQuatKey& k : keys) {
      EXPECT_NEAR(std::fabs(Dot(Unit(s.Eval(k.time)), ZvQuat(k.angles))), 1.0, 1e-12)
          << "trial " << trial << " key at " << k.time;
    }
    // Each factor exp(v B(u)) turns by at most 2 |v| |B'| per unit of u (B1' and B3' reach 3,
    // B2' 1.5), so the rotation's speed in a segment is bounded; neighbouring samples may not
    // differ by more than that speed times the step.
    const double step = 1e-3;
    for (unsigned int i = 0; i < s.GetNumSegments(); ++i) {
      const ZvQuatSpline::Segment& g = s.GetSegment(i);
      const double speed =
          2.0 * (3.0 * LogLength(g.a) + 1.5 * LogLength(g.m) + 3.0 * LogLength(g.b)) * g.invSpan;
      ZvQuat previous = s.Eval(g.t0);
      for (double t = g.t0 + step; t <= g.t1; t += step) {
        const ZvQuat q = s.Eval(t);
        ASSERT_LE(AngleBetween(previous, q), speed * step * 1.01 + 1e-9)
            << "trial " << trial << " t " << t;
        previous = q;
      }
    }
  }
}

TEST(QuatSpline, SpinsTurnBetweenKeysNotAtThem) {
  const ZvPoint3<double> a{0.1, 0.2, 0.3}, b{0.5, -0.4, 1.0};
  std::vector<ZvQuatKey> keys{ZvQuatKey(0.0, a, 0.f, 0.f, 0.f, 0),
                              ZvQuatKey(1.0, b, 0.f, 0.f, 0.f, 0)};
  const ZvQuatSpline plain(2, keys.data(), 1);
  keys[0].SetSpins(2);
  const ZvQuatSpline spun(2, keys.data(), 1);
  const auto travel = [](const ZvQuatSpline& s) {
    double sum = 0.0;
    ZvQuat p = s.Eval(0.0);
    for (int i = 1; i <= 4000; ++i) {
      const ZvQuat q = s.Eval(i / 4000.0);
      sum += AngleBetween(p, q);
      p = q;
    }
    return sum;
  };
  EXPECT_NEAR(std::fabs(Dot(Unit(spun.Eval(1.0)), ZvQuat(b))), 1.0, 1e-12);
  EXPECT_NEAR(std::fabs(Dot(Unit(spun.Eval(0.0)), ZvQuat(a))), 1.0, 1e-12);
  // Each spin adds pi to the half angle in log space: a whole turn of the rotation.
  EXPECT_NEAR(travel(spun) - travel(plain), 2 * 2 * kPi, 1e-2);
  // Hermite from raw tangents follows the same rule.
  const ZvQuat q0(a), q1(b), zero(0, 0, 0, 0);
  EXPECT_LT(AngleBetween(Hermite(q0, q1, zero, zero, 1.0, 3), q1), 1e-9);
  EXPECT_GT(AngleBetween(Hermite(q0, q1, zero, zero, 0.5, 1), Hermite(q0, q1, zero, zero, 0.5, 0)),
            3.0);
}

TEST(QuatSpline, EqualKeysStayPut) {
  // Two equal rotations: the phantoms repeat them (weights 2 and -1) and nothing moves.
  const ZvPoint3<double> a{0.3, -0.2, 2.0};
  const ZvQuatKey keys[2] = {ZvQuatKey(1.0, a, 0.f, 0.f, 0.f, 0),
                             ZvQuatKey(3.0, a, 0.f, 0.f, 0.f, 0)};
  const ZvQuatSpline s(2, keys, 2);
  for (double t : {-5.0, 1.0, 1.7, 2.5, 3.0, 9.0})
    EXPECT_LT(AngleBetween(s.Eval(t), ZvQuat(a)), 1e-9) << t;
}

class QuatExtrapolation : public ::testing::Test {
 protected:
  void SetUp() override {
    std::mt19937 rng(5);
    keys = RandomKeys(rng, 4);
    for (ZvQuatKey& k : keys)
      k.flags = 0;
    first = keys.front().time;
    last = keys.back().time;
  }
  ZvQuatSpline Spline(unsigned int method) const {
    return ZvQuatSpline(static_cast<int>(keys.size()), keys.data(), method);
  }
  std::vector<ZvQuatKey> keys;
  double first = 0, last = 0;
};

TEST_F(QuatExtrapolation, ConstantHoldsTheEnds) {
  const ZvQuatSpline s = Spline(1);
  EXPECT_LT(AngleBetween(s.Eval(last + 3.0), ZvQuat(keys.back().angles)), 1e-12);
  EXPECT_LT(AngleBetween(s.Eval(first - 3.0), ZvQuat(keys.front().angles)), 1e-12);
}

TEST_F(QuatExtrapolation, RepeatFoldsIntoTheKeys) {
  const ZvQuatSpline s = Spline(3);
  const double period = last - first;
  for (double r : {0.1, 0.37, 0.9}) {
    const ZvQuat inside = s.Eval(first + r * period);
    EXPECT_LT(AngleBetween(s.Eval(first + r * period + 2 * period), inside), 1e-9) << r;
    EXPECT_LT(AngleBetween(s.Eval(first + r * period - 3 * period), inside), 1e-9) << r;
  }
}

TEST_F(QuatExtrapolation, RepeatWithOffsetComposesWholePeriods) {
  const ZvQuatSpline s = Spline(4);
  const double period = last - first;
  const ZvQuat whole =
      s.Eval(last) * ZvQuat(s.Eval(first).w, -s.Eval(first).x, -s.Eval(first).y, -s.Eval(first).z);
  for (double r : {0.25, 0.8}) {
    const ZvQuat inside = s.Eval(first + r * period);
    EXPECT_LT(AngleBetween(s.Eval(first + r * period + period), whole * inside), 1e-9);
    EXPECT_LT(AngleBetween(s.Eval(first + r * period + 3 * period), whole * whole * whole * inside),
              1e-9);
    const ZvQuat back(whole.w, -whole.x, -whole.y, -whole.z);
    EXPECT_LT(AngleBetween(s.Eval(first + r * period - period), back * inside), 1e-9);
  }
  // No jump where one period meets the next, on either side.
  EXPECT_LT(AngleBetween(s.Eval(last + 1e-7), s.Eval(last)), 1e-4);
  EXPECT_LT(AngleBetween(s.Eval(first - 1e-7), s.Eval(first)), 1e-4);
  EXPECT_LT(AngleBetween(s.Eval(last + period + 1e-7), s.Eval(last + period - 1e-7)), 1e-4);
}

TEST_F(QuatExtrapolation, LinearKeepsTurningAtTheEndSpeed) {
  const ZvQuatSpline s = Spline(2);
  for (int side = 0; side < 2; ++side) {
    const double end = side ? last : first, dir = side ? 1.0 : -1.0;
    const ZvQuat at = s.Eval(end);
    const double d1 = AngleBetween(at, s.Eval(end + dir * 0.1));
    const double d2 = AngleBetween(at, s.Eval(end + dir * 0.2));
    EXPECT_LT(AngleBetween(at, s.Eval(end + dir * 1e-7)), 1e-4);
    EXPECT_NEAR(d2, 2 * d1, 1e-9 + 1e-6 * d1) << side;
    // The speed matches the spline's just inside the keys.
    const double inside = AngleBetween(at, s.Eval(end - dir * 1e-4)) / 1e-4;
    EXPECT_NEAR(d1 / 0.1, inside, 0.01 * inside + 1e-6) << side;
  }
}

TEST(QuatSpline, DegenerateTimesAndFarTimesStayDefined) {
  // Keys at one time make no span; far or NaN times make no period count. Evaluation must still
  // return (not loop or trap), and far periods of a proper spline stay unit rotations.
  const ZvQuatKey same[3] = {ZvQuatKey(1.0, ZvPoint3<double>{0.1, 0, 0}, 0.f, 0.f, 0.f, 0),
                             ZvQuatKey(1.0, ZvPoint3<double>{0.2, 0, 0}, 0.f, 0.f, 0.f, 0),
                             ZvQuatKey(1.0, ZvPoint3<double>{0.3, 0, 0}, 0.f, 0.f, 0.f, 0)};
  const ZvQuatKey two[2] = {ZvQuatKey(0.0, ZvPoint3<double>{0.1, 0.2, 0}, 0.f, 0.f, 0.f, 0),
                            ZvQuatKey(1.0, ZvPoint3<double>{0.5, 0, 0.3}, 0.f, 0.f, 0.f, 0)};
  for (unsigned int method = 1; method <= 4; ++method) {
    const ZvQuatSpline flat(3, same, method);
    for (double t : {0.0, 1.0, 2.0, std::nan("")})
      flat.Eval(t);
    const ZvQuatSpline s(2, two, method);
    for (double t : {1e300, -1e300, 1e17}) {
      const ZvQuat q = s.Eval(t);
      EXPECT_TRUE(std::isfinite(Dot(q, q))) << method << " " << t;
      // The linear method's angle that far out is lost to rounding; the others fold or count
      // periods and keep a rotation.
      if (method != 2) {
        EXPECT_NEAR(Dot(q, q), 1.0, 1e-6) << method << " " << t;
      }
    }
  }
  EXPECT_EQ(ZvQuatSpline(1, two, 1).GetNumSegments(), 0u);
  EXPECT_EQ(ZvQuatSpline(1, two, 1).Eval(0.5).w, 1.0);
}

TEST(QuatSpline, IncomingTangentFollowsTheFirstKeysContinuity) {
  // The incoming tangent at a segment's second key weighs the rotation after it with the
  // continuity of the segment's first key. Changing only that continuity must move it.
  std::vector<ZvQuatKey> keys{ZvQuatKey(0.0, ZvPoint3<double>{0.0, 0.1, 0.0}, 0.f, 0.f, 0.f, 0),
                              ZvQuatKey(1.0, ZvPoint3<double>{0.6, 0.2, 0.1}, 0.f, 0.f, 0.f, 0),
                              ZvQuatKey(2.0, ZvPoint3<double>{0.9, -0.3, 0.7}, 0.f, 0.f, 0.f, 0)};
  const ZvQuatSpline before(3, keys.data(), 1);
  keys[0].continuity = 0.5f;
  const ZvQuatSpline after(3, keys.data(), 1);
  const ZvQuat& b0 = before.GetSegment(0).b;
  const ZvQuat& b1 = after.GetSegment(0).b;
  // With the second key's parameters 0 the incoming tangent is k (L2 + (1 + c) L3), k = 1/2
  // here, and b is a third of it: raising c by 0.5 adds L3 / 12, L3 the log of the step after.
  const ZvQuat q1(keys[1].angles), q2(keys[2].angles);
  const ZvQuat l3 = QuatLog(QuatInverse(q1) * q2);
  EXPECT_NEAR(b1.x - b0.x, l3.x / 12, 1e-12);
  EXPECT_NEAR(b1.y - b0.y, l3.y / 12, 1e-12);
  EXPECT_NEAR(b1.z - b0.z, l3.z / 12, 1e-12);
  EXPECT_GT(LogLength(l3), 0.1);
  // The second segment's own incoming tangent is untouched by the first key.
  const ZvQuat& c0 = before.GetSegment(1).b;
  const ZvQuat& c1 = after.GetSegment(1).b;
  EXPECT_EQ(c0.x, c1.x);
  EXPECT_EQ(c0.y, c1.y);
  EXPECT_EQ(c0.z, c1.z);
}

}  // namespace
