// Sampled images of a rotation curve (subdivision between keys, then removal of the 2 pi jumps
// of the Euler form) and what the rotation view builds on them: polylines, snapshots and
// resampling.
#include <zv/bezier_tool.h>
#include <zv/quat_fcurve.h>
#include <zv/transfo4.h>

#include "fcurve/cfc_base_impl.h"
#include "fcurve/fcurve_lock.h"

#include <algorithm>
#include <cfloat>
#include <cmath>
#include <vector>

namespace {

constexpr double kDegrees = 57.29577951308232;

double Angle(const ZvPoint3<double>& p, unsigned int c) {
  return c == 0 ? p.x : c == 1 ? p.y : p.z;
}

void AddSample(double t, const ZvPoint3<double>& v, bool key, ZvDoubleArray& times,
               ZvPoint3dArray& points, ZvBoolArray& isKey, ZvPointTagArray* tags) {
  times.Add(t);
  points.Add(v);
  isKey.Add(key);
  if (tags != nullptr) tags->Add(ZvPointTag_First);
}

// The rotation of `p` as the Euler triple nearest `near`.
ZvPoint3<double> NearestForm(const ZvPoint3<double>& p, const ZvPoint3<double>& near) {
  ZvPoint3<double> r;
  ZvQuat(p).Get(r, near);
  return r;
}

}  // namespace

void ZvQuatFCurveSubdivide(const ZvQuatCurve& curve, double t0, const ZvPoint3<double>& v0,
                           bool key0, double t1, const ZvPoint3<double>& v1, bool key1,
                           const ZvTransfo4& transfo, double tolerance, ZvDoubleArray& times,
                           ZvPoint3dArray& points, ZvBoolArray& isKey, ZvPointTagArray* tags,
                           int depth) {
  if (depth < 6) {
    const double tm = (t0 + t1) * 0.5;
    const ZvPoint3<double> vm = curve.Eval(tm);
    for (unsigned int c = 0; c < 3; ++c) {
      const double y0 = transfo.Map(ZvPoint2<double>{t0, Angle(v0, c) * kDegrees}).y;
      const double ym = transfo.Map(ZvPoint2<double>{tm, Angle(vm, c) * kDegrees}).y;
      const double y1 = transfo.Map(ZvPoint2<double>{t1, Angle(v1, c) * kDegrees}).y;
      if (std::fabs(y0 - ym) > tolerance || std::fabs(ym - y1) > tolerance ||
          std::fabs(y0 - y1) > tolerance) {
        ZvQuatFCurveSubdivide(curve, t0, v0, key0, tm, vm, false, transfo, tolerance, times, points,
                              isKey, tags, depth + 1);
        ZvQuatFCurveSubdivide(curve, tm, vm, false, t1, v1, key1, transfo, tolerance, times, points,
                              isKey, tags, depth + 1);
        return;
      }
    }
  }
  if (times.size == 0) AddSample(t0, v0, key0, times, points, isKey, tags);
  AddSample(t1, v1, key1, times, points, isKey, tags);
}

void ZvQuatFCurveMakeContinuous(const ZvDoubleArray&, ZvPoint3dArray& points,
                                const ZvBoolArray& isKey) {
  const unsigned int n = points.size;
  if (n == 0) return;
  unsigned int firstKey = n, lastKey = 0;
  for (unsigned int i = 0; i < n; ++i) {
    if (!isKey[i]) continue;
    if (firstKey == n) firstKey = i;
    lastKey = i;
  }
  if (firstKey == n) firstKey = lastKey = 0;
  for (unsigned int i = firstKey; i-- > 0;)
    points[i] = NearestForm(points[i], points[i + 1]);
  for (unsigned int i = firstKey + 1; i < n; ++i) {
    if (i <= lastKey && isKey[i]) continue;
    points[i] = NearestForm(points[i], points[i - 1]);
  }
}

