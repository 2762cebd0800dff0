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

bool IsControl(unsigned char byte) { return byte < 0x20 || (byte >= 0x7F && byte < 0xA0); }

}  // namespace

std::string EscapeBytes(const char* text, std::size_t length) {
  std::string out;
  out.reserve(length);
  for (std::size_t i = 0; i < length; ++i) {
    unsigned char byte = static_cast<unsigned char>(text[i]);
    if (byte == '\\') {
      out += "\\\\";
    } else if (IsControl(byte)) {
      AppendEscape(out, byte);
    } else {
      out += static_cast<char>(byte);
    }
  }
  return out;
}

std::string EscapeBytes(const std::string& text) { return EscapeBytes(text.data(), text.size()); }

std::string EscapeCText(const char* text) {
  return text == nullptr ? std::string() : EscapeBytes(text, std::strlen(text));
}

std::string EscapeBounded(const char* text, std::size_t capacity) {
  if (text == nullptr) return std::string();
  std::size_t length = 0;
  while (length < capacity && text[length] != '\0') ++length;
  return EscapeBytes(text, length);
}

std::string EscapeAscii(const char* text, std::size_t length) {
  std::string out;
  out.reserve(length);
  for (std::size_t i = 0; i < length; ++i) {
    unsigned char byte = static_cast<unsigned char>(text[i]);
    if (byte == '\\') {
      out += "\\\\";
    } else if (byte < 0x20 || byte >= 0x7F) {
      AppendEscape(out, byte);
    } else {
      out += static_cast<char>(byte);
    }
  }
  return out;
}

std::string EscapeAscii(const std::string& text) { return EscapeAscii(text.data(), text.size()); }

std::string EscapeTraceText(const char* text) {
  if (text == nullptr) return std::string();
  std::size_t length = std::strlen(text);
  bool closingLineEnd = length > 0 && text[length - 1] == '\n';
  if (closingLineEnd) --length;
  std::string out;
  out.reserve(length + 1);
  for (std::size_t i = 0; i < length; ++i) {
    unsigned char byte = static_cast<unsigned char>(text[i]);
    if (byte == '\t') {
      out += '\t';
    } else if (byte == '\\') {
      out += "\\\\";
    } else if (IsControl(byte)) {
      AppendEscape(out, byte);
    } else {
      out += static_cast<char>(byte);
    }
  }
  if (closingLineEnd) out += '\n';
  return out;
}

}  // namespace ravel_dump
