#include "Ravel_PGL.h"

#include <cstdarg>
#include <cstdio>
#include <cstdlib>

const char* gszRavelDbgFilePath = "";
int gRavelDbgLineNum = 0;

namespace {

const unsigned int kLevelBits = 0xF0000000u;

// Errors only, until the application asks for more.
unsigned int gTraceLevels = 0x80000000u;
RavelPGL_TraceHook gTraceHook = 0;
void* gTraceHookContext = 0;
RavelPGL_PanicHook gPanicHook = 0;
void* gPanicHookContext = 0;

}  // namespace

extern "C" int RavelPGL_TraceOut(unsigned int mask, const char* format, ...) {
  if (gTraceHook == 0 && (mask & gTraceLevels & kLevelBits) == 0) return 0;

  char local[1024];
  char* text = local;
  va_list args;
  va_start(args, format);
  va_list retry;
  va_copy(retry, args);
  int written = std::vsnprintf(local, sizeof(local), format, args);
  va_end(args);
  if (written < 0) {
    local[0] = '\0';
  } else if (static_cast<unsigned int>(written) >= sizeof(local)) {
    // A long broadcast text: format it again into a buffer of its own size.
    char* large = static_cast<char*>(std::malloc(static_cast<unsigned int>(written) + 1u));
    if (large != 0) {
      std::vsnprintf(large, static_cast<unsigned int>(written) + 1u, format, retry);
      text = large;
    }
  }
  va_end(retry);

  if (gTraceHook != 0) {
    gTraceHook(mask, gszRavelDbgFilePath, gRavelDbgLineNum, text, gTraceHookContext);
  } else {
    std::fprintf(stderr, "[%08x] %s:%d: %s", mask, gszRavelDbgFilePath ? gszRavelDbgFilePath : "",
                 gRavelDbgLineNum, text);
  }
  if (text != local) std::free(text);
  return written;
}

extern "C" int RavelPGL_CheckAndInitDebug(void) { return 0; }

extern "C" void RavelPGL_Panic(void) {
  if (gPanicHook != 0) {
    gPanicHook(gszRavelDbgFilePath, gRavelDbgLineNum, gPanicHookContext);
    return;
  }
  std::fprintf(stderr, "PANIC at %s:%d\n", gszRavelDbgFilePath ? gszRavelDbgFilePath : "",
               gRavelDbgLineNum);
  std::abort();
}

extern "C" void RavelPGL_SetTraceHook(RavelPGL_TraceHook hook, void* context) {
  gTraceHook = hook;
  gTraceHookContext = hook ? context : 0;
}

extern "C" void RavelPGL_SetPanicHook(RavelPGL_PanicHook hook, void* context) {
  gPanicHook = hook;
  gPanicHookContext = hook ? context : 0;
}

extern "C" void RavelPGL_SetTraceMask(unsigned int levels) { gTraceLevels = levels; }

extern "C" unsigned int RavelPGL_GetTraceMask(void) { return gTraceLevels; }

extern "C" int RavelPGL_StrCaseCompare(const char* left, const char* right) {
  const unsigned char* a = reinterpret_cast<const unsigned char*>(left);
  const unsigned char* b = reinterpret_cast<const unsigned char*>(right);
  for (;; ++a, ++b) {
    unsigned int ca = (*a >= 'A' && *a <= 'Z') ? *a + ('a' - 'A') : *a;
    unsigned int cb = (*b >= 'A' && *b <= 'Z') ? *b + ('a' - 'A') : *b;
    if (ca != cb || ca == 0) return static_cast<int>(ca) - static_cast<int>(cb);
  }
}