void ZvQuatCurveFlatten(const ZvQuatCurve& curve, double start, double end,
                        const ZvTransfo4& transfo, double tolerance, ZvDoubleArray& times,
                        ZvPoint3dArray& points, ZvBoolArray& isKey, ZvPointTagArray* tags) {
  const unsigned int n = curve.GetNumKeys();
  if (n < 2) {
    const ZvPoint3<double> v = n ? curve.GetKeyValue(0) : curve.GetValueWhenNoKeys();
    AddSample(start, v, n != 0, times, points, isKey, tags);
    AddSample(end, v, n != 0, times, points, isKey, tags);
    return;
  }
  unsigned int first = curve.GetPrevKey(start, 0.0), last = curve.GetNextKey(end, 0.0);
  if (first == ZvQuatCurve::NoKey) first = 0;
  if (last == ZvQuatCurve::NoKey) last = n - 1;
  // The anchors: the keys around the range, and the range's own ends where it reaches past the
  // keys into the extrapolation.
  std::vector<double> at;
  std::vector<bool> keyed;
  if (start < curve.GetKeyTime(first)) {
    at.push_back(start);
    keyed.push_back(false);
  }
  for (unsigned int i = first; i <= last; ++i) {
    at.push_back(curve.GetKeyTime(i));
    keyed.push_back(true);
  }
  if (end > curve.GetKeyTime(last)) {
    at.push_back(end);
    keyed.push_back(false);
  }
  // A reversed or NaN range reaches no key and no end: nothing to sample.
  if (at.empty()) return;
  const unsigned int from = times.size;
  ZvPoint3<double> v0 = curve.Eval(at[0]);
  for (size_t i = 0; i + 1 < at.size(); ++i) {
    const ZvPoint3<double> v1 = curve.Eval(at[i + 1]);
    // Each piece comes with its own start sample, which after the first piece is the joint
    // already added.
    ZvDoubleArray t;
    ZvPoint3dArray p;
    ZvBoolArray k;
    ZvQuatFCurveSubdivide(curve, at[i], v0, keyed[i], at[i + 1], v1, keyed[i + 1], transfo,
                          tolerance, t, p, k, nullptr, 0);
    for (unsigned int j = times.size > from ? 1 : 0; j < t.size; ++j)
      AddSample(t[j], p[j], k[j], times, points, isKey, tags);
    v0 = v1;
  }
  // Only the new samples are made continuous.
  ZvDoubleArray t;
  ZvPoint3dArray p;
  ZvBoolArray k;
  for (unsigned int j = from; j < times.size; ++j) {
    t.Add(times[j]);
    p.Add(points[j]);
    k.Add(isKey[j]);
  }
  ZvQuatFCurveMakeContinuous(t, p, k);
  for (unsigned int j = from; j < times.size; ++j)
    points[j] = p[j - from];
}

double ZvQuatKeyDelta(const ZvQuatCurve& curve, int i) {
  const int n = static_cast<int>(curve.GetNumKeys());
  if (n < 2) return 0.0;
  int m = i % (n - 1);
  if (m < 0) m += n - 1;
  return curve.GetKeyTime(static_cast<unsigned int>(m + 1)) -
         curve.GetKeyTime(static_cast<unsigned int>(m));
}

unsigned int ZvQuatFCurve::FlattenFromTo(const ZvExtent2<double>& box, const ZvTransfo4& transfo,
                                         double tolerance, ZvPoint2dArray& points,
                                         ZvPointTagArray& tags, ZvBoolArray& extrapolated,
                                         int) const {
  ZvFCurveLockGuard hold(*this);
  ZvTransfo4 back;
  if (!transfo.Inverse(back)) return 0;
  // The parameter range the box shows: its corners mapped back.
  double start = DBL_MAX, end = -DBL_MAX;
  const double xs[2] = {box.xmin, box.xmax}, ys[2] = {box.ymin, box.ymax};
  for (double x : xs) {
    for (double y : ys) {
      const double t = back.Map(ZvPoint2<double>{x, y}).x;
      start = std::min(start, t);
      end = std::max(end, t);
    }
  }
  if (!std::isfinite(start) || !std::isfinite(end)) return 0;
  const unsigned int from = points.size;
  if (m_curve->GetNumKeys() == 0) {
    const double v = m_curve->GetValueWhenNoKeys(m_component);
    ZvPoint2<double> a = transfo.Map(ZvPoint2<double>{start, v});
    ZvPoint2<double> b = transfo.Map(ZvPoint2<double>{end, v});
    ClipAndAddLineSegment(a, b, box, points, tags, extrapolated);
  } else {
    ZvDoubleArray times;
    ZvPoint3dArray angles;
    ZvBoolArray isKey;
    ZvQuatCurveFlatten(*m_curve, start, end, transfo, tolerance, times, angles, isKey, nullptr);
    for (unsigned int i = 0; i + 1 < times.size; ++i) {
      ZvPoint2<double> a =
          transfo.Map(ZvPoint2<double>{times[i], Angle(angles[i], m_component) * kDegrees});
      ZvPoint2<double> b =
          transfo.Map(ZvPoint2<double>{times[i + 1], Angle(angles[i + 1], m_component) * kDegrees});
      ClipAndAddLineSegment(a, b, box, points, tags, extrapolated);
    }
  }
  if (points.size > from) tags[tags.size - 1] = ZvPointTag_Last;
  return 1;
}

