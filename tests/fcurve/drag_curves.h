// Random curves of every kind for the drag tools' tests, and what is compared after a drag.
#ifndef ZV_TESTS_FCURVE_DRAG_CURVES_H
#define ZV_TESTS_FCURVE_DRAG_CURVES_H

#include <zv/quat_fcurve.h>
#include <zv/raw_fcurve.h>
#include <zv/std_fcurve.h>
#include <zv/step_fcurve.h>

#include <gtest/gtest.h>

#include "stdedit_util.h"
#include "uid.h"

#include <cmath>
#include <cstdio>
#include <memory>
#include <random>
#include <string>

namespace dragtest {

using C = ZvBaseFCurve;

inline std::unique_ptr<C> MakeCurve(C::Kind kind, std::mt19937& rng, unsigned int n) {
  std::unique_ptr<C> curve;
  switch (kind) {
    case C::BooleanKind:
      curve = std::make_unique<ZvBooleanFCurve>();
      break;
    case C::IntegerKind:
      curve = std::make_unique<ZvIntegerFCurve>();
      break;
    case C::RawKind:
      curve = std::make_unique<ZvRawFCurve>();
      break;
    case C::QuatKind:
      curve = std::make_unique<ZvQuatFCurve>(1);  // the other two angles ride along
      break;
    default:
      curve = std::make_unique<ZvStdFCurve>();
      break;
  }
  // Keys on a grid of quarters, so that drags by quarters land on unmoved keys often.
  std::uniform_int_distribution<int> gap(1, 4);
  std::uniform_real_distribution<double> value(-3.0, 3.0), unit(0.0, 1.0);
  double t = 0;
  for (unsigned int i = 0; i < n; ++i) {
    t += 0.25 * gap(rng);
    const double v = kind == C::BooleanKind   ? (unit(rng) < 0.5)
                     : kind == C::IntegerKind ? std::round(value(rng))
                                              : value(rng);
    curve->CreateKey(t, v);
  }
  if (auto* quat = dynamic_cast<ZvQuatFCurve*>(curve.get())) {
    ZvQuatCurve& keys = *quat->GetQuatCurve();
    for (unsigned int i = 0; i < keys.GetNumKeys(); ++i) {
      keys.SetKeyValue(i, 0, value(rng) * 30);
      keys.SetKeyValue(i, 2, value(rng) * 30);
    }
  }
  ZvDoubleArray keys;
  curve->GetAllKeyParameters(keys);
  const _zvUID uid = MakeUID(1);
  for (unsigned int i = 0; i < keys.size; ++i) {
    double at = keys[i];
    if (unit(rng) < 0.1) curve->SetConstraint(at, C::ParameterLock, 1, 0.0);
    if (unit(rng) < 0.1) curve->SetConstraint(at, C::ValueLock, 1, 0.0);
    const std::string data = "key " + std::to_string(i);
    if (unit(rng) < 0.3) curve->SetKeyUserData(at, uid, TextBytes(data), Size(data), 0.0);
  }
  if (auto* std = dynamic_cast<ZvStdFCurve*>(curve.get())) {
    for (unsigned int i = 0; i < keys.size; ++i) {
      const ZvPoint2<double> left{-0.4 * unit(rng), value(rng)}, right{0.4 * unit(rng), value(rng)};
      std->SetKeyTgtHandles(keys[i], left, right, 0.0);
      if (unit(rng) < 0.2)
        std->SetSegmentKindAtIndex(i, unit(rng) < 0.5 ? C::LinearSegment : C::ConstantSegment);
    }
  }
  return curve;
}

// Everything a key carries that the contract shows, with its user data.
inline std::string Dump(const C& curve) {
  if (auto* std = dynamic_cast<const ZvStdFCurve*>(&curve)) return stdedit::Dump(*std);
  std::string out;
  char line[256];
  if (auto* quat = dynamic_cast<const ZvQuatFCurve*>(&curve)) {
    for (const ZvQuatKey& k : quat->GetQuatCurve()->GetKeys()) {
      std::snprintf(line, sizeof line, "%.17g %.17g %.17g %.17g %g %g %g %u\n", k.time, k.angles.x,
                    k.angles.y, k.angles.z, k.tension, k.continuity, k.bias, k.flags);
      out += line;
    }
  }
  for (unsigned int i = 0; i < curve.GetNumKeys(); ++i) {
    C::KeyInfo k{};
    k.mask = 511;
    curve.GetKeyInfoFromIndex(i, &k);
    int p = 0, v = 0;
    double at = k.parameter;
    curve.GetConstraint(at, C::ParameterLock, p, 0.0);
    curve.GetConstraint(at, C::ValueLock, v, 0.0);
    std::snprintf(line, sizeof line, "%.17g %.17g %.17g %d%d\n", k.parameter, k.leftValue,
                  k.rightValue, p, v);
    out += line;
  }
  return out;
}

inline std::string UserData(const C& curve) {
  std::string out;
  ZvDoubleArray keys;
  curve.GetAllKeyParameters(keys);
  for (unsigned int i = 0; i < keys.size; ++i) {
    double at = keys[i];
    const unsigned char* data = nullptr;
    unsigned int size = 0;
    if (curve.GetKeyUserData(at, MakeUID(1), data, size, 0.0))
      out += std::to_string(i) + ":" + AsString(data, size) + ";";
  }
  return out;
}

inline void ExpectApart(const C& curve) {
  ZvDoubleArray keys;
  curve.GetAllKeyParameters(keys);
  for (unsigned int i = 1; i < keys.size; ++i) {
    ASSERT_GT(keys[i] - keys[i - 1], 1e-15) << i;
  }
  if (auto* std = dynamic_cast<const ZvStdFCurve*>(&curve)) {
    ASSERT_TRUE(std->IsValid());
  }
}

}  // namespace dragtest

#endif
