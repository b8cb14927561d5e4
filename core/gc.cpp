// ZvGC defaults and copying.
#include <zv/gc.h>

namespace {

// The default feather profile: one cubic segment from value 1 at 0 to value 0 at 1, its handles
// at the thirds of the chord, so the weight falls evenly from the centre to the filter's edge.
ZvStdFCurve DefaultFeatherProfile() {
  return ZvStdFCurve(0.0, 1.0, 1.0, 0.0);
}

}  // namespace

ZvGC::ZvGC()
    : flattenTolerance(1.0),
      sampleSpacing(1.0),
      propertyTolerance(0.1),
      defaultProperty(1.0),
      pointMergeDistance(0.5),
      fitTolerance(0.82139380484),
      miterLimit(1.0),
      lineWidth(1.0),
      featherInner(0.0),
      featherOuter(0.0),
      featherRadius(0),
      samplingRate(4),
      opacity(1.0),
      fillRule(1),
      capStyle(2),
      joinStyle(1),
      taper(0),
      clipToShape(1),
      transform(),
      featherProfile(DefaultFeatherProfile()) {}

ZvGC::ZvGC(const ZvGC& other) = default;

ZvGC& ZvGC::operator=(const ZvGC& other) = default;

ZvGC::~ZvGC() {}
