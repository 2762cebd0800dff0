#include "Ravel_CDescriptorStreamIdentifier.h"

#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorStreamIdentifier");

const RavelCDescriptorKind RavelCStreamIdentifierDescriptor::kKind = {
    0x52, "Stream Id Descriptor", "This Descriptor isn't Stream Identifier Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Stream Identifier Descriptor ===================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCStreamIdentifierDescriptor::RavelCStreamIdentifierDescriptor(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCStreamIdentifierDescriptor::RavelCStreamIdentifierDescriptor(RavelCStreamIdentifierDescriptor&) = default;

RavelCStreamIdentifierDescriptor& RavelCStreamIdentifierDescriptor::operator=(RavelCStreamIdentifierDescriptor&) = default;

RavelCStreamIdentifierDescriptor::~RavelCStreamIdentifierDescriptor() {}

int RavelCStreamIdentifierDescriptor::ParseRawData(unsigned char* raw) {
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) {
    iComponentTag = 0;
    return result;
  }
  iComponentTag = RavelCReadWindow::Read8(raw + 2);
  return kRavelOk;
}

void RavelCStreamIdentifierDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tComponent Tag = [0x%02x]\n", iComponentTag);
}
