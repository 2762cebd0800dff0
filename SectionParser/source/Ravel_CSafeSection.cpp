#include "Ravel_CSafeSection.h"

#include <cstring>

#include "Ravel_ByteOrder.h"
#include "Ravel_CDsmccDDB.h"
#include "Ravel_CDsmccDII.h"
#include "Ravel_CDsmccDSI.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_CSectionWalk.h"
#include "Ravel_CTableAIT.h"
#include "Ravel_CTableBIT.h"
#include "Ravel_CTableBase.h"
#include "Ravel_CTableEIT.h"
#include "Ravel_CTableNIT.h"
#include "Ravel_CTablePAT.h"
#include "Ravel_CTablePMT.h"
#include "Ravel_CTableSDT.h"
#include "Ravel_CTableStreamEventDescriptor.h"
#include "Ravel_CTableTDT.h"
#include "Ravel_CTableTOT.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Util.h"

namespace {

// Whether the class's own parse verifies the CRC_32.
enum CrcRule {
  kCrcNever,
  kCrcAlways,
  kCrcWithSyntaxIndicator  // only sections with section_syntax_indicator 1
};

// Which object a class's parse makes: a table, one of the time tables (each with
// a header of its own), or the DSM-CC message of a carousel section.
enum Holder { kNoClass, kHeldTable, kHeldTDT, kHeldTOT, kHeldMessage };

typedef RavelCTableBase* (*CreateTableFunction)(unsigned char* section, int& result);
typedef RavelCTableBase* (*CopyTableFunction)(RavelCTableBase& table);
typedef void (*JoinTableFunction)(RavelCTableBase& table, RavelCTableBase& other);

// One row per run of table_ids. The same rows answer Parse, Copy, Join and the
// static questions, so they cannot disagree.
struct TableRow {
  unsigned char iFirstTableId;
  unsigned char iLastTableId;
  RavelTableKind eKind;
  Holder eHolder;
  CrcRule eClassCrc;
  RavelCSectionWalk::Function pWalk;  // null: nothing to walk past the header
  CreateTableFunction pCreate;        // kHeldTable only
  CopyTableFunction pCopy;
  JoinTableFunction pJoin;  // null: each section stands alone (or no class)
  bool bJoined;             // the sections of one table make one table
  int iStreamIdBytes;       // bytes after the long header that belong to the table's identity
  bool bOtherStream;        // describes another transport stream than the one it arrives on
};

// Built over a null section, which traces nothing, then parsed once: the result
// and the traces are those of the real section.
template <class T>
RavelCTableBase* ParseNewTable(unsigned char* section, int& result) {
  T* table = new T(0);
  result = table->ParseRawData(section);
  return table;
}

RavelCTableBase* ParseNewAIT(unsigned char* section, int& result) {
  RavelCAIT* table = new RavelCAIT();
  result = table->ParseRawData(section);
  return table;
}

template <class T>
RavelCTableBase* CopyTable(RavelCTableBase& table) {
  return new T(static_cast<T&>(table));
}

// The PMT has an assignment and no copy constructor.
RavelCTableBase* CopyPMT(RavelCTableBase& table) {
  RavelCPMT* copy = new RavelCPMT(0);
  *copy = static_cast<RavelCPMT&>(table);
  return copy;
}

template <class T>
void JoinTable(RavelCTableBase& table, RavelCTableBase& other) {
  static_cast<T&>(table) += static_cast<T&>(other);
}

typedef RavelCSectionWalk W;

// table_ids     kind                           class         class CRC                 walk             create / copy / join                                          joined  stream ids  other stream
const TableRow kTableRows[] = {
    {0x00, 0x00, kRavelKindPAT,                 kHeldTable,   kCrcAlways,              0,               ParseNewTable<RavelCPAT>, CopyTable<RavelCPAT>, 0,                      false, 0, false},
    {0x01, 0x01, kRavelKindCAT,                 kNoClass,     kCrcNever,               0,               0, 0, 0,                                                            false, 0, false},
    {0x02, 0x02, kRavelKindPMT,                 kHeldTable,   kCrcAlways,              W::PMT,          ParseNewTable<RavelCPMT>, CopyPMT, JoinTable<RavelCPMT>,           true,  0, false},
    {0x3B, 0x3C, kRavelKindDsmccOther,          kHeldMessage, kCrcNever,               W::Carousel,     0, 0, 0,                                                            false, 0, false},
    {0x3D, 0x3D, kRavelKindStreamEvents,        kHeldTable,   kCrcWithSyntaxIndicator, W::StreamEvents, ParseNewTable<RavelCDsmccStreamEvent>, CopyTable<RavelCDsmccStreamEvent>, 0, false, 0, false},
    {0x40, 0x40, kRavelKindNIT,                 kHeldTable,   kCrcAlways,              W::NIT,          ParseNewTable<RavelCNIT>, CopyTable<RavelCNIT>, JoinTable<RavelCNIT>, true,  0, false},
    {0x41, 0x41, kRavelKindNIT,                 kHeldTable,   kCrcAlways,              W::NIT,          ParseNewTable<RavelCNIT>, CopyTable<RavelCNIT>, JoinTable<RavelCNIT>, true,  0, true},
    {0x42, 0x42, kRavelKindSDT,                 kHeldTable,   kCrcAlways,              W::SDT,          ParseNewTable<RavelCSDT>, CopyTable<RavelCSDT>, JoinTable<RavelCSDT>, true,  2, false},
    {0x46, 0x46, kRavelKindSDT,                 kHeldTable,   kCrcAlways,              W::SDT,          ParseNewTable<RavelCSDT>, CopyTable<RavelCSDT>, JoinTable<RavelCSDT>, true,  2, true},
    {0x4E, 0x4E, kRavelKindEITPresentFollowing, kHeldTable,   kCrcAlways,              W::EIT,          ParseNewTable<RavelCEIT>, CopyTable<RavelCEIT>, JoinTable<RavelCEIT>, true,  4, false},
    {0x4F, 0x4F, kRavelKindEITPresentFollowing, kHeldTable,   kCrcAlways,              W::EIT,          ParseNewTable<RavelCEIT>, CopyTable<RavelCEIT>, JoinTable<RavelCEIT>, true,  4, true},
    {0x50, 0x50, kRavelKindEITSchedule,         kHeldTable,   kCrcAlways,              W::EIT,          ParseNewTable<RavelCEIT>, CopyTable<RavelCEIT>, JoinTable<RavelCEIT>, true,  4, false},
    // EIT schedule actual sections past the first four days: the EIT class refuses them.
    {0x51, 0x5F, kRavelKindEITSchedule,         kNoClass,     kCrcNever,               W::EIT,          0, 0, 0,                                                            true,  4, false},
    {0x60, 0x6F, kRavelKindEITSchedule,         kHeldTable,   kCrcAlways,              W::EIT,          ParseNewTable<RavelCEIT>, CopyTable<RavelCEIT>, JoinTable<RavelCEIT>, true,  4, true},
    // The time tables keep their own short header and their classes check no CRC_32.
    {0x70, 0x70, kRavelKindTDT,                 kHeldTDT,     kCrcNever,               W::TDT,          0, 0, 0,                                                            false, 0, false},
    {0x73, 0x73, kRavelKindTOT,                 kHeldTOT,     kCrcNever,               W::TOT,          0, 0, 0,                                                            false, 0, false},
    {0x74, 0x74, kRavelKindAIT,                 kHeldTable,   kCrcAlways,              W::AIT,          ParseNewAIT, CopyTable<RavelCAIT>, 0,                               false, 0, false},
    {0xC4, 0xC4, kRavelKindBIT,                 kHeldTable,   kCrcAlways,              W::BIT,          ParseNewTable<RavelCBIT>, CopyTable<RavelCBIT>, JoinTable<RavelCBIT>, true,  0, false},
};

const int kTableRowCount = static_cast<int>(sizeof(kTableRows) / sizeof(kTableRows[0]));

// A short section that still ends with a CRC_32 (ETSI EN 300 468 5.2.6).
const unsigned char kTOTTableId = 0x73;

// Carousel sections: their DSM-CC message follows the 8-byte section header and
// ends before the CRC_32 (or checksum), neither of which the message classes read.
const int kCarouselHeaderSize = 8;
const int kCrcSize = 4;
const int kMessageHeaderSize = 12;
const int kLongHeaderSize = 8;

typedef RavelCDsmccBase* (*CreateMessageFunction)(unsigned char* message, int& result);
typedef RavelCDsmccBase* (*CopyMessageFunction)(RavelCDsmccBase& message);

struct MessageRow {
  unsigned short iMessageId;
  RavelTableKind eKind;
  CreateMessageFunction pCreate;
  CopyMessageFunction pCopy;  // null: the class has no copy
};

template <class T>
RavelCDsmccBase* ParseNewMessage(unsigned char* message, int& result) {
  T* object = new T(0);
  result = object->ParseRawData(message);
  return object;
}

// A DSI built over null data traces its parse once more than any DSI does, so it
// is built over the message; its parse of non-null data does not fail.
RavelCDsmccBase* ParseNewDSI(unsigned char* message, int& result) {
  result = kRavelOk;
  return new RavelCDsmccDSI(message);
}

template <class T>
RavelCDsmccBase* CopyMessage(RavelCDsmccBase& message) {
  return new T(static_cast<T&>(message));
}

const MessageRow kMessageRows[] = {
    {RAVEL_DSMCC_MSG_DSI, kRavelKindDSI, ParseNewDSI, 0},
    {RAVEL_DSMCC_MSG_DII, kRavelKindDII, ParseNewMessage<RavelCDsmccDII>, CopyMessage<RavelCDsmccDII>},
    {RAVEL_DSMCC_MSG_DDB, kRavelKindDDB, ParseNewMessage<RavelCDsmccDDB>, CopyMessage<RavelCDsmccDDB>},
};

const int kMessageRowCount = static_cast<int>(sizeof(kMessageRows) / sizeof(kMessageRows[0]));

const char* const kKindNames[kRavelKindCount] = {
    "PAT", "CAT", "PMT", "NIT", "SDT", "EIT p/f", "EIT schedule", "TDT", "TOT", "BIT", "AIT",
    "DSI", "DII", "DDB", "DSM-CC other", "stream descriptors", "other",
};

// Where no row applies (a row index is tested with `< 0`).
const int kNoRow = -1;

// The row of every table_id (kNoRow for none), made once from the rows: every
// section a receiver reads asks it several times.
struct TableRowIndex {
  signed char aRow[256];
  TableRowIndex() {
    for (int tableId = 0; tableId < 256; ++tableId) aRow[tableId] = kNoRow;
    for (int i = 0; i < kTableRowCount; ++i) {
      for (int tableId = kTableRows[i].iFirstTableId; tableId <= kTableRows[i].iLastTableId; ++tableId) {
        aRow[tableId] = static_cast<signed char>(i);
      }
    }
  }
};

int FindTableRow(unsigned char tableId) {
  static const TableRowIndex index;
  return index.aRow[tableId];
}

// The EIT's sections come in segments of eight (ETSI EN 300 468 5.2.4).
bool IsSegmentedRow(int row) {
  return kTableRows[row].eKind == kRavelKindEITPresentFollowing || kTableRows[row].eKind == kRavelKindEITSchedule;
}

int FindMessageRow(unsigned short messageId) {
  for (int i = 0; i < kMessageRowCount; ++i) {
    if (kMessageRows[i].iMessageId == messageId) return i;
  }
  return kNoRow;
}

RavelSafeRefusal Accepted() {
  RavelSafeRefusal refusal = {kRavelSafeOk, 0, -1};
  return refusal;
}

}  // namespace

