// Paths under allocation failure. A test-only global operator new throws on the k-th allocation
// after it is armed; each operation is run for k = 0, 1, 2, ... until it completes without the
// failure firing, and after every failure the path must still be well formed: both arrays of
// one length, codes that parse, the lock released, and what the operation promises (appends
// chop back to the entry state and rethrow; Clone, Clear, operator= and the readers swallow).
// Run under AddressSanitizer, leak detection catches anything a failure leaves behind.
#include <zv/path2f.h>

#include <gtest/gtest.h>

#include <cmath>
#include <functional>
#include <memory>
#include <vector>

#include "path_fixtures.h"
#include "tests/support/failing_allocator.h"

using zv_test::ForEachFailure;

namespace {

struct State {
  std::vector<float> xy;
  std::vector<int> codes;
  unsigned int open;
  bool operator==(const State& o) const { return xy == o.xy && codes == o.codes && open == o.open; }
};

State Snapshot(const ZvPath2f& path) {
  State s;
  const ZvPoint2fArray& pts = PathArrays::Points(path);
  for (unsigned int i = 0; i < pts.size; ++i) {
    s.xy.push_back(pts[i].x);
    s.xy.push_back(pts[i].y);
  }
  s.codes = Codes(path, 255);
  s.open = PathArrays::Open(path);
  return s;
}

using Step = std::function<void(ZvPath2f&)>;

// ForEachFailure on a fresh copy of `source` every round; the last round's copy stays in `path`.
int ForEachFailureOnCopy(const ZvPath2f& source, std::unique_ptr<ZvPath2f>& path, const Step& op,
                         const std::function<void(bool threw)>& check) {
  return ForEachFailure([&] { path.reset(new ZvPath2f(source)); }, [&] { op(*path); }, check);
}

// An append that failed rethrew and left the path as it was on entry.
std::function<void(bool)> ChoppedBack(const std::unique_ptr<ZvPath2f>& path, const State& entry) {
  return [&path, entry](bool threw) {
    EXPECT_TRUE(threw);
    EXPECT_TRUE(PathInvariantHolds(*path));
    EXPECT_EQ(path->GetLockCount(), 0u);
    EXPECT_TRUE(Snapshot(*path) == entry);
  };
}

// An operation that swallowed the failure left an empty, unlocked, well-formed path.
void ExpectEmptied(const ZvPath2f& path) {
  EXPECT_TRUE(PathInvariantHolds(path));
  EXPECT_EQ(path.NumPoints(), 0u);
  EXPECT_EQ(PathArrays::Open(path), 0u);
  EXPECT_EQ(path.GetLockCount(), 0u);
}

std::vector<Step> DrawingSteps() {
  static const ZvPoint2<float> pts[8] = {P(1, 2), P(3, 1), P(4, 4), P(2, 6),
                                         P(0, 5), P(1, 3), P(2, 2), P(0, 0)};
  static ZvPoint2fArray array(1);
  if (array.size == 0)
    for (const auto& p : pts)
      array.Add(p);
  std::vector<Step> steps;
  for (int round = 0; round < 3; ++round) {
    steps.push_back([](ZvPath2f& p) { p.Moveto(P(0, 0)); });
    steps.push_back([](ZvPath2f& p) { p.Lineto(P(5, 0)); });
    steps.push_back([](ZvPath2f& p) { p.Curveto(P(6, 1), P(6, 3)); });
    steps.push_back([](ZvPath2f& p) { p.Curveto(P(6, 5), P(4, 6), P(3, 6)); });
    steps.push_back([](ZvPath2f& p) { p.AltCurveto(pts, 7); });
    steps.push_back([](ZvPath2f& p) { p.AltAltCurveto(array, 0, 8); });
    steps.push_back([](ZvPath2f& p) { p.Lineto(P(0, 0)); });
    steps.push_back([](ZvPath2f& p) { p.Closeto(); });
    steps.push_back([](ZvPath2f& p) { p.AddPolyline(pts, 8, 1); });
  }
  return steps;
}

}  // namespace

TEST(PathAllocFailure, AppendsChopBackAndRethrow) {
  const std::vector<Step> steps = DrawingSteps();
  ZvPath2f reference(1);
  int failures = 0;
  for (const Step& step : steps) {
    std::unique_ptr<ZvPath2f> path;
    failures += ForEachFailureOnCopy(reference, path, step, ChoppedBack(path, Snapshot(reference)));
    step(reference);
  }
  EXPECT_GT(failures, 0);
  EXPECT_EQ(reference.NumSubpaths(), 6u);
}

TEST(PathAllocFailure, CloseSubpathInsertionChopsBack) {
  // Full arrays, so that the closing line needs room: an open triangle, then a lone start.
  ZvPath2f source(1);
  source.Moveto(P(0, 0));
  source.Lineto(P(4, 0));
  source.Lineto(P(4, 3));
  source.Moveto(P(9, 9));
  std::unique_ptr<ZvPath2f> path;
  EXPECT_GT(ForEachFailureOnCopy(
                source, path, [](ZvPath2f& p) { p.CloseSubpath(1); },
                ChoppedBack(path, Snapshot(source))),
            0);
  EXPECT_EQ(Codes(*path), (std::vector<int>{1, 3, 3, 4, 1}));
}

