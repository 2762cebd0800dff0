#include "Ravel_CDescriptorTargetRegion.h"

#include <cstdlib>
#include <cstring>

#include "Ravel_CReadWindow.h"
#include "Ravel_DescriptorText.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorTargetRegion");

const RavelCDescriptorKind RavelCTargetRegionDescriptor::kKind = {
    0xC6, "Region Descriptor", "This Descriptor isn't Target Region Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Target Region Descriptor =====================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCTargetRegionDescriptor::RavelCTargetRegionDescriptor(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCTargetRegionDescriptor::RavelCTargetRegionDescriptor(RavelCTargetRegionDescriptor& other)
    : RavelCDescriptorBase(other) {
  *this = other;
}

RavelCTargetRegionDescriptor& RavelCTargetRegionDescriptor::operator=(RavelCTargetRegionDescriptor& other) {
  if (this == &other) return *this;
  Release();
  RavelCDescriptorBase::operator=(other);
  pRegionSpec = RavelText_DuplicateCText(other.pRegionSpec);
  iRegionSpecType = other.iRegionSpecType;
  return *this;
}

RavelCTargetRegionDescriptor::~RavelCTargetRegionDescriptor() { Release(); }

void RavelCTargetRegionDescriptor::Release() {
  RavelText_FreeCText(pRegionSpec);
  iRegionSpecType = 0;
}

int RavelCTargetRegionDescriptor::ParseRawData(unsigned char* raw) {
  Release();
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  iRegionSpecType = RavelCReadWindow::Read8(raw + 2);
  // Counted in 8 bits: a length of 0 takes 255 bytes into a 256-byte buffer.
  unsigned char count = static_cast<unsigned char>(iDescriptorLength - 1);
  pRegionSpec = static_cast<char*>(std::malloc(static_cast<std::size_t>(count) + 1));
  if (pRegionSpec != 0) {
    RavelCReadWindow::Copy(reinterpret_cast<unsigned char*>(pRegionSpec), raw + 3, count);
    // The buffer's last byte is the one the copy leaves over; it closes the text.
    pRegionSpec[count] = '\0';
  }
  return kRavelOk;
}

void RavelCTargetRegionDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t Region Spec Type: %d \n", iRegionSpecType);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t Region Spec: %s \n", RavelTraceText(pRegionSpec));
}
