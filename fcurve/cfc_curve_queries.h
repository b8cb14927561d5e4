// The slots of the curve contract that only search the keys or read the curve-wide fields, told
// once for every keyed kind. A kind defines them all with ZV_CFC_KEY_QUERY_SLOTS(Class) in one
// of its sources; the class must hold its implementation object in `m_impl`, and that object
// must offer the store fields, the search layer, KeyRightValue, KeyArrivingValue,
// ValueLeftOfFirstKey and Clamp.
#ifndef ZV_FCURVE_CFC_CURVE_QUERIES_H
#define ZV_FCURVE_CFC_CURVE_QUERIES_H

#include <zv/fcurve.h>

#include "fcurve/cfc_key_search.h"
#include "fcurve/fcurve_lock.h"

#include <cmath>

struct CFCQueries {
  template <class Impl>
  static unsigned int GetKeyParameters(const Impl& s, double start, double end,
                                       ZvDoubleArray& parameters, int excludeStart,
                                       int excludeEnd) {
    if (zvIsSameParameter(start, end) && (excludeStart != 0) != (excludeEnd != 0)) {
      excludeStart = excludeEnd = 0;
    }
    unsigned int first, last;
    if (!s.GetKeyIndicesInInterval(start, end, first, last, excludeStart, excludeEnd)) return 0;
    for (unsigned int i = first; i <= last; ++i)
      parameters.Add(s.keys[i].parameter);
    return last - first + 1;
  }

  template <class Impl>
  static unsigned int GetAllKeyParameters(const Impl& s, ZvDoubleArray& parameters) {
    for (unsigned int i = 0; i < s.keys.size; ++i)
      parameters.Add(s.keys[i].parameter);
    return s.keys.size;
  }

  template <class Impl>
  static unsigned int GetNextKeyParameter(const Impl& s, double parameter, double& next,
                                          int inclusive) {
    // A NaN lies next to no key.
    if (s.keys.size == 0 || std::isnan(parameter)) return 0;
    int found;
    unsigned int at = s.LocateParameter(parameter, found);
    if (found && inclusive) --at;
    if (at >= s.keys.size) return 0;
    next = s.keys[at].parameter;
    return 1;
  }

  template <class Impl>
  static unsigned int GetPrevKeyParameter(const Impl& s, double parameter, double& prev,
                                          int inclusive) {
    if (s.keys.size == 0 || std::isnan(parameter)) return 0;
    int found;
    unsigned int at = s.LocateParameter(parameter, found);
    if (found && !inclusive) --at;
    if (at == 0) return 0;
    prev = s.keys[at - 1].parameter;
    return 1;
  }

  template <class Impl>
  static unsigned int GetNearestKeyParameter(const Impl& s, double parameter, double& nearest) {
    const unsigned int n = s.keys.size;
    if (n == 0 || std::isnan(parameter)) return 0;
    int found;
    const unsigned int at = s.LocateParameter(parameter, found);
    unsigned int i;
    if (found) {
      i = at - 1;
    } else if (at == 0) {
      i = 0;
    } else if (at >= n) {
      i = n - 1;
    } else {
      // Of two equally near keys, the later.
      i = s.keys[at].parameter - parameter <= parameter - s.keys[at - 1].parameter ? at : at - 1;
    }
    nearest = s.keys[i].parameter;
    return 1;
  }

  template <class Impl>
  static unsigned int KeyParameterAt(const Impl& s, double& parameter, double tolerance) {
    unsigned int i;
    if (!s.GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) return 0;
    parameter = s.keys[i].parameter;
    return 1;
  }

  template <class Impl>
  static unsigned int EndKeyParameter(const Impl& s, bool last, double& parameter) {
    const unsigned int n = s.keys.size;
    if (n == 0) return 0;
    parameter = s.keys[last ? n - 1 : 0].parameter;
    return 1;
  }

  template <class Impl>
  static unsigned int IsEndKeyParameter(const Impl& s, bool last, double parameter) {
    const unsigned int n = s.keys.size;
    return n && zvIsSameParameter(parameter, s.keys[last ? n - 1 : 0].parameter);
  }

