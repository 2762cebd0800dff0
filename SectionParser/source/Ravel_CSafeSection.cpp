#include "Ravel_CSafeSection.h"

#include <cstring>

#include "Ravel_ByteOrder.h"
#include "Ravel_CDsmccDDB.h"
#include "Ravel_CDsmccDII.h"
#include "Ravel_CDsmccDSI.h"
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

// Whether the table's own parse verifies the CRC_32.
enum CrcRule {
  kCrcNever,
  kCrcAlways,
  kCrcWithSyntaxIndicator  // only sections with section_syntax_indicator 1
};

typedef RavelCTableBase* (*CreateTableFunction)(unsigned char* section, int& result);
typedef RavelCTableBase* (*CopyTableFunction)(RavelCTableBase& table);

// One row per table class: the table_ids it accepts, its CRC rule, how to make
// one from a section and how to copy one. The same rows answer Parse, CopyTable
// and the static questions, so they cannot disagree.
struct TableRow {
  unsigned char iFirstTableId;
  unsigned char iLastTableId;
  CrcRule eCrc;
  CreateTableFunction pCreate;
  CopyTableFunction pCopy;
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

// The EIT takes 0x4E, 0x4F, 0x50 and 0x60 to 0x6F; 0x51 to 0x5F have no class.
const TableRow kTableRows[] = {
    {0x00, 0x00, kCrcAlways, ParseNewTable<RavelCPAT>, CopyTable<RavelCPAT>},
    {0x02, 0x02, kCrcAlways, ParseNewTable<RavelCPMT>, CopyPMT},
    {0x3D, 0x3D, kCrcWithSyntaxIndicator, ParseNewTable<RavelCDsmccStreamEvent>, CopyTable<RavelCDsmccStreamEvent>},
    {0x40, 0x41, kCrcAlways, ParseNewTable<RavelCNIT>, CopyTable<RavelCNIT>},
    {0x42, 0x42, kCrcAlways, ParseNewTable<RavelCSDT>, CopyTable<RavelCSDT>},
    {0x46, 0x46, kCrcAlways, ParseNewTable<RavelCSDT>, CopyTable<RavelCSDT>},
    {0x4E, 0x50, kCrcAlways, ParseNewTable<RavelCEIT>, CopyTable<RavelCEIT>},
    {0x60, 0x6F, kCrcAlways, ParseNewTable<RavelCEIT>, CopyTable<RavelCEIT>},
    {0x74, 0x74, kCrcAlways, ParseNewAIT, CopyTable<RavelCAIT>},
    {0xC4, 0xC4, kCrcAlways, ParseNewTable<RavelCBIT>, CopyTable<RavelCBIT>},
};

// The time tables keep their own short header and check no CRC_32.
const unsigned char kTDTTableId = 0x70;
const unsigned char kTOTTableId = 0x73;

const int kTableRowCount = static_cast<int>(sizeof(kTableRows) / sizeof(kTableRows[0]));

// Carousel sections: their DSM-CC message follows the 8-byte section header and
// ends before the CRC_32 (or checksum), neither of which the message classes read.
const unsigned char kDsmccControlTableId = 0x3B;  // DSI, DII
const unsigned char kDsmccDataTableId = 0x3C;     // DDB
const int kSectionHeaderSize = 8;
const int kSectionCrcSize = 4;
const int kMessageHeaderSize = 12;

typedef RavelCDsmccBase* (*CreateMessageFunction)(unsigned char* message, int& result);
typedef RavelCDsmccBase* (*CopyMessageFunction)(RavelCDsmccBase& message);
// Whether the parts that the class reads lie inside the message's `end` bytes.
typedef bool (*PartsInsideFunction)(const unsigned char* message, int end);

struct MessageRow {
  unsigned short iMessageId;
  CreateMessageFunction pCreate;
  CopyMessageFunction pCopy;  // null: the class has no copy
  PartsInsideFunction pPartsInside;
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

int BodyOffset(const unsigned char* message) { return kMessageHeaderSize + message[9]; }

// serverId 20 | compatibilityDescriptorLength 16 | privateDataLength 16 | privateData
bool DsiPartsInside(const unsigned char* message, int end) {
  int body = BodyOffset(message);
  if (body + 24 > end) return false;
  return body + 24 + RavelRead16(message + body + 22) <= end;
}

// download parameters 16 | compatibilityDescriptorLength 16 | descriptor |
// numberOfModules 16 | records | privateDataLength 16 | privateData
bool DiiPartsInside(const unsigned char* message, int end) {
  int body = BodyOffset(message);
  if (body + 18 > end) return false;
  int at = body + 16 + RavelRead16(message + body + 16);
  if (at + 4 > end) return false;
  unsigned int numberOfModules = RavelRead16(message + at + 2);
  at += 4;
  for (unsigned int i = 0; i < numberOfModules; ++i) {
    if (at + 8 > end) return false;
    at += 8 + message[at + 7];  // moduleInfoLength
    if (at > end) return false;
  }
  if (at + 2 > end) return false;
  return at + 2 + RavelRead16(message + at) <= end;
}

// moduleId 16 | moduleVersion 8 | reserved 8 | blockNumber 16 | block to the end
bool DdbPartsInside(const unsigned char* message, int end) { return BodyOffset(message) + 6 <= end; }

const MessageRow kMessageRows[] = {
    {RAVEL_DSMCC_MSG_DSI, ParseNewDSI, 0, DsiPartsInside},
    {RAVEL_DSMCC_MSG_DII, ParseNewMessage<RavelCDsmccDII>, CopyMessage<RavelCDsmccDII>, DiiPartsInside},
    {RAVEL_DSMCC_MSG_DDB, ParseNewMessage<RavelCDsmccDDB>, CopyMessage<RavelCDsmccDDB>, DdbPartsInside},
};

const int kMessageRowCount = static_cast<int>(sizeof(kMessageRows) / sizeof(kMessageRows[0]));

int FindTableRow(unsigned char tableId) {
  for (int i = 0; i < kTableRowCount; ++i) {
    if (tableId >= kTableRows[i].iFirstTableId && tableId <= kTableRows[i].iLastTableId) return i;
  }
  return -1;
}

int FindMessageRow(unsigned short messageId) {
  for (int i = 0; i < kMessageRowCount; ++i) {
    if (kMessageRows[i].iMessageId == messageId) return i;
  }
  return -1;
}

bool IsCarouselSection(unsigned char tableId) {
  return tableId == kDsmccControlTableId || tableId == kDsmccDataTableId;
}

// The length checks of a message of `count` bytes; `end` gets its declared size.
RavelSafeResult CheckMessageLength(const unsigned char* message, int count, int& end) {
  if (message == 0 || count < 0) return kRavelSafeNullInput;
  if (count < kMessageHeaderSize) return kRavelSafeTooShort;
  end = kMessageHeaderSize + RavelRead16(message + 10);  // messageLength
  if (end > count) return kRavelSafeLengthMismatch;
  return kRavelSafeOk;
}

}  // namespace

const int RavelCSafeSection::kPadding;
const int RavelCSafeSection::kMaxSectionSize;

RavelCSafeSection::RavelCSafeSection()
    : pBuffer(0), iDataSize(0), iParseResult(0), pTable(0), pTDT(0), pTOT(0), pMessage(0), iRow(-1) {}

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
  iRow = -1;
}

