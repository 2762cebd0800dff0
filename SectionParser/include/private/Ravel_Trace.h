// The trace convention of the parser: each call site stores its source path and
// line in the location globals, then calls RavelPGL_TraceOut. A source file
// names its path once with RAVEL_TRACE_SOURCE.
#ifndef RAVEL_TRACE_H
#define RAVEL_TRACE_H

#include "Ravel_PGL.h"

// Levels.
#define RAVEL_LEVEL_DUMP 0x10000000u
#define RAVEL_LEVEL_BIT 0x20000000u
#define RAVEL_LEVEL_WARNING 0x40000000u
#define RAVEL_LEVEL_ERROR 0x80000000u
// Modules.
#define RAVEL_MODULE_UTILITY 0x01u
#define RAVEL_MODULE_PARSER 0x20u
#define RAVEL_MODULE_CAROUSEL 0x40u

// The masks the parser sources use.
#define RAVEL_PARSER_DUMP (RAVEL_LEVEL_DUMP | RAVEL_MODULE_PARSER)
#define RAVEL_PARSER_BIT (RAVEL_LEVEL_BIT | RAVEL_MODULE_PARSER)
#define RAVEL_PARSER_WARNING (RAVEL_LEVEL_WARNING | RAVEL_MODULE_PARSER)
#define RAVEL_PARSER_ERROR (RAVEL_LEVEL_ERROR | RAVEL_MODULE_PARSER)
#define RAVEL_CAROUSEL_DUMP (RAVEL_LEVEL_DUMP | RAVEL_MODULE_CAROUSEL)
#define RAVEL_CAROUSEL_WARNING (RAVEL_LEVEL_WARNING | RAVEL_MODULE_CAROUSEL)
#define RAVEL_CAROUSEL_ERROR (RAVEL_LEVEL_ERROR | RAVEL_MODULE_CAROUSEL)
#define RAVEL_UTILITY_WARNING (RAVEL_LEVEL_WARNING | RAVEL_MODULE_UTILITY)

#define RAVEL_TRACE_SOURCE(path) static const char kRavelTraceSourcePath[] = path

#define RAVEL_TRACE(mask, ...) RAVEL_PGL_TRACE_AT(kRavelTraceSourcePath, __LINE__, (mask), __VA_ARGS__)

// Panic with the location globals set to the call site.
#define RAVEL_PANIC()                                         \
  do {                                                        \
    RAVEL_PGL_SET_LOCATION(kRavelTraceSourcePath, __LINE__);  \
    RavelPGL_CheckAndInitDebug();                             \
    RavelPGL_Panic();                                         \
  } while (0)

// A text handed to %s: a missing text prints as the C library prints a null.
inline const char* RavelTraceText(const char* text) { return text ? text : "(null)"; }

#endif