TEST(PathAllocFailure, CloneAnswersNull) {
  const ZvPath2f source = ThreeSubpaths();
  const State entry = Snapshot(source);
  ZvShape2f* clone = nullptr;
  const int failures = ForEachFailure([&] { clone = nullptr; }, [&] { clone = source.Clone(); },
                                      [&](bool threw) {
                                        EXPECT_FALSE(threw);
                                        EXPECT_EQ(clone, nullptr);
                                        EXPECT_EQ(source.GetLockCount(), 0u);
                                      });
  EXPECT_GT(failures, 0);
  ASSERT_NE(clone, nullptr);
  EXPECT_TRUE(Snapshot(*static_cast<ZvPath2f*>(clone)) == entry);
  delete clone;
}

TEST(PathAllocFailure, AssignmentEmptiesTheTarget) {
  const ZvPath2f source = ThreeSubpaths();
  ZvPath2f target;
  const int failures = ForEachFailure(
      [&] {
        target.Clear();
        target.Moveto(P(9, 9));
      },
      [&] { target = source; },
      [&](bool threw) {
        EXPECT_FALSE(threw);
        ExpectEmptied(target);
        EXPECT_EQ(source.GetLockCount(), 0u);
      });
  EXPECT_GT(failures, 0);
  EXPECT_TRUE(Snapshot(target) == Snapshot(source));
}

TEST(PathAllocFailure, ClearNeverFails) {
  const ZvPath2f source = ThreeSubpaths();
  std::unique_ptr<ZvPath2f> path;
  const int failures = ForEachFailureOnCopy(
      source, path, [](ZvPath2f& p) { p.Clear(); },
      [&](bool threw) {
        EXPECT_FALSE(threw);
        ExpectEmptied(*path);
      });
  EXPECT_GT(failures, 0);
  ExpectEmptied(*path);
  path->Moveto(P(1, 1));  // still usable
}

TEST(PathAllocFailure, ReadersEmptyThePathOrAnswerNull) {
  const ZvPath2f source = ThreeSubpaths();
  std::vector<unsigned char> block(source.GetBufferSize());
  source.WriteToBuffer(block.data());
  const unsigned char* body = block.data() + 4;

  ZvPath2f target;
  unsigned int read = 0;
  int failures = ForEachFailure(
      [&] {
        target = source;
        target.Translate(P(1, 1));
      },
      [&] { read = target.ReadFromBufferBody(body); },
      [&](bool threw) {
        EXPECT_FALSE(threw);
        EXPECT_EQ(read, 0u);
        ExpectEmptied(target);
      });
  EXPECT_GT(failures, 0);
  EXPECT_EQ(read, block.size() - 4);

  ZvShape2f* shape = nullptr;
  unsigned int consumed = 0;
  const auto expectNull = [&](bool threw) {
    EXPECT_FALSE(threw);
    EXPECT_EQ(shape, nullptr);
    EXPECT_EQ(consumed, 0u);
  };
  failures =
      ForEachFailure([&] { shape = nullptr; },
                     [&] { shape = ZvShape2f_CreateFromBufferBody(body, consumed); }, expectNull);
  EXPECT_GT(failures, 0);
  ASSERT_NE(shape, nullptr);
  delete shape;
  failures = ForEachFailure(
      [&] { shape = nullptr; },
      [&] { shape = ZvShape2f_CreateFromBuffer(block.data(), block.size(), consumed); },
      expectNull);
  EXPECT_GT(failures, 0);
  ASSERT_NE(shape, nullptr);
  EXPECT_EQ(consumed, block.size());
  delete shape;
}

TEST(PathAllocFailure, ConstructorsReleaseWhatTheyHold) {
  const ZvPath2f source = ThreeSubpaths();
  ZvPath2f* made = nullptr;
  const auto threwCleanly = [&](bool threw) {
    EXPECT_TRUE(threw);
    EXPECT_EQ(source.GetLockCount(), 0u);
  };
  int failures =
      ForEachFailure([&] { made = nullptr; }, [&] { made = new ZvPath2f(source); }, threwCleanly);
  EXPECT_GT(failures, 0);
  delete made;
  failures = ForEachFailure([&] { made = nullptr; }, [&] { made = new ZvPath2f(source, 4, 9); },
                            threwCleanly);
  EXPECT_GT(failures, 0);
  ASSERT_NE(made, nullptr);
  // Index 4 is a cubic's first control point: the copy starts at that cubic's end node.
  EXPECT_EQ(Codes(*made), (std::vector<int>{1, 8, 9, 10}));
  delete made;
}

