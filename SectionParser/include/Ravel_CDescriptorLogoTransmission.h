// Logo transmission descriptor (tag 0xCF, ARIB STD-B10 / ABNT NBR 15603-2,
// logo_transmission_descriptor):
//   logo_transmission_type 8
//   type 1: reserved 7 | logo_id 9 | reserved 4 | logo_version 12 | download_data_id 16
//   type 2: reserved 7 | logo_id 9
//   type 3: logo_char ... (the rest of the descriptor)
#ifndef RAVEL_CDESCRIPTORLOGOTRANSMISSION_H
#define RAVEL_CDESCRIPTORLOGOTRANSMISSION_H

#include "Ravel_CDescriptorBase.h"

class RavelCLogoTransmissionDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCLogoTransmissionDescriptor(unsigned char* raw);
  RavelCLogoTransmissionDescriptor(RavelCLogoTransmissionDescriptor& other);
  RavelCLogoTransmissionDescriptor& operator=(RavelCLogoTransmissionDescriptor& other);
  virtual ~RavelCLogoTransmissionDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned char GetLogoTransmissionType() const { return iLogoTransmissionType; }
  unsigned short GetLogoId() const { return iLogoId; }
  unsigned short GetLogoVersion() const { return iLogoVersion; }
  unsigned short GetDownloadDataId() const { return iDownloadDataId; }
  // Type 3 only (null otherwise): GetLogoCharactersLength() characters of broadcast text.
  const char* GetLogoCharacters() const { return pLogoCharacters; }
  int GetLogoCharactersLength() const;

  unsigned char iLogoTransmissionType = 0;
  unsigned short iLogoId = 0;          // 9 bits
  unsigned short iLogoVersion = 0;     // 12 bits
  unsigned short iDownloadDataId = 0;
  // malloc'd; holds descriptor_length - 1 characters. The buffer has two bytes
  // more than the characters, both 0, so it can also be used as a C text.
  char* pLogoCharacters = 0;

 private:
  void Release();
};

#endif
