#include "Ravel_CDescriptorInfo.h"

#include <cstring>

#include "Ravel_CReadWindow.h"
#include "Ravel_DescriptorText.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorInfo");

const RavelCDescriptorKind RavelCInfoDescriptor::kKind = {
    0x03,
    "Info Descriptor",
    "This Descriptor isn't Info Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Info Descriptor ===================\n",
    RAVEL_UTILITY_WARNING,
    false, kRavelTraceSourcePath};

RavelCInfoDescriptor::RavelCInfoDescriptor(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCInfoDescriptor::RavelCInfoDescriptor(RavelCInfoDescriptor& other) : RavelCDescriptorBase(other) {
  *this = other;
}

RavelCInfoDescriptor& RavelCInfoDescriptor::operator=(RavelCInfoDescriptor& other) {
  if (this == &other) return *this;
  ReleaseText();
  RavelCDescriptorBase::operator=(other);
  std::memcpy(szLanguageCode, other.szLanguageCode, sizeof(szLanguageCode));
  // Copied up to its first 0 byte, like every other owned text; the buffer
  // comes from new[] because this class releases its text with delete[].
  if (other.pText != 0) {
    std::size_t length = std::strlen(other.pText);
    pText = new char[length + 1];
    std::memcpy(pText, other.pText, length + 1);
  }
  return *this;
}

RavelCInfoDescriptor::~RavelCInfoDescriptor() { ReleaseText(); }

void RavelCInfoDescriptor::ReleaseText() {
  delete[] pText;
  pText = 0;
}

int RavelCInfoDescriptor::ParseRawData(unsigned char* raw) {
  // The text of an earlier parse is released here too, so parsing again never leaks it.
  ReleaseText();
  std::memset(szLanguageCode, 0, sizeof(szLanguageCode));
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  RavelText_SetLanguageCode(szLanguageCode, raw + 2);
  // descriptor_length - 3 text bytes and two 0 bytes (descriptor_length - 1 in all).
  // A length below 3 holds no text: the buffer is then just the two 0 bytes.
  int textLength = iDescriptorLength >= 3 ? iDescriptorLength - 3 : 0;
  pText = new char[textLength + 2];
  RavelCReadWindow::Copy(reinterpret_cast<unsigned char*>(pText), raw + 5, textLength);
  pText[textLength] = '\0';
  pText[textLength + 1] = '\0';
  return kRavelOk;
}

void RavelCInfoDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tiISO639LangCode=[%s], ipTextChar=[%s]\n", szLanguageCode, RavelTraceText(pText));
}
