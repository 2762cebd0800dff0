// Program map table (table_id 0x02, ISO/IEC 13818-1 2.4.4.8), after the long
// section header (table id extension = program_number):
//   reserved 3 | PCR_PID 13                              // ---xxxxx xxxxxxxx
//   reserved 4 | program_info_length 12                  // ----xxxx xxxxxxxx
//   program info descriptors (program_info_length bytes)
//   elementary streams, up to the CRC_32:
//     stream_type 8
//     reserved 3 | elementary_PID 13                     // ---xxxxx xxxxxxxx
//     reserved 4 | ES_info_length 12                     // ----xxxx xxxxxxxx
//     ES descriptors (ES_info_length bytes)
//   CRC_32
// Kept descriptors: parental rating (0x55) of the program info loop; CA (0x09,
// its CA_PID only), stream identifier (0x52), target region (0xC6) and data
// component (0xFD) of each stream. Every other descriptor is traced and skipped.
#ifndef RAVEL_CTABLEPMT_H
#define RAVEL_CTABLEPMT_H

#include "Ravel_CArray.h"
#include "Ravel_CDescriptorDataComponent.h"
#include "Ravel_CDescriptorParentalRating.h"
#include "Ravel_CDescriptorStreamIdentifier.h"
#include "Ravel_CDescriptorTargetRegion.h"
#include "Ravel_CTableBase.h"

// One elementary stream of the PMT.
class RavelCMapInfo {
 public:
  // Cleared, then parsed from the entry (null leaves it cleared).
  explicit RavelCMapInfo(unsigned char* entry);
  RavelCMapInfo(RavelCMapInfo& other);
  RavelCMapInfo& operator=(RavelCMapInfo& other);
  virtual ~RavelCMapInfo();

  // Reads one stream entry and its descriptors; null gives -8. A descriptor of
  // length 0 ends the descriptor loop, and the entry still counts as parsed.
  virtual int ParseRawData(unsigned char* entry);
  virtual void Show();

  unsigned char GetStreamType() const { return iStreamType; }
  unsigned short GetElementaryPID() const { return iElementaryPID; }
  unsigned short GetESInfoLength() const { return iESInfoLength; }
  unsigned short GetCAPID() const { return iCAPID; }
  RavelCStreamIdentifierDescriptor* GetStreamIdentifier() { return pStreamIdentifier; }
  RavelCDataComponentDescriptor* GetDataComponent() { return pDataComponent; }
  RavelCTargetRegionDescriptor* GetTargetRegion() { return pTargetRegion; }

  unsigned char iStreamType = 0;
  unsigned short iElementaryPID = 0;  // 13 bits
  unsigned short iESInfoLength = 0;   // 12 bits
  // CA_PID of the last CA descriptor seen since construction; a parse without
  // one leaves it as it was.
  unsigned short iCAPID = 0;
  RavelCStreamIdentifierDescriptor* pStreamIdentifier = 0;  // owned, or null
  RavelCDataComponentDescriptor* pDataComponent = 0;        // owned, or null
  RavelCTargetRegionDescriptor* pTargetRegion = 0;          // owned, or null

 private:
  void DeleteDescriptors();
};

class RavelCPMT : public RavelCTableBase {
 public:
  explicit RavelCPMT(unsigned char* section);
  // Copies the header, name, PCR PID, program info length and every stream; the
  // target keeps its own parental rating descriptor (or none).
  RavelCPMT& operator=(RavelCPMT& other);
  // Appends copies of the other's streams when the versions match; nothing else
  // of the target changes.
  RavelCPMT& operator+=(RavelCPMT& other);
  virtual ~RavelCPMT();

  virtual int ParseRawData(unsigned char* section);
  virtual void Show();

  // Stream selection, by stream_type in list order; 0 when nothing matches.
  // Video: 0x01, 0x02, 0x1B. Audio: 0x04, 0x0F, 0x11. Captions: 0x06.
  unsigned short GetVideoPID();
  // PID of audio stream number `n` (counted from 0).
  unsigned short GetAudioPID(unsigned char n);
  unsigned char GetAudioPIDCount();
  unsigned short GetCCPID();

  unsigned short GetPCRPID() const { return iPCRPID; }
  unsigned short GetProgramInfoLength() const { return iProgramInfoLength; }
  int GetMapInfoCount() const { return aMapInfoList.iCount; }
  // The stream at `index` of the list (bounds-checked by the array).
  RavelCMapInfo* GetMapInfo(int index) { return aMapInfoList[index]; }
  RavelCParentalRatingDescriptor* GetParentalRating() { return pParentalRating; }

  unsigned short iPCRPID = 0;             // 13 bits
  unsigned short iProgramInfoLength = 0;  // 12 bits
  RavelCArray<RavelCMapInfo*> aMapInfoList;  // the streams in section order, owned
  RavelCParentalRatingDescriptor* pParentalRating = 0;  // owned, or null

 private:
  // The PMT has no copy constructor, only the assignment.
  RavelCPMT(const RavelCPMT&);

  void DeleteStreams();
  void DeleteParentalRating();
  // Index of the n-th stream (from 0) whose type `matches`, or -1.
  int FindStream(bool (*matches)(unsigned char streamType), int n);
  // Number of matching streams among those the selection walk visits.
  int CountStreams(bool (*matches)(unsigned char streamType));
};

#endif
