// Slots of ZvPath2f whose work belongs to the measuring, editing and rasterising code of paths.
//
// The virtual table is fixed, so every slot needs a body to link. Until that code is in, each of
// these answers its failure value (0, null, or its argument untouched) and changes nothing.
// Each definition here is removed when the real one arrives.
#include <zv/path2f.h>

// ---- Measuring ---------------------------------------------------------------------------------

ZvExtent2<float>& ZvPath2f::GetTightExtent(ZvExtent2<float>& extent) const {
  return extent;
}
ZvExtent2<double>& ZvPath2f::GetTightExtent(ZvExtent2<double>& extent) const {
  return extent;
}

int ZvPath2f::GetClosePointIndex(const ZvPoint2<float>&, double, unsigned int*) const {
  return 0;
}

unsigned int ZvPath2f::GetPointsInExtentIndices(const ZvExtent2<float>&, ZvULongArray*) const {
  return 0;
}

int ZvPath2f::IsIntersectingExtent(const ZvGC&, const ZvExtent2<float>&, int) const {
  return 0;
}

int ZvPath2f::IsInteriorIntersectingExtent(const ZvGC&, const ZvExtent2<float>&, int) const {
  return 0;
}

unsigned int ZvPath2f::IntersectSamplePointsExtent(const ZvGC&, const ZvExtent2<float>&,
                                                   ZvPoint2fArray&, ZvPointTagArray&, int) const {
  return 0;
}

unsigned int ZvPath2f::Flatten(const ZvGC&, ZvPoint2fArray&, ZvPointTagArray&) const {
  return 0;
}
unsigned int ZvPath2f::Sample(const ZvGC&, ZvPoint2fArray&, ZvPointTagArray&) const {
  return 0;
}

// ---- Rasterising -------------------------------------------------------------------------------

int ZvPath2f::Fill(const ZvGC&, ZvRaster<unsigned char>&, int (*)(), const IntBbox2l*) const {
  return 0;
}
int ZvPath2f::Fill(const ZvGC&, ZvRaster<float>&, int (*)(), const IntBbox2l*) const {
  return 0;
}
int ZvPath2f::Fill(const ZvGC&, ZvRaster<short>&, int (*)(), const IntBbox2l*) const {
  return 0;
}
int ZvPath2f::AAFill(const ZvGC&, ZvRaster<unsigned char>&, int (*)(), const IntBbox2l*) const {
  return 0;
}
int ZvPath2f::AAFill(const ZvGC&, ZvRaster<float>&, int (*)(), const IntBbox2l*) const {
  return 0;
}
int ZvPath2f::AAFill(const ZvGC&, ZvRaster<short>&, int (*)(), const IntBbox2l*) const {
  return 0;
}
int ZvPath2f::SoftFill(const ZvGC&, ZvRaster<unsigned char>&, int (*)()) const {
  return 0;
}
int ZvPath2f::SoftFill(const ZvGC&, ZvRaster<float>&, int (*)()) const {
  return 0;
}
int ZvPath2f::SoftFill(const ZvGC&, ZvRaster<short>&, int (*)()) const {
  return 0;
}
int ZvPath2f::Stroke(const ZvGC&, ZvRaster<unsigned char>&) const {
  return 0;
}

// ---- Editing -----------------------------------------------------------------------------------

int ZvPath2f::ReplaceSegment(unsigned int, const ZvPoint2<float>*, unsigned int) {
  return 0;
}
int ZvPath2f::ReplaceSubpathSection(unsigned int, unsigned int) {
  return 0;
}
int ZvPath2f::ReplaceSubpathSection(unsigned int, unsigned int, const ZvPoint2<float>&,
                                    const ZvPoint2<float>&) {
  return 0;
}
int ZvPath2f::ReplaceSubpathSection(unsigned int, unsigned int, const ZvPath2f&, unsigned int,
                                    unsigned int) {
  return 0;
}
int ZvPath2f::RemoveSubpath(unsigned int) {
  return 0;
}
int ZvPath2f::RemoveSubpathSection(unsigned int, unsigned int) {
  return 0;
}
