// Time and date table (table_id 0x70, ARIB STD-B10, ABNT NBR 15603-2), a short
// section without CRC_32:
//   table_id                    8
//   section_syntax_indicator    1   // x.......
//   reserved_future_use, reserved 3 // .xxx....
//   section_length             12   // ....xxxx xxxxxxxx
//   JST_time / UTC_time        40   (16-bit MJD, then hour, minute, second: BCD)
#ifndef RAVEL_CTABLETDT_H
#define RAVEL_CTABLETDT_H

#include "Ravel_CString.h"

class RavelCTDT {
 public:
  // Every field starts at 0 and the name empty, then the section is parsed.
  explicit RavelCTDT(unsigned char* section);
  virtual ~RavelCTDT();

  // Null clears the fields and gives -9; a foreign table_id is stored and gives
  // -8 with the other fields as they were. The time is kept as broadcast.
  virtual int ParseRawData(unsigned char* section);
  virtual void Show();

  int SetTableName(const RavelCString& name);
  int SetTableName(const char* name);

  RavelCString sTableName;  // "TDT" once a TDT has been parsed
  unsigned char iTableId = 0;
  unsigned char bSectionSyntaxIndicator = 0;
  unsigned short iSectionLength = 0;  // 12 bits
  // Date by the receiver's MJD rule (the first of a month is day 31 or 32 of the
  // month before), time by the BCD rule.
  int iYear = 0;
  int iMonth = 0;
  int iDay = 0;
  int iHour = 0;
  int iMinute = 0;
  int iSecond = 0;
};

#endif
