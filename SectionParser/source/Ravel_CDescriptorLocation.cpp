#include "Ravel_CDescriptorLocation.h"

#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorLocation");

const RavelCDescriptorKind RavelCLocationDescriptor::kKind = {
    0x06,
    "Location Descriptor",
    "This Descriptor isn't Location Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Location Descriptor ===================\n",
    RAVEL_WRONG_TAG_MASK,
    false, kRavelTraceSourcePath};

RavelCLocationDescriptor::RavelCLocationDescriptor(unsigned char* raw) { ParseRawData(raw); }

RavelCLocationDescriptor::RavelCLocationDescriptor(RavelCLocationDescriptor&) = default;

RavelCLocationDescriptor& RavelCLocationDescriptor::operator=(RavelCLocationDescriptor&) = default;

RavelCLocationDescriptor::~RavelCLocationDescriptor() {}

int RavelCLocationDescriptor::ParseRawData(unsigned char* raw) {
  iLocationTag = 0;
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  iLocationTag = RavelCReadWindow::Read8(raw + 2);
  return kRavelOk;
}

void RavelCLocationDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tiLocationTag=[%d]\n", iLocationTag);
}
