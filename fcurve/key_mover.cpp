// Dragging keys: the rules of a drag, told once for every curve kind over the records of
// CFCMoverKeys.
#include <zv/fcurve_key_mover.h>

#include "fcurve/cfc_keys.h"
#include "fcurve/fcurve_lock.h"
#include "fcurve/key_mover_impl.h"

#include <algorithm>
#include <cmath>
#include <new>

namespace {

// Moving keys keep this far from the keys they do not move onto: closer, a key would be taken
// for the other when it is looked up by parameter.
constexpr double kCollision = 1e-6;
// Two parameters closer than this are one key.
constexpr double kKeyIdentity = 1e-15;

}  // namespace

ZvFCurveKeyMoverImpl::ZvFCurveKeyMoverImpl(ZvBaseFCurve& curve,
                                           const ZvDoubleArray& selectedParameters,
                                           const ZvExtent2<double>& bounds,
                                           const ZvExtent2<double>& selectionExtent)
    : CFCKeyDrag(curve),
      m_minX(bounds.xmin),
      m_maxX(bounds.xmax),
      m_minY(bounds.ymin),
      m_maxY(bounds.ymax),
      m_bounded(bounds.kind == ZvExtent2<double>::Regular),
      m_kind(curve.GetKind()) {
  if (selectionExtent.kind == ZvExtent2<double>::Regular) {
    m_selectionExtent = selectionExtent;
    m_selectionExtentGiven = true;
  }
  ZvFCurveLockGuard guard(m_curve);
  // A parameter that names no key makes the whole drag inert rather than a drag of part of
  // what the user picked.
  if (!CaptureKeys(selectedParameters)) return;
  m_numKeys = selectedParameters.size;
  m_allKeysSelected = m_numKeys == m_keys->NumKeys();
  m_currentValues.resize(m_numKeys);
  m_state.assign(m_numKeys, Initial);
  m_ascending.resize(m_numKeys);
  const auto extreme = [](unsigned int& at, unsigned int k, double v, double best, bool above) {
    if (at == kNoKey || (above ? v > best : v < best)) at = k;
  };
  for (unsigned int k = 0; k < m_numKeys; ++k) {
    const unsigned short flags = m_keys->StartFlags(k);
    const bool parameterLocked = flags & CFCFlag_ParameterLock,
               valueLocked = flags & CFCFlag_ValueLock;
    if (!parameterLocked || !valueLocked) m_canMove = true;
    if (parameterLocked || valueLocked) m_someLocked = true;
    const double t = m_keys->StartParameter(k), v = m_keys->StartValue(k),
                 left = m_keys->StartLeftValue(k);
    m_currentValues[k] = v;
    m_ascending[k] = k;
    const auto start = [&](unsigned int at) { return m_keys->StartParameter(at); };
    const auto value = [&](unsigned int at) { return m_keys->StartValue(at); };
    const auto leftValue = [&](unsigned int at) { return m_keys->StartLeftValue(at); };
    extreme(m_first, k, t, m_first == kNoKey ? 0 : start(m_first), false);
    extreme(m_last, k, t, m_last == kNoKey ? 0 : start(m_last), true);
    extreme(m_lowest, k, v, m_lowest == kNoKey ? 0 : value(m_lowest), false);
    extreme(m_highest, k, v, m_highest == kNoKey ? 0 : value(m_highest), true);
    extreme(m_lowestLeft, k, left, m_lowestLeft == kNoKey ? 0 : leftValue(m_lowestLeft), false);
    extreme(m_highestLeft, k, left, m_highestLeft == kNoKey ? 0 : leftValue(m_highestLeft), true);
  }
  std::sort(m_ascending.begin(), m_ascending.end(), [&](unsigned int a, unsigned int b) {
    return m_currentParameters[a] < m_currentParameters[b];
  });
  m_byStart = m_ascending;
  if (m_canMove) SaveUserData();
}

