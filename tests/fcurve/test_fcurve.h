// A minimal keyed curve for exercising the services of ZvBaseFCurve: keys
// are bare parameters; removing and moving keys carries their user data the
// way the real curves do. Everything else answers 0.
#ifndef ZV_TESTS_FCURVE_TEST_FCURVE_H
#define ZV_TESTS_FCURVE_TEST_FCURVE_H

#include <zv/fcurve.h>

#include "fcurve/fcurve_lock.h"

#include <algorithm>
#include <cmath>
#include <vector>

class TestFCurve : public ZvBaseFCurve {
 public:
  TestFCurve() = default;
  explicit TestFCurve(std::vector<double> keys) : m_keys(std::move(keys)) {}
  TestFCurve(const TestFCurve& other) : ZvBaseFCurve(other), m_keys(other.Keys()) {}
  TestFCurve& operator=(const TestFCurve& other) {
    Set(other);
    return *this;
  }
  TestFCurve& operator=(const ZvBaseFCurve& other) override {
    Set(other);
    return *this;
  }

  std::vector<double> Keys() const {
    Hold hold(*this);
    return m_keys;
  }

  ZvBaseFCurve* QueryFCurveKind(Kind kind) const override {
    return kind == GetKind() ? const_cast<TestFCurve*>(this) : nullptr;
  }
  Kind GetKind() const override { return StdKind; }
  ZvBaseFCurve* Clone() const override { return new TestFCurve(*this); }
  unsigned int Set(const ZvBaseFCurve& curve) override {
    const TestFCurve* other = dynamic_cast<const TestFCurve*>(&curve);
    if (other == nullptr) return 0;
    Hold hold(*this);
    if (other == this) return 1;
    ZvBaseFCurve::operator=(*other);
    m_keys = other->Keys();
    return 1;
  }

  unsigned int CreateKey(double parameter, double) override {
    Hold hold(*this);
    const auto it = std::lower_bound(m_keys.begin(), m_keys.end(), parameter);
    if (it == m_keys.end() || *it != parameter) m_keys.insert(it, parameter);
    return 1;
  }
  unsigned int RemoveKey(double parameter, double tolerance) override {
    Hold hold(*this);
    if (!GetNearestKeyParameterInCenteredInterval(parameter, tolerance)) return 0;
    RemoveKeyUserData(parameter);
    m_keys.erase(std::find(m_keys.begin(), m_keys.end(), parameter));
    return 1;
  }
  unsigned int ShiftParameters(double delta) override {
    Hold hold(*this);
    for (double& key : m_keys)
      key += delta;
    return TranslateAllKeyUserData(delta);
  }
  unsigned int ScaleParameterAxis(double factor) override {
    Hold hold(*this);
    if (!(factor > 0.0)) return 0;
    for (double& key : m_keys)
      key *= factor;
    return ScaleAllKeyUserData(factor);
  }
  unsigned int GetNumKeys() const override {
    Hold hold(*this);
    return static_cast<unsigned int>(m_keys.size());
  }
  unsigned int GetKeyParameter(unsigned int index, double& parameter) const override {
    Hold hold(*this);
    if (index >= m_keys.size()) return 0;
    parameter = m_keys[index];
    return 1;
  }
  // Nearest key in [t - tolerance, t + tolerance]; the earlier of two equal.
  unsigned int GetNearestKeyParameterInCenteredInterval(double& parameter,
                                                        double tolerance) const override {
    Hold hold(*this);
    const double* best = nullptr;
    for (const double& key : m_keys) {
      const double d = std::fabs(key - parameter);
      if (!(d <= tolerance + 1e-15)) continue;
      if (best == nullptr || d < std::fabs(*best - parameter)) best = &key;
    }
    if (best == nullptr) return 0;
    parameter = *best;
    return 1;
  }

