// The records of each keyed store under a drag: one template over the three stores, with the
// few things that differ between key records told by overloads.
#include "fcurve/key_mover_keys.h"

#include <zv/quat_fcurve.h>
#include <zv/raw_fcurve.h>
#include <zv/std_fcurve.h>
#include <zv/step_fcurve.h>

#include "fcurve/cfc_curve_store.h"
#include "fcurve/cfc_single_value_curve.h"
#include "fcurve/raw_fcurve_impl.h"
#include "fcurve/std_fcurve_impl.h"
#include "fcurve/step_fcurve_impl.h"

#include <algorithm>
#include <cmath>
#include <utility>
#include <vector>

namespace {

// A key parameter is the same key within this distance.
constexpr double kKeyIdentity = 1e-15;

// The rotation keys of one component, seen as a store: a record is a whole rotation key, its value
// the component in degrees.
struct QuatStore {
  struct Keys {
    std::vector<ZvQuatKey>* keys;
    unsigned int size;
    ZvQuatKey& operator[](unsigned int i) { return (*keys)[i]; }
    const ZvQuatKey& operator[](unsigned int i) const { return (*keys)[i]; }
  };
  QuatStore(ZvQuatCurve& c, unsigned int comp)
      : keys{&CFCCurveStore::KeysToChange(c), 0}, curve(c), component(comp) {
    keys.size = static_cast<unsigned int>(keys.keys->size());
  }
  unsigned short GetKeyFlags(unsigned int i) const {
    const unsigned short f = keys[i].flags;
    return static_cast<unsigned short>((f & ZvQuatKey::ParamLockFlag ? CFCFlag_ParameterLock : 0) |
                                       (f & ZvQuatKey::ValueLockFlag ? CFCFlag_ValueLock : 0));
  }
  void SetKeyFlags(unsigned int, unsigned short) {}  // the record carries its own
  Keys keys;
  ZvQuatCurve& curve;
  unsigned int component;
};

template <class Impl>
bool IsReadOnly(const Impl& s) {
  return s.readOnly != 0;
}
bool IsReadOnly(const QuatStore& s) {
  return s.curve.IsReadOnly() != 0;
}

// What a store remembers of its keys' places is forgotten once they are laid out anew.
template <class Impl>
void KeysChanged(Impl& s) {
  s.searchHint = 0;
}
void KeysChanged(QuatStore& s) {
  CFCCurveStore::KeysToChange(s.curve);
}

constexpr double kDegrees = 57.29577951308232;

double& Angle(ZvQuatKey& k, unsigned int c) {
  return c == 0 ? k.angles.x : c == 1 ? k.angles.y : k.angles.z;
}

double ParameterOf(const ZvQuatKey& k) {
  return k.time;
}
template <class Key>
double ParameterOf(const Key& k) {
  return k.parameter;
}

double RightValueOf(const CFCSingleValueKey<int>& k) {
  return k.value;
}
double RightValueOf(const CFCSingleValueKey<double>& k) {
  return k.value;
}
double RightValueOf(const CFCStdKey& k) {
  return k.rightValue;
}
double LeftValueOf(const CFCStdKey& k) {
  return k.leftValue;
}
template <class Key>
double LeftValueOf(const Key& k) {
  return RightValueOf(k);
}

template <class Store, class Key>
double ValueOf(const Store&, const Key& k) {
  return RightValueOf(k);
}
double ValueOf(const QuatStore& s, const ZvQuatKey& k) {
  ZvQuatKey copy = k;
  return Angle(copy, s.component) * kDegrees;
}
template <class Store, class Key>
double LeftValueOf(const Store&, const Key& k) {
  return LeftValueOf(k);
}
double LeftValueOf(const QuatStore& s, const ZvQuatKey& k) {
  return ValueOf(s, k);
}

void Place(CFCSingleValueKey<int>& k, double t, double v) {
  k.parameter = t;
  k.value = CFCWholeKeyValue(v);
}
void Place(CFCSingleValueKey<double>& k, double t, double v) {
  k.parameter = t;
  k.value = v;
}
// The handles are absolute positions: they travel with the key, and a discontinuity keeps its
// step.
void Place(CFCStdKey& k, double t, double v) {
  const ZvPoint2<double> d{t - k.parameter, v - k.rightValue};
  k.leftTangent = k.leftTangent + d;
  k.rightTangent = k.rightTangent + d;
  k.parameter = t;
  k.leftValue += d.y;
  k.rightValue = v;
}

template <class Store, class Key>
void PlaceKey(Store&, Key& k, double t, double v) {
  Place(k, t, v);
}
// The angle moves by the change in degrees, so that no move leaves it bit for bit unchanged.
void PlaceKey(QuatStore& s, ZvQuatKey& k, double t, double v) {
  const double dv = v - ValueOf(s, k);
  k.time = t;
  if (dv != 0) Angle(k, s.component) += dv / kDegrees;
}

template <class Store, class Key>
void AddKey(const Store& s, ZvExtent2<double>& e, const Key& k) {
  e.AddPoint(ZvPoint2<double>{ParameterOf(k), LeftValueOf(s, k)});
  e.AddPoint(ZvPoint2<double>{ParameterOf(k), ValueOf(s, k)});
}
// A Bezier segment stays inside the hull of its control points.
template <class Store>
void AddKey(const Store&, ZvExtent2<double>& e, const CFCStdKey& k) {
  e.AddPoint(ZvPoint2<double>{k.parameter, k.leftValue});
  e.AddPoint(ZvPoint2<double>{k.parameter, k.rightValue});
  e.AddPoint(k.leftTangent);
  e.AddPoint(k.rightTangent);
}

// Only Bezier stores have handles, which must keep the segment they reach into a function of
// the parameter whatever its kind, as a kind may change back to cubic later.
template <class Impl>
void FitSegment(Impl&, unsigned int) {}

// Scales a handle so that its reach along the parameter stays within the segment's length,
// which keeps a cubic segment a function of the parameter.
ZvPoint2<double> WithinReach(const ZvPoint2<double>& key, const ZvPoint2<double>& handle,
                             double length) {
  const double reach = std::fabs(handle.x - key.x);
  if (reach <= length) return handle;
  return key + (handle - key) * (length / reach);
}

// The segment from key a to key a + 1, after keys moved at either end.
void FitSegment(ZvStdFCurveImpl& s, unsigned int a) {
  CFCStdKey& k = s.keys[a];
  if (a + 1 >= s.keys.size) return;
  CFCStdKey& next = s.keys[a + 1];
  const ZvPoint2<double> p0{k.parameter, k.rightValue}, p3{next.parameter, next.leftValue};
  if (ZvStdFCurve_IsCubicSegmentValid(p0, k.rightTangent, next.leftTangent, p3)) return;
  const double length = p3.x - p0.x;
  k.rightTangent = WithinReach(p0, k.rightTangent, length);
  next.leftTangent = WithinReach(p3, next.leftTangent, length);
}

template <class Impl>
class MoverKeys final : public CFCMoverKeys {
 public:
  using Key = std::remove_reference_t<decltype(std::declval<Impl&>().keys[0])>;

