#include "Ravel_CDescriptorModuleLink.h"

#include "Ravel_ByteOrder.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorModuleLink");

const RavelCDescriptorKind RavelCModuleLinkDescriptor::kKind = {
    0x04,
    "Module Link Descriptor",
    "This Descriptor isn't Module Link Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Module Link Descriptor ===================\n",
    RAVEL_WRONG_TAG_MASK,
    false, kRavelTraceSourcePath};

RavelCModuleLinkDescriptor::RavelCModuleLinkDescriptor(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCModuleLinkDescriptor::RavelCModuleLinkDescriptor(RavelCModuleLinkDescriptor&) = default;

RavelCModuleLinkDescriptor& RavelCModuleLinkDescriptor::operator=(RavelCModuleLinkDescriptor&) = default;

RavelCModuleLinkDescriptor::~RavelCModuleLinkDescriptor() {}

int RavelCModuleLinkDescriptor::ParseRawData(unsigned char* raw) {
  iPosition = 0;
  iModuleId = 0;
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  iPosition = RavelCReadWindow::Read8(raw + 2);
  iModuleId = RavelCReadWindow::Read16(raw + 3);
  return kRavelOk;
}

void RavelCModuleLinkDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  // The module id is a number: printed in decimal under its usual label.
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tiPosition=[%d], iModuleId=[%d]\n", iPosition, iModuleId);
}