const int RavelCSafeSection::kMaxSectionSize;

RavelCSafeSection::RavelCSafeSection()
    : cRefusal(Accepted()), iRow(kNoRow) {}

RavelCSafeSection::~RavelCSafeSection() {
  Clear();
  delete[] pBuffer;
}

void RavelCSafeSection::Clear() {
  delete pTable;
  pTable = 0;
  delete pTDT;
  pTDT = 0;
  delete pTOT;
  pTOT = 0;
  delete pMessage;
  pMessage = 0;
  iRow = kNoRow;
}

// The buffer is kept; the bytes of the last section are zeroed so that the bytes
// after the next one read zero.
void RavelCSafeSection::Reset() {
  Clear();
  iParseResult = 0;
  if (iDataSize > 0) std::memset(pBuffer, 0, static_cast<unsigned int>(iDataSize));
  iDataSize = 0;
  cRefusal = Accepted();
}

RavelSafeResult RavelCSafeSection::Refuse(RavelSafeResult result, const char* check, int offset) {
  cRefusal.eResult = result;
  cRefusal.pCheck = check;
  cRefusal.iOffset = offset;
  return result;
}

void RavelCSafeSection::Keep(const unsigned char* bytes, int size) {
  if (size > iCapacity) {
    delete[] pBuffer;
    pBuffer = new unsigned char[size];
    iCapacity = size;
  }
  std::memcpy(pBuffer, bytes, static_cast<unsigned int>(size));
  iDataSize = size;
}

