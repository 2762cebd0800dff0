#include "Ravel_CTableBIT.h"

#include "Ravel_RecordList.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"
#include "Ravel_DescriptorSlot.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CTableBIT");

namespace {

const unsigned char kBITTableId = 0xC4;
const unsigned char kTagExtendedBroadcaster = 0xCE;

// Byte 8: view propriety and first_descriptors_length; the first loop starts at byte 10.
const int kFirstDescriptorsLengthAt = 8;
const int kFirstDescriptorsAt = 10;
// broadcaster_id and the descriptors length field.
const int kBroadcasterFixedSize = 3;
// section_length counts the header bytes after it (5), bytes 8 and 9 and the CRC_32.
const int kSectionLengthWithoutLoops = 11;

}  // namespace

// ---------------------------------------------------------------------------
// RavelCBroadcasterDescriptor

RavelCBroadcasterDescriptor::RavelCBroadcasterDescriptor(unsigned char* record) {
  ParseRawData(record);
}

RavelCBroadcasterDescriptor::RavelCBroadcasterDescriptor(RavelCBroadcasterDescriptor& other) {
  *this = other;
}

RavelCBroadcasterDescriptor& RavelCBroadcasterDescriptor::operator=(RavelCBroadcasterDescriptor& other) {
  if (this == &other) return *this;
  DeleteDescriptor();
  iBroadcasterId = other.iBroadcasterId;
  iBroadcasterDescriptorsLength = other.iBroadcasterDescriptorsLength;
  pExtendedBroadcasterDescriptor = RavelDescriptorSlot_CopyOf(other.pExtendedBroadcasterDescriptor);
  return *this;
}

RavelCBroadcasterDescriptor::~RavelCBroadcasterDescriptor() { DeleteDescriptor(); }

void RavelCBroadcasterDescriptor::DeleteDescriptor() {
  RavelDescriptorSlot_Release(pExtendedBroadcasterDescriptor);
}

int RavelCBroadcasterDescriptor::ParseRawData(unsigned char* record) {
  DeleteDescriptor();
  if (record == 0) {
    iBroadcasterId = 0;
    iBroadcasterDescriptorsLength = 0;
    return kRavelErrInvalidArgument;
  }
  iBroadcasterId = RavelCReadWindow::Read8(record);
  iBroadcasterDescriptorsLength = RavelCReadWindow::Read12(record + 1);  // ----xxxx xxxxxxxx

  // Only the descriptor at byte 3 is looked at, even when the descriptors length
  // is 0 and those bytes belong to the next record or to the CRC_32; the rest of
  // the broadcaster's descriptors is skipped unread by the table.
  unsigned char* descriptor = record + kBroadcasterFixedSize;
  unsigned char tag = RavelCReadWindow::Read8(descriptor);
  unsigned char length = RavelCReadWindow::Read8(descriptor + 1);
  if (tag == 0 || length == 0) {
    RAVEL_TRACE(RAVEL_PARSER_WARNING, "Invalid Descriptor Tag & Length!! descrTag=[0x%02x], descrLen=[%d]\n", tag,
                length);
    iBroadcasterId = 0;
    iBroadcasterDescriptorsLength = 0;
    return kRavelErrCorruptSection;
  }
  if (tag == kTagExtendedBroadcaster) {
    pExtendedBroadcasterDescriptor = new RavelCExtendedBroadcasterDescriptor(descriptor);
    return kRavelOk;
  }
  RAVEL_TRACE(RAVEL_PARSER_WARNING, "BIT BroadcasterDescriptor Parsing.. Unkown Descriptor Tag=[0x%02x]\n", tag);
  return kRavelOk;
}

void RavelCBroadcasterDescriptor::Show() {
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tTS Information : BroadcasterID=[0x%04x], BroadcasterDescriptorLen=[0x%04x]\n",
              iBroadcasterId, iBroadcasterDescriptorsLength);
  if (pExtendedBroadcasterDescriptor != 0) pExtendedBroadcasterDescriptor->Show();
}

// ---------------------------------------------------------------------------
// RavelCBIT

RavelCBIT::RavelCBIT(unsigned char* section)
    : RavelCTableBase(0), aBroadcasterDescriptor() {
  RavelCBIT::ParseRawData(section);
}

RavelCBIT::RavelCBIT(RavelCBIT& other)
    : RavelCTableBase(0), aBroadcasterDescriptor() {
  CopyHeader(other);
  *this = other;
}

