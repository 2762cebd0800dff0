#include "Ravel_CDescriptorShortEvent.h"

#include <cstring>

#include "Ravel_CReadWindow.h"
#include "Ravel_DescriptorText.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorShortEvent");

const RavelCDescriptorKind RavelCShortEventDescriptor::kKind = {
    0x4D, "Short Event Descriptor", "This Descriptor isn't Short Event Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Short Event Descriptor ===================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCShortEventDescriptor::RavelCShortEventDescriptor(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCShortEventDescriptor::RavelCShortEventDescriptor(RavelCShortEventDescriptor& other)
    : RavelCDescriptorBase(other) {
  *this = other;
}

RavelCShortEventDescriptor& RavelCShortEventDescriptor::operator=(RavelCShortEventDescriptor& other) {
  if (this == &other) return *this;
  Release();
  RavelCDescriptorBase::operator=(other);
  std::memcpy(szLanguageCode, other.szLanguageCode, sizeof(szLanguageCode));
  pEventName = RavelText_DuplicateCText(other.pEventName);
  pEventDescription = RavelText_DuplicateCText(other.pEventDescription);
  return *this;
}

RavelCShortEventDescriptor::~RavelCShortEventDescriptor() { Release(); }

void RavelCShortEventDescriptor::Release() {
  RavelText_FreeCText(pEventName);
  RavelText_FreeCText(pEventDescription);
  std::memset(szLanguageCode, 0, sizeof(szLanguageCode));
}

int RavelCShortEventDescriptor::ParseRawData(unsigned char* raw) {
  Release();
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  RavelText_SetLanguageCode(szLanguageCode, raw + 2);
  const unsigned char* p = raw + 5;
  int nameCount = RavelCReadWindow::Read8(p);
  pEventName = RavelText_NewCText(p + 1, nameCount);
  p += 1 + nameCount;
  int textCount = RavelCReadWindow::Read8(p);
  pEventDescription = RavelText_NewCText(p + 1, textCount);
  return kRavelOk;
}

void RavelCShortEventDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tLanguageCode=[%s]\n", szLanguageCode);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tEventName=[%s]\n", RavelTraceText(pEventName));
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tEventDescription=[%s]\n", RavelTraceText(pEventDescription));
}
