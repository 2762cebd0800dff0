#include "Ravel_CTablePMT.h"

#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_TableMerge.h"
#include "Ravel_Trace.h"
#include "Ravel_DescriptorSlot.h"
#include "Ravel_RecordList.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CTablePMT");

namespace {

const unsigned char kPMTTableId = 0x02;
const int kProgramInfoStart = 12;  // after the header, PCR_PID and program_info_length
const int kStreamHeaderSize = 5;   // stream_type, elementary_PID, ES_info_length

const unsigned char kTagCA = 0x09;
const unsigned char kTagStreamIdentifier = 0x52;
const unsigned char kTagParentalRating = 0x55;
const unsigned char kTagTargetRegion = 0xC6;
const unsigned char kTagDataComponent = 0xFD;

// MPEG-1 video, MPEG-2 video, H.264/AVC.
bool IsVideoStream(unsigned char type) { return type == 0x01 || type == 0x02 || type == 0x1B; }
// MPEG-2 audio, AAC in ADTS, AAC in LATM.
bool IsAudioStream(unsigned char type) { return type == 0x04 || type == 0x0F || type == 0x11; }
// PES private data: the closed captions of a one-segment service.
bool IsCaptionStream(unsigned char type) { return type == 0x06; }

// Stream selection walks the list with an 8-bit index that goes on while it is
// below the count. From 256 streams on the index wraps from 255 to 0 before it
// reaches the end, so only the first 256 streams are ever visited, over and
// over: a match is counted again on every round, and a walk that finds nothing
// there never ends. The walk below gives the same answers for every list where
// it ends, and ends with 0 (or the count of one round) where it would not.
const int kSelectionIndexRange = 256;

// The index of a stream the selection does not find.
const int kNoStream = -1;

}  // namespace

// ---------------------------------------------------------------------------
// RavelCMapInfo

RavelCMapInfo::RavelCMapInfo(unsigned char* entry) {
  ParseRawData(entry);
}

RavelCMapInfo::RavelCMapInfo(RavelCMapInfo& other) {
  *this = other;
}

RavelCMapInfo& RavelCMapInfo::operator=(RavelCMapInfo& other) {
  if (this == &other) return *this;
  DeleteDescriptors();
  iStreamType = other.iStreamType;
  iElementaryPID = other.iElementaryPID;
  iESInfoLength = other.iESInfoLength;
  iCAPID = other.iCAPID;
  pStreamIdentifier = RavelDescriptorSlot_CopyOf(other.pStreamIdentifier);
  pDataComponent = RavelDescriptorSlot_CopyOf(other.pDataComponent);
  pTargetRegion = RavelDescriptorSlot_CopyOf(other.pTargetRegion);
  return *this;
}

RavelCMapInfo::~RavelCMapInfo() { DeleteDescriptors(); }

void RavelCMapInfo::DeleteDescriptors() {
  RavelDescriptorSlot_Release(pStreamIdentifier);
  RavelDescriptorSlot_Release(pDataComponent);
  RavelDescriptorSlot_Release(pTargetRegion);
}

int RavelCMapInfo::ParseRawData(unsigned char* entry) {
  DeleteDescriptors();
  if (entry == 0) {
    // iCAPID is left as it is.
    iStreamType = 0;
    iElementaryPID = 0;
    iESInfoLength = 0;
    return kRavelErrInvalidArgument;
  }
  iStreamType = RavelCReadWindow::Read8(entry);
  iElementaryPID = RavelCReadWindow::Read16(entry + 1) & 0x1FFF;  // ---xxxxx xxxxxxxx
  iESInfoLength = RavelCReadWindow::Read12(entry + 3);            // ----xxxx xxxxxxxx
  if (iESInfoLength == 0) return kRavelOk;

  // The loop stops at the end of the section whatever its length says.
  const int end = kStreamHeaderSize + RavelCReadWindow::Readable(entry + kStreamHeaderSize, iESInfoLength);
  int at = kStreamHeaderSize;
  do {
    unsigned char* descriptor = entry + at;
    if (RavelCReadWindow::Unreadable(descriptor)) break;
    const unsigned char tag = descriptor[0];
    const unsigned char length = RavelCReadWindow::Read8(descriptor + 1);
    if (length == 0) {
      // Ends this stream's descriptors only; the stream itself is kept. A tag of
      // 0 with a length is merely unknown here.
      RAVEL_TRACE(RAVEL_PARSER_WARNING, "Invalid Descriptor Tag & Length!! descrTag=[0x%02x], descrLen=[%d]\n", tag,
                  length);
      return kRavelOk;
    }
    // The descriptors' own parse results are not looked at; a later descriptor
    // of the same tag replaces the earlier one.
    switch (tag) {
      case kTagCA:
        // CA_system_ID 16 | reserved 3 | CA_PID 13
        iCAPID = RavelCReadWindow::Read16(descriptor + 4) & 0x1FFF;  // ---xxxxx xxxxxxxx
        RAVEL_TRACE(RAVEL_PARSER_WARNING, "PMT MapInfo CA PID =[0x%x]", iCAPID);
        break;
      case kTagStreamIdentifier:
        delete pStreamIdentifier;
        pStreamIdentifier = new RavelCStreamIdentifierDescriptor(0);
        pStreamIdentifier->ParseRawData(descriptor);
        break;
      case kTagTargetRegion:
        RavelDescriptorSlot_Replace(pTargetRegion, descriptor);
        break;
      case kTagDataComponent:
        delete pDataComponent;
        pDataComponent = new RavelCDataComponentDescriptor(0);
        pDataComponent->ParseRawData(descriptor);
        break;
      default:
        RAVEL_TRACE(RAVEL_PARSER_WARNING, "PMT MapInfo Parsing.. Unkown Descriptor Tag=[0x%02x]\n", tag);
        break;
    }
    at += 2 + length;
  } while (at < end);
  return kRavelOk;
}

