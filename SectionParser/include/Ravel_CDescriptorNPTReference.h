// NPT reference descriptor (tag 0x17) of a DSM-CC stream descriptor section,
// ISO/IEC 13818-6 8.1.1:
//   postDiscontinuityIndicator 1 | contentId 7 | reserved 7 | STC_Reference 33
//   reserved 31 | NPT_Reference 33 | scaleNumerator 16 | scaleDenominator 16
// The two 33-bit references are kept as five bytes each (bit 32 alone in the
// first byte), never combined into a number.
#ifndef RAVEL_CDESCRIPTORNPTREFERENCE_H
#define RAVEL_CDESCRIPTORNPTREFERENCE_H

#include "Ravel_CDescriptorBase.h"

class RavelCNPTReferenceDescriptor : public RavelCDescriptorBase {
 public:
  // A null descriptor is refused with "Invalid Argument!\n".
  static const RavelCDescriptorKind kKind;

  explicit RavelCNPTReferenceDescriptor(unsigned char* raw);
  RavelCNPTReferenceDescriptor(RavelCNPTReferenceDescriptor& other);
  RavelCNPTReferenceDescriptor& operator=(RavelCNPTReferenceDescriptor& other);
  virtual ~RavelCNPTReferenceDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned char GetPostDiscontinuityIndicator() const { return iPostDiscontinuityIndicator; }
  unsigned char GetContentId() const { return iContentId; }
  const unsigned char* GetSTCReference() const { return aSTCReference; }
  const unsigned char* GetNPTReference() const { return aNPTReference; }
  unsigned short GetScaleNumerator() const { return iScaleNumerator; }
  unsigned short GetScaleDenominator() const { return iScaleDenominator; }

  unsigned char iPostDiscontinuityIndicator;
  unsigned char iContentId;
  unsigned char aSTCReference[5];
  unsigned char aNPTReference[5];
  unsigned short iScaleNumerator;
  unsigned short iScaleDenominator;
};

#endif
