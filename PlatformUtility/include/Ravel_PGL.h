// Trace, panic and debug services of the platform utility library.
//
// Every trace call site stores its source path and line in the two location
// globals, then calls RavelPGL_TraceOut with a mask (a level bit ORed with a
// module bit) and a printf format. Formatting happens only when somebody
// listens: an installed hook, or the default sink with the level enabled.
#ifndef RAVEL_PGL_H
#define RAVEL_PGL_H

#if defined(__GNUC__) || defined(__clang__)
#define RAVEL_PRINTF_FORMAT(fmt, first) __attribute__((format(printf, fmt, first)))
#else
#define RAVEL_PRINTF_FORMAT(fmt, first)
#endif

#ifdef __cplusplus
extern "C" {
#endif

// Location of the trace call in progress (written without a lock: one thread at a time).
extern const char* gszRavelDbgFilePath;
extern int gRavelDbgLineNum;

// The one way the location globals are set: the source path and the line of the
// call site, which a helper tracing on behalf of its caller is handed as values.
#define RAVEL_PGL_SET_LOCATION(path, line) \
  do {                                     \
    gszRavelDbgFilePath = (path);          \
    gRavelDbgLineNum = (line);             \
  } while (0)

// A trace reported at the given call site.
#define RAVEL_PGL_TRACE_AT(path, line, mask, ...) \
  do {                                            \
    RAVEL_PGL_SET_LOCATION((path), (line));       \
    RavelPGL_TraceOut((mask), __VA_ARGS__);       \
  } while (0)

int RavelPGL_TraceOut(unsigned int mask, const char* format, ...) RAVEL_PRINTF_FORMAT(2, 3);
int RavelPGL_CheckAndInitDebug(void);
void RavelPGL_Panic(void);

// Receives every trace call, unfiltered and formatted, with the location globals
// as they were at the call. A null hook restores the default sink.
typedef void (*RavelPGL_TraceHook)(unsigned int mask, const char* file, int line, const char* text,
                                   void* context);
void RavelPGL_SetTraceHook(RavelPGL_TraceHook hook, void* context);

// With a hook installed, RavelPGL_Panic calls it and returns; without one it reports and aborts.
typedef void (*RavelPGL_PanicHook)(const char* file, int line, void* context);
void RavelPGL_SetPanicHook(RavelPGL_PanicHook hook, void* context);

// Levels (the high bits of a mask) that the default sink prints to standard error.
void RavelPGL_SetTraceMask(unsigned int levels);
unsigned int RavelPGL_GetTraceMask(void);

// Case-insensitive comparison of two NUL-terminated texts (ASCII letters only), as strcmp.
int RavelPGL_StrCaseCompare(const char* left, const char* right);

#ifdef __cplusplus
}
#endif

#endif
