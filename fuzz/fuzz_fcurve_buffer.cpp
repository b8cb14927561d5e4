// Feeds arbitrary bytes to the bounded curve factory and, when a curve comes out, uses it the way
// hosts do: a foreign block may hold keys out of order, unknown segment kinds or extrapolation
// methods, and no query may crash on them. What the curve writes must read back and, once
// repaired, write the same bytes again.
#include <zv/std_fcurve.h>
#include <zv/transfo4.h>

#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <vector>

namespace {

void Use(const ZvBaseFCurve& curve) {
  double first = 0.0, last = 0.0;
  curve.GetSmallestKeyParameter(first);
  curve.GetLargestKeyParameter(last);
  const double span = last - first;
  for (int i = -4; i <= 20; ++i) {
    const double t = first + span * i / 16.0;
    curve.Eval(t, 1);
    curve.FoldParameter(t);
  }
  const double high = curve.GetValueUpperBound(1);
  const double low = curve.GetValueLowerBound(0);
  double parameter;
  curve.EvalInverse(0.5, parameter, 0);
  ZvDoubleArray parameters, left, right;
  curve.GetKeys(parameters, left, right, 1);
  ZvBaseFCurve::KeyInfo info;
  for (unsigned int i = 0; i < curve.GetNumKeys() && i < 64; ++i) {
    info.mask = 0x1FF;
    curve.GetKeyInfoFromIndex(i, &info);
  }
  ZvPoint2dArray points;
  ZvPointTagArray tags;
  ZvTransfo4 identity;
  // A drawing's cost grows with the curve's size over the tolerance up to the cap of 2^20
  // points, half a second under the sanitizers: the tolerance follows the size, so that the
  // drawing code is exercised rather than that cost measured.
  const double size = std::fabs(high - low) + std::fabs(span);
  const double tolerance = std::isfinite(size) ? std::fmax(0.01, size * 1e-4) : 0.01;
  if (curve.GetNumKeys() < 256) curve.Flatten(identity, tolerance, points, tags, 1);
}

std::vector<unsigned char> Write(const ZvBaseFCurve& curve) {
  std::vector<unsigned char> block(curve.GetBufferSize());
  if (curve.WriteToBuffer(block.data()) != block.size()) std::abort();
  return block;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  unsigned int consumed = 0;
  ZvBaseFCurve* curve = ZvBaseFCurve_CreateFromBuffer(data, size, consumed);
  if (!curve) {
    if (consumed != 0) std::abort();
    return 0;
  }
  if (consumed > size) std::abort();
  Use(*curve);
  // Writing repairs what reading let in (keys out of order, a store that holds nothing), so the
  // second generation's block is the one that must come back unchanged.
  std::vector<unsigned char> block = Write(*curve);
  delete curve;
  std::vector<unsigned char> previous;
  for (int generation = 0; generation < 2; ++generation) {
    unsigned int again = 0;
    ZvBaseFCurve* copy = ZvBaseFCurve_CreateFromBuffer(block.data(), block.size(), again);
    if (!copy || again != block.size()) std::abort();
    previous.swap(block);
    block = Write(*copy);
    delete copy;
  }
  if (block != previous) std::abort();
  return 0;
}
