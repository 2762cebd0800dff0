// Application descriptor (tag 0x00 of the AIT application loop; ABNT NBR 15606-3
// application signalling, after ETSI TS 102 812):
//   application_profiles_length 8
//   application_profile 16 | version.major 8 | version.minor 8 | version.micro 8
//   service_bound_flag 1 | visibility 2 | reserved 5        // bvvxxxxx
//   application_priority 8 | transport_protocol_label 8
// Only the first profile and the first transport protocol label are read: the
// fields after the first profile are taken from the bytes that follow it,
// whatever the profiles length says. The AIT picks this class by tag, so the
// tag is not checked here.
#ifndef RAVEL_CDESCRIPTORAPPLICATION_H
#define RAVEL_CDESCRIPTORAPPLICATION_H

#include "Ravel_CDescriptorBase.h"

class RavelCApplicationDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCApplicationDescriptor(unsigned char* raw);
  RavelCApplicationDescriptor(RavelCApplicationDescriptor& other);
  RavelCApplicationDescriptor& operator=(RavelCApplicationDescriptor& other);
  virtual ~RavelCApplicationDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  int GetApplicationProfile() const { return iApplicationProfile; }
  unsigned char GetVersionMajor() const { return iVersionMajor; }
  unsigned char GetVersionMinor() const { return iVersionMinor; }
  unsigned char GetVersionMicro() const { return iVersionMicro; }
  unsigned char GetServiceBoundFlag() const { return bServiceBoundFlag; }
  int GetVisibility() const { return iVisibility; }
  unsigned char GetAppPriority() const { return iAppPriority; }
  unsigned char GetAppTransportLabel() const { return iAppTransportLabel; }

  int iApplicationProfile;  // 16 bits
  unsigned char iVersionMajor;
  unsigned char iVersionMinor;
  unsigned char iVersionMicro;
  unsigned char bServiceBoundFlag;  // 1 bit
  int iVisibility;                  // 2 bits
  unsigned char iAppPriority;
  unsigned char iAppTransportLabel;

 private:
  void Clear();
};

#endif
