// Debug output for hosts. Nothing inside the library calls it.
#ifndef ZV_TRACE_H
#define ZV_TRACE_H

#include <zv/api.h>

// Formats into a 512-character buffer (longer texts keep their first 511 characters) and passes
// the result to printf as its format, so a '%' that survives the first pass is read again:
// write "%%%%" to print one percent sign.
ZV_API void _zvTRACE(const char* format, ...) __attribute__((format(printf, 1, 2)));

#endif
