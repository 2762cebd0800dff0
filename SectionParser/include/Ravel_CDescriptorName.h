// Name descriptor (tag 0x02) of a DII module info, ARIB STD-B24 Vol. 3 /
// ABNT NBR 15606-3 data carousel:
//   text_char: descriptor_length bytes, the file name of the module
#ifndef RAVEL_CDESCRIPTORNAME_H
#define RAVEL_CDESCRIPTORNAME_H

#include "Ravel_CDescriptorBase.h"

class RavelCNameDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCNameDescriptor(unsigned char* raw);
  RavelCNameDescriptor(RavelCNameDescriptor& other);
  RavelCNameDescriptor& operator=(RavelCNameDescriptor& other);
  virtual ~RavelCNameDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  const char* GetFileName() const { return sFileName.GetString(); }

  RavelCString sFileName;
};

#endif
