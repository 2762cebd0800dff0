#include "Ravel_CSafeSection.h"

#include <cstring>

#include "Ravel_ByteOrder.h"
#include "Ravel_CTableAIT.h"
#include "Ravel_CTableBase.h"
#include "Ravel_CTablePAT.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Util.h"

namespace {

typedef RavelCTableBase* (*CreateFunction)();
typedef RavelCTableBase* (*CopyFunction)(RavelCTableBase& table);

// Whether the table's own parse verifies the CRC_32.
enum CrcRule {
  kCrcNever,
  kCrcAlways,
  kCrcWithSyntaxIndicator  // only sections with section_syntax_indicator 1
};

// One row per table class: the table_ids it accepts, its CRC rule, how to make an
// empty one and how to copy one. The same rows answer Parse, CopyTable and the
// two static questions, so they cannot disagree.
struct TableRow {
  unsigned char iFirstTableId;
  unsigned char iLastTableId;
  CrcRule eCrc;
  CreateFunction pCreate;
  CopyFunction pCopy;
};

// Built over a null section: an empty object that traces nothing, so the one
// parse made afterwards yields the result and the traces of the real section.
template <class T>
RavelCTableBase* CreateEmpty() {
  return new T(0);
}

RavelCTableBase* CreateAIT() { return new RavelCAIT(); }

template <class T>
RavelCTableBase* CopyConstructed(RavelCTableBase& table) {
  return new T(static_cast<T&>(table));
}

const TableRow kTableRows[] = {
    {0x00, 0x00, kCrcAlways, CreateEmpty<RavelCPAT>, CopyConstructed<RavelCPAT>},
    {0x74, 0x74, kCrcAlways, CreateAIT, CopyConstructed<RavelCAIT>},
};

const int kTableRowCount = static_cast<int>(sizeof(kTableRows) / sizeof(kTableRows[0]));

int FindTableRow(unsigned char tableId) {
  for (int i = 0; i < kTableRowCount; ++i) {
    if (tableId >= kTableRows[i].iFirstTableId && tableId <= kTableRows[i].iLastTableId) return i;
  }
  return -1;
}

}  // namespace

const int RavelCSafeSection::kPadding;
const int RavelCSafeSection::kMaxSectionSize;

RavelCSafeSection::RavelCSafeSection() : pBuffer(0), iSectionSize(0), iParseResult(0), pTable(0), iTableRow(-1) {}

RavelCSafeSection::~RavelCSafeSection() {
  Clear();
  delete[] pBuffer;
}

void RavelCSafeSection::Clear() {
  delete pTable;
  pTable = 0;
  iTableRow = -1;
}

RavelCTableBase* RavelCSafeSection::TakeTable() {
  RavelCTableBase* table = pTable;
  pTable = 0;
  iTableRow = -1;
  return table;
}

RavelCTableBase* RavelCSafeSection::CopyTable() const {
  if (pTable == 0 || iTableRow < 0) return 0;
  return kTableRows[iTableRow].pCopy(*pTable);
}

void RavelCSafeSection::Show() {
  if (pTable != 0) pTable->Show();
}

RavelSafeResult RavelCSafeSection::CheckAndCopy(const unsigned char* bytes, int count) {
  Clear();
  iParseResult = 0;
  delete[] pBuffer;
  pBuffer = 0;
  iSectionSize = 0;

  if (bytes == 0 || count < 0) return kRavelSafeNullInput;
  if (count < 3) return kRavelSafeTooShort;
  int size = RavelSectionSize(bytes);
  if (count < size) return kRavelSafeLengthMismatch;

  // Allocated to the exact size, so that a memory checker flags any read past the padding.
  pBuffer = new unsigned char[size + kPadding];
  std::memcpy(pBuffer, bytes, static_cast<unsigned int>(size));
  std::memset(pBuffer + size, 0, static_cast<unsigned int>(kPadding));
  iSectionSize = size;
  return kRavelSafeOk;
}

RavelSafeResult RavelCSafeSection::Load(const unsigned char* bytes, int count) {
  RavelSafeResult result = CheckAndCopy(bytes, count);
  if (result != kRavelSafeOk) return result;
  if (ChecksCrc(pBuffer[0], static_cast<unsigned char>(pBuffer[1] >> 7)) && !RavelUtil_CheckSectionCRC32(pBuffer)) {
    return kRavelSafeCrcError;
  }
  return kRavelSafeOk;
}

RavelSafeResult RavelCSafeSection::Parse(const unsigned char* bytes, int count) {
  RavelSafeResult result = Load(bytes, count);
  if (result != kRavelSafeOk) return result;
  int row = FindTableRow(pBuffer[0]);
  if (row < 0) return kRavelSafeUnknownTable;
  RavelCTableBase* table = kTableRows[row].pCreate();
  iParseResult = table->ParseRawData(pBuffer);
  if (iParseResult != kRavelOk) {
    delete table;
    return kRavelSafeRefused;
  }
  pTable = table;
  iTableRow = row;
  return kRavelSafeOk;
}

RavelSafeResult RavelCSafeSection::ParseInto(const unsigned char* bytes, int count, RavelCTableBase& table) {
  RavelSafeResult result = Load(bytes, count);
  if (result != kRavelSafeOk) return result;
  iParseResult = table.ParseRawData(pBuffer);
  return iParseResult == kRavelOk ? kRavelSafeOk : kRavelSafeRefused;
}

bool RavelCSafeSection::IsKnownTable(unsigned char tableId) { return FindTableRow(tableId) >= 0; }

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
    case kRavelSafeUnknownTable:
      return "unknown table";
    case kRavelSafeRefused:
      return "refused by the parser";
  }
  return "unknown result";
}
