// Closed components: the size tests of their contours, and their emission as pixel-exact
// polygons through the callback table.
#include "raster/ob_context.h"

#include <cmath>

int ObTestContourArea(const ObContext& ctx, const ObContour* contour) {
  if (std::fabs(ctx.areaThreshold) <= 1e-09) return 1;
  const ObVertex* first = contour->first;
  double sum = 0.0;
  unsigned int n = 0;
  const ObVertex* v = first;
  do {
    const ObVertex* w = v->next;
    sum += static_cast<double>(v->x) * w->y - static_cast<double>(v->y) * w->x;
    ++n;
    v = w;
  } while (v != first);
  if (n < 3) return 0;
  return std::fabs(sum) >= 2.0 * ctx.areaThreshold;
}

int ObTestContourPerimeter(const ObContext& ctx, const ObContour* contour) {
  if (std::fabs(ctx.perimeterThreshold) <= 1e-09) return 1;
  const ObVertex* first = contour->first;
  double sum = 0.0;
  const ObVertex* v = first;
  do {
    const ObVertex* w = v->next;
    const double dx = static_cast<double>(w->x) - v->x, dy = static_cast<double>(w->y) - v->y;
    const double d2 = dx * dx + dy * dy;
    if (d2 > 1e-09) sum += std::sqrt(d2);
    if (sum >= ctx.perimeterThreshold) return 1;
    v = w;
  } while (v != first);
  return 0;
}

namespace {
void Lineto(ObContext& ctx, int x, int y) {
  ctx.penX = x;
  ctx.penY = y;
  if (ctx.table.lineto) ctx.table.lineto(x, y, ctx.userData);
}

// Each corner stands for one unit edge along its row, on the left edge of its pixel for corners
// on walls with the region to their right and on the right edge otherwise; the ring runs down
// the first kind and up the second. Joining the unit edges of consecutive corners gives only
// horizontal and vertical lines, since a wall that steps sideways always has a corner in the
// row before the step and in the row of it.
void EmitCorner(ObContext& ctx, const ObVertex* v) {
  int column = v->x - 2;
  switch (v->type) {
    case ObBirthLeft:
    case ObSplitRight:
    case ObDeathLeft:
    case ObMergeRight:
      ctx.direction = 1;
      break;
    case ObBirthRight:
    case ObSplitLeft:
    case ObDeathRight:
    case ObMergeLeft:
      ctx.direction = -1;
      column = v->x - 1;
      break;
    case ObStepOnRightSide:
      column = v->x - 1;
      break;
    default:
      break;
  }
  // A corner born and ended in one row doubles its partner's unit edge.
  if (column == ctx.edgeColumn && v->y == ctx.edgeRow && ctx.direction == ctx.edgeDirection) return;
  ctx.edgeColumn = column;
  ctx.edgeRow = v->y;
  ctx.edgeDirection = ctx.direction;
  const int from = ctx.direction > 0 ? v->y - 2 : v->y - 1;
  const int to = ctx.direction > 0 ? v->y - 1 : v->y - 2;
  if (column != ctx.penX || from != ctx.penY) Lineto(ctx, column, from);
  Lineto(ctx, column, to);
}

// An outer contour starts down the left edge of its first pixel, a hole up the right edge of
// the pixel left of it.
void EmitContour(ObContext& ctx, const ObContour* contour, bool hole) {
  const ObVertex* first = contour->first;
  const int column = hole ? first->x - 1 : first->x - 2;
  const int from = hole ? first->y - 1 : first->y - 2;
  const int to = hole ? first->y - 2 : first->y - 1;
  ctx.direction = hole ? -1 : 1;
  ctx.edgeColumn = column;
  ctx.edgeRow = first->y;
  ctx.edgeDirection = ctx.direction;
  if (ctx.table.moveto) ctx.table.moveto(column, from, ctx.userData);
  Lineto(ctx, column, to);
  for (const ObVertex* v = first->next; v != first; v = v->next)
    EmitCorner(ctx, v);
  if (ctx.penX != column || ctx.penY != from) Lineto(ctx, column, from);
}

bool Passes(const ObContext& ctx, const ObContour* contour) {
  return ObTestContourArea(ctx, contour) && ObTestContourPerimeter(ctx, contour);
}
}  // namespace

void ObEmitComponent(ObContext& ctx, ObComponent* component) {
  const ObContour* outer = component->contours;
  if (!Passes(ctx, outer)) return;
  if (ctx.table.newComponent) ctx.table.newComponent(ctx.userData);
  EmitContour(ctx, outer, false);
  for (const ObContour* c = outer->next; c != outer; c = c->next)
    if (Passes(ctx, c)) EmitContour(ctx, c, true);
  if (ctx.table.closeComponent) ctx.table.closeComponent(ctx.userData);
}
