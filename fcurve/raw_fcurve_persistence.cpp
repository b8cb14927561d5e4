// Persistence of the raw curve: the block comes with curve persistence. Until then each of these
// refuses with 0 and changes nothing.
#include <zv/raw_fcurve.h>

unsigned int ZvRawFCurve::GetBufferSize() const {
  return 0;
}
unsigned int ZvRawFCurve::WriteToBuffer(void*) const {
  return 0;
}
unsigned int ZvRawFCurve::ReadFromBufferBody(const void*) {
  return 0;
}
