// The rotation key record and its packed flags.
#include <zv/quat.h>

#include <cmath>

ZvQuatKey::ZvQuatKey()
    : time(0.0), angles{0.0, 0.0, 0.0}, tension(0.0f), continuity(0.0f), bias(0.0f), flags(0) {}

ZvQuatKey::ZvQuatKey(double t, const ZvPoint3<double>& a, float te, float co, float bi, int spins)
    : time(t),
      angles(a),
      tension(te),
      continuity(co),
      bias(bi),
      flags(static_cast<unsigned short>(spins & SpinsMask)) {}

int ZvQuatKey::GetSpins() const {
  const int raw = flags & SpinsMask;
  // Bit 13 is the sign of the 14-bit field.
  return raw & 0x2000 ? raw - 0x4000 : raw;
}

void ZvQuatKey::SetSpins(int spins) {
  flags = static_cast<unsigned short>((flags & ~SpinsMask) | (spins & SpinsMask));
}

void ZvQuatKey::SetParamLock(bool on) {
  flags = static_cast<unsigned short>(on ? flags | ParamLockFlag : flags & ~ParamLockFlag);
}

void ZvQuatKey::SetValueLock(bool on) {
  flags = static_cast<unsigned short>(on ? flags | ValueLockFlag : flags & ~ValueLockFlag);
}

bool ZvQuatKey::operator==(const ZvQuatKey& o) const {
  const auto near = [](double p, double q, double tolerance) {
    return std::fabs(p - q) <= tolerance;
  };
  return near(time, o.time, 1e-9) && near(angles.x, o.angles.x, 1e-9) &&
         near(angles.y, o.angles.y, 1e-9) && near(angles.z, o.angles.z, 1e-9) &&
         std::fabs(tension - o.tension) <= 1e-7f && std::fabs(continuity - o.continuity) <= 1e-7f &&
         std::fabs(bias - o.bias) <= 1e-7f && flags == o.flags;
}
