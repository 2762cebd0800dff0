#include "Ravel_CDescriptorApplicationName.h"

#include <cstring>

#include "Ravel_CBitInputStream.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_FixedText.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorApplicationName");

// The application descriptors dump at the information level.
static const unsigned int kShowMask = RAVEL_PARSER_WARNING;

// The display name is the application descriptor's own: both kinds show as
// "Application Descriptor".
const RavelCDescriptorKind RavelCApplicationNameDescriptor::kKind = {
    0x01, "Application Descriptor", 0 /* any tag */,
    "\t=================== Application Name Descriptor ===================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCApplicationNameDescriptor::RavelCApplicationNameDescriptor(unsigned char* raw) {
  Clear();
  ParseRawData(raw);
}

RavelCApplicationNameDescriptor::RavelCApplicationNameDescriptor(RavelCApplicationNameDescriptor&) = default;

RavelCApplicationNameDescriptor& RavelCApplicationNameDescriptor::operator=(RavelCApplicationNameDescriptor&) = default;

RavelCApplicationNameDescriptor::~RavelCApplicationNameDescriptor() {}

void RavelCApplicationNameDescriptor::Clear() {
  std::memset(szISOLanguageCode, 0, sizeof(szISOLanguageCode));
  std::memset(szApplicationName, 0, sizeof(szApplicationName));
}

int RavelCApplicationNameDescriptor::ParseRawData(unsigned char* raw) {
  Clear();
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  RavelCBitInputStream reader = RavelCReadWindow::Reader(raw + 2, iDescriptorLength);
  unsigned char status = 0;
  reader.GetByteArray(reinterpret_cast<unsigned char*>(szISOLanguageCode), 3);
  // An 8-bit count never exceeds the 255-byte field.
  unsigned char nameLength = reader.ReadByte(8, status);
  reader.GetByteArray(reinterpret_cast<unsigned char*>(szApplicationName), nameLength);
  return kRavelOk;
}

void RavelCApplicationNameDescriptor::Show() {
  ShowHeader(kKind, __LINE__, kShowMask);
  RAVEL_TRACE(kShowMask, "\t iISOLanguageCode=%s, iApplicationName=%s", szISOLanguageCode,
              RavelFixedText_Print(szApplicationName).Get());
}
