#include "Ravel_CDescriptorDataComponent.h"

#include "Ravel_ByteOrder.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorDataComponent");

const RavelCDescriptorKind RavelCDataComponentDescriptor::kKind = {
    0xFD, "Data Component Descriptor", "This Descriptor isn't Data Component Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Data Component Descriptor ===================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCDataComponentDescriptor::RavelCDataComponentDescriptor(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCDataComponentDescriptor::RavelCDataComponentDescriptor(RavelCDataComponentDescriptor&) = default;

RavelCDataComponentDescriptor& RavelCDataComponentDescriptor::operator=(RavelCDataComponentDescriptor&) = default;

RavelCDataComponentDescriptor::~RavelCDataComponentDescriptor() {}

int RavelCDataComponentDescriptor::ParseRawData(unsigned char* raw) {
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) {
    iDataComponentId = 0;
    return result;
  }
  iDataComponentId = RavelCReadWindow::Read16(raw + 2);
  return kRavelOk;
}

void RavelCDataComponentDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tiDataComponentId=[0x%04x]\n", iDataComponentId);
}
