#include "Ravel_CTableEIT.h"

#include "Ravel_ByteOrder.h"
#include "Ravel_CDateCode.h"
#include "Ravel_CDescriptorAudioComponent.h"
#include "Ravel_CDescriptorComponent.h"
#include "Ravel_CDescriptorContent.h"
#include "Ravel_CDescriptorCopyright.h"
#include "Ravel_CDescriptorExtendedEvent.h"
#include "Ravel_CDescriptorParentalRating.h"
#include "Ravel_CDescriptorSeries.h"
#include "Ravel_CDescriptorShortEvent.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"
#include "Ravel_DescriptorSlot.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CTableEIT");

namespace {

// event_id, start_time, duration and the flags with descriptors_loop_length.
const int kEventFixedSize = 12;
// The common header and transport_stream_id to last_table_id.
const int kEventLoopStart = 14;

const unsigned char kTagCopyright = 0x0D;
const unsigned char kTagShortEvent = 0x4D;
const unsigned char kTagExtendedEvent = 0x4E;
const unsigned char kTagComponent = 0x50;
const unsigned char kTagContent = 0x54;
const unsigned char kTagParentalRating = 0x55;
const unsigned char kTagDigitalCopyControl = 0xC1;
const unsigned char kTagAudioComponent = 0xC4;
const unsigned char kTagSeries = 0xD5;

// 0x4E and 0x4F present/following, 0x50 the first actual schedule table, 0x60
// to 0x6F the other schedule tables. The further actual schedule tables 0x51 to
// 0x5F are not taken.
bool IsEITTableId(unsigned char tableId) {
  return tableId == 0x4E || tableId == 0x4F || tableId == 0x50 || (tableId >> 4) == 0x6;
}

const char* EITTableName(unsigned char tableId) {
  switch (tableId) {
    case 0x4E:
      return "EIT Actual";
    case 0x4F:
      return "EIT Other";
    case 0x50:
      return "EIT schedule Actual";
    default:
      return "EIT schedule Other";
  }
}

void ReleaseAudioComponent(void* element) { delete static_cast<RavelCAudioComponentDescriptor*>(element); }

}  // namespace

// ---------------------------------------------------------------------------
// RavelCEventInfo

RavelCEventInfo::RavelCEventInfo(unsigned char* event) {
  ClearFields();
  ResetAudioComponentList();
  if (event != 0) ParseRawData(event);
}

RavelCEventInfo::RavelCEventInfo(RavelCEventInfo& other) {
  ClearFields();
  ResetAudioComponentList();
  *this = other;
}

RavelCEventInfo& RavelCEventInfo::operator=(RavelCEventInfo& other) {
  // Released before anything is read from `other`: an event assigned to itself
  // keeps its fields but no descriptor.
  DeleteDescriptors();
  ResetAudioComponentList();
  iEventId = other.iEventId;
  cStartTime = other.cStartTime;
  iDurationHour = other.iDurationHour;
  iDurationMinute = other.iDurationMinute;
  iDurationSecond = other.iDurationSecond;
  iRunningStatus = other.iRunningStatus;
  bFreeCAMode = other.bFreeCAMode;
  iDescriptorsLoopLength = other.iDescriptorsLoopLength;
  pShortEventDescriptor = RavelDescriptorSlot_CopyOf(other.pShortEventDescriptor);
  pContentDescriptor = RavelDescriptorSlot_CopyOf(other.pContentDescriptor);
  pComponentDescriptor = RavelDescriptorSlot_CopyOf(other.pComponentDescriptor);
  pParentalRatingDescriptor = RavelDescriptorSlot_CopyOf(other.pParentalRatingDescriptor);
  // As many as the list's 8-bit count tells.
  int audioCount = other.GetAudioComponentCount();
  for (int i = 0; i < audioCount; ++i) {
    RavelCAudioComponentDescriptor* audio = other.GetAudioComponent(i);
    if (audio != 0) list_insert(pAudioComponentList, new RavelCAudioComponentDescriptor(*audio));
  }
  pCopyrightDescriptor = RavelDescriptorSlot_CopyOf(other.pCopyrightDescriptor);
  pExtendedEventDescriptor = RavelDescriptorSlot_CopyOf(other.pExtendedEventDescriptor);
  pSeriesDescriptor = RavelDescriptorSlot_CopyOf(other.pSeriesDescriptor);
  iSpare = other.iSpare;
  return *this;
}

