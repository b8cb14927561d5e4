// Reading the standard curve's block, of today and of every older version.
//
// Everything is read into a temporary curve; the target takes the result under its lock only
// when the whole block was accepted, so a refused block changes nothing.
#include <zv/std_fcurve.h>

#include "fcurve/buffer_bytes.h"
#include "fcurve/cfc_key_order.h"
#include "fcurve/fcurve_lock.h"
#include "fcurve/std_fcurve_buffer.h"
#include "fcurve/std_fcurve_impl.h"

#include <cstddef>
#include <cstring>
#include <utility>

using namespace zv_std_buffer;

namespace {

// A byte of a tag block is a flag that is on only when it is 1.
bool IsOne(unsigned int byte) {
  return byte == 1;
}

// Past the seven doubles of a key lie its small fields and the padding around them.
constexpr std::size_t kKeyTailOffset = offsetof(CFCStdKey, segmentKind);
static_assert(kKeyTailOffset == 7 * sizeof(double), "the doubles of a key are contiguous");

// A key record from p into `to`; the caller checked that it lies inside the block. Every byte of
// the key is written, padding zeroed with the small fields, so that keys read into a block that
// was not zero-filled carry no stale byte. New keys claim continuity until the flags say
// otherwise.
inline const unsigned char* ReadKeyRecord(const unsigned char* p, CFCStdKey* to) {
  CFCStdKey& k = *to;
  k.parameter = zvLoadF64(p);
  k.leftValue = zvLoadF64(p + 8);
  k.rightValue = zvLoadF64(p + 16);
  k.leftTangent.x = zvLoadF64(p + 24);
  k.leftTangent.y = zvLoadF64(p + 32);
  k.rightTangent.x = zvLoadF64(p + 40);
  k.rightTangent.y = zvLoadF64(p + 48);
  std::memset(reinterpret_cast<unsigned char*>(to) + kKeyTailOffset, 0,
              sizeof(CFCStdKey) - kKeyTailOffset);
  k.segmentKind = p[56];
  k.flags = CFCFlag_TangentContinuity;
  return p + kKeyRecordSize;
}

// The keys of a fresh store become n unset ones in a block of exactly n, for the records to
// overwrite: zero-filling first a block rounded up to a power of two wrote up to twice the
// bytes of the keys, all of them written again at once.
CFCStdKey* KeysToOverwrite(ZvStdFCurveImpl& s, unsigned int n) {
  if (n == 0) return s.keys.data;
  CFCStdKey* block = new CFCStdKey[n];
  delete[] s.keys.data;
  s.keys.data = block;
  s.keys.capacity = n;
  s.keys.size = n;
  return block;
}

// The oldest layout: value when no keys, first segment kind, and 64-byte records whose last
// word must be 0. Everything else keeps its default.
bool ReadOldest(ZvByteReader& in, ZvStdFCurveImpl& s) {
  if (!in.Has(16)) return false;
  s.valueWhenNoKeys = zvGetF64(in);
  s.firstSegmentKind = in.U32();
  const unsigned int n = in.U32();
  if (!in.Has(static_cast<std::uint64_t>(kKeyRecordSize + 4) * n)) return false;
  CFCStdKey* keys = KeysToOverwrite(s, n);
  for (unsigned int i = 0; i < n; ++i) {
    const unsigned char* tail = ReadKeyRecord(in.Bytes(kKeyRecordSize + 4), keys + i);
    if (zvLoadLE<4>(tail) != 0) return false;
  }
  return true;
}

// The header and key records of every stamp from 256.
bool ReadHeaderAndKeys(ZvByteReader& in, ZvStdFCurveImpl& s) {
  if (!in.Has(36) || in.U32() != ZvBaseFCurve::StdKind) return false;
  s.valueWhenNoKeys = zvGetF64(in);
  s.minClamp = zvGetF64(in);
  s.maxClamp = zvGetF64(in);
  s.firstSegmentKind = in.U32();
  const unsigned int n = in.U32();
  // The records are checked before anything is allocated for them.
  if (!in.Has(static_cast<std::uint64_t>(kKeyRecordSize) * n)) return false;
  CFCStdKey* keys = KeysToOverwrite(s, n);
  const unsigned char* p = in.Bytes(kKeyRecordSize * n);
  for (unsigned int i = 0; i < n; ++i)
    p = ReadKeyRecord(p, keys + i);
  return true;
}

// The tagged blocks that the stamp promises, up to the tangent constraint.
template <class ReadUserData>
bool ReadTaggedBlocks(ZvByteReader& in, unsigned int stamp, ZvStdFCurveImpl& s,
                      ReadUserData readUserData) {
  const unsigned int n = s.keys.size;
  if (stamp < kFlagsTag) return true;
  const bool wide = stamp >= kWideFlagsStamp;
  if (!zvReadTag(in, kFlagsTag) || !in.Has(static_cast<std::uint64_t>(wide ? 2 : 1) * n)) {
    return false;
  }
  const unsigned char* flags = in.Bytes((wide ? 2u : 1u) * n);
  const unsigned char* extra = nullptr;
  if (stamp >= kSettingsTag) {
    if (!zvReadTag(in, kSettingsTag) || !in.Has(2 + 2 * static_cast<std::uint64_t>(n)))
      return false;
    s.extrapolation = in.U8();
    s.readOnly = in.U8() != 0 ? 1 : 0;
    extra = in.Bytes(2u * n);
  }
  // Flags and extra bytes in one pass over the keys rather than two: the keys of a long curve
  // outgrow the first-level cache.
  CFCStdKey* keys = s.keys.data;
  for (unsigned int i = 0; i < n; ++i) {
    keys[i].flags = static_cast<unsigned short>(wide ? zvLoadLE<2>(flags + 2 * i) : flags[i]);
    if (extra) std::memcpy(keys[i].extra, extra + 2 * i, 2);
  }

  if (stamp < kSettingsTag) return true;
  if (readUserData(in) == 0) return false;

  if (stamp < kTangentConstraintTag) return true;
  if (!zvReadTag(in, kTangentConstraintTag) || !in.Has(1)) return false;
  s.defaultBezierTangentConstraint = IsOne(in.U8());
  return true;
}

bool IsSegmentValid(double x0, double x1, double x2, double x3) {
  return ZvStdFCurve_IsCubicSegmentValid({x0, 0.0}, {x1, 0.0}, {x2, 0.0}, {x3, 0.0}) != 0;
}

bool IsConstantOrLinear(unsigned int kind) {
  return kind == ZvBaseFCurve::ConstantSegment || kind == ZvBaseFCurve::LinearSegment;
}

// Blocks from before 258 kept any handles on constant and linear segments; those that would not
// make a function segment once the kind turns cubic go onto their keys.
void SetValidBezierTangentsOnConstantOrLinearSegments(ZvStdFCurveImpl& s) {
  const unsigned int n = s.keys.size;
  if (n == 0) return;
  CFCStdKey& first = s.keys[0];
  if (IsConstantOrLinear(s.firstSegmentKind) && first.leftTangent.x > first.parameter)
    first.leftTangent = {first.parameter, first.leftValue};
  for (unsigned int i = 0; i + 1 < n; ++i) {
    const CFCStdKey& k = s.keys[i];
    const CFCStdKey& next = s.keys[i + 1];
    if (!IsConstantOrLinear(k.segmentKind) ||
        IsSegmentValid(k.parameter, k.rightTangent.x, next.leftTangent.x, next.parameter)) {
      continue;
    }
    s.SetActualRightTgt(i, {k.parameter, k.rightValue});
    s.SetActualLeftTgt(i + 1, {next.parameter, next.leftValue});
  }
  CFCStdKey& last = s.keys[n - 1];
  if (IsConstantOrLinear(last.segmentKind) && last.rightTangent.x < last.parameter)
    last.rightTangent = {last.parameter, last.rightValue};
}

bool IsZeroLength(double dx, double dy) {
  const double length2 = dx * dx + dy * dy;
  return length2 >= -1e-15 && 1e-15 >= length2;
}

// What older versions left behind in fields that mean more today.
void RepairOlderVersion(ZvStdFCurveImpl& s, unsigned int stamp) {
  const unsigned int n = s.keys.size;
  if (stamp < 258) SetValidBezierTangentsOnConstantOrLinearSegments(s);
  // Automatic tangents came with 260; the bit meant nothing before.
  if (stamp < 260) {
    for (unsigned int i = 0; i < n; ++i)
      s.keys[i].flags = static_cast<unsigned short>(s.keys[i].flags & ~CFCFlag_AutoTangent);
  }
  s.ClaimContinuityOnlyWhereUnified();
  // The outer handles of the end keys were not kept before 263: a collapsed one mirrors its
  // partner through the key.
  if (stamp > 262 || n < 2) return;
  CFCStdKey& first = s.keys[0];
  if (IsZeroLength(first.leftTangent.x - first.parameter, first.leftTangent.y - first.leftValue)) {
    const ZvPoint2<double> r = first.rightTangent;
    s.SetActualLeftTgt(0, {r.x - 2 * (r.x - first.parameter), r.y - 2 * (r.y - first.rightValue)});
  }
  CFCStdKey& last = s.keys[n - 1];
  if (IsZeroLength(last.rightTangent.x - last.parameter, last.rightTangent.y - last.rightValue)) {
    const ZvPoint2<double> l = last.leftTangent;
    s.SetActualRightTgt(n - 1,
                        {l.x - 2 * (l.x - last.parameter), l.y - 2 * (l.y - last.leftValue)});
  }
}

}  // namespace

