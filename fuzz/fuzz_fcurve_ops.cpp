// Random sequences of public calls on function curves of every kind, with extreme arguments
// (the largest doubles, infinities, NaN, denormals, values a hair off a key, reversed
// intervals). After every call the keys must still be finite and strictly increasing, and the
// curve's block must read back through the bounded factory with the same keys and, read again,
// give the same bytes; hangs and runaway memory are caught by running with -timeout=1
// -rss_limit_mb=512.
//
// The library accepts up to 2^20 keys, samples or repeated keys a call, at a cost in
// proportion: a second and more under the sanitizers. So that one input stays well within its
// second while a call that is slower than linear still stands out, an input ends once its curve
// holds more than kMaxKeys keys, samplings finer than kMaxSamples samples are coarsened and
// cycle drawings and snapshots narrowed to as many repeated keys; a call past the library's caps
// still goes through as it is, to be refused.
//
// Input: one byte picks the curve kind, then each step is one byte for the call and as many
// more as its arguments take.
#include <zv/fcurve_stretcher.h>
#include <zv/quat_fcurve.h>
#include <zv/raw_fcurve.h>
#include <zv/std_fcurve.h>
#include <zv/step_fcurve.h>
#include <zv/transfo4.h>

#include <cfloat>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <memory>
#include <vector>

namespace {

const double kExtremes[] = {0.0,
                            -0.0,
                            1.0,
                            -1.0,
                            0.5,
                            2.0,
                            10.0,
                            15.0,
                            1e-13,
                            1e-300,
                            5e-324,
                            1e6,
                            4.29e9,
                            1e17,
                            1e18,
                            1e300,
                            1e308,
                            DBL_MAX,
                            -DBL_MAX,
                            -1e300,
                            std::numeric_limits<double>::infinity(),
                            -std::numeric_limits<double>::infinity(),
                            std::numeric_limits<double>::quiet_NaN(),
                            14.999999999999998,
                            0.99999999999999989,
                            1.0000000000000002,
                            -62.5,
                            1e-7,
                            1e-15};
constexpr unsigned int kNumExtremes = sizeof(kExtremes) / sizeof(kExtremes[0]);

constexpr unsigned int kMaxKeys = 4096;
constexpr double kMaxSamples = 4096.0;
// Samplings of more than this many samples are refused by the library, whatever their cost.
constexpr double kRefusedSamples = 4.0 * 1048576.0;

// The step, made coarse enough for at most kMaxSamples samples over [from, to] unless the
// library refuses the sampling anyway.
double Coarsened(double from, double to, double step) {
  const double span = std::fabs(to - from);
  const double count = span / std::fabs(step);
  if (!(count > kMaxSamples) || count > kRefusedSamples) return step;
  return std::copysign(span / kMaxSamples, step);
}

// The same for a resampling, which under the cycle methods resamples the part of the keyed
// range that the interval folds onto: at most one period, however long the interval.
double CoarsenedResampling(const ZvBaseFCurve& c, double from, double to, double step) {
  const ZvBaseFCurve::ExtrapolationMethod m = c.GetExtrapolationMethod();
  double first = 0, last = 0;
  if ((m != ZvBaseFCurve::CycleExtrapolation && m != ZvBaseFCurve::CycleWithOffsetExtrapolation) ||
      c.GetNumKeys() < 2 || !c.GetSmallestKeyParameter(first) || !c.GetLargestKeyParameter(last) ||
      !(std::fabs(to - from) > last - first)) {
    return Coarsened(from, to, step);
  }
  return Coarsened(first, last, step);
}

// Under the cycle methods a drawing or a snapshot repeats every key once per period in its
// range. A range of more than kMaxSamples repeated keys is narrowed to about that many (its end
// moved towards its start), unless the library refuses the call anyway: past a million periods
// or 2^20 repeated keys for a drawing, past 10^5 periods for a snapshot. `unit` is the width on
// screen of one unit of parameter.
double NarrowedCycleEnd(const ZvBaseFCurve& c, double from, double to, double unit,
                        double refusedPeriods) {
  const ZvBaseFCurve::ExtrapolationMethod m = c.GetExtrapolationMethod();
  double first = 0, last = 0;
  if ((m != ZvBaseFCurve::CycleExtrapolation && m != ZvBaseFCurve::CycleWithOffsetExtrapolation) ||
      c.GetNumKeys() < 2 || !c.GetSmallestKeyParameter(first) || !c.GetLargestKeyParameter(last)) {
    return to;
  }
  const double periods = std::fabs((to - from) / (unit * (last - first)));
  const double pieces = periods * c.GetNumKeys();
  if (!(pieces > kMaxSamples) || periods > refusedPeriods || pieces > kRefusedSamples / 4.0)
    return to;
  return from + (to - from) * (kMaxSamples / pieces);
}

// A drawing's points grow with its size over the tolerance, up to the library's 2^20 (each a
// few arrays of 16 bytes, and more under the sanitizers): tolerances finer than 1e-3 of the
// drawing's width or height only measure that. Non-positive and non-finite ones go through.
double DrawingTolerance(double asked, double width, double height) {
  const double size = std::fmax(std::fabs(width), std::fabs(height));
  return std::isfinite(size) && asked > 0.0 ? std::fmax(asked, size * 1e-3) : asked;
}

class Script {
 public:
  Script(const std::uint8_t* data, std::size_t size) : p_(data), end_(data + size) {}
  bool More() const { return p_ < end_; }
  unsigned int Byte() { return p_ < end_ ? *p_++ : 0; }
  // Mostly small numbers, so that keys meet; often an extreme; sometimes any double at all.
  double Number() {
    const unsigned int b = Byte();
    if (b < 96) return (static_cast<int>(Byte()) - 128) * 0.25;
    if (b < 224) return kExtremes[Byte() % kNumExtremes];
    std::uint64_t bits = 0;
    for (int i = 0; i < 8; ++i)
      bits = bits << 8 | Byte();
    double d;
    std::memcpy(&d, &bits, sizeof d);
    return d;
  }