RavelCEventInfo::~RavelCEventInfo() {
  DeleteDescriptors();
  ReleaseAudioComponentList();
}

void RavelCEventInfo::ClearFields() {
  iEventId = 0;
  cStartTime = RavelCDateTime();
  iDurationHour = 0;
  iDurationMinute = 0;
  iDurationSecond = 0;
  iRunningStatus = 0;
  bFreeCAMode = 0;
  iDescriptorsLoopLength = 0;
}

void RavelCEventInfo::DeleteDescriptors() {
  RavelDescriptorSlot_Release(pShortEventDescriptor);
  RavelDescriptorSlot_Release(pContentDescriptor);
  RavelDescriptorSlot_Release(pComponentDescriptor);
  RavelDescriptorSlot_Release(pParentalRatingDescriptor);
  RavelDescriptorSlot_Release(pCopyrightDescriptor);
  RavelDescriptorSlot_Release(pExtendedEventDescriptor);
  RavelDescriptorSlot_Release(pSeriesDescriptor);
}

void RavelCEventInfo::ResetAudioComponentList() {
  if (pAudioComponentList == 0) {
    pAudioComponentList = new list_head;
  } else {
    list_removeAll(pAudioComponentList);
  }
  list_initialize(pAudioComponentList);
  list_set_release(pAudioComponentList, ReleaseAudioComponent);
}

void RavelCEventInfo::ReleaseAudioComponentList() {
  if (pAudioComponentList == 0) return;
  list_removeAll(pAudioComponentList);
  delete pAudioComponentList;
  pAudioComponentList = 0;
}

int RavelCEventInfo::GetAudioComponentCount() const {
  return pAudioComponentList != 0 ? pAudioComponentList->count : 0;
}

RavelCAudioComponentDescriptor* RavelCEventInfo::GetAudioComponent(int index) const {
  if (pAudioComponentList == 0) return 0;
  return static_cast<RavelCAudioComponentDescriptor*>(list_element(pAudioComponentList, index));
}

int RavelCEventInfo::ParseRawData(unsigned char* event) {
  DeleteDescriptors();
  ResetAudioComponentList();
  if (event == 0) {
    ClearFields();
    return kRavelErrInvalidArgument;
  }
  iEventId = RavelCReadWindow::Read16(event);
  // The date rule gives the first of a month as day 31 or 32 of the month before.
  RavelDateCode_DecodeDateTime(event + 2, cStartTime);
  iDurationHour = RavelBcd(RavelCReadWindow::Read8(event + 7));
  iDurationMinute = RavelBcd(RavelCReadWindow::Read8(event + 8));
  iDurationSecond = RavelBcd(RavelCReadWindow::Read8(event + 9));
  const unsigned char status = RavelCReadWindow::Read8(event + 10);
  iRunningStatus = static_cast<unsigned char>(status >> 5);           // xxx.....
  bFreeCAMode = static_cast<unsigned char>((status >> 4) & 0x01);     // ...x....
  iDescriptorsLoopLength = RavelCReadWindow::Read12(event + 10);      // ....xxxx xxxxxxxx
  if (iDescriptorsLoopLength == 0) return kRavelOk;

  // The loop stops at the end of the section whatever its length says.
  unsigned char* position = event + kEventFixedSize;
  const unsigned char* end = RavelCReadWindow::Clamp(position, position + iDescriptorsLoopLength);
  do {
    if (RavelCReadWindow::Unreadable(position)) break;
    unsigned char tag = position[0];
    unsigned char length = RavelCReadWindow::Read8(position + 1);
    if (tag == 0 || length == 0) {
      // An empty descriptor is taken for corruption, although the standards allow it.
      RAVEL_TRACE(RAVEL_PARSER_WARNING, "Invalid Descriptor Tag & Length!! descrTag=[0x%02x], descrLen=[%d]\n", tag,
                  length);
      ClearFields();
      DeleteDescriptors();
      ReleaseAudioComponentList();
      return kRavelErrCorruptSection;
    }
    switch (tag) {
      case kTagCopyright:
        RavelDescriptorSlot_Replace(pCopyrightDescriptor, position);
        break;
      case kTagShortEvent:
        RavelDescriptorSlot_Replace(pShortEventDescriptor, position);
        break;
      case kTagExtendedEvent:
        RavelDescriptorSlot_Replace(pExtendedEventDescriptor, position);
        break;
      case kTagComponent:
        RavelDescriptorSlot_Replace(pComponentDescriptor, position);
        break;
      case kTagContent:
        RavelDescriptorSlot_Replace(pContentDescriptor, position);
        break;
      case kTagParentalRating:
        RavelDescriptorSlot_Replace(pParentalRatingDescriptor, position);
        break;
      case kTagDigitalCopyControl:
        RAVEL_TRACE(RAVEL_PARSER_WARNING, "EIT EventInfo Parsing.. Digital Copy Control Descriptor Tag=[0x%02x]\n",
                    tag);
        break;
      case kTagAudioComponent:
        list_insert(pAudioComponentList, new RavelCAudioComponentDescriptor(position));
        break;
      case kTagSeries:
        RavelDescriptorSlot_Replace(pSeriesDescriptor, position);
        break;
      default:
        RAVEL_TRACE(RAVEL_PARSER_WARNING, "EIT EventInfo Parsing.. Unknown Descriptor Tag=[0x%02x]\n", tag);
        break;
    }
    position += length + 2;
  } while (position < end);
  return kRavelOk;
}