namespace {

// Paths whose arrays are exactly full (16 points in blocks of 16), so that any insertion needs
// a larger block and any removal of more than 8 points a smaller one. The first has a locked
// smooth loop between an open polyline and a longer one; the second a closed 12-gon before an
// open polyline.
ZvPath2f FullLoopPath() {
  ZvPath2f path(1);
  path.Moveto(P(0, 0));
  path.Lineto(P(10, 0));
  path.Lineto(P(10, 10));
  path.Moveto(P(20, 0));
  path.Curveto(P(25, -5), P(30, -5), P(35, 0));
  path.Curveto(P(40, 5), P(15, 5), P(20, 0));
  path.Closeto();
  path.LockG1(6);
  path.Moveto(P(50, 50));
  for (int i = 1; i <= 5; ++i)
    path.Lineto(P(50.0f + i, 50.0f + i * i));
  return path;
}

ZvPath2f FullPolygonPath() {
  ZvPath2f path(1);
  path.Moveto(P(10, 0));
  for (int i = 1; i < 11; ++i)
    path.Lineto(P(10 * std::cos(i * 0.5712f), 10 * std::sin(i * 0.5712f)));
  path.Lineto(P(10, 0));
  path.Closeto();
  path.Moveto(P(30, 0));
  for (int i = 1; i < 4; ++i)
    path.Lineto(P(30.0f + i, float(i * i)));
  return path;
}

struct Edit {
  const char* name;
  ZvPath2f (*source)();
  Step step;
  bool changes = true;  // replacing a section by itself only allocates its copy
};

std::vector<Edit> Edits() {
  static const ZvPoint2<float> octic[9] = {P(0, 0), P(1, 1), P(2, 2), P(3, 3), P(4, 4),
                                           P(5, 5), P(6, 6), P(7, 7), P(10, 0)};
  static const ZvPoint2<float> quartic[5] = {P(20, 0), P(22, -6), P(25, -7), P(31, -6), P(35, 0)};
  static const ZvPath2f stretch = [] {
    ZvPath2f s;
    s.Moveto(quartic[0]);
    s.AltCurveto(quartic + 1, 4);
    return s;
  }();
  return {
      {"ReplaceSegment grows", FullLoopPath, [](ZvPath2f& p) { p.ReplaceSegment(1, octic, 8); }},
      {"ReplaceSegment beside a lock", FullLoopPath,
       [](ZvPath2f& p) { p.ReplaceSegment(4, quartic, 4); }},
      {"ReplaceSubpathSection cubic", FullLoopPath,
       [](ZvPath2f& p) { p.ReplaceSubpathSection(0, 2, P(1, 5), P(9, 5)); }},
      {"ReplaceSubpathSection stretch", FullLoopPath,
       [](ZvPath2f& p) { p.ReplaceSubpathSection(3, 6, stretch, 0, 4); }},
      {"ReplaceSubpathSection from itself", FullLoopPath,
       [](ZvPath2f& p) { p.ReplaceSubpathSection(3, 6, p, 3, 6); }, false},
      {"ReplaceSubpathSection line shrinks", FullPolygonPath,
       [](ZvPath2f& p) { p.ReplaceSubpathSection(0, 11); }},
      {"RemoveSubpathSection shrinks", FullPolygonPath,
       [](ZvPath2f& p) { p.RemoveSubpathSection(0, 9); }},
      {"RemoveSubpath shrinks", FullPolygonPath, [](ZvPath2f& p) { p.RemoveSubpath(3); }},
      {"GetSimilarPath", FullPolygonPath,
       [](ZvPath2f& p) {
         const ZvPath2f source(p);
         source.GetSimilarPath(2.0f, 0, p);
       }},
  };
}

}  // namespace

// Every allocation an edit makes comes before its first change: a failure at any of them lets
// std::bad_alloc through and leaves the path exactly as it was, lock bits included.
TEST(PathAllocFailure, FailedEditsLeaveThePathAsItWas) {
  for (const Edit& edit : Edits()) {
    const ZvPath2f source = edit.source();
    ASSERT_EQ(PathArrays::Points(source).capacity, PathArrays::Points(source).size) << edit.name;
    ZvPath2f expected(source);
    edit.step(expected);
    ASSERT_EQ(Snapshot(expected) == Snapshot(source), !edit.changes) << edit.name;
    const State entry = Snapshot(source);
    std::unique_ptr<ZvPath2f> path;
    const int failures = ForEachFailureOnCopy(source, path, edit.step, [&](bool threw) {
      EXPECT_TRUE(threw) << edit.name;
      EXPECT_TRUE(Snapshot(*path) == entry) << edit.name;
      EXPECT_TRUE(PathInvariantHolds(*path)) << edit.name;
      EXPECT_EQ(path->GetLockCount(), 0u) << edit.name;
    });
    EXPECT_GT(failures, 0) << edit.name;
    EXPECT_TRUE(Snapshot(*path) == Snapshot(expected)) << edit.name;
  }
}
