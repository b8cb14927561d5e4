// The keys, locks, settings and reference count of the rotation curve. Every change of keys
// drops the spline; the next evaluation rebuilds it.
#include <zv/quat_fcurve.h>

#include <algorithm>
#include <cfloat>
#include <cmath>

namespace {

constexpr double kDegrees = 57.29577951308232;
constexpr double kRadians = 0.017453292519943295;

double& Component(ZvPoint3<double>& p, unsigned int c) {
  return c == 0 ? p.x : c == 1 ? p.y : p.z;
}
double Component(const ZvPoint3<double>& p, unsigned int c) {
  return c == 0 ? p.x : c == 1 ? p.y : p.z;
}

}  // namespace

ZvQuatCurve::ZvQuatCurve()
    : valueWhenNoKeys{0.0, 0.0, 0.0},
      lastValue{0.0, 0.0, 0.0},
      lastTime(0.0),
      spline(nullptr),
      refCount(0),
      extrapolation(1),
      readOnly(0) {}

ZvQuatCurve::ZvQuatCurve(const ZvQuatCurve& o)
    : valueWhenNoKeys(o.valueWhenNoKeys),
      lastValue(o.lastValue),
      lastTime(o.lastTime),
      keys(o.keys),
      spline(nullptr),
      refCount(0),
      extrapolation(o.extrapolation),
      readOnly(o.readOnly) {}

ZvQuatCurve& ZvQuatCurve::operator=(const ZvQuatCurve& o) {
  if (this == &o) return *this;
  keys = o.keys;
  valueWhenNoKeys = o.valueWhenNoKeys;
  extrapolation = o.extrapolation;
  readOnly = o.readOnly;
  Invalidate();
  return *this;
}

ZvQuatCurve::~ZvQuatCurve() {
  delete spline;
}

void ZvQuatCurve::Ref() {
  ++refCount;
}

void ZvQuatCurve::UnRef() {
  if (--refCount <= 0) delete this;
}

void ZvQuatCurve::Invalidate() {
  delete spline;
  spline = nullptr;
}

unsigned int ZvQuatCurve::GetNumKeys() const {
  return static_cast<unsigned int>(keys.size());
}

int ZvQuatCurve::GetKey(unsigned int index, ZvQuatKey& key) const {
  if (index >= keys.size()) return 0;
  key = keys[index];
  return 1;
}

unsigned int ZvQuatCurve::FindKey(double time, double tolerance) const {
  // A walk in key order, so that it answers the same on times a locked shift left unordered.
  const auto from = std::find_if(keys.begin(), keys.end(),
                                 [&](const ZvQuatKey& k) { return !(k.time < time - tolerance); });
  unsigned int best = NoKey;
  double bestDistance = DBL_MAX;
  for (auto k = from; k != keys.end() && !(k->time > time + tolerance); ++k) {
    const double d = std::fabs(k->time - time);
    if (d > bestDistance) break;
    if (d < bestDistance) {
      bestDistance = d;
      best = static_cast<unsigned int>(k - keys.begin());
    }
  }
  return best;
}

unsigned int ZvQuatCurve::SetKey(const ZvQuatKey& key, double tolerance) {
  Invalidate();
  const unsigned int hit = FindKey(key.time, tolerance);
  if (hit != NoKey) {
    keys[hit] = key;
    return hit;
  }
  const auto at = std::find_if(keys.begin(), keys.end(),
                               [&](const ZvQuatKey& k) { return !(k.time < key.time); });
  const auto index = at - keys.begin();
  keys.insert(at, key);
  return static_cast<unsigned int>(index);
}

unsigned int ZvQuatCurve::SetKey(double time, const ZvPoint3<double>& radians, double tolerance) {
  return SetKey(ZvQuatKey(time, radians, 0.0f, 0.0f, 0.0f, 0), tolerance);
}

unsigned int ZvQuatCurve::SetKey(double time, unsigned int component, double degrees,
                                 double tolerance) {
  ZvPoint3<double> angles = Eval(time);
  Component(angles, component) = degrees * kRadians;
  return SetKey(time, angles, tolerance);
}

int ZvQuatCurve::RemoveKey(double time, double tolerance) {
  return RemoveKeyAt(FindKey(time, tolerance));
}

int ZvQuatCurve::RemoveKeyAt(unsigned int index) {
  if (index >= keys.size()) return 0;
  Invalidate();
  keys.erase(keys.begin() + index);
  return 1;
}

void ZvQuatCurve::RemoveAllKeys() {
  Invalidate();
  keys.clear();
}

int ZvQuatCurve::RemoveKeyRange(unsigned int first, unsigned int last) {
  if (first > last || last >= keys.size()) return 0;
  Invalidate();
  keys.erase(keys.begin() + first, keys.begin() + last + 1);
  return 1;
}

double ZvQuatCurve::GetKeyTime(unsigned int index) const {
  return index < keys.size() ? keys[index].time : 0.0;
}

ZvPoint3<double> ZvQuatCurve::GetKeyValue(unsigned int index) const {
  return index < keys.size() ? keys[index].angles : ZvPoint3<double>{0.0, 0.0, 0.0};
}

