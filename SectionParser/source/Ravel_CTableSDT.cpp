#include "Ravel_CTableSDT.h"

#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_TableMerge.h"
#include "Ravel_Trace.h"
#include "Ravel_DescriptorSlot.h"
#include "Ravel_RecordList.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CTableSDT");

namespace {

const unsigned char kSDTActualTableId = 0x42;
const unsigned char kSDTOtherTableId = 0x46;
const int kServiceLoopStart = 11;  // after original_network_id and reserved_future_use
const int kServiceHeaderSize = 5;  // service_id, flags, running status, loop length

const unsigned char kTagService = 0x48;
const unsigned char kTagCountryAvailability = 0x49;
const unsigned char kTagDigitalCopyControl = 0xC1;
const unsigned char kTagLogoTransmission = 0xCF;

}  // namespace

// ---------------------------------------------------------------------------
// RavelCServiceDescription

RavelCServiceDescription::RavelCServiceDescription(unsigned char* entry) {
  ParseRawData(entry);
}

RavelCServiceDescription::RavelCServiceDescription(RavelCServiceDescription& other) {
  *this = other;
}

RavelCServiceDescription& RavelCServiceDescription::operator=(RavelCServiceDescription& other) {
  if (this == &other) return *this;
  DeleteDescriptors();
  iServiceId = other.iServiceId;
  iEITCompanyDefFlag = other.iEITCompanyDefFlag;
  bEITScheduleFlag = other.bEITScheduleFlag;
  bEITPresentFollowingFlag = other.bEITPresentFollowingFlag;
  iRunningStatus = other.iRunningStatus;
  bFreeCAMode = other.bFreeCAMode;
  iDescriptorsLoopLength = other.iDescriptorsLoopLength;
  // The service descriptor's own copy carries no names.
  pService = RavelDescriptorSlot_CopyOf(other.pService);
  pLogoTransmission = RavelDescriptorSlot_CopyOf(other.pLogoTransmission);
  pCountryAvailability = RavelDescriptorSlot_CopyOf(other.pCountryAvailability);
  return *this;
}

RavelCServiceDescription::~RavelCServiceDescription() { DeleteDescriptors(); }

void RavelCServiceDescription::ClearScalars() {
  iServiceId = 0;
  iEITCompanyDefFlag = 0;
  bEITScheduleFlag = 0;
  bEITPresentFollowingFlag = 0;
  iRunningStatus = 0;
  bFreeCAMode = 0;
  iDescriptorsLoopLength = 0;
}

void RavelCServiceDescription::DeleteDescriptors() {
  RavelDescriptorSlot_Release(pService);
  RavelDescriptorSlot_Release(pLogoTransmission);
  RavelDescriptorSlot_Release(pCountryAvailability);
}

int RavelCServiceDescription::ParseRawData(unsigned char* entry) {
  DeleteDescriptors();
  if (entry == 0) {
    ClearScalars();
    return kRavelErrInvalidArgument;
  }
  iServiceId = RavelCReadWindow::Read16(entry);
  const unsigned char flags = RavelCReadWindow::Read8(entry + 2);
  const unsigned char status = RavelCReadWindow::Read8(entry + 3);
  iEITCompanyDefFlag = (flags >> 2) & 0x07;  // ...xxx..
  bEITScheduleFlag = (flags >> 1) & 0x01;    // ......x.
  bEITPresentFollowingFlag = flags & 0x01;   // .......x
  iRunningStatus = (status >> 5) & 0x07;     // xxx.....
  bFreeCAMode = (status >> 4) & 0x01;        // ...x....
  iDescriptorsLoopLength = RavelCReadWindow::Read12(entry + 3);  // ....xxxx xxxxxxxx
  if (iDescriptorsLoopLength == 0) return kRavelOk;

  // The loop stops at the end of the section whatever its length says.
  const int end = kServiceHeaderSize + RavelCReadWindow::Readable(entry + kServiceHeaderSize, iDescriptorsLoopLength);
  int at = kServiceHeaderSize;
  do {
    unsigned char* descriptor = entry + at;
    if (RavelCReadWindow::Unreadable(descriptor)) break;
    const unsigned char tag = descriptor[0];
    const unsigned char length = RavelCReadWindow::Read8(descriptor + 1);
    if (tag == 0 || length == 0) {
      RAVEL_TRACE(RAVEL_PARSER_WARNING, "Invalid Descriptor Tag & Length!! descrTag=[0x%02x], descrLen=[%d]\n", tag,
                  length);
      ClearScalars();
      DeleteDescriptors();
      return kRavelErrCorruptSection;
    }
    // The descriptors' own parse results are not looked at; a later descriptor
    // of the same tag replaces the earlier one.
    switch (tag) {
      case kTagService:
        RavelDescriptorSlot_Replace(pService, descriptor);
        break;
      case kTagCountryAvailability:
        RavelDescriptorSlot_Replace(pCountryAvailability, descriptor);
        break;
      case kTagDigitalCopyControl:
        RAVEL_TRACE(RAVEL_PARSER_WARNING,
                    "SDT ServiceDescription Parsing.. Digital Copy Control Descriptor Tag=[0x%02x]\n", tag);
        break;
      case kTagLogoTransmission:
        RavelDescriptorSlot_Replace(pLogoTransmission, descriptor);
        break;
      default:
        RAVEL_TRACE(RAVEL_PARSER_WARNING, "SDT ServiceDescription Parsing.. Unknown Descriptor Tag=[0x%02x]\n", tag);
        break;
    }
    at += 2 + length;
  } while (at < end);
  return kRavelOk;
}

