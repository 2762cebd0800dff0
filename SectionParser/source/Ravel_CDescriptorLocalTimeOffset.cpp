#include "Ravel_CDescriptorLocalTimeOffset.h"

#include <cstring>

#include "Ravel_ByteOrder.h"
#include "Ravel_CDateCode.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_RecordList.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorLocalTimeOffset");

RavelCCountryCode::RavelCCountryCode(const char* code) {
  if (code != 0 && std::strlen(code) == 3) std::memcpy(szCountryCode, code, 3);
}

RavelCLocalTimeOffset::RavelCLocalTimeOffset() { Clear(); }

RavelCLocalTimeOffset::RavelCLocalTimeOffset(unsigned char* raw) {
  Clear();
  ParseRawData(raw);
}

RavelCLocalTimeOffset::~RavelCLocalTimeOffset() {}

void RavelCLocalTimeOffset::Clear() {
  std::memset(szCountryCode, 0, sizeof(szCountryCode));
  iCountryRegionId = 0;
  iLocalTimeOffsetPolarity = 0;
  iLocalTimeOffsetHour = 0;
  iLocalTimeOffsetMinute = 0;
  iLocalTimeOffsetSecond = 0;
  cTimeOfChange = RavelCDateTime();
  iNextTimeOffsetHour = 0;
  iNextTimeOffsetMinute = 0;
  iNextTimeOffsetSecond = 0;
}

int RavelCLocalTimeOffset::ParseRawData(unsigned char* raw) {
  if (raw == 0) {
    Clear();
    return kRavelErrInvalidArgument;
  }
  RavelCReadWindow::Copy(reinterpret_cast<unsigned char*>(szCountryCode), raw, 3);
  szCountryCode[3] = '\0';
  const unsigned char region = RavelCReadWindow::Read8(raw + 3);
  iCountryRegionId = static_cast<unsigned char>(region >> 2);          // xxxxxx..
  iLocalTimeOffsetPolarity = static_cast<unsigned char>(region & 1);   // .......x
  iLocalTimeOffsetHour = RavelBcd(RavelCReadWindow::Read8(raw + 4));
  iLocalTimeOffsetMinute = RavelBcd(RavelCReadWindow::Read8(raw + 5));
  iLocalTimeOffsetSecond = 0;
  RavelDateCode_DecodeDateTime(raw + 6, cTimeOfChange);
  iNextTimeOffsetHour = RavelBcd(RavelCReadWindow::Read8(raw + 11));
  iNextTimeOffsetMinute = RavelBcd(RavelCReadWindow::Read8(raw + 12));
  iNextTimeOffsetSecond = 0;
  return kRavelOk;
}

void RavelCLocalTimeOffset::Show() {
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tCountry Code=[%s], Country Region ID = [%d] Local Time Offset Polarity = [%d]\n",
              szCountryCode, iCountryRegionId, iLocalTimeOffsetPolarity);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tLocal Time Offset=[%d:%d:%d]\n", iLocalTimeOffsetHour, iLocalTimeOffsetMinute,
              iLocalTimeOffsetSecond);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tTime of Change=[%d.%d.%d - %d:%d:%d]\n", cTimeOfChange.iYear, cTimeOfChange.iMonth,
              cTimeOfChange.iDay, cTimeOfChange.iHour, cTimeOfChange.iMinute, cTimeOfChange.iSecond);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tNext Time Offset=[%d:%d:%d]\n", iNextTimeOffsetHour, iNextTimeOffsetMinute,
              iNextTimeOffsetSecond);
}

const RavelCDescriptorKind RavelCLocalTimeOffsetDescriptor::kKind = {
    0x58, "Time Offset Descriptor", "This Descriptor isn't LocalTimeOffset Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Local Time Offset Descriptor =====================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCLocalTimeOffsetDescriptor::RavelCLocalTimeOffsetDescriptor(unsigned char* raw) : aLocalTimeOffsets() {
  ParseRawData(raw);
}

RavelCLocalTimeOffsetDescriptor::RavelCLocalTimeOffsetDescriptor(RavelCLocalTimeOffsetDescriptor& other)
    : RavelCDescriptorBase(other), aLocalTimeOffsets() {
  *this = other;
}

RavelCLocalTimeOffsetDescriptor& RavelCLocalTimeOffsetDescriptor::operator=(RavelCLocalTimeOffsetDescriptor& other) {
  if (this == &other) return *this;
  RavelRecordList_DeleteAll(aLocalTimeOffsets);
  RavelCDescriptorBase::operator=(other);
  RavelRecordList_AppendCopies(aLocalTimeOffsets, other.aLocalTimeOffsets);
  return *this;
}

RavelCLocalTimeOffsetDescriptor::~RavelCLocalTimeOffsetDescriptor() { RavelRecordList_DeleteAll(aLocalTimeOffsets); }

int RavelCLocalTimeOffsetDescriptor::ParseRawData(unsigned char* raw) {
  RavelRecordList_DeleteAll(aLocalTimeOffsets);
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  if (iDescriptorLength == 0) return kRavelOk;
  // Steps of 13 while the entry starts inside the body (and the section); a
  // partial last entry is read as a whole one.
  const unsigned char* end = RavelCReadWindow::Clamp(raw + 2, raw + 2 + iDescriptorLength);
  for (unsigned char* at = raw + 2; at < end; at += 13) {
    RavelCLocalTimeOffset* entry = new RavelCLocalTimeOffset();
    entry->ParseRawData(at);
    aLocalTimeOffsets.Append(entry);
  }
  return kRavelOk;
}

RavelCLocalTimeOffset* RavelCLocalTimeOffsetDescriptor::GetLocalTimeOffset(const char* country) {
  if (country == 0) return 0;
  for (int i = 0; i < aLocalTimeOffsets.iCount; ++i) {
    RavelCLocalTimeOffset* entry = aLocalTimeOffsets.ipArray[i];
    if (RavelPGL_StrCaseCompare(entry->szCountryCode, country) == 0) return entry;
  }
  return 0;
}

RavelCLocalTimeOffset* RavelCLocalTimeOffsetDescriptor::GetLocalTimeOffset(const char* country,
                                                                          unsigned char regionId) {
  if (country == 0) return 0;
  for (int i = 0; i < aLocalTimeOffsets.iCount; ++i) {
    RavelCLocalTimeOffset* entry = aLocalTimeOffsets.ipArray[i];
    if (RavelPGL_StrCaseCompare(entry->szCountryCode, country) == 0 && entry->iCountryRegionId == regionId) {
      return entry;
    }
  }
  return 0;
}

void RavelCLocalTimeOffsetDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  for (int i = 0; i < aLocalTimeOffsets.iCount; ++i) {
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t##################### LocalTimeOffset [%d] #####################\n", i);
    aLocalTimeOffsets.ipArray[i]->Show();
  }
}
