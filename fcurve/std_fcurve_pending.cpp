// Operations of the standard curve that are not built yet: snapshots, cut and paste, key
// reduction, flattening and sampling through the flattened curve, mirroring and scaling about
// a pivot, and persistence. Each refuses with 0 (or null) and changes nothing.
#include <zv/std_fcurve.h>

ZvBaseFCurve* ZvStdFCurve::SnapShot(double, double, ExtrapolationMethod) const {
  return nullptr;
}
unsigned int ZvStdFCurve::Cut(double, double, ZvBaseFCurve&) {
  return 0;
}
unsigned int ZvStdFCurve::Append(const ZvBaseFCurve&) {
  return 0;
}
unsigned int ZvStdFCurve::Paste(const ZvBaseFCurve&, double, double) {
  return 0;
}
unsigned int ZvStdFCurve::ReduceNumKeys(double, double, double) {
  return 0;
}
unsigned int ZvStdFCurve::MirrorParameters() {
  return 0;
}
unsigned int ZvStdFCurve::ScaleAndOffsetParameters(double, double, double, double, double, int, int,
                                                   RegionHandle) {
  return 0;
}
unsigned int ZvStdFCurve::GetBufferSize() const {
  return 0;
}
unsigned int ZvStdFCurve::WriteToBuffer(void*) const {
  return 0;
}
unsigned int ZvStdFCurve::ReadFromBufferBody(const void*) {
  return 0;
}
