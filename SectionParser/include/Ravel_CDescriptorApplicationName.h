// Application name descriptor (tag 0x01 of the AIT application loop; ABNT NBR
// 15606-3 application signalling, after ETSI TS 102 812):
//   { ISO_639_language_code 24 | application_name_length 8 | application_name }
// Only the first language and name are read. The name goes into a fixed 255-byte
// field, which a name of 255 bytes fills without a terminator. The AIT picks this
// class by tag, so the tag is not checked here.
#ifndef RAVEL_CDESCRIPTORAPPLICATIONNAME_H
#define RAVEL_CDESCRIPTORAPPLICATIONNAME_H

#include "Ravel_CDescriptorBase.h"

class RavelCApplicationNameDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCApplicationNameDescriptor(unsigned char* raw);
  RavelCApplicationNameDescriptor(RavelCApplicationNameDescriptor& other);
  RavelCApplicationNameDescriptor& operator=(RavelCApplicationNameDescriptor& other);
  virtual ~RavelCApplicationNameDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  const char* GetISOLanguageCode() const { return szISOLanguageCode; }
  // The field itself: it is not terminated when the name fills all 255 bytes.
  const char* GetApplicationName() const { return szApplicationName; }

  char szISOLanguageCode[4];
  char szApplicationName[255];

 private:
  void Clear();
};

#endif
