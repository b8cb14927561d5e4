// The key store behind ZvMipPath2fProp1d and the record behind ZvMipP2fP1dAgent.
//
// Nothing here locks: the sequence and the agents take their locks before calling in.
#ifndef ZV_SHAPE_MIP_PATH_IMPL_H
#define ZV_SHAPE_MIP_PATH_IMPL_H

#include <zv/arrays.h>
#include <zv/mip_path2f_prop1d.h>
#include <zv/path2f_prop1d.h>

// One key: its parameter and its path, owned by the store.
struct MPKey {
  double parameter = 0.0;
  ZvPath2fProp1d* path = nullptr;
};

class ZvMipPath2fProp1dImpl {
 public:
  // Parameters this close are one key.
  static constexpr double kSameParameter = 1e-15;

  ZvMipPath2fProp1dImpl() : keys(1) {}
  // Deep; if a copy cannot be allocated, what was copied is freed and std::bad_alloc goes on.
  ZvMipPath2fProp1dImpl(const ZvMipPath2fProp1dImpl& other);
  ZvMipPath2fProp1dImpl& operator=(const ZvMipPath2fProp1dImpl&) = delete;
  ~ZvMipPath2fProp1dImpl();

  void Swap(ZvMipPath2fProp1dImpl& other);

  // The index of the first key above t; for a key within 1e-15 of t, one past that key's
  // index, with `exact` 1.
  unsigned int LocateParameter(double t, int& exact) const;
  // The first and last key in from..to, bounds included (within 1e-15). 0, with both indices
  // untouched, when none lies there.
  int GetKeyIndicesInInterval(double from, double to, unsigned int& first,
                              unsigned int& last) const;
  // The keys in from..to as the half-open index range [begin, end); a key within 1e-15 of a
  // bound counts when the bound's flag is non-zero. begin >= end when none lies there.
  void GetIntervalRange(double from, double to, int includeFrom, int includeTo, unsigned int& begin,
                        unsigned int& end) const;

  // Deletes the keys strictly between `before` and `after` and puts a key with a copy of
  // key.path at key.parameter in their place. `before` is ~0u at the front of the sequence and
  // `after` the key count at its end. Nothing changes if an allocation fails. 1.
  int RemoveBodyAndCreateKeyBetweenExistingKeys(const MPKey& key, unsigned int before,
                                                unsigned int after);
  // A copy of `path` at `parameter`, inserted before key `at`.
  void InsertKey(unsigned int at, double parameter, const ZvPath2fProp1d& path);
  // Key `index` takes a copy of `path`; its parameter stays.
  void ReplaceKeyPath(unsigned int index, const ZvPath2fProp1d& path);
  // Deletes keys [begin, end).
  void RemoveKeys(unsigned int begin, unsigned int end);
  // Appends a key that takes over `path` (allocated with new); frees it if the append fails.
  void AppendOwned(double parameter, ZvPath2fProp1d* path);

  // Makes the empty `out` the sequence at t seen through keys [begin, end) (begin < end): a
  // copy of the key at t or, beyond those keys, of the nearer end key; otherwise the linear
  // morph between the two keys around t with the context the agents document.
  void EvalInto(double t, unsigned int begin, unsigned int end, double spacing, double tolerance,
                ZvPath2fProp1d& out) const;

  ZvDynArray<MPKey> keys;

 private:
  // Replaces `removeCount` keys at `at` by `insert` (null: by nothing), which takes over a copy
  // of its path.
  void Splice(unsigned int at, unsigned int removeCount, const MPKey* insert);
};

// What an agent owns besides its lock.
struct ZvMipP2fP1dAgentData {
  explicit ZvMipP2fP1dAgentData(ZvMipPath2fProp1d& sequence) : mipPath(&sequence), result(1) {}
  ZvCriticalSection& SequenceLock() const { return mipPath->cs; }
  ZvMipPath2fProp1dImpl& Keys() const { return *mipPath->impl; }
  ZvMipPath2fProp1d* mipPath;  // not owned
  ZvPath2fProp1d result;       // the last evaluation
};

#endif
