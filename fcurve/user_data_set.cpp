#include <zv/fcurve_userdata.h>

CFCUserDataSet::CFCUserDataSet() {}

CFCUserDataSet::CFCUserDataSet(const CFCUserDataSet& other) : m_items(other.m_items) {}

CFCUserDataSet& CFCUserDataSet::operator=(const CFCUserDataSet& other) {
  if (this != &other) m_items = other.m_items;
  return *this;
}

CFCUserDataSet::~CFCUserDataSet() {}

unsigned int CFCUserDataSet::GetCount() const {
  return static_cast<unsigned int>(m_items.size());
}

unsigned int CFCUserDataSet::IsEmpty() const {
  return m_items.empty() ? 1 : 0;
}

CFCUserDataSet::const_iterator CFCUserDataSet::begin() const {
  return m_items.begin();
}

CFCUserDataSet::const_iterator CFCUserDataSet::end() const {
  return m_items.end();
}

const CFCUserDataValue* CFCUserDataSet::FindUserData(const _zvUID& uid) const {
  const ItemMap::const_iterator it = m_items.find(CFCUserDataKey(uid));
  return it == m_items.end() ? nullptr : &it->second;
}

void CFCUserDataSet::SetUserData(const _zvUID& uid, const unsigned char* data, unsigned int size) {
  m_items[CFCUserDataKey(uid)].Assign(data, size);
}

unsigned int CFCUserDataSet::InsertUserData(const _zvUID& uid, const unsigned char* data,
                                            unsigned int size) {
  const CFCUserDataKey key(uid);
  if (m_items.find(key) != m_items.end()) return 0;
  m_items[key].Assign(data, size);
  return 1;
}

unsigned int CFCUserDataSet::RemoveUserData(const _zvUID& uid) {
  return m_items.erase(CFCUserDataKey(uid)) != 0 ? 1 : 0;
}

void CFCUserDataSet::MergeUserData(const CFCUserDataSet& other) {
  if (this == &other) return;
  for (const auto& item : other.m_items)
    m_items[item.first] = item.second;
}

void CFCUserDataSet::RemoveAllUserData() {
  m_items.clear();
}
