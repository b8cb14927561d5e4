// SnapShot: a new standard curve equal to this one over an interval, the extrapolated parts
// made into keys. Under the cycle methods the interval is assembled from whole periods and the
// pieces at its ends.
#include <zv/std_fcurve.h>

#include "fcurve/fcurve_lock.h"
#include "fcurve/std_fcurve_impl.h"

#include <cmath>
#include <memory>
#include <new>

namespace {

// An interval longer than this many periods is refused rather than built key by key.
constexpr double kMaxSnapShotCycles = 1e5;

using Curve = std::unique_ptr<ZvStdFCurve>;

// Moves a snapshot under construction along either axis. Its keys carry the source's locks,
// which guard the source against edits, not the copies against being put in place.
void MoveAlong(ZvStdFCurveImpl& s, ZvBaseFCurve& curve, double dx, double dy) {
  for (unsigned int i = 0; i < s.keys.size; ++i) {
    CFCStdKey& k = s.keys[i];
    k.parameter += dx;
    k.leftTangent.x += dx;
    k.rightTangent.x += dx;
    k.leftValue += dy;
    k.rightValue += dy;
    k.leftTangent.y += dy;
    k.rightTangent.y += dy;
  }
  s.valueWhenNoKeys += dy;
  if (dx != 0.0) curve.TranslateAllKeyUserData(dx);
}

}  // namespace

ZvBaseFCurve* ZvStdFCurve::SnapShot(double start, double end, ExtrapolationMethod method) const {
  if (!std::isfinite(start) || !std::isfinite(end)) return nullptr;
  ZvFCurveLockGuard guard(*this);
  const ZvStdFCurveImpl& s = *m_impl;
  const double lo = start < end ? start : end, hi = start < end ? end : start;
  auto right = [&s](double t) { return s.EvalRightUsingExtrapolationMethod(t); };
  auto left = [&s](double t) { return s.EvalLeftUsingExtrapolationMethod(t); };
  auto section = [this](double a, double b) { return Curve(new ZvStdFCurve(*this, a, b)); };
  const unsigned int n = s.keys.size;
  try {
    Curve out;
    if (n == 0) {
      out = section(lo, hi);
      out->m_impl->readOnly = 0;
      out->CreateNonModifyingKey(lo, 1);
      out->CreateNonModifyingKey(hi, 1);
    } else if (std::fabs(lo - hi) <= 1e-15) {
      const FSKind kind = GetSegmentKindAtParameter(lo);
      out.reset(new ZvStdFCurve(lo, left(lo), right(lo), kind, kind));
    } else if (n > 1 && (s.extrapolation == CycleExtrapolation ||
                         s.extrapolation == CycleWithOffsetExtrapolation)) {
      const double t0 = s.keys[0].parameter, tn = s.keys[n - 1].parameter;
      const double offset = s.extrapolation == CycleWithOffsetExtrapolation
                                ? s.keys[n - 1].rightValue - s.keys[0].leftValue
                                : 0.0;
      double a, b;
      const double fs = s.CycleOffsetFold(lo, a, true), fe = s.CycleOffsetFold(hi, b, false);
      if (!(b - a <= kMaxSnapShotCycles) || !((b - a + 1.0) * n <= kCFCMaxSnapShotKeys)) {
        return nullptr;
      }
      const double shift = lo - fs;
      if (a >= b) {
        // Within one period; deliberately without a value offset, also with the offset method.
        out = section(fs, fe);
        out->m_impl->readOnly = 0;
      } else {
        if (fs < tn) {
          out = section(fs, tn);
          out->m_impl->readOnly = 0;
          MoveAlong(*out->m_impl, *out, 0.0, a * offset);
        }
        if (a + 1 < b) {
          ZvStdFCurve whole(*this);
          whole.m_impl->readOnly = 0;
          MoveAlong(*whole.m_impl, whole, 0.0, (a + 1) * offset);
          // Counted from 0: far from the origin a + 1 can round back to a.
          for (double counted = 1.0; counted < b - a; counted += 1.0) {
            if (out) {
              out->Append(whole);
            } else {
              out.reset(new ZvStdFCurve(whole));
            }
            MoveAlong(*whole.m_impl, whole, 0.0, offset);
          }
        }
        if (fe > t0) {
          Curve last = section(t0, fe);
          last->m_impl->readOnly = 0;
          MoveAlong(*last->m_impl, *last, 0.0, b * offset);
          if (out) {
            out->Append(*last);
          } else {
            out = std::move(last);
          }
        }
      }
      if (!out) return nullptr;
      MoveAlong(*out->m_impl, *out, shift, 0.0);
    } else {
      const double t0 = s.keys[0].parameter, tn = s.keys[n - 1].parameter;
      const unsigned int ext = s.extrapolation;
      // The extrapolation of this curve, made into a segment kind of the snapshot.
      auto extend = [ext](ZvStdFCurve& c, double at) {
        if (ext == ConstantExtrapolation) c.SetSegmentKindAtParameter(at, ConstantSegment);
        if (ext == LinearExtrapolation) c.SetSegmentKindAtParameter(at, LinearSegment);
      };
      const FSKind first = static_cast<FSKind>(s.firstSegmentKind);
      if (lo < t0 && hi > tn) {
        out.reset(new ZvStdFCurve(*this));
        out->m_impl->readOnly = 0;
        out->CreateKey(lo, right(lo));
        out->CreateKey(hi, right(hi));
        extend(*out, lo);
        extend(*out, tn);
      } else if (lo < t0 && hi <= t0) {
        out.reset(new ZvStdFCurve(lo, right(lo), right(lo), first, first));
        extend(*out, lo);
        out->CreateKey(hi, right(hi));
      } else if (lo < t0) {
        out = section(t0, hi);
        out->m_impl->readOnly = 0;
        out->CreateKey(lo, right(lo));
        extend(*out, lo);
      } else if (hi <= tn) {
        out = section(lo, hi);
      } else if (lo >= tn) {
        const FSKind kind = static_cast<FSKind>(s.keys[n - 1].segmentKind);
        out.reset(new ZvStdFCurve(lo, right(lo), right(lo), kind, kind));
        out->CreateKey(hi, right(hi));
        extend(*out, lo);
        extend(*out, hi);
      } else {
        out = section(lo, tn);
        out->m_impl->readOnly = 0;
        extend(*out, tn);
        out->CreateKey(hi, right(hi));
      }
    }
    out->m_impl->readOnly = 0;
    // Periods moved far from the origin can round their keys onto each other: no snapshot then.
    if (!out->m_impl->KeysAreOrdered()) return nullptr;
    out->SetExtrapolationMethod(method);
    return out.release();
  } catch (const std::bad_alloc&) {
    return nullptr;
  }
}