double ZvQuatCurve::GetKeyValue(unsigned int index, unsigned int component) const {
  return index < keys.size() ? Component(keys[index].angles, component) * kDegrees : 0.0;
}

int ZvQuatCurve::SetKeyValue(unsigned int index, unsigned int component, double degrees) {
  if (index >= keys.size()) return 0;
  Invalidate();
  Component(keys[index].angles, component) = degrees * kRadians;
  return 1;
}

int ZvQuatCurve::SetParameter(unsigned int index, double time) {
  if (index >= keys.size()) return 0;
  Invalidate();
  keys[index].time = time;
  return 1;
}

unsigned int ZvQuatCurve::GetNextKey(double time, double tolerance) const {
  const auto k = std::find_if(keys.begin(), keys.end(),
                              [&](const ZvQuatKey& q) { return q.time > time + tolerance; });
  return k == keys.end() ? NoKey : static_cast<unsigned int>(k - keys.begin());
}

unsigned int ZvQuatCurve::GetPrevKey(double time, double tolerance) const {
  const auto k = std::find_if(keys.rbegin(), keys.rend(),
                              [&](const ZvQuatKey& q) { return q.time < time - tolerance; });
  return k == keys.rend() ? NoKey : static_cast<unsigned int>(keys.rend() - k - 1);
}

int ZvQuatCurve::Scale(double factor) {
  if (factor < 1e-12) return 0;
  Invalidate();
  for (ZvQuatKey& k : keys)
    if (!k.IsParamLocked()) k.time *= factor;
  return 1;
}

int ZvQuatCurve::Shift(double delta) {
  Invalidate();
  for (ZvQuatKey& k : keys)
    if (!k.IsParamLocked()) k.time += delta;
  return 1;
}

int ZvQuatCurve::IsValid() const {
  for (size_t i = 1; i < keys.size(); ++i)
    if (!(keys[i].time > keys[i - 1].time)) return 0;
  return 1;
}

ZvExtent2<double> ZvQuatCurve::GetKeyExtent(unsigned int index, unsigned int component) const {
  ZvExtent2<double> e;
  if (index >= keys.size()) return e;
  const long n = static_cast<long>(keys.size());
  for (long i = static_cast<long>(index) - 2; i <= static_cast<long>(index) + 2; ++i) {
    const bool present = i >= 0 && i < n;
    const double t = present ? keys[i].time : 0.0;
    double v =
        (present ? Component(keys[i].angles, component) : Component(valueWhenNoKeys, component)) *
        kDegrees;
    v -= 360.0 * std::floor(v / 360.0);
    e.AddPoint(ZvPoint2<double>{t, v});
  }
  return e;
}

int ZvQuatCurve::IsParamLocked(unsigned int index) const {
  return index < keys.size() && keys[index].IsParamLocked() ? 1 : 0;
}

int ZvQuatCurve::SetParamLock(unsigned int index, int on) {
  if (index >= keys.size()) return 0;
  keys[index].SetParamLock(on != 0);
  return 1;
}

int ZvQuatCurve::IsValueLocked(unsigned int index) const {
  return index < keys.size() && keys[index].IsValueLocked() ? 1 : 0;
}

int ZvQuatCurve::SetValueLock(unsigned int index, int on) {
  if (index >= keys.size()) return 0;
  keys[index].SetValueLock(on != 0);
  return 1;
}

int ZvQuatCurve::IsReadOnly() const {
  return readOnly;
}

void ZvQuatCurve::SetReadOnlyConstraint(int on) {
  readOnly = on ? 1 : 0;
}

unsigned int ZvQuatCurve::GetConstraintData(unsigned int index) const {
  if (index >= keys.size()) return 0;
  return (keys[index].IsValueLocked() ? 2u : 0u) | (keys[index].IsParamLocked() ? 4u : 0u);
}

int ZvQuatCurve::SetConstraintData(unsigned int index, unsigned int data) {
  if (index >= keys.size()) return 0;
  keys[index].SetValueLock((data & 2) != 0);
  keys[index].SetParamLock((data & 4) != 0);
  return 1;
}

ZvPoint3<double> ZvQuatCurve::GetValueWhenNoKeys() const {
  return valueWhenNoKeys;
}

double ZvQuatCurve::GetValueWhenNoKeys(unsigned int component) const {
  return Component(valueWhenNoKeys, component) * kDegrees;
}

void ZvQuatCurve::SetValueWhenNoKeys(const ZvPoint3<double>& radians) {
  valueWhenNoKeys = radians;
}

void ZvQuatCurve::SetValueWhenNoKeys(unsigned int component, double degrees) {
  Component(valueWhenNoKeys, component) = degrees * kRadians;
}

unsigned int ZvQuatCurve::GetExtrapolationMethod() const {
  return extrapolation;
}

int ZvQuatCurve::SetExtrapolationMethod(unsigned int method) {
  if (method < 1 || method > 4) return 0;
  extrapolation = method;
  if (spline != nullptr) {
    spline->SetExtrapolation(method);
    // The cached result may lie beyond the keys, where the method decides it.
    lastTime = std::nan("");
  }
  return 1;
}
