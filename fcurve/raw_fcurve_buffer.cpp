// The raw curve's block, of today and of the older versions.
//
// After the keys stands a marker word that says whether a flags array follows. No raw curve
// has one (raw keys keep no locks), so the writer puts 0; a reader steps over the array of an
// older writer that had one.
#include <zv/raw_fcurve.h>

#include "fcurve/buffer_bytes.h"
#include "fcurve/cfc_key_order.h"
#include "fcurve/fcurve_lock.h"
#include "fcurve/raw_fcurve_impl.h"

#include <utility>

namespace {

constexpr unsigned int kStamp = 264;
constexpr unsigned int kFirstStamp = 256;
// Extrapolation, read-only flag and user data; the block came with 258.
constexpr unsigned int kSettingsTag = 258;
// Flags of two bytes a key behind the marker, from 259 on; one byte before.
constexpr unsigned int kWideFlagsStamp = 259;
constexpr unsigned int kTimeCurveTag = 264;
// A marker from this value on announces a flags array.
constexpr std::uint32_t kFlagsMarker = 0xFFFFFFFEu;

// Length, stamp, kind, three doubles, key count; the marker; the two tags and their bytes.
constexpr unsigned int kFixedSize = 4 + 4 + 4 + 24 + 4 + 4 + 4 + 2 + 4 + 1;
constexpr unsigned int kKeySize = 16;

bool ReadHeaderAndKeys(ZvByteReader& in, unsigned int stamp, ZvRawFCurveImpl& s) {
  if (!in.Has(32) || in.U32() != ZvBaseFCurve::RawKind) return false;
  s.valueWhenNoKeys = zvGetF64(in);
  s.minClamp = zvGetF64(in);
  s.maxClamp = zvGetF64(in);
  const unsigned int n = in.U32();
  if (!in.Has(static_cast<std::uint64_t>(kKeySize) * n + 4)) return false;
  s.keys.Resize(n);
  for (unsigned int i = 0; i < n; ++i) {
    s.keys[i].parameter = zvGetF64(in);
    s.keys[i].value = zvGetF64(in);
  }
  if (in.U32() >= kFlagsMarker) {
    const std::uint64_t flags = static_cast<std::uint64_t>(stamp >= kWideFlagsStamp ? 2 : 1) * n;
    if (!in.Has(flags)) return false;
    in.Skip(static_cast<std::size_t>(flags));
  }
  return true;
}

}  // namespace

unsigned int ZvRawFCurve::GetBufferSize() const {
  if (!m_impl->KeysAreOrdered()) CFCDropKeysOutOfOrder(*m_impl, const_cast<ZvRawFCurve&>(*this));
  ZvFCurveLockGuard guard(*this);
  return kFixedSize + kKeySize * m_impl->keys.size + GetUserDataBufferSize();
}

unsigned int ZvRawFCurve::WriteToBuffer(void* buffer) const {
  if (buffer == nullptr) return 0;
  const unsigned int size = GetBufferSize();
  ZvFCurveLockGuard guard(*this);
  const ZvRawFCurveImpl& s = *m_impl;
  ZvByteWriter out(buffer);
  out.U32(size - 4);
  out.U32(kStamp);
  out.U32(RawKind);
  zvPutF64(out, s.valueWhenNoKeys);
  zvPutF64(out, s.minClamp);
  zvPutF64(out, s.maxClamp);
  out.U32(s.keys.size);
  for (unsigned int i = 0; i < s.keys.size; ++i) {
    zvPutF64(out, s.keys[i].parameter);
    zvPutF64(out, s.keys[i].value);
  }
  out.U32(0);  // no flags array
  out.U32(kSettingsTag);
  out.U8(s.extrapolation);
  out.U8(s.readOnly ? 1 : 0);
  WriteUserData(out);
  out.U32(kTimeCurveTag);
  out.U8(s.timeCurve ? 1 : 0);
  return size;
}

unsigned int ZvRawFCurve::ReadFromBufferBody(const void* body) {
  if (body == nullptr) return 0;
  ZvByteReader in(body);
  return ReadBody(in, false);
}

unsigned int ZvRawFCurve::ReadFromBuffer(const void* buffer, std::size_t size) {
  ZvByteReader body(buffer, 0);
  const unsigned int whole = zvOpenBoundedBlock(buffer, size, body);
  return whole != 0 && ReadBody(body, true) != 0 ? whole : 0;
}

unsigned int ZvRawFCurve::ReadBody(ZvByteReader& in, bool ascendingKeysOnly) {
  ZvRawFCurve read(0.0);
  ZvRawFCurveImpl& s = *read.m_impl;
  if (!in.Has(4)) return 0;
  const unsigned int stamp = in.U32();
  if (stamp < kFirstStamp || !ReadHeaderAndKeys(in, stamp, s)) return 0;
  if (stamp >= kSettingsTag) {
    if (!zvReadTag(in, kSettingsTag) || !in.Has(2)) return 0;
    s.extrapolation = in.U8();
    s.readOnly = in.U8() != 0 ? 1 : 0;
    if (read.ReadUserDataBlock(in) == 0) return 0;
  }
  if (stamp >= kTimeCurveTag) {
    if (!zvReadTag(in, kTimeCurveTag) || !in.Has(1)) return 0;
    s.timeCurve = in.U8() == 1 ? 1 : 0;
  }
  if (ascendingKeysOnly && !CFCKeysStrictlyAscending(s.keys)) return 0;
  ZvFCurveLockGuard guard(*this);
  ExchangeUserData(read);
  std::swap(m_impl, read.m_impl);
  return static_cast<unsigned int>(in.Consumed());
}
