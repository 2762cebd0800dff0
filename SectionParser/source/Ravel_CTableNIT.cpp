#include "Ravel_CTableNIT.h"

#include "Ravel_RecordList.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_TableMerge.h"
#include "Ravel_Trace.h"
#include "Ravel_DescriptorSlot.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CTableNIT");

namespace {

const unsigned char kNITActualTableId = 0x40;
const unsigned char kNITOtherTableId = 0x41;

const unsigned char kTagNetworkName = 0x40;
const unsigned char kTagServiceList = 0x41;
const unsigned char kTagLinkage = 0x4A;
const unsigned char kTagTSInformation = 0xCD;
const unsigned char kTagTerrDeliverySystem = 0xFA;
const unsigned char kTagPartialReception = 0xFB;
const unsigned char kTagSystemManagement = 0xFE;

// transport_stream_id, original_network_id and the descriptors length field.
const int kTSInfoFixedSize = 6;
// Byte 8: network_descriptors_length; its descriptors start at byte 10.
const int kNetworkDescriptorsLengthAt = 8;
const int kNetworkDescriptorsAt = 10;

}  // namespace

// ---------------------------------------------------------------------------
// RavelCTSInfo

RavelCTSInfo::RavelCTSInfo(unsigned char* entry) {
  ParseRawData(entry);
}

RavelCTSInfo::RavelCTSInfo(RavelCTSInfo& other) {
  *this = other;
}

RavelCTSInfo& RavelCTSInfo::operator=(RavelCTSInfo& other) {
  if (this == &other) return *this;
  iTransportStreamId = other.iTransportStreamId;
  iOriginalNetworkId = other.iOriginalNetworkId;
  iTransportDescriptorsLength = other.iTransportDescriptorsLength;
  DeleteDescriptors();
  pServiceList = RavelDescriptorSlot_CopyOf(other.pServiceList);
  pTerrDeliverySystem = RavelDescriptorSlot_CopyOf(other.pTerrDeliverySystem);
  pTSInformation = RavelDescriptorSlot_CopyOf(other.pTSInformation);
  pPartialReception = RavelDescriptorSlot_CopyOf(other.pPartialReception);
  return *this;
}

RavelCTSInfo::~RavelCTSInfo() { DeleteDescriptors(); }

void RavelCTSInfo::DeleteDescriptors() {
  RavelDescriptorSlot_Release(pServiceList);
  RavelDescriptorSlot_Release(pTerrDeliverySystem);
  RavelDescriptorSlot_Release(pTSInformation);
  RavelDescriptorSlot_Release(pPartialReception);
}

int RavelCTSInfo::ParseRawData(unsigned char* entry) {
  DeleteDescriptors();
  if (entry == 0) {
    iTransportStreamId = 0;
    iOriginalNetworkId = 0;
    iTransportDescriptorsLength = 0;
    return kRavelErrInvalidArgument;
  }
  iTransportStreamId = RavelCReadWindow::Read16(entry);
  iOriginalNetworkId = RavelCReadWindow::Read16(entry + 2);
  iTransportDescriptorsLength = RavelCReadWindow::Read12(entry + 4);  // ----xxxx xxxxxxxx
  if (iTransportDescriptorsLength == 0) return kRavelOk;

  // The bytes consumed are counted in 16 bits, as the loop has always counted
  // them; with a 12-bit length and at most 257 bytes per descriptor the counter
  // stops long before it could wrap. The loop also stops at the end of the section.
  unsigned short consumed = 0;
  unsigned char* descriptor = entry + kTSInfoFixedSize;
  do {
    if (RavelCReadWindow::Unreadable(descriptor)) break;
    unsigned char tag = descriptor[0];
    unsigned char length = RavelCReadWindow::Read8(descriptor + 1);
    if (tag == 0 || length == 0) {
      // Unlike the other tables' entries, a malformed descriptor fails the
      // transport stream, and with it the whole NIT.
      RAVEL_TRACE(RAVEL_PARSER_WARNING, "Invalid Descriptor Tag & Length!! descrTag=[0x%02x], descrLen=[%d]\n", tag,
                  length);
      iTransportStreamId = 0;
      iOriginalNetworkId = 0;
      iTransportDescriptorsLength = 0;
      DeleteDescriptors();
      return kRavelErrCorruptSection;
    }
    switch (tag) {
      case kTagServiceList:
        RavelDescriptorSlot_Replace(pServiceList, descriptor);
        break;
      case kTagTSInformation:
        RavelDescriptorSlot_Replace(pTSInformation, descriptor);
        break;
      case kTagTerrDeliverySystem:
        RavelDescriptorSlot_Replace(pTerrDeliverySystem, descriptor);
        break;
      case kTagPartialReception:
        RavelDescriptorSlot_Replace(pPartialReception, descriptor);
        break;
      default:
        RAVEL_TRACE(RAVEL_PARSER_WARNING, "NIT TSInfo Parsing.. Unkown Descriptor Tag=[0x%02x]\n", tag);
        break;
    }
    consumed = static_cast<unsigned short>(consumed + 2 + length);
    descriptor += 2 + length;
  } while (consumed < iTransportDescriptorsLength);
  return kRavelOk;
}

