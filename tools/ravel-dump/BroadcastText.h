// Broadcast texts decoded for a person. The library keeps texts as broadcast;
// ravel-dump shows them in UTF-8 in the coding of the broadcast's standard:
// ARIB STD-B24 8-unit code in Japan, ISO/IEC 8859-15 with no character-table
// byte in Brazil (ABNT NBR 15603-2). --raw-text keeps the bytes as broadcast.
#ifndef RAVEL_DUMP_BROADCASTTEXT_H
#define RAVEL_DUMP_BROADCASTTEXT_H

#include <cstddef>
#include <string>

namespace ravel_dump {

enum class TextCoding { kAsBroadcast, kArib8Unit, kLatin9 };

// The coding of the library's standard setting (RavelCfg), or the bytes as
// broadcast when `rawText`.
TextCoding TextCodingOf(int standard, bool rawText);

// UTF-8 with the text's line breaks as '\n' and its other control codes
// dropped. As broadcast: the bytes escaped as EscapeBytes does.
std::string DecodeBroadcastText(const char* bytes, std::size_t length, TextCoding coding);
std::string DecodeBroadcastText(const std::string& bytes, TextCoding coding);

// Appends the UTF-8 form of the Unicode character `code`.
void AppendUtf8(std::string& out, unsigned int code);

// The same on one line, for the summary and the dumps: line breaks as spaces.
std::string OneLineText(const std::string& bytes, TextCoding coding);

// A dump line of the library whose member is a broadcast text (service, event,
// network and stream names, event texts), with that text decoded; other lines
// come back unchanged. `line` is the trace text as the library wrote it.
std::string DecodeTextInTraceLine(const std::string& line, TextCoding coding);

}  // namespace ravel_dump

#endif
