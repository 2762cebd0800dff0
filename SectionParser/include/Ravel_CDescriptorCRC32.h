// CRC32 descriptor (tag 0x05) of a DII module info, ARIB STD-B24 Vol. 3 /
// ABNT NBR 15606-3 data carousel:
//   CRC_32 32, kept as its four bytes in broadcast order
#ifndef RAVEL_CDESCRIPTORCRC32_H
#define RAVEL_CDESCRIPTORCRC32_H

#include "Ravel_CDescriptorBase.h"

class RavelCCRC32Descriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCCRC32Descriptor(unsigned char* raw);
  RavelCCRC32Descriptor(RavelCCRC32Descriptor& other);
  RavelCCRC32Descriptor& operator=(RavelCCRC32Descriptor& other);
  virtual ~RavelCCRC32Descriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  // The four CRC bytes, most significant first.
  const unsigned char* GetCRC32() const { return aCRC32; }

  unsigned char aCRC32[4] = {};
};

#endif
