#include "Ravel_CDescriptorName.h"

#include "Ravel_DescriptorText.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorName");

const RavelCDescriptorKind RavelCNameDescriptor::kKind = {
    0x02,
    "Name Descriptor",
    "This Descriptor isn't Name Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Name Descriptor ===================\n",
    RAVEL_WRONG_TAG_MASK,
    false, kRavelTraceSourcePath};

RavelCNameDescriptor::RavelCNameDescriptor(unsigned char* raw) : sFileName() { ParseRawData(raw); }

RavelCNameDescriptor::RavelCNameDescriptor(RavelCNameDescriptor&) = default;

RavelCNameDescriptor& RavelCNameDescriptor::operator=(RavelCNameDescriptor&) = default;

RavelCNameDescriptor::~RavelCNameDescriptor() {}

int RavelCNameDescriptor::ParseRawData(unsigned char* raw) {
  sFileName = "";
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  RavelText_SetString(sFileName, raw + 2, iDescriptorLength);
  return kRavelOk;
}

void RavelCNameDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tiFileName=[%s]\n", sFileName.GetString());
}
