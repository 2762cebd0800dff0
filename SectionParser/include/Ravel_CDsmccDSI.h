// DownloadServerInitiate, ISO/IEC 13818-6 7.3.6, after the message header:
//   serverId 20 bytes (a RavelCNASP) | compatibilityDescriptor (assumed empty: 2 bytes)
//   privateDataLength 16 | privateDataByte
#ifndef RAVEL_CDSMCCDSI_H
#define RAVEL_CDSMCCDSI_H

#include "Ravel_CDsmccMsgBase.h"
#include "Ravel_CNASP.h"

class RavelCDsmccDSI : public RavelCDsmccBase {
 public:
  // Building the server id empty first traces "NASP Input Data is NULL!\n" once.
  explicit RavelCDsmccDSI(unsigned char* data);
  virtual ~RavelCDsmccDSI();

  virtual int ParseRawData(unsigned char* data);
  virtual void Show();

  RavelCNASP& GetNASP() { return cNASP; }
  int GetPrivateDataLength() const { return iPrivateDataLength; }
  // Points into the caller's buffer: valid only while that buffer lives.
  unsigned char* GetPrivateData() const { return pPrivateData; }

  RavelCNASP cNASP;
  int iPrivateDataLength = 0;
  unsigned char* pPrivateData = 0;
};

#endif
