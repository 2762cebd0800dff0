// Linkage descriptor (tag 0x4A, ARIB STD-B10 / ABNT NBR 15603-2, linkage_descriptor):
//   transport_stream_id 16 | original_network_id 16 | service_id 16 | linkage_type 8
//   private_data_byte ... (ignored)
#ifndef RAVEL_CDESCRIPTORLINKAGE_H
#define RAVEL_CDESCRIPTORLINKAGE_H

#include "Ravel_CDescriptorBase.h"

class RavelCLinkageDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCLinkageDescriptor(unsigned char* raw);
  RavelCLinkageDescriptor(RavelCLinkageDescriptor& other);
  RavelCLinkageDescriptor& operator=(RavelCLinkageDescriptor& other);
  virtual ~RavelCLinkageDescriptor();

  // A refused descriptor (null or foreign tag) zeroes all four fields.
  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned short GetTransportStreamId() const { return iTransportStreamId; }
  unsigned short GetOriginalNetworkId() const { return iOriginalNetworkId; }
  unsigned short GetServiceId() const { return iServiceId; }
  unsigned char GetLinkageType() const { return iLinkageType; }

  unsigned short iTransportStreamId = 0;
  unsigned short iOriginalNetworkId = 0;
  unsigned short iServiceId = 0;
  unsigned char iLinkageType = 0;
};

#endif
