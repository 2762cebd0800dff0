#include "Ravel_CDescriptorLinkage.h"

#include "Ravel_ByteOrder.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorLinkage");

const RavelCDescriptorKind RavelCLinkageDescriptor::kKind = {
    0x4A, "Linkage Descriptor", "This Descriptor isn't Linkage Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Linkage Descriptor ===================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCLinkageDescriptor::RavelCLinkageDescriptor(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCLinkageDescriptor::RavelCLinkageDescriptor(RavelCLinkageDescriptor&) = default;

RavelCLinkageDescriptor& RavelCLinkageDescriptor::operator=(RavelCLinkageDescriptor&) = default;

RavelCLinkageDescriptor::~RavelCLinkageDescriptor() {}

int RavelCLinkageDescriptor::ParseRawData(unsigned char* raw) {
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) {
    iTransportStreamId = 0;
    iOriginalNetworkId = 0;
    iServiceId = 0;
    iLinkageType = 0;
    return result;
  }
  iTransportStreamId = RavelCReadWindow::Read16(raw + 2);
  iOriginalNetworkId = RavelCReadWindow::Read16(raw + 4);
  iServiceId = RavelCReadWindow::Read16(raw + 6);
  iLinkageType = RavelCReadWindow::Read8(raw + 8);
  return kRavelOk;
}

void RavelCLinkageDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP,
              "\tTransportStreamId=[0x%04x], OrginalNetworkId=[0x%04x], ServiceId=[0x%04x], LinkageType=[0x%02x]\n",
              iTransportStreamId, iOriginalNetworkId, iServiceId, iLinkageType);
}
