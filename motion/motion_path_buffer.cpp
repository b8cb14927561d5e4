// Persistent blocks of motion paths.
//
// Body: version (16 bits) and six zero bytes, the point count N, N points as three doubles,
// then per node its time, its two tangent information bytes and its flags, and a zero trailer.
// Older versions carry no tangents (their paths ran at constant speed) and version 258 an
// extra byte per node that is no longer used.
#include <zv/motion_path.h>

#include <cmath>
#include <cstdint>
#include <cstring>
#include <memory>

#include "core/le_bytes.h"
#include "core/scoped_lock.h"
#include "motion/motion_path_impl.h"

namespace {

constexpr unsigned int kVersion = 259;
constexpr unsigned int kVersionWithoutTangents = 257;
constexpr unsigned int kVersionWithSpareBytes = 258;
// Version word, padding and point count before the points; the trailer after everything.
constexpr unsigned int kHeader = 12;
constexpr unsigned int kTrailer = 4;

// Doubles travel as their IEEE image; what is not finite travels and arrives as 0.
void PutF64(ZvByteWriter& out, double v) {
  const double finite = std::isfinite(v) ? v : 0.0;
  std::uint64_t bits;
  std::memcpy(&bits, &finite, 8);
  out.U32(static_cast<std::uint32_t>(bits));
  out.U32(static_cast<std::uint32_t>(bits >> 32));
}

double GetF64(ZvByteReader& in) {
  std::uint64_t bits = in.U32();
  bits |= static_cast<std::uint64_t>(in.U32()) << 32;
  double v;
  std::memcpy(&v, &bits, 8);
  return std::isfinite(v) ? v : 0.0;
}

unsigned int BodyLength(unsigned int n) {
  return n ? 24 * n + 11 * (n / 3) + 27 : 16;
}

// Reads a body into a fresh implementation. Refuses what the path could not hold: a point
// count that is not whole segments, times that do not increase, unknown tangent values.
unsigned int ReadBody(ZvByteReader& in, std::unique_ptr<ZvMotionPath3dImpl>& result) {
  if (!in.Has(kHeader)) return 0;
  const unsigned int version = in.U32();
  in.Skip(4);
  const unsigned int n = in.U32();
  if (version < kVersionWithoutTangents) return 0;
  const unsigned int k = n ? n / 3 + 1 : 0;
  if (n && n % 3 != 1) return 0;
  const unsigned int perNode = version == kVersionWithoutTangents  ? 9
                               : version == kVersionWithSpareBytes ? 10
                                                                   : 11;
  if (!in.Has(24ull * n + static_cast<std::uint64_t>(perNode) * k + kTrailer)) return 0;
  auto m = std::make_unique<ZvMotionPath3dImpl>();
  m->controlPoints.Resize(n);
  m->clientData.Resize(n);
  for (unsigned int i = 0; i < n; ++i) {
    m->controlPoints[i].x = GetF64(in);
    m->controlPoints[i].y = GetF64(in);
    m->controlPoints[i].z = GetF64(in);
    m->clientData[i] = nullptr;
  }
  m->initialTimes.Resize(k);
  m->nodeFlags.Resize(k);
  m->tangents.Resize(k);
  for (unsigned int j = 0; j < k; ++j) {
    m->initialTimes[j] = GetF64(in);
    if (j > 0 && !(m->initialTimes[j] > m->initialTimes[j - 1])) return 0;
  }
  if (version == kVersionWithSpareBytes) in.Skip(k);
  for (unsigned int j = 0; j < k; ++j) {
    ZvTwoSidedTangent& t = m->tangents[j];
    if (version == kVersionWithoutTangents || version == kVersionWithSpareBytes) {
      t.left = t.right = ZvMotionPath3d::Constant;
      continue;
    }
    // Checked as bytes: an enumeration must never hold a value it does not name.
    const unsigned int left = in.U8(), right = in.U8();
    if (left > ZvMotionPath3d::Ease || right > ZvMotionPath3d::Ease) return 0;
    t.left = static_cast<ZvMotionPath3d::TangentInfo>(left);
    t.right = static_cast<ZvMotionPath3d::TangentInfo>(right);
  }
  for (unsigned int j = 0; j < k; ++j)
    m->nodeFlags[j] = in.U8();
  in.Skip(kTrailer);
  result = std::move(m);
  return static_cast<unsigned int>(in.Consumed());
}

// The path's implementation is replaced only once a whole body has been read.
unsigned int ReadInto(ZvByteReader& in, ZvMotionPath3dImpl*& impl) {
  std::unique_ptr<ZvMotionPath3dImpl> fresh;
  const unsigned int consumed = ReadBody(in, fresh);
  if (!consumed) return 0;
  delete impl;
  impl = fresh.release();
  return consumed;
}

}  // namespace

unsigned int ZvMotionPath3d_GetBufferBodyLengthSize() {
  return 4;
}

unsigned int ZvMotionPath3d::GetBufferSize() const {
  ZvScopedLock guard(lock);
  return ZvMotionPath3d_GetBufferBodyLengthSize() + BodyLength(impl->NumPoints());
}

unsigned int ZvMotionPath3d::WriteToBuffer(void* buffer) const {
  ZvScopedLock guard(lock);
  const ZvMotionPath3dImpl& m = *impl;
  const unsigned int n = m.NumPoints(), k = n ? m.NumNodes() : 0;
  ZvByteWriter out(buffer);
  out.U32(BodyLength(n));
  out.U16(kVersion);
  out.U16(0);
  out.U32(0);
  out.U32(n);
  for (unsigned int i = 0; i < n; ++i) {
    PutF64(out, m.controlPoints[i].x);
    PutF64(out, m.controlPoints[i].y);
    PutF64(out, m.controlPoints[i].z);
  }
  for (unsigned int j = 0; j < k; ++j)
    PutF64(out, m.initialTimes[j]);
  for (unsigned int j = 0; j < k; ++j) {
    out.U8(static_cast<std::uint8_t>(m.tangents[j].left));
    out.U8(static_cast<std::uint8_t>(m.tangents[j].right));
  }
  for (unsigned int j = 0; j < k; ++j)
    out.U8(m.nodeFlags[j]);
  out.U32(0);
  return static_cast<unsigned int>(out.Written());
}

unsigned int ZvMotionPath3d::ReadFromBufferBody(const void* body) {
  ZvScopedLock guard(lock);
  ZvByteReader in(body);
  return ReadInto(in, impl);
}

unsigned int ZvMotionPath3d::ReadFromBufferBody(const void* body, unsigned int size) {
  ZvScopedLock guard(lock);
  ZvByteReader in(body, size);
  return ReadInto(in, impl);
}

namespace {

template <class... Size>
ZvMotionPath3d* CreateFromBody(const void* body, unsigned int& bytesRead, Size... size) {
  ZvMotionPath3d* path = nullptr;
  bytesRead = 0;
  try {
    path = new ZvMotionPath3d();
    const unsigned int consumed = path->ReadFromBufferBody(body, size...);
    if (consumed) {
      bytesRead = consumed;
      return path;
    }
  } catch (...) {
    // A block that asks for more memory than there is gives no path, like any bad block.
  }
  delete path;
  return nullptr;
}

}  // namespace

ZvMotionPath3d* ZvMotionPath3d_CreateFromBufferBody(const void* body, unsigned int& bytesRead) {
  return CreateFromBody(body, bytesRead);
}

ZvMotionPath3d* ZvMotionPath3d_CreateFromBufferBody(const void* body, unsigned int size,
                                                    unsigned int& bytesRead) {
  return CreateFromBody(body, bytesRead, size);
}
