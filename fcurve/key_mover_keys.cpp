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

void Place(CFCSingleValueKey<int>& k, const CFCKeyPlace& at) {
  k.parameter = at.parameter;
  k.value = CFCWholeKeyValue(at.value);
}
void Place(CFCSingleValueKey<double>& k, const CFCKeyPlace& at) {
  k.parameter = at.parameter;
  k.value = at.value;
}
// The handles are absolute positions that keep their offsets from the key. They are moved by the
// key's change and by the change of their offset, so that a key put back where it started, with
// scales of 1, has its handles back bit for bit.
void Place(CFCStdKey& k, const CFCKeyPlace& at) {
  const ZvPoint2<double> left{k.parameter, k.leftValue}, right{k.parameter, k.rightValue};
  const ZvPoint2<double> toLeft = k.leftTangent - left, toRight = k.rightTangent - right;
  const ZvPoint2<double> newLeft{at.parameter, at.leftValue}, newRight{at.parameter, at.value};
  if (at.handleScaleX >= 0) {
    k.leftTangent =
        k.leftTangent + (newLeft - left) +
        ZvPoint2<double>{toLeft.x * (at.handleScaleX - 1), toLeft.y * (at.leftHandleScaleY - 1)};
    k.rightTangent =
        k.rightTangent + (newRight - right) +
        ZvPoint2<double>{toRight.x * (at.handleScaleX - 1), toRight.y * (at.rightHandleScaleY - 1)};
  } else {
    // The key order turned round: what reached the previous key reaches the next one now.
    k.leftTangent =
        newLeft + ZvPoint2<double>{toRight.x * at.handleScaleX, toRight.y * at.rightHandleScaleY};
    k.rightTangent =
        newRight + ZvPoint2<double>{toLeft.x * at.handleScaleX, toLeft.y * at.leftHandleScaleY};
  }
  k.parameter = at.parameter;
  k.leftValue = at.leftValue;
  k.rightValue = at.value;
}

