// Boolean masks of two shapes' aliased fills.
#include <zv/fill.h>
#include <zv/gc.h>
#include <zv/shape.h>

namespace {
template <class Keep>
void Mask(const ZvGC& gc, const ZvShape2f* a, const ZvShape2f* b, ZvRaster<unsigned char>& target,
          Keep keep) {
  if (!a || !b) return;
  const int w = target.GetWidth(), h = target.GetHeight();
  ZvRaster<unsigned char> fa(w, h, 0), fb(w, h, 0);
  a->Fill(gc, fa, nullptr, nullptr);
  b->Fill(gc, fb, nullptr, nullptr);
  const unsigned char* pa = fa.GetRaster();
  const unsigned char* pb = fb.GetRaster();
  unsigned char* out = target.GetRaster();
  for (int i = 0; i < w * h; ++i)
    if (keep(pa[i] == 255, pb[i] == 255)) out[i] = 255;
}
}  // namespace

void ZvShape2f_IntersectionAB(const ZvGC& gc, const ZvShape2f* a, const ZvShape2f* b,
                              ZvRaster<unsigned char>& target) {
  Mask(gc, a, b, target, [](bool inA, bool inB) { return inA && inB; });
}
void ZvShape2f_UnionAB(const ZvGC& gc, const ZvShape2f* a, const ZvShape2f* b,
                       ZvRaster<unsigned char>& target) {
  Mask(gc, a, b, target, [](bool inA, bool inB) { return inA || inB; });
}
void ZvShape2f_DifferenceAB(const ZvGC& gc, const ZvShape2f* a, const ZvShape2f* b,
                            ZvRaster<unsigned char>& target) {
  Mask(gc, a, b, target, [](bool inA, bool inB) { return inA && !inB; });
}
