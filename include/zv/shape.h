// ZvShape2f: the abstract two-dimensional shape.
//
// Every shape answers the same forty virtual operations (points, extents, hit tests, transforms,
// flattening, sampling, rasterising, persistence) and carries one recursive lock, taken by each
// public operation, queries included. A caller that needs several calls to see one state holds
// Lock() across them. Operations on two shapes lock `this` first, then the other.
//
// The concrete kinds are ZvPath2f, ZvRect2f, ZvOval2f and ZvPath2fProp1d. The order of the
// virtual operations below is the order of the virtual table and is part of the binary
// interface: new virtual operations are never inserted among them.
//
// Persistence. A shape's block is a 32-bit little-endian body length (the prefix, 4 bytes,
// counting the body only) followed by the body, which begins with a 32-bit kind word whose low
// 16 bits name the kind. Writers produce the whole block; readers take the body.
#ifndef ZV_SHAPE_H
#define ZV_SHAPE_H

#include <zv/api.h>
#include <zv/arrays.h>
#include <zv/critical_section.h>
#include <zv/point.h>
#include <zv/raster.h>

#include <cstddef>

class ZvGC;
class ZvTransfo4;
struct IntBbox2l;  // the host's integer box; fills read its width, height and origin

class ZV_API ZvShape2f {
 public:
  // Also the kind word of every shape block.
  enum Kind { KindNone = 0, KindPath = 1, KindRect = 2, KindOval = 3, KindPathProp = 4 };

  ZvShape2f() : lockCount(0) {}
  // A copy has a lock of its own, not held.
  ZvShape2f(const ZvShape2f&) : lockCount(0) {}

  // ---- Virtual operations, in virtual-table order ------------------------------------------
  // Copies nothing at this level: passes through both locks, this shape's first.
  virtual ZvShape2f& operator=(const ZvShape2f& other);
  virtual ~ZvShape2f();
  // The object itself if `kind` is its own kind, else null.
  virtual ZvShape2f* QueryShapeKind(Kind kind) const = 0;
  // A new shape owned by the caller; null if it could not be built.
  virtual ZvShape2f* Clone() const = 0;
  virtual unsigned int NumPoints() const = 0;
  // Each returns its argument.
  virtual ZvExtent2<float>& GetExtent(ZvExtent2<float>& extent) const = 0;
  virtual ZvExtent2<double>& GetExtent(ZvExtent2<double>& extent) const = 0;
  virtual ZvExtent2<float>& GetTightExtent(ZvExtent2<float>& extent) const = 0;
  virtual ZvExtent2<double>& GetTightExtent(ZvExtent2<double>& extent) const = 0;
  // 1 if index < NumPoints(), else 0 with `point` untouched.
  virtual int GetPoint(unsigned int index, ZvPoint2<float>& point) const = 0;
  // No test of the index.
  virtual ZvPoint2<float> GetPoint(unsigned int index) const = 0;
  // Points first..last inclusive into `dst`; returns `dst`. No test of the range.
  virtual ZvPoint2<float>* GetPoints(unsigned int first, unsigned int last,
                                     ZvPoint2<float>* dst) const = 0;
  virtual ZvPoint2<double>* GetPoints(unsigned int first, unsigned int last,
                                      ZvPoint2<double>* dst) const = 0;
  virtual int GetClosePointIndex(const ZvPoint2<float>& point, double size,
                                 unsigned int* index) const = 0;
  // Number of indices added.
  virtual unsigned int GetPointsInExtentIndices(const ZvExtent2<float>& extent,
                                                ZvULongArray* indices) const = 0;
  virtual int IsIntersectingExtent(const ZvGC& gc, const ZvExtent2<float>& extent,
                                   int noQuickReject) const = 0;
  virtual int IsInteriorIntersectingExtent(const ZvGC& gc, const ZvExtent2<float>& extent,
                                           int noQuickReject) const = 0;
  // Number of points added.
  virtual unsigned int IntersectSamplePointsExtent(const ZvGC& gc, const ZvExtent2<float>& extent,
                                                   ZvPoint2fArray& points, ZvPointTagArray& tags,
                                                   int noQuickReject) const = 0;
  // Transforms change the shape in place and return it.
  virtual ZvShape2f& Translate(const ZvPoint2<float>& offset) = 0;
  virtual ZvShape2f& Rotate(double degrees, const ZvPoint2<float>& center) = 0;
  virtual ZvShape2f& Scale(double sx, double sy, const ZvPoint2<float>& center) = 0;
  virtual ZvShape2f& ShearX(double a, double b) = 0;
  virtual ZvShape2f& ShearY(double a, double b) = 0;
  virtual ZvShape2f& Transform(const ZvTransfo4& transform) = 0;
  // Number of points added to the caller's arrays.
  virtual unsigned int Flatten(const ZvGC& gc, ZvPoint2fArray& points,
                               ZvPointTagArray& tags) const = 0;
  virtual unsigned int Sample(const ZvGC& gc, ZvPoint2fArray& points,
                              ZvPointTagArray& tags) const = 0;
  // Rasterising, in the pixels of `raster` after gc.transform (see gc.h). Each overwrites the
  // pixels it touches with its coverage (full scale: 255, 1.0 or 16384) and leaves the rest
  // as they were. The callback, called after each row, may end a fill early by answering
  // non-zero; what is painted stays. Result 1 when the fill ran to its end; 0 when the shape
  // misses the raster or the callback ended it.
  virtual int Fill(const ZvGC& gc, ZvRaster<unsigned char>& raster, int (*callback)(),
                   const IntBbox2l* box) const = 0;
  virtual int Fill(const ZvGC& gc, ZvRaster<float>& raster, int (*callback)(),
                   const IntBbox2l* box) const = 0;
  virtual int Fill(const ZvGC& gc, ZvRaster<short>& raster, int (*callback)(),
                   const IntBbox2l* box) const = 0;
  virtual int AAFill(const ZvGC& gc, ZvRaster<unsigned char>& raster, int (*callback)(),
                     const IntBbox2l* box) const = 0;
  virtual int AAFill(const ZvGC& gc, ZvRaster<float>& raster, int (*callback)(),
                     const IntBbox2l* box) const = 0;
  virtual int AAFill(const ZvGC& gc, ZvRaster<short>& raster, int (*callback)(),
                     const IntBbox2l* box) const = 0;
  // SoftFill blurs over gc.featherInner + gc.featherOuter pixels; a width that is no number or
  // above 2^20 pixels is refused (0, raster untouched).
  virtual int SoftFill(const ZvGC& gc, ZvRaster<unsigned char>& raster,
                       int (*callback)()) const = 0;
  virtual int SoftFill(const ZvGC& gc, ZvRaster<float>& raster, int (*callback)()) const = 0;
  virtual int SoftFill(const ZvGC& gc, ZvRaster<short>& raster, int (*callback)()) const = 0;
  virtual int Stroke(const ZvGC& gc, ZvRaster<unsigned char>& raster) const = 0;
  // Persistence: bytes written and needed include the length prefix; the reader takes the body
  // and answers the body bytes consumed, or 0.
  virtual unsigned int WriteToBuffer(void* buffer) const = 0;
  virtual unsigned int GetBufferSize() const = 0;
  virtual unsigned int ReadFromBufferBody(const void* body) = 0;

