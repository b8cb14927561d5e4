// One structural change of a path's two arrays, prepared and then applied.
//
// An edit removes a run of points and opens a gap for new ones at the same place, at most once.
// The constructor allocates whatever the new length needs, for both arrays, before anything
// changes, so that an edit which runs out of memory leaves its path as it was; Apply allocates
// nothing. An edit therefore builds its splice before its first change and applies it at the
// step that removes or inserts.
#ifndef ZV_SHAPE_PATH_SPLICE_H
#define ZV_SHAPE_PATH_SPLICE_H

#include <zv/arrays.h>

#include <memory>

class ZvPathSplice {
 public:
  ZvPathSplice(ZvPoint2fArray& points, ZvUByteArray& codes, unsigned int at,
               unsigned int removeCount, unsigned int insertCount)
      : points_(points), codes_(codes), at_(at), remove_(removeCount), insert_(insertCount) {
    const unsigned int n = points.size - removeCount + insertCount;
    pointBlock_.reset(points.SpliceBlock(n));
    codeBlock_.reset(codes.SpliceBlock(n));
  }

  // Replaces the run by a gap of unset points and codes at `at`, to be filled by the caller
  // before anything reads the codes.
  void Apply() {
    points_.Splice(at_, remove_, insert_, pointBlock_.release());
    codes_.Splice(at_, remove_, insert_, codeBlock_.release());
  }

 private:
  ZvPoint2fArray& points_;
  ZvUByteArray& codes_;
  unsigned int at_, remove_, insert_;
  std::unique_ptr<ZvPoint2<float>[]> pointBlock_;
  std::unique_ptr<unsigned char[]> codeBlock_;
};

#endif
