// Writing the standard curve's block.
#include <zv/std_fcurve.h>

#include "fcurve/buffer_bytes.h"
#include "fcurve/cfc_key_order.h"
#include "fcurve/fcurve_lock.h"
#include "fcurve/std_fcurve_buffer.h"
#include "fcurve/std_fcurve_impl.h"

#include <cstdint>
#include <cstring>

using namespace zv_std_buffer;

namespace {

// The IEEE image of a double, or that of 0.0 when it is not finite. A test of the exponent
// bits rather than a floating-point classification keeps the store free of branches.
inline std::uint64_t FiniteBits(double v) {
  std::uint64_t bits;
  std::memcpy(&bits, &v, 8);
  const std::uint64_t exponent = 0x7FF0000000000000ull;
  return (bits & exponent) == exponent ? 0 : bits;
}

// Flattened so that the per-field stores become plain moves inside one loop.
__attribute__((flatten)) void StoreKeys(const CFCStdKey* keys, unsigned int n,
                                        unsigned char* records, unsigned char* flags,
                                        unsigned char* extras) {
  for (unsigned int i = 0; i < n; ++i) {
    const CFCStdKey& k = keys[i];
    unsigned char* p = records + std::size_t{kKeyRecordSize} * i;
    p = zvStoreLE<8>(p, FiniteBits(k.parameter));
    p = zvStoreLE<8>(p, FiniteBits(k.leftValue));
    p = zvStoreLE<8>(p, FiniteBits(k.rightValue));
    p = zvStoreLE<8>(p, FiniteBits(k.leftTangent.x));
    p = zvStoreLE<8>(p, FiniteBits(k.leftTangent.y));
    p = zvStoreLE<8>(p, FiniteBits(k.rightTangent.x));
    p = zvStoreLE<8>(p, FiniteBits(k.rightTangent.y));
    zvStoreLE<4>(p, k.segmentKind);  // the kind and three zero bytes
    zvStoreLE<2>(flags + 2u * i, k.flags);
    std::memcpy(extras + 2u * i, k.extra, 2);
  }
}

}  // namespace

// Not a pure query: a curve whose keys went out of order (a foreign block, say) is repaired
// here, before the lock, so that what is written always reads back as a valid curve. Only the
// order is tested: it is all the repair changes, and a full validity check per segment cost
// more than writing the keys.
unsigned int ZvStdFCurve::GetBufferSize() const {
  if (!m_impl->KeysAreOrdered()) CFCDropKeysOutOfOrder(*m_impl, const_cast<ZvStdFCurve&>(*this));
  ZvFCurveLockGuard guard(*this);
  const unsigned int perKey = kKeyRecordSize + 2 + 2;  // record, flags, extra bytes
  return kHeaderSize + perKey * m_impl->keys.size + kTrailerSize + GetUserDataBufferSize() +
         kUnwrittenTail;
}

unsigned int ZvStdFCurve::WriteToBuffer(void* buffer) const {
  if (buffer == nullptr) return 0;
  const unsigned int size = GetBufferSize();
  ZvFCurveLockGuard guard(*this);
  const ZvStdFCurveImpl& s = *m_impl;
  const unsigned int n = s.keys.size;
  ZvByteWriter out(buffer);
  out.U32(size - 4);
  out.U32(kStamp);
  out.U32(StdKind);
  zvPutF64(out, s.valueWhenNoKeys);
  zvPutF64(out, s.minClamp);
  zvPutF64(out, s.maxClamp);
  out.U32(s.firstSegmentKind);
  out.U32(n);
  // The records, the flag words and the extra bytes are three runs of the block, but each key
  // is visited once and writes its share of all three: the keys are read in a single pass.
  unsigned char* records = out.Run(kKeyRecordSize * n);
  out.U32(kFlagsTag);
  unsigned char* flags = out.Run(2u * n);
  out.U32(kSettingsTag);
  out.U8(s.extrapolation);
  out.U8(s.readOnly ? 1 : 0);
  unsigned char* extras = out.Run(2u * n);
  StoreKeys(s.keys.data, n, records, flags, extras);
  WriteUserData(out);
  out.U32(kTangentConstraintTag);
  out.U8(s.defaultBezierTangentConstraint ? 1 : 0);
  out.U32(kTimeCurveTag);
  out.U8(s.timeCurve ? 1 : 0);
  // No uninitialised byte leaves the library.
  out.U32(0);
  return size;
}