void ZvFCurveKeyMoverImpl::ClampTranslationVector(ZvPoint2<double>& translation) const {
  if (!m_bounded || m_numKeys == 0) return;
  const double t0 = m_keys->StartParameter(m_first), t1 = m_keys->StartParameter(m_last);
  if (m_minX > translation.x + t0)
    translation.x = m_minX - t0;
  else if (translation.x + t1 > m_maxX)
    translation.x = m_maxX - t1;
  const auto clampY = [&](double low, double high) {
    if (m_minY > translation.y + low)
      translation.y = m_minY - low;
    else if (translation.y + high > m_maxY)
      translation.y = m_maxY - high;
  };
  clampY(m_keys->StartValue(m_lowest), m_keys->StartValue(m_highest));
  // Bezier keys have a second value at a discontinuity; whichever side is clamped last wins.
  if (m_kind == ZvBaseFCurve::StdKind)
    clampY(m_keys->StartLeftValue(m_lowestLeft), m_keys->StartLeftValue(m_highestLeft));
}

double ZvFCurveKeyMoverImpl::MovedValue(unsigned int k, double dy) const {
  const double v = m_keys->StartValue(k);
  if (m_kind == ZvBaseFCurve::BooleanKind) {
    // A boolean key moves by no fractions: it flips once the drag passes half way.
    if (std::fabs(v - 1.0) <= kKeyIdentity && dy < -0.5) return 0.0;
    if (std::fabs(v) <= kKeyIdentity && dy > 0.5) return 1.0;
    return v;
  }
  if (m_kind == ZvBaseFCurve::IntegerKind) return CFCWholeKeyValue(v + dy);
  return v + dy;
}

// Keys are visited from the front of the drag backwards, so that a key that moves never lands on
// a selected key still to be moved. The first key that would land on an unmoved key stops where
// it was, and so do all keys behind it: the selection does not pass through an unmoved key in
// one step.
void ZvFCurveKeyMoverImpl::DecideStates(const ZvPoint2<double>& translation, double* parameters,
                                        double* values) {
  const bool goingLeft =
      m_currentParameters[m_first] >= m_keys->StartParameter(m_first) + translation.x;
  bool blocked = false;
  for (unsigned int n = 0; n < m_numKeys; ++n) {
    const unsigned int k = m_byStart[goingLeft ? n : m_numKeys - 1 - n];
    const unsigned short flags = m_keys->StartFlags(k);
    unsigned char state = ValueOnly;
    parameters[k] = m_currentParameters[k];
    if (!(flags & CFCFlag_ParameterLock) && !blocked) {
      const double start = m_keys->StartParameter(k), t = start + translation.x;
      // A key's own start is always free, however near its neighbours were to begin with.
      if (t != start && m_keys->UnmovedKeyNear(t, kCollision)) {
        blocked = true;
      } else {
        parameters[k] = t;
        state = Moves;
      }
    }
    if (flags & CFCFlag_ValueLock) {
      state = state == Moves ? ParameterOnly : Held;
      values[k] = m_currentValues[k];
    } else {
      values[k] = MovedValue(k, translation.y);
    }
    m_state[k] = state;
  }
}

// Held keys sit where the last Update left them, and moving keys travel together; where a
// moving key would come too near a held one (a drag turned round while part of the selection
// was held), or rounding brings two moving keys onto one another, the moving ones stay where
// they were. Each round holds at least one more key, and the keys as they were are apart, so
// this ends.
void ZvFCurveKeyMoverImpl::SeparateSelectedKeys(double* parameters) {
  const auto moving = [&](unsigned int k) { return parameters[k] != m_currentParameters[k]; };
  for (bool again = true; again;) {
    again = false;
    std::sort(m_ascending.begin(), m_ascending.end(),
              [&](unsigned int a, unsigned int b) { return parameters[a] < parameters[b]; });
    for (unsigned int n = 1; n < m_numKeys; ++n) {
      const unsigned int a = m_ascending[n - 1], b = m_ascending[n];
      if (!moving(a) && !moving(b)) continue;
      const auto home = [&](unsigned int k) { return parameters[k] == m_keys->StartParameter(k); };
      if (home(a) && home(b)) continue;
      const double gap = parameters[b] - parameters[a];
      if (gap > (moving(a) && moving(b) ? kKeyIdentity : kCollision)) continue;
      for (unsigned int k : {a, b}) {
        if (!moving(k)) continue;
        parameters[k] = m_currentParameters[k];
        m_state[k] = m_state[k] == Moves ? ValueOnly : Held;
      }
      again = true;
    }
  }
}

