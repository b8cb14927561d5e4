// The four events of the sweep: birth, split, death and merge, and the bookkeeping of the
// chains, contours and components they join.
#include "raster/ob_context.h"

namespace {
ObVertex* NewVertex(ObContext& ctx, int x, int y, ObVertexType type) {
  ObVertex* v = ctx.vertices.New();
  v->x = static_cast<std::uint16_t>(x);
  v->y = static_cast<std::uint16_t>(y);
  v->type = type;
  return v;
}

ObEvent* NewEvent(ObContext& ctx, ObEventKind kind, ObVertex* first, ObComponent* component,
                  ObContour* contour) {
  ObEvent* e = ctx.events.New();
  e->next = e->prev = e;
  e->kind = kind;
  e->first = first;
  e->component = component;
  e->contour = contour;
  return e;
}

ObContour* NewContour(ObContext& ctx, ObEvent* event, ObVertex* first) {
  ObContour* c = ctx.contours.New();
  c->next = c->prev = c;
  c->event = event;
  c->first = first;
  return c;
}

// Two walls side by side, inserted after `after`.
ObActiveWall* InsertWalls(ObContext& ctx, ObActiveWall* after, ObEvent* event, int kind, int leftX,
                          ObVertex* leftLast, int rightX, ObVertex* rightLast, int y) {
  ObActiveWall* l = ctx.walls.New();
  ObActiveWall* r = ctx.walls.New();
  l->kind = kind;
  r->kind = kind + 1;
  l->x = static_cast<std::uint16_t>(leftX);
  r->x = static_cast<std::uint16_t>(rightX);
  l->y = r->y = static_cast<std::uint16_t>(y);
  l->last = leftLast;
  r->last = rightLast;
  l->event = r->event = event;
  l->fresh = r->fresh = true;
  l->prev = after;
  l->next = r;
  r->prev = l;
  r->next = after->next;
  after->next->prev = r;
  after->next = l;
  return r;
}

ObActiveWall* RemoveWalls(ObContext& ctx, ObActiveWall* left, ObActiveWall* right) {
  ObActiveWall* before = left->prev;
  before->next = right->next;
  right->next->prev = before;
  ctx.walls.Free(left);
  ctx.walls.Free(right);
  return before;
}

void AppendContour(ObComponent* component, ObContour* c) {
  ObContour* head = component->contours;
  if (!head) {
    component->contours = c->next = c->prev = c;
    return;
  }
  c->prev = head->prev;
  c->next = head;
  head->prev->next = c;
  head->prev = c;
}

void RemoveContour(ObComponent* component, ObContour* c) {
  if (c->next == c) {
    component->contours = nullptr;
  } else {
    c->prev->next = c->next;
    c->next->prev = c->prev;
    if (component->contours == c) component->contours = c->next;
  }
  c->next = c->prev = c;
}

// Joins the event ring holding `a` and the ring holding `b` through the new event `e`, placed
// between them. When a and b are on one ring the chain has closed, and e is merely inserted.
void LinkEvent(ObEvent* a, ObEvent* e, ObEvent* b, bool sameRing) {
  ObEvent* after = a->next;
  a->next = e;
  e->prev = a;
  if (sameRing) {
    e->next = after;
    after->prev = e;
    return;
  }
  ObEvent* beforeB = b->prev;
  e->next = b;
  b->prev = e;
  beforeB->next = after;
  after->prev = beforeB;
}

template <class F>
void ForEachEvent(ObEvent* start, F f) {
  ObEvent* e = start;
  do {
    f(e);
    e = e->next;
  } while (e != start);
}

// Top first, then left: the order in which the sweep meets corners.
bool Before(const ObVertex* a, const ObVertex* b) {
  return a->y < b->y || (a->y == b->y && a->x < b->x);
}
}  // namespace

ObActiveWall* ObMakeBirth(ObContext& ctx, ObActiveWall* after, int start, int end, int y) {
  ObVertex* l = NewVertex(ctx, start, y, ObBirthLeft);
  ObVertex* r = NewVertex(ctx, end, y, ObBirthRight);
  r->next = l;
  l->prev = r;
  ObComponent* component = ctx.components.New();
  ObEvent* e = NewEvent(ctx, ObBirth, l, component, nullptr);
  AppendContour(component, NewContour(ctx, e, l));
  return InsertWalls(ctx, after, e, ObBirthLeftWall, start, l, end, r, y);
}

