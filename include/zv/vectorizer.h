// ZvVectorizer: tracing an 8-bit raster back into paths.
//
// Every 4-connected region of pixels equal to one value (pixels that share an edge connect,
// pixels that only touch at a corner do not) becomes one outer contour plus one contour per
// hole, exactly along pixel edges. Pixel (i, j) of the raster, raw rows (the orientation flag
// is not consulted), is the unit square [i, i + 1] x [j, j + 1]; every traced corner is an
// integer point in these pixel coordinates. Outer contours and holes run in opposite senses, so
// the traced path filled under either rule gives back the region; the even-odd rule gives it
// back pixel for pixel.
//
// The raster is read once, top row first, holding three rows of runs and the corners found so
// far: memory grows with the corners, not with the raster. A region is handed out as soon as
// its lowest row has been read, all its holes with it; regions come out in the order in which
// they end, which is why a region lower on the raster may come out before one higher up.
//
// Thresholds drop small contours: a contour whose corner polygon encloses less than the area
// threshold (pixels squared), or whose corner polygon is shorter than the perimeter threshold
// (pixels), is not output. An outer contour that fails takes its holes with it; a hole that
// fails is dropped alone. Both are kept as absolute values; a value within 1e-9 of 0 switches
// its test off. The corner polygon has a corner wherever the boundary changes direction and
// on the rows where it steps, so it measures a little less than the traced outline.
//
// Sizes. Coordinates are held in 16 bits: a raster wider or higher than 32767 pixels is out of
// range and traces nothing (the calls answer 0 and leave the path alone).
//
// An object holds only the two thresholds; a call allocates everything it needs and frees it
// before returning. Concurrent calls on one object are safe as long as nobody changes the
// thresholds meanwhile. The output path stays locked while a call appends to it, so another
// thread sees it before or after the call, never half traced. Allocation failure lets
// std::bad_alloc through; what was appended to the path by then stays.
#ifndef ZV_VECTORIZER_H
#define ZV_VECTORIZER_H

#include <zv/api.h>
#include <zv/point.h>
#include <zv/raster.h>

class ZvPath2f;
class ZvGC;

// The table through which traced contours reach their consumer, for hosts that want the corners
// without a path. Every entry may be null. `userData` is passed last to each. Order per call:
// init once, with the extent given to the call; per region newComponent, then for each contour
// moveto and a lineto per corner (the last lineto returns to the moveto point), then
// closeComponent; close once at the end. Coordinates are the integer pixel coordinates described
// above.
struct ObCallbackTable {
  void (*init)(const ZvExtent2<float>& extent, void* userData);
  void (*newComponent)(void* userData);
  void (*moveto)(int x, int y, void* userData);
  void (*lineto)(int x, int y, void* userData);
  void (*closeComponent)(void* userData);
  void (*close)(void* userData);
};

class ZV_API ZvVectorizer {
 public:
  ZvVectorizer(double perimeterThreshold, double areaThreshold);
  ~ZvVectorizer();
  ZvVectorizer(const ZvVectorizer&) = delete;
  ZvVectorizer& operator=(const ZvVectorizer&) = delete;

  void SetPerimeterThreshold(double threshold);  // pixels; stored as its absolute value
  void SetAreaThreshold(double threshold);       // square pixels; stored as its absolute value
  double GetPerimeterThreshold() const;
  double GetAreaThreshold() const;

  // Appends the contours of the regions of pixels equal to `value` to `path`, each a closed
  // polyline: a region's outer contour, then its holes. Collinear unit edges are joined, so a
  // straight side is one line. Result: the number of points appended; 0, and the path left
  // alone, when no pixel has the value, every contour fails the thresholds, or the raster is
  // out of range. `extent` is handed to the table's init entry and not otherwise used.
  unsigned int Vectorize(const ZvRaster<unsigned char>& raster, unsigned char value,
                         const ZvExtent2<float>& extent, ZvPath2f& path) const;

  // The same contours smoothed: each is resampled at every pixel step along it and fitted with
  // cubics within gc.flattenTolerance pixels (G1 inside a contour, including at its start), and
  // appended as one closed subpath. Short pieces of one or two steps stay lines or become a
  // cubic with both handles on their middle sample. Result: the number of points appended; 0
  // with the path alone when tracing found nothing.
  unsigned int VectorizeAndFit(const ZvRaster<unsigned char>& raster, unsigned char value,
                               const ZvExtent2<float>& extent, const ZvGC& gc,
                               ZvPath2f& path) const;

  // The tracing sweep with the caller's own table. Result: 1 when the raster was traced (also
  // when nothing matched), 0 for a raster out of range. An empty or out-of-range raster calls
  // no entry at all.
  int Trace(const ZvRaster<unsigned char>& raster, unsigned char value,
            const ZvExtent2<float>& extent, const ObCallbackTable& table, void* userData) const;

 private:
  struct Thresholds;
  Thresholds* thresholds;
};

#endif
