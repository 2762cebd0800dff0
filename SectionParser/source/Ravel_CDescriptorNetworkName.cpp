#include "Ravel_CDescriptorNetworkName.h"

#include "Ravel_DescriptorText.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorNetworkName");

const RavelCDescriptorKind RavelCNetworkNameDescriptor::kKind = {
    0x40, "Network Name Descriptor",
    "This Descriptor isn't Network Name Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Network Descriptor ===================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCNetworkNameDescriptor::RavelCNetworkNameDescriptor(unsigned char* raw) : sNetworkName() {
  ParseRawData(raw);
}

RavelCNetworkNameDescriptor::RavelCNetworkNameDescriptor(RavelCNetworkNameDescriptor&) = default;

RavelCNetworkNameDescriptor& RavelCNetworkNameDescriptor::operator=(RavelCNetworkNameDescriptor&) = default;

RavelCNetworkNameDescriptor::~RavelCNetworkNameDescriptor() {}

int RavelCNetworkNameDescriptor::ParseRawData(unsigned char* raw) {
  sNetworkName = "";
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  RavelText_SetString(sNetworkName, raw + 2, iDescriptorLength);
  return kRavelOk;
}

void RavelCNetworkNameDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tNetwork Name=[%s]\n", sNetworkName.GetString());
}
