// Service descriptor (tag 0x48, ARIB STD-B10 / ABNT NBR 15603-2, service_descriptor):
//   service_type 8 | service_provider_name_length 8 | provider name bytes
//   service_name_length 8 | service name bytes
#ifndef RAVEL_CDESCRIPTORSERVICE_H
#define RAVEL_CDESCRIPTORSERVICE_H

#include "Ravel_CDescriptorBase.h"

class RavelCServiceDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCServiceDescriptor(unsigned char* raw);
  // Copies carry the header and the service type only: both names end up null.
  RavelCServiceDescriptor(RavelCServiceDescriptor& other);
  RavelCServiceDescriptor& operator=(RavelCServiceDescriptor& other);
  virtual ~RavelCServiceDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned char GetServiceType() const { return iServiceType; }
  // Broadcast text as received, or null when the name is empty.
  const char* GetServiceProviderName() const { return pServiceProviderName; }
  const char* GetServiceName() const { return pServiceName; }

  unsigned char iServiceType = 0;
  char* pServiceProviderName = 0;  // malloc'd, NUL-terminated; null for a zero count
  char* pServiceName = 0;          // malloc'd, NUL-terminated; null for a zero count

 private:
  void Release();
};

#endif