RavelCTableBase* RavelCSafeSection::TakeTable() {
  RavelCTableBase* table = pTable;
  pTable = 0;
  iRow = pMessage != 0 ? iRow : kNoRow;
  return table;
}

RavelCTDT* RavelCSafeSection::TakeTDT() {
  RavelCTDT* table = pTDT;
  pTDT = 0;
  return table;
}

RavelCTOT* RavelCSafeSection::TakeTOT() {
  RavelCTOT* table = pTOT;
  pTOT = 0;
  return table;
}

RavelCDsmccBase* RavelCSafeSection::TakeMessage() {
  RavelCDsmccBase* message = pMessage;
  pMessage = 0;
  iRow = pTable != 0 ? iRow : kNoRow;
  return message;
}

RavelCTableBase* RavelCSafeSection::CopyTable() const { return pTable != 0 ? Copy(*pTable) : 0; }

RavelCTOT* RavelCSafeSection::CopyTOT() const { return pTOT != 0 ? new RavelCTOT(*pTOT) : 0; }

RavelCDsmccBase* RavelCSafeSection::CopyMessage() const {
  if (pMessage == 0 || kMessageRows[iRow].pCopy == 0) return 0;
  return kMessageRows[iRow].pCopy(*pMessage);
}

void RavelCSafeSection::Show() {
  if (pTable != 0) pTable->Show();
  if (pTDT != 0) pTDT->Show();
  if (pTOT != 0) pTOT->Show();
  if (pMessage != 0) pMessage->Show();
}