RavelCBIT& RavelCBIT::operator=(RavelCBIT& other) {
  CopyHeader(other);
  // The records go first, so a table assigned to itself is left without any.
  RavelRecordList_DeleteAll(aBroadcasterDescriptor);
  bBroadcasterViewPropriety = other.bBroadcasterViewPropriety;
  iFirstDescriptorsLength = other.iFirstDescriptorsLength;
  RavelRecordList_AppendCopies(aBroadcasterDescriptor, other.aBroadcasterDescriptor);
  return *this;
}

RavelCBIT::~RavelCBIT() { RavelRecordList_DeleteAll(aBroadcasterDescriptor); }

int RavelCBIT::ParseRawData(unsigned char* section) {
  RavelCReadWindow window(section);
  RavelRecordList_DeleteAll(aBroadcasterDescriptor);
  if (section == 0) return kRavelErrInvalidArgument;
  int result = CheckCrcAndParseHeader(section, kRavelTraceSourcePath, __LINE__, "BIT Section: CRC Error!\n");
  if (result != kRavelOk) return result;
  if (iTableId != kBITTableId) {
    RAVEL_TRACE(RAVEL_PARSER_ERROR, "Table ID isn't for BIT! Table ID=[0x%02x]\n", iTableId);
    return kRavelErrInvalidArgument;
  }
  SetTableName("BIT");
  bBroadcasterViewPropriety = (RavelCReadWindow::Read8(section + kFirstDescriptorsLengthAt) >> 4) & 0x01;  // ---x----
  iFirstDescriptorsLength = RavelCReadWindow::Read12(section + kFirstDescriptorsLengthAt);  // ----xxxx xxxxxxxx

  // The first loop is walked for its descriptor headers only; nothing of it is kept.
  // Both loops stop at the end of the section whatever their lengths say.
  int at = kFirstDescriptorsAt;
  if (iFirstDescriptorsLength != 0) {
    int end = at + RavelCReadWindow::Readable(section + at, iFirstDescriptorsLength);
    do {
      if (RavelCReadWindow::Unreadable(section + at)) break;
      unsigned char tag = section[at];
      unsigned char length = RavelCReadWindow::Read8(section + at + 1);
      if (tag == 0 || length == 0) {
        RAVEL_TRACE(RAVEL_PARSER_WARNING, "Invalid Descriptor Tag & Length!! descrTag=[0x%02x], descrLen=[%d]\n",
                    tag, length);
        return kRavelErrCorruptSection;
      }
      RAVEL_TRACE(RAVEL_PARSER_BIT, "First Descriptor Loop.. Unkown Descriptor Tag=[0x%02x]\n", tag);
      at += 2 + length;
    } while (at < end);
  }

  // Computed in 16 bits on purpose: a first_descriptors_length that claims more
  // than the section holds wraps the broadcaster loop length round to a large value.
  unsigned short broadcasterLoopLength =
      static_cast<unsigned short>(iSectionLength - kSectionLengthWithoutLoops - iFirstDescriptorsLength);
  if (broadcasterLoopLength == 0) return kRavelOk;
  int end = at + RavelCReadWindow::Readable(section + at, broadcasterLoopLength);
  do {
    if (RavelCReadWindow::Unreadable(section + at)) break;
    RavelCBroadcasterDescriptor* broadcaster = new RavelCBroadcasterDescriptor(0);
    if (broadcaster->ParseRawData(section + at) != kRavelOk) {
      RAVEL_TRACE(RAVEL_PARSER_WARNING, "BIT Info Parsing Fail! Maybe data has been corrupted!\n");
      delete broadcaster;
      RavelRecordList_DeleteAll(aBroadcasterDescriptor);
      return kRavelErrCorruptSection;
    }
    aBroadcasterDescriptor.Append(broadcaster);
    at += kBroadcasterFixedSize + broadcaster->iBroadcasterDescriptorsLength;
  } while (at < end);
  return kRavelOk;
}

RavelCBIT& RavelCBIT::operator+=(RavelCBIT& other) {
  // Nothing is compared: the records of any BIT section are taken as they are.
  RavelRecordList_AppendCopies(aBroadcasterDescriptor, other.aBroadcasterDescriptor);
  return *this;
}

void RavelCBIT::Show() {
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#################################################################\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "###################### BIT Table Information ######################\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#################################################################\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "####################### Header Information ########################\n");
  RavelCTableBase::Show();
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#################################################################\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "####################### Body Information #######################\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Broadcaster View Propriety=[%d]\n", bBroadcasterViewPropriety);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Broadcaster Descriptor Array Size=[%d]\n", aBroadcasterDescriptor.iCount);
  for (int i = 0; i < aBroadcasterDescriptor.iCount; ++i) {
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "##################### Broadcaster Descriptor [%d] #####################\n", i);
    aBroadcasterDescriptor.ipArray[i]->Show();
  }
  // Shorter than the opening rule.
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#################################################\n");
}
