#include "Ravel_CDescriptorGeneralEvent.h"

#include <cstring>

#include "Ravel_ByteOrder.h"
#include "Ravel_CDateCode.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_DescriptorText.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorGeneralEvent");

const RavelCDescriptorKind RavelCGeneralEventDescriptor::kKind = {
    0x40,
    "General Event Descriptor",
    "This Descriptor isn't  General Event Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== General Event Descriptor ===================\n",
    RAVEL_WRONG_TAG_MASK,
    false, kRavelTraceSourcePath};

namespace {

void ClearFields(RavelCGeneralEventDescriptor& d) {
  d.iEventMsgGroupId = 0;
  d.iTimeMode = 0;
  d.cEventMsgMJDJSTTime = RavelCDateTime();
  std::memset(d.aEventMsgNPT, 0, sizeof(d.aEventMsgNPT));
  std::memset(&d.cEventMsgRelativeTime, 0, sizeof(d.cEventMsgRelativeTime));
  d.iEventMsgType = 0;
  d.iEventMsgId = 0;
  d.iPrivateDataLength = 0;
  d.pPrivateData = 0;
}

}  // namespace

RavelCGeneralEventDescriptor::RavelCGeneralEventDescriptor(unsigned char* raw) {
  ClearFields(*this);
  ParseRawData(raw);
}

RavelCGeneralEventDescriptor::RavelCGeneralEventDescriptor(RavelCGeneralEventDescriptor& other)
    : RavelCDescriptorBase(other) {
  ClearFields(*this);
  *this = other;
}

RavelCGeneralEventDescriptor& RavelCGeneralEventDescriptor::operator=(RavelCGeneralEventDescriptor& other) {
  if (this == &other) return *this;
  RavelText_FreeCText(pPrivateData);
  RavelCDescriptorBase::operator=(other);
  iEventMsgGroupId = other.iEventMsgGroupId;
  iTimeMode = other.iTimeMode;
  cEventMsgMJDJSTTime = other.cEventMsgMJDJSTTime;
  std::memcpy(aEventMsgNPT, other.aEventMsgNPT, sizeof(aEventMsgNPT));
  cEventMsgRelativeTime = other.cEventMsgRelativeTime;
  iEventMsgType = other.iEventMsgType;
  iEventMsgId = other.iEventMsgId;
  iPrivateDataLength = other.iPrivateDataLength;
  // Duplicated as a C text: up to its first 0 byte.
  pPrivateData = RavelText_DuplicateCText(other.pPrivateData);
  return *this;
}

RavelCGeneralEventDescriptor::~RavelCGeneralEventDescriptor() { RavelText_FreeCText(pPrivateData); }

int RavelCGeneralEventDescriptor::ParseRawData(unsigned char* raw) {
  // A refused descriptor keeps everything of its earlier parse, private data included.
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  RavelText_FreeCText(pPrivateData);

  iEventMsgGroupId = static_cast<unsigned short>(RavelCReadWindow::Read16(raw + 2) >> 4);  // 12 bits, then xxxx----
  iTimeMode = RavelCReadWindow::Read8(raw + 4);
  switch (iTimeMode) {
    case 0:
      break;
    case 1:
    case 5:
      RavelDateCode_DecodeDateTime(raw + 5, cEventMsgMJDJSTTime);
      break;
    case 2:
      aEventMsgNPT[0] = RavelCReadWindow::Read8(raw + 5) & 0x01;  // -------1: bit 32
      RavelCReadWindow::Copy(aEventMsgNPT + 1, raw + 6, 4);
      break;
    case 3: {
      // The BCD digits sit four bits further on, after 4 reserved bits.
      unsigned char digits[4];  // bytes 5 to 8
      RavelCReadWindow::Copy(digits, raw + 5, sizeof(digits));
      cEventMsgRelativeTime.iHours = (digits[0] & 0x0F) * 10 + (digits[1] >> 4);
      cEventMsgRelativeTime.iMinutes = (digits[1] & 0x0F) * 10 + (digits[2] >> 4);
      cEventMsgRelativeTime.iSeconds = (digits[2] & 0x0F) * 10 + (digits[3] >> 4);
      break;
    }
    default:
      RAVEL_TRACE(RAVEL_PARSER_WARNING, "Unknown Time Mode =[0x%x]\n", iTimeMode);
      break;
  }
  // Fixed positions whatever the time mode, even where no time field was sent.
  iEventMsgType = RavelCReadWindow::Read8(raw + 10);
  iEventMsgId = RavelCReadWindow::Read16(raw + 11);
  // 8-bit on purpose: a descriptor_length of 10 gives 255 (the receivers' value).
  iPrivateDataLength = static_cast<unsigned char>(iDescriptorLength - 11);
  pPrivateData = RavelText_NewCText(raw + 13, iPrivateDataLength);
  return kRavelOk;
}

void RavelCGeneralEventDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t EventMsgGroupID=[%d], TimeMode=[%d]\n", iEventMsgGroupId, iTimeMode);
  switch (iTimeMode) {
    case 1:
    case 5:
      RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t EventMsg_MJDJSTTime =[%d.%d.%d - %d:%d:%d]\n", cEventMsgMJDJSTTime.iYear,
                  cEventMsgMJDJSTTime.iMonth, cEventMsgMJDJSTTime.iDay, cEventMsgMJDJSTTime.iHour,
                  cEventMsgMJDJSTTime.iMinute, cEventMsgMJDJSTTime.iSecond);
      break;
    case 2:
      RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t EventMsg_NPT=[0x%02x 0x%02x 0x%02x 0x%02x 0x%02x]\n", aEventMsgNPT[0],
                  aEventMsgNPT[1], aEventMsgNPT[2], aEventMsgNPT[3], aEventMsgNPT[4]);
      break;
    case 3:
      RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t EventMsg_RelativeTime =[%d:%d:%d]\n", cEventMsgRelativeTime.iHours,
                  cEventMsgRelativeTime.iMinutes, cEventMsgRelativeTime.iSeconds);
      break;
    default:
      // Time mode 0 too: the dump knows only the modes that carry a time.
      RAVEL_TRACE(RAVEL_PARSER_WARNING, "Unknown Time Mode =[0x%x]\n", iTimeMode);
      break;
  }
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t EventMsgType=[%d], EventMsgID=[0x%04x]\n", iEventMsgType, iEventMsgId);
}
