// Time offset table (table_id 0x73, ARIB STD-B10, ABNT NBR 15603-2), a short
// section:
//   table_id                    8
//   section_syntax_indicator    1   // x.......
//   reserved_future_use, reserved 3 // .xxx....
//   section_length             12   // ....xxxx xxxxxxxx
//   JST_time / UTC_time        40   (16-bit MJD, then hour, minute, second: BCD)
//   reserved                    4   // xxxx....
//   descriptors_loop_length    12   // ....xxxx xxxxxxxx
//   descriptors                     (the local time offset descriptor is kept)
//   CRC_32                     32   (not checked)
#ifndef RAVEL_CTABLETOT_H
#define RAVEL_CTABLETOT_H

#include "Ravel_CString.h"

class RavelCLocalTimeOffsetDescriptor;

class RavelCTOT {
 public:
  explicit RavelCTOT(unsigned char* section);
  RavelCTOT(RavelCTOT& other);
  // Drops this table's descriptor first, so assigning a table to itself leaves
  // it without one.
  RavelCTOT& operator=(RavelCTOT& other);
  virtual ~RavelCTOT();

  // Null clears the fields and gives -9; a foreign table_id is stored and gives
  // -8 with the other fields as they were. The time is kept as broadcast: the
  // offset of the local time offset descriptor is not applied.
  virtual int ParseRawData(unsigned char* section);
  virtual void Show();

  int SetTableName(const RavelCString& name);
  int SetTableName(const char* name);

  RavelCString sTableName;  // "TOT" once a TOT has been parsed
  unsigned char iTableId;
  unsigned char bSectionSyntaxIndicator;
  unsigned short iSectionLength;  // 12 bits
  // Date by the receiver's MJD rule (the first of a month is day 31 or 32 of the
  // month before), time by the BCD rule.
  int iYear;
  int iMonth;
  int iDay;
  int iHour;
  int iMinute;
  int iSecond;
  unsigned short iDescriptorsLoopLength;  // 12 bits
  // The last local time offset descriptor (0x58) of the loop, or null. Owned.
  RavelCLocalTimeOffsetDescriptor* pLocalTimeOffsetDescriptor = 0;

 private:
  void ClearFields();
};

#endif
