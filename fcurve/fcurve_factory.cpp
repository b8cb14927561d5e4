// Curves from persistent blocks: the kind of a body, and the factories that build a curve of
// that kind from a trusted body or from a bounded whole block.
#include <zv/fcurve.h>
#include <zv/quat_fcurve.h>
#include <zv/raw_fcurve.h>
#include <zv/std_fcurve.h>
#include <zv/step_fcurve.h>

#include "fcurve/buffer_bytes.h"

#include <memory>

namespace {

// The first body word is a version stamp; stamps below 256 are the standard curve's oldest
// layouts, which carry no kind word.
unsigned int KindOfBody(ZvByteReader in) {
  if (!in.Has(4)) return 0;
  if (in.U32() < 256) return ZvBaseFCurve::StdKind;
  if (!in.Has(4)) return 0;
  const unsigned int kind = in.U32();
  switch (kind) {
    case ZvBaseFCurve::BooleanKind:
    case ZvBaseFCurve::IntegerKind:
    case ZvBaseFCurve::StdKind:
    case ZvBaseFCurve::RawKind:
    case ZvBaseFCurve::QuatKind:
      return kind;
    default:
      return 0;
  }
}

// How each kind is made blank and read from a bounded block.
struct KindReader {
  unsigned int kind;
  ZvBaseFCurve* (*create)();
  unsigned int (*readBounded)(ZvBaseFCurve& curve, const void* buffer, std::size_t size);
};

template <class Curve>
unsigned int ReadBounded(ZvBaseFCurve& curve, const void* buffer, std::size_t size) {
  return static_cast<Curve&>(curve).ReadFromBuffer(buffer, size);
}

// The blank curve of each kind.
const KindReader kReaders[] = {
    {ZvBaseFCurve::BooleanKind, [] { return static_cast<ZvBaseFCurve*>(new ZvBooleanFCurve(1.0)); },
     &ReadBounded<ZvBooleanFCurve>},
    {ZvBaseFCurve::IntegerKind, [] { return static_cast<ZvBaseFCurve*>(new ZvIntegerFCurve(0.0)); },
     &ReadBounded<ZvIntegerFCurve>},
    {ZvBaseFCurve::StdKind,
     [] { return static_cast<ZvBaseFCurve*>(new ZvStdFCurve(0.0, ZvBaseFCurve::CubicSegment)); },
     &ReadBounded<ZvStdFCurve>},
    {ZvBaseFCurve::RawKind, [] { return static_cast<ZvBaseFCurve*>(new ZvRawFCurve(0.0)); },
     &ReadBounded<ZvRawFCurve>},
    {ZvBaseFCurve::QuatKind, [] { return static_cast<ZvBaseFCurve*>(new ZvQuatFCurve(0)); },
     &ReadBounded<ZvQuatFCurve>},
};

const KindReader* ReaderOfKind(unsigned int kind) {
  for (const KindReader& reader : kReaders)
    if (reader.kind == kind) return &reader;
  return nullptr;
}

}  // namespace

unsigned int ZvBaseFCurve_GetBufferBodyLengthSize() {
  return 4;
}

unsigned int ZvBaseFCurve_GetKindFromBufferBody(const void* body) {
  return body != nullptr ? KindOfBody(ZvByteReader(body)) : 0;
}

unsigned int ZvBaseFCurve_CreateFromBufferBody(const void* body, ZvBaseFCurve** out) {
  if (body == nullptr || out == nullptr) return 0;
  *out = nullptr;
  const KindReader* reader = ReaderOfKind(ZvBaseFCurve_GetKindFromBufferBody(body));
  if (reader == nullptr) return 0;
  // Nothing leaves the factory: whatever fails, the caller gets null.
  try {
    std::unique_ptr<ZvBaseFCurve> curve(reader->create());
    if (curve->ReadFromBufferBody(body) == 0) return 0;
    *out = curve.release();
    return 1;
  } catch (...) {
    return 0;
  }
}

ZvBaseFCurve* ZvBaseFCurve_CreateFromBuffer(const void* buffer, std::size_t size,
                                            unsigned int& consumed) {
  consumed = 0;
  ZvByteReader body(buffer, 0);
  if (zvOpenBoundedBlock(buffer, size, body) == 0) return nullptr;
  const KindReader* reader = ReaderOfKind(KindOfBody(body));
  if (reader == nullptr) return nullptr;
  try {
    std::unique_ptr<ZvBaseFCurve> curve(reader->create());
    consumed = reader->readBounded(*curve, buffer, size);
    return consumed != 0 ? curve.release() : nullptr;
  } catch (...) {
    consumed = 0;
    return nullptr;
  }
}
