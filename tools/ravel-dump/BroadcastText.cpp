#include "BroadcastText.h"

#include <cstring>

#include "AribText.h"
#include "ByteText.h"
#include "Ravel_Cfg.h"

namespace ravel_dump {
namespace {

// ISO/IEC 8859-15 is ISO/IEC 8859-1 but for these eight characters.
unsigned int Latin9Character(unsigned char byte) {
  switch (byte) {
    case 0xA4: return 0x20AC;  // euro sign
    case 0xA6: return 0x0160;
    case 0xA8: return 0x0161;
    case 0xB4: return 0x017D;
    case 0xB8: return 0x017E;
    case 0xBC: return 0x0152;
    case 0xBD: return 0x0153;
    case 0xBE: return 0x0178;
    default: return byte;
  }
}

std::string Latin9ToUtf8(const unsigned char* bytes, std::size_t length) {
  std::string out;
  for (std::size_t i = 0; i < length; ++i) {
    unsigned char byte = bytes[i];
    if (byte == '\r' || byte == '\n') {
      if (byte == '\n' && i > 0 && bytes[i - 1] == '\r') continue;  // CR LF is one break
      out += '\n';
    } else if (byte >= 0x20 && byte != 0x7F && (byte < 0x80 || byte >= 0xA0)) {
      AppendUtf8(out, Latin9Character(byte));
    }
  }
  return out;
}

struct TextInLine {
  const char* opening;  // ends with the '[' before the text
  const char* closing;  // what follows the text, to the end of the line
};

// The library's dump lines that hold a broadcast text.
const TextInLine kTextLines[] = {
    {"\tService Provider Name=[", "]\n"}, {"\tService Name=[", "]\n"},   {"\tNetwork Name=[", "]\n"},
    {"\tEventName=[", "]\n"},             {"\tEventDescription=[", "]\n"}, {"\tItemDescription=[", "]\n"},
    {"\tItem=[", "]\n"},                  {"\tSeriesName=[", "]\n"},     {"\tLogo Char String=[", "]\n"},
    {", ipTextChar=[", "]\n"},            {", Ts Name=[", "], Tx Type Count=["},
};

// How the library writes a text member that is absent.
const char kAbsentText[] = "(null)";

}  // namespace

void AppendUtf8(std::string& out, unsigned int code) {
  if (code < 0x80) {
    out += static_cast<char>(code);
  } else if (code < 0x800) {
    out += static_cast<char>(0xC0 | (code >> 6));
    out += static_cast<char>(0x80 | (code & 0x3F));
  } else if (code < 0x10000) {
    out += static_cast<char>(0xE0 | (code >> 12));
    out += static_cast<char>(0x80 | ((code >> 6) & 0x3F));
    out += static_cast<char>(0x80 | (code & 0x3F));
  } else {
    out += static_cast<char>(0xF0 | (code >> 18));
    out += static_cast<char>(0x80 | ((code >> 12) & 0x3F));
    out += static_cast<char>(0x80 | ((code >> 6) & 0x3F));
    out += static_cast<char>(0x80 | (code & 0x3F));
  }
}

TextCoding TextCodingOf(int standard, bool rawText) {
  if (rawText) return TextCoding::kAsBroadcast;
  return standard == RAVEL_STANDARD_JAPAN ? TextCoding::kArib8Unit : TextCoding::kLatin9;
}

std::string DecodeBroadcastText(const char* bytes, std::size_t length, TextCoding coding) {
  const unsigned char* text = reinterpret_cast<const unsigned char*>(bytes);
  switch (coding) {
    case TextCoding::kArib8Unit: return AribTextToUtf8(text, length);
    case TextCoding::kLatin9: return Latin9ToUtf8(text, length);
    case TextCoding::kAsBroadcast: break;
  }
  return EscapeBytes(bytes, length);
}

std::string DecodeBroadcastText(const std::string& bytes, TextCoding coding) {
  return DecodeBroadcastText(bytes.data(), bytes.size(), coding);
}

std::string OneLineText(const std::string& bytes, TextCoding coding) {
  std::string text = DecodeBroadcastText(bytes, coding);
  for (char& c : text)
    if (c == '\n') c = ' ';
  return text;
}

std::string DecodeTextInTraceLine(const std::string& line, TextCoding coding) {
  if (coding == TextCoding::kAsBroadcast) return line;
  for (const TextInLine& kind : kTextLines) {
    std::size_t opening = line.find(kind.opening);
    if (opening == std::string::npos || (kind.opening[0] == '\t' && opening != 0)) continue;
    std::size_t start = opening + std::strlen(kind.opening);
    std::size_t closingLength = std::strlen(kind.closing);
    std::size_t end = line.rfind(kind.closing);
    if (end == std::string::npos || end < start) continue;
    if (kind.closing[closingLength - 1] == '\n' && end + closingLength != line.size()) continue;
    std::string text = line.substr(start, end - start);
    if (text == kAbsentText) return line;
    return line.substr(0, start) + OneLineText(text, coding) + line.substr(end);
  }
  return line;
}

}  // namespace ravel_dump
