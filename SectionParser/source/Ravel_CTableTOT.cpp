#include "Ravel_CTableTOT.h"

#include "Ravel_CDescriptorLocalTimeOffset.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_TimeTable.h"
#include "Ravel_Trace.h"
#include "Ravel_DescriptorSlot.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CTableTOT");

namespace {

const unsigned char kTOTTableId = 0x73;
const unsigned char kTagLocalTimeOffset = 0x58;
// table_id to descriptors_loop_length.
const int kDescriptorLoopStart = 10;

}  // namespace

RavelCTOT::RavelCTOT(unsigned char* section) : sTableName() {
  ClearFields();
  ParseRawData(section);
}

RavelCTOT::RavelCTOT(RavelCTOT& other) : sTableName() {
  ClearFields();
  *this = other;
}

RavelCTOT& RavelCTOT::operator=(RavelCTOT& other) {
  // Released before `other` is read: a table assigned to itself loses its descriptor.
  RavelDescriptorSlot_Release(pLocalTimeOffsetDescriptor);
  sTableName = other.sTableName;
  iTableId = other.iTableId;
  bSectionSyntaxIndicator = other.bSectionSyntaxIndicator;
  iSectionLength = other.iSectionLength;
  iYear = other.iYear;
  iMonth = other.iMonth;
  iDay = other.iDay;
  iHour = other.iHour;
  iMinute = other.iMinute;
  iSecond = other.iSecond;
  iDescriptorsLoopLength = other.iDescriptorsLoopLength;
  pLocalTimeOffsetDescriptor = RavelDescriptorSlot_CopyOf(other.pLocalTimeOffsetDescriptor);
  return *this;
}

RavelCTOT::~RavelCTOT() { delete pLocalTimeOffsetDescriptor; }

void RavelCTOT::ClearFields() {
  RavelTimeTable_Clear(*this);
  iDescriptorsLoopLength = 0;
}

int RavelCTOT::SetTableName(const RavelCString& name) {
  sTableName = name;
  return 1;
}

int RavelCTOT::SetTableName(const char* name) {
  sTableName = name;
  return 1;
}

int RavelCTOT::ParseRawData(unsigned char* section) {
  RavelCReadWindow window(section);
  delete pLocalTimeOffsetDescriptor;
  pLocalTimeOffsetDescriptor = 0;
  if (section == 0) iDescriptorsLoopLength = 0;
  int result = RavelTimeTable_ParseHeaderAndTime(*this, section, kTOTTableId, "TOT", kRavelTraceSourcePath, __LINE__);
  if (result != kRavelOk) return result;

  // The CRC_32 is not verified: a corrupted TOT is taken as it stands.
  iDescriptorsLoopLength = RavelCReadWindow::Read12(section + 8);  // ....xxxx xxxxxxxx
  if (iDescriptorsLoopLength == 0) return kRavelOk;
  // The loop stops at the end of the section whatever its length says.
  unsigned char* position = section + kDescriptorLoopStart;
  const unsigned char* end = RavelCReadWindow::Clamp(position, position + iDescriptorsLoopLength);
  do {
    if (RavelCReadWindow::Unreadable(position)) break;
    unsigned char tag = position[0];
    if (tag == kTagLocalTimeOffset) {
      // Only the last one of the loop is kept.
      delete pLocalTimeOffsetDescriptor;
      pLocalTimeOffsetDescriptor = new RavelCLocalTimeOffsetDescriptor(position);
    } else {
      RAVEL_TRACE(RAVEL_PARSER_WARNING, "TOT Parsing.. Unknown Descriptor Tag=[0x%02x]\n", tag);
    }
    // A zero length only steps over the tag and length bytes.
    position += RavelCReadWindow::Read8(position + 1) + 2;
  } while (position < end);
  return kRavelOk;
}

void RavelCTOT::Show() {
  static const char kRule[] = "#################################################################\n";
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "%s", kRule);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "###################### TOT Table Information ######################\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "%s", kRule);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Talbe identifier=[0x%02x], Table Name=[%s]\n", iTableId,
              sTableName.IsEmpty() ? "Unknown" : sTableName.GetString());
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Section syntax indicator=[%d], Section length=[%d]\n", bSectionSyntaxIndicator,
              iSectionLength);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "JST Time =[%d.%d.%d - %d:%d:%d]\n", iYear, iMonth, iDay, iHour, iMinute, iSecond);
  if (pLocalTimeOffsetDescriptor != 0) pLocalTimeOffsetDescriptor->Show();
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "%s", kRule);
}
