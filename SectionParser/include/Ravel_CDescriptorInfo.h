// Info descriptor (tag 0x03) of a DII module info, ARIB STD-B24 Vol. 3 /
// ABNT NBR 15606-3 data carousel:
//   ISO_639_language_code 24 | text_char: descriptor_length - 3 bytes
#ifndef RAVEL_CDESCRIPTORINFO_H
#define RAVEL_CDESCRIPTORINFO_H

#include "Ravel_CDescriptorBase.h"

class RavelCInfoDescriptor : public RavelCDescriptorBase {
 public:
  // Its wrong-tag message goes out at 0x40000001, with the common utility module bit.
  static const RavelCDescriptorKind kKind;

  explicit RavelCInfoDescriptor(unsigned char* raw);
  RavelCInfoDescriptor(RavelCInfoDescriptor& other);
  RavelCInfoDescriptor& operator=(RavelCInfoDescriptor& other);
  virtual ~RavelCInfoDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  const char* GetLanguageCode() const { return szLanguageCode; }
  // Null until a parse succeeds.
  const char* GetText() const { return pText; }

  char szLanguageCode[4] = {};
  // new[] buffer: the text bytes followed by two 0 bytes.
  char* pText = 0;

 private:
  void ReleaseText();
};

#endif
