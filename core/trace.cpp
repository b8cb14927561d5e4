#include <zv/trace.h>

#include <cstdarg>
#include <cstdio>

#if defined(__GNUC__)
#pragma GCC diagnostic ignored "-Wformat-security"
#pragma GCC diagnostic ignored "-Wformat-nonliteral"
#endif

void _zvTRACE(const char* format, ...) {
  char buffer[512];
  va_list args;
  va_start(args, format);
  const int n = vsnprintf(buffer, sizeof buffer, format, args);
  va_end(args);
  // The second formatting pass is part of the function's contract.
  if (n >= 0) printf(buffer);
}
