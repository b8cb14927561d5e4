// The rotation curve view's block: the component it shows, the shared rotation curve's keys and
// settings, and the view's user data. Keys enter the rotation curve read aside one by one in
// time order, so a block with keys out of order or on one time reads as a valid curve.
#include <zv/quat_fcurve.h>

#include "fcurve/buffer_bytes.h"
#include "fcurve/fcurve_lock.h"

namespace {

// The stamps are four ASCII digits: "1010" today, "0010" before the component was kept.
constexpr std::uint32_t kStamp = 0x30313031u;
constexpr std::uint32_t kStampWithoutComponent = 0x30313030u;

// Time, three angles, three key parameters, the spins and the constraint data.
constexpr unsigned int kKeySize = 48;
// Length, stamp, kind, component, key count; the value without keys, read-only, extrapolation.
constexpr unsigned int kFixedSize = 20 + 24 + 4 + 4;

void WritePoint(ZvByteWriter& out, const ZvPoint3<double>& p) {
  zvPutF64(out, p.x);
  zvPutF64(out, p.y);
  zvPutF64(out, p.z);
}

ZvPoint3<double> ReadPoint(ZvByteReader& in) {
  ZvPoint3<double> p;
  p.x = zvGetF64(in);
  p.y = zvGetF64(in);
  p.z = zvGetF64(in);
  return p;
}

}  // namespace

unsigned int ZvQuatFCurve::GetBufferSize() const {
  ZvFCurveLockGuard guard(*this);
  return kFixedSize + kKeySize * m_curve->GetNumKeys() + GetUserDataBufferSize();
}

unsigned int ZvQuatFCurve::WriteToBuffer(void* buffer) const {
  if (buffer == nullptr) return 0;
  const unsigned int size = GetBufferSize();
  ZvFCurveLockGuard guard(*this);
  const ZvQuatCurve& curve = *m_curve;
  ZvByteWriter out(buffer);
  out.U32(size - 4);
  out.U32(kStamp);
  out.U32(QuatKind);
  out.U32(m_component);
  out.U32(curve.GetNumKeys());
  for (unsigned int i = 0; i < curve.GetNumKeys(); ++i) {
    const ZvQuatKey& key = curve.GetKeys()[i];
    zvPutF64(out, key.time);
    WritePoint(out, key.angles);
    out.F32(&key.tension);
    out.F32(&key.continuity);
    out.F32(&key.bias);
    // The spins, then the locks as constraint data (2 value, 4 parameter) and a zero byte.
    out.U16(key.flags & ZvQuatKey::SpinsMask);
    out.U8(curve.GetConstraintData(i));
    out.U8(0);
  }
  WritePoint(out, curve.GetValueWhenNoKeys());
  out.U32(curve.IsReadOnly() ? 1 : 0);
  out.U32(curve.GetExtrapolationMethod());
  WriteUserData(out);
  return size;
}

unsigned int ZvQuatFCurve::ReadFromBufferBody(const void* body) {
  if (body == nullptr) return 0;
  ZvByteReader in(body);
  return ReadBody(in, false);
}

unsigned int ZvQuatFCurve::ReadFromBuffer(const void* buffer, std::size_t size) {
  ZvByteReader body(buffer, 0);
  const unsigned int whole = zvOpenBoundedBlock(buffer, size, body);
  return whole != 0 && ReadBody(body, true) != 0 ? whole : 0;
}

unsigned int ZvQuatFCurve::ReadBody(ZvByteReader& in, bool ascendingKeysOnly) {
  if (!in.Has(12)) return 0;
  const std::uint32_t stamp = in.U32();
  if ((stamp != kStamp && stamp != kStampWithoutComponent) || in.U32() != QuatKind) return 0;
  unsigned int component = m_component;
  if (stamp == kStamp) {
    component = in.U32();
    if (!in.Has(4)) return 0;
  }
  const unsigned int n = in.U32();
  if (!in.Has(static_cast<std::uint64_t>(kKeySize) * n + 32)) return 0;
  // The rotation and the user data are read aside and taken only when the block was whole.
  ZvQuatCurve read;
  for (unsigned int i = 0; i < n; ++i) {
    ZvQuatKey key;
    key.time = zvGetF64(in);
    if (ascendingKeysOnly && i > 0 && !(key.time > read.GetKeyTime(i - 1))) return 0;
    key.angles = ReadPoint(in);
    in.F32(&key.tension);
    in.F32(&key.continuity);
    in.F32(&key.bias);
    key.flags = static_cast<unsigned short>(in.U16() & ZvQuatKey::SpinsMask);
    const unsigned int constraints = in.U16();
    // Blocks hold their keys in order: each goes behind the last without a search, and only a
    // foreign block's key out of order is set in its place.
    unsigned int at = static_cast<unsigned int>(read.keys.size());
    if (at == 0 || key.time > read.keys.back().time) {
      read.keys.push_back(key);
    } else {
      at = read.SetKey(key, 0.0);
    }
    read.SetConstraintData(at, constraints);
  }
  read.SetValueWhenNoKeys(ReadPoint(in));
  read.SetReadOnlyConstraint(in.U32() != 0);
  read.SetExtrapolationMethod(in.U32());
  ZvQuatFCurve base(0);
  if (base.ReadUserDataBlock(in) == 0) return 0;
  ZvFCurveLockGuard guard(*this);
  // The copy of the keys is the one step that can fail; the user data change hands after it.
  *m_curve = read;
  ExchangeUserData(base);
  m_component = component;
  return static_cast<unsigned int>(in.Consumed());
}
