// Stretching a box of keys: which keys move, the scales the rules allow, and the layouts.
#include <zv/fcurve_stretcher.h>

#include "fcurve/cfc_keys.h"
#include "fcurve/fcurve_lock.h"
#include "fcurve/stretcher_impl.h"

#include <algorithm>
#include <cmath>
#include <utility>

namespace {

// A parameter within this of a selected one selects its key: selections come from screen picks
// and values handed round by the host, not from the store itself.
constexpr double kSelected = 1e-7;
// Moved keys keep apart from one another by at least this (or what they started with): the
// store takes keys within 1e-15 for one.
constexpr double kApart = 1e-9;
// The smallest size a stretch starts from, and the smallest scale a caller may ask to keep.
constexpr double kSmallest = 0.001;

double Clamp(double s, double lo, double hi) {
  return std::min(std::max(s, lo), hi);
}

}  // namespace

ZvFCurveStretcherImpl::ZvFCurveStretcherImpl(ZvBaseFCurve& curve, const ZvExtent2<double>& box,
                                             const ZvDoubleArray& selectedParameters,
                                             const ZvExtent2<double>& bounds,
                                             const ZvPoint2<double>& pivot,
                                             ZvBaseFCurve::RegionHandle handle, int ripple,
                                             double minimumScale)
    : CFCKeyDrag(curve),
      m_box(box),
      m_bounds(bounds),
      m_pivot(pivot),
      m_handle(handle),
      m_kind(curve.GetKind()),
      m_ripple(ripple != 0),
      m_minimumScale(minimumScale),
      // Values are often small numbers (a scale factor, an opacity); a thousandth would be coarse.
      m_margin(handle == ZvBaseFCurve::TopHandle || handle == ZvBaseFCurve::BottomHandle ? 1e-6
                                                                                         : 0.001) {
  using C = ZvBaseFCurve;
  if (handle != C::LeftHandle && handle != C::RightHandle && handle != C::TopHandle &&
      handle != C::BottomHandle) {
    return;
  }
  if (m_kind == 0 || !(minimumScale >= kSmallest) || box.kind != ZvExtent2<double>::Regular ||
      !std::isfinite(pivot.x) || !std::isfinite(pivot.y)) {
    return;
  }
  // A boolean key has no values between its two to scale through.
  if (!InParameter() && m_kind == C::BooleanKind) return;
  const double size = InParameter() ? box.xmax - box.xmin : box.ymax - box.ymin;
  if (!(size >= kSmallest)) return;
  m_reciprocal = 1.0 / size;
  switch (handle) {
    case C::RightHandle:
      m_range = box.xmax - pivot.x;
      m_offEdge = std::fabs(pivot.x - box.xmin) > 1e-7;
      break;
    case C::LeftHandle:
      m_range = pivot.x - box.xmin;
      m_offEdge = std::fabs(pivot.x - box.xmax) > 1e-7;
      break;
    case C::TopHandle:
      m_range = box.ymax - pivot.y;
      m_offEdge = std::fabs(pivot.y - box.ymin) > 1e-7;
      break;
    default:
      m_range = pivot.y - box.ymin;
      m_offEdge = std::fabs(pivot.y - box.ymax) > 1e-7;
      break;
  }
  // A side dragged from the pivot itself, or from beyond it, gives no scale.
  if (!(m_range > m_margin) || !std::isfinite(m_range)) return;
  ZvFCurveLockGuard guard(m_curve);
  if (m_curve.GetNumKeys() == 0 || !Gather(selectedParameters)) return;
  FindScaleRanges();
  SaveUserData();
  m_active = true;
}

bool ZvFCurveStretcherImpl::Gather(const ZvDoubleArray& selectedParameters) {
  ZvDoubleArray all;
  m_curve.GetAllKeyParameters(all);
  std::vector<double> keys(all.data, all.data + all.size);
  std::vector<char> selected(keys.size(), 0);
  bool any = false;
  for (unsigned int i = 0; i < selectedParameters.size; ++i) {
    const double t = selectedParameters[i];
    const auto at = std::lower_bound(keys.begin(), keys.end(), t - kSelected);
    if (at == keys.end() || *at > t + kSelected) continue;
    selected[at - keys.begin()] = 1;
    any = true;
  }
  if (!any) return false;
  return InParameter() ? GatherParameters(keys, selected) : GatherValues(keys, selected);
}

