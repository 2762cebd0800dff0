// Component descriptor (tag 0x50, ARIB STD-B10, ABNT NBR 15603-2):
//   reserved_future_use       4   // xxxx....
//   stream_content            4   // ....xxxx
//   component_type            8
//   component_tag             8
//   ISO_639_language_code    24   (kept as one integer, letters big-endian)
//   text_char                 (not read)
#ifndef RAVEL_CDESCRIPTORCOMPONENT_H
#define RAVEL_CDESCRIPTORCOMPONENT_H

#include "Ravel_CDescriptorBase.h"

class RavelCComponentDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCComponentDescriptor(unsigned char* raw);
  RavelCComponentDescriptor(RavelCComponentDescriptor& other);
  RavelCComponentDescriptor& operator=(RavelCComponentDescriptor& other);
  virtual ~RavelCComponentDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned char GetStreamContent() const { return iStreamContent; }
  unsigned char GetComponentType() const { return iComponentType; }
  unsigned char GetComponentTag() const { return iComponentTag; }
  unsigned int GetISO639LanguageCode() const { return iISO639LanguageCode; }

  unsigned char iStreamContent = 0;  // 4 bits
  unsigned char iComponentType = 0;
  unsigned char iComponentTag = 0;
  unsigned int iISO639LanguageCode = 0;  // 24 bits: 'p','o','r' gives 0x00706F72

 private:
  void Clear();
};

#endif
