// Little-endian persistence, one byte at a time, so that a block is the same from every build
// whatever the host's byte order, word size or structure padding.
//
// ZvByteWriter appends to a block the caller sized. ZvByteReader reads a block either trusting
// the caller (unbounded: the caller vouches that the block is complete) or within a known size
// (bounded: every read is checked first, and a read past the end fails instead of happening).
// Readers of persistent classes are written once against ZvByteReader and ask Has(n) before each
// run of reads, which is always true for an unbounded reader; so the trusted and the checked
// entry points share one body of code.
//
// Floats travel as their 32-bit pattern, copied in memory and never through a floating-point
// register, so that every bit (signalling NaNs included) survives a 32-bit x87 build too.
#ifndef ZV_CORE_LE_BYTES_H
#define ZV_CORE_LE_BYTES_H

#include <cstddef>
#include <cstdint>
#include <cstring>

// The `Count`-byte little-endian number at p, and its store. On a little-endian host that is
// one unaligned copy, which decoding a run of records from one local pointer needs to be fast;
// elsewhere the bytes are assembled one by one.
template <int Count>
inline std::uint64_t zvLoadLE(const unsigned char* p) {
#if defined(__BYTE_ORDER__) && __BYTE_ORDER__ == __ORDER_LITTLE_ENDIAN__
  std::uint64_t v = 0;
  std::memcpy(&v, p, Count);
#else
  std::uint64_t v = 0;
  for (int i = 0; i < Count; ++i)
    v |= static_cast<std::uint64_t>(p[i]) << (8 * i);
#endif
  return v;
}

template <int Count>
inline unsigned char* zvStoreLE(unsigned char* p, std::uint64_t v) {
#if defined(__BYTE_ORDER__) && __BYTE_ORDER__ == __ORDER_LITTLE_ENDIAN__
  std::memcpy(p, &v, Count);
#else
  for (int i = 0; i < Count; ++i)
    p[i] = static_cast<unsigned char>(v >> (8 * i));
#endif
  return p + Count;
}

class ZvByteWriter {
 public:
  explicit ZvByteWriter(void* block) : start_(static_cast<unsigned char*>(block)), at_(start_) {}

  // Each write goes through a local pointer: stores through the block's unsigned char pointer
  // could alias the member, which would keep the compiler from merging a field's byte stores
  // into one.
  void U8(std::uint8_t v) { *at_++ = v; }
  void U16(std::uint16_t v) { at_ = zvStoreLE<2>(at_, v); }
  void U32(std::uint32_t v) { at_ = zvStoreLE<4>(at_, v); }
  void U64(std::uint64_t v) { at_ = zvStoreLE<8>(at_, v); }
  // The bit pattern of the float stored at `f`.
  void F32(const float* f) {
    std::uint32_t bits;
    std::memcpy(&bits, f, 4);
    U32(bits);
  }
  void Bytes(const void* data, std::size_t count) {
    if (count) std::memcpy(at_, data, count);
    at_ += count;
  }
  // The next `count` bytes, for a nested block that its own writer fills; the writer moves past
  // them.
  unsigned char* Run(std::size_t count) {
    unsigned char* p = at_;
    at_ += count;
    return p;
  }
  std::size_t Written() const { return static_cast<std::size_t>(at_ - start_); }

 private:
  unsigned char* start_;
  unsigned char* at_;
};

class ZvByteReader {
 public:
  // Unbounded: the caller vouches for the block.
  explicit ZvByteReader(const void* block)
      : start_(static_cast<const unsigned char*>(block)), at_(start_), left_(0), bounded_(false) {}
  // Bounded to `size` bytes.
  ZvByteReader(const void* block, std::size_t size)
      : start_(static_cast<const unsigned char*>(block)),
        at_(start_),
        left_(size),
        bounded_(true) {}

  // Whether `count` more bytes may be read. The count is 64-bit so that a caller can ask for
  // products of stored counts without overflowing first.
  bool Has(std::uint64_t count) const { return !bounded_ || count <= left_; }

  // Reads without asking: the caller asked Has() for the run first.
  std::uint8_t U8() { return *Take(1); }
  std::uint16_t U16() { return static_cast<std::uint16_t>(zvLoadLE<2>(Take(2))); }
  std::uint32_t U32() { return static_cast<std::uint32_t>(zvLoadLE<4>(Take(4))); }
  std::uint64_t U64() { return zvLoadLE<8>(Take(8)); }
  // Stores the next 32-bit pattern into the float at `f`.
  void F32(float* f) {
    const std::uint32_t bits = U32();
    std::memcpy(f, &bits, 4);
  }
  void Skip(std::size_t count) { Take(count); }
  // The next `count` bytes where they lie, without a copy.
  const unsigned char* Bytes(std::size_t count) { return Take(count); }
  // A reader of the next `count` bytes alone, bounded like this one; this one does not move.
  // A nested block is read through it so that its contents cannot reach past its own length.
  ZvByteReader Part(std::size_t count) const {
    return bounded_ ? ZvByteReader(at_, count) : ZvByteReader(at_);
  }

  std::size_t Consumed() const { return static_cast<std::size_t>(at_ - start_); }

 private:
  const unsigned char* Take(std::size_t count) {
    const unsigned char* p = at_;
    at_ += count;
    if (bounded_) left_ -= count;
    return p;
  }
  const unsigned char* start_;
  const unsigned char* at_;
  std::uint64_t left_;
  bool bounded_;
};

#endif
