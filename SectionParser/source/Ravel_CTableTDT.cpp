#include "Ravel_CTableTDT.h"

#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_TimeTable.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CTableTDT");

namespace {

const unsigned char kTDTTableId = 0x70;

}  // namespace

RavelCTDT::RavelCTDT(unsigned char* section)
    : sTableName() {
  ParseRawData(section);
}

RavelCTDT::~RavelCTDT() {}

int RavelCTDT::SetTableName(const RavelCString& name) {
  sTableName = name;
  return 1;
}

int RavelCTDT::SetTableName(const char* name) {
  sTableName = name;
  return 1;
}

int RavelCTDT::ParseRawData(unsigned char* section) {
  // Nothing is checked against the length: the TDT carries no CRC_32.
  RavelCReadWindow window(section);
  return RavelTimeTable_ParseHeaderAndTime(*this, section, kTDTTableId, "TDT", kRavelTraceSourcePath, __LINE__);
}

void RavelCTDT::Show() {
  static const char kRule[] = "#################################################################\n";
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "%s", kRule);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "###################### TDT Table Information ######################\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "%s", kRule);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Talbe identifier=[0x%02x], Table Name=[%s]\n", iTableId,
              sTableName.IsEmpty() ? "Unknown" : sTableName.GetString());
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Section syntax indicator=[%d], Section length=[%d]\n", bSectionSyntaxIndicator,
              iSectionLength);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "TDT =[%d.%d.%d - %d:%d:%d]\n", iYear, iMonth, iDay, iHour, iMinute, iSecond);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "%s", kRule);
}
