#include "Ravel_CDescriptorType.h"

#include "Ravel_DescriptorText.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorType");

const RavelCDescriptorKind RavelCTypeDescriptor::kKind = {
    0x01,
    "Type Descriptor",
    "This Descriptor isn't Type Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Type Descriptor ===================\n",
    RAVEL_WRONG_TAG_MASK,
    false, kRavelTraceSourcePath};

RavelCTypeDescriptor::RavelCTypeDescriptor(unsigned char* raw) : sType() { ParseRawData(raw); }

RavelCTypeDescriptor::RavelCTypeDescriptor(RavelCTypeDescriptor&) = default;

RavelCTypeDescriptor& RavelCTypeDescriptor::operator=(RavelCTypeDescriptor&) = default;

RavelCTypeDescriptor::~RavelCTypeDescriptor() {}

int RavelCTypeDescriptor::ParseRawData(unsigned char* raw) {
  sType = "";
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  RavelText_SetString(sType, raw + 2, iDescriptorLength);
  return kRavelOk;
}

void RavelCTypeDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tiType=[%s]\n", sType.GetString());
}