void RavelCMapInfo::Show() {
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Stream Type Id=[0x%02x], Stream PID=[0x%04x], Stream Info Len=[%d]\n", iStreamType,
              iElementaryPID, iESInfoLength);
  if (pStreamIdentifier != 0) pStreamIdentifier->Show();
  if (pDataComponent != 0) pDataComponent->Show();
  if (pTargetRegion != 0) pTargetRegion->Show();
}

// ---------------------------------------------------------------------------
// RavelCPMT

RavelCPMT::RavelCPMT(unsigned char* section)
    : RavelCTableBase(0), aMapInfoList() {
  ParseRawData(section);
}

RavelCPMT& RavelCPMT::operator=(RavelCPMT& other) {
  CopyHeader(other);
  iPCRPID = other.iPCRPID;
  iProgramInfoLength = other.iProgramInfoLength;
  // The target's streams go first, so assigning a table to itself empties it.
  // pParentalRating stays the target's own.
  DeleteStreams();
  RavelRecordList_AppendCopies(aMapInfoList, other.aMapInfoList);
  return *this;
}

RavelCPMT& RavelCPMT::operator+=(RavelCPMT& other) {
  if (!RAVEL_TABLE_MERGE_CHECK_VERSION(*this, other, "PMT")) return *this;
  RavelRecordList_AppendCopies(aMapInfoList, other.aMapInfoList);
  return *this;
}

RavelCPMT::~RavelCPMT() {
  DeleteStreams();
  DeleteParentalRating();
}

void RavelCPMT::DeleteStreams() { RavelRecordList_DeleteAll(aMapInfoList); }

void RavelCPMT::DeleteParentalRating() {
  RavelDescriptorSlot_Release(pParentalRating);
}