unsigned int ZvStdFCurve::ReadFromBufferBody(const void* body) {
  if (body == nullptr) return 0;
  ZvByteReader in(body);
  return ReadBody(in, false);
}

unsigned int ZvStdFCurve::ReadFromBuffer(const void* buffer, std::size_t size) {
  ZvByteReader body(buffer, 0);
  const unsigned int whole = zvOpenBoundedBlock(buffer, size, body);
  return whole != 0 && ReadBody(body, true) != 0 ? whole : 0;
}

unsigned int ZvStdFCurve::ReadBody(ZvByteReader& in, bool ascendingKeysOnly) {
  // The defaults of every field an older block does not hold.
  ZvStdFCurve read(0.0, CubicSegment);
  ZvStdFCurveImpl& s = *read.m_impl;
  if (!in.Has(4)) return 0;
  const unsigned int stamp = in.U32();
  if (stamp == kOldestStamp) {
    if (!ReadOldest(in, s)) return 0;
  } else {
    if (stamp < kFirstStamp || !ReadHeaderAndKeys(in, s) ||
        !ReadTaggedBlocks(in, stamp, s,
                          [&read](ZvByteReader& r) { return read.ReadUserDataBlock(r); })) {
      return 0;
    }
    RepairOlderVersion(s, stamp);
    if (stamp >= kTimeCurveTag) {
      if (!zvReadTag(in, kTimeCurveTag) || !in.Has(1)) return 0;
      s.timeCurve = IsOne(in.U8());
    }
  }
  if (ascendingKeysOnly && !CFCKeysStrictlyAscending(s.keys)) return 0;
  ZvFCurveLockGuard guard(*this);
  ExchangeUserData(read);
  std::swap(m_impl, read.m_impl);
  return static_cast<unsigned int>(in.Consumed());
}
