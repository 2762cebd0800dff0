#include "ByteText.h"

#include <cstring>

namespace ravel_dump {
namespace {

const char kHex[] = "0123456789abcdef";

void AppendEscape(std::string& out, unsigned char byte) {
  out += '\\';
  out += 'x';
  out += kHex[byte >> 4];
  out += kHex[byte & 0x0F];
}

// Length of the valid UTF-8 sequence of a printable character (not C1)
// starting at text[i], or 0.
std::size_t Utf8Length(const unsigned char* text, std::size_t i, std::size_t length) {
  unsigned char lead = text[i];
  std::size_t n = 0;
  unsigned int code = 0;
  unsigned int minimum = 0;
  if (lead >= 0xC2 && lead <= 0xDF) {
    n = 2, code = lead & 0x1F, minimum = 0x80;
  } else if (lead >= 0xE0 && lead <= 0xEF) {
    n = 3, code = lead & 0x0F, minimum = 0x800;
  } else if (lead >= 0xF0 && lead <= 0xF4) {
    n = 4, code = lead & 0x07, minimum = 0x10000;
  } else {
    return 0;
  }
  if (i + n > length) return 0;
  for (std::size_t k = 1; k < n; ++k) {
    if ((text[i + k] & 0xC0) != 0x80) return 0;
    code = (code << 6) | (text[i + k] & 0x3F);
  }
  if (code < minimum || code > 0x10FFFF || (code >= 0xD800 && code <= 0xDFFF)) return 0;
  if (code >= 0x80 && code <= 0x9F) return 0;  // C1 controls
  return n;
}

// `keepLayout`: tabs pass unchanged (a trace's own layout).
std::string Escape(const char* text, std::size_t length, bool keepLayout) {
  const unsigned char* bytes = reinterpret_cast<const unsigned char*>(text);
  std::string out;
  out.reserve(length);
  for (std::size_t i = 0; i < length;) {
    unsigned char byte = bytes[i];
    if (byte == '\\') {
      out += "\\\\";
      ++i;
    } else if (byte == '\t' && keepLayout) {
      out += '\t';
      ++i;
    } else if (byte >= 0x20 && byte < 0x7F) {
      out += static_cast<char>(byte);
      ++i;
    } else if (std::size_t n = byte >= 0x80 ? Utf8Length(bytes, i, length) : 0) {
      out.append(text + i, n);
      i += n;
    } else {
      AppendEscape(out, byte);
      ++i;
    }
  }
  return out;
}

}  // namespace

std::string EscapeBytes(const char* text, std::size_t length) { return Escape(text, length, false); }

std::string EscapeBytes(const std::string& text) { return EscapeBytes(text.data(), text.size()); }

std::string EscapeTraceText(const char* text) {
  if (text == nullptr) return std::string();
  std::size_t length = std::strlen(text);
  bool closingLineEnd = length > 0 && text[length - 1] == '\n';
  std::string out = Escape(text, closingLineEnd ? length - 1 : length, true);
  if (closingLineEnd) out += '\n';
  return out;
}

}  // namespace ravel_dump
