// Closed components: the size tests of their contours, and their emission as pixel-exact
// polygons, through the callback table or straight into the library's own path.
#include "raster/ob_context.h"
#include "raster/vect_path.h"

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
// The calls of the callback table, each entry optional.
struct TableSink {
  static constexpr bool kTakesRepeats = false;
  const ObCallbackTable* table;
  void* userData;
  void NewComponent() {
    if (table->newComponent) table->newComponent(userData);
  }
  void Moveto(int x, int y) {
    if (table->moveto) table->moveto(x, y, userData);
  }
  void Lineto(int x, int y) {
    if (table->lineto) table->lineto(x, y, userData);
  }
  void CloseComponent() {
    if (table->closeComponent) table->closeComponent(userData);
  }
};

// The path table's callbacks made directly, with VectLineto's test done on the integer corners.
// The emitter draws only horizontal and vertical lines, and repeats a point only where this sink
// lets it (a repeat has no heading and changes nothing), so ShouldExtendLastSegment, which
// lengthens the last line when the new point carries it on in its direction, comes down to
// comparing the headings of the two lines: no float tests, and one branch-free store whether
// the point is new or moves the last one. The contour buffer's fields
// and the count are worked on in copies, which the emitter keeps in registers while it walks a
// contour (see EmitContour); they go back to the closure before anything else reads it.
struct PathSink {
  // The emitter may skip its test for a repeated point, a branch that irregular regions
  // mispredict.
  static constexpr bool kTakesRepeats = true;
  explicit PathSink(VectClosure& c) : closure(&c) { Load(); }
  VectClosure* closure;
  ZvPoint2<float>* data;
  unsigned int size, capacity, emitted;
  int lastX = 0, lastY = 0;
  int heading = 0;  // of the last line, a bit per sense of each axis; 0 before the first line

  void Load() {
    data = closure->contour.data;
    size = closure->contour.size;
    capacity = closure->contour.capacity;
    emitted = closure->emitted;
  }
  void Store() {
    closure->contour.size = size;
    closure->emitted = emitted;
  }
  void NewComponent() { VectNewComponent(closure); }
  void Moveto(int x, int y) {
    Store();
    VectMoveto(x, y, closure);
    Load();
    lastX = x;
    lastY = y;
    heading = 0;
  }
  void Lineto(int x, int y) {
    const int dx = x - lastX, dy = y - lastY;
    const int h = (dx > 0) | (dx < 0) << 1 | (dy > 0) << 2 | (dy < 0) << 3;
    if (size == capacity) {
      Store();
      closure->contour.Resize(size + 1);
      closure->contour.Chop(size);
      Load();
    }
    const unsigned int turn = (h != heading) & (h != 0);
    size += turn;
    data[size - 1] = ZvPoint2<float>{static_cast<float>(x), static_cast<float>(y)};
    emitted += turn;
    heading = h ? h : heading;
    lastX = x;
    lastY = y;
  }
  void CloseComponent() {
    Store();
    VectCloseComponent(closure);
    Load();
  }
};

// The emitter's pen and the last unit edge it drew (column, row, direction), kept apart from the
// context so that they can live in registers while a contour is walked.
template <class Sink>
struct Pen {
  Sink& sink;
  int x, y;
  int edgeColumn, edgeRow, edgeDirection;
  int direction;

  void Lineto(int toX, int toY) {
    x = toX;
    y = toY;
    sink.Lineto(toX, toY);
  }
};

// What a corner's type says of it: whether it stands on the right edge of its pixel rather than
// the left, and the sense in which the ring runs there (+1 down, -1 up, 0 as before it).
const int kOnRightEdge[11] = {0, 0, 1, 1, 0, 0, 1, 1, 0, 0, 1};
const int kSense[11] = {0, 1, -1, -1, 1, 1, -1, -1, 1, 0, 0};

// Each corner stands for one unit edge along its row, on the left edge of its pixel for corners
// on walls with the region to their right and on the right edge otherwise; the ring runs down
// the first kind and up the second. Joining the unit edges of consecutive corners gives only
// horizontal and vertical lines, since a wall that steps sideways always has a corner in the
// row before the step and in the row of it.
template <class Sink>
void EmitCorner(Pen<Sink>& pen, const ObVertex* v) {
  const int column = v->x - 2 + kOnRightEdge[v->type];
  if (kSense[v->type]) pen.direction = kSense[v->type];
  // A corner born and ended in one row doubles its partner's unit edge.
  if (column == pen.edgeColumn && v->y == pen.edgeRow && pen.direction == pen.edgeDirection) return;
  pen.edgeColumn = column;
  pen.edgeRow = v->y;
  pen.edgeDirection = pen.direction;
  const int from = pen.direction > 0 ? v->y - 2 : v->y - 1;
  const int to = pen.direction > 0 ? v->y - 1 : v->y - 2;
  if (Sink::kTakesRepeats || column != pen.x || from != pen.y) pen.Lineto(column, from);
  pen.Lineto(column, to);
}

// An outer contour starts down the left edge of its first pixel, a hole up the right edge of
// the pixel left of it.
template <class Sink>
void EmitContour(Sink& sink, const ObContour* contour, bool hole) {
  const ObVertex* first = contour->first;
  const int column = hole ? first->x - 1 : first->x - 2;
  const int from = hole ? first->y - 1 : first->y - 2;
  const int to = hole ? first->y - 2 : first->y - 1;
  const int direction = hole ? -1 : 1;
  // A copy of the sink that nothing else can reach, so that its fields can stay in registers.
  Sink local = sink;
  Pen<Sink> pen{local, column, from, column, first->y, direction, direction};
  local.Moveto(column, from);
  pen.Lineto(column, to);
  for (const ObVertex* v = first->next; v != first; v = v->next)
    EmitCorner(pen, v);
  if (pen.x != column || pen.y != from) pen.Lineto(column, from);
  sink = local;
}

bool Passes(const ObContext& ctx, const ObContour* contour) {
  return ObTestContourArea(ctx, contour) && ObTestContourPerimeter(ctx, contour);
}

template <class Sink>
void Emit(ObContext& ctx, Sink& sink, ObComponent* component) {
  const ObContour* outer = component->contours;
  if (!Passes(ctx, outer)) return;
  sink.NewComponent();
  EmitContour(sink, outer, false);
  for (const ObContour* c = outer->next; c != outer; c = c->next)
    if (Passes(ctx, c)) EmitContour(sink, c, true);
  sink.CloseComponent();
}
}  // namespace

void ObEmitComponent(ObContext& ctx, ObComponent* component) {
  TableSink sink{&ctx.table, ctx.userData};
  Emit(ctx, sink, component);
}

void ObEmitComponentToPath(ObContext& ctx, ObComponent* component) {
  PathSink sink(*static_cast<VectClosure*>(ctx.userData));
  Emit(ctx, sink, component);
}
