// Network name descriptor (tag 0x40, ARIB STD-B10 6.2.11):
//   network_name: descriptor_length bytes of broadcast text
#ifndef RAVEL_CDESCRIPTORNETWORKNAME_H
#define RAVEL_CDESCRIPTORNETWORKNAME_H

#include "Ravel_CDescriptorBase.h"

class RavelCNetworkNameDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCNetworkNameDescriptor(unsigned char* raw);
  RavelCNetworkNameDescriptor(RavelCNetworkNameDescriptor& other);
  RavelCNetworkNameDescriptor& operator=(RavelCNetworkNameDescriptor& other);
  virtual ~RavelCNetworkNameDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  const char* GetNetworkName() const { return sNetworkName.GetString(); }

  RavelCString sNetworkName;
};

#endif
