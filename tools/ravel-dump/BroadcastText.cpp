#include "BroadcastText.h"

// libaribb24's headers declare C functions without saying so.
extern "C" {
#include <aribb24/aribb24.h>
#include <aribb24/decoder.h>
}

#include <cstring>
#include <vector>

#include "ByteText.h"
#include "Ravel_Cfg.h"

namespace ravel_dump {
namespace {

void AppendUtf8(std::string& out, unsigned int code) {
  if (code < 0x80) {
    out += static_cast<char>(code);
  } else if (code < 0x800) {
    out += static_cast<char>(0xC0 | (code >> 6));
    out += static_cast<char>(0x80 | (code & 0x3F));
  } else {
    out += static_cast<char>(0xE0 | (code >> 12));
    out += static_cast<char>(0x80 | ((code >> 6) & 0x3F));
    out += static_cast<char>(0x80 | (code & 0x3F));
  }
}

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

// ARIB STD-B24 control codes that libaribb24 does not act on in SI texts.
const unsigned char kAribLineBreak = 0x0D;  // APR, the line break of SI texts
const unsigned char kAribMiddleSize = 0x89;  // MSZ: alphanumerics shown half-width
const unsigned char kAribNormalSize = 0x8A;  // NSZ: back to full width

// In middle size the alphanumeric set is shown half-width: the full-width
// forms libaribb24 gives (U+FF01 to U+FF5E, U+3000 for the space) become ASCII.
void AppendHalfWidth(std::string& out, const std::string& fullWidth) {
  for (std::size_t i = 0; i < fullWidth.size();) {
    const unsigned char* c = reinterpret_cast<const unsigned char*>(fullWidth.data()) + i;
    if (i + 3 <= fullWidth.size() && c[0] == 0xEF && ((c[1] == 0xBC && c[2] >= 0x81) || (c[1] == 0xBD && c[2] <= 0x9E))) {
      unsigned int code = ((c[1] & 0x3F) << 6 | (c[2] & 0x3F)) + 0xF000 - 0xFEE0;
      out += static_cast<char>(code);
      i += 3;
    } else if (i + 3 <= fullWidth.size() && c[0] == 0xE3 && c[1] == 0x80 && c[2] == 0x80) {
      out += ' ';
      i += 3;
    } else {
      out += fullWidth[i++];
    }
  }
}

// libaribb24 decodes the character sets of ARIB STD-B24 8-unit code (JIS X 0208
// kanji, alphanumerics, hiragana, katakana, the additional symbols), with the
// designations and shifts the text makes, starting from the default sets of SI
// texts. It drops control codes, line breaks and character sizes included:
// the text is therefore decoded run by run between those two, the decoder
// keeping its state from one run to the next.
class AribDecoder {
 public:
  AribDecoder() : instance_(arib_instance_new(nullptr)) {
    decoder_ = instance_ != nullptr ? arib_get_decoder(instance_) : nullptr;
  }
  ~AribDecoder() {
    if (instance_ != nullptr) arib_instance_destroy(instance_);
  }
  AribDecoder(const AribDecoder&) = delete;
  AribDecoder& operator=(const AribDecoder&) = delete;

  std::string Decode(const unsigned char* bytes, std::size_t length) {
    std::string out;
    if (decoder_ == nullptr) return out;
    arib_initialize_decoder(decoder_);
    bool middleSize = false;
    std::size_t runStart = 0;
    for (std::size_t i = 0; i <= length; ++i) {
      bool end = i == length;
      if (!end && bytes[i] != kAribLineBreak && bytes[i] != kAribMiddleSize && bytes[i] != kAribNormalSize) continue;
      std::string run = DecodeRun(bytes + runStart, i - runStart);
      if (middleSize) {
        AppendHalfWidth(out, run);
      } else {
        out += run;
      }
      if (end) break;
      if (bytes[i] == kAribLineBreak) out += '\n';
      middleSize = bytes[i] == kAribMiddleSize ? true : bytes[i] == kAribNormalSize ? false : middleSize;
      runStart = i + 1;
    }
    return out;
  }

 private:
  std::string DecodeRun(const unsigned char* bytes, std::size_t length) {
    if (length == 0) return std::string();
    // At most 4 UTF-8 bytes for each byte of the run (an additional symbol
    // beyond the BMP from a single-shifted byte pair).
    std::vector<char> buffer(4 * length + 4, '\0');
    std::size_t written = arib_decode_buffer(decoder_, bytes, length, buffer.data(), buffer.size() - 1);
    return std::string(buffer.data(), strnlen(buffer.data(), written));
  }

  arib_instance_t* instance_;
  arib_decoder_t* decoder_;
};

std::string Arib8UnitToUtf8(const unsigned char* bytes, std::size_t length) {
  static AribDecoder decoder;
  return decoder.Decode(bytes, length);
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

TextCoding TextCodingOf(int standard, bool rawText) {
  if (rawText) return TextCoding::kAsBroadcast;
  return standard == RAVEL_STANDARD_JAPAN ? TextCoding::kArib8Unit : TextCoding::kLatin9;
}

std::string DecodeBroadcastText(const char* bytes, std::size_t length, TextCoding coding) {
  const unsigned char* text = reinterpret_cast<const unsigned char*>(bytes);
  switch (coding) {
    case TextCoding::kArib8Unit: return Arib8UnitToUtf8(text, length);
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
