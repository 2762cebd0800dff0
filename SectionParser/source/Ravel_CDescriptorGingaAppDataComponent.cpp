#include "Ravel_CDescriptorGingaAppDataComponent.h"

#include "Ravel_ByteOrder.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorGingaAppDataComponent");

// The display name given on a match is the base's own: the descriptor never
// gets a name of its kind. It has no banner since it keeps the base Show.
const RavelCDescriptorKind RavelCGingaAppDataComponentDescriptor::kKind = {
    0xFD, "Unknown Descriptor",
    "This Descriptor isn't Ginga Application Data Component! Descriptor Tag=[0x%x]\n", 0 /* no Show */,
    RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCGingaAppDataComponentDescriptor::RavelCGingaAppDataComponentDescriptor(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCGingaAppDataComponentDescriptor::RavelCGingaAppDataComponentDescriptor(
    RavelCGingaAppDataComponentDescriptor& other)
    : RavelCDescriptorBase(other) {
  *this = other;
}

RavelCGingaAppDataComponentDescriptor& RavelCGingaAppDataComponentDescriptor::operator=(
    RavelCGingaAppDataComponentDescriptor& other) {
  if (this == &other) return *this;
  Release();
  RavelCDescriptorBase::operator=(other);
  iDataComponentId = other.iDataComponentId;
  if (other.pAdditionalGingaInfo != 0) {
    pAdditionalGingaInfo = new RavelCAdditionalGingaInfo(*other.pAdditionalGingaInfo);
  }
  return *this;
}

RavelCGingaAppDataComponentDescriptor::~RavelCGingaAppDataComponentDescriptor() { Release(); }

void RavelCGingaAppDataComponentDescriptor::Release() {
  delete pAdditionalGingaInfo;  // and its carousel record with it
  pAdditionalGingaInfo = 0;
  iDataComponentId = 0;
}

int RavelCGingaAppDataComponentDescriptor::ParseRawData(unsigned char* raw) {
  Release();
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  iDataComponentId = RavelCReadWindow::Read16(raw + 2);
  RAVEL_TRACE(RAVEL_PARSER_WARNING, "ComponentId [0x%04x]\n", iDataComponentId);
  pAdditionalGingaInfo = new RavelCAdditionalGingaInfo();
  pAdditionalGingaInfo->ParseRawData(raw + 4);
  return kRavelOk;
}