void RavelCEventInfo::Show() {
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Event Id=[%d]\n", iEventId);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Start Time=[%d.%d.%d - %d:%d:%d]\n", cStartTime.iYear, cStartTime.iMonth,
              cStartTime.iDay, cStartTime.iHour, cStartTime.iMinute, cStartTime.iSecond);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Duration=[%d:%d:%d]\n", iDurationHour, iDurationMinute, iDurationSecond);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Running Status=[%d]\n", iRunningStatus);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "FreeCAMode=[%d]\n", bFreeCAMode);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Descriptors Loop Len=[%d]\n", iDescriptorsLoopLength);
  if (pShortEventDescriptor != 0) pShortEventDescriptor->Show();
  if (pContentDescriptor != 0) pContentDescriptor->Show();
  if (pComponentDescriptor != 0) pComponentDescriptor->Show();
  if (pParentalRatingDescriptor != 0) pParentalRatingDescriptor->Show();
  int audioCount = GetAudioComponentCount();
  for (int i = 0; i < audioCount; ++i) {
    RavelCAudioComponentDescriptor* audio = GetAudioComponent(i);
    if (audio != 0) audio->Show();
  }
  if (pCopyrightDescriptor != 0) pCopyrightDescriptor->Show();
  if (pExtendedEventDescriptor != 0) pExtendedEventDescriptor->Show();
  if (pSeriesDescriptor != 0) pSeriesDescriptor->Show();
}

int RavelCEventInfo::operator<(const RavelCEventInfo& other) const { return cStartTime < other.cStartTime ? 1 : 0; }
int RavelCEventInfo::operator<=(const RavelCEventInfo& other) const { return cStartTime <= other.cStartTime ? 1 : 0; }
int RavelCEventInfo::operator>(const RavelCEventInfo& other) const { return cStartTime > other.cStartTime ? 1 : 0; }
int RavelCEventInfo::operator>=(const RavelCEventInfo& other) const { return cStartTime >= other.cStartTime ? 1 : 0; }

// ---------------------------------------------------------------------------
// RavelCEIT

RavelCEIT::RavelCEIT(unsigned char* section)
    : RavelCTableBase(0), aEventInfo() {
  ParseRawData(section);
}

RavelCEIT::RavelCEIT(RavelCEIT& other)
    : RavelCTableBase(0), aEventInfo() {
  CopyHeader(other);
  *this = other;
}

RavelCEIT& RavelCEIT::operator=(RavelCEIT& other) {
  aEventInfo.RemoveAll();
  CopyHeader(other);
  iTransportStreamId = other.iTransportStreamId;
  iOriginalNetworkId = other.iOriginalNetworkId;
  iSegmentLastSectionNumber = other.iSegmentLastSectionNumber;
  iLastTableId = other.iLastTableId;
  for (int i = 0; i < other.aEventInfo.iCount; ++i) {
    aEventInfo.Append(new RavelCEventInfo(*other.aEventInfo.ipArray[i]));
  }
  return *this;
}

