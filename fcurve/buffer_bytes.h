// What the curve blocks add to the little-endian writer and reader: doubles, identifiers, tags
// and the opening of a whole block.
//
// A double travels as the eight bytes of its IEEE 754 image, least significant first, and a value
// that is not finite travels as 0.0 both ways: a block never carries nor yields a NaN or an
// infinity. Every reader is written once against ZvByteReader and asks Has() before each run of
// reads, so the trusted body readers and the bounded whole-block readers are the same code.
#ifndef ZV_FCURVE_BUFFER_BYTES_H
#define ZV_FCURVE_BUFFER_BYTES_H

#include <zv/fcurve_userdata.h>

#include "core/le_bytes.h"

#include <climits>
#include <cmath>
#include <cstdint>
#include <cstring>

inline double zvFiniteOrZero(double v) {
  return std::isfinite(v) ? v : 0.0;
}

// The double at p, and its store, for runs of records decoded from one local pointer.
inline double zvLoadF64(const unsigned char* p) {
  const std::uint64_t bits = zvLoadLE<8>(p);
  double v;
  std::memcpy(&v, &bits, 8);
  return zvFiniteOrZero(v);
}

inline unsigned char* zvStoreF64(unsigned char* p, double v) {
  const double filtered = zvFiniteOrZero(v);
  std::uint64_t bits;
  std::memcpy(&bits, &filtered, 8);
  return zvStoreLE<8>(p, bits);
}

inline void zvPutF64(ZvByteWriter& out, double v) {
  zvStoreF64(out.Run(8), v);
}

inline double zvGetF64(ZvByteReader& in) {
  return zvLoadF64(in.Bytes(8));
}

// u32 Data1, u16 Data2, u16 Data3, the 8 bytes of Data4.
constexpr unsigned int kZvUIDSize = 16;

inline void zvPutUID(ZvByteWriter& out, const _zvUID& uid) {
  out.U32(uid.Data1);
  out.U16(uid.Data2);
  out.U16(uid.Data3);
  out.Bytes(uid.Data4, 8);
}

inline _zvUID zvGetUID(ZvByteReader& in) {
  _zvUID uid;
  uid.Data1 = in.U32();
  uid.Data2 = in.U16();
  uid.Data3 = in.U16();
  std::memcpy(uid.Data4, in.Bytes(8), 8);
  return uid;
}

// Reads the u32 that opens a tag block; false if it is missing or another tag.
inline bool zvReadTag(ZvByteReader& in, std::uint32_t tag) {
  return in.Has(4) && in.U32() == tag;
}

// Opens a whole block of `size` bytes for bounded reading: its length word and the body the
// word announces must both lie inside the block. On success `body` reads exactly the body and
// the result is the size of the whole block; otherwise the result is 0.
inline unsigned int zvOpenBoundedBlock(const void* buffer, std::size_t size, ZvByteReader& body) {
  if (buffer == nullptr) return 0;
  ZvByteReader block(buffer, size);
  if (!block.Has(4)) return 0;
  const std::uint32_t length = block.U32();
  // The whole size is handed back as an unsigned int, so it must fit one.
  if (!block.Has(length) || length > UINT_MAX - 4u) return 0;
  body = block.Part(length);
  return length + 4u;
}

#endif
