// Writing the standard curve's block.
#include <zv/std_fcurve.h>

#include "fcurve/buffer_bytes.h"
#include "fcurve/cfc_key_order.h"
#include "fcurve/fcurve_lock.h"
#include "fcurve/std_fcurve_buffer.h"
#include "fcurve/std_fcurve_impl.h"

#include <cstring>

using namespace zv_std_buffer;

// Not a pure query: a curve whose keys went out of order (a foreign block, say) is repaired
// here, before the lock, so that what is written always reads back as a valid curve.
unsigned int ZvStdFCurve::GetBufferSize() const {
  if (!m_impl->IsValid()) CFCDropKeysOutOfOrder(*m_impl, const_cast<ZvStdFCurve&>(*this));
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
  unsigned char* p = out.Run(kKeyRecordSize * n);
  for (unsigned int i = 0; i < n; ++i) {
    const CFCStdKey& k = s.keys[i];
    for (const double v : {k.parameter, k.leftValue, k.rightValue, k.leftTangent.x, k.leftTangent.y,
                           k.rightTangent.x, k.rightTangent.y}) {
      p = zvStoreF64(p, v);
    }
    p = zvStoreLE<4>(p, k.segmentKind);  // the kind and three zero bytes
  }
  out.U32(kFlagsTag);
  p = out.Run(2u * n);
  for (unsigned int i = 0; i < n; ++i)
    p = zvStoreLE<2>(p, s.keys[i].flags);
  out.U32(kSettingsTag);
  out.U8(s.extrapolation);
  out.U8(s.readOnly ? 1 : 0);
  p = out.Run(2u * n);
  for (unsigned int i = 0; i < n; ++i, p += 2)
    std::memcpy(p, s.keys[i].extra, 2);
  WriteUserData(out);
  out.U32(kTangentConstraintTag);
  out.U8(s.defaultBezierTangentConstraint ? 1 : 0);
  out.U32(kTimeCurveTag);
  out.U8(s.timeCurve ? 1 : 0);
  // No uninitialised byte leaves the library.
  out.U32(0);
  return size;
}
