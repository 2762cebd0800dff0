// Location descriptor (tag 0x06) of a DII module info, ARIB STD-B24 Vol. 3 /
// ABNT NBR 15606-3 data carousel:
//   location_tag 8 (component tag of the stream that carries the module)
#ifndef RAVEL_CDESCRIPTORLOCATION_H
#define RAVEL_CDESCRIPTORLOCATION_H

#include "Ravel_CDescriptorBase.h"

class RavelCLocationDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCLocationDescriptor(unsigned char* raw);
  RavelCLocationDescriptor(RavelCLocationDescriptor& other);
  RavelCLocationDescriptor& operator=(RavelCLocationDescriptor& other);
  virtual ~RavelCLocationDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned char GetLocationTag() const { return iLocationTag; }

  unsigned char iLocationTag = 0;
};

#endif
