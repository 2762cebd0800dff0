// Broadcast texts are bytes in the broadcast's own character coding (ARIB,
// ABNT, DVB tables). They are printed as received, except that bytes which
// could disturb a terminal or a line-oriented reader are written as \xNN.
#ifndef RAVEL_DUMP_BYTETEXT_H
#define RAVEL_DUMP_BYTETEXT_H

#include <cstddef>
#include <string>

namespace ravel_dump {

// Control bytes (C0, DEL, C1) and the backslash itself are escaped; printable
// ASCII and the upper half outside C1 (0xA0-0xFF) pass unchanged.
std::string EscapeBytes(const char* text, std::size_t length);
std::string EscapeBytes(const std::string& text);
// The same, for a C text that may be null ("" then).
std::string EscapeCText(const char* text);
// A text of at most `capacity` bytes that may lack its terminator.
std::string EscapeBounded(const char* text, std::size_t capacity);

// For JSON (which must be valid UTF-8): everything outside printable ASCII is
// escaped, so the string round-trips to the received bytes.
std::string EscapeAscii(const char* text, std::size_t length);
std::string EscapeAscii(const std::string& text);

// A formatted trace text: like EscapeBytes, but tabs and the line end that
// closes the text are kept, since they are the dump's own layout.
std::string EscapeTraceText(const char* text);

}  // namespace ravel_dump

#endif
