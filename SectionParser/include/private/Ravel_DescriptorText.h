// The three forms in which descriptors keep broadcast text. The bytes are copied
// exactly as broadcast, control codes included; only a terminating 0 is added.
#ifndef RAVEL_DESCRIPTORTEXT_H
#define RAVEL_DESCRIPTORTEXT_H

#include <cstdlib>
#include <cstring>

#include "Ravel_CString.h"

// Owned string object: count + 1 bytes from new[], handed to the string.
inline void RavelText_SetString(RavelCString& target, const unsigned char* text, int count) {
  if (count < 0) count = 0;
  char* buffer = new char[count + 1];
  if (count > 0) std::memcpy(buffer, text, static_cast<std::size_t>(count));
  buffer[count] = '\0';
  target.SetMemAllocedString(buffer);
}

// Owned C text: count + 1 bytes from malloc, released with free.
inline char* RavelText_NewCText(const unsigned char* text, int count) {
  if (count < 0) count = 0;
  char* buffer = static_cast<char*>(std::malloc(static_cast<std::size_t>(count) + 1));
  if (buffer == 0) return 0;
  if (count > 0) std::memcpy(buffer, text, static_cast<std::size_t>(count));
  buffer[count] = '\0';
  return buffer;
}

// The copy of an owned C text made by assignment: strlen, malloc, strcpy.
inline char* RavelText_DuplicateCText(const char* text) {
  if (text == 0) return 0;
  std::size_t length = std::strlen(text);
  char* buffer = static_cast<char*>(std::malloc(length + 1));
  if (buffer != 0) std::memcpy(buffer, text, length + 1);
  return buffer;
}

inline void RavelText_FreeCText(char*& text) {
  std::free(text);
  text = 0;
}

// ISO 639-2 language code: 3 bytes and a 0, no case folding or validation.
inline void RavelText_SetLanguageCode(char (&target)[4], const unsigned char* code) {
  std::memcpy(target, code, 3);
  target[3] = '\0';
}

#endif
