// Ginga application descriptor (tag 0x06 of the AIT application loop; ABNT NBR
// 15606-3):
//   { parameter_length 8 | parameter_byte ... }
// The parameters are not decoded: the parse only names the descriptor, and the
// parameter field stays as it was (cleared by construction and by a null parse).
// The AIT picks this class by tag, so the tag is not checked here.
#ifndef RAVEL_CDESCRIPTORGINGAAPP_H
#define RAVEL_CDESCRIPTORGINGAAPP_H

#include "Ravel_CDescriptorBase.h"

class RavelCGingaAppDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCGingaAppDescriptor(unsigned char* raw);
  RavelCGingaAppDescriptor(RavelCGingaAppDescriptor& other);
  RavelCGingaAppDescriptor& operator=(RavelCGingaAppDescriptor& other);
  virtual ~RavelCGingaAppDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  // The field itself: it is not terminated when all 255 bytes are set.
  const char* GetParameter() const { return szParameter; }

  char szParameter[255] = {};
};

#endif