void RavelCServiceDescription::Show() {
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Service ID=[0x%04x]\n", iServiceId);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "EITCompanyDefFlag=[%d]\n", iEITCompanyDefFlag);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "EITScheduleFlag=[%d]\n", bEITScheduleFlag);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "EITPresentFollowingFlag=[%d]\n", bEITPresentFollowingFlag);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Running Status=[%d]\n", iRunningStatus);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "FreeCAMode=[%d]\n", bFreeCAMode);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Descriptors Loop Len=[%d]\n", iDescriptorsLoopLength);
  if (pService != 0) pService->Show();
  if (pLogoTransmission != 0) pLogoTransmission->Show();
  if (pCountryAvailability != 0) pCountryAvailability->Show();
}

// ---------------------------------------------------------------------------
// RavelCSDT

RavelCSDT::RavelCSDT(unsigned char* section) : RavelCTableBase(0), aServiceList() {
  ParseRawData(section);
}

RavelCSDT::RavelCSDT(RavelCSDT& other) : RavelCTableBase(0), aServiceList() {
  *this = other;
}

RavelCSDT& RavelCSDT::operator=(RavelCSDT& other) {
  CopyHeader(other);
  iOriginalNetworkId = other.iOriginalNetworkId;
  // The target's services go first, so assigning a table to itself empties it.
  DeleteServices();
  RavelRecordList_AppendCopies(aServiceList, other.aServiceList);
  return *this;
}

RavelCSDT& RavelCSDT::operator+=(RavelCSDT& other) {
  if (!RAVEL_TABLE_MERGE_CHECK_VERSION(*this, other, "SDT")) return *this;
  RavelRecordList_AppendCopies(aServiceList, other.aServiceList);
  return *this;
}

RavelCSDT::~RavelCSDT() { DeleteServices(); }

void RavelCSDT::DeleteServices() { RavelRecordList_DeleteAll(aServiceList); }

int RavelCSDT::ParseRawData(unsigned char* section) {
  RavelCReadWindow window(section);
  DeleteServices();
  if (section == 0) {
    iOriginalNetworkId = 0;
    return kRavelErrInvalidArgument;
  }
  int result = CheckCrcAndParseHeader(section, kRavelTraceSourcePath, __LINE__, "SDT Section: CRC Error!\n");
  if (result != kRavelOk) {
    iOriginalNetworkId = 0;
    return result;
  }
  if (iTableId == kSDTActualTableId) {
    SetTableName("SDT Actual");
  } else if (iTableId == kSDTOtherTableId) {
    SetTableName("SDT Other");
  } else {
    RAVEL_TRACE(RAVEL_PARSER_ERROR, "Table ID isn't for SDT! Table ID=[0x%02x]\n", iTableId);
    iOriginalNetworkId = 0;
    return kRavelErrInvalidArgument;
  }
  // A single byte access: the upper byte of original_network_id, the low byte
  // (byte 9) is not taken in.
  iOriginalNetworkId = RavelCReadWindow::Read8(section + 8);

  const int end = iSectionLength - 1;  // the first CRC_32 byte
  int at = kServiceLoopStart;
  if (at >= end) return kRavelOk;
  do {
    unsigned char* entry = section + at;
    RavelCServiceDescription* service = new RavelCServiceDescription(0);
    if (service->ParseRawData(entry) != kRavelOk) {
      // A malformed descriptor loop of any service fails the whole section.
      RAVEL_TRACE(RAVEL_PARSER_WARNING, "SDT Info Parsing Fail! Maybe data has been corrupted!\n");
      delete service;
      DeleteServices();
      iOriginalNetworkId = 0;
      return kRavelErrCorruptSection;
    }
    aServiceList.Append(service);
    at += kServiceHeaderSize + service->iDescriptorsLoopLength;
  } while (at < end);
  return kRavelOk;
}

void RavelCSDT::Show() {
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#################################################################\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "###################### SDT Table Information ######################\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#################################################################\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "####################### Header Information ########################\n");
  RavelCTableBase::Show();
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#################################################################\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "####################### Body Information #######################\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Original Network ID = [0x%04x]\n", iOriginalNetworkId);
  for (int i = 0; i < aServiceList.iCount; ++i) {
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "##################### Service Description [%d] #####################\n", i);
    aServiceList.ipArray[i]->Show();
  }
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#################################################################\n");
}