void RavelCSafeSection::Reset() {
  Clear();
  iParseResult = 0;
  delete[] pBuffer;
  pBuffer = 0;
  iDataSize = 0;
}

RavelCTableBase* RavelCSafeSection::TakeTable() {
  RavelCTableBase* table = pTable;
  pTable = 0;
  iRow = pMessage != 0 ? iRow : -1;
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
  iRow = pTable != 0 ? iRow : -1;
  return message;
}

RavelCTableBase* RavelCSafeSection::CopyTable() const {
  if (pTable == 0) return 0;
  return kTableRows[iRow].pCopy(*pTable);
}

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

void RavelCSafeSection::CopyPadded(const unsigned char* bytes, int size) {
  // Allocated to the exact size, so that a memory checker flags any read past the padding.
  pBuffer = new unsigned char[size + kPadding];
  std::memcpy(pBuffer, bytes, static_cast<unsigned int>(size));
  std::memset(pBuffer + size, 0, static_cast<unsigned int>(kPadding));
  iDataSize = size;
}

RavelSafeResult RavelCSafeSection::Load(const unsigned char* bytes, int count) {
  Reset();
  if (bytes == 0 || count < 0) return kRavelSafeNullInput;
  if (count < 3) return kRavelSafeTooShort;
  int size = RavelSectionSize(bytes);
  if (count < size) return kRavelSafeLengthMismatch;
  CopyPadded(bytes, size);
  if (ChecksCrc(pBuffer[0], static_cast<unsigned char>(pBuffer[1] >> 7)) && !RavelUtil_CheckSectionCRC32(pBuffer)) {
    return kRavelSafeCrcError;
  }
  return kRavelSafeOk;
}