  // Not needed by the tests of the base services.
  ZvBaseFCurve* SnapShot(double, double, ExtrapolationMethod) const override { return nullptr; }
  unsigned int MergeAndCreateKey(double, double, double, double, int, int, int) override {
    return 0;
  }
  unsigned int CreateNonModifyingKey(double, int) override { return 0; }
  unsigned int MergeAndCreateNonModifyingKey(double, double, double, int, int, int, int) override {
    return 0;
  }
  unsigned int RemoveKeys(double, double, int, int) override { return 0; }
  unsigned int SetValueWhenNoKeys(double) override { return 0; }
  unsigned int GetKeyValue(double, KeySide, double&, double) const override { return 0; }
  unsigned int GetKeyValues(double, double&, double&, double) const override { return 0; }
  unsigned int SetKeyValue(double, KeySide, double, double) override { return 0; }
  unsigned int Cut(double, double, ZvBaseFCurve&) override { return 0; }
  unsigned int RemoveTail(double) override { return 0; }
  unsigned int RemoveHead(double) override { return 0; }
  unsigned int Append(const ZvBaseFCurve&) override { return 0; }
  unsigned int Paste(const ZvBaseFCurve&, double, double) override { return 0; }
  unsigned int ShiftValues(double) override { return 0; }
  unsigned int ReduceNumKeys(double, double, double) override { return 0; }
  unsigned int GetFCurveInfo(FCurveInfo*) const override { return 0; }
  unsigned int GetKeyInfoFromIndex(unsigned int, KeyInfo*) const override { return 0; }
  unsigned int GetKeyInfoFromParameter(double, KeyInfo*) const override { return 0; }
  unsigned int GetKeyIndex(double, unsigned int&) const override { return 0; }
  unsigned int GetKeyParameters(double, double, ZvDoubleArray&, int, int) const override {
    return 0;
  }
  unsigned int IsKeyParameter(double, double) const override { return 0; }
  unsigned int GetAllKeyParameters(ZvDoubleArray&) const override { return 0; }
  unsigned int GetNextKeyParameter(double, double&, int) const override { return 0; }
  unsigned int GetPrevKeyParameter(double, double&, int) const override { return 0; }
  unsigned int GetNearestKeyParameter(double, double&) const override { return 0; }
  unsigned int SetClampingValues(double, double) override { return 0; }
  unsigned int GetClampingValues(double&, double&) const override { return 0; }
  unsigned int GetSmallestKeyParameter(double&) const override { return 0; }
  unsigned int IsSmallestKeyParameter(double) const override { return 0; }
  double GetMinusInfinityVal() const override { return 0.0; }
  unsigned int GetLargestKeyParameter(double&) const override { return 0; }
  unsigned int IsLargestKeyParameter(double) const override { return 0; }
  double GetPlusInfinityVal() const override { return 0.0; }
  double GetValueUpperBound(int) const override { return 0.0; }
  double GetValueLowerBound(int) const override { return 0.0; }
  double Eval(double, int) const override { return 0.0; }
  unsigned int EvalSequence(double, double, double, double, ZvDoubleArray&, ZvDoubleArray&,
                            int) const override {
    return 0;
  }
  unsigned int Flatten(const ZvTransfo4&, double, ZvPoint2dArray&, ZvPointTagArray&,
                       int) const override {
    return 0;
  }
  unsigned int FlattenFromTo(const ZvExtent2<double>&, const ZvTransfo4&, double, ZvPoint2dArray&,
                             ZvPointTagArray&, ZvBoolArray&, int) const override {
    return 0;
  }
  unsigned int GetKeys(ZvDoubleArray&, ZvDoubleArray&, ZvDoubleArray&, int) const override {
    return 0;
  }
  unsigned int ResampleSequence(double, double, double, int, int) override { return 0; }
  unsigned int SmoothSequence(double, double, const double*, unsigned int) override { return 0; }
  unsigned int MirrorValues() override { return 0; }
  unsigned int MirrorParameters() override { return 0; }
  unsigned int ScaleAndOffsetParameters(double, double, double, double, double, int, int,
                                        RegionHandle) override {
    return 0;
  }
  unsigned int SetReadOnlyConstraint(int) override { return 0; }
  unsigned int IsReadOnly() const override { return 0; }
  unsigned int SetConstraint(double&, KeyConstraint, int, double) override { return 0; }
  unsigned int GetConstraint(double&, KeyConstraint, int&, double) const override { return 0; }
  unsigned int IsConstraintSupported(KeyConstraint) const override { return 0; }
  unsigned int AreAnyValuesLockedInInterval(double, double, int, int) const override { return 0; }
  unsigned int AreAnyParametersLockedInInterval(double, double, int, int) const override {
    return 0;
  }
  unsigned int AreAnyKeysLockedInInterval(double, double, int, int) const override { return 0; }
  unsigned int SetExtrapolationMethod(ExtrapolationMethod) override { return 0; }
  ExtrapolationMethod GetExtrapolationMethod() const override { return ConstantExtrapolation; }
  double FoldParameter(double parameter) const override { return parameter; }
  unsigned int GetBufferSize() const override { return 0; }
  unsigned int WriteToBuffer(void*) const override { return 0; }
  unsigned int ReadFromBufferBody(const void*) override { return 0; }
  unsigned int ScaleAndShiftValues(double, double) override { return 0; }
  unsigned int EvalInverse(double, double&, int) const override { return 0; }
  unsigned int IsBijective() const override { return 0; }
  unsigned int SetDefaultBezierTangentConstraint(int) override { return 0; }
  unsigned int IsDefautlBezierTangentConstraintOn() const override { return 0; }
  unsigned int SetAsTimeFCurve(int) override { return 0; }
  unsigned int IsTimeFCurve() const override { return 0; }

 private:
  using Hold = ZvFCurveLockGuard;
  std::vector<double> m_keys;
};

#endif
