#include <zv/fcurve_userdata.h>

#include <cstring>
#include <new>

CFCUserDataKey::CFCUserDataKey() : m_uid() {}

CFCUserDataKey::CFCUserDataKey(const _zvUID& uid) : m_uid(uid) {}

bool CFCUserDataKey::operator<(const CFCUserDataKey& other) const {
  const _zvUID& a = m_uid;
  const _zvUID& b = other.m_uid;
  if (a.Data1 != b.Data1) return a.Data1 < b.Data1;
  if (a.Data2 != b.Data2) return a.Data2 < b.Data2;
  if (a.Data3 != b.Data3) return a.Data3 < b.Data3;
  return std::memcmp(a.Data4, b.Data4, sizeof a.Data4) < 0;
}

CFCUserDataValue::CFCUserDataValue() : m_size(0), m_owned(0), m_data(nullptr) {}

CFCUserDataValue::CFCUserDataValue(const unsigned char* data, unsigned int size, int copyBytes)
    : m_size(0), m_owned(0), m_data(nullptr) {
  if (copyBytes) {
    Assign(data, size);
  } else if (data != nullptr) {
    m_data = const_cast<unsigned char*>(data);
    m_size = size;
  }
}

CFCUserDataValue::CFCUserDataValue(const CFCUserDataValue& other)
    : m_size(0), m_owned(0), m_data(nullptr) {
  Assign(other.m_data, other.m_size);
}

CFCUserDataValue& CFCUserDataValue::operator=(const CFCUserDataValue& other) {
  if (this != &other) Assign(other.m_data, other.m_size);
  return *this;
}

CFCUserDataValue::~CFCUserDataValue() {
  Release();
}

void CFCUserDataValue::Assign(const unsigned char* data, unsigned int size) {
  // Copy first: the source may be our own bytes.
  unsigned char* copy = nullptr;
  if (data != nullptr && size != 0) {
    // A failed allocation leaves the value empty, silently.
    copy = new (std::nothrow) unsigned char[size];
    if (copy != nullptr) std::memcpy(copy, data, size);
  }
  Release();
  if (copy != nullptr) {
    m_data = copy;
    m_size = size;
    m_owned = 1;
  }
}

void CFCUserDataValue::Release() {
  if (m_owned) delete[] m_data;
  m_data = nullptr;
  m_size = 0;
  m_owned = 0;
}
