// Persistence of the boolean and integer curves: the blocks come with curve persistence. Until
// then each of these refuses with 0 and changes nothing.
#include <zv/step_fcurve.h>

unsigned int ZvBooleanFCurve::GetBufferSize() const {
  return 0;
}
unsigned int ZvBooleanFCurve::WriteToBuffer(void*) const {
  return 0;
}
unsigned int ZvBooleanFCurve::ReadFromBufferBody(const void*) {
  return 0;
}
unsigned int ZvIntegerFCurve::GetBufferSize() const {
  return 0;
}
unsigned int ZvIntegerFCurve::WriteToBuffer(void*) const {
  return 0;
}
unsigned int ZvIntegerFCurve::ReadFromBufferBody(const void*) {
  return 0;
}
