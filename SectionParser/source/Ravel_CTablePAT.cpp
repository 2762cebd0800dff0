#include "Ravel_CTablePAT.h"

#include "Ravel_ByteOrder.h"
#include "Ravel_CBitInputStream.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"
#include "Ravel_RecordList.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CTablePAT");

namespace {

const unsigned char kPATTableId = 0x00;
// Below this section_length the body is not walked. The loop reads an entry
// before it tests its end, so 10 to 12 still read one whose last bytes are CRC.
const unsigned short kMinSectionLengthWithEntries = 10;
// PMT PIDs of one-segment services (ABNT NBR 15603-2 / ARIB TR-B14).
const unsigned short kOneSegPMTPIDFirst = 0x1FC8;
const unsigned short kOneSegPMTPIDLast = 0x1FCF;

}  // namespace

bool RavelPAT_IsOneSegPMTPID(unsigned short pid) { return pid >= kOneSegPMTPIDFirst && pid <= kOneSegPMTPIDLast; }

// ---------------------------------------------------------------------------
// RavelCPMTInfo

RavelCPMTInfo::RavelCPMTInfo(unsigned char* entry) { ParseRawData(entry); }

RavelCPMTInfo::~RavelCPMTInfo() {}

int RavelCPMTInfo::ParseRawData(unsigned char* entry) {
  if (entry == 0) {
    iProgramNumber = 0;
    iPID = 0;
    return kRavelErrInvalidArgument;
  }
  RavelCBitInputStream reader(entry, 4, 0);
  unsigned char status = 0;
  iProgramNumber = reader.ReadShort(16, status);
  reader.Skip(3);
  iPID = reader.ReadShort(13, status);
  return kRavelOk;
}

void RavelCPMTInfo::Show() {
  // The entry's own dump goes out at warning level, unlike the table's lines.
  RAVEL_TRACE(RAVEL_PARSER_WARNING, "Program Number=[%d], PID=[%d]\n", iProgramNumber, iPID);
}

// ---------------------------------------------------------------------------
// RavelCPAT

RavelCPAT::RavelCPAT(unsigned char* section) : RavelCTableBase(0), aProgramList(), iNetworkPID(0xFFFF) {
  ParseRawData(section);
}

RavelCPAT::RavelCPAT(RavelCPAT& other) : RavelCTableBase(0), aProgramList(), iNetworkPID(0xFFFF) {
  *this = other;
}

RavelCPAT& RavelCPAT::operator=(RavelCPAT& other) {
  CopyHeader(other);
  iNetworkPID = other.iNetworkPID;
  // The target's programs go first, so assigning a table to itself empties it.
  DeletePrograms();
  RavelRecordList_AppendCopies(aProgramList, other.aProgramList);
  return *this;
}

RavelCPAT::~RavelCPAT() { DeletePrograms(); }

void RavelCPAT::DeletePrograms() { RavelRecordList_DeleteAll(aProgramList); }

// Before the first program with a greater program_number, so equal numbers keep
// their order of arrival.
void RavelCPAT::InsertInProgramOrder(RavelCPMTInfo* program) {
  for (int i = 0; i < aProgramList.iCount; ++i) {
    if (aProgramList.ipArray[i]->iProgramNumber > program->iProgramNumber) {
      aProgramList.Insert(program, i);
      return;
    }
  }
  aProgramList.Append(program);
}

int RavelCPAT::ParseRawData(unsigned char* section) {
  RavelCReadWindow window(section);
  // iNetworkPID survives a re-parse: a section without program_number 0 keeps it.
  DeletePrograms();
  if (section == 0) return kRavelErrInvalidArgument;
  int result = CheckCrcAndParseHeader(section, kRavelTraceSourcePath, __LINE__, "PAT Section: CRC Error!\n");
  if (result != kRavelOk) return result;
  if (iTableId != kPATTableId) {
    // Decimal here, unlike the other tables' messages.
    RAVEL_TRACE(RAVEL_PARSER_ERROR, "Table ID isn't for PAT! Table ID=[%d]\n", iTableId);
    return kRavelErrInvalidArgument;
  }
  SetTableName("PAT");
  if (iSectionLength < kMinSectionLengthWithEntries) return kRavelOk;

  RavelCPMTInfo* heldBack = 0;
  int end = iSectionLength - 1;  // the first CRC_32 byte
  int at = 8;
  do {
    unsigned char* entry = section + at;
    unsigned short programNumber = RavelRead16(entry);
    if (programNumber == 0) {
      iNetworkPID = RavelRead16(entry + 2) & 0x1FFF;  // ---xxxxx xxxxxxxx
    } else {
      RavelCPMTInfo* program = new RavelCPMTInfo(entry);
      // The first one-segment PMT goes last in the list; any later one is sorted in.
      if (heldBack == 0 && RavelPAT_IsOneSegPMTPID(program->iPID)) {
        heldBack = program;
      } else {
        InsertInProgramOrder(program);
      }
    }
    at += 4;
  } while (at < end);
  if (heldBack != 0) aProgramList.Append(heldBack);
  return kRavelOk;
}

void RavelCPAT::Show() {
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#################################################\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#### PAT Table Information\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "# Header Information\n");
  RavelCTableBase::Show();
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "# Body Information\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "The number of PMT Table Info=[%d]\n", aProgramList.iCount);
  for (int i = 0; i < aProgramList.iCount; ++i) {
    RavelCPMTInfo* program = aProgramList.ipArray[i];
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "[%d]th Table Info: Program Number=[%d], PID=[0x%02x]\n", i,
                program->iProgramNumber, program->iPID);
  }
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#################################################\n");
}