  // The store is borrowed; for a rotation curve the adapter is owned.
  explicit MoverKeys(std::unique_ptr<Impl> owned) : m_owned(std::move(owned)), m_store(*m_owned) {}

  explicit MoverKeys(Impl& store) : m_store(store) {}

  bool Capture(const ZvDoubleArray& selected) override {
    const unsigned int n = m_store.keys.size;
    std::vector<unsigned int> index(selected.size);
    std::vector<char> taken(n, 0);
    for (unsigned int i = 0; i < selected.size; ++i) {
      const unsigned int at = Find(selected[i]);
      if (at == n || taken[at]) return false;
      taken[at] = 1;
      index[i] = at;
    }
    m_moved.clear();
    m_movedFlags.clear();
    for (unsigned int at : index) {
      m_moved.push_back(m_store.keys[at]);
      m_movedFlags.push_back(m_store.GetKeyFlags(at));
    }
    m_rest.clear();
    m_restFlags.clear();
    m_restParameters.clear();
    for (unsigned int at = 0; at < n; ++at) {
      if (taken[at]) continue;
      m_rest.push_back(m_store.keys[at]);
      m_restFlags.push_back(m_store.GetKeyFlags(at));
      m_restParameters.push_back(ParameterOf(m_store.keys[at]));
    }
    m_now = m_moved;
    return true;
  }

  bool ReadOnly() const override { return IsReadOnly(m_store); }
  unsigned int NumKeys() const override { return m_store.keys.size; }
  double StartParameter(unsigned int i) const override { return ParameterOf(m_moved[i]); }
  double StartValue(unsigned int i) const override { return ValueOf(m_store, m_moved[i]); }
  double StartLeftValue(unsigned int i) const override { return LeftValueOf(m_store, m_moved[i]); }
  unsigned short StartFlags(unsigned int i) const override { return m_movedFlags[i]; }

  bool UnmovedKeyNear(double t, double tolerance) const override {
    const auto it =
        std::lower_bound(m_restParameters.begin(), m_restParameters.end(), t - tolerance);
    return it != m_restParameters.end() && *it <= t + tolerance;
  }

