// Stream identifier descriptor (tag 0x52, ARIB STD-B10 / ABNT NBR 15603-2,
// stream_identifier_descriptor):
//   component_tag 8
#ifndef RAVEL_CDESCRIPTORSTREAMIDENTIFIER_H
#define RAVEL_CDESCRIPTORSTREAMIDENTIFIER_H

#include "Ravel_CDescriptorBase.h"

class RavelCStreamIdentifierDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCStreamIdentifierDescriptor(unsigned char* raw);
  RavelCStreamIdentifierDescriptor(RavelCStreamIdentifierDescriptor& other);
  RavelCStreamIdentifierDescriptor& operator=(RavelCStreamIdentifierDescriptor& other);
  virtual ~RavelCStreamIdentifierDescriptor();

  // A refused descriptor (null or foreign tag) zeroes the component tag.
  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned char GetComponentTag() const { return iComponentTag; }

  unsigned char iComponentTag = 0;
};

#endif
