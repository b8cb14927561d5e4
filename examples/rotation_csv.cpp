// Keys a rotation through three function-curve views of one rotation curve (one view per Euler
// angle, in degrees) and writes the three evaluated angles as CSV.
//
//   zv_example_rotation_csv [output.csv]      (standard output without an argument)
//
// Plot it with gnuplot:
//   set datafile separator ','; set key autotitle columnhead
//   plot for [c=2:4] 'output.csv' using 1:c with lines
#include <zv/zv.h>

#include <cstdio>

int main(int argc, char** argv) {
  // The x view owns a new rotation curve; y and z share it. The rotation lives as long as the
  // last of the three views.
  ZvQuatFCurve x(0);
  ZvQuatFCurve y(x.GetQuatCurve(), 1);
  ZvQuatFCurve z(x.GetQuatCurve(), 2);

  // A key made on one channel is a key of the rotation: the other two angles take the values
  // the curve had there, so their channels keep their shape.
  x.CreateKey(0.0, 0.0);
  z.CreateKey(1.0, 90.0);
  y.CreateKey(2.0, 45.0);
  x.CreateKey(3.0, 120.0);
  z.CreateKey(4.0, 200.0);  // past 180: the angles stay on the keys' branch, no jump to -160

  // Tension, continuity, bias and spins belong to the rotation's keys. One extra turn after the
  // key at 1: the rotation spins about its path's axis between keys 1 and 2. Its Euler angles
  // jump there where the turn passes near gimbal lock; the rotation itself moves smoothly.
  ZvQuatCurve& rotation = *x.GetQuatCurve();
  ZvQuatKey key;
  rotation.GetKey(1, key);
  key.SetSpins(1);
  rotation.SetKey(key, 0.0);

  std::FILE* out = argc > 1 ? std::fopen(argv[1], "w") : stdout;
  if (out == nullptr) {
    std::perror(argv[1]);
    return 1;
  }
  std::fprintf(out, "t,x_degrees,y_degrees,z_degrees\n");
  const int samples = 400;
  for (int i = 0; i <= samples; ++i) {
    const double t = -0.5 + 5.0 * i / samples;
    std::fprintf(out, "%.4f,%.6f,%.6f,%.6f\n", t, x.Eval(t, 0), y.Eval(t, 0), z.Eval(t, 0));
  }
  if (out != stdout) std::fclose(out);
  return 0;
}
