// The sweep: rows read one by one, each compared with the rows above and below.
#include "raster/ob_context.h"

#include <algorithm>
#include <utility>

namespace {
// A cursor into a neighbour row. It only moves forward, since the runs of the present row are
// visited left to right: a row costs time linear in its runs.
class ObNeighbours {
  // Entry - 1 < bound as unsigned numbers: false for the 0 that closes a row.
  static unsigned int Less(std::uint16_t entry, unsigned int bound) {
    return static_cast<unsigned int>(entry) - 1 < bound;
  }

 public:
  explicit ObNeighbours(const std::uint16_t* row) : row(row) {}
  // Overlaps of the columns start..end, widened by the margin on both sides.
  void Find(int start, int end, int margin, int& count, int& first, int& last) {
    // Each cursor moves over a run or two at most, most of the time. Runs are sorted, so the
    // second run can pass only if the first does: both are tested at once, from loads that do
    // not wait on each other, and the loop after them rarely runs, where a loop alone would
    // mispredict its exit on every irregular row. A test is one unsigned compare, the closing
    // zeros of the row falling out as the largest values; the second test may read the pair
    // after them (the rows have room for it), but then the first has failed and its answer is
    // dropped.
    const unsigned int before = static_cast<unsigned int>(std::max(start - margin - 1, 0));
    const unsigned int reach = static_cast<unsigned int>(end + margin);
    auto endsBefore = [&](unsigned int k) { return Less(row[2 * k + 1], before); };
    auto startsWithin = [&](unsigned int k) { return Less(row[2 * k], reach); };
    const unsigned int e0 = endsBefore(ended), e1 = endsBefore(ended + 1);
    const unsigned int s0 = startsWithin(started), s1 = startsWithin(started + 1);
    ended += e0 + (e0 & e1);
    started += s0 + (s0 & s1);
    while (endsBefore(ended))
      ++ended;
    while (startsWithin(started))
      ++started;
    count = static_cast<int>(started - ended);
    first = count ? static_cast<int>(ended) + 1 : 0;
    last = count ? static_cast<int>(started) : 0;
  }

 private:
  const std::uint16_t* row;
  unsigned int ended = 0;    // runs ending left of the present run
  unsigned int started = 0;  // runs starting no further right than its end
};

// Moves a wall to column x for the next row. Called for every wall on every row, so it is kept
// where the sweep can inline it.
inline void ObAdvanceWall(ObContext& ctx, ObActiveWall* wall, int x) {
  const int step = x - wall->x;
  // A straight wall makes no corner; a sideways step, or the end of one, does. A fresh wall's
  // birth or split corner already stands for its first row. One branch on the outcome, rather
  // than one per test, since on irregular regions each test is a coin toss.
  const bool corner = (!wall->fresh) & ((step != wall->lastStep) | (x != wall->x));
  wall->lastStep = step;
  wall->fresh = false;
  if (corner) {
    // The ring runs down the walls with the region on their right and up the others, so the
    // new corner follows the wall's last one or comes before it.
    const bool down = ObHasRegionOnRight(wall->kind);
    ObVertex* ObVertex::*const forward = down ? &ObVertex::next : &ObVertex::prev;
    ObVertex* ObVertex::*const backward = down ? &ObVertex::prev : &ObVertex::next;
    ObVertex* v = ctx.vertices.New();
    v->x = wall->x;
    v->y = wall->y;
    v->type = down ? ObStepOnLeftSide : ObStepOnRightSide;
    // Every wall gets its first corner at its birth or split; only the sentinels have none,
    // and no run of the first row can have one of them as its wall, since the row above it is
    // empty. The analyzer cannot see that far.
    wall->last->*forward = v;  // NOLINT(clang-analyzer-core.NullDereference)
    v->*backward = wall->last;
    wall->last = v;
  }
  wall->y = static_cast<std::uint16_t>(wall->y + 1);
  wall->x = static_cast<std::uint16_t>(x);
}

// Done with run p: its right wall moves to its end, and it dies if nothing is below it. `wall`
// is the wall left of p's right wall, or p's right wall itself after a birth.
ObActiveWall* Finish(ObContext& ctx, ObActiveWall* wall, const ObRun& p, int y) {
  if (p.aboveCount) {
    wall = wall->next;
    ObAdvanceWall(ctx, wall, p.end);
  }
  if (!p.belowCount) wall = ObMakeDeath(ctx, wall->prev, wall, y);
  return wall;
}
}  // namespace

