// Export control for libzv. Everything is hidden unless marked ZV_API.
#ifndef ZV_API_H
#define ZV_API_H

#if defined(_WIN32)
#if defined(ZV_BUILDING_LIBRARY)
#define ZV_API __declspec(dllexport)
#else
#define ZV_API __declspec(dllimport)
#endif
#else
#define ZV_API __attribute__((visibility("default")))
#endif

#endif
