#include "Ravel_CDescriptorEstDownloadTime.h"

#include "Ravel_ByteOrder.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorEstDownloadTime");

const RavelCDescriptorKind RavelCEstDownloadTimeDescriptor::kKind = {
    0x07,
    "Estimated Donwload Time Descriptor",
    "This Descriptor isn't Estimated Download Time Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== EST Download Time Descriptor ===================\n",
    RAVEL_WRONG_TAG_MASK,
    false, kRavelTraceSourcePath};

RavelCEstDownloadTimeDescriptor::RavelCEstDownloadTimeDescriptor(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCEstDownloadTimeDescriptor::RavelCEstDownloadTimeDescriptor(RavelCEstDownloadTimeDescriptor&) = default;

RavelCEstDownloadTimeDescriptor& RavelCEstDownloadTimeDescriptor::operator=(RavelCEstDownloadTimeDescriptor&) = default;

RavelCEstDownloadTimeDescriptor::~RavelCEstDownloadTimeDescriptor() {}

int RavelCEstDownloadTimeDescriptor::ParseRawData(unsigned char* raw) {
  iEstDownloadTime = 0;
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  iEstDownloadTime = RavelCReadWindow::Read32(raw + 2);
  return kRavelOk;
}

void RavelCEstDownloadTimeDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  // Printed as a signed number, as the receivers' logs show it.
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tiEstDownloadTime=[%d]\n", static_cast<int>(iEstDownloadTime));
}
