// Common long section header of every PSI/SI table (ISO/IEC 13818-1 2.4.4):
//   table_id 8 | section_syntax_indicator 1 | '0' + reserved 3 | section_length 12
//   table_id_extension 16 | reserved 2 | version_number 5 | current_next_indicator 1
//   section_number 8 | last_section_number 8
// The body starts at byte 8; the CRC_32 takes the last 4 bytes.
#ifndef RAVEL_CTABLEBASE_H
#define RAVEL_CTABLEBASE_H

#include "Ravel_CString.h"

class RavelCTableBase {
 public:
  explicit RavelCTableBase(unsigned char* section);
  virtual ~RavelCTableBase();

  // Parses the 8 header bytes. A null section clears the header and gives -9.
  virtual int ParseRawData(unsigned char* section);
  virtual void Show();

  int SetTableName(const RavelCString& name);
  int SetTableName(const char* name);

  unsigned char iSession = 0;  // the caller's tag; the library only clears and prints it
  unsigned char iTableId;
  unsigned char bSectionSyntaxIndicator;
  unsigned short iSectionLength;
  unsigned short iTableIdExtension;
  unsigned char iVersionNumber;
  unsigned char bCurrentNextIndicator;
  unsigned char iSectionNumber;
  unsigned char iLastSectionNumber;
  RavelCString sTableName;

 protected:
  // Steps every table shares before its own checks: the CRC over the whole
  // section (traced with `crcMessage` at warning level, from the table's own
  // `sourcePath` and `sourceLine`; -24 on mismatch), then the header parse.
  // Gives 0 when the table goes on with its table_id check.
  int CheckCrcAndParseHeader(unsigned char* section, const char* sourcePath, int sourceLine, const char* crcMessage);

  // Copies the header members and the name from another table.
  void CopyHeader(const RavelCTableBase& other);
};

#endif
