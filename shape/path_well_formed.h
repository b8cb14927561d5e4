// The structural rules of a path's two arrays, checked in one pass. The bounded reader applies
// them to blocks from untrusted sources, so that no path reaches a host that its own queries
// would walk off.
#ifndef ZV_SHAPE_PATH_WELL_FORMED_H
#define ZV_SHAPE_PATH_WELL_FORMED_H

namespace zv_path {

// True when the codes parse: index 0 (if any) starts a subpath; after every node comes either
// a new start or the first code of a segment, whose degree then fixes the codes of its points;
// a closed end code ends its subpath; and no code carries the bits above the segment code
// (locks are not persisted, and nothing sets bit 6).
bool IsWellFormedBlock(const unsigned char* codes, unsigned int count);

}  // namespace zv_path

#endif