// Selected keys in the box scale; with ripple on, every key beyond a side that moves follows
// that side, selected or not, so that what comes after the box keeps its timing. Keys whose
// parameter is locked stay, and limit the others like any key that stays.
bool ZvFCurveStretcherImpl::GatherParameters(const std::vector<double>& keys,
                                             const std::vector<char>& selected) {
  const bool rightMoves = m_handle == ZvBaseFCurve::RightHandle || m_offEdge,
             leftMoves = m_handle == ZvBaseFCurve::LeftHandle || m_offEdge;
  ZvDoubleArray candidates;
  std::vector<char> candidateSelected;
  for (std::size_t i = 0; i < keys.size(); ++i) {
    const bool carried =
        m_ripple && ((rightMoves && keys[i] > m_box.xmax) || (leftMoves && keys[i] < m_box.xmin));
    if (!selected[i] && !carried) continue;
    candidates.Add(keys[i]);
    candidateSelected.push_back(selected[i]);
  }
  if (!CaptureKeys(candidates)) return false;
  ZvDoubleArray moving;
  bool allSelectedLocked = true;
  const auto inY = [&](double v) { return m_box.ymin <= v && v <= m_box.ymax; };
  for (unsigned int k = 0; k < candidates.size; ++k) {
    const bool locked = m_keys->StartFlags(k) & CFCFlag_ParameterLock;
    if (candidateSelected[k] && !locked) allSelectedLocked = false;
    if (locked) continue;
    const double t = m_keys->StartParameter(k), left = m_keys->StartLeftValue(k),
                 right = m_keys->StartValue(k);
    const bool inBox = m_box.xmin <= t && t <= m_box.xmax && (inY(left) || inY(right));
    Moved m{{t, 0}, {left, 0}, {right, 0}, false, false, false};
    if (candidateSelected[k] && inBox) {
      m.parameter.slope = t - m_pivot.x;
      m.scaled = true;
    } else if (m_ripple && rightMoves && t > m_box.xmax) {
      m.parameter.slope = m_box.xmax - m_pivot.x;
    } else if (m_ripple && leftMoves && t < m_box.xmin) {
      m.parameter.slope = m_box.xmin - m_pivot.x;
    } else {
      continue;
    }
    m_moved.push_back(m);
    moving.Add(t);
  }
  if (allSelectedLocked || moving.size == 0) return false;
  m_mirrorable =
      std::all_of(m_moved.begin(), m_moved.end(), [](const Moved& m) { return m.scaled; });
  return CaptureKeys(moving);
}

ZvFCurveStretcherImpl::Follow ZvFCurveStretcherImpl::Carried(double v, double low, double high,
                                                             double pivot) const {
  if (m_ripple && v > high && (m_handle == ZvBaseFCurve::TopHandle || m_offEdge))
    return {v, high - pivot};
  if (m_ripple && v < low && (m_handle == ZvBaseFCurve::BottomHandle || m_offEdge))
    return {v, low - pivot};
  return {v, 0};
}

// Only selected keys change value; a side of a key whose value lies in the box scales, the
// other side goes with a rippled side of the box or stays.
bool ZvFCurveStretcherImpl::GatherValues(const std::vector<double>& keys,
                                         const std::vector<char>& selected) {
  ZvDoubleArray candidates;
  for (std::size_t i = 0; i < keys.size(); ++i)
    if (selected[i]) candidates.Add(keys[i]);
  if (!CaptureKeys(candidates)) return false;
  ZvDoubleArray moving;
  const double low = m_box.ymin, high = m_box.ymax, pivot = m_pivot.y;
  for (unsigned int k = 0; k < candidates.size; ++k) {
    if (m_keys->StartFlags(k) & CFCFlag_ValueLock) continue;
    const double t = m_keys->StartParameter(k), left = m_keys->StartLeftValue(k),
                 right = m_keys->StartValue(k);
    const bool inX = m_box.xmin <= t && t <= m_box.xmax;
    Moved m{{t, 0}, Carried(left, low, high, pivot), Carried(right, low, high, pivot), false, false,
            false};
    if (inX && low <= left && left <= high) m.left = {left, left - pivot}, m.leftScaled = true;
    if (inX && low <= right && right <= high)
      m.right = {right, right - pivot}, m.rightScaled = true;
    if (m.left.slope == 0 && m.right.slope == 0) continue;
    m_moved.push_back(m);
    moving.Add(t);
  }
  return moving.size != 0 && CaptureKeys(moving);
}

ZvFCurveStretcherImpl::Range ZvFCurveStretcherImpl::Solve(const std::vector<Bound>& bounds,
                                                          double lo, double hi) {
  for (const Bound& b : bounds) {
    if (b.b > 0)
      lo = std::max(lo, (b.c - b.a) / b.b);
    else if (b.b < 0)
      hi = std::min(hi, (b.c - b.a) / b.b);
    else if (b.a < b.c)
      return {1, 0};
  }
  return {lo, hi};
}