int RavelCPMT::ParseRawData(unsigned char* section) {
  RavelCReadWindow window(section);
  DeleteStreams();
  DeleteParentalRating();
  if (section == 0) {
    iPCRPID = 0;
    iProgramInfoLength = 0;
    return kRavelErrInvalidArgument;
  }
  int result = CheckCrcAndParseHeader(section, kRavelTraceSourcePath, __LINE__, "PMT Section: CRC Error!\n");
  if (result != kRavelOk) {
    iPCRPID = 0;
    iProgramInfoLength = 0;
    return result;
  }
  if (iTableId != kPMTTableId) {
    RAVEL_TRACE(RAVEL_PARSER_ERROR, "Table ID isn't for PMT! Table ID=[0x%02x]\n", iTableId);
    iPCRPID = 0;
    iProgramInfoLength = 0;
    return kRavelErrInvalidArgument;
  }
  SetTableName("PMT");
  iPCRPID = RavelCReadWindow::Read16(section + 8) & 0x1FFF;  // ---xxxxx xxxxxxxx
  iProgramInfoLength = RavelCReadWindow::Read12(section + 10);  // ----xxxx xxxxxxxx

  // The streams start at the first descriptor boundary at or past the end of
  // the program info, so an overlong last descriptor moves them on. The loop
  // stops at the end of the section whatever its length says.
  int at = kProgramInfoStart;
  if (iProgramInfoLength != 0) {
    const int end = at + RavelCReadWindow::Readable(section + at, iProgramInfoLength);
    do {
      unsigned char* descriptor = section + at;
      if (RavelCReadWindow::Unreadable(descriptor)) break;
      const unsigned char tag = descriptor[0];
      const unsigned char length = RavelCReadWindow::Read8(descriptor + 1);
      if (tag == 0 || length == 0) {
        // Unlike a stream's loop, a malformed program info loop fails the section.
        RAVEL_TRACE(RAVEL_PARSER_WARNING, "Invalid Descriptor Tag & Length!! descrTag=[0x%02x], descrLen=[%d]\n", tag,
                    length);
        iPCRPID = 0;
        iProgramInfoLength = 0;
        return kRavelErrCorruptSection;
      }
      if (tag == kTagParentalRating) {
        // The last parental rating descriptor of the loop wins.
        if (pParentalRating != 0) {
          RAVEL_TRACE(RAVEL_PARSER_WARNING, "Duplicated Parental Rating Inforamtion!\n");
          DeleteParentalRating();
        }
        pParentalRating = new RavelCParentalRatingDescriptor(0);
        if (pParentalRating->ParseRawData(descriptor) != kRavelOk) {
          RAVEL_TRACE(RAVEL_PARSER_ERROR, "Parental Rating Descriptor Parsing Fail!\n");
          DeleteParentalRating();
        }
      } else {
        // The CA descriptor of this loop is not read either.
        RAVEL_TRACE(RAVEL_PARSER_WARNING, "PMT Body Parsing: Unkown Descriptor Tag=[0x%02x]\n", tag);
      }
      at += 2 + length;
    } while (at < end);
  }

  const int end = iSectionLength - 1;  // the first CRC_32 byte
  if (at >= end) return kRavelOk;
  do {
    unsigned char* entry = section + at;
    // The constructor parses the entry and the result comes from a second parse,
    // so the entry's own traces come out twice.
    RavelCMapInfo* stream = new RavelCMapInfo(entry);
    if (stream->ParseRawData(entry) != kRavelOk) {
      RAVEL_TRACE(RAVEL_PARSER_WARNING, "PMT Info Parsing Fail! Maybe data has been corrupted!\n");
      delete stream;
      DeleteStreams();
      return kRavelErrCorruptSection;
    }
    aMapInfoList.Append(stream);
    at += kStreamHeaderSize + stream->iESInfoLength;
  } while (at < end);
  return kRavelOk;
}

int RavelCPMT::CountStreams(bool (*matches)(unsigned char streamType)) {
  const int visited = aMapInfoList.iCount < kSelectionIndexRange ? aMapInfoList.iCount : kSelectionIndexRange;
  int found = 0;
  for (int i = 0; i < visited; ++i) {
    if (matches(aMapInfoList.ipArray[i]->iStreamType)) ++found;
  }
  return found;
}

int RavelCPMT::FindStream(bool (*matches)(unsigned char streamType), int n) {
  const int found = CountStreams(matches);
  if (found == 0) return kNoStream;
  if (n >= found) {
    // A short list ends without the n-th match; a long one comes round again
    // and goes on counting from the first match.
    if (aMapInfoList.iCount < kSelectionIndexRange) return kNoStream;
    n %= found;
  }
  for (int i = 0; i < aMapInfoList.iCount; ++i) {
    if (!matches(aMapInfoList.ipArray[i]->iStreamType)) continue;
    if (n == 0) return i;
    --n;
  }
  return kNoStream;
}

unsigned short RavelCPMT::GetVideoPID() {
  const int index = FindStream(IsVideoStream, 0);
  return index < 0 ? 0 : aMapInfoList.ipArray[index]->iElementaryPID;
}

unsigned short RavelCPMT::GetAudioPID(unsigned char n) {
  const int index = FindStream(IsAudioStream, n);
  return index < 0 ? 0 : aMapInfoList.ipArray[index]->iElementaryPID;
}

unsigned char RavelCPMT::GetAudioPIDCount() {
  // Counted in 8 bits; a list long enough to wrap gives the count of one round.
  return static_cast<unsigned char>(CountStreams(IsAudioStream));
}

unsigned short RavelCPMT::GetCCPID() {
  const int index = FindStream(IsCaptionStream, 0);
  return index < 0 ? 0 : aMapInfoList.ipArray[index]->iElementaryPID;
}

void RavelCPMT::Show() {
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#################################################\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#### PMT Table Information\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "# Header Information\n");
  RavelCTableBase::Show();
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "# Body Information\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "PCR_PID=[0x%04x], Program Information Len=[%d]\n", iPCRPID, iProgramInfoLength);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Stream Information. Size=[%d]\n", aMapInfoList.iCount);
  // The parental rating descriptor is not dumped.
  for (int i = 0; i < aMapInfoList.iCount; ++i) aMapInfoList.ipArray[i]->Show();
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#################################################\n");
}
