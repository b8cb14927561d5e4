// The tracer's output, bit for bit, on fixed families of rasters: every callback with its
// corners, and every point and closing of the traced path. The expected digests are the output of
// the first implementation of the sweep, recorded before its row scan and its records were
// reworked for speed; the sweep's order of contours, their first corners and the corners the
// path joins are all output that hosts may keep, so any change of a digest is a change of
// behaviour, to be made on purpose or not at all.
//
// The rasters are built from integer arithmetic only, so that every build (32-bit ones included)
// makes the same pixels; the output of the sweep is integers, so the digests hold everywhere.
#include <zv/path2f.h>
#include <zv/vectorizer.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <random>
#include <string>
#include <vector>

namespace {
// FNV-1a, 64 bits.
struct Digest {
  std::uint64_t h = 1469598103934665603ull;
  void Add(std::int64_t v) {
    for (int i = 0; i < 8; ++i) {
      h ^= static_cast<std::uint64_t>(v >> (8 * i)) & 0xff;
      h *= 1099511628211ull;
    }
  }
};

// Every call of the table, tagged, in order.
ObCallbackTable DigestTable() {
  return {[](const ZvExtent2<float>&, void* u) { static_cast<Digest*>(u)->Add(1); },
          [](void* u) { static_cast<Digest*>(u)->Add(2); },
          [](int x, int y, void* u) {
            Digest& g = *static_cast<Digest*>(u);
            g.Add(3);
            g.Add(x);
            g.Add(y);
          },
          [](int x, int y, void* u) {
            Digest& g = *static_cast<Digest*>(u);
            g.Add(4);
            g.Add(x);
            g.Add(y);
          },
          [](void* u) { static_cast<Digest*>(u)->Add(5); },
          [](void* u) { static_cast<Digest*>(u)->Add(6); }};
}

// Traces `r` for `value` with the thresholds, into the digest: the calls of the sweep, then the
// count and the points of Vectorize's path, subpath by subpath with its closing.
void AddTrace(Digest& digest, const ZvRaster<unsigned char>& r, unsigned char value,
              double perimeter, double area) {
  const ZvVectorizer v(perimeter, area);
  EXPECT_EQ(v.Trace(r, value, r.GetExtent2f(), DigestTable(), &digest), 1);
  ZvPath2f path;
  digest.Add(v.Vectorize(r, value, r.GetExtent2f(), path));
  ZvPath2fIter it(path);
  unsigned int first = 0, last = 0;
  while (it.GetNextSubPathIndices(first, last)) {
    for (unsigned int i = first; i <= last; ++i) {
      digest.Add(static_cast<std::int64_t>(path.GetPoint(i).x));
      digest.Add(static_cast<std::int64_t>(path.GetPoint(i).y));
    }
    digest.Add(path.IsSubpathClosed(first));
  }
}

// The pixel values the families use: both ends of the byte and the middle, so that a scan that
// compared bytes as signed, or matched nearby values, would trace other regions.
const unsigned char kValues[] = {0, 1, 127, 128, 129, 254, 255};

unsigned char Pick(std::mt19937& rng) {
  return kValues[rng() % (sizeof kValues)];
}

// Integer discs and rings (a ring is a disc of another value inside), rectangles, frames and
// single-pixel diagonals: shapes with long walls, steps, holes, nested holes, U and n turns.
void PaintShapes(ZvRaster<unsigned char>& r, std::mt19937& rng, unsigned char ink,
                 unsigned char paper) {
  const int w = r.GetWidth(), h = r.GetHeight();
  const int shapes = 1 + static_cast<int>(rng() % 12);
  for (int s = 0; s < shapes; ++s) {
    const int cx = static_cast<int>(rng() % w), cy = static_cast<int>(rng() % h);
    const int size = 1 + static_cast<int>(rng() % (1 + std::min(w, h) / 2));
    switch (rng() % 4) {
      case 0: {
        const int rings = 1 + static_cast<int>(rng() % 4);
        for (int k = 0; k < rings; ++k) {
          const int rad = size + 2 * (rings - 1 - k);
          for (int y = cy - rad; y <= cy + rad; ++y)
            for (int x = cx - rad; x <= cx + rad; ++x)
              if (x >= 0 && y >= 0 && x < w && y < h &&
                  (x - cx) * (x - cx) + (y - cy) * (y - cy) <= rad * rad)
                r.SetVal(x, y, k % 2 ? paper : ink);
        }
        break;
      }
      case 1:
      case 2: {
        const bool frame = rng() % 2;
        const int sw = size + static_cast<int>(rng() % 9), sh = size;
        for (int y = cy; y < cy + sh && y < h; ++y)
          for (int x = cx; x < cx + sw && x < w; ++x) {
            const bool edge = x == cx || y == cy || x == cx + sw - 1 || y == cy + sh - 1;
            r.SetVal(x, y, !frame || edge ? ink : paper);
          }
        break;
      }
      default:
        for (int k = 0; k < size && cx + k < w && cy + k < h; ++k)
          r.SetVal(cx + k, cy + k, ink);
    }
  }
}

// Rows of runs whose lengths are random from 1 to `longest`, each row copying the one above with
// its boundaries moved by -1, 0 or 1 now and then: run ends fall at every position in a word.
void PaintRuns(ZvRaster<unsigned char>& r, std::mt19937& rng, int longest, unsigned char a,
               unsigned char b) {
  const int w = r.GetWidth();
  std::vector<int> bounds;
  for (int x = 0; x < w; x += 1 + static_cast<int>(rng() % longest))
    bounds.push_back(x);
  for (int y = 0; y < r.GetHeight(); ++y) {
    for (int& x : bounds)
      if (rng() % 4 == 0) x = std::max(0, std::min(w, x + static_cast<int>(rng() % 3) - 1));
    bool on = rng() % 2;
    std::size_t k = 0;
    for (int x = 0; x < w; ++x) {
      while (k < bounds.size() && bounds[k] <= x) {
        on = !on;
        ++k;
      }
      r.SetVal(x, y, on ? a : b);
    }
  }
}

void PaintNoise(ZvRaster<unsigned char>& r, std::mt19937& rng, unsigned char value) {
  const unsigned int density = rng() % 101;
  for (int i = 0; i < r.GetSize(); ++i)
    r.SetVal(i, rng() % 100 < density ? value : Pick(rng));
}

enum Family { kShapes, kRuns, kNoise };

// `count` rasters of the family, each traced for two values under varied thresholds.
std::uint64_t FamilyDigest(Family family, int count, int maxSide, unsigned int seed) {
  std::mt19937 rng(seed);
  Digest digest;
  const double thresholds[][2] = {{0, 0}, {8, 0}, {0, 4}, {-12, -9}};
  for (int trial = 0; trial < count; ++trial) {
    const int w = 1 + static_cast<int>(rng() % maxSide), h = 1 + static_cast<int>(rng() % maxSide);
    const unsigned char ink = Pick(rng), paper = Pick(rng);
    ZvRaster<unsigned char> r(w, h, paper);
    if (family == kShapes) PaintShapes(r, rng, ink, paper);
    if (family == kRuns) PaintRuns(r, rng, 1 + static_cast<int>(rng() % 40), ink, paper);
    if (family == kNoise) PaintNoise(r, rng, ink);
    const double* t = thresholds[trial % 4];
    AddTrace(digest, r, ink, t[0], t[1]);
    AddTrace(digest, r, paper, t[0], t[1]);
  }
  return digest.h;
}

std::string Hex(std::uint64_t h) {
  char s[24];
  std::snprintf(s, sizeof s, "%016llx", static_cast<unsigned long long>(h));
  return s;
}
}  // namespace

TEST(VectorizeDigest, OutputIsThatOfTheFirstSweep) {
  struct Case {
    const char* name;
    Family family;
    int count, maxSide;
    unsigned int seed;
    const char* expected;
  };
  const Case cases[] = {
      {"small shapes", kShapes, 600, 40, 1, "e7541c39ec61be7f"},
      {"wide shapes", kShapes, 60, 300, 2, "1f0b7c3e64cb0e9f"},
      {"runs", kRuns, 400, 120, 3, "a79058ae30816ff0"},
      {"small noise", kNoise, 600, 40, 4, "9f57f1a98f060f70"},
      {"wide noise", kNoise, 40, 260, 5, "844d53b2fcfd4c32"},
  };
  for (const Case& c : cases)
    EXPECT_EQ(Hex(FamilyDigest(c.family, c.count, c.maxSide, c.seed)), c.expected) << c.name;
}