RavelSafeResult RavelCSafeSection::Load(const unsigned char* bytes, int count) {
  Reset();
  if (bytes == 0 || count < 0) return Refuse(kRavelSafeNullInput, "no data", -1);
  if (count < 3) return Refuse(kRavelSafeTooShort, "bytes end before section_length", count);
  int size = RavelSectionSize(bytes);
  if (count < size) return Refuse(kRavelSafeLengthMismatch, "section runs past the bytes held", 1);
  Keep(bytes, size);
  if (CarriesCrc(pBuffer) && !RavelUtil_CheckSectionCRC32(pBuffer)) {
    return Refuse(kRavelSafeCrcError, "CRC_32 does not verify", size - kCrcSize);
  }
  int row = FindTableRow(pBuffer[0]);
  if (row >= 0 && kTableRows[row].pWalk != 0 && !kTableRows[row].pWalk(pBuffer, size, cRefusal)) {
    return cRefusal.eResult;
  }
  return kRavelSafeOk;
}

RavelSafeResult RavelCSafeSection::Parse(const unsigned char* bytes, int count) {
  RavelSafeResult result = Load(bytes, count);
  if (result != kRavelSafeOk) return result;
  int row = FindTableRow(pBuffer[0]);
  switch (row < 0 ? kNoClass : kTableRows[row].eHolder) {
    case kHeldMessage:
      return ParseMessageAt(pBuffer + kCarouselHeaderSize);
    case kHeldTDT:
      return ParseTimeTable(pTDT);
    case kHeldTOT:
      return ParseTimeTable(pTOT);
    case kHeldTable:
      return ParseHeld(row);
    default:
      return Refuse(kRavelSafeUnknownTable, "no class for this table_id", 0);
  }
}