template <class Store, class Key>
void PlaceKey(Store&, Key& k, const CFCKeyPlace& at) {
  Place(k, at);
}
// The angle moves by the change in degrees, so that no move leaves it bit for bit unchanged.
void PlaceKey(QuatStore& s, ZvQuatKey& k, const CFCKeyPlace& at) {
  const double dv = at.value - ValueOf(s, k);
  k.time = at.parameter;
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
    m_at = index;
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

  // Lookups come in the order of a walk over the selection, so each starts where the last ended.
  bool UnmovedKeyNear(double t, double tolerance) const override {
    m_hint = Gallop(m_hint, t - tolerance);
    const std::size_t at = m_hint;
    return at < m_restParameters.size() && m_restParameters[at] <= t + tolerance;
  }

  void UnmovedAround(double t, double& below, double& above) const override {
    const auto it = std::lower_bound(m_restParameters.begin(), m_restParameters.end(), t);
    below = it == m_restParameters.begin() ? -HUGE_VAL : *(it - 1);
    const auto up = std::upper_bound(it, m_restParameters.end(), t);
    above = up == m_restParameters.end() ? HUGE_VAL : *up;
  }

  void Layout(const CFCKeyPlace* places, const unsigned int* ascending,
              ZvExtent2<double>& modified) override {
    const unsigned int count = static_cast<unsigned int>(m_moved.size());
    for (unsigned int i = 0; i < count; ++i)
      AddAround(m_at[i], modified);
    for (unsigned int i = 0; i < count; ++i) {
      m_now[i] = m_moved[i];
      PlaceKey(m_store, m_now[i], places[i]);
    }
    // A moved key's new index is the number of unmoved keys below it plus the moved keys before
    // it. The unmoved keys below are counted by a search that starts where the previous one
    // ended, so the selection is walked once whatever the curve's size.
    m_newAt.resize(count);
    std::size_t from = 0;
    for (unsigned int j = 0; j < count; ++j) {
      const unsigned int i = ascending[j];
      from = Gallop(from, ParameterOf(m_now[i]));
      m_newAt[i] = static_cast<unsigned int>(from) + j;
    }
    Rewrite(ascending);
    m_at.swap(m_newAt);
    KeysChanged(m_store);
    for (unsigned int i = 0; i < count; ++i) {
      if (m_at[i] > 0) FitSegment(m_store, m_at[i] - 1);
      FitSegment(m_store, m_at[i]);
    }
    for (unsigned int i = 0; i < count; ++i)
      AddAround(m_at[i], modified);
  }

 private:
  // The index of the first unmoved parameter at or above t, searched from `from` by steps that
  // double, in whichever direction t lies: the cost grows with the distance from `from`, not with
  // the number of keys.
  std::size_t Gallop(std::size_t from, double t) const {
    const std::vector<double>& p = m_restParameters;
    const std::size_t n = p.size();
    from = std::min(from, n);
    std::size_t lo = from, hi = from, step = 1;
    if (from < n && p[from] < t) {
      while (hi < n && p[hi] < t) {  // p[lo] < t
        lo = hi;
        hi = n - hi > step ? hi + step : n;
        step *= 2;
      }
    } else {
      while (lo > 0 && p[lo - 1] >= t) {  // p[hi] >= t, or hi == n
        hi = lo - 1;
        lo = hi > step ? hi - step : 0;
        step *= 2;
      }
    }
    return static_cast<std::size_t>(std::lower_bound(p.begin() + lo, p.begin() + hi, t) -
                                    p.begin());
  }

  // Writes the store where the layout changes: from each moved key's old index to its new one,
  // widened by one on each side for the neighbours whose handles FitSegment shortened last time.
  // Elsewhere the same numbers of moved keys lie below and above, so the store holds the same
  // record already.
  void Rewrite(const unsigned int* ascending) {
    const unsigned int count = static_cast<unsigned int>(m_moved.size()), n = m_store.keys.size;
    m_spans.clear();
    for (unsigned int i = 0; i < count; ++i) {
      const unsigned int lo = std::min(m_at[i], m_newAt[i]), hi = std::max(m_at[i], m_newAt[i]);
      m_spans.emplace_back(lo > 0 ? lo - 1 : 0, std::min(hi + 1, n - 1));
    }
    std::sort(m_spans.begin(), m_spans.end());
    unsigned int m = 0, done = 0;  // moved keys placed, first index not yet written
    for (const auto& span : m_spans) {
      const unsigned int first = std::max(span.first, done);
      if (first > span.second) continue;
      while (m < count && m_newAt[ascending[m]] < first)
        ++m;
      unsigned int r = first - m;
      for (unsigned int at = first; at <= span.second; ++at) {
        if (m < count && m_newAt[ascending[m]] == at) {
          const unsigned int i = ascending[m++];
          m_store.keys[at] = m_now[i];
          m_store.SetKeyFlags(at, m_movedFlags[i]);
        } else {
          m_store.keys[at] = m_rest[r];
          m_store.SetKeyFlags(at, m_restFlags[r++]);
        }
      }
      done = span.second + 1;
    }
  }

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

  // The key at index `at` of the store as it stands, and its two neighbours, whose segments it
  // shapes.
  void AddAround(unsigned int at, ZvExtent2<double>& modified) const {
    const unsigned int n = m_store.keys.size;
    AddKey(m_store, modified, m_store.keys[at]);
    if (at > 0) AddKey(m_store, modified, m_store.keys[at - 1]);
    if (at + 1 < n) AddKey(m_store, modified, m_store.keys[at + 1]);
  }

  std::unique_ptr<Impl> m_owned;
  Impl& m_store;
  std::vector<Key> m_moved, m_now, m_rest;
  std::vector<unsigned short> m_movedFlags, m_restFlags;
  std::vector<double> m_restParameters;
  std::vector<unsigned int> m_at, m_newAt;  // store index of each moved key, now and next
  mutable std::size_t m_hint = 0;           // where the last lookup of an unmoved key ended
  std::vector<std::pair<unsigned int, unsigned int>> m_spans;
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