  // ---- The lock ----------------------------------------------------------------------------
  // Recursive; usable on a const shape. GetLockCount reads the count of holds inside the lock.
  void Lock() const;
  void Unlock() const;
  unsigned int GetLockCount() const;

  // Does the shape's extent, mapped by the context's transform, touch `extent`? Touching counts.
  // An Infinite argument answers 1; an Empty mapped extent 0; an Infinite mapped extent 1 unless
  // the argument is Empty.
  int IsRasterExtentIntersecting(const ZvGC& gc, const ZvExtent2<float>& extent) const;

 private:
  mutable ZvCriticalSection cs;
  mutable unsigned int lockCount;
};

// Size of the body length prefix of every shape block: 4.
ZV_API unsigned int ZvShape2f_GetBufferBodyLengthSize();
// The kind named by a body; KindNone for an unknown code.
ZV_API ZvShape2f::Kind ZvShape2f_GetKindFromBufferBody(const void* body);
// The factories' shapes are new objects owned by the caller, who deletes them.
// Builds the shape a trusted body describes. `consumed` receives the body bytes read. Null, with
// `consumed` 0, for an unknown kind, a body its reader refuses or a failed allocation: nothing is
// thrown.
ZV_API ZvShape2f* ZvShape2f_CreateFromBufferBody(const void* body, unsigned int& consumed);
// The same for a whole block of `size` bytes from an untrusted source (a file, the network):
// the block is refused when its length prefix exceeds `size`, when its contents would be read
// past the block's end, or when it describes a shape that breaks the kind's own rules (for a
// path: segment codes that do not parse, or lock bits). On success `consumed` is the size of the
// whole block, prefix included, so that a caller can step to what follows; on failure null and 0.
ZV_API ZvShape2f* ZvShape2f_CreateFromBuffer(const void* buffer, std::size_t size,
                                             unsigned int& consumed);

#endif
