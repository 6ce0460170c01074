#include "types/Diagnostics.h"

#include <cstdarg>
#include <cstdio>
#include <new>
#include <vector>

#if defined(__ANDROID__)
#include <android/log.h>
#endif

#include "types/DiagnosticOutput.h"
#include "types/Mutex.h"

namespace OrzaVSMobile {

namespace {

// Held while a line is delivered, so lines never interleave and a replaced sink is never called
// after setDiagnosticSink returns. Always the innermost lock: it is taken under the engine's
// locks and nothing is locked while it is held.
Tovra::Mutex gSinkMutex;
DiagnosticSink gSink ORZAVS_GUARDED_BY(gSinkMutex) = nullptr;
void* gSinkContext ORZAVS_GUARDED_BY(gSinkMutex) = nullptr;

void writeDefault(const char* line) {
  std::puts(line);
#if defined(__ANDROID__)
  __android_log_write(ANDROID_LOG_INFO, "OrzaVSMobile", line);
#endif
}

}  // namespace

void setDiagnosticSink(DiagnosticSink sink, void* context) {
  Tovra::MutexLock lock(gSinkMutex);
  gSink = sink;
  gSinkContext = sink != nullptr ? context : nullptr;
}

void reportLine(const char* line) noexcept {
  Tovra::MutexLock lock(gSinkMutex);
  if (gSink != nullptr) {
    gSink(gSinkContext, line);
  } else {
    writeDefault(line);
  }
}

void reportLinef(const char* format, ...) noexcept {
  char small[256];
  va_list args;
  va_start(args, format);
  const int length = std::vsnprintf(small, sizeof small, format, args);
  va_end(args);
  if (length < 0) return;
  if (static_cast<size_t>(length) < sizeof small) {
    reportLine(small);
    return;
  }
  // Long lines (a server reply quoted whole): format again into a buffer that fits. Without
  // memory for it, the line is delivered cut at the small buffer's size.
  std::vector<char> large;
  try {
    large.resize(static_cast<size_t>(length) + 1);
  } catch (const std::bad_alloc&) {
    reportLine(small);
    return;
  }
  va_start(args, format);
  std::vsnprintf(large.data(), large.size(), format, args);
  va_end(args);
  reportLine(large.data());
}

}  // namespace OrzaVSMobile
