// User data attached to a function curve: opaque byte items keyed by a
// 16-byte identifier, either on the curve as a whole or on one of its keys.
// Whether an item owns its bytes or refers to the caller's is chosen per
// value (CFCUserDataValue); a referring value must not outlive the bytes.
#ifndef ZV_FCURVE_USERDATA_H
#define ZV_FCURVE_USERDATA_H

#include <zv/api.h>

#include <cstring>
#include <map>

class ZvBaseFCurve;
class ZvByteReader;

// 16-byte identifier of one user data item.
struct _zvUID {
  unsigned int Data1;
  unsigned short Data2;
  unsigned short Data3;
  unsigned char Data4[8];
};

inline bool operator==(const _zvUID& a, const _zvUID& b) {
  return a.Data1 == b.Data1 && a.Data2 == b.Data2 && a.Data3 == b.Data3 &&
         std::memcmp(a.Data4, b.Data4, sizeof a.Data4) == 0;
}
inline bool operator!=(const _zvUID& a, const _zvUID& b) {
  return !(a == b);
}

// Map key over a _zvUID; a strict weak order over the 16 bytes.
class ZV_API CFCUserDataKey {
 public:
  CFCUserDataKey();
  explicit CFCUserDataKey(const _zvUID& uid);

  const _zvUID& GetUID() const { return m_uid; }
  bool operator<(const CFCUserDataKey& other) const;

 private:
  _zvUID m_uid;
};

// The bytes of one item. Copies always deep-copy; when an allocation fails
// the copy stays empty without reporting it. The bytes are freed only when
// the value owns them.
class ZV_API CFCUserDataValue {
 public:
  CFCUserDataValue();
  // copyBytes non-zero: the value owns a copy of the bytes.
  // copyBytes zero: the value only refers to the caller's bytes.
  CFCUserDataValue(const unsigned char* data, unsigned int size, int copyBytes);
  CFCUserDataValue(const CFCUserDataValue& other);
  CFCUserDataValue& operator=(const CFCUserDataValue& other);
  ~CFCUserDataValue();

  unsigned int GetSize() const { return m_size; }
  unsigned int IsOwned() const { return m_owned; }
  const unsigned char* GetData() const { return m_data; }

  // Replaces the bytes by a copy of the given ones (same failure rule).
  void Assign(const unsigned char* data, unsigned int size);

 private:
  void Release();

  unsigned int m_size;
  unsigned int m_owned;
  unsigned char* m_data;
};

// An ordered set of items, one per identifier.
class ZV_API CFCUserDataSet {
 public:
  typedef std::map<CFCUserDataKey, CFCUserDataValue> ItemMap;
  typedef ItemMap::const_iterator const_iterator;

  CFCUserDataSet();
  CFCUserDataSet(const CFCUserDataSet& other);
  CFCUserDataSet& operator=(const CFCUserDataSet& other);
  virtual ~CFCUserDataSet();

  unsigned int GetCount() const;
  unsigned int IsEmpty() const;
  const_iterator begin() const;
  const_iterator end() const;

  // The item of an identifier, or null. The pointer stays valid until the
  // item is replaced or removed.
  const CFCUserDataValue* FindUserData(const _zvUID& uid) const;
  // Stores a copy of the bytes, replacing an existing item of the same
  // identifier.
  void SetUserData(const _zvUID& uid, const unsigned char* data, unsigned int size);
  // Stores a copy of the bytes only if the identifier is new; 1 if stored.
  unsigned int InsertUserData(const _zvUID& uid, const unsigned char* data, unsigned int size);
  // 1 if an item was removed.
  unsigned int RemoveUserData(const _zvUID& uid);
  // Copies every item of the other set in, replacing items of the same
  // identifier.
  void MergeUserData(const CFCUserDataSet& other);
  void RemoveAllUserData();

  // Persistent set block: u32 length of the rest, u32 version 256,
  // u32 item count, then per item the identifier, u32 size and the bytes.
  unsigned int GetBufferSize() const;
  unsigned int WriteToBuffer(void* buffer) const;
  // Given the block past its length field; returns the body bytes consumed,
  // 0 for a refused version. A set that already holds items is only walked.
  unsigned int ReadFromBufferBody(const void* body);
  // The same, never reading beyond `size` bytes of the body; a block that is cut short, or
  // whose items reach past it, is refused (0) and the set is left as it was.
  unsigned int ReadFromBufferBody(const void* body, unsigned int size);

 private:
  friend class ZvBaseFCurve;
  // The reader behind ReadFromBufferBody, also run bounded inside a curve's block.
  unsigned int ReadBody(ZvByteReader& in);

  ItemMap m_items;
};

// The user data of one curve: the curve-level items (the set it is) and one
// owned set per key parameter. Key parameters compare exactly; they always
// equal the parameters of the curve's keys. A NaN is no key parameter: every
// operation given one finds nothing and changes nothing.
class ZV_API CFCUserDataStore : public CFCUserDataSet {
 public:
  typedef std::map<double, CFCUserDataSet*> KeySetMap;
  typedef KeySetMap::const_iterator key_const_iterator;

  CFCUserDataStore();
  CFCUserDataStore(const CFCUserDataStore& other);
  CFCUserDataStore& operator=(const CFCUserDataStore& other);
  ~CFCUserDataStore() override;

  unsigned int GetKeySetCount() const;
  key_const_iterator key_begin() const;
  key_const_iterator key_end() const;

  // The set at exactly this parameter, or null.
  CFCUserDataSet* FindKeySet(double parameter) const;
  // The set at exactly this parameter, created empty if absent.
  CFCUserDataSet* GetOrCreateKeySet(double parameter);
  // Replaces the set at the parameter by a copy; an empty set removes it.
  void SetKeySet(double parameter, const CFCUserDataSet& set);
  // Takes ownership of the set; merges it into a set already at the
  // parameter (its items win) and frees it then.
  void AdoptKeySet(double parameter, CFCUserDataSet* set);
  // 1 if a set was removed.
  unsigned int RemoveKeySet(double parameter);
  // 1 if the item was removed; an emptied set goes with its entry.
  unsigned int RemoveKeyUserData(double parameter, const _zvUID& uid);
  void RemoveAllKeySets();

  // Every key parameter plus delta, or times factor; the sets change hands
  // without a copy, and sets whose parameters meet are merged. A delta or
  // factor that is not finite is refused with 0.
  unsigned int TranslateKeySets(double delta);
  unsigned int ScaleKeySets(double factor);
  // The sets from oldParameters[0] on go from oldParameters[i] to
  // newParameters[i] (both ascending, count > 0); a set the lists do not name
  // stays. The first moved set, landing within 1e-15 of the last set that
  // stays, is merged into it. 0 (and nothing moved) if a parameter is NaN.
  unsigned int MoveKeySetTail(const double* oldParameters, const double* newParameters,
                              unsigned int count);

 private:
  template <class F>
  void RebuildKeySets(F newParameter);

  KeySetMap m_keySets;
};

#endif
