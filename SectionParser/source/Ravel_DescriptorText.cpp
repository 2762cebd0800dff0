#include "Ravel_DescriptorText.h"

#include "Ravel_CReadWindow.h"

void RavelText_SetString(RavelCString& target, const unsigned char* text, int count) {
  if (count < 0) count = 0;
  char* buffer = new char[count + 1];
  RavelCReadWindow::Copy(reinterpret_cast<unsigned char*>(buffer), text, count);
  buffer[count] = '\0';
  target.SetMemAllocedString(buffer);
}

char* RavelText_NewCText(const unsigned char* text, int count) {
  if (count < 0) count = 0;
  char* buffer = static_cast<char*>(std::malloc(static_cast<std::size_t>(count) + 1));
  if (buffer == 0) return 0;
  RavelCReadWindow::Copy(reinterpret_cast<unsigned char*>(buffer), text, count);
  buffer[count] = '\0';
  return buffer;
}

void RavelText_SetLanguageCode(char (&target)[4], const unsigned char* code) {
  RavelCReadWindow::Copy(reinterpret_cast<unsigned char*>(target), code, 3);
  target[3] = '\0';
}
