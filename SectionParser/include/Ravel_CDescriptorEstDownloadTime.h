// Estimated download time descriptor (tag 0x07) of a DII module info,
// ARIB STD-B24 Vol. 3 / ABNT NBR 15606-3 data carousel:
//   est_download_time 32 (seconds, kept as broadcast)
#ifndef RAVEL_CDESCRIPTORESTDOWNLOADTIME_H
#define RAVEL_CDESCRIPTORESTDOWNLOADTIME_H

#include "Ravel_CDescriptorBase.h"

class RavelCEstDownloadTimeDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCEstDownloadTimeDescriptor(unsigned char* raw);
  RavelCEstDownloadTimeDescriptor(RavelCEstDownloadTimeDescriptor& other);
  RavelCEstDownloadTimeDescriptor& operator=(RavelCEstDownloadTimeDescriptor& other);
  virtual ~RavelCEstDownloadTimeDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned int GetEstDownloadTime() const { return iEstDownloadTime; }

  unsigned int iEstDownloadTime = 0;
};

#endif