RavelSafeResult RavelCSafeSection::ParseHeld(int row) {
  RavelCTableBase* table = kTableRows[row].pCreate(pBuffer, iParseResult);
  if (iParseResult != kRavelOk) {
    delete table;
    return Refuse(kRavelSafeRefused, "the class's parse refused it", -1);
  }
  pTable = table;
  iRow = row;
  return kRavelSafeOk;
}

// Built over a null section (which traces nothing), then parsed once.
template <class T>
RavelSafeResult RavelCSafeSection::ParseTimeTable(T*& held) {
  T* table = new T(0);
  iParseResult = table->ParseRawData(pBuffer);
  if (iParseResult != kRavelOk) {
    delete table;
    return Refuse(kRavelSafeRefused, "the class's parse refused it", -1);
  }
  held = table;
  return kRavelSafeOk;
}

template <class T>
RavelSafeResult RavelCSafeSection::ParseCallers(const unsigned char* bytes, int count, T& table) {
  RavelSafeResult result = Load(bytes, count);
  if (result != kRavelSafeOk) return result;
  iParseResult = table.ParseRawData(pBuffer);
  if (iParseResult != kRavelOk) return Refuse(kRavelSafeRefused, "the class's parse refused it", -1);
  return kRavelSafeOk;
}

RavelSafeResult RavelCSafeSection::ParseInto(const unsigned char* bytes, int count, RavelCTableBase& table) {
  return ParseCallers(bytes, count, table);
}

RavelSafeResult RavelCSafeSection::ParseInto(const unsigned char* bytes, int count, RavelCTDT& table) {
  return ParseCallers(bytes, count, table);
}

RavelSafeResult RavelCSafeSection::ParseInto(const unsigned char* bytes, int count, RavelCTOT& table) {
  return ParseCallers(bytes, count, table);
}

// `message` lies in pBuffer and its parts have been walked.
RavelSafeResult RavelCSafeSection::ParseMessageAt(unsigned char* message) {
  int row = FindMessageRow(RavelRead16(message + 2));
  RavelCDsmccBase* object = kMessageRows[row].pCreate(message, iParseResult);
  if (iParseResult != kRavelOk) {
    delete object;
    return Refuse(kRavelSafeRefused, "the class's parse refused it", -1);
  }
  pMessage = object;
  iRow = row;
  return kRavelSafeOk;
}

RavelSafeResult RavelCSafeSection::LoadMessage(const unsigned char* bytes, int count) {
  Reset();
  if (bytes == 0 || count < 0) return Refuse(kRavelSafeNullInput, "no data", -1);
  if (count < kMessageHeaderSize) return Refuse(kRavelSafeTooShort, "bytes end before messageLength", count);
  int end = kMessageHeaderSize + RavelRead16(bytes + 10);
  if (end > count) return Refuse(kRavelSafeLengthMismatch, "message runs past the bytes held", 10);
  Keep(bytes, end);
  return kRavelSafeOk;
}

