// Growable typed arrays.
//
// Every array has three public fields, in this order: `size` (elements in use), `capacity`
// (elements allocated) and `data` (a block from array new, owned). Capacity moves only by
// doubling and by truncating halving, so appending is amortised constant time and a 5-element
// block grows to 10 and shrinks to 2. There is no bounds check: reading past `size` is a
// programming error. Any operation that changes `size`, except `Chop`, may move `data`.
//
// An allocation failure raises std::bad_alloc; `size` may already have changed at that moment
// and the array must then be treated as unusable.
#ifndef ZV_ARRAYS_H
#define ZV_ARRAYS_H

#include <zv/point.h>

#include <cstring>
#include <new>

// Marks a vertex of a flattened polyline.
enum ZvPointTag {
  ZvPointTag_First = 0,     // first vertex of a polyline piece
  ZvPointTag_Continue = 1,  // continuation vertex
  ZvPointTag_Last = 2       // last vertex of a polyline piece
};

namespace zv_detail {

// How a block of elements is made, copied and cleared. Plain values move with memcpy; the point
// arrays and record arrays zero every fresh block; class elements are default-constructed and
// copied by assignment.
template <class T, bool ZeroFill, bool ClearFreed = false>
struct PlainBlock {
  static T* Allocate(unsigned int n) {
    T* p = new T[n];
    if (ZeroFill) std::memset(static_cast<void*>(p), 0, sizeof(T) * n);
    return p;
  }
  static void Copy(T* dst, const T* src, unsigned int n) {
    if (n) std::memcpy(static_cast<void*>(dst), static_cast<const void*>(src), sizeof(T) * n);
  }
  static void Move(T* dst, const T* src, unsigned int n) {
    if (n) std::memmove(static_cast<void*>(dst), static_cast<const void*>(src), sizeof(T) * n);
  }
  // Record arrays zero the slots they open or free, so a key never carries stale bytes.
  static void Clear(T* p, unsigned int n) {
    if (ClearFreed && n) std::memset(static_cast<void*>(p), 0, sizeof(T) * n);
  }
};

template <class T>
struct ObjectBlock {
  static T* Allocate(unsigned int n) { return new T[n]; }
  static void Copy(T* dst, const T* src, unsigned int n) {
    for (unsigned int i = 0; i < n; ++i)
      dst[i] = src[i];
  }
  static void Move(T* dst, const T* src, unsigned int n) {
    if (dst < src) {
      for (unsigned int i = 0; i < n; ++i)
        dst[i] = src[i];
    } else {
      for (unsigned int i = n; i-- > 0;)
        dst[i] = src[i];
    }
  }
  static void Clear(T*, unsigned int) {}
};

// The one implementation of the capacity rule and of every editing operation. Self is the
// concrete array, so that operations taking "another array" take exactly that class.
template <class Self, class T, class Block>
class ArrayBase {
 public:
  unsigned int size;
  unsigned int capacity;
  T* data;

  explicit ArrayBase(unsigned int cap = 1) : size(0), capacity(cap ? cap : 1), data(nullptr) {
    data = Block::Allocate(capacity);
  }
  ArrayBase(const T& value, unsigned int cap) : size(1), capacity(cap ? cap : 1), data(nullptr) {
    data = Block::Allocate(capacity);
    data[0] = value;
  }
  // A count of 0 leaves a capacity of 0: such an array must not be appended to.
  ArrayBase(const T* values, unsigned int count) : size(count), capacity(count), data(nullptr) {
    data = Block::Allocate(count);
    Block::Copy(data, values, count);
  }
  ArrayBase(const ArrayBase& other) : size(other.size), capacity(other.capacity), data(nullptr) {
    data = Block::Allocate(capacity);
    Block::Copy(data, other.data, size);
  }
  ~ArrayBase() {
    delete[] data;
    data = nullptr;
  }
  ArrayBase& operator=(const ArrayBase& other) {
    if (this == &other) return *this;
    T* block = Block::Allocate(other.capacity);
    Block::Copy(block, other.data, other.size);
    delete[] data;
    data = block;
    size = other.size;
    capacity = other.capacity;
    return *this;
  }

  T& operator[](unsigned int i) { return data[i]; }
  const T& operator[](unsigned int i) const { return data[i]; }

  // Sets size to n. Storage stays when n fits and the array stays more than half full;
  // otherwise capacity is halved until it is at most n, doubled until it holds n, and the
  // elements move to a fresh block.
  void Resize(unsigned int n) {
    const unsigned int old = size;
    size = n;
    if ((capacity >> 1) < n && n <= capacity) return;
    if (n > 0x80000000u) throw std::bad_alloc();
    const unsigned int cap = HalvedOrDoubled(capacity, n);
    T* block = Block::Allocate(cap);
    Block::Copy(block, data, old < n ? old : n);
    delete[] data;
    data = block;
    capacity = cap;
  }

