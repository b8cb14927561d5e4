// Persistent blocks of ZvMipPath2fProp1d.
#include <memory>
#include <new>

#include "core/scoped_lock.h"
#include "fcurve/buffer_bytes.h"
#include "shape/mip_path_impl.h"

namespace {
// Stored as bytes 0, 1, 0, 0; readers look at bytes 1 to 3 only.
constexpr std::uint32_t kVersion = 256;
// Length field, version word and key count.
constexpr unsigned int kHeaderSize = 12;
// The parameter and the key path's length field.
constexpr unsigned int kKeyFixedSize = 12;
}  // namespace

unsigned int ZvMipPath2fProp1d_GetBufferBodyLengthSize() {
  return 4;
}

unsigned int ZvMipPath2fProp1d::GetBufferSize() const {
  ZvScopedLock lock(cs);
  unsigned int size = kHeaderSize;
  for (unsigned int i = 0; i < impl->keys.size; ++i)
    size += 8 + impl->keys[i].path->GetBufferSize();
  return size;
}

unsigned int ZvMipPath2fProp1d::WriteToBuffer(void* buffer) const {
  if (buffer == nullptr) return 0;
  ZvScopedLock lock(cs);
  const unsigned int size = GetBufferSize();
  ZvByteWriter out(buffer);
  out.U32(size - 4);
  out.U32(kVersion);
  out.U32(impl->keys.size);
  for (unsigned int i = 0; i < impl->keys.size; ++i) {
    const MPKey& key = impl->keys[i];
    zvPutF64(out, key.parameter);
    const unsigned int pathSize = key.path->GetBufferSize();
    key.path->WriteToBuffer(out.Run(pathSize));
  }
  return static_cast<unsigned int>(out.Written());
}

unsigned int ZvMipPath2fProp1d::ReadFromBufferBody(const void* body) {
  if (body == nullptr) return 0;
  return ReadBlock(body, 0, false);
}

unsigned int ZvMipPath2fProp1d::ReadFromBuffer(const void* buffer, std::size_t size) {
  ZvByteReader body(buffer, 0);
  const unsigned int whole = zvOpenBoundedBlock(buffer, size, body);
  if (whole == 0) return 0;
  return ReadBlock(static_cast<const unsigned char*>(buffer) + 4, whole - 4, true) ? whole : 0;
}

// The keys are read into a store of their own and swapped in only when all of them have been
// read, so that a refused block or a failed allocation leaves the sequence as it was.
unsigned int ZvMipPath2fProp1d::ReadBlock(const void* body, std::size_t size, bool bounded) {
  const unsigned char* start = static_cast<const unsigned char*>(body);
  ZvByteReader in = bounded ? ZvByteReader(body, size) : ZvByteReader(body);
  if (!in.Has(8)) return 0;
  const unsigned char* version = in.Bytes(4);
  const std::uint32_t v = static_cast<std::uint32_t>(version[1]) << 8 |
                          static_cast<std::uint32_t>(version[2]) << 16 |
                          static_cast<std::uint32_t>(version[3]) << 24;
  if (v < kVersion) return 0;
  const unsigned int n = in.U32();
  // Every key takes at least its fixed bytes: a count the block cannot hold is refused before
  // anything is allocated for it.
  if (!in.Has(static_cast<std::uint64_t>(kKeyFixedSize) * n)) return 0;
  unsigned int consumed = 8;
  try {
    ZvMipPath2fProp1dImpl read;
    for (unsigned int i = 0; i < n; ++i) {
      if (!in.Has(kKeyFixedSize)) return 0;
      const double parameter = zvGetF64(in);
      const unsigned char* block = start + in.Consumed();
      const unsigned int length = in.U32();
      if (!in.Has(length)) return 0;
      std::unique_ptr<ZvPath2fProp1d> path(new ZvPath2fProp1d(1));
      if (bounded) {
        // Only a sequence its own search can walk is taken from a foreign block.
        if (i > 0 &&
            !(parameter - read.keys[i - 1].parameter > ZvMipPath2fProp1dImpl::kSameParameter))
          return 0;
        if (path->ReadFromBuffer(block, 4 + static_cast<std::size_t>(length)) == 0) return 0;
      } else if (path->ReadFromBufferBody(block + 4) == 0) {
        return 0;
      }
      in.Skip(length);
      read.AppendOwned(parameter, path.release());
      consumed += kKeyFixedSize + length;
    }
    ZvScopedLock lock(cs);
    impl->Swap(read);
  } catch (const std::bad_alloc&) {
    return 0;
  }
  return consumed;
}
