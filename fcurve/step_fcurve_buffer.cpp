// The blocks of the boolean and integer curves. Both hold the same fields in the same order and
// differ in the identifier that follows the kind and in the width of a value: one byte that is
// 0 or 1, or a 32-bit integer.
#include <zv/step_fcurve.h>

#include "fcurve/buffer_bytes.h"
#include "fcurve/cfc_key_order.h"
#include "fcurve/fcurve_lock.h"
#include "fcurve/step_fcurve_impl.h"

#include <cstring>
#include <utility>

namespace {

// The stamp written today: the key flags became 16-bit words with 258; 257 held one byte.
constexpr unsigned int kStamp = 258;
constexpr unsigned int kByteFlagsStamp = 257;

// The identifier words after the kind, the same in both kinds but for the first.
constexpr unsigned char kIdentifierTail[12] = {0xCA, 0x97, 0xD1, 0x11, 0x93, 0x6A,
                                               0x00, 0xA0, 0x24, 0x3E, 0x35, 0xF0};

struct BooleanLayout {
  static constexpr unsigned int kKind = ZvBaseFCurve::BooleanKind;
  static constexpr std::uint32_t kIdentifier = 0x84F21462u;
  static constexpr unsigned int kValueSize = 1;
  static void Put(ZvByteWriter& out, int v) { out.U8(v != 0 ? 1 : 0); }
  // A header byte is on when it is not 0, a key's only when it is 1.
  static int HeaderValue(ZvByteReader& in) { return in.U8() != 0 ? 1 : 0; }
  static int KeyValue(ZvByteReader& in) { return in.U8() == 1 ? 1 : 0; }
};

struct IntegerLayout {
  static constexpr unsigned int kKind = ZvBaseFCurve::IntegerKind;
  static constexpr std::uint32_t kIdentifier = 0x84F21461u;
  static constexpr unsigned int kValueSize = 4;
  static void Put(ZvByteWriter& out, int v) { out.U32(static_cast<std::uint32_t>(v)); }
  static int HeaderValue(ZvByteReader& in) { return static_cast<int>(in.U32()); }
  static int KeyValue(ZvByteReader& in) { return static_cast<int>(in.U32()); }
};

// Stamp, kind, identifier, two values, extrapolation, read-only, key count.
template <class Layout>
constexpr unsigned int HeaderSize() {
  return 4 + 4 + 16 + 2 * Layout::kValueSize + 2 + 4;
}

template <class Layout>
constexpr unsigned int KeySize(unsigned int flagsSize) {
  return 8 + Layout::kValueSize + flagsSize;
}

template <class Layout>
unsigned int BufferSize(ZvStepFCurveImpl& s, ZvBaseFCurve& curve) {
  if (!s.KeysAreOrdered()) CFCDropKeysOutOfOrder(s, curve);
  ZvFCurveLockGuard guard(curve);
  return 4 + HeaderSize<Layout>() + KeySize<Layout>(2) * s.keys.size +
         curve.GetUserDataBufferSize();
}

template <class Layout>
void Write(const ZvStepFCurveImpl& s, unsigned int size, ZvByteWriter& out) {
  out.U32(size - 4);
  out.U32(kStamp);
  out.U32(Layout::kKind);
  out.U32(Layout::kIdentifier);
  out.Bytes(kIdentifierTail, sizeof kIdentifierTail);
  Layout::Put(out, s.valueWhenNoKeys);
  Layout::Put(out, s.valueBeforeFirstKey);
  out.U8(s.extrapolation);
  out.U8(s.readOnly ? 1 : 0);
  out.U32(s.keys.size);
  for (unsigned int i = 0; i < s.keys.size; ++i) {
    zvPutF64(out, s.keys[i].parameter);
    Layout::Put(out, s.keys[i].value);
    out.U16(s.GetKeyFlags(i));
  }
}

// Everything before the user data, into the store of a temporary curve.
template <class Layout>
bool Read(ZvByteReader& in, ZvStepFCurveImpl& s) {
  if (!in.Has(HeaderSize<Layout>())) return false;
  const std::uint32_t stamp = in.U32();
  if (stamp < kByteFlagsStamp || stamp == 0xFFFFFFFFu) return false;
  if (in.U32() != Layout::kKind || in.U32() != Layout::kIdentifier ||
      std::memcmp(in.Bytes(sizeof kIdentifierTail), kIdentifierTail, sizeof kIdentifierTail) != 0) {
    return false;
  }
  s.valueWhenNoKeys = Layout::HeaderValue(in);
  s.valueBeforeFirstKey = Layout::HeaderValue(in);
  s.extrapolation = in.U8();
  s.readOnly = in.U8() != 0 ? 1 : 0;
  const unsigned int n = in.U32();
  const unsigned int flagsSize = stamp == kByteFlagsStamp ? 1 : 2;
  if (!in.Has(static_cast<std::uint64_t>(KeySize<Layout>(flagsSize)) * n)) return false;
  for (unsigned int i = 0; i < n; ++i) {
    const double parameter = zvGetF64(in);
    s.InsertKey(i, parameter, Layout::KeyValue(in));
    s.SetKeyFlags(i, static_cast<unsigned short>(flagsSize == 1 ? in.U8() : in.U16()));
  }
  return true;
}

}  // namespace

#define ZV_STEP_FCURVE_BUFFER(Curve, Layout, Blank)                                   \
  unsigned int Curve::GetBufferSize() const {                                         \
    return BufferSize<Layout>(*m_impl, const_cast<Curve&>(*this));                    \
  }                                                                                   \
  unsigned int Curve::WriteToBuffer(void* buffer) const {                             \
    if (buffer == nullptr) return 0;                                                  \
    const unsigned int size = GetBufferSize();                                        \
    ZvFCurveLockGuard guard(*this);                                                   \
    ZvByteWriter out(buffer);                                                         \
    Write<Layout>(*m_impl, size, out);                                                \
    WriteUserData(out);                                                               \
    return size;                                                                      \
  }                                                                                   \
  unsigned int Curve::ReadFromBufferBody(const void* body) {                          \
    if (body == nullptr) return 0;                                                    \
    ZvByteReader in(body);                                                            \
    return ReadBody(in, false);                                                       \
  }                                                                                   \
  unsigned int Curve::ReadFromBuffer(const void* buffer, std::size_t size) {          \
    ZvByteReader body(buffer, 0);                                                     \
    const unsigned int whole = zvOpenBoundedBlock(buffer, size, body);                \
    return whole != 0 && ReadBody(body, true) != 0 ? whole : 0;                       \
  }                                                                                   \
  unsigned int Curve::ReadBody(ZvByteReader& in, bool ascendingKeysOnly) {            \
    Curve read(Blank);                                                                \
    if (!Read<Layout>(in, *read.m_impl) || read.ReadUserDataBlock(in) == 0) return 0; \
    if (ascendingKeysOnly && !CFCKeysStrictlyAscending(read.m_impl->keys)) return 0;  \
    ZvFCurveLockGuard guard(*this);                                                   \
    ExchangeUserData(read);                                                           \
    std::swap(m_impl, read.m_impl);                                                   \
    return static_cast<unsigned int>(in.Consumed());                                  \
  }

ZV_STEP_FCURVE_BUFFER(ZvBooleanFCurve, BooleanLayout, 1.0)
ZV_STEP_FCURVE_BUFFER(ZvIntegerFCurve, IntegerLayout, 0.0)