  template <class Impl>
  static unsigned int GetKeys(const Impl& s, ZvDoubleArray& parameters, ZvDoubleArray& leftValues,
                              ZvDoubleArray& rightValues, int clamped) {
    for (unsigned int i = 0; i < s.keys.size; ++i) {
      const double l = s.KeyArrivingValue(i), r = s.KeyRightValue(i);
      parameters.Add(s.keys[i].parameter);
      leftValues.Add(clamped ? s.Clamp(l) : l);
      rightValues.Add(clamped ? s.Clamp(r) : r);
    }
    return s.keys.size;
  }

  // 1 if the flag changed; 0 if not, or on a read-only curve.
  template <class Impl>
  static unsigned int SetAsTimeFCurve(Impl& s, int on) {
    const unsigned int flag = on ? 1 : 0;
    if (s.readOnly || s.timeCurve == flag) return 0;
    s.timeCurve = flag;
    return 1;
  }
};

// Defines the query slots of a keyed curve class; each takes the curve's lock, since the search
// behind it moves the hint.
#define ZV_CFC_KEY_QUERY_SLOTS(Class)                                                            \
  unsigned int Class::GetKeyParameter(unsigned int index, double& parameter) const {             \
    ZvFCurveLockGuard guard(*this);                                                              \
    if (index >= m_impl->keys.size) return 0;                                                    \
    parameter = m_impl->keys[index].parameter;                                                   \
    return 1;                                                                                    \
  }                                                                                              \
  unsigned int Class::GetKeyIndex(double parameter, unsigned int& index) const {                 \
    ZvFCurveLockGuard guard(*this);                                                              \
    return m_impl->GetClosestKeyIndexInCenteredInterval(parameter, 0.0, index);                  \
  }                                                                                              \
  unsigned int Class::GetNumKeys() const {                                                       \
    ZvFCurveLockGuard guard(*this);                                                              \
    return m_impl->keys.size;                                                                    \
  }                                                                                              \
  unsigned int Class::GetKeyParameters(double start, double end, ZvDoubleArray& parameters,      \
                                       int excludeStart, int excludeEnd) const {                 \
    ZvFCurveLockGuard guard(*this);                                                              \
    return CFCQueries::GetKeyParameters(*m_impl, start, end, parameters, excludeStart,           \
                                        excludeEnd);                                             \
  }                                                                                              \
  unsigned int Class::IsKeyParameter(double parameter, double tolerance) const {                 \
    ZvFCurveLockGuard guard(*this);                                                              \
    unsigned int i;                                                                              \
    return m_impl->GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i);                \
  }                                                                                              \
  unsigned int Class::GetAllKeyParameters(ZvDoubleArray& parameters) const {                     \
    ZvFCurveLockGuard guard(*this);                                                              \
    return CFCQueries::GetAllKeyParameters(*m_impl, parameters);                                 \
  }                                                                                              \
  unsigned int Class::GetNextKeyParameter(double parameter, double& next, int inclusive) const { \
    ZvFCurveLockGuard guard(*this);                                                              \
    return CFCQueries::GetNextKeyParameter(*m_impl, parameter, next, inclusive);                 \
  }                                                                                              \
  unsigned int Class::GetPrevKeyParameter(double parameter, double& prev, int inclusive) const { \
    ZvFCurveLockGuard guard(*this);                                                              \
    return CFCQueries::GetPrevKeyParameter(*m_impl, parameter, prev, inclusive);                 \
  }                                                                                              \
  unsigned int Class::GetNearestKeyParameter(double parameter, double& nearest) const {          \
    ZvFCurveLockGuard guard(*this);                                                              \
    return CFCQueries::GetNearestKeyParameter(*m_impl, parameter, nearest);                      \
  }                                                                                              \
  unsigned int Class::GetNearestKeyParameterInCenteredInterval(double& parameter,                \
                                                               double tolerance) const {         \
    ZvFCurveLockGuard guard(*this);                                                              \
    return CFCQueries::KeyParameterAt(*m_impl, parameter, tolerance);                            \
  }                                                                                              \
  unsigned int Class::GetSmallestKeyParameter(double& parameter) const {                         \
    ZvFCurveLockGuard guard(*this);                                                              \
    return CFCQueries::EndKeyParameter(*m_impl, false, parameter);                               \
  }                                                                                              \
  unsigned int Class::IsSmallestKeyParameter(double parameter) const {                           \
    ZvFCurveLockGuard guard(*this);                                                              \
    return CFCQueries::IsEndKeyParameter(*m_impl, false, parameter);                             \
  }                                                                                              \
  unsigned int Class::GetLargestKeyParameter(double& parameter) const {                          \
    ZvFCurveLockGuard guard(*this);                                                              \
    return CFCQueries::EndKeyParameter(*m_impl, true, parameter);                                \
  }                                                                                              \
  unsigned int Class::IsLargestKeyParameter(double parameter) const {                            \
    ZvFCurveLockGuard guard(*this);                                                              \
    return CFCQueries::IsEndKeyParameter(*m_impl, true, parameter);                              \
  }                                                                                              \
  double Class::GetMinusInfinityVal() const {                                                    \
    ZvFCurveLockGuard guard(*this);                                                              \
    return m_impl->keys.size ? static_cast<double>(m_impl->ValueLeftOfFirstKey())                \
                             : static_cast<double>(m_impl->valueWhenNoKeys);                     \
  }                                                                                              \
  double Class::GetPlusInfinityVal() const {                                                     \
    ZvFCurveLockGuard guard(*this);                                                              \
    const unsigned int n = m_impl->keys.size;                                                    \
    return n ? m_impl->KeyRightValue(n - 1) : static_cast<double>(m_impl->valueWhenNoKeys);      \
  }                                                                                              \
  unsigned int Class::GetKeys(ZvDoubleArray& parameters, ZvDoubleArray& leftValues,              \
                              ZvDoubleArray& rightValues, int clamped) const {                   \
    ZvFCurveLockGuard guard(*this);                                                              \
    return CFCQueries::GetKeys(*m_impl, parameters, leftValues, rightValues, clamped);           \
  }                                                                                              \
  unsigned int Class::SetReadOnlyConstraint(int on) {                                            \
    ZvFCurveLockGuard guard(*this);                                                              \
    m_impl->readOnly = on ? 1 : 0;                                                               \
    return 1;                                                                                    \
  }                                                                                              \
  unsigned int Class::IsReadOnly() const {                                                       \
    ZvFCurveLockGuard guard(*this);                                                              \
    return m_impl->readOnly;                                                                     \
  }                                                                                              \
  ZvBaseFCurve::ExtrapolationMethod Class::GetExtrapolationMethod() const {                      \
    ZvFCurveLockGuard guard(*this);                                                              \
    return static_cast<ExtrapolationMethod>(m_impl->extrapolation);                              \
  }                                                                                              \
  double Class::FoldParameter(double parameter) const {                                          \
    ZvFCurveLockGuard guard(*this);                                                              \
    m_impl->FoldParameter(parameter);                                                            \
    return parameter;                                                                            \
  }                                                                                              \
  unsigned int Class::IsDefautlBezierTangentConstraintOn() const {                               \
    ZvFCurveLockGuard guard(*this);                                                              \
    return m_impl->defaultBezierTangentConstraint;                                               \
  }                                                                                              \
  unsigned int Class::SetAsTimeFCurve(int on) {                                                  \
    ZvFCurveLockGuard guard(*this);                                                              \
    return CFCQueries::SetAsTimeFCurve(*m_impl, on);                                             \
  }                                                                                              \
  unsigned int Class::IsTimeFCurve() const {                                                     \
    ZvFCurveLockGuard guard(*this);                                                              \
    return m_impl->timeCurve;                                                                    \
  }

#endif
