#include "Ravel_CDescriptorCompressionType.h"

#include "Ravel_ByteOrder.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorCompressionType");

const RavelCDescriptorKind RavelCCompressionTypeDescriptor::kKind = {
    0xC2,
    "Compression Type Descriptor",
    "This Descriptor isn't Compression Type Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Compression Type Descriptor ===================\n",
    RAVEL_WRONG_TAG_MASK,
    false, kRavelTraceSourcePath};

RavelCCompressionTypeDescriptor::RavelCCompressionTypeDescriptor(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCCompressionTypeDescriptor::RavelCCompressionTypeDescriptor(RavelCCompressionTypeDescriptor&) = default;

RavelCCompressionTypeDescriptor& RavelCCompressionTypeDescriptor::operator=(RavelCCompressionTypeDescriptor&) = default;

RavelCCompressionTypeDescriptor::~RavelCCompressionTypeDescriptor() {}

int RavelCCompressionTypeDescriptor::ParseRawData(unsigned char* raw) {
  iCompressionType = 0;
  iOriginalSize = 0;
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  iCompressionType = RavelCReadWindow::Read8(raw + 2);
  iOriginalSize = RavelCReadWindow::Read32(raw + 3);
  return kRavelOk;
}

void RavelCCompressionTypeDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tiCompressionType=[%d], iOriginalSize=[%d]\n", iCompressionType,
              static_cast<int>(iOriginalSize));
}