unsigned int ZvQuatFCurve::Flatten(const ZvTransfo4& transfo, double tolerance,
                                   ZvPoint2dArray& points, ZvPointTagArray& tags,
                                   int clamped) const {
  ZvFCurveLockGuard hold(*this);
  const unsigned int n = m_curve->GetNumKeys();
  if (n == 0) return points.size;
  const double x0 = transfo.Map(ZvPoint2<double>{m_curve->GetKeyTime(0), 0.0}).x;
  const double x1 = transfo.Map(ZvPoint2<double>{m_curve->GetKeyTime(n - 1), 0.0}).x;
  const ZvExtent2<double> box(std::min(x0, x1), -DBL_MAX, std::max(x0, x1), DBL_MAX);
  ZvBoolArray flags;
  return FlattenFromTo(box, transfo, tolerance, points, tags, flags, clamped);
}

ZvBaseFCurve* ZvQuatFCurve::SnapShot(double start, double end, ExtrapolationMethod method) const {
  ZvFCurveLockGuard hold(*this);
  ZvDoubleArray times;
  ZvPoint3dArray angles;
  ZvBoolArray isKey;
  // A hundredth of a degree keeps the copy visually exact at any usual zoom.
  ZvQuatCurveFlatten(*m_curve, start, end, ZvTransfo4(), 0.01, times, angles, isKey, nullptr);
  ZvQuatCurve* copy = new ZvQuatCurve;
  copy->SetValueWhenNoKeys(m_curve->GetValueWhenNoKeys());
  copy->SetExtrapolationMethod(static_cast<unsigned int>(method));
  // The samples come in rising time: each key goes after the last one, so the keys are built
  // in one pass rather than searched and inserted one at a time.
  std::vector<ZvQuatKey>& keys = copy->keys;
  for (unsigned int i = 0; i < times.size; ++i) {
    // Written so that a NaN bound or sample keeps nothing: no key may have a NaN time.
    if (!(times[i] >= start && times[i] <= end) || !std::isfinite(times[i])) continue;
    if (!keys.empty() && !(times[i] - keys.back().time > 1e-6)) continue;
    keys.push_back(ZvQuatKey(times[i], angles[i], 0.0f, 0.0f, 0.0f, 0));
  }
  return new ZvQuatFCurve(copy, m_component);
}

unsigned int ZvQuatFCurve::ResampleSequence(double start, double end, double step,
                                            int keepExistingKeys, int) {
  if (!(step > 0.0) || !std::isfinite(start) || !std::isfinite(end)) return 0;
  ZvFCurveLockGuard hold(*this);
  if (m_curve->IsReadOnly()) return 0;
  // Samples of the rotation across the interval, the existing keys marked among them.
  struct Sample {
    double time;
    ZvPoint3<double> angles;
    bool key;
  };
  std::vector<Sample> samples;
  const double count = std::ceil((end - 1e-6 - start) / step);
  // The cap of every kind, checked before any key is made.
  if (!(count <= kCFCMaxResampledKeys)) return 0;
  for (long i = 0; i < count; ++i) {
    const double t = start + static_cast<double>(i) * step;
    samples.push_back({t, m_curve->Eval(t), false});
  }
  samples.push_back({end, m_curve->Eval(end), false});
  for (const ZvQuatKey& k : m_curve->GetKeys()) {
    const bool inside = k.time >= start && k.time <= end;
    if (!inside || keepExistingKeys) samples.push_back({k.time, k.angles, true});
  }
  std::stable_sort(samples.begin(), samples.end(),
                   [](const Sample& a, const Sample& b) { return a.time < b.time; });
  ZvDoubleArray times;
  ZvPoint3dArray angles;
  ZvBoolArray isKey;
  for (const Sample& s : samples) {
    times.Add(s.time);
    angles.Add(s.angles);
    isKey.Add(s.key);
  }
  ZvQuatFCurveMakeContinuous(times, angles, isKey);
  // The samples are in time order: each becomes a key behind the last one, or replaces the last
  // one when within 1e-6 of it (the only key it can be near), as setting them one by one would.
  std::vector<ZvQuatKey> keys;
  keys.reserve(times.size);
  for (unsigned int i = 0; i < times.size; ++i) {
    const ZvQuatKey key(times[i], angles[i], 0.0f, 0.0f, 0.0f, 0);
    if (!keys.empty() && std::fabs(keys.back().time - key.time) <= 1e-6) {
      keys.back() = key;
    } else {
      keys.push_back(key);
    }
  }
  RemoveAllKeyUserData();
  m_curve->RemoveAllKeys();
  m_curve->keys.swap(keys);
  return 1;
}
