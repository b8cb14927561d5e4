// Holds a shape's lock for a scope, counting the hold like ZvShape2f::Lock does.
#ifndef ZV_SHAPE_SHAPE_LOCK_H
#define ZV_SHAPE_SHAPE_LOCK_H

#include <zv/shape.h>

class ZvShapeLock {
 public:
  explicit ZvShapeLock(const ZvShape2f& shape) : shape_(shape) { shape_.Lock(); }
  ~ZvShapeLock() { shape_.Unlock(); }
  ZvShapeLock(const ZvShapeLock&) = delete;
  ZvShapeLock& operator=(const ZvShapeLock&) = delete;

 private:
  const ZvShape2f& shape_;
};

#endif