RavelSafeResult RavelCSafeSection::ParseMessage(const unsigned char* bytes, int count) {
  RavelSafeResult result = LoadMessage(bytes, count);
  if (result != kRavelSafeOk) return result;
  if (!RavelCSectionWalk::Message(pBuffer, iDataSize, RavelRead16(pBuffer + 2), 0, cRefusal)) return cRefusal.eResult;
  // A message held without its section: the window is the message itself.
  RavelCReadWindow window(pBuffer, pBuffer + iDataSize);
  return ParseMessageAt(pBuffer);
}

RavelSafeResult RavelCSafeSection::ParseMessageInto(const unsigned char* bytes, int count,
                                                    unsigned short messageId, RavelCDsmccBase& message) {
  RavelSafeResult result = LoadMessage(bytes, count);
  if (result != kRavelSafeOk) return result;
  if (!RavelCSectionWalk::Message(pBuffer, iDataSize, messageId, 0, cRefusal)) return cRefusal.eResult;
  RavelCReadWindow window(pBuffer, pBuffer + iDataSize);
  iParseResult = message.ParseRawData(pBuffer);
  if (iParseResult != kRavelOk) return Refuse(kRavelSafeRefused, "the class's parse refused it", -1);
  return kRavelSafeOk;
}

RavelSafeResult RavelCSafeSection::ParseMessageInto(const unsigned char* bytes, int count, RavelCDsmccDSI& message) {
  return ParseMessageInto(bytes, count, RAVEL_DSMCC_MSG_DSI, message);
}

RavelSafeResult RavelCSafeSection::ParseMessageInto(const unsigned char* bytes, int count, RavelCDsmccDII& message) {
  return ParseMessageInto(bytes, count, RAVEL_DSMCC_MSG_DII, message);
}

RavelSafeResult RavelCSafeSection::ParseMessageInto(const unsigned char* bytes, int count, RavelCDsmccDDB& message) {
  return ParseMessageInto(bytes, count, RAVEL_DSMCC_MSG_DDB, message);
}

RavelSafeResult RavelCSafeSection::CheckMessage(const unsigned char* message, int count) {
  if (message == 0 || count < 0) return kRavelSafeNullInput;
  if (count < kMessageHeaderSize) return kRavelSafeTooShort;
  int end = kMessageHeaderSize + RavelRead16(message + 10);
  if (end > count) return kRavelSafeLengthMismatch;
  RavelSafeRefusal refusal = Accepted();
  RavelCSectionWalk::Message(message, end, RavelRead16(message + 2), 0, refusal);
  return refusal.eResult;
}

bool RavelCSafeSection::EachDescriptor(const unsigned char* section, int count, DescriptorVisit visit, void* context) {
  if (section == 0 || count < 3 || count < RavelSectionSize(section)) return false;
  int row = FindTableRow(section[0]);
  if (row < 0 || kTableRows[row].pWalk == 0) return false;
  RavelSafeRefusal refusal = Accepted();
  return RavelCSectionWalk::Visit(kTableRows[row].pWalk, section, RavelSectionSize(section), visit, context, refusal);
}

RavelTableKind RavelCSafeSection::GetKind(const unsigned char* section, int count) {
  if (section == 0 || count < 1) return kRavelKindOther;
  int row = FindTableRow(section[0]);
  if (row < 0) return kRavelKindOther;
  if (kTableRows[row].eHolder == kHeldMessage) {
    if (count < kCarouselHeaderSize + 4) return kRavelKindDsmccOther;
    int message = FindMessageRow(RavelRead16(section + kCarouselHeaderSize + 2));
    return message < 0 ? kRavelKindDsmccOther : kMessageRows[message].eKind;
  }
  return kTableRows[row].eKind;
}

const char* RavelCSafeSection::GetKindName(RavelTableKind kind) {
  return kind >= 0 && kind < kRavelKindCount ? kKindNames[kind] : "?";
}

bool RavelCSafeSection::IsKnownTable(unsigned char tableId) {
  int row = FindTableRow(tableId);
  return row >= 0 && kTableRows[row].eHolder != kNoClass;
}

