// Compression type descriptor (tag 0xC2) of a DII module info, ARIB STD-B24
// Vol. 3 / ABNT NBR 15606-3 data carousel:
//   compression_type 8 | original_size 32
#ifndef RAVEL_CDESCRIPTORCOMPRESSIONTYPE_H
#define RAVEL_CDESCRIPTORCOMPRESSIONTYPE_H

#include "Ravel_CDescriptorBase.h"

class RavelCCompressionTypeDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCCompressionTypeDescriptor(unsigned char* raw);
  RavelCCompressionTypeDescriptor(RavelCCompressionTypeDescriptor& other);
  RavelCCompressionTypeDescriptor& operator=(RavelCCompressionTypeDescriptor& other);
  virtual ~RavelCCompressionTypeDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned char GetCompressionType() const { return iCompressionType; }
  // Size of the module once decompressed.
  unsigned int GetOriginalSize() const { return iOriginalSize; }

  unsigned char iCompressionType = 0;
  unsigned int iOriginalSize = 0;
};

#endif