void RavelCTSInfo::Show() {
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tTS Information : TransportStreamId=[0x%04x], OrginalNetworkId=[0x%04x]\n",
              iTransportStreamId, iOriginalNetworkId);
  // Not the member order: the delivery system comes last in the dump.
  if (pServiceList != 0) pServiceList->Show();
  if (pTSInformation != 0) pTSInformation->Show();
  if (pPartialReception != 0) pPartialReception->Show();
  if (pTerrDeliverySystem != 0) pTerrDeliverySystem->Show();
}

// ---------------------------------------------------------------------------
// RavelCNIT

RavelCNIT::RavelCNIT(unsigned char* section)
    : RavelCTableBase(0), aTSInfoList() {
  ParseRawData(section);
}

RavelCNIT::RavelCNIT(RavelCNIT& other)
    : RavelCTableBase(0), aTSInfoList() {
  *this = other;
}

RavelCNIT& RavelCNIT::operator=(RavelCNIT& other) {
  if (this == &other) {
    // The transport streams are released before the copy, so a table assigned
    // to itself loses them; its descriptors come back as copies of themselves.
    RavelRecordList_DeleteAll(aTSInfoList);
    return *this;
  }
  CopyHeader(other);
  DeleteNetworkDescriptors();
  RavelRecordList_DeleteAll(aTSInfoList);
  pLinkage = RavelDescriptorSlot_CopyOf(other.pLinkage);
  pNetworkName = RavelDescriptorSlot_CopyOf(other.pNetworkName);
  pSystemManagement = RavelDescriptorSlot_CopyOf(other.pSystemManagement);
  RavelRecordList_AppendCopies(aTSInfoList, other.aTSInfoList);
  return *this;
}

RavelCNIT::~RavelCNIT() {
  DeleteNetworkDescriptors();
  RavelRecordList_DeleteAll(aTSInfoList);
}

void RavelCNIT::DeleteNetworkDescriptors() {
  RavelDescriptorSlot_Release(pLinkage);
  RavelDescriptorSlot_Release(pNetworkName);
  RavelDescriptorSlot_Release(pSystemManagement);
}