void ZvFCurveStretcherImpl::FindScaleRanges() {
  std::vector<Bound> common, forward, backward;
  // The coordinate f stays at or above `low` less no more than it started above it, and likewise
  // below `high`: a key that started nearer than the margin may stay, not come nearer.
  const auto keepWithin = [&](const Follow& f, double low, double high) {
    if (f.slope == 0) return;
    const double a = f.start - f.slope;
    if (low > -HUGE_VAL) common.push_back({a, f.slope, low + std::min(m_margin, f.start - low)});
    if (high < HUGE_VAL)
      common.push_back({-a, -f.slope, -(high - std::min(m_margin, high - f.start))});
  };
  const bool bounded = m_bounds.kind == ZvExtent2<double>::Regular;
  for (std::size_t i = 0; i < m_moved.size(); ++i) {
    const Moved& m = m_moved[i];
    if (InParameter()) {
      double below = 0, above = 0;
      m_keys->UnmovedAround(m.parameter.start, below, above);
      if (bounded) below = std::max(below, m_bounds.xmin), above = std::min(above, m_bounds.xmax);
      keepWithin(m.parameter, below, above);
      if (i == 0) continue;
      // Moved keys keep their order for positive scales and turn it round for negative ones.
      const Follow& p = m_moved[i - 1].parameter;
      const double gap = m.parameter.start - p.start, slope = m.parameter.slope - p.slope;
      const double apart = std::min(kApart, gap);
      forward.push_back({gap - slope, slope, apart});
      backward.push_back({slope - gap, -slope, apart});
    } else {
      const double low = bounded ? m_bounds.ymin : -HUGE_VAL,
                   high = bounded ? m_bounds.ymax : HUGE_VAL;
      keepWithin(m.left, low, high);
      keepWithin(m.right, low, high);
    }
  }
  std::vector<Bound> positive = common;
  positive.insert(positive.end(), forward.begin(), forward.end());
  m_positive = Solve(positive, 0, HUGE_VAL);
  // Rounding may put the start itself a hair outside; the start is always allowed.
  m_positive.lo = std::min(m_positive.lo, 1.0);
  m_positive.hi = std::max(m_positive.hi, 1.0);
  if (InParameter() && !m_mirrorable) return;
  std::vector<Bound> negative = common;
  negative.insert(negative.end(), backward.begin(), backward.end());
  m_negative = Solve(negative, -HUGE_VAL, 0);
}

int ZvFCurveStretcherImpl::ClampScale(ZvPoint2<double>& translation, double& scale) const {
  using C = ZvBaseFCurve;
  double& amount = InParameter() ? translation.x : translation.y;
  const bool growsWithAmount = m_handle == C::RightHandle || m_handle == C::TopHandle;
  const double wanted = (m_range + (growsWithAmount ? amount : -amount)) / m_range;
  double s = Clamp(wanted, m_positive.lo, m_positive.hi);
  if (m_negative.lo <= m_negative.hi) {
    const double mirrored = Clamp(wanted, m_negative.lo, m_negative.hi);
    if (std::fabs(mirrored - wanted) < std::fabs(s - wanted)) s = mirrored;
  }
  // Near zero the box would collapse: it keeps at least a margin's size, on the side of the
  // pivot the drag is on.
  const double sign = s < 0 && std::fabs(s) > 1e-9 ? -1.0 : 1.0;
  if (std::fabs(s) <= m_margin * m_reciprocal) s = sign * (m_reciprocal + 1.0) * m_margin;
  if (std::fabs(s) < m_minimumScale) s = sign * m_minimumScale;
  if (s < 0 && !m_negative.Holds(s)) {
    const double smallest = std::max((m_reciprocal + 1.0) * m_margin, m_minimumScale);
    s = std::max(m_positive.lo, smallest);
  }
  if (s > 0) s = Clamp(s, m_positive.lo, m_positive.hi);
  scale = s;
  if (s == wanted) return 0;
  amount = (growsWithAmount ? s - 1.0 : 1.0 - s) * m_range;
  return 1;
}

