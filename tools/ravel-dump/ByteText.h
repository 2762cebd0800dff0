// Broadcast texts are bytes in the broadcast's own character coding (ARIB,
// ABNT, DVB tables). They are printed as received, except that bytes which
// could disturb a terminal or a line-oriented reader are written as \xNN:
// control bytes (C0, DEL, C1, also when UTF-8 encodes them) and bytes that do
// not form valid UTF-8 (the 8-bit codings). What is printed is therefore always
// valid UTF-8 and free of control codes; a text coded in UTF-8 reads as such.
#ifndef RAVEL_DUMP_BYTETEXT_H
#define RAVEL_DUMP_BYTETEXT_H

#include <cstddef>
#include <string>

namespace ravel_dump {

// The backslash itself is written as \\ so that the escaping can be undone.
std::string EscapeBytes(const char* text, std::size_t length);
std::string EscapeBytes(const std::string& text);

// A formatted trace text: like EscapeBytes, but tabs and the line end that
// closes the text are kept, since they are the dump's own layout.
std::string EscapeTraceText(const char* text);

}  // namespace ravel_dump

#endif