int RavelCNIT::ParseRawData(unsigned char* section) {
  RavelCReadWindow window(section);
  DeleteNetworkDescriptors();
  RavelRecordList_DeleteAll(aTSInfoList);
  if (section == 0) return kRavelErrInvalidArgument;
  int result = CheckCrcAndParseHeader(section, kRavelTraceSourcePath, __LINE__, "NIT Section: CRC Error!\n");
  if (result != kRavelOk) return result;
  if (iTableId == kNITActualTableId) {
    SetTableName("NIT Actual");
  } else if (iTableId == kNITOtherTableId) {
    SetTableName("NIT Other");
  } else {
    RAVEL_TRACE(RAVEL_PARSER_ERROR, "Table ID isn't for NIT! Table ID=[0x%02x]\n", iTableId);
    return kRavelErrInvalidArgument;
  }

  unsigned short networkDescriptorsLength =
      RavelCReadWindow::Read12(section + kNetworkDescriptorsLengthAt);  // ----xxxx xxxxxxxx
  // Both loops stop at the end of the section whatever their lengths say.
  int at = kNetworkDescriptorsAt;
  if (networkDescriptorsLength != 0) {
    int end = at + RavelCReadWindow::Readable(section + at, networkDescriptorsLength);
    do {
      unsigned char* descriptor = section + at;
      if (RavelCReadWindow::Unreadable(descriptor)) break;
      unsigned char tag = descriptor[0];
      unsigned char length = RavelCReadWindow::Read8(descriptor + 1);
      // Only the tag is tested here: a descriptor of length 0 goes to its class.
      if (tag == 0) {
        RAVEL_TRACE(RAVEL_PARSER_WARNING, "Invalid Descriptor Tag & Length!! descrTag=[0x%02x], descrLen=[%d]\n",
                    tag, length);
        DeleteNetworkDescriptors();
        return kRavelErrCorruptSection;
      }
      // A later descriptor of the same tag takes the place of the earlier one.
      switch (tag) {
        case kTagNetworkName:
          RavelDescriptorSlot_Replace(pNetworkName, descriptor);
          break;
        case kTagSystemManagement:
          RavelDescriptorSlot_Replace(pSystemManagement, descriptor);
          break;
        case kTagLinkage: {
          RavelCLinkageDescriptor* linkage = new RavelCLinkageDescriptor(0);
          linkage->ParseRawData(descriptor);
          delete pLinkage;
          pLinkage = linkage;
          break;
        }
        default:
          RAVEL_TRACE(RAVEL_PARSER_WARNING, "NIT Body Parsing.. Unkown Descriptor Tag=[0x%02x]\n", tag);
          break;
      }
      at += 2 + length;
    } while (at < end);
  }

  // The transport stream loop follows wherever the network loop stopped, and
  // its own length, not section_length, bounds it. The end is counted from the
  // length field itself, two bytes before the first entry: the receivers' rule.
  unsigned short transportStreamLoopLength = RavelCReadWindow::Read12(section + at);  // ----xxxx xxxxxxxx
  if (transportStreamLoopLength == 0) return kRavelOk;
  const int end = at + RavelCReadWindow::Readable(section + at, transportStreamLoopLength);
  at += 2;
  do {
    if (RavelCReadWindow::Unreadable(section + at)) break;
    RavelCTSInfo* transportStream = new RavelCTSInfo(0);
    if (transportStream->ParseRawData(section + at) != kRavelOk) {
      RAVEL_TRACE(RAVEL_PARSER_WARNING, "NIT Info Parsing Fail! Maybe data has been corrupted!\n");
      delete transportStream;
      DeleteNetworkDescriptors();
      RavelRecordList_DeleteAll(aTSInfoList);
      return kRavelErrCorruptSection;
    }
    aTSInfoList.Append(transportStream);
    at += kTSInfoFixedSize + transportStream->iTransportDescriptorsLength;
  } while (at < end);
  return kRavelOk;
}

RavelCNIT& RavelCNIT::operator+=(RavelCNIT& other) {
  if (!RAVEL_TABLE_MERGE_CHECK_VERSION(*this, other, "NIT")) return *this;
  // Network descriptors may come in any section of the table: take those still
  // missing, keep those already held.
  if (pLinkage == 0) pLinkage = RavelDescriptorSlot_CopyOf(other.pLinkage);
  if (pNetworkName == 0) pNetworkName = RavelDescriptorSlot_CopyOf(other.pNetworkName);
  if (pSystemManagement == 0) pSystemManagement = RavelDescriptorSlot_CopyOf(other.pSystemManagement);
  RavelRecordList_AppendCopies(aTSInfoList, other.aTSInfoList);
  return *this;
}

void RavelCNIT::Show() {
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#################################################\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#### NIT Table Information\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "# Header Information\n");
  RavelCTableBase::Show();
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "# Body Information. [Descriptors]\n");
  if (pLinkage != 0) pLinkage->Show();
  if (pNetworkName != 0) pNetworkName->Show();
  if (pSystemManagement != 0) pSystemManagement->Show();
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Transport Stream Information. Size=[%d]\n", aTSInfoList.iCount);
  for (int i = 0; i < aTSInfoList.iCount; ++i) aTSInfoList.ipArray[i]->Show();
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#################################################\n");
}