RavelCEIT::~RavelCEIT() {}

void RavelCEIT::ClearFields() {
  iTransportStreamId = 0;
  iOriginalNetworkId = 0;
  iSegmentLastSectionNumber = 0;
  iLastTableId = 0;
}

RavelCEIT& RavelCEIT::operator+=(RavelCEIT& other) {
  if (iTransportStreamId == other.iTransportStreamId && iOriginalNetworkId == other.iOriginalNetworkId &&
      iVersionNumber == other.iVersionNumber) {
    // The count is taken first, so a table joined with itself doubles its events.
    int count = other.aEventInfo.iCount;
    for (int i = 0; i < count; ++i) {
      aEventInfo.Append(new RavelCEventInfo(*other.aEventInfo.ipArray[i]));
    }
    aEventInfo.Sort();
    return *this;
  }
  RAVEL_TRACE(RAVEL_PARSER_ERROR, "Two EIT Information have different information!\n");
  RAVEL_TRACE(RAVEL_PARSER_ERROR, "THIS: TS ID=[%d], Org Network ID=[%d], VersionNum=[%d]\n", iTransportStreamId,
              iOriginalNetworkId, iVersionNumber);
  RAVEL_TRACE(RAVEL_PARSER_ERROR, "OTHER: TS ID=[%d], Org Network ID=[%d], VersionNum=[%d]\n", other.iTransportStreamId,
              other.iOriginalNetworkId, other.iVersionNumber);
  return *this;
}

int RavelCEIT::ParseRawData(unsigned char* section) {
  RavelCReadWindow window(section);
  aEventInfo.RemoveAll();
  if (section == 0) {
    ClearFields();
    return kRavelErrInvalidArgument;
  }
  // On a CRC error the header is left as the previous parse set it.
  if (CheckCrcAndParseHeader(section, kRavelTraceSourcePath, __LINE__, "EIT Section: CRC Error!\n") != kRavelOk) {
    ClearFields();
    return kRavelErrCorruptSection;
  }
  if (!IsEITTableId(iTableId)) {
    RAVEL_TRACE(RAVEL_PARSER_ERROR, "Table ID isn't for EIT! Table ID=[0x%02x]\n", iTableId);
    ClearFields();
    return kRavelErrInvalidArgument;
  }
  iEITTableId = iTableId;
  SetTableName(EITTableName(iTableId));
  iTransportStreamId = RavelCReadWindow::Read16(section + 8);
  iOriginalNetworkId = RavelCReadWindow::Read16(section + 10);
  iSegmentLastSectionNumber = RavelCReadWindow::Read8(section + 12);
  iLastTableId = RavelCReadWindow::Read8(section + 13);

  // Events are trusted to stay inside the section once its CRC has matched.
  unsigned char* position = section + kEventLoopStart;
  unsigned char* end = section + iSectionLength - 1;  // the first CRC_32 byte
  while (position < end) {
    RavelCEventInfo* event = new RavelCEventInfo(0);
    if (event->ParseRawData(position) != kRavelOk) {
      RAVEL_TRACE(RAVEL_PARSER_WARNING, "EIT Info Parsing Fail! Maybe data has been corrupted!\n");
      ClearFields();
      delete event;
      aEventInfo.RemoveAll();
      return kRavelErrCorruptSection;
    }
    aEventInfo.Append(event);
    position += kEventFixedSize + event->iDescriptorsLoopLength;
  }
  return kRavelOk;
}

void RavelCEIT::Show() {
  static const char kRule[] = "#################################################################\n";
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "%s", kRule);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "###################### EIT Table Information ######################\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "%s", kRule);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "####################### Header Information ########################\n");
  RavelCTableBase::Show();
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "# Body Information\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Transport Stream ID = [0x%04x]\n", iTransportStreamId);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Original Network ID = [0x%04x]\n", iOriginalNetworkId);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Segment Last Section Num=[%d]\n", iSegmentLastSectionNumber);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Last Table ID=[%d]\n", iLastTableId);
  for (int i = 0; i < aEventInfo.iCount; ++i) {
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "##################### Event Information [%d] #####################\n", i);
    aEventInfo.ipArray[i]->Show();
  }
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "%s", kRule);
}
