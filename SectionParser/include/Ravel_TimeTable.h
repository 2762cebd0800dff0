// What the TDT and the TOT share: the 3-byte short section header and the
// 40-bit time that follows it (16-bit MJD, then hour, minute and second in
// BCD), kept as broadcast. Both classes hold the same leading members; these
// helpers fill them so that each class keeps only what is its own.
#ifndef RAVEL_TIMETABLE_H
#define RAVEL_TIMETABLE_H

#include "Ravel_ByteOrder.h"
#include "Ravel_CDateCode.h"
#include "Ravel_PGL.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

class RavelCReadWindow;

template <class TimeTable>
void RavelTimeTable_Clear(TimeTable& table) {
  table.iTableId = 0;
  table.bSectionSyntaxIndicator = 0;
  table.iSectionLength = 0;
  table.iYear = 0;
  table.iMonth = 0;
  table.iDay = 0;
  table.iHour = 0;
  table.iMinute = 0;
  table.iSecond = 0;
}

// Null clears the fields and gives -9. A foreign table_id is stored, traced
// ("Table ID isn't for <name>! ..." at error level, from `sourcePath`) and
// gives -8 with the other fields as they were. Otherwise the name is set and
// the header and time are read: 0. They are read through `Window`, the read
// window of the section (RavelCReadWindow, named at instantiation so that this
// header does without its declaration): a short section reads zeros there.
template <class TimeTable, class Window = RavelCReadWindow>
int RavelTimeTable_ParseHeaderAndTime(TimeTable& table, unsigned char* section, unsigned char tableId,
                                      const char* name, const char* sourcePath) {
  if (section == 0) {
    RavelTimeTable_Clear(table);
    return kRavelErrNullSection;
  }
  table.iTableId = Window::Read8(section);
  if (table.iTableId != tableId) {
    gszRavelDbgFilePath = sourcePath;
    gRavelDbgLineNum = __LINE__;
    RavelPGL_TraceOut(RAVEL_PARSER_ERROR, "Table ID isn't for %s! Table ID=[0x%02x]\n", name, table.iTableId);
    return kRavelErrInvalidArgument;
  }
  table.SetTableName(name);
  table.bSectionSyntaxIndicator = Window::Read8(section + 1) >> 7;  // x.......
  table.iSectionLength = Window::Read12(section + 1);             // ....xxxx xxxxxxxx
  RavelDateCode_DecodeMJD(Window::Read16(section + 3), table.iYear, table.iMonth, table.iDay);
  table.iHour = RavelBcd(Window::Read8(section + 5));
  table.iMinute = RavelBcd(Window::Read8(section + 6));
  table.iSecond = RavelBcd(Window::Read8(section + 7));
  return kRavelOk;
}

#endif
