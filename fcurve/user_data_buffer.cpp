// The persistent user data blocks: one block per set, and the block of a
// curve's whole store, shared by every curve kind.
#include <zv/fcurve.h>

#include "fcurve/buffer_bytes.h"
#include "fcurve/fcurve_lock.h"

#include <memory>

namespace {

// Version stamp of both blocks; anything below, and the all-ones word, is
// refused on reading.
const unsigned int kUserDataVersion = 256;

bool IsReadableVersion(unsigned int version) {
  return version >= kUserDataVersion && version != 0xFFFFFFFFu;
}

// Identifier and size of an item: u32, u16, u16, 8 bytes, u32.
const unsigned int kItemHeaderSize = 20;

}  // namespace

unsigned int CFCUserDataSet::GetBufferSize() const {
  unsigned int size = 12;
  for (const auto& item : m_items)
    size += kItemHeaderSize + item.second.GetSize();
  return size;
}

unsigned int CFCUserDataSet::WriteToBuffer(void* buffer) const {
  if (buffer == nullptr) return 0;
  const unsigned int size = GetBufferSize();
  unsigned char* p = static_cast<unsigned char*>(buffer);
  p = zvPutU32(p, size - 4);
  p = zvPutU32(p, kUserDataVersion);
  p = zvPutU32(p, GetCount());
  for (const auto& item : m_items) {
    const _zvUID& uid = item.first.GetUID();
    p = zvPutU32(p, uid.Data1);
    p = zvPutU16(p, uid.Data2);
    p = zvPutU16(p, uid.Data3);
    std::memcpy(p, uid.Data4, 8);
    p += 8;
    const unsigned int itemSize = item.second.GetSize();
    p = zvPutU32(p, itemSize);
    if (itemSize != 0) std::memcpy(p, item.second.GetData(), itemSize);
    p += itemSize;
  }
  return size;
}

unsigned int CFCUserDataSet::ReadFromBufferBody(const void* body) {
  if (body == nullptr) return 0;
  const unsigned char* p = static_cast<const unsigned char*>(body);
  if (!IsReadableVersion(zvGetU32(p))) return 0;
  const unsigned int count = zvGetU32(p + 4);
  // A set that holds items already only steps over the block.
  const bool walkOnly = !IsEmpty();
  unsigned int offset = 8;
  for (unsigned int i = 0; i < count; ++i) {
    const unsigned char* item = p + offset;
    _zvUID uid;
    uid.Data1 = zvGetU32(item);
    uid.Data2 = static_cast<unsigned short>(zvGetU16(item + 4));
    uid.Data3 = static_cast<unsigned short>(zvGetU16(item + 6));
    std::memcpy(uid.Data4, item + 8, 8);
    const unsigned int size = zvGetU32(item + 16);
    if (!walkOnly) InsertUserData(uid, item + kItemHeaderSize, size);
    offset += kItemHeaderSize + size;
  }
  return offset;
}

unsigned int ZvBaseFCurve::GetUserDataBufferSize() const {
  ZvFCurveLockGuard guard(*this);
  // Length, version and the "anything stored" byte; without a store the
  // block ends there.
  unsigned int size = 9;
  if (m_userData == nullptr) return size;
  size += 2;  // the two "follows" bytes
  if (!m_userData->IsEmpty()) size += m_userData->GetBufferSize();
  if (m_userData->GetKeySetCount() != 0) {
    size += 4;
    for (auto it = m_userData->key_begin(); it != m_userData->key_end(); ++it)
      size += 8 + it->second->GetBufferSize();
  }
  return size;
}

unsigned int ZvBaseFCurve::WriteUserDataToBuffer(void* buffer) const {
  if (buffer == nullptr) return 0;
  ZvFCurveLockGuard guard(*this);
  const unsigned int size = GetUserDataBufferSize();
  const CFCUserDataStore* store = m_userData;
  const bool hasCurveItems = store != nullptr && !store->IsEmpty();
  const bool hasKeySets = store != nullptr && store->GetKeySetCount() != 0;
  unsigned char* p = static_cast<unsigned char*>(buffer);
  p = zvPutU32(p, size - 4);
  p = zvPutU32(p, kUserDataVersion);
  p = zvPutU8(p, hasCurveItems || hasKeySets ? 1 : 0);
  if (store == nullptr) return size;
  p = zvPutU8(p, hasCurveItems ? 1 : 0);
  if (hasCurveItems) p += store->WriteToBuffer(p);
  p = zvPutU8(p, hasKeySets ? 1 : 0);
  if (hasKeySets) {
    p = zvPutU32(p, store->GetKeySetCount());
    for (auto it = store->key_begin(); it != store->key_end(); ++it) {
      p = zvPutF64(p, it->first);
      p += it->second->WriteToBuffer(p);
    }
  }
  return size;
}

unsigned int ZvBaseFCurve::ReadUserDataFromBufferBody(const void* body) {
  if (body == nullptr) return 0;
  const unsigned char* p = static_cast<const unsigned char*>(body);
  if (!IsReadableVersion(zvGetU32(p))) return 0;
  if (p[4] != 1) return 5;

  // Read into a store of our own, so that a refused inner block changes
  // nothing; it is kept only if the curve has no store yet.
  std::unique_ptr<CFCUserDataStore> read(new CFCUserDataStore);
  unsigned int offset = 6;
  if (p[5] == 1) {
    const unsigned int setLength = zvGetU32(p + offset);
    offset += 4;
    if (setLength != 0) {
      const unsigned int consumed = read->ReadFromBufferBody(p + offset);
      if (consumed == 0) return 0;
      offset += consumed;
    }
  }
  if (p[offset++] == 1) {
    const unsigned int count = zvGetU32(p + offset);
    offset += 4;
    for (unsigned int i = 0; i < count; ++i) {
      const double parameter = zvGetF64(p + offset);
      const unsigned int setLength = zvGetU32(p + offset + 8);
      offset += 12;
      if (setLength == 0) continue;
      std::unique_ptr<CFCUserDataSet> set(new CFCUserDataSet);
      const unsigned int consumed = set->ReadFromBufferBody(p + offset);
      if (consumed == 0) return 0;
      offset += consumed;
      read->AdoptKeySet(parameter, set.release());
    }
  }

  ZvFCurveLockGuard guard(*this);
  if (m_userData == nullptr) m_userData = read.release();
  return offset;
}
