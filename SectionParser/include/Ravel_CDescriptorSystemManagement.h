// System management descriptor (tag 0xFE, ARIB STD-B10 / ABNT NBR 15603-2,
// system_management_descriptor):
//   system_management_id 16 (broadcasting_flag 2 | broadcasting_identifier 6 |
//   additional_broadcasting_identification 8) | additional_identification_info ... (ignored)
// Both the flag and the identifier are taken from the low bits of the first byte.
#ifndef RAVEL_CDESCRIPTORSYSTEMMANAGEMENT_H
#define RAVEL_CDESCRIPTORSYSTEMMANAGEMENT_H

#include "Ravel_CDescriptorBase.h"

class RavelCSystemManagementDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCSystemManagementDescriptor(unsigned char* raw);
  RavelCSystemManagementDescriptor(RavelCSystemManagementDescriptor& other);
  RavelCSystemManagementDescriptor& operator=(RavelCSystemManagementDescriptor& other);
  virtual ~RavelCSystemManagementDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned char GetBroadcastingFlag() const { return iBroadcastingFlag; }
  unsigned char GetBroadcastingIdentifier() const { return iBroadcastingIdentifier; }
  unsigned char GetAdditionalBroadcastingIdentification() const { return iAdditionalBroadcastingIdentification; }

  unsigned char iBroadcastingFlag = 0;
  unsigned char iBroadcastingIdentifier = 0;
  unsigned char iAdditionalBroadcastingIdentification = 0;
};

#endif
