// A shape animation: property paths as keys along one parameter (time, say), and the agents
// that edit it and evaluate it.
//
// ZvMipPath2fProp1d holds keys in strictly ascending order of parameter; two parameters within
// 1e-15 are one key. Each key owns a private deep copy of its ZvPath2fProp1d: a path handed in
// is copied, never kept, and no key path is ever handed out.
//
// ZvMipP2fP1dAgent works on one sequence it does not own (the sequence must outlive it) and
// keeps a result path of its own. Between two keys it morphs: ZvMorpher::LinearMorph of the two
// key paths at the ratio of t between their parameters, with a context of pointMergeDistance =
// `spacing` (path units: the flatten tolerance and resampling step), propertyTolerance =
// `tolerance` (property units) and fitTolerance 0.25. Key paths of the same topology
// (siblings) blend their control points and are not refitted. At a key, and beyond the first
// or last key, the result is a copy of that key's path. The result is valid up to the agent's
// next evaluation; it belongs to the agent.
//
// Threads. The sequence and every agent each embed a recursive lock. An agent's operation takes
// the agent's lock first, then the sequence's, always in that order, and holds both for the
// whole call (a whole morph included). So several agents, one per thread, may evaluate and edit
// one sequence at once. One agent is not meant to be shared between threads: its result is
// read after the call returns, unlocked.
//
// Failure. Integer results are 1 for success and 0 for a refusal, which changes nothing.
// Allocation failures pass through the editing operations as std::bad_alloc and leave the
// sequence as it was.
//
// Persistence (little-endian, the same from every build):
//   0  u32  body length (total - 4)       4  u32  version 256 (bytes 0, 1, 0, 0)
//   8  u32  key count n                  12  per key: f64 parameter (a value that is not finite
//                                            is written 0.0), then the key path's whole block
//                                            (ZvPath2fProp1d::WriteToBuffer, its prefix included)
// Total: 12 + the sum over the keys of (8 + path GetBufferSize). Unlike a shape block, it has no
// kind word.
#ifndef ZV_MIP_PATH2F_PROP1D_H
#define ZV_MIP_PATH2F_PROP1D_H

#include <zv/api.h>
#include <zv/arrays.h>
#include <zv/critical_section.h>
#include <zv/morpher.h>
#include <zv/path2f_prop1d.h>

#include <cstddef>

class ZvTransfo4;
class ZvMipPath2fProp1dImpl;
struct ZvMipP2fP1dAgentData;

class ZV_API ZvMipPath2fProp1d {
 public:
  // No keys.
  ZvMipPath2fProp1d();
  // Deep: every key path is copied.
  ZvMipPath2fProp1d(const ZvMipPath2fProp1d& other);
  // One key: a copy of `path` at `parameter`.
  ZvMipPath2fProp1d(const ZvPath2fProp1d& path, double parameter);
  // The part of `source` from `from` to `to`, bounds included: copies of its keys there, and
  // where a bound lies strictly between two keys, a key at the bound holding the source's
  // evaluation there (at the default context's pointMergeDistance and propertyTolerance, so the
  // cost of such a key grows with the size of the source's keys over 0.5). A bound beyond the
  // source's first or last key adds nothing.
  ZvMipPath2fProp1d(const ZvMipPath2fProp1d& source, double from, double to);
  ~ZvMipPath2fProp1d();
  // Deep. Locks this sequence, then the source. If a copy cannot be allocated, this sequence is
  // left as it was and std::bad_alloc goes on to the caller.
  ZvMipPath2fProp1d& operator=(const ZvMipPath2fProp1d& other);

  unsigned int GetNumKeys() const;
  // Appends every key parameter, in order; the result is the count appended.
  unsigned int GetAllKeyParameters(ZvDoubleArray& parameters) const;
  // 1, or 0 with `parameter` untouched when there are no keys.
  int GetSmallestKeyParameter(double& parameter) const;
  int GetLargestKeyParameter(double& parameter) const;

