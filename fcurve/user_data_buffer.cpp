// The persistent user data blocks: one block per set, and the block of a curve's whole store,
// shared by every curve kind.
#include <zv/fcurve.h>

#include "fcurve/buffer_bytes.h"
#include "fcurve/fcurve_lock.h"

#include <memory>

namespace {

// Version stamp of both blocks; anything below, and the all-ones word, is refused on reading.
const unsigned int kUserDataVersion = 256;

bool IsReadableVersion(unsigned int version) {
  return version >= kUserDataVersion && version != 0xFFFFFFFFu;
}

// Identifier and size of an item.
const unsigned int kItemHeaderSize = kZvUIDSize + 4;

// Reads the u32 length of a nested block and, when it is not 0, hands the body to `readBody`
// bounded by that length. The outer reader moves past the length the block states, whatever the
// body reader made of it. 0 when the block does not fit or its body is refused, else the bytes
// taken.
template <class ReadBody>
unsigned int ReadNestedBlock(ZvByteReader& in, ReadBody readBody) {
  if (!in.Has(4)) return 0;
  const std::uint32_t length = in.U32();
  if (!in.Has(length)) return 0;
  if (length != 0) {
    ZvByteReader body = in.Part(length);
    if (!readBody(body)) return 0;
    in.Skip(length);
  }
  return 4 + length;
}

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
  ZvByteWriter out(buffer);
  out.U32(size - 4);
  out.U32(kUserDataVersion);
  out.U32(GetCount());
  for (const auto& item : m_items) {
    zvPutUID(out, item.first.GetUID());
    out.U32(item.second.GetSize());
    out.Bytes(item.second.GetData(), item.second.GetSize());
  }
  return size;
}

unsigned int CFCUserDataSet::ReadFromBufferBody(const void* body) {
  if (body == nullptr) return 0;
  ZvByteReader in(body);
  return ReadBody(in);
}

unsigned int CFCUserDataSet::ReadFromBufferBody(const void* body, unsigned int size) {
  if (body == nullptr) return 0;
  ZvByteReader in(body, size);
  // Read aside, so that a block refused half-way leaves no items behind.
  CFCUserDataSet read;
  const unsigned int used = read.ReadBody(in);
  if (used == 0) return 0;
  if (IsEmpty()) m_items.swap(read.m_items);
  return used;
}

unsigned int CFCUserDataSet::ReadBody(ZvByteReader& in) {
  if (!in.Has(8) || !IsReadableVersion(in.U32())) return 0;
  const unsigned int count = in.U32();
  // A set that holds items already only steps over the block.
  const bool walkOnly = !IsEmpty();
  for (unsigned int i = 0; i < count; ++i) {
    if (!in.Has(kItemHeaderSize)) return 0;
    const _zvUID uid = zvGetUID(in);
    const unsigned int size = in.U32();
    if (!in.Has(size)) return 0;
    const unsigned char* data = in.Bytes(size);
    if (!walkOnly) InsertUserData(uid, data, size);
  }
  return static_cast<unsigned int>(in.Consumed());
}

unsigned int ZvBaseFCurve::GetUserDataBufferSize() const {
  ZvFCurveLockGuard guard(*this);
  // Length, version and the "anything stored" byte; without a store the block ends there.
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
  ZvByteWriter out(buffer);
  WriteUserData(out);
  return static_cast<unsigned int>(out.Written());
}

void ZvBaseFCurve::WriteUserData(ZvByteWriter& out) const {
  ZvFCurveLockGuard guard(*this);
  const CFCUserDataStore* store = m_userData;
  const bool hasCurveItems = store != nullptr && !store->IsEmpty();
  const bool hasKeySets = store != nullptr && store->GetKeySetCount() != 0;
  out.U32(GetUserDataBufferSize() - 4);
  out.U32(kUserDataVersion);
  out.U8(hasCurveItems || hasKeySets ? 1 : 0);
  if (store == nullptr) return;
  out.U8(hasCurveItems ? 1 : 0);
  if (hasCurveItems) store->WriteToBuffer(out.Run(store->GetBufferSize()));
  out.U8(hasKeySets ? 1 : 0);
  if (!hasKeySets) return;
  out.U32(store->GetKeySetCount());
  for (auto it = store->key_begin(); it != store->key_end(); ++it) {
    zvPutF64(out, it->first);
    it->second->WriteToBuffer(out.Run(it->second->GetBufferSize()));
  }
}

unsigned int ZvBaseFCurve::ReadUserDataFromBufferBody(const void* body) {
  if (body == nullptr) return 0;
  ZvByteReader in(body);
  return ReadUserDataBody(in);
}

unsigned int ZvBaseFCurve::ReadUserDataBody(ZvByteReader& in) {
  if (!in.Has(5) || !IsReadableVersion(in.U32())) return 0;
  if (in.U8() != 1) return 5;

  // Read into a store of our own, so that a refused inner block changes nothing; it is kept only
  // if the curve has no store yet.
  std::unique_ptr<CFCUserDataStore> read(new CFCUserDataStore);
  if (!in.Has(1)) return 0;
  if (in.U8() == 1) {
    CFCUserDataSet& items = *read;
    if (!ReadNestedBlock(in, [&](ZvByteReader& set) { return items.ReadBody(set) != 0; })) return 0;
  }
  if (!in.Has(1)) return 0;
  if (in.U8() == 1) {
    if (!in.Has(4)) return 0;
    const unsigned int count = in.U32();
    for (unsigned int i = 0; i < count; ++i) {
      if (!in.Has(8)) return 0;
      const double parameter = zvGetF64(in);
      std::unique_ptr<CFCUserDataSet> set;
      const auto readSet = [&](ZvByteReader& body) {
        set.reset(new CFCUserDataSet);
        return set->ReadBody(body) != 0;
      };
      if (!ReadNestedBlock(in, readSet)) return 0;
      // An entry of length 0 creates nothing.
      if (set) read->AdoptKeySet(parameter, set.release());
    }
  }

  ZvFCurveLockGuard guard(*this);
  if (m_userData == nullptr) m_userData = read.release();
  return static_cast<unsigned int>(in.Consumed());
}

unsigned int ZvBaseFCurve::ReadUserDataBlock(ZvByteReader& in) {
  return ReadNestedBlock(in, [this](ZvByteReader& body) { return ReadUserDataBody(body) != 0; });
}