  // Replacing a run in two steps, for a caller that changes several arrays together and must
  // allocate for all of them before changing any. SpliceBlock answers the block that a size of
  // n moves to (a larger one when n does not fit, a smaller one when less than half of the
  // present block would be used, as removals shrink) or null when the present block serves; it
  // may throw and changes nothing. Splice then replaces `removeCount` elements at `at` by
  // `insertCount` unset ones for the caller to fill (zeroed in record arrays), taking over the
  // block SpliceBlock answered for the same n; it allocates nothing.
  T* SpliceBlock(unsigned int n) const {
    if ((capacity >> 1) <= n && n <= capacity) return nullptr;
    if (n > 0x80000000u) throw std::bad_alloc();
    return Block::Allocate(HalvedOrDoubled(capacity, n));
  }
  void Splice(unsigned int at, unsigned int removeCount, unsigned int insertCount, T* block) {
    const unsigned int n = size - removeCount + insertCount;
    const unsigned int tail = size - at - removeCount;
    if (block) {
      Block::Copy(block, data, at);
      Block::Copy(block + at + insertCount, data + at + removeCount, tail);
      delete[] data;
      data = block;
      capacity = HalvedOrDoubled(capacity, n);
    } else {
      Block::Move(data + at + insertCount, data + at + removeCount, tail);
      if (n < size) Block::Clear(data + n, size - n);
    }
    Block::Clear(data + at, insertCount);
    size = n;
  }

  void Chop(unsigned int n) {
    if (size > n) size = n;
  }
  void ChopAndResize(unsigned int n) {
    if (size > n) Resize(n);
  }

  void Add(const T& value) {
    if (size < capacity) {
      data[size++] = value;
      return;
    }
    AddGrowing(value);
  }
  void Add(const Self& other) { Add(other.data, other.size); }
  void Add(const T* values, unsigned int count) {
    // An array may append a run of its own elements: find the run again after the move.
    const bool own = Aliases(values);
    const unsigned int offset = own ? static_cast<unsigned int>(values - data) : 0;
    const unsigned int at = size;
    Resize(size + count);
    Block::Copy(data + at, own ? data + offset : values, count);
  }

  void InsertBefore(unsigned int index, const T& value) {
    const T copy(value);
    const unsigned int old = size;
    Resize(size + 1);
    Block::Move(data + index + 1, data + index, old - index);
    Block::Clear(data + index, 1);
    data[index] = copy;
  }
  void InsertBefore(unsigned int index, const Self& other) {
    if (&other == this) {
      const Self copy(other);
      InsertBefore(index, copy.data, copy.size);
    } else {
      InsertBefore(index, other.data, other.size);
    }
  }
  void InsertBefore(unsigned int index, const T* values, unsigned int count) {
    const unsigned int old = size;
    Resize(size + count);
    Block::Move(data + index + count, data + index, old - index);
    Block::Copy(data + index, values, count);
  }

  // A capacity-1 array only drops its count; the element stays where it was.
  void Remove(unsigned int index) {
    if (size == 0) return;
    if (capacity > 1 && index + 1 < size)
      Block::Move(data + index, data + index + 1, size - index - 1);
    --size;
    Block::Clear(data + size, 1);
    ShrinkIfSparse();
  }
  void RemoveClosedRange(unsigned int first, unsigned int last) {
    const unsigned int count = last - first + 1;
    Block::Move(data + first, data + last + 1, size - last - 1);
    size -= count;
    Block::Clear(data + size, count);
    ShrinkIfSparse();
  }

 protected:
  bool Aliases(const T* p) const { return p >= data && p < data + size; }

 private:
  // The capacity a fresh block for n elements gets: halved until at most n, then doubled until
  // it holds n. A capacity of 0 would never double; it starts again from 1.
  static unsigned int HalvedOrDoubled(unsigned int cap, unsigned int n) {
    while (cap > n)
      cap >>= 1;
    while (cap < n)
      cap = cap ? cap << 1 : 1;
    return cap ? cap : 1;
  }
  void AddGrowing(const T& value) {
    // The value may live in the block that Resize is about to free.
    if (Aliases(&value)) {
      const T copy(value);
      Resize(size + 1);
      data[size - 1] = copy;
    } else {
      Resize(size + 1);
      data[size - 1] = value;
    }
  }
  void ShrinkIfSparse() {
    if (size < (capacity >> 1)) Resize(size);
  }
};

// The plane point arrays add coordinate pairs and closed ranges of another array.
template <class Self, class T>
class Point2ArrayBase : public ArrayBase<Self, ZvPoint2<T>, PlainBlock<ZvPoint2<T>, true>> {
  using Base = ArrayBase<Self, ZvPoint2<T>, PlainBlock<ZvPoint2<T>, true>>;

