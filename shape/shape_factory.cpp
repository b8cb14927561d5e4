// Shapes from persistent blocks: the trusted body readers and the bounded whole-block reader.
#include <zv/oval2f.h>
#include <zv/path2f.h>
#include <zv/path2f_prop1d.h>
#include <zv/rect2f.h>

#include <new>

#include "core/le_bytes.h"
#include "shape/path_well_formed.h"

unsigned int ZvShape2f_GetBufferBodyLengthSize() {
  return 4;
}

ZvShape2f::Kind ZvShape2f_GetKindFromBufferBody(const void* body) {
  // Only the low 16 bits of the kind word are looked at.
  ZvByteReader in(body);
  const unsigned int kind = in.U16();
  return kind >= 1 && kind <= 4 ? static_cast<ZvShape2f::Kind>(kind) : ZvShape2f::KindNone;
}

namespace {

// The body of a rectangle or an oval: the kind word and three points.
const unsigned int kFrameBodyLength = 28;

// The empty object of a kind.
ZvShape2f* NewShapeOfKind(ZvShape2f::Kind kind) {
  switch (kind) {
    case ZvShape2f::KindPath:
      return new ZvPath2f(1);
    case ZvShape2f::KindRect:
      return new ZvRect2f();
    case ZvShape2f::KindOval:
      return new ZvOval2f();
    case ZvShape2f::KindPathProp:
      return new ZvPath2fProp1d(1);
    default:
      return nullptr;
  }
}

}  // namespace

ZvShape2f* ZvShape2f_CreateFromBufferBody(const void* body, unsigned int& consumed) {
  consumed = 0;
  ZvShape2f* shape = nullptr;
  try {
    shape = NewShapeOfKind(ZvShape2f_GetKindFromBufferBody(body));
    if (!shape) return nullptr;
    consumed = shape->ReadFromBufferBody(body);
  } catch (...) {
    // Nothing leaves the factory: whatever failed, the caller gets null.
    consumed = 0;
  }
  if (consumed == 0) {
    delete shape;
    return nullptr;
  }
  return shape;
}

ZvShape2f* ZvShape2f_CreateFromBuffer(const void* buffer, std::size_t size,
                                      unsigned int& consumed) {
  consumed = 0;
  if (!buffer) return nullptr;
  const std::size_t prefix = ZvShape2f_GetBufferBodyLengthSize();
  ZvByteReader block(buffer, size);
  if (!block.Has(prefix)) return nullptr;
  const std::uint32_t length = block.U32();
  if (!block.Has(length)) return nullptr;
  // The body reader sees exactly the body; the kind word must lie inside it.
  const unsigned char* body = static_cast<const unsigned char*>(buffer) + prefix;
  ZvByteReader head(body, length);
  if (!head.Has(2)) return nullptr;
  const unsigned int kind = head.U16();
  ZvShape2f* shape = nullptr;
  unsigned int read = 0;
  try {
    if (kind == ZvShape2f::KindPath) {
      ZvPath2f* path = new ZvPath2f(1);
      shape = path;
      ZvByteReader in(body, length);
      read = path->ReadBody(in);
      // A foreign block must also describe a path that the path's own queries can walk.
      if (read && (path->currentSubpathOpen > 1 ||
                   !zv_path::IsWellFormedBlock(path->codes.data, path->codes.size)))
        read = 0;
    } else if (kind == ZvShape2f::KindPathProp) {
      ZvPath2fProp1d* prop = new ZvPath2fProp1d(1);
      shape = prop;
      read = prop->ReadFromBuffer(buffer, prefix + length);
    } else if ((kind == ZvShape2f::KindRect || kind == ZvShape2f::KindOval) &&
               head.Has(kFrameBodyLength - 2)) {
      // Fixed size: once the body is known to hold it, the trusted reader is safe.
      shape = NewShapeOfKind(static_cast<ZvShape2f::Kind>(kind));
      read = shape->ReadFromBufferBody(body);
    }
  } catch (...) {
    read = 0;
  }
  if (read == 0) {
    delete shape;
    return nullptr;
  }
  consumed = static_cast<unsigned int>(prefix + length);
  return shape;
}