  // The whole block's size and its writing; WriteToBuffer answers the bytes written, 0 for a
  // null buffer. Each call locks the sequence on its own: while agents on other threads may
  // still edit, the size asked can be out of date by the time of the write.
  unsigned int GetBufferSize() const;
  unsigned int WriteToBuffer(void* buffer) const;
  // Reads a trusted body (the bytes behind the length field). Result: 8 + the sum over the keys
  // of (12 + the key path's body length). 0, with the sequence unchanged, when the version word
  // is below 256, a key path's block is refused or memory runs out.
  unsigned int ReadFromBufferBody(const void* body);
  // Reads a whole block of `size` bytes from an untrusted source, length field included: refused
  // (0, the sequence unchanged) when the stored length exceeds `size`, when anything would be
  // read past the body or a key path's block, when a key path's own bounded reader refuses it,
  // or when the key parameters are not strictly ascending. Otherwise 4 + the stored length.
  unsigned int ReadFromBuffer(const void* buffer, std::size_t size);

 private:
  friend struct ZvMipP2fP1dAgentData;  // the agents reach the keys and the lock through it
  unsigned int ReadBlock(const void* body, std::size_t size, bool bounded);

  ZvMipPath2fProp1dImpl* impl;
  mutable ZvCriticalSection cs;
};

// Size of the body length field of the sequence's block: 4.
ZV_API unsigned int ZvMipPath2fProp1d_GetBufferBodyLengthSize();

class ZV_API ZvMipP2fP1dAgent {
 public:
  // Attaches to `mipPath`, which must outlive the agent.
  explicit ZvMipP2fP1dAgent(ZvMipPath2fProp1d& mipPath);
  ZvMipP2fP1dAgent(const ZvMipP2fP1dAgent&) = delete;
  ZvMipP2fP1dAgent& operator=(const ZvMipP2fP1dAgent&) = delete;
  ~ZvMipP2fP1dAgent();

  // The sequence at t (see the top of this file for the morph); an empty path when there are no
  // keys. `spacing` is in path units, `tolerance` in property units. Between keys the result is
  // also empty when the morph refuses the spacing: not a positive finite number, or so small
  // against the keys that resampling would take more than ZvMorpher::kMaxSteps steps.
  ZvPath2fProp1d& Eval(double t, double spacing, double tolerance);
  // As Eval, with only the keys in from..to visible; a key exactly on a bound is visible when
  // the bound's include flag is non-zero. A t outside the visible keys gives the nearer end's
  // key; with no visible key the result is empty.
  ZvPath2fProp1d& EvalInInterval(double t, double from, double to, int includeFrom, int includeTo,
                                 double spacing, double tolerance);

  // Puts a copy of `path` at t: replaces the path of a key within 1e-15 of t (its parameter
  // stays), otherwise inserts a key in order. 0 for a t that is not finite.
  int CreateKey(double t, const ZvPath2fProp1d& path);
  // CreateKey with the last evaluation; 0 when that is empty (no evaluation yet, say).
  int CreateKeyFromEvaluation(double t);
  // Replaces the keys in from..to (bound rules as in EvalInInterval) by one key: a copy of
  // `path` at t. 0, with nothing changed, when t is not finite or does not lie strictly between
  // the nearest keys kept on either side, so that the order stays strict.
  int MergeAndCreateKey(double t, double from, double to, const ZvPath2fProp1d& path,
                        int includeFrom, int includeTo);
  // Deletes the key nearest to t among those within `tolerance` of it (the earlier on a tie).
  // 1 also when there are no keys at all; 0 when keys exist but none lies that near.
  int RemoveKey(double t, double tolerance);
  // Deletes the keys in from..to (bound rules as in EvalInInterval). 1 also when there are no
  // keys at all; 0 when keys exist but none lies in the interval.
  int RemoveKeys(double from, double to, int includeFrom, int includeTo);
  // Adds d to every key parameter. 1.
  int ShiftKeyParameters(double d);
  // Multiplies every key parameter by s. A negative s reverses the order the keys rely on and
  // must not be passed. 1.
  int ScaleKeyParameterAxis(double s);
  // Transforms every key path (its geometry, in path units). 1.
  int Transform(const ZvTransfo4& transform);

 private:
  ZvMipP2fP1dAgentData* data;
  ZvCriticalSection cs;
};

#endif
