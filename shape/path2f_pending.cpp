// Slots of ZvPath2f whose work belongs to the measuring, editing and rasterising code of paths.
//
// The virtual table is fixed, so every slot needs a body to link. Until that code is in, each of
// these answers its failure value (0, null, or its argument untouched) and changes nothing.
// Each definition here is removed when the real one arrives.
#include <zv/path2f.h>

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
