#include "Ravel_CTableStreamEventDescriptor.h"

#include "Ravel_RecordList.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"
#include "Ravel_Util.h"
#include "Ravel_DescriptorSlot.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CTableStreamEventDescriptor");

#define RAVEL_TAG_NPT_REFERENCE 0x17
#define RAVEL_TAG_GENERAL_EVENT 0x40

RavelCDsmccStreamEvent::RavelCDsmccStreamEvent(unsigned char* section)
    : RavelCTableBase(0), cGeneralEvents() {
  ParseRawData(section);
}

RavelCDsmccStreamEvent::RavelCDsmccStreamEvent(RavelCDsmccStreamEvent& other)
    : RavelCTableBase(0), cGeneralEvents() {
  *this = other;
}

RavelCDsmccStreamEvent& RavelCDsmccStreamEvent::operator=(RavelCDsmccStreamEvent& other) {
  CopyHeader(other);
  // Released before `other` is read: assigned to itself, a table is left with
  // neither its NPT reference nor its general events.
  ReleaseDescriptors();
  pNPTReference = RavelDescriptorSlot_CopyOf(other.pNPTReference);
  // General events are never copied: the copy runs over the target's own count,
  // which is 0 here, so a copy's list is always empty; callers rely on that.
  return *this;
}

RavelCDsmccStreamEvent::~RavelCDsmccStreamEvent() { ReleaseDescriptors(); }

void RavelCDsmccStreamEvent::ReleaseDescriptors() {
  RavelDescriptorSlot_Release(pNPTReference);
  RavelRecordList_DeleteAll(cGeneralEvents);
}

int RavelCDsmccStreamEvent::ParseRawData(unsigned char* section) {
  RavelCReadWindow window(section);
  ReleaseDescriptors();
  if (section == 0) return kRavelErrInvalidArgument;
  // The header is read before the CRC check, so a corrupt section still shows it.
  RavelCTableBase::ParseRawData(section);
  if (bSectionSyntaxIndicator != 1) {
    // Such sections end in a checksum, which is not verified.
    RAVEL_TRACE(RAVEL_PARSER_WARNING, "Section Stream Descriptor Parding. CheckSum needed!\n");
  } else if (!RavelUtil_CheckSectionCRC32(section)) {
    RAVEL_TRACE(RAVEL_PARSER_WARNING, "Stream Descriptor Event: CRC Error!\n");
    return kRavelErrCorruptSection;
  }
  SetTableName("Stream Descriptor Event Table");
  if (iSectionLength < 10) return kRavelOk;

  // Descriptors run from byte 8 up to the CRC_32 (byte section_length - 1).
  unsigned char* at = section + 8;
  unsigned char* end = section + iSectionLength - 1;
  while (at < end) {
    unsigned char tag = at[0];
    unsigned char length = at[1];
    if (tag == 0 || length == 0) {
      RAVEL_TRACE(RAVEL_PARSER_WARNING, "Invalid Descriptor Tag & Length!! descrTag=[0x%02x], descrLen=[%d]\n", tag,
                  length);
      ReleaseDescriptors();
      return kRavelErrCorruptSection;
    }
    if (tag == RAVEL_TAG_GENERAL_EVENT) {
      RavelCGeneralEventDescriptor* event = new RavelCGeneralEventDescriptor(0);
      int result = event->ParseRawData(at);
      if (result != kRavelOk) {
        RAVEL_TRACE(RAVEL_PARSER_ERROR, "General Event Reference Parsing Fail! iResult=[%d]\n", result);
        delete event;
      } else {
        cGeneralEvents.Append(event);
      }
    } else if (tag == RAVEL_TAG_NPT_REFERENCE) {
      if (pNPTReference != 0) {
        RAVEL_TRACE(RAVEL_PARSER_WARNING, "Duplicated NPT Reference!\n");
        delete pNPTReference;
        pNPTReference = 0;
      }
      // Built empty first, which traces the descriptor's "Invalid Argument!".
      pNPTReference = new RavelCNPTReferenceDescriptor(0);
      int result = pNPTReference->ParseRawData(at);
      if (result != kRavelOk) {
        RAVEL_TRACE(RAVEL_PARSER_ERROR, "NPT Reference Parsing Fail! iResult=[%d]\n", result);
        delete pNPTReference;
        pNPTReference = 0;
      }
    } else {
      RAVEL_TRACE(RAVEL_PARSER_WARNING, "Stream Descriptor Parsing. Unkown Descriptor Tag=[0x%02x]\n", tag);
    }
    at += length + 2;
  }
  return kRavelOk;
}

void RavelCDsmccStreamEvent::Show() {
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#################################################\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#### DSMCC Stream Descriptor Table Information\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "# Header Information\n");
  RavelCTableBase::Show();
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "# Body Information\n");
  if (pNPTReference != 0) pNPTReference->Show();
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "# The number of General Event Descriptor=[%d]\n", cGeneralEvents.iCount);
  for (int i = 0; i < cGeneralEvents.iCount; ++i) cGeneralEvents.ipArray[i]->Show();
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#################################################\n");
}
