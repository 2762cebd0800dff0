// Local time offset descriptor (tag 0x58, ARIB STD-B10, ABNT NBR 15603-2),
// a loop of 13-byte entries:
//   country_code                 24
//   country_region_id             6   // xxxxxx..
//   reserved                      1   // ......x.
//   local_time_offset_polarity    1   // .......x
//   local_time_offset            16   (hours, minutes: BCD)
//   time_of_change               40   (16-bit MJD, then hour, minute, second: BCD)
//   next_time_offset             16   (hours, minutes: BCD)
//
// The country code record of the country availability descriptor lives here too.
#ifndef RAVEL_CDESCRIPTORLOCALTIMEOFFSET_H
#define RAVEL_CDESCRIPTORLOCALTIMEOFFSET_H

#include "Ravel_CArray.h"
#include "Ravel_CDateTime.h"
#include "Ravel_CDescriptorBase.h"

// A 3-letter country code (ISO 3166) kept as a C string.
class RavelCCountryCode {
 public:
  // Copies `code` only when it is not null and exactly 3 characters long;
  // otherwise the code stays "".
  explicit RavelCCountryCode(const char* code);

  const char* toString() const { return szCountryCode; }
  const char* GetCountryCode() const { return szCountryCode; }

  char szCountryCode[4] = {};
};

// One entry of the loop.
class RavelCLocalTimeOffset {
 public:
  RavelCLocalTimeOffset();
  // Zeroed, then parsed from the entry's first byte (null leaves it zeroed).
  explicit RavelCLocalTimeOffset(unsigned char* raw);
  virtual ~RavelCLocalTimeOffset();

  // Null clears every field and gives -8.
  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  const char* GetCountryCode() const { return szCountryCode; }
  unsigned char GetCountryRegionId() const { return iCountryRegionId; }
  unsigned char GetLocalTimeOffsetPolarity() const { return iLocalTimeOffsetPolarity; }
  int GetLocalTimeOffsetHour() const { return iLocalTimeOffsetHour; }
  int GetLocalTimeOffsetMinute() const { return iLocalTimeOffsetMinute; }
  int GetLocalTimeOffsetSecond() const { return iLocalTimeOffsetSecond; }
  const RavelCDateTime& GetTimeOfChange() const { return cTimeOfChange; }
  int GetNextTimeOffsetHour() const { return iNextTimeOffsetHour; }
  int GetNextTimeOffsetMinute() const { return iNextTimeOffsetMinute; }
  int GetNextTimeOffsetSecond() const { return iNextTimeOffsetSecond; }

  char szCountryCode[4];
  unsigned char iCountryRegionId;          // 6 bits
  unsigned char iLocalTimeOffsetPolarity;  // 1 bit: 0 ahead of UTC, 1 behind
  int iLocalTimeOffsetHour;
  int iLocalTimeOffsetMinute;
  int iLocalTimeOffsetSecond;              // always 0
  // Year to second by the receiver's MJD and BCD rules; the other three fields 0.
  RavelCDateTime cTimeOfChange;
  int iNextTimeOffsetHour;
  int iNextTimeOffsetMinute;
  int iNextTimeOffsetSecond;               // always 0

 private:
  void Clear();
};

class RavelCLocalTimeOffsetDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCLocalTimeOffsetDescriptor(unsigned char* raw);
  RavelCLocalTimeOffsetDescriptor(RavelCLocalTimeOffsetDescriptor& other);
  RavelCLocalTimeOffsetDescriptor& operator=(RavelCLocalTimeOffsetDescriptor& other);
  virtual ~RavelCLocalTimeOffsetDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  int GetNumOfLocalTimeOffsets() const { return aLocalTimeOffsets.iCount; }
  // The entry at `index`; out of range panics through the array and yields null.
  RavelCLocalTimeOffset* GetLocalTimeOffset(int index) { return aLocalTimeOffsets[index]; }
  // The first entry whose country code equals `country` ignoring case, or null.
  RavelCLocalTimeOffset* GetLocalTimeOffset(const char* country);
  // The first entry matching both the country (ignoring case) and the region id, or null.
  RavelCLocalTimeOffset* GetLocalTimeOffset(const char* country, unsigned char regionId);

  RavelCArray<RavelCLocalTimeOffset*> aLocalTimeOffsets;  // owned entries
};

#endif
