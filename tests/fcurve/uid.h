// Identifiers for the user data tests.
#ifndef ZV_TESTS_FCURVE_UID_H
#define ZV_TESTS_FCURVE_UID_H

#include <zv/fcurve_userdata.h>

#include <string>

// An identifier that differs from others of another n in every field.
inline _zvUID MakeUID(unsigned int n) {
  _zvUID uid;
  uid.Data1 = 0x10000000u + n;
  uid.Data2 = static_cast<unsigned short>(0x2000 + n);
  uid.Data3 = static_cast<unsigned short>(0x3000 + n);
  for (int i = 0; i < 8; ++i)
    uid.Data4[i] = static_cast<unsigned char>(n + i);
  return uid;
}

inline const unsigned char* TextBytes(const std::string& s) {
  return reinterpret_cast<const unsigned char*>(s.data());
}

inline unsigned int Size(const std::string& s) {
  return static_cast<unsigned int>(s.size());
}

inline std::string AsString(const unsigned char* data, unsigned int size) {
  return std::string(reinterpret_cast<const char*>(data), size);
}

inline std::string AsString(const CFCUserDataValue* value) {
  return value == nullptr ? std::string("<none>") : AsString(value->GetData(), value->GetSize());
}

#endif
