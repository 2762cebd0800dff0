// Service list descriptor (tag 0x41, ARIB STD-B10 / ABNT NBR 15603-2, service_list_descriptor):
//   { service_id 16 | service_type 8 } repeated descriptor_length / 3 times
#ifndef RAVEL_CDESCRIPTORSERVICELIST_H
#define RAVEL_CDESCRIPTORSERVICELIST_H

#include "Ravel_CDescriptorBase.h"

class RavelCServiceListDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCServiceListDescriptor(unsigned char* raw);
  RavelCServiceListDescriptor(RavelCServiceListDescriptor& other);
  RavelCServiceListDescriptor& operator=(RavelCServiceListDescriptor& other);
  virtual ~RavelCServiceListDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  int GetServiceCount() const { return iServiceCount; }
  // 1 with both outputs set for 0 <= index < count; otherwise a trace, both 0, and 0.
  int GetServiceInfo(int index, unsigned short& serviceId, unsigned short& serviceType);

  unsigned short* pServiceIds = 0;   // iServiceCount entries (new[]), null when empty
  unsigned char* pServiceTypes = 0;  // iServiceCount entries (new[]), null when empty
  int iServiceCount = 0;             // descriptor_length / 3; a trailing 1 or 2 bytes are ignored

 private:
  void Release();
};

#endif
