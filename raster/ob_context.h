// The tracing sweep's records and the state of one sweep.
//
// A sweep reads the raster top row first, each row encoded as runs. Runs are compared with the
// runs of the row above and below, and four events drive a list of active walls: a run with
// nothing above is born, two runs below one run above split (a hole may start between them),
// two runs above one run below merge, and a run with nothing below dies. Each wall grows a chain
// of corners; chains join into rings, and a component (an outer contour with its holes) is
// handed to the callback table when its outer ring closes.
//
// Coordinates are 16-bit and offset: a run's columns are stored plus 2, and raster row r is
// swept as row r + 2, so that 0 can end a row of runs. Every record lives in a pool until the
// end of the sweep: a component that merges into another is relabelled, never copied, so its
// corners must outlive its emission.
#ifndef ZV_RASTER_OB_CONTEXT_H
#define ZV_RASTER_OB_CONTEXT_H

#include <zv/raster.h>
#include <zv/vectorizer.h>

#include <cstdint>
#include <memory>
#include <utility>
#include <vector>

// Corner types. Birth, split, death and merge corners come in left and right pairs; a step
// corner is where a wall moves sideways between rows.
enum ObVertexType : std::uint8_t {
  ObBirthLeft = 1,
  ObBirthRight = 2,
  ObSplitLeft = 3,
  ObSplitRight = 4,
  ObDeathLeft = 5,
  ObDeathRight = 6,
  ObMergeLeft = 7,
  ObMergeRight = 8,
  ObStepOnLeftSide = 9,   // on a wall with the region to its right (kinds 1 and 4)
  ObStepOnRightSide = 10  // on a wall with the region to its left (kinds 2 and 3)
};

// Ring order goes down the walls that have the region on their right and up the others, so an
// outer contour and a hole run in opposite senses.
struct ObVertex {
  ObVertex* next;
  ObVertex* prev;
  std::uint16_t x;
  std::uint16_t y;
  std::uint8_t type;
};

struct ObComponent;
struct ObContour;

enum ObEventKind { ObBirth = 1, ObSplit = 2, ObMerge = 3, ObDeath = 4 };

// The events of one open chain form a ring, so that a chain can be relabelled when it joins
// another contour or component.
struct ObEvent {
  ObEvent* next;
  ObEvent* prev;
  ObComponent* component;
  ObContour* contour;  // null while the chain belongs to the outer contour
  ObVertex* first;
  int kind;
};

struct ObContour {
  ObContour* next;
  ObContour* prev;
  ObEvent* event;
  ObVertex* first;
  int closed;
};

// One outer contour (the head of the ring) with its holes.
struct ObComponent {
  ObContour* contours;
  unsigned int holes;
};

enum ObWallKind {
  ObBirthLeftWall = 1,
  ObBirthRightWall = 2,
  ObSplitLeftWall = 3,
  ObSplitRightWall = 4
};

// A vertical boundary of a run, in the list of walls crossing the present row, left to right.
struct ObActiveWall {
  ObActiveWall* prev;
  ObActiveWall* next;
  ObEvent* event;
  ObVertex* last;  // the open end of its chain
  int kind;
  std::uint16_t x;
  std::uint16_t y;
  int lastStep;
  bool fresh;  // created in this row: the first move needs no corner of its own
};

inline bool ObHasRegionOnRight(int wallKind) {
  return wallKind == ObBirthLeftWall || wallKind == ObSplitRightWall;
}

// Records handed out zeroed and released all at once. Walls are recycled (`Recycled`) since a
// wall lives only while its run does; the other records stay to the end, so their pools skip
// the free list, and hand out the next record of the present chunk after one compare.
template <class T, bool Recycled = false>
class ObPool {
 public:
  T* New() {
    if (Recycled && !freed.empty()) {
      T* p = freed.back();
      freed.pop_back();
      *p = T{};
      return p;
    }
    if (next == limit) Grow();
    T* p = next++;
    *p = T{};
    return p;
  }
  void Free(T* p) {
    static_assert(Recycled, "records of this kind live to the end of the sweep");
    freed.push_back(p);
  }

 private:
  static constexpr unsigned int kChunk = 256;
  void Grow() {
    // Owned before the list grows, so that a failure to grow it frees the chunk.
    std::unique_ptr<T[]> chunk(new T[kChunk]);
    chunks.push_back(std::move(chunk));
    next = chunks.back().get();
    limit = next + kChunk;
  }
  std::vector<std::unique_ptr<T[]>> chunks;
  T* next = nullptr;  // the present chunk's first unused record, up to limit
  T* limit = nullptr;
  std::vector<T*> freed;
};

// A run of the present row with its overlaps in the rows above and below: counts, and the
// 1-based index of the first and last run overlapped (0 for none).
struct ObRun {
  int start;
  int end;
  int aboveCount, aboveFirst, aboveLast;
  int belowCount, belowFirst, belowLast;
};

struct ObContext;
// How a closed component reaches its consumer: ObEmitComponent goes through the callback table;
// ObEmitComponentToPath serves the library's own path table (raster/vect_path.h, userData a
// VectClosure) with the same calls made directly, which spares two indirect calls a corner.
using ObEmitter = void (*)(ObContext& ctx, ObComponent* component);

struct ObContext {
  ObCallbackTable table;
  ObEmitter emit;
  void* userData;
  int margin;  // a run's reach into its neighbour rows; 0 connects shared columns only
  double perimeterThreshold;
  double areaThreshold;
  ObActiveWall* leftSentinel;
  ObActiveWall* rightSentinel;

  ObPool<ObVertex> vertices;
  ObPool<ObEvent> events;
  ObPool<ObContour> contours;
  ObPool<ObComponent> components;
  ObPool<ObActiveWall, true> walls;
};

// Runs and rows.
// Entries a row of runs needs for a raster `width` wide: two per run and a closing pair.
inline unsigned int ObRowEntries(int width) {
  return static_cast<unsigned int>(width / 2) * 2 + 4;
}
void ObEncodeRow(const unsigned char* pixels, int width, unsigned char value, std::uint16_t* row);

// The sweep.
void ObVectorize(ObContext& ctx, const ZvRaster<unsigned char>& raster, unsigned char value,
                 const ZvExtent2<float>& extent);
void ObProcessRow(ObContext& ctx, const std::uint16_t* prev, const std::uint16_t* cur,
                  const std::uint16_t* next, int y);

// Events. Birth and split insert their two walls after `after` and answer the right one; death
// and merge remove the pair and answer the wall left of it.
ObActiveWall* ObMakeBirth(ObContext& ctx, ObActiveWall* after, int start, int end, int y);
ObActiveWall* ObMakeSplit(ObContext& ctx, ObActiveWall* after, int leftEnd, int rightStart, int y);
ObActiveWall* ObMakeDeath(ObContext& ctx, ObActiveWall* left, ObActiveWall* right, int y);
ObActiveWall* ObMakeMerge(ObContext& ctx, ObActiveWall* left, ObActiveWall* right, int y);

// Contours.
int ObTestContourArea(const ObContext& ctx, const ObContour* contour);
int ObTestContourPerimeter(const ObContext& ctx, const ObContour* contour);
void ObEmitComponent(ObContext& ctx, ObComponent* component);
void ObEmitComponentToPath(ObContext& ctx, ObComponent* component);

#endif
