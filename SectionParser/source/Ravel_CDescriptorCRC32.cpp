#include "Ravel_CDescriptorCRC32.h"

#include <cstring>

#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorCRC32");

const RavelCDescriptorKind RavelCCRC32Descriptor::kKind = {
    0x05,
    "CRC32 Descriptor",
    "This Descriptor isn't CRC32 Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== CRC32 Descriptor ===================\n",
    RAVEL_WRONG_TAG_MASK,
    false, kRavelTraceSourcePath};

RavelCCRC32Descriptor::RavelCCRC32Descriptor(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCCRC32Descriptor::RavelCCRC32Descriptor(RavelCCRC32Descriptor&) = default;

RavelCCRC32Descriptor& RavelCCRC32Descriptor::operator=(RavelCCRC32Descriptor&) = default;

RavelCCRC32Descriptor::~RavelCCRC32Descriptor() {}

int RavelCCRC32Descriptor::ParseRawData(unsigned char* raw) {
  std::memset(aCRC32, 0, sizeof(aCRC32));
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  RavelCReadWindow::Copy(aCRC32, raw + 2, sizeof(aCRC32));
  return kRavelOk;
}

void RavelCCRC32Descriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tCRC32=[0x%02x 0x%02x 0x%02x 0x%02x]\n", aCRC32[0], aCRC32[1], aCRC32[2], aCRC32[3]);
}
