// Series descriptor (tag 0xD5, ARIB STD-B10):
//   series_id                16
//   repeat_label              4   // xxxx....
//   program_pattern           3   // ....xxx.
//   expire_date_valid_flag    1   // .......x
//   expire_date              16   (MJD, kept raw)
//   episode_number           12
//   last_episode_number      12
//   series_name_char         descriptor_length - 8 bytes
#ifndef RAVEL_CDESCRIPTORSERIES_H
#define RAVEL_CDESCRIPTORSERIES_H

#include "Ravel_CDescriptorBase.h"

class RavelCSeriesDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCSeriesDescriptor(unsigned char* raw);
  RavelCSeriesDescriptor(RavelCSeriesDescriptor& other);
  RavelCSeriesDescriptor& operator=(RavelCSeriesDescriptor& other);
  virtual ~RavelCSeriesDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned short GetSeriesId() const { return iSeriesId; }
  unsigned char GetRepeatLabel() const { return iRepeatLabel; }
  unsigned char GetProgramPattern() const { return iProgramPattern; }
  unsigned char GetExpireDateValidFlag() const { return iExpireDateValidFlag; }
  unsigned short GetExpireDate() const { return iExpireDate; }
  unsigned short GetEpisodeNumber() const { return iEpisodeNumber; }
  unsigned short GetLastEpisodeNumber() const { return iLastEpisodeNumber; }
  // Null when the descriptor carries no name (length below 9).
  const char* GetSeriesName() const { return pSeriesName; }

  unsigned short iSeriesId = 0;
  unsigned char iRepeatLabel = 0;
  unsigned char iProgramPattern = 0;
  unsigned char iExpireDateValidFlag = 0;
  unsigned short iExpireDate = 0;
  unsigned short iEpisodeNumber = 0;      // 12 bits
  unsigned short iLastEpisodeNumber = 0;  // 12 bits
  char* pSeriesName = 0;                  // malloc'd, length - 7 bytes with the closing 0

 private:
  void Release();
};

#endif