ObActiveWall* ObMakeSplit(ObContext& ctx, ObActiveWall* after, int leftEnd, int rightStart, int y) {
  ObVertex* l = NewVertex(ctx, leftEnd, y, ObSplitLeft);
  ObVertex* r = NewVertex(ctx, rightStart, y, ObSplitRight);
  l->next = r;
  r->prev = l;
  ObComponent* component = after->event->component;
  ObEvent* e = NewEvent(ctx, ObSplit, l, component, nullptr);
  e->contour = NewContour(ctx, e, l);
  AppendContour(component, e->contour);
  ++component->holes;
  return InsertWalls(ctx, after, e, ObSplitLeftWall, leftEnd, l, rightStart, r, y);
}

ObActiveWall* ObMakeDeath(ObContext& ctx, ObActiveWall* left, ObActiveWall* right, int y) {
  ObVertex* l = NewVertex(ctx, left->x, y, ObDeathLeft);
  ObVertex* r = NewVertex(ctx, right->x, y, ObDeathRight);
  left->last->next = l;
  l->prev = left->last;
  l->next = r;
  r->prev = l;
  r->next = right->last;
  right->last->prev = r;

  ObEvent* a = left->event;
  ObEvent* b = right->event;
  ObComponent* component = a->component;
  ObContour* ca = a->contour;
  ObContour* cb = b->contour;
  ObEvent* e = NewEvent(ctx, ObDeath, l, component, nullptr);
  if (!ca && !cb) {
    // Both walls are ends of the outer chain: the component is complete.
    LinkEvent(a, e, b, true);
    ctx.emit(ctx, component);
  } else if (!ca || !cb) {
    // A chain that began under a split turns out to open to the outside: it was no hole.
    ObContour* hole = ca ? ca : cb;
    ForEachEvent(ca ? a : b, [](ObEvent* x) { x->contour = nullptr; });
    RemoveContour(component, hole);
    if (component->holes) --component->holes;
    LinkEvent(a, e, b, false);
  } else {
    // Two hole chains join into one hole, named after the one met first.
    const bool keepB = !Before(ca->first, cb->first);
    ObContour* gone = keepB ? ca : cb;
    ObContour* kept = keepB ? cb : ca;
    ForEachEvent(keepB ? a : b, [kept](ObEvent* x) { x->contour = kept; });
    RemoveContour(component, gone);
    if (component->holes) --component->holes;
    e->contour = kept;
    LinkEvent(a, e, b, false);
  }
  return RemoveWalls(ctx, left, right);
}

ObActiveWall* ObMakeMerge(ObContext& ctx, ObActiveWall* left, ObActiveWall* right, int y) {
  ObVertex* l = NewVertex(ctx, left->x, y, ObMergeLeft);
  ObVertex* r = NewVertex(ctx, right->x, y, ObMergeRight);
  right->last->next = r;
  r->prev = right->last;
  r->next = l;
  l->prev = r;
  l->next = left->last;
  left->last->prev = l;

  ObEvent* a = left->event;
  ObEvent* b = right->event;
  if (a->component == b->component) {
    // The gap between the two runs is closed from below: a hole is complete. It stays on its
    // component, to be emitted with it.
    ObEvent* e = NewEvent(ctx, ObMerge, l, a->component, a->contour);
    LinkEvent(a, e, b, true);
    if (a->contour) a->contour->closed = 1;
    return RemoveWalls(ctx, left, right);
  }
  // Two components become one. A hole chain keeps its component, since the other one has just
  // been found inside that hole; otherwise the component met first survives, so that an outer
  // contour always starts at its topmost, then leftmost corner.
  ObContour* decided = a->contour ? a->contour : b->contour;
  ObComponent* survivor;
  if (a->contour)
    survivor = a->component;
  else if (b->contour)
    survivor = b->component;
  else
    survivor = Before(a->component->contours->first, b->component->contours->first) ? a->component
                                                                                    : b->component;
  ObEvent* dissolvedSide = survivor == a->component ? b : a;
  ObComponent* dissolved = dissolvedSide->component;

  ObContour* head = dissolved->contours;
  for (ObContour* c = head->next; c != head;) {
    ObContour* following = c->next;
    if (!c->closed) ForEachEvent(c->event, [survivor](ObEvent* x) { x->component = survivor; });
    RemoveContour(dissolved, c);
    AppendContour(survivor, c);
    c = following;
  }
  survivor->holes += dissolved->holes;
  // Only the dissolved side needs relabelling: the survivor's chain already carries its names.
  ForEachEvent(dissolvedSide, [survivor, decided](ObEvent* x) {
    x->component = survivor;
    if (decided) x->contour = decided;
  });
  ObEvent* e = NewEvent(ctx, ObMerge, l, survivor, decided);
  LinkEvent(a, e, b, false);
  // The dissolved outer contour is now part of a survivor's chain; its record and the component
  // stay in the pools, unreferenced, until the sweep ends.
  RemoveContour(dissolved, head);
  return RemoveWalls(ctx, left, right);
}