void ObProcessRow(ObContext& ctx, const std::uint16_t* prev, const std::uint16_t* cur,
                  const std::uint16_t* next, int y) {
  if (!cur[0]) return;
  ObNeighbours above(prev), below(next);
  ObActiveWall* wall = ctx.leftSentinel;
  // p is the run left of c: events between neighbours are seen once, when c is treated.
  ObRun p{}, c{};
  bool hasP = false;
  for (unsigned int k = 0; cur[2 * k]; ++k) {
    c.start = cur[2 * k];
    c.end = cur[2 * k + 1];
    above.Find(c.start, c.end, ctx.margin, c.aboveCount, c.aboveFirst, c.aboveLast);
    below.Find(c.start, c.end, ctx.margin, c.belowCount, c.belowFirst, c.belowLast);
    const bool birth = c.aboveCount == 0;
    if (birth) {
      if (hasP) wall = Finish(ctx, wall, p, y);
      wall = ObMakeBirth(ctx, wall, c.start, c.end, y);
    } else if (hasP && p.aboveLast == c.aboveFirst) {
      // One run above, two here: the gap between them may be the top of a hole. `wall` is p's
      // left wall; p's right wall is the new left wall of the split.
      ObActiveWall* right = ObMakeSplit(ctx, wall, p.end, c.start, y);
      if (!p.belowCount) ObMakeDeath(ctx, wall, right->prev, y);
      wall = right;
    } else {
      if (hasP) wall = Finish(ctx, wall, p, y);
      wall = wall->next;
      ObAdvanceWall(ctx, wall, c.start);
    }
    if (c.belowCount && hasP && p.belowLast == c.belowFirst) {
      // Two runs here, one below: p's right wall and c's left wall close the gap.
      if (birth)
        wall = ObMakeMerge(ctx, wall->prev->prev, wall->prev, y)->next;
      else
        wall = ObMakeMerge(ctx, wall->prev, wall, y);
    }
    p = c;
    hasP = true;
  }
  if (wall != ctx.leftSentinel) Finish(ctx, wall, p, y);
}

void ObVectorize(ObContext& ctx, const ZvRaster<unsigned char>& raster, unsigned char value,
                 const ZvExtent2<float>& extent) {
  if (ctx.table.init) ctx.table.init(extent, ctx.userData);
  ctx.leftSentinel = ctx.walls.New();
  ctx.rightSentinel = ctx.walls.New();
  ctx.leftSentinel->next = ctx.rightSentinel;
  ctx.rightSentinel->prev = ctx.leftSentinel;

  const int width = raster.GetWidth(), height = raster.GetHeight();
  const unsigned int entries = ObRowEntries(width);
  // Two entries past the last row, for the neighbour cursors' look ahead.
  std::vector<std::uint16_t> rows(3 * entries + 2, 0);
  std::uint16_t* prev = rows.data();
  std::uint16_t* cur = prev + entries;
  std::uint16_t* next = cur + entries;
  // The sweep lags one row behind the reading, so that every row is treated knowing the row
  // below; two empty rows after the last flush its deaths.
  int y = 1;
  for (int r = 0; r < height + 2; ++r, ++y) {
    if (r < height)
      ObEncodeRow(raster.GetRaster() + raster.CalculateOffsetForPos(0, r), width, value, next);
    else
      next[0] = next[1] = 0;
    ObProcessRow(ctx, prev, cur, next, y);
    std::swap(prev, cur);
    std::swap(cur, next);
  }
  if (ctx.table.close) ctx.table.close(ctx.userData);
}
