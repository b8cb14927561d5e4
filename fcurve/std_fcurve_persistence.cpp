// Persistence of the standard curve, not built yet: each of these refuses with 0 and changes
// nothing.
#include <zv/std_fcurve.h>

unsigned int ZvStdFCurve::GetBufferSize() const {
  return 0;
}
unsigned int ZvStdFCurve::WriteToBuffer(void*) const {
  return 0;
}
unsigned int ZvStdFCurve::ReadFromBufferBody(const void*) {
  return 0;
}