  void Layout(const double* parameters, const double* values, const unsigned int* ascending,
              ZvExtent2<double>& modified) override {
    const unsigned int count = static_cast<unsigned int>(m_moved.size());
    for (unsigned int i = 0; i < count; ++i)
      AddAround(ParameterOf(m_now[i]), modified);
    for (unsigned int i = 0; i < count; ++i) {
      m_now[i] = m_moved[i];
      PlaceKey(m_store, m_now[i], parameters[i], values[i]);
    }
    // One merge of the unmoved records, which never change during the drag, with the moved.
    const unsigned int n = m_store.keys.size;
    unsigned int r = 0, m = 0;
    m_placed.clear();
    for (unsigned int at = 0; at < n; ++at) {
      const bool takeMoved = m < count && (r == m_rest.size() ||
                                           ParameterOf(m_now[ascending[m]]) < m_restParameters[r]);
      if (takeMoved) {
        const unsigned int i = ascending[m++];
        m_store.keys[at] = m_now[i];
        m_store.SetKeyFlags(at, m_movedFlags[i]);
        m_placed.push_back(at);
      } else {
        m_store.keys[at] = m_rest[r];
        m_store.SetKeyFlags(at, m_restFlags[r++]);
      }
    }
    KeysChanged(m_store);
    for (unsigned int at : m_placed) {
      if (at > 0) FitSegment(m_store, at - 1);
      FitSegment(m_store, at);
    }
    for (unsigned int i = 0; i < count; ++i)
      AddAround(ParameterOf(m_now[i]), modified);
  }

 private:
  // The index of the key at t within the identity tolerance, or the number of keys.
  unsigned int Find(double t) const {
    const unsigned int n = m_store.keys.size;
    unsigned int lo = 0, hi = n;
    while (lo < hi) {
      const unsigned int mid = lo + (hi - lo) / 2;
      if (ParameterOf(m_store.keys[mid]) < t - kKeyIdentity)
        lo = mid + 1;
      else
        hi = mid;
    }
    return lo < n && ParameterOf(m_store.keys[lo]) <= t + kKeyIdentity ? lo : n;
  }

  // The key at t in the store as it stands, and its two neighbours, whose segments it shapes.
  void AddAround(double t, ZvExtent2<double>& modified) const {
    const unsigned int at = Find(t), n = m_store.keys.size;
    if (at == n) return;
    AddKey(m_store, modified, m_store.keys[at]);
    if (at > 0) AddKey(m_store, modified, m_store.keys[at - 1]);
    if (at + 1 < n) AddKey(m_store, modified, m_store.keys[at + 1]);
  }

  std::unique_ptr<Impl> m_owned;
  Impl& m_store;
  std::vector<Key> m_moved, m_now, m_rest;
  std::vector<unsigned short> m_movedFlags, m_restFlags;
  std::vector<double> m_restParameters;
  std::vector<unsigned int> m_placed;
};

template <class Impl>
std::unique_ptr<CFCMoverKeys> Keys(Impl& store) {
  return std::make_unique<MoverKeys<Impl>>(store);
}

template <class Curve, class Impl>
std::unique_ptr<CFCMoverKeys> SingleValueKeys(ZvBaseFCurve& curve) {
  Curve* c = dynamic_cast<Curve*>(&curve);
  if (!c) return nullptr;
  return Keys(CFCSingleValueCurve<Curve, Impl>::Of(*c));
}

}  // namespace

std::unique_ptr<CFCMoverKeys> CFCMakeMoverKeys(ZvBaseFCurve& curve) {
  switch (curve.GetKind()) {
    case ZvBaseFCurve::BooleanKind:
      return SingleValueKeys<ZvBooleanFCurve, ZvStepFCurveImpl>(curve);
    case ZvBaseFCurve::IntegerKind:
      return SingleValueKeys<ZvIntegerFCurve, ZvStepFCurveImpl>(curve);
    case ZvBaseFCurve::RawKind:
      return SingleValueKeys<ZvRawFCurve, ZvRawFCurveImpl>(curve);
    case ZvBaseFCurve::StdKind: {
      ZvStdFCurve* c = dynamic_cast<ZvStdFCurve*>(&curve);
      if (!c) return nullptr;
      return Keys(CFCCurveStore::Of(*c));
    }
    case ZvBaseFCurve::QuatKind: {
      ZvQuatFCurve* c = dynamic_cast<ZvQuatFCurve*>(&curve);
      if (c == nullptr) return nullptr;
      return std::make_unique<MoverKeys<QuatStore>>(
          std::make_unique<QuatStore>(*c->GetQuatCurve(), c->GetComponent()));
    }
    default:
      return nullptr;
  }
}
