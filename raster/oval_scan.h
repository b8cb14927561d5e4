// Direct scan conversion of ovals and rectangles, their distance rasters and radial fills.
//
// An oval is the ellipse inscribed in the parallelogram of three device-space points p0, p1, p2
// (p0 to p1 one side, p0 to p2 the other); a rectangle is that parallelogram. Neither needs the
// polygon sweep: an axis-aligned oval is walked in exact forward differences of its elliptic
// equation, any other oval through an implicit quadratic form, a rectangle through its four
// edges. Rows are drawing rows, stored through the raster's orientation flag; every write is
// clipped to the raster. `offset` is the pixel-centre offset, 0.5 from every caller.
#ifndef ZV_RASTER_OVAL_SCAN_H
#define ZV_RASTER_OVAL_SCAN_H

#include <zv/arrays.h>
#include <zv/point.h>
#include <zv/raster.h>

class ZvGC;
class ZvTransfo4;

// 0 plain filling; 1 also stamps a disk of the radius around every outline pixel into the
// distance raster (a running minimum of the distance to the outline); 2 and above paint the
// degenerate cases instead of refusing them.
enum OvalFillMode { OvalFillPlain = 0, OvalFillOutlineDisks = 1, OvalFillDegenerate = 2 };
// The same meanings for rectangles.
enum RectFillMode { RectFillPlain = 0, RectFillOutlineDisks = 1, RectFillDegenerate = 2 };

// An edge of a polygon of few edges, top end first.
struct S_Edge {
  double yTop;
  double yBottom;
  int xMinPixel;  // floor of the smaller end x
  int xMaxPixel;  // floor of the larger end x
  double x;       // x at the first scan row's centre
  double dxdy;    // change of x per row; 3.4028234663852886e38 for a horizontal edge
  int firstRow;   // the first row whose centre lies at or below yTop
};

// Real roots of a x^2 + b x + c, lo <= hi, in the form that avoids cancellation. 0, outputs
// untouched, when there are none.
int SolveQuadraticEquation(double& lo, double& hi, double a, double b, double c);

// Plain fills. `distance` receives the disks of mode 1 and is otherwise left alone.
template <class T>
void ScanConvertIsothetic(const ZvPoint2<float>& p0, const ZvPoint2<float>& p1,
                          const ZvPoint2<float>& p2, double offset, ZvRaster<T>& raster, T value,
                          ZvRaster<float>& distance, int radius, OvalFillMode mode);
template <class T>
void ScanConvert(const ZvPoint2<float>& p0, const ZvPoint2<float>& p1, const ZvPoint2<float>& p2,
                 double offset, ZvRaster<T>& raster, T value, ZvRaster<float>& distance, int radius,
                 OvalFillMode mode);
// The rectangle: every pixel whose centre lies in the parallelogram, edges included.
template <class T>
void ScanConvert(const ZvPoint2<float>& p0, const ZvPoint2<float>& p1, const ZvPoint2<float>& p2,
                 double offset, ZvRaster<T>& raster, T value, ZvRaster<float>& distance,
                 RectFillMode mode);

// Normalised elliptic radius (0 at the centre, 1 on the outline, never above 1) at every pixel
// inside the oval, as a running minimum: pixels outside keep what they held.
void FillDistanceRasterIsothetic(const ZvPoint2<float>& p0, const ZvPoint2<float>& p1,
                                 const ZvPoint2<float>& p2, double offset,
                                 ZvRaster<float>& distance);
void FillDistanceRaster(const ZvPoint2<float>& p0, const ZvPoint2<float>& p1,
                        const ZvPoint2<float>& p2, double offset, ZvRaster<float>& distance);

void AppendEdge(S_Edge* edges, double x0, double y0, double x1, double y1, double offset,
                unsigned int& count);
int CompareEdgesY(const void* a, const void* b);

// A (2r + 1)-square raster of the distance of each pixel from its middle pixel, within r;
// pixels beyond keep their value (the caller fills with 3.4028235e+38 first).
void DiskRasterSetup(ZvRaster<float>& disk, int radius);
// Running minimum of the disk centred on the four mirror images of (dx, dy) about the pixel
// corner (cx, cy): columns cx + dx and cx - dx - 1, rows cy + dy and cy - dy - 1 (drawing rows).
void FillDisks(int dx, int dy, double cx, double cy, int radius, const ZvRaster<float>& disk,
               ZvRaster<float>& target);

// Running minimum of the disk centred on pixel (x, row), drawing rows, clipped.
void StampDisk(const ZvRaster<float>& disk, int radius, int x, int row, ZvRaster<float>& target);

// Every pixel of the raster from the profile: `toUnit` maps a pixel centre into the frame where
// the shape is the disk (round) or the square (not round) of radius `radius` about the origin;
// pixels outside get 0, pixels inside the profile's value at the distance from the origin
// (Euclidean for the disk, the larger axis distance for the square), scaled to the pixel type.
template <class T>
void ZvRadialFillPixels(const ZvTransfo4& toUnit, const ZvPoint2dArray& profile, double radius,
                        bool round, ZvRaster<T>& raster);

// The frame of a radial fill: the context's feather profile flattened at 0.001 into `profile`,
// its largest key parameter as `radius`, and `toUnit` taking the corners a, b, c (mapped by the
// context's transform) to (-radius, -radius), (radius, -radius), (-radius, radius). 0 when the
// profile has no keys or the corners are collapsed.
int ZvRadialFillFrame(const ZvGC& gc, const ZvPoint2<float>& a, const ZvPoint2<float>& b,
                      const ZvPoint2<float>& c, ZvTransfo4& toUnit, ZvPoint2dArray& profile,
                      double& radius);

#endif
