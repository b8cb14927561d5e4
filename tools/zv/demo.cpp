#include "demo.h"

#include "render.h"
#include "svg_path.h"

#include <cmath>
#include <string>

namespace {
const double kPi = 3.14159265358979323846;

// A star of `points` tips as SVG path data, drawn as one self-crossing polygon (every second
// tip joined), so that the two fill rules differ in its centre.
std::string Star(double cx, double cy, double r, int points) {
  std::string d;
  for (int i = 0; i < points; ++i) {
    const double a = -kPi / 2 + i * 2 * (2 * kPi / points);
    d += (i ? " L" : "M") + std::to_string(cx + r * std::cos(a)) + " " +
         std::to_string(cy + r * std::sin(a));
  }
  return d + " Z";
}

// A circle of four cubics.
std::string Circle(double cx, double cy, double r) {
  const double k = 0.5522847498307935 * r;
  auto p = [](double x, double y) { return std::to_string(x) + " " + std::to_string(y) + " "; };
  return "M" + p(cx + r, cy) + "C" + p(cx + r, cy + k) + p(cx + k, cy + r) + p(cx, cy + r) + "C" +
         p(cx - k, cy + r) + p(cx - r, cy + k) + p(cx - r, cy) + "C" + p(cx - r, cy - k) +
         p(cx - k, cy - r) + p(cx, cy - r) + "C" + p(cx + k, cy - r) + p(cx + r, cy - k) +
         p(cx + r, cy) + "Z";
}

void Draw(const std::string& d, const ZvRenderOptions& options, ZvRaster<unsigned char>& r) {
  ZvPath2f path;
  std::string error;
  if (ZvParseSvgPath(d, path, error)) ZvRenderPath(path, options, r);
}
}  // namespace

ZvRaster<unsigned char> ZvRenderDemo() {
  ZvRaster<unsigned char> r(640, 400, 0);
  ZvRenderOptions o;
  // Top left: one star under even-odd (hollow centre), one under non-zero winding.
  o.fillRule = 0;
  Draw(Star(80, 90, 70, 5), o, r);
  o.fillRule = 1;
  Draw(Star(240, 90, 70, 5), o, r);
  // Top right: circles with feather radii 0, 3, 6 and 8 sub-samples at 8x8.
  for (int i = 0; i < 4; ++i) {
    o.feather = i == 0 ? 0 : 3 * i - (i == 3 ? 1 : 0);
    Draw(Circle(370 + 75 * i, 60, 30), o, r);
  }
  o.feather = 0;
  // Overlapping circles at opacities 1, 0.6 and 0.3, at 4x4.
  o.rate = 4;
  const double opacity[] = {1.0, 0.6, 0.3};
  for (int i = 0; i < 3; ++i) {
    o.opacity = opacity[i];
    Draw(Circle(400 + 70 * i, 140, 35), o, r);
  }
  o.opacity = 1.0;
  o.rate = 8;
  // Right: a soft-filled circle, its edge faded inwards over 16 pixels.
  o.soft = 16;
  Draw(Circle(565, 205, 28), o, r);
  o.soft = 0;
  // Bottom: a zigzag stroked with miter, round and bevel joins and flat, round and square caps.
  o.fill = false;
  o.strokeWidth = 14;
  const char* zigzag = "M0 0 l40 -50 l40 50 l40 -50";
  for (int i = 0; i < 3; ++i) {
    o.join = i == 0 ? 1 : i == 1 ? 2 : 0;
    o.cap = i == 0 ? 2 : i == 1 ? 0 : 1;
    o.translateX = 40 + 150 * i;
    o.translateY = 270;
    Draw(zigzag, o, r);
  }
  // A tapered S-curve and a thin closed curve stroked with round joins.
  o.taper = true;
  o.strokeWidth = 24;
  o.translateX = 0;
  o.translateY = 0;
  Draw("M480 360 C520 250 580 380 620 240", o, r);
  o.taper = false;
  o.strokeWidth = 3;
  o.join = 2;
  Draw("M30 345 Q130 395 230 345 T430 345", o, r);
  return r;
}
