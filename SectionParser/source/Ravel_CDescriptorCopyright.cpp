#include "Ravel_CDescriptorCopyright.h"

#include <cstdlib>
#include <cstring>

#include "Ravel_ByteOrder.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_DescriptorText.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorCopyright");

const RavelCDescriptorKind RavelCCopyrightDescriptor::kKind = {
    0x0D, "Copyright Descriptor", "This Descriptor isn't Copyright Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Copyright Descriptor =====================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCCopyrightDescriptor::RavelCCopyrightDescriptor(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCCopyrightDescriptor::RavelCCopyrightDescriptor(RavelCCopyrightDescriptor& other)
    : RavelCDescriptorBase(other) {
  *this = other;
}

RavelCCopyrightDescriptor& RavelCCopyrightDescriptor::operator=(RavelCCopyrightDescriptor& other) {
  if (this == &other) return *this;
  Release();
  RavelCDescriptorBase::operator=(other);
  iCopyrightId = other.iCopyrightId;
  pCopyrightInfo = RavelText_DuplicateCText(other.pCopyrightInfo);
  return *this;
}

RavelCCopyrightDescriptor::~RavelCCopyrightDescriptor() { Release(); }

void RavelCCopyrightDescriptor::Release() {
  RavelText_FreeCText(pCopyrightInfo);
  iCopyrightId = 0;
}

int RavelCCopyrightDescriptor::ParseRawData(unsigned char* raw) {
  Release();
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  iCopyrightId = RavelCReadWindow::Read32(raw + 2);
  // Counted in 8 bits: a length of 0 takes 255 bytes into a 256-byte buffer.
  unsigned char count = static_cast<unsigned char>(iDescriptorLength - 1);
  std::size_t size = static_cast<std::size_t>(count) + 1;
  pCopyrightInfo = static_cast<char*>(std::malloc(size));
  if (pCopyrightInfo != 0) {
    RavelCReadWindow::Copy(reinterpret_cast<unsigned char*>(pCopyrightInfo), raw + 6, count);
    // The buffer's last byte is the one the copy leaves over; it closes the text.
    pCopyrightInfo[count] = '\0';
  }
  return kRavelOk;
}

void RavelCCopyrightDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t Copyright id: %d \n", static_cast<int>(iCopyrightId));
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t Copyright info: %s \n", RavelTraceText(pCopyrightInfo));
}