 private:
  const std::uint8_t* p_;
  const std::uint8_t* end_;
};

std::unique_ptr<ZvBaseFCurve> NewCurve(unsigned int kind) {
  switch (kind % 5) {
    case 0:
      return std::unique_ptr<ZvBaseFCurve>(new ZvStdFCurve());
    case 1:
      return std::unique_ptr<ZvBaseFCurve>(new ZvRawFCurve());
    case 2:
      return std::unique_ptr<ZvBaseFCurve>(new ZvIntegerFCurve());
    case 3:
      return std::unique_ptr<ZvBaseFCurve>(new ZvBooleanFCurve());
    default:
      return std::unique_ptr<ZvBaseFCurve>(new ZvQuatFCurve(0));
  }
}

void CheckKeys(const ZvBaseFCurve& c) {
  ZvDoubleArray p;
  c.GetAllKeyParameters(p);
  if (p.size != c.GetNumKeys()) std::abort();
  for (unsigned int i = 0; i < p.size; ++i) {
    if (!std::isfinite(p[i])) std::abort();
    if (i > 0 && !(p[i] > p[i - 1])) std::abort();
  }
}

std::vector<unsigned char> BlockOf(const ZvBaseFCurve& c) {
  std::vector<unsigned char> block(c.GetBufferSize());
  if (c.WriteToBuffer(block.data()) != block.size()) std::abort();
  return block;
}

std::unique_ptr<ZvBaseFCurve> ReadBack(const std::vector<unsigned char>& block) {
  unsigned int consumed = 0;
  std::unique_ptr<ZvBaseFCurve> copy(
      ZvBaseFCurve_CreateFromBuffer(block.data(), block.size(), consumed));
  if (!copy || consumed == 0) std::abort();
  return copy;
}

// The keys come back from the block as they were. A reader keeps the continuity claim of a key
// only where its handles agree within its tolerance, so after a far scale it may drop one: it is
// the block of the curve read back that must then come back byte for byte.
void CheckBlock(const ZvBaseFCurve& c) {
  std::unique_ptr<ZvBaseFCurve> copy = ReadBack(BlockOf(c));
  ZvDoubleArray kept, read;
  c.GetAllKeyParameters(kept);
  copy->GetAllKeyParameters(read);
  if (kept.size != read.size ||
      (kept.size && std::memcmp(kept.data, read.data, kept.size * sizeof(double)) != 0)) {
    std::abort();
  }
  const std::vector<unsigned char> block = BlockOf(*copy);
  if (BlockOf(*ReadBack(block)) != block) std::abort();
}

void Step(ZvBaseFCurve& c, Script& s) {
  const unsigned int op = s.Byte() % 27;
  const double a = s.Number(), b = s.Number(), d = s.Number();
  const int f0 = s.Byte() & 1, f1 = s.Byte() & 1;
  switch (op) {
    case 0:
    case 1:  // most often, so that curves get keys
      c.CreateKey(a, b);
      break;
    case 2:
      c.MergeAndCreateKey(a, b, d, s.Number(), f0, f1, s.Byte() & 1);
      break;
    case 3:
      c.CreateNonModifyingKey(a, f0);
      break;
    case 4:
      c.MergeAndCreateNonModifyingKey(a, b, d, f0, f1, s.Byte() & 1, s.Byte() & 1);
      break;
    case 5:
      c.RemoveKey(a, b);
      break;
    case 6:
      c.RemoveKeys(a, b, f0, f1);
      break;
    case 7:
      c.SetKeyValue(a, f0 ? ZvBaseFCurve::LeftSide : ZvBaseFCurve::RightSide, b, d);
      break;
    case 8: {
      std::unique_ptr<ZvBaseFCurve> out(c.Clone());
      if (out) {
        c.Cut(a, b, *out);
        CheckKeys(*out);
      }
      break;
    }
    case 9:
      f0 ? c.RemoveTail(a) : c.RemoveHead(a);
      break;
    case 10: {
      std::unique_ptr<ZvBaseFCurve> other(c.Clone());
      if (other) f0 ? c.Append(*other) : c.Paste(*other, a, b);
      break;
    }
    case 11:
      c.ShiftParameters(a);
      break;
    case 12:
      c.ScaleParameterAxis(a);
      break;
    case 13:
      f0 ? c.ShiftValues(a) : c.MirrorValues();
      break;
    case 14:
      c.ReduceNumKeys(a, b, d);
      break;
    case 15: {
      // A sampling flattens the curve on its way, as a drawing of the interval would: its cycles
      // are narrowed and its tolerance floored likewise. Far below the floor a sampling runs into
      // the library's cap on streamed points, which it reaches in over a second under the
      // sanitizers (a subnormal tolerance makes a million points of every cubic); the unit tests
      // cover that refusal.
      const double end = NarrowedCycleEnd(c, a, b, 1.0, 1e6);
      const double height = c.GetValueUpperBound(0) - c.GetValueLowerBound(0);
      const double tolerance = DrawingTolerance(s.Number(), end - a, height);
      ZvDoubleArray params, values;
      c.EvalSequence(a, end, Coarsened(a, end, d), tolerance, params, values, f0);
      break;
    }
    case 16: {
      ZvExtent2<double> box;
      box.AddPoint(ZvPoint2<double>{a, b});
      box.AddPoint(ZvPoint2<double>{d, s.Number()});
      ZvTransfo4 t;
      if (f0) t.Scale(s.Number(), s.Number(), 1.0);
      ZvPoint2dArray points;
      ZvPointTagArray tags;
      ZvBoolArray extrapolated;
      box.xmax = NarrowedCycleEnd(c, box.xmin, box.xmax, t.GetMatrixPtr()[0], 1e6);
      c.FlattenFromTo(box, t,
                      DrawingTolerance(s.Number(), box.xmax - box.xmin, box.ymax - box.ymin),
                      points, tags, extrapolated, f1);
      ZvPoint2dArray all;
      ZvPointTagArray allTags;
      double first = 0, last = 0;
      c.GetSmallestKeyParameter(first);
      c.GetLargestKeyParameter(last);
      const double* m = t.GetMatrixPtr();
      const double height = c.GetValueUpperBound(0) - c.GetValueLowerBound(0);
      c.Flatten(t, DrawingTolerance(s.Number(), (last - first) * m[0], height * m[5]), all, allTags,
                f1);
      break;
    }
    case 17:
      c.ResampleSequence(a, b, CoarsenedResampling(c, a, b, d), f0, 0);
      break;
    case 18: {
      const double kernel[5] = {a, b, d, 0.25, 0.5};
      c.SmoothSequence(s.Number(), s.Number(), kernel, 1 + s.Byte() % 5);
      break;
    }
    case 19:
      c.MirrorParameters();
      break;
    case 20:
      c.ScaleAndOffsetParameters(a, b, d, s.Number(), s.Number(), f0, f1,
                                 ZvBaseFCurve::BottomHandle);
      break;
    case 21:
      c.SetExtrapolationMethod(static_cast<ZvBaseFCurve::ExtrapolationMethod>(1 + s.Byte() % 4));
      break;
    case 22: {
      double p = a;
      c.SetConstraint(p, static_cast<ZvBaseFCurve::KeyConstraint>(1u << (s.Byte() % 6)), f0, b);
      break;
    }
    case 23: {
      std::unique_ptr<ZvBaseFCurve> snap(
          c.SnapShot(a, NarrowedCycleEnd(c, a, b, 1.0, 1e5),
                     static_cast<ZvBaseFCurve::ExtrapolationMethod>(1 + s.Byte() % 4)));
      if (snap) CheckKeys(*snap);
      break;
    }
    case 24: {
      // Queries: none may answer a key at a NaN, none may hang.
      unsigned int index;
      double p = a, v;
      c.GetKeyIndex(a, index);
      c.GetNearestKeyParameter(a, p);
      c.GetNextKeyParameter(a, p, f0);
      c.GetPrevKeyParameter(a, p, f1);
      c.GetNearestKeyParameterInCenteredInterval(p, b);
      c.GetKeyValue(a, ZvBaseFCurve::RightSide, v, b);
      c.Eval(a, f0);
      c.GetValueUpperBound(f0);
      c.GetValueLowerBound(f1);
      if (std::isnan(a) && c.IsKeyParameter(a, b)) std::abort();
      break;
    }
    case 26: {
      // A stretch of the keys of [a, b] from a side picked by the script, dragged twice.
      ZvDoubleArray keys;
      c.GetKeyParameters(std::fmin(a, b), std::fmax(a, b), keys, 0, 0);
      ZvExtent2<double> box(std::fmin(a, b), -1e6, std::fmax(a, b), 1e6), moved, changed;
      const auto handle = static_cast<ZvBaseFCurve::RegionHandle>(1u << (s.Byte() % 4));
      ZvFCurveStretcher stretch(c, box, keys, ZvExtent2<double>(-1e9, -1e9, 1e9, 1e9),
                                ZvPoint2<double>{d, s.Number()}, handle, f0, 0.001 + f1);
      for (int i = 0; i < 2; ++i) {
        ZvPoint2<double> drag{s.Number(), s.Number()};
        ZvDoubleArray before, after;
        int clamped = 0;
        stretch.Update(drag, -1e9, 1e9, before, after, changed, moved, clamped);
        CheckKeys(c);
      }
      stretch.Finalize();
      break;
    }
    default:
      c.SetClampingValues(a, b);
      break;
  }
}

}  // namespace

// The memory limit is meant for what the library holds. AddressSanitizer keeps freed blocks in
// quarantine to catch late uses, 256 MB of them by default, which after a few large flattens or
// curves is most of the process; a smaller quarantine still catches a use soon after a free.
// Over a long run its allocator's cached free blocks and the stacks it records for every
// allocation grow the process too: freed pages go back to the system every second, and
// allocation stacks keep their 10 innermost frames.
extern "C" const char* __asan_default_options() {
  return "quarantine_size_mb=32:allocator_release_to_os_interval_ms=1000:malloc_context_size=10";
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (size == 0) return 0;
  Script script(data + 1, size - 1);
  std::unique_ptr<ZvBaseFCurve> curve = NewCurve(data[0]);
  for (int steps = 0; script.More() && steps < 24; ++steps) {
    Step(*curve, script);
    CheckKeys(*curve);
    CheckBlock(*curve);
    if (curve->GetNumKeys() > kMaxKeys) break;
  }
  return 0;
}
