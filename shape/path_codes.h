// The segment codes of ZvPath2f, decoded once into a table.
//
// A segment of degree d carries codes base(d) .. base(d)+d-1 on its d points, base(d) being
// d(d+1)/2 + 2, and its end node carries base(d)+d instead when it closes the subpath. Code 1
// starts a subpath; 0, 2 and everything above 46 are illegal.
#ifndef ZV_SHAPE_PATH_CODES_H
#define ZV_SHAPE_PATH_CODES_H

#include <cstdint>

namespace zv_path {

constexpr unsigned char kStart = 1;
constexpr unsigned char kCodeMask = 0x3f;  // bits 0..5: the segment code
constexpr unsigned char kG1Lock = 0x80;    // bit 7: the node's tangent lock, never persisted
constexpr unsigned char kKeepBits = 0xc0;  // bits 6 and 7 survive a rewritten code
constexpr unsigned int kMaxDegree = 8;

constexpr unsigned int Base(unsigned int degree) {
  return degree * (degree + 1) / 2 + 2;
}

// The closed end codes relative to code 4: bits 0, 3, 7, 12, 18, 25, 33 and 42.
constexpr std::uint64_t kClosedEndMask = 4406670266505ull;

constexpr bool IsClosedEnd(unsigned int code) {
  return code >= 4 && code - 4 <= 42 && ((kClosedEndMask >> (code - 4)) & 1u);
}

// Degree and position k (1..d) of a code inside its segment; a closed end code is at k = d.
// Code 1 and the illegal codes have degree 0.
struct CodeInfo {
  unsigned char degree = 0;
  unsigned char position = 0;
};

struct CodeTable {
  CodeInfo info[64];
  constexpr CodeTable() : info() {
    for (unsigned int d = 1; d <= kMaxDegree; ++d) {
      for (unsigned int k = 1; k <= d; ++k)
        info[Base(d) + k - 1] =
            CodeInfo{static_cast<unsigned char>(d), static_cast<unsigned char>(k)};
      info[Base(d) + d] = CodeInfo{static_cast<unsigned char>(d), static_cast<unsigned char>(d)};
    }
  }
};

constexpr CodeTable kCodes{};

inline CodeInfo Decode(unsigned char byte) {
  return kCodes.info[byte & kCodeMask];
}

// A node ends a segment or starts a subpath: code 1, and every code at k = d.
inline bool IsNode(unsigned char byte) {
  const unsigned int code = byte & kCodeMask;
  const CodeInfo c = kCodes.info[code];
  return code == kStart || (c.degree != 0 && c.position == c.degree);
}

// The open end node code of each degree and its closed form.
inline bool IsOpenEnd(unsigned int code) {
  const CodeInfo c = kCodes.info[code & kCodeMask];
  return c.degree != 0 && (code & kCodeMask) == Base(c.degree) + c.degree - 1;
}

// 3 -> 4, 6 -> 7, ..., 45 -> 46, bits 6 and 7 kept. Only for IsOpenEnd codes.
inline unsigned char ClosedFromOpen(unsigned char byte) {
  return static_cast<unsigned char>(byte + 1);
}
// The reverse; only for IsClosedEnd codes.
inline unsigned char OpenFromClosed(unsigned char byte) {
  return static_cast<unsigned char>(byte - 1);
}

// The handles next to a node: the first inner control point of a segment of degree 2 or more
// (codes 5, 8, 12, 17, 23, 30, 38) and the last one (5, 9, 14, 20, 27, 35, 44), as bit masks
// relative to code 5. A quadratic's single handle is both.
constexpr std::uint64_t kFirstHandleMask = 8623755401ull;
constexpr std::uint64_t kLastHandleMask = 550833783313ull;

constexpr bool InHandleMask(std::uint64_t mask, unsigned int code) {
  return code >= 5 && code - 5 <= 39 && ((mask >> (code - 5)) & 1u);
}

// Whether a subpath starts anywhere in first..last, last being an index of the path.
inline bool StartsIn(const unsigned char* codes, unsigned int first, unsigned int last) {
  for (unsigned int i = first; i <= last; ++i)
    if ((codes[i] & kCodeMask) == kStart) return true;
  return false;
}

// The end node byte of a rewritten segment whose end node had `old`: the open code given, made
// the closed one when `old` closed its subpath, and bits 6 and 7 of `old` kept.
inline unsigned char EndNodeByte(unsigned int openCode, unsigned char old) {
  const unsigned int closed = IsClosedEnd(old & kCodeMask) ? 1u : 0u;
  return static_cast<unsigned char>((old & kKeepBits) | (openCode + closed));
}

// 1e-7 in single precision, bounds included, on each axis.
template <class P>
bool Coincide(const P& a, const P& b) {
  const float dx = a.x - b.x, dy = a.y - b.y;
  return dx >= -1e-7f && dx <= 1e-7f && dy >= -1e-7f && dy <= 1e-7f;
}

}  // namespace zv_path

#endif
