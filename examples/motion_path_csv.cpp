// A camera move along a motion path of five nodes, sampled at 24 frames a second and written as
// CSV of time and position: it eases out of its first position, passes the middle nodes at the
// speed its neighbouring segments suggest, dollies straight at constant speed, and eases into
// its last position.
//
//   zv_example_motion_path_csv [output.csv]      (standard output without an argument)
//
// Plot it with gnuplot:
//   set datafile separator ','; set key autotitle columnhead
//   splot 'output.csv' using 2:3:4 with linespoints
#include <zv/zv.h>

#include <cstdio>

int main(int argc, char** argv) {
  using P = ZvPoint3<double>;
  // Nodes carry times in seconds; handles shape each segment between them. Positions are in
  // metres: the camera rises while it circles its subject at the origin.
  ZvMotionPath3d path;
  path.Moveto(P{10, 0, 1.5}, 0.0);
  path.Curveto(P{10, 4, 1.6}, P{7, 7, 1.8}, P{4, 9, 2.0}, 2.0);
  path.Curveto(P{1, 11, 2.2}, P{-4, 10, 2.5}, P{-7, 7, 2.8}, 3.5);
  path.Lineto(P{-9, 2, 3.0}, 4.5);  // a straight dolly, at constant speed
  path.Curveto(P{-10, -2, 3.1}, P{-8, -6, 3.2}, P{-5, -8, 3.5}, 6.0);

  // Start from rest and come to rest at the end (tangent information is set per node, by the
  // control index of the node). A G1 lock turns the handles at the first inner joint collinear,
  // so the camera does not jerk sideways there.
  path.SetRightTangentInfo(0, ZvMotionPath3d::Ease);
  path.SetLeftTangentInfo(12, ZvMotionPath3d::Ease);
  path.LockG1Continuity(3);

  std::FILE* out = argc > 1 ? std::fopen(argv[1], "w") : stdout;
  if (!out) {
    std::perror(argv[1]);
    return 1;
  }
  // The tolerance is how far the flattened path may stray from the curve, in metres.
  const double tolerance = 0.001;
  double first = 0.0, last = 0.0;
  path.GetTimeInterval(first, last);
  std::fprintf(out, "time,x,y,z\n");
  // Frames are counted, not accumulated, so frame 144 falls on 6 s exactly.
  for (int frame = 0; first + frame / 24.0 <= last; ++frame) {
    const double t = first + frame / 24.0;
    P p{};
    path.Eval(t, tolerance, p);
    std::fprintf(out, "%.4f,%.6f,%.6f,%.6f\n", t, p.x, p.y, p.z);
  }
  if (out != stdout) std::fclose(out);
  return 0;
}