RavelSafeResult RavelCSafeSection::Parse(const unsigned char* bytes, int count) {
  RavelSafeResult result = Load(bytes, count);
  if (result != kRavelSafeOk) return result;
  if (IsCarouselSection(pBuffer[0])) {
    int messageCount = iDataSize - kSectionHeaderSize - kSectionCrcSize;
    if (messageCount < kMessageHeaderSize) return kRavelSafeTooShort;
    return ParseMessageAt(pBuffer + kSectionHeaderSize, messageCount);
  }
  if (pBuffer[0] == kTDTTableId) return ParseTimeTable(pTDT);
  if (pBuffer[0] == kTOTTableId) return ParseTimeTable(pTOT);
  int row = FindTableRow(pBuffer[0]);
  if (row < 0) return kRavelSafeUnknownTable;
  RavelCTableBase* table = kTableRows[row].pCreate(pBuffer, iParseResult);
  if (iParseResult != kRavelOk) {
    delete table;
    return kRavelSafeRefused;
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
    return kRavelSafeRefused;
  }
  held = table;
  return kRavelSafeOk;
}

template <class T>
RavelSafeResult RavelCSafeSection::ParseCallers(const unsigned char* bytes, int count, T& table) {
  RavelSafeResult result = Load(bytes, count);
  if (result != kRavelSafeOk) return result;
  iParseResult = table.ParseRawData(pBuffer);
  return iParseResult == kRavelOk ? kRavelSafeOk : kRavelSafeRefused;
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

// `message` lies in pBuffer, followed by at least kPadding zeroed bytes.
RavelSafeResult RavelCSafeSection::ParseMessageAt(unsigned char* message, int count) {
  RavelSafeResult result = CheckMessage(message, count);
  if (result != kRavelSafeOk) return result;
  int row = FindMessageRow(RavelRead16(message + 2));
  RavelCDsmccBase* object = kMessageRows[row].pCreate(message, iParseResult);
  if (iParseResult != kRavelOk) {
    delete object;
    return kRavelSafeRefused;
  }
  pMessage = object;
  iRow = row;
  return kRavelSafeOk;
}

RavelSafeResult RavelCSafeSection::LoadMessage(const unsigned char* bytes, int count) {
  Reset();
  int end = 0;
  RavelSafeResult result = CheckMessageLength(bytes, count, end);
  if (result != kRavelSafeOk) return result;
  CopyPadded(bytes, end);
  return kRavelSafeOk;
}

RavelSafeResult RavelCSafeSection::ParseMessage(const unsigned char* bytes, int count) {
  RavelSafeResult result = LoadMessage(bytes, count);
  if (result != kRavelSafeOk) return result;
  return ParseMessageAt(pBuffer, iDataSize);
}

RavelSafeResult RavelCSafeSection::ParseMessageInto(const unsigned char* bytes, int count,
                                                    unsigned short messageId, RavelCDsmccBase& message) {
  RavelSafeResult result = LoadMessage(bytes, count);
  if (result != kRavelSafeOk) return result;
  if (!kMessageRows[FindMessageRow(messageId)].pPartsInside(pBuffer, iDataSize)) return kRavelSafeOutsideMessage;
  iParseResult = message.ParseRawData(pBuffer);
  return iParseResult == kRavelOk ? kRavelSafeOk : kRavelSafeRefused;
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
  int end = 0;
  RavelSafeResult result = CheckMessageLength(message, count, end);
  if (result != kRavelSafeOk) return result;
  int row = FindMessageRow(RavelRead16(message + 2));
  if (row < 0) return kRavelSafeUnknownTable;
  return kMessageRows[row].pPartsInside(message, end) ? kRavelSafeOk : kRavelSafeOutsideMessage;
}

bool RavelCSafeSection::IsKnownTable(unsigned char tableId) {
  return FindTableRow(tableId) >= 0 || IsCarouselSection(tableId) || tableId == kTDTTableId ||
         tableId == kTOTTableId;
}

bool RavelCSafeSection::ChecksCrc(unsigned char tableId, unsigned char sectionSyntaxIndicator) {
  int row = FindTableRow(tableId);
  if (row < 0) return false;
  switch (kTableRows[row].eCrc) {
    case kCrcAlways:
      return true;
    case kCrcWithSyntaxIndicator:
      return sectionSyntaxIndicator != 0;
    default:
      return false;
  }
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
  }
  return "unknown result";
}
