// Persistent blocks of ZvPath2f.
#include <zv/path2f.h>

#include <new>

#include "core/le_bytes.h"
#include "shape/path_codes.h"
#include "shape/shape_lock.h"

namespace {
// Kind word, point count and open flag around 9 bytes a point.
constexpr unsigned int kBodyFixed = 12;
constexpr unsigned int kBytesPerPoint = 9;
}  // namespace

unsigned int ZvPath2f::GetBufferSize() const {
  ZvShapeLock guard(*this);
  return ZvShape2f_GetBufferBodyLengthSize() + kBodyFixed + kBytesPerPoint * points.size;
}

unsigned int ZvPath2f::WriteToBuffer(void* buffer) const {
  ZvShapeLock guard(*this);
  const unsigned int n = points.size;
  ZvByteWriter out(buffer);
  out.U32(kBodyFixed + kBytesPerPoint * n);
  out.U16(KindPath);
  out.U16(0);
  out.U32(n);
  for (unsigned int i = 0; i < n; ++i) {
    out.F32(&points[i].x);
    out.F32(&points[i].y);
  }
  // Tangent locks are a property of an editing session, not of the document.
  for (unsigned int i = 0; i < n; ++i)
    out.U8(codes[i] & zv_path::kCodeMask);
  out.U32(currentSubpathOpen);
  return static_cast<unsigned int>(out.Written());
}

unsigned int ZvPath2f::ReadFromBufferBody(const void* body) {
  ZvByteReader in(body);
  return ReadBody(in);
}

unsigned int ZvPath2f::ReadBody(ZvByteReader& in) {
  if (!in.Has(8)) return 0;
  if (in.U16() != KindPath) return 0;
  in.Skip(2);
  const unsigned int n = in.U32();
  // The whole rest of the body is checked before anything is allocated for it.
  if (!in.Has(static_cast<std::uint64_t>(kBytesPerPoint) * n + 4)) return 0;
  ZvShapeLock guard(*this);
  try {
    ZvPoint2fArray newPoints(n);
    ZvUByteArray newCodes(n);
    newPoints.Resize(n);
    newCodes.Resize(n);
    for (unsigned int i = 0; i < n; ++i) {
      in.F32(&newPoints[i].x);
      in.F32(&newPoints[i].y);
    }
    for (unsigned int i = 0; i < n; ++i)
      newCodes[i] = in.U8();
    const unsigned int open = in.U32();
    points = newPoints;
    codes = newCodes;
    currentSubpathOpen = open;
  } catch (const std::bad_alloc&) {
    points.Chop(0);
    codes.Chop(0);
    currentSubpathOpen = 0;
    return 0;
  }
  return kBodyFixed + kBytesPerPoint * n;
}
