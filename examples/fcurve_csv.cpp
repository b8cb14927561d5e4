// Builds an animation curve from a few keys - cubic, linear and constant segments - and writes
// its values over a range wider than the keys, once per extrapolation method, as CSV.
//
//   zv_example_fcurve_csv [output.csv]      (standard output without an argument)
//
// Plot it with gnuplot:
//   set datafile separator ','; set key autotitle columnhead
//   plot for [c=2:5] 'output.csv' using 1:c with lines
#include <zv/zv.h>

#include <cstdio>

int main(int argc, char** argv) {
  // A curve without keys evaluates to 0 everywhere; keys give it a shape. The segment kinds
  // passed to CreateKey are those left and right of the new key.
  ZvStdFCurve curve(0.0, ZvBaseFCurve::CubicSegment);
  curve.CreateKey(0.0, 0.0);
  curve.CreateKey(1.0, 2.0);  // cubic from 0 to 1, handles a third of the way
  curve.CreateKey(2.0, 1.0);  // cubic, the tangent at 1 continued smoothly
  curve.CreateKey(3.0, 1.5, ZvBaseFCurve::CubicSegment, ZvBaseFCurve::ConstantSegment);
  curve.CreateKey(4.0, 3.0, ZvBaseFCurve::ConstantSegment, ZvBaseFCurve::LinearSegment);
  curve.CreateKey(5.0, 2.5);  // linear, like the segment before it

  // Flatten the peak at t = 1 and steepen the first key's tangent (handles relative to the
  // key), so that linear extrapolation has a slope to follow on the left.
  double at = 1.0;
  curve.SetConstraint(at, ZvBaseFCurve::FlatTangent, 1, 0.0);
  curve.SetKeyTgtHandles(0.0, ZvPoint2<double>{-0.2, -1.0}, ZvPoint2<double>{0.2, 1.0}, 0.0);

  std::FILE* out = argc > 1 ? std::fopen(argv[1], "w") : stdout;
  if (out == nullptr) {
    std::perror(argv[1]);
    return 1;
  }
  const ZvBaseFCurve::ExtrapolationMethod methods[] = {
      ZvBaseFCurve::ConstantExtrapolation, ZvBaseFCurve::LinearExtrapolation,
      ZvBaseFCurve::CycleExtrapolation, ZvBaseFCurve::CycleWithOffsetExtrapolation};
  std::fprintf(out, "t,constant,linear,cycle,cycle_with_offset\n");
  // One curve per method would do as well; switching the method of one curve is cheaper.
  const int samples = 600;
  for (int i = 0; i <= samples; ++i) {
    const double t = -5.0 + 15.0 * i / samples;
    std::fprintf(out, "%.6f", t);
    for (ZvBaseFCurve::ExtrapolationMethod method : methods) {
      curve.SetExtrapolationMethod(method);
      std::fprintf(out, ",%.9g", curve.Eval(t, 0));
    }
    std::fprintf(out, "\n");
  }
  if (out != stdout) std::fclose(out);
  return 0;
}