bool RavelCSafeSection::ChecksCrc(unsigned char tableId, unsigned char sectionSyntaxIndicator) {
  int row = FindTableRow(tableId);
  if (row < 0) return false;
  switch (kTableRows[row].eClassCrc) {
    case kCrcAlways:
      return true;
    case kCrcWithSyntaxIndicator:
      return sectionSyntaxIndicator != 0;
    default:
      return false;
  }
}

bool RavelCSafeSection::CarriesCrc(const unsigned char* section) {
  return (section[1] & 0x80) != 0 || section[0] == kTOTTableId;
}

bool RavelCSafeSection::JoinsSections(unsigned char tableId) {
  int row = FindTableRow(tableId);
  return row >= 0 && kTableRows[row].bJoined;
}

bool RavelCSafeSection::IsSegmented(unsigned char tableId) {
  int row = FindTableRow(tableId);
  return row >= 0 && IsSegmentedRow(row);
}

bool RavelCSafeSection::DescribesOtherStream(unsigned char tableId) {
  int row = FindTableRow(tableId);
  return row >= 0 && kTableRows[row].bOtherStream;
}

bool RavelCSafeSection::ReadHeader(const unsigned char* section, int count, RavelSectionHeader& header) {
  std::memset(&header, 0, sizeof header);
  if (section == 0 || count < 3) return false;
  header.iTableId = section[0];
  header.bLongForm = (section[1] & 0x80) != 0;
  if (!header.bLongForm) return true;
  if (count < kLongHeaderSize) return false;
  header.iTableIdExtension = RavelRead16(section + 3);
  header.iVersionNumber = static_cast<unsigned char>((section[5] >> 1) & 0x1F);
  header.iSectionNumber = section[6];
  header.iLastSectionNumber = section[7];
  header.iSegmentLastSectionNumber = section[6];
  int row = FindTableRow(section[0]);
  int streamIdBytes = row >= 0 ? kTableRows[row].iStreamIdBytes : 0;
  if (count >= kLongHeaderSize + streamIdBytes) {
    for (int i = 0; i < streamIdBytes; ++i) header.iStreamIds = (header.iStreamIds << 8) | section[kLongHeaderSize + i];
  }
  // The EIT's segment_last_section_number follows its stream ids.
  if (row >= 0 && IsSegmentedRow(row) && count > kLongHeaderSize + streamIdBytes) {
    header.iSegmentLastSectionNumber = section[kLongHeaderSize + streamIdBytes];
  }
  return true;
}

bool RavelCSafeSection::Join(RavelCTableBase& table, RavelCTableBase& other) {
  int row = FindTableRow(table.iTableId);
  int otherRow = FindTableRow(other.iTableId);
  if (row < 0 || otherRow < 0 || kTableRows[row].pJoin == 0 || kTableRows[row].pJoin != kTableRows[otherRow].pJoin) {
    return false;
  }
  kTableRows[row].pJoin(table, other);
  return true;
}

RavelCTableBase* RavelCSafeSection::Copy(RavelCTableBase& table) {
  int row = FindTableRow(table.iTableId);
  if (row < 0 || kTableRows[row].pCopy == 0) return 0;
  return kTableRows[row].pCopy(table);
}

const char* RavelCSafeSection::GetResultText(RavelSafeResult result) {
  switch (result) {
    case kRavelSafeOk:
      return "ok";
    case kRavelSafeNullInput:
      return "no data";
    case kRavelSafeTooShort:
      return "too short";
    case kRavelSafeLengthMismatch:
      return "length mismatch";
    case kRavelSafeCrcError:
      return "CRC error";
    case kRavelSafeOutsideMessage:
      return "part outside the message";
    case kRavelSafeUnknownTable:
      return "unknown table";
    case kRavelSafeRefused:
      return "refused by the parser";
    case kRavelSafeMalformed:
      return "malformed";
  }
  return "unknown result";
}
