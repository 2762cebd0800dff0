// Type descriptor (tag 0x01) of a DII module info, ARIB STD-B24 Vol. 3 /
// ABNT NBR 15606-3 data carousel:
//   text_char: descriptor_length bytes, the media type of the module
#ifndef RAVEL_CDESCRIPTORTYPE_H
#define RAVEL_CDESCRIPTORTYPE_H

#include "Ravel_CDescriptorBase.h"

class RavelCTypeDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCTypeDescriptor(unsigned char* raw);
  RavelCTypeDescriptor(RavelCTypeDescriptor& other);
  RavelCTypeDescriptor& operator=(RavelCTypeDescriptor& other);
  virtual ~RavelCTypeDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  const char* GetType() const { return sType.GetString(); }

  RavelCString sType;
};

#endif
