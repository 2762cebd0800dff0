#include "Ravel_CDescriptorNPTReference.h"

#include <cstring>

#include "Ravel_ByteOrder.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorNPTReference");

const RavelCDescriptorKind RavelCNPTReferenceDescriptor::kKind = {
    0x17,
    "NPT Reference Descriptor",
    "This Descriptor isn't  NPT Reference Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== NPT Reference Descriptor ===================\n",
    RAVEL_WRONG_TAG_MASK,
    true, kRavelTraceSourcePath};

namespace {

void ClearFields(RavelCNPTReferenceDescriptor& d) {
  d.iPostDiscontinuityIndicator = 0;
  d.iContentId = 0;
  std::memset(d.aSTCReference, 0, sizeof(d.aSTCReference));
  std::memset(d.aNPTReference, 0, sizeof(d.aNPTReference));
  d.iScaleNumerator = 0;
  d.iScaleDenominator = 0;
}

// A 33-bit reference: bit 32 alone (xxxxxxx1), then the 32 bits below it.
void ReadReference33(const unsigned char* raw, unsigned char (&target)[5]) {
  target[0] = RavelCReadWindow::Read8(raw) & 0x01;
  RavelCReadWindow::Copy(target + 1, raw + 1, 4);
}

}  // namespace

RavelCNPTReferenceDescriptor::RavelCNPTReferenceDescriptor(unsigned char* raw) {
  ClearFields(*this);
  ParseRawData(raw);
}

RavelCNPTReferenceDescriptor::RavelCNPTReferenceDescriptor(RavelCNPTReferenceDescriptor&) = default;

RavelCNPTReferenceDescriptor& RavelCNPTReferenceDescriptor::operator=(RavelCNPTReferenceDescriptor&) = default;

RavelCNPTReferenceDescriptor::~RavelCNPTReferenceDescriptor() {}

int RavelCNPTReferenceDescriptor::ParseRawData(unsigned char* raw) {
  // Nothing owned to release; a refused descriptor keeps the fields it had.
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  const unsigned char flags = RavelCReadWindow::Read8(raw + 2);
  iPostDiscontinuityIndicator = flags >> 7;  // 1xxxxxxx
  iContentId = flags & 0x7F;                 // x1111111
  ReadReference33(raw + 3, aSTCReference);    // bytes 3 to 7
  ReadReference33(raw + 11, aNPTReference);   // bytes 11 to 15
  iScaleNumerator = RavelCReadWindow::Read16(raw + 16);
  iScaleDenominator = RavelCReadWindow::Read16(raw + 18);
  return kRavelOk;
}

void RavelCNPTReferenceDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t Post Discontinuity Indicator=[%d], Dsm_ContentID=[%d]\n",
              iPostDiscontinuityIndicator, iContentId);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t STC_Reference=[0x%02x 0x%02x 0x%02x 0x%02x 0x%02x]\n", aSTCReference[0],
              aSTCReference[1], aSTCReference[2], aSTCReference[3], aSTCReference[4]);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t NPT_Reference=[0x%02x 0x%02x 0x%02x 0x%02x 0x%02x]\n", aNPTReference[0],
              aNPTReference[1], aNPTReference[2], aNPTReference[3], aNPTReference[4]);
  // The scales are numbers: printed in decimal under their usual labels.
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t Scale Numerator=[%d], Scale Denominator=[%d]\n", iScaleNumerator,
              iScaleDenominator);
}