int ZvFCurveKeyMoverImpl::Update(ZvPoint2<double>& translation, ZvDoubleArray& newParameters,
                                 ZvExtent2<double>& modifiedExtent,
                                 ZvExtent2<double>& selectionExtent, double viewStart,
                                 double viewEnd) {
  if (newParameters.size != 0 || !(viewStart <= viewEnd) || !m_canMove) return 0;
  if (!std::isfinite(translation.x) || !std::isfinite(translation.y)) return 0;
  ZvFCurveLockGuard guard(m_curve);
  if (m_keys->ReadOnly()) return 0;
  ClampTranslationVector(translation);

  std::vector<double> parameters(m_numKeys), values(m_numKeys);
  DecideStates(translation, parameters.data(), values.data());
  SeparateSelectedKeys(parameters.data());

  CurveEnds ends(m_curve);
  bool changed = false;
  for (unsigned int k = 0; k < m_numKeys; ++k) {
    if (parameters[k] == m_currentParameters[k] && values[k] == m_currentValues[k]) continue;
    changed = true;
    ends.Note(m_currentParameters[k], parameters[k]);
  }
  if (changed) {
    std::vector<CFCKeyPlace> places(m_numKeys);
    for (unsigned int k = 0; k < m_numKeys; ++k) {
      // A discontinuity keeps its step.
      const double left = m_keys->StartLeftValue(k) + (values[k] - m_keys->StartValue(k));
      places[k] = CFCKeyPlace{parameters[k], values[k], left, 1.0, 1.0, 1.0};
    }
    Relayout(places.data(), m_ascending.data(), modifiedExtent);
    m_currentValues = values;
    ends.Widen(modifiedExtent, viewStart, viewEnd);
  }
  for (double t : m_currentParameters)
    newParameters.Add(t);
  if (m_selectionExtentGiven) {
    ZvExtent2<double> box = m_selectionExtent;
    box.xmin += translation.x;
    box.xmax += translation.x;
    box.ymin += translation.y;
    box.ymax += translation.y;
    for (unsigned int k = 0; k < m_numKeys; ++k)
      box.AddPoint(ZvPoint2<double>{m_currentParameters[k], m_currentValues[k]});
    selectionExtent = box;
  }
  return changed ? 1 : 0;
}

int ZvFCurveKeyMoverImpl::Finalize() {
  if (!m_canMove) return 0;
  ZvFCurveLockGuard guard(m_curve);
  DropUserData();
  return 1;
}

ZvFCurveKeyMover::ZvFCurveKeyMover(ZvBaseFCurve& curve, const ZvDoubleArray& selectedParameters,
                                   const ZvExtent2<double>& bounds,
                                   const ZvExtent2<double>& selectionExtent)
    : m_impl(new ZvFCurveKeyMoverImpl(curve, selectedParameters, bounds, selectionExtent)) {}

ZvFCurveKeyMover::~ZvFCurveKeyMover() {
  delete m_impl;
}

int ZvFCurveKeyMover::Update(ZvPoint2<double>& translation, ZvDoubleArray& newParameters,
                             ZvExtent2<double>& modifiedExtent, ZvExtent2<double>& selectionExtent,
                             double viewStart, double viewEnd) {
  return m_impl->Update(translation, newParameters, modifiedExtent, selectionExtent, viewStart,
                        viewEnd);
}

int ZvFCurveKeyMover::Finalize() {
  return m_impl->Finalize();
}
