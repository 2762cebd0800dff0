#include "Ravel_CString.h"

#include <cstring>

namespace {

char* Duplicate(const char* text) {
  if (text == 0) return 0;
  std::size_t length = std::strlen(text);
  char* copy = new char[length + 1];
  std::memcpy(copy, text, length + 1);
  return copy;
}

}  // namespace

RavelCString::RavelCString() {}

RavelCString::RavelCString(const char* text) : pText(Duplicate(text)) {}

RavelCString::RavelCString(const RavelCString& other) : pText(Duplicate(other.pText)) {}

RavelCString::~RavelCString() { delete[] pText; }

RavelCString& RavelCString::operator=(const char* text) {
  if (text != pText) {
    char* copy = Duplicate(text);
    delete[] pText;
    pText = copy;
  }
  return *this;
}

RavelCString& RavelCString::operator=(const RavelCString& other) { return *this = other.pText; }

void RavelCString::SetMemAllocedString(char* buffer) {
  if (buffer == pText) return;
  delete[] pText;
  pText = buffer;
}

const char* RavelCString::GetString() const { return pText ? pText : ""; }

unsigned int RavelCString::GetLength() const {
  return pText ? static_cast<unsigned int>(std::strlen(pText)) : 0u;
}

bool RavelCString::IsEmpty() const { return pText == 0 || pText[0] == '\0'; }