int ZvFCurveStretcherImpl::Update(ZvPoint2<double>& translation, double viewStart, double viewEnd,
                                  ZvDoubleArray& oldParameters, ZvDoubleArray& newParameters,
                                  ZvExtent2<double>& modifiedExtent, ZvExtent2<double>& boxExtent,
                                  int& clamped) {
  if (!m_active || oldParameters.size != 0 || newParameters.size != 0 || !(viewStart <= viewEnd))
    return 0;
  if (!std::isfinite(InParameter() ? translation.x : translation.y)) return 0;
  ZvFCurveLockGuard guard(m_curve);
  if (m_keys->ReadOnly()) return 0;
  ZvPoint2<double> asked = translation;
  double s = 1.0;
  const int cut = ClampScale(asked, s);
  const std::size_t count = m_moved.size();
  std::vector<CFCKeyPlace> places(count);
  for (std::size_t i = 0; i < count; ++i) {
    const Moved& m = m_moved[i];
    const double sx = m.scaled ? s : 1.0;
    double left = m.left.At(s), right = m.right.At(s);
    // A key turned round by a mirror in parameter meets its segments from the other side.
    if (sx < 0) std::swap(left, right);
    const double leftScale = m.leftScaled ? s : 1.0, rightScale = m.rightScaled ? s : 1.0;
    places[i] = CFCKeyPlace{m.parameter.At(s), right, left, sx, leftScale, rightScale};
    // A drag across most of the double range scales past it: refused, nothing moves.
    if (!std::isfinite(places[i].parameter) || !std::isfinite(left) || !std::isfinite(right))
      return 0;
  }
  m_ascending.resize(count);
  for (unsigned int i = 0; i < count; ++i)
    m_ascending[i] = i;
  std::sort(m_ascending.begin(), m_ascending.end(), [&](unsigned int a, unsigned int b) {
    return places[a].parameter < places[b].parameter;
  });
  // Keys a few units in the last place apart can round onto one parameter when they move
  // together: refused like a scale past the double range.
  for (std::size_t i = 1; i < count; ++i) {
    if (!(places[m_ascending[i]].parameter > places[m_ascending[i - 1]].parameter)) return 0;
  }
  translation = asked;
  for (double t : m_currentParameters)
    oldParameters.Add(t);
  CurveEnds ends(m_curve);
  for (std::size_t i = 0; i < count; ++i)
    ends.Note(m_currentParameters[i], places[i].parameter);
  Relayout(places.data(), m_ascending.data(), modifiedExtent);
  ends.Widen(modifiedExtent, viewStart, viewEnd);
  for (double t : m_currentParameters)
    newParameters.Add(t);
  ZvExtent2<double> box = m_box;
  double& lo = InParameter() ? box.xmin : box.ymin;
  double& hi = InParameter() ? box.xmax : box.ymax;
  const double pivot = InParameter() ? m_pivot.x : m_pivot.y;
  const double newLo = lo + (s - 1.0) * (lo - pivot), newHi = hi + (s - 1.0) * (hi - pivot);
  lo = std::min(newLo, newHi);
  hi = std::max(newLo, newHi);
  boxExtent = box;
  clamped = cut;
  return 1;
}

int ZvFCurveStretcherImpl::ComputeScalingFactorAndTranslationVector(ZvPoint2<double>& translation,
                                                                    double& scale) {
  if (!m_active || !std::isfinite(InParameter() ? translation.x : translation.y)) {
    translation = ZvPoint2<double>{0, 0};
    scale = 1.0;
    return 0;
  }
  ZvFCurveLockGuard guard(m_curve);
  return ClampScale(translation, scale);
}

int ZvFCurveStretcherImpl::Finalize() {
  if (!m_active) return 0;
  ZvFCurveLockGuard guard(m_curve);
  DropUserData();
  return 1;
}

ZvFCurveStretcher::ZvFCurveStretcher(ZvBaseFCurve& curve, ZvExtent2<double>& box,
                                     const ZvDoubleArray& selectedParameters,
                                     const ZvExtent2<double>& bounds, const ZvPoint2<double>& pivot,
                                     ZvBaseFCurve::RegionHandle handle, int ripple,
                                     double minimumScale)
    : m_impl(new ZvFCurveStretcherImpl(curve, box, selectedParameters, bounds, pivot, handle,
                                       ripple, minimumScale)) {}

ZvFCurveStretcher::~ZvFCurveStretcher() {
  delete m_impl;
}

int ZvFCurveStretcher::Update(ZvPoint2<double>& translation, double viewStart, double viewEnd,
                              ZvDoubleArray& oldParameters, ZvDoubleArray& newParameters,
                              ZvExtent2<double>& modifiedExtent, ZvExtent2<double>& boxExtent,
                              int& clamped) {
  return m_impl->Update(translation, viewStart, viewEnd, oldParameters, newParameters,
                        modifiedExtent, boxExtent, clamped);
}

int ZvFCurveStretcher::ComputeScalingFactorAndTranslationVector(ZvPoint2<double>& translation,
                                                                double& scale) {
  return m_impl->ComputeScalingFactorAndTranslationVector(translation, scale);
}

int ZvFCurveStretcher::Finalize() {
  return m_impl->Finalize();
}
