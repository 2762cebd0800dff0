#include "Ravel_CTableBase.h"

#include "Ravel_CBitInputStream.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"
#include "Ravel_Util.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CTableBase");

RavelCTableBase::RavelCTableBase(unsigned char* section) : sTableName() {
  // Runs the base parse: derived constructors pass null here to clear the header.
  // A parse never writes the caller's tag, so it starts cleared either way.
  RavelCTableBase::ParseRawData(section);
}

RavelCTableBase::~RavelCTableBase() {}

int RavelCTableBase::ParseRawData(unsigned char* section) {
  if (section == 0) {
    iSession = 0;
    iTableId = 0;
    bSectionSyntaxIndicator = 0;
    iSectionLength = 0;
    iTableIdExtension = 0;
    iVersionNumber = 0;
    bCurrentNextIndicator = 0;
    iSectionNumber = 0;
    iLastSectionNumber = 0;
    return kRavelErrNullSection;
  }
  // A section shorter than its 8 header bytes reads zeros for the rest.
  RavelCReadWindow window(section);
  RavelCBitInputStream reader = RavelCReadWindow::Reader(section, 8);
  unsigned char status = 0;
  iTableId = reader.ReadByte(8, status);
  bSectionSyntaxIndicator = reader.ReadBit(status);
  reader.Skip(3);
  iSectionLength = reader.ReadShort(12, status);
  iTableIdExtension = reader.ReadShort(16, status);
  reader.Skip(2);
  iVersionNumber = reader.ReadByte(5, status);
  bCurrentNextIndicator = reader.ReadBit(status);
  iSectionNumber = reader.ReadByte(8, status);
  iLastSectionNumber = reader.ReadByte(8, status);
  return kRavelOk;
}

void RavelCTableBase::Show() {
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Session = [0x%02x], Talbe identifier=[0x%02x], Table Name=[%s]\n", iSession,
              iTableId, sTableName.IsEmpty() ? "Unknown" : sTableName.GetString());
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Section syntax indicator=[%d], Section length=[%d], Any Identifier(?)=[0x%04x]\n",
              bSectionSyntaxIndicator, iSectionLength, iTableIdExtension);
  RAVEL_TRACE(RAVEL_PARSER_DUMP,
              "Version number=[%d], Current next indicator=[%d], Section numbe=[%d], Last section number=[%d]\n",
              iVersionNumber, bCurrentNextIndicator, iSectionNumber, iLastSectionNumber);
}

int RavelCTableBase::SetTableName(const RavelCString& name) {
  sTableName = name;
  return 1;
}

int RavelCTableBase::SetTableName(const char* name) {
  sTableName = name;
  return 1;
}

int RavelCTableBase::CheckCrcAndParseHeader(unsigned char* section, const char* sourcePath, int sourceLine,
                                            const char* crcMessage) {
  if (!RavelUtil_CheckSectionCRC32(section)) {
    RAVEL_PGL_TRACE_AT(sourcePath, sourceLine, RAVEL_PARSER_WARNING, "%s", crcMessage);
    return kRavelErrCorruptSection;
  }
  RavelCTableBase::ParseRawData(section);
  return kRavelOk;
}

void RavelCTableBase::CopyHeader(const RavelCTableBase& other) {
  iSession = other.iSession;
  iTableId = other.iTableId;
  bSectionSyntaxIndicator = other.bSectionSyntaxIndicator;
  iSectionLength = other.iSectionLength;
  iTableIdExtension = other.iTableIdExtension;
  iVersionNumber = other.iVersionNumber;
  bCurrentNextIndicator = other.bCurrentNextIndicator;
  iSectionNumber = other.iSectionNumber;
  iLastSectionNumber = other.iLastSectionNumber;
  sTableName = other.sTableName;
}
