// Quaternions and the rotation spline.
//
// Angles here are radians. An Euler triple (x, y, z) is the rotation Rz(z) Ry(y) Rx(x): x is
// applied first. Converting back to Euler angles has two solutions away from gimbal lock (y near
// plus or minus pi/2) and a whole family at it; Get picks the solution nearest a seed so that
// angles sampled along a moving rotation stay continuous instead of jumping by 2 pi.
//
// The spline runs through keyed rotations in the logarithm space of the relative rotations,
// with Kochanek-Bartels tension, continuity and bias per key, and optional extra turns (spins)
// between keys. Nothing here has a lock or shared state.
#ifndef ZV_QUAT_H
#define ZV_QUAT_H

#include <zv/api.h>
#include <zv/point.h>

// w + xi + yj + zk. Rotations are unit quaternions; q and -q are the same rotation.
struct ZV_API ZvQuat {
  double w;
  double x;
  double y;
  double z;

  ZvQuat() : w(1.0), x(0.0), y(0.0), z(0.0) {}
  ZvQuat(double w_, double x_, double y_, double z_) : w(w_), x(x_), y(y_), z(z_) {}
  // The rotation of the Euler triple, normalised.
  explicit ZvQuat(const ZvPoint3<double>& radians);

  // Scales to unit length unless already within 1e-12 of it; a quaternion shorter than 1e-12
  // (squared) becomes the identity. w is then clamped to [-1, 1] so that acos(w) is defined.
  void Normalize();
  // Euler angles nearest (0, 0, 0), written into `radians`.
  void Get(ZvPoint3<double>& radians) const;
  // Euler angles nearest `seed`: of the two solutions the one with the smaller sum of angular
  // distances to the seed (the second on a tie), each angle then moved by whole turns to lie
  // within pi of its seed angle. At gimbal lock only x - z (or x + z) is determined; the change
  // from the seed's combination is split evenly between x and z.
  void Get(ZvPoint3<double>& radians, const ZvPoint3<double>& seed) const;

  // Hamilton product (*this) q: q is applied first.
  ZvQuat operator*(const ZvQuat& q) const;
};

// Cumulative Hermite interpolation in log space: q0 exp(a B1(u)) exp(m B2(u)) exp(b B3(u)) with
// B1 = 1 - (1 - u)^3, B2 = 3u^2 - 2u^3, B3 = u^3. a, m and b are pure quaternions (w ignored);
// the result is not normalised. At u = 0 it is q0, at u = 1 the rotation that m was built to
// reach.
ZV_API ZvQuat PreComputedHermite(const ZvQuat& q0, const ZvQuat& a, const ZvQuat& m,
                                 const ZvQuat& b, double u);
// The same from raw tangents: a and b are the outgoing tangent at q0 and the incoming tangent
// at q1 (pure quaternions in log space); `spins` adds that many half-angle turns of pi to the
// middle term, i.e. extra full rotations between q0 and q1 that leave both ends in place.
ZV_API ZvQuat Hermite(const ZvQuat& q0, const ZvQuat& q1, const ZvQuat& a, const ZvQuat& b,
                      double u, int spins);

// A key of a rotation curve. `flags` packs, from bit 0: a signed 14-bit spin count (extra turns
// in the segment after this key), the parameter lock (bit 14) and the value lock (bit 15).
struct ZV_API ZvQuatKey {
  enum Flags : unsigned short {
    SpinsMask = 0x3fff,
    ParamLockFlag = 0x4000,
    ValueLockFlag = 0x8000
  };

  double time;
  ZvPoint3<double> angles;  // Euler angles, radians
  float tension;            // Kochanek-Bartels parameters, usually in [-1, 1]
  float continuity;
  float bias;
  unsigned short flags;

  // All zero: time 0, no rotation, no spins, no locks.
  ZvQuatKey();
  // `spins` is kept modulo 2^14 (masked with 16383); both locks clear.
  ZvQuatKey(double time, const ZvPoint3<double>& angles, float tension, float continuity,
            float bias, int spins);

  // The spin count as a signed value in [-8192, 8191].
  int GetSpins() const;
  void SetSpins(int spins);
  bool IsParamLocked() const { return (flags & ParamLockFlag) != 0; }
  bool IsValueLocked() const { return (flags & ValueLockFlag) != 0; }
  void SetParamLock(bool on);
  void SetValueLock(bool on);

  // Time and angles equal within 1e-9, the floats within 1e-7, the flags exactly.
  bool operator==(const ZvQuatKey& other) const;
  bool operator!=(const ZvQuatKey& other) const { return !(*this == other); }
  // By time only.
  bool operator<(const ZvQuatKey& other) const { return time < other.time; }
};

// The rotation spline through a sequence of keys sorted by time. Tangents and middle terms are
// computed once here, so that an evaluation costs a search and three exponentials.
class ZV_API ZvQuatSpline {
 public:
  // One cubic piece in log space between two neighbouring keys.
  struct ZV_API Segment {
    ZvQuat start;  // rotation at t0
    ZvQuat a;      // a third of the outgoing log tangent; w = 0
    ZvQuat b;      // a third of the incoming log tangent; w = 0
    ZvQuat end;    // rotation at t1 (negated after an odd number of spins)
    ZvQuat m;      // middle log term, spins included; w = 0
    double t0;
    double t1;
    double invSpan;  // 1 / (t1 - t0)

    // The rotation at the segment's own parameter u in [0, 1]; not normalised.
    ZvQuat Eval(double u) const;
  };

  // `extrapolation`: 1 constant, 2 linear (continue the end's angular velocity), 3 repeat,
  // 4 repeat with each period composed onto the rotation reached by the last. Fewer than two
  // keys make a spline without segments, which evaluates to the identity.
  ZvQuatSpline(int numKeys, const ZvQuatKey* keys, unsigned int extrapolation);
  ZvQuatSpline(const ZvQuatSpline& other);
  ZvQuatSpline& operator=(const ZvQuatSpline& other);
  ~ZvQuatSpline();

  // The rotation at t, extrapolated beyond the keys; not normalised.
  ZvQuat Eval(double t) const;
  // The segment that Eval uses for a t inside the keys, and the parameter u in it; t before the
  // first key gives segment 0 and u = 0, after the last the last segment and u = 1. -1 when
  // there is no segment.
  int GetEvalInterval(double t, double& u) const;

  unsigned int GetNumSegments() const { return numSegments; }
  const Segment& GetSegment(unsigned int i) const { return segments[i]; }
  unsigned int GetExtrapolation() const { return extrapolation; }
  void SetExtrapolation(unsigned int method) { extrapolation = method; }

 private:
  unsigned int SegmentAt(double t) const;
  ZvQuat EvalAfterLast(double t) const;
  ZvQuat EvalBeforeFirst(double t) const;

  unsigned int numSegments;
  Segment* segments;
  unsigned int extrapolation;
  // Times strictly increase, so that a bisection finds what a walk from the first segment
  // would; a spline over unordered times walks.
  bool ordered;
};

#endif
