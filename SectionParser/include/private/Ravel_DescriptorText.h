// The three forms in which descriptors keep broadcast text. The bytes are copied
// exactly as broadcast, control codes included; only a terminating 0 is added.
#ifndef RAVEL_DESCRIPTORTEXT_H
#define RAVEL_DESCRIPTORTEXT_H

#include <cstdlib>
#include <cstring>

#include "Ravel_CString.h"

// The text bytes are read through the read window of the parse in progress:
// bytes beyond the section read as 0, and the text keeps its declared count.

// Owned string object: count + 1 bytes from new[], handed to the string.
void RavelText_SetString(RavelCString& target, const unsigned char* text, int count);

// Owned C text: count + 1 bytes from malloc, released with free.
char* RavelText_NewCText(const unsigned char* text, int count);

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
void RavelText_SetLanguageCode(char (&target)[4], const unsigned char* code);

#endif
