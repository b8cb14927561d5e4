// Feeds arbitrary bytes to the bounded mip path reader and, when a sequence comes out, checks
// that it writes back to a block that reads again to the same bytes, then evaluates, copies and
// edits it the way hosts do, checking that the keys stay in strict order.
#include <zv/mip_path2f_prop1d.h>
#include <zv/path2f_prop1d.h>

#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <vector>

namespace {

std::vector<unsigned char> Write(const ZvMipPath2fProp1d& mip) {
  std::vector<unsigned char> block(mip.GetBufferSize());
  if (mip.WriteToBuffer(block.data()) != block.size()) std::abort();
  return block;
}

void CheckOrder(const ZvMipPath2fProp1d& mip) {
  ZvDoubleArray parameters;
  if (mip.GetAllKeyParameters(parameters) != mip.GetNumKeys()) std::abort();
  for (unsigned int i = 1; i < parameters.size; ++i)
    if (!(parameters[i] - parameters[i - 1] > 1e-15)) std::abort();
}

// The largest width or height of a key; 0 when none has a finite one.
double SizeOf(ZvMipP2fP1dAgent& agent, const ZvDoubleArray& parameters) {
  double size = 0.0;
  for (unsigned int i = 0; i < parameters.size; ++i) {
    ZvExtent2<double> extent;
    agent.Eval(parameters[i], 1.0, 0.1).GetExtent(extent);
    if (extent.kind != ZvExtent2<double>::Regular) continue;
    size = std::fmax(size, std::fmax(extent.xmax - extent.xmin, extent.ymax - extent.ymin));
  }
  return std::isfinite(size) ? size : 0.0;
}

void Exercise(ZvMipPath2fProp1d& mip) {
  ZvDoubleArray parameters;
  mip.GetAllKeyParameters(parameters);
  ZvMipP2fP1dAgent agent(mip);
  // Morphing costs grow with the ratio of a shape's size to the step, so the step follows the
  // size of the keys, as a host's would. The part copy evaluates its bounds at the default
  // step of 0.5, so it is made of small keys only.
  const double size = SizeOf(agent, parameters);
  const double spacing = size > 0.0 ? size * 1e-2 : 1.0;
  const unsigned int n = parameters.size;
  // The morphs between the first few keys, and beyond both ends.
  for (unsigned int i = 0; i + 1 < n && i < 4; ++i)
    agent.Eval(0.5 * (parameters[i] + parameters[i + 1]), spacing, 0.1);
  if (n) {
    agent.Eval(parameters[0] - 1.0, spacing, 0.1);
    agent.EvalInInterval(parameters[n - 1] + 1.0, parameters[0], parameters[n / 2], 0, 1, spacing,
                         0.1);
    if (size <= 1000.0)
      CheckOrder(ZvMipPath2fProp1d(mip, parameters[0] + 0.25, parameters[n - 1] - 0.25));
    agent.CreateKeyFromEvaluation(parameters[n - 1] + 2.0);
    agent.MergeAndCreateKey(parameters[0], parameters[0], parameters[n / 2],
                            agent.Eval(parameters[0], spacing, 0.1), 1, 1);
    agent.RemoveKey(parameters[n / 2], 0.5);
  }
  CheckOrder(mip);
  ZvMipPath2fProp1d copy;
  copy = mip;
  if (Write(copy) != Write(mip)) std::abort();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  ZvMipPath2fProp1d mip;
  const std::vector<unsigned char> empty = Write(mip);
  const unsigned int read = mip.ReadFromBuffer(data, size);
  if (read == 0) {
    // A refused block leaves the sequence as it was.
    if (Write(mip) != empty) std::abort();
    return 0;
  }
  if (read > size) std::abort();
  CheckOrder(mip);
  const std::vector<unsigned char> block = Write(mip);
  ZvMipPath2fProp1d again;
  if (again.ReadFromBuffer(block.data(), block.size()) != block.size() || Write(again) != block)
    std::abort();
  Exercise(mip);
  return 0;
}