 public:
  using Base::Add;
  using Base::Base;
  // Double coordinates narrow to the element type.
  void Add(double x, double y) { Base::Add(ZvPoint2<T>{static_cast<T>(x), static_cast<T>(y)}); }
  // Appends other[first..last]. first > last grows by the wrapped count and copies nothing,
  // so callers keep first at most last.
  void Add(const Self& other, unsigned int first, unsigned int last) {
    const unsigned int count = last - first + 1;
    if (first > last) {
      this->Resize(this->size + count);
      return;
    }
    Base::Add(other.data + first, count);
  }
};

}  // namespace zv_detail

// Arrays of plain values. The `private: using` lines withhold operations a class does not offer.

class ZvPoint2fArray : public zv_detail::Point2ArrayBase<ZvPoint2fArray, float> {
 public:
  using Point2ArrayBase::Point2ArrayBase;
};

class ZvPoint2dArray : public zv_detail::Point2ArrayBase<ZvPoint2dArray, double> {
 public:
  using Point2ArrayBase::Point2ArrayBase;

 private:
  using Point2ArrayBase::RemoveClosedRange;
};

class ZvPoint3fArray : public zv_detail::ArrayBase<ZvPoint3fArray, ZvPoint3<float>,
                                                   zv_detail::PlainBlock<ZvPoint3<float>, true>> {
 public:
  using ArrayBase::ArrayBase;

 private:
  using ArrayBase::RemoveClosedRange;
};

class ZvPoint3dArray : public zv_detail::ArrayBase<ZvPoint3dArray, ZvPoint3<double>,
                                                   zv_detail::PlainBlock<ZvPoint3<double>, true>> {
 public:
  using ArrayBase::Add;
  using ArrayBase::ArrayBase;
  void Add(double x, double y, double z) { ArrayBase::Add(ZvPoint3<double>{x, y, z}); }
};

class ZvPointTagArray : public zv_detail::ArrayBase<ZvPointTagArray, ZvPointTag,
                                                    zv_detail::PlainBlock<ZvPointTag, false>> {
 public:
  using ArrayBase::ArrayBase;

 private:
  using ArrayBase::InsertBefore;
  using ArrayBase::Remove;
  using ArrayBase::RemoveClosedRange;
};

class ZvULongArray : public zv_detail::ArrayBase<ZvULongArray, unsigned int,
                                                 zv_detail::PlainBlock<unsigned int, false>> {
 public:
  using ArrayBase::ArrayBase;

 private:
  using ArrayBase::RemoveClosedRange;
};

class ZvUByteArray : public zv_detail::ArrayBase<ZvUByteArray, unsigned char,
                                                 zv_detail::PlainBlock<unsigned char, false>> {
 public:
  using ArrayBase::ArrayBase;
};

class ZvUShortArray : public zv_detail::ArrayBase<ZvUShortArray, unsigned short,
                                                  zv_detail::PlainBlock<unsigned short, false>> {
 public:
  using ArrayBase::ArrayBase;
};

class ZvDoubleArray
    : public zv_detail::ArrayBase<ZvDoubleArray, double, zv_detail::PlainBlock<double, false>> {
 public:
  using ArrayBase::ArrayBase;
};

class ZvFloatArray
    : public zv_detail::ArrayBase<ZvFloatArray, float, zv_detail::PlainBlock<float, false>> {
 public:
  using ArrayBase::ArrayBase;

 private:
  using ArrayBase::InsertBefore;
  using ArrayBase::Remove;
  using ArrayBase::RemoveClosedRange;
};

// The pointers are not owned.
class ZvLPVoidArray
    : public zv_detail::ArrayBase<ZvLPVoidArray, void*, zv_detail::PlainBlock<void*, false>> {
 public:
  using ArrayBase::ArrayBase;
};

// A Boolean is a 32-bit integer here.
class ZvBoolArray
    : public zv_detail::ArrayBase<ZvBoolArray, int, zv_detail::PlainBlock<int, false>> {
 public:
  using ArrayBase::ArrayBase;

 private:
  using ArrayBase::InsertBefore;
  using ArrayBase::RemoveClosedRange;
};

// Elements with constructors: each slot of a fresh block is default-constructed and elements
// are copied by assignment.
template <class T>
class ZvDynArray : public zv_detail::ArrayBase<ZvDynArray<T>, T, zv_detail::ObjectBlock<T>> {
  using Base = zv_detail::ArrayBase<ZvDynArray<T>, T, zv_detail::ObjectBlock<T>>;

 public:
  using Base::Base;
};

// Plain records moved by memory copy (the keys of the function curves). Fresh blocks, opened
// slots and freed slots are zero-filled.
template <class T>
class ZvAltDynArray
    : public zv_detail::ArrayBase<ZvAltDynArray<T>, T, zv_detail::PlainBlock<T, true, true>> {
  using Base = zv_detail::ArrayBase<ZvAltDynArray<T>, T, zv_detail::PlainBlock<T, true, true>>;

 public:
  using Base::Base;
};

#endif
