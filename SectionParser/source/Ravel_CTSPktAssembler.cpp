#include "Ravel_CTSPktAssembler.h"

#include <stdint.h>
#include <stdlib.h>
#include <string.h>

#include "Ravel_ByteOrder.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_CTSPacket.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CTSPktAssembler");

namespace {

const unsigned short kIdlePID = 0xFFFF;
const int kIdleConIndex = 255;
const int kUnknownSectionLen = -1;
const unsigned char kStuffingByte = 0xFF;

// Bytes from `at` to the end of the packet; 0 when `at` lies at or beyond the
// end (a payload behind an over-long adaptation field has no bytes).
inline int BytesToEnd(const unsigned char* packet, const unsigned char* at) {
  const uintptr_t offset = reinterpret_cast<uintptr_t>(at) - reinterpret_cast<uintptr_t>(packet);
  return offset < RAVEL_TS_PACKET_SIZE ? RAVEL_TS_PACKET_SIZE - static_cast<int>(offset) : 0;
}

// A section buffer whose `capacity` bytes are all set, counted with `size`
// bytes, grown to the bytes its parse may read (RavelCReadWindow::OwnedSize)
// with the bytes nobody supplied cleared.
unsigned char* OwnedSectionBuffer(unsigned char* buffer, int capacity, int size) {
  const int owned = RavelCReadWindow::OwnedSize(buffer, size);
  if (owned <= capacity) return buffer;
  buffer = static_cast<unsigned char*>(realloc(buffer, static_cast<size_t>(owned)));
  memset(buffer + capacity, 0, static_cast<size_t>(owned - capacity));
  return buffer;
}

// A section found whole inside one packet: one malloc'ed copy.
inline void EmitSection(const unsigned char* section, int size, RavelCSectionData& out) {
  unsigned char* buffer = static_cast<unsigned char*>(malloc(static_cast<size_t>(size)));
  memcpy(buffer, section, static_cast<size_t>(size));
  out.Append(OwnedSectionBuffer(buffer, size, size), size);
}

}  // namespace

// ---------------------------------------------------------------------------
// RavelCPktEntry

RavelCPktEntry::RavelCPktEntry() {}

RavelCPktEntry::RavelCPktEntry(const unsigned char* data, int len) { SetData(data, len); }

void RavelCPktEntry::SetData(const unsigned char* data, int len) {
  if (len >= static_cast<int>(sizeof(aData)) + 1) {
    RAVEL_TRACE(RAVEL_PARSER_ERROR, "Too long data lenght=[%d]\n", len);
    iDataLen = 0;
    return;
  }
  if (len < 0 || data == 0) len = 0;
  if (len > 0) memcpy(aData, data, static_cast<size_t>(len));
  // The unused tail is cleared so that a copied piece holds no stale bytes.
  memset(aData + len, 0, sizeof(aData) - static_cast<size_t>(len));
  iDataLen = static_cast<unsigned char>(len);
}

int RavelCPktEntry::GetData(unsigned char* destination, int& count) {
  count = 0;
  if (iDataLen != 0) {
    memcpy(destination, aData, iDataLen);
    count = iDataLen;
  }
  iDataLen = 0;
  return count;
}

// ---------------------------------------------------------------------------
// RavelCSectionData

RavelCSectionData::RavelCSectionData() {}

RavelCSectionData::RavelCSectionData(const RavelCSectionData& other) {
  CopyFrom(other);
}

RavelCSectionData& RavelCSectionData::operator=(const RavelCSectionData& other) {
  if (this != &other) {
    Release();
    CopyFrom(other);
  }
  return *this;
}

RavelCSectionData::~RavelCSectionData() { Release(); }

void RavelCSectionData::Append(unsigned char* section, int size) {
  if (iSectionCount < 0 || iSectionCount >= RAVEL_MAX_ASSEMBLED_SECTIONS) {
    // The caller has not taken the earlier sections out; there is no slot left.
    free(section);
    return;
  }
  pSection[iSectionCount] = section;
  iSectionSize[iSectionCount] = size;
  ++iSectionCount;
}

// Frees the buffers of the entries in use. Entries beyond iSectionCount are
// not ours any more: a caller takes a section by lowering the count.
void RavelCSectionData::Release() {
  const int count = iSectionCount < RAVEL_MAX_ASSEMBLED_SECTIONS ? iSectionCount : RAVEL_MAX_ASSEMBLED_SECTIONS;
  for (int i = 0; i < count; ++i) {
    if (pSection[i] != 0) free(pSection[i]);
    pSection[i] = 0;
  }
  iSectionCount = 0;
}

void RavelCSectionData::CopyFrom(const RavelCSectionData& other) {
  int count = other.iSectionCount;
  if (count < 0) count = 0;
  if (count > RAVEL_MAX_ASSEMBLED_SECTIONS) count = RAVEL_MAX_ASSEMBLED_SECTIONS;
  iSectionCount = count;
  for (int i = 0; i < count; ++i) {
    const int size = other.iSectionSize[i];
    iSectionSize[i] = size;
    pSection[i] = 0;
    if (other.pSection[i] != 0 && size > 0) {
      // Only the counted bytes are sure to be the source's: a buffer a caller
      // put there may end with them. The rest of the window reads as zero.
      unsigned char* buffer = static_cast<unsigned char*>(malloc(static_cast<size_t>(size)));
      memcpy(buffer, other.pSection[i], static_cast<size_t>(size));
      pSection[i] = OwnedSectionBuffer(buffer, size, size);
    }
  }
}

// ---------------------------------------------------------------------------
// RavelCTSPktStore

RavelCTSPktStore::RavelCTSPktStore()
    : iPID(kIdlePID), iLastConIndex(kIdleConIndex), iSectionLen(kUnknownSectionLen) {}

RavelCTSPktStore::RavelCTSPktStore(RavelCTSPktStore& other)
    : iPID(kIdlePID), iLastConIndex(kIdleConIndex), iSectionLen(kUnknownSectionLen) {
  *this = other;
}

RavelCTSPktStore& RavelCTSPktStore::operator=(RavelCTSPktStore& other) {
  iPacketArray.RemoveAll();
  iPID = other.iPID;
  iCurBufSize = other.iCurBufSize;
  iLastConIndex = other.iLastConIndex;
  for (int i = 0; i < other.iPacketArray.iCount; ++i) {
    const RavelCPktEntry* piece = other.iPacketArray.ipArray[i];
    iPacketArray.Append(piece != 0 ? new RavelCPktEntry(*piece) : 0);
  }
  iSectionLen = other.iSectionLen;
  return *this;
}

RavelCTSPktStore::~RavelCTSPktStore() {}

int RavelCTSPktStore::ClearPacketBuffer() {
  Reset();
  return kRavelOk;
}

void RavelCTSPktStore::Reset() {
  iPacketArray.RemoveAll();
  iPID = kIdlePID;
  iCurBufSize = 0;
  iLastConIndex = kIdleConIndex;
  iSectionLen = kUnknownSectionLen;
}

void RavelCTSPktStore::StorePiece(const unsigned char* data, int len) {
  iPacketArray.Append(new RavelCPktEntry(data, len));
  iCurBufSize += len;
}

int RavelCTSPktStore::AddTSPacket(const unsigned char* packet, RavelCSectionData& out) {
  RavelCTSPacket header(0);
  const int parsed = header.ParseRawData(const_cast<unsigned char*>(packet));
  if (parsed != kRavelOk) {
    RAVEL_TRACE(RAVEL_PARSER_ERROR, "TS Packet Parsing Fail! iResult=[%d]\n", parsed);
    return 0;
  }
  const unsigned char* payload = header.pPayloadStartPtr;
  if (payload == 0) {
    RAVEL_TRACE(RAVEL_PARSER_ERROR, "This TS Packet hasn't payload! This will be discarded!\n");
    return 0;
  }
  const int payloadBytes = BytesToEnd(packet, payload);
  const int counter = header.iContinuityCounter;
  const bool unitStart = header.bPayloadUnitStartIndicator != 0;

  if (iPacketArray.iCount > 0) {
    const int expected = iLastConIndex == 15 ? 0 : iLastConIndex + 1;
    if (counter != expected) {
      // A lost or repeated packet is routine on air: dump level, then start over.
      RAVEL_TRACE(RAVEL_PARSER_DUMP,
                  "Packet Count=[%d], Cont Index Invalid! PID=[0x%04x], iLastConIndex=[%d], PID=[0x%04x], "
                  "Current Continuity Index=[%d]\n",
                  iPacketArray.iCount, static_cast<unsigned int>(iPID), iLastConIndex,
                  static_cast<unsigned int>(header.iPID), counter);
      RAVEL_TRACE(RAVEL_PARSER_DUMP, "Section Length=[%d], Cur Received Byte=[%d]\n", iSectionLen, iCurBufSize);
      Reset();
    }
  }

  // The pointer_field; a payload without bytes has none and counts as 0.
  const int pointerField = payloadBytes > 0 ? payload[0] : 0;

  if (iPacketArray.iCount == 0) {
    if (!unitStart) return 0;  // the middle of a section whose start was missed
    if (pointerField >= payloadBytes - 1) {
      RAVEL_TRACE(RAVEL_PARSER_ERROR, "Section Pointer Field Invalid! =>[%d]\n", pointerField);
      return 0;
    }
    const unsigned char* section = payload + 1 + pointerField;
    const int remaining = payloadBytes - 1 - pointerField;
    if (remaining < 3) {
      // section_length is cut by the packet end; iSectionLen keeps its value.
      StorePiece(section, remaining);
      iPID = header.iPID;
      iLastConIndex = counter;
      return 0;
    }
    iSectionLen = RavelSectionSize(section);
    if (iSectionLen > remaining) {
      StorePiece(section, remaining);
      iPID = header.iPID;
      iLastConIndex = counter;
      return 0;
    }
    const int size = iSectionLen;
    EmitSection(section, size, out);
    Reset();
    const int left = remaining - size;
    // A section ending with the packet has no byte after it, so no stuffing
    // either: the store goes on as for a next section with no bytes.
    if (left > 0 && section[size] == kStuffingByte) return 1;
    // A next section starts here. It is stored under the size of the section
    // just emitted (not its own) and waits for the next packet even when whole.
    iSectionLen = left < 3 ? kUnknownSectionLen : RavelSectionSize(section);
    StorePiece(section + size, left);
    iPID = header.iPID;
    iLastConIndex = counter;
    return 1;
  }

  if (iSectionLen == kUnknownSectionLen) {
    RAVEL_TRACE(RAVEL_PARSER_WARNING, "Section length field is divided in two ts packets!\n");
    if (iPacketArray.iCount != 1 || iPacketArray.ipArray[0] == 0 || iPacketArray.ipArray[0]->iDataLen >= 3) {
      RAVEL_TRACE(RAVEL_PARSER_ERROR, "Section length should be set before this time!\n");
      Reset();
      return 0;
    }
    // The held header bytes are taken out (they will be missing from the joined
    // section) and the new packet's data is laid over them: the length comes
    // from bytes 1 and 2 of the new data.
    unsigned char scratch[8];
    memset(scratch, 0, sizeof(scratch));
    int held = 0;
    iPacketArray.ipArray[0]->GetData(scratch, held);
    const unsigned char* data = unitStart ? payload + 1 : payload;
    int available = unitStart ? payloadBytes - 1 : payloadBytes;
    int take = static_cast<int>(sizeof(scratch)) - held;
    if (take > available) take = available;
    if (take > 0) memcpy(scratch, data, static_cast<size_t>(take));
    iSectionLen = RavelSectionSize(scratch);
  }

  if (!unitStart) {
    StorePiece(payload, payloadBytes);
    iLastConIndex = counter;
    if (iCurBufSize < iSectionLen) return 0;
    GetAssembleData(out);
    return 1;
  }

  if (pointerField >= payloadBytes) {
    // The pending section is kept, but this packet's counter is not recorded.
    RAVEL_TRACE(RAVEL_PARSER_ERROR, "Invalid Pointer Field Length! curSectionLen=[%d]\n", pointerField);
    return 0;
  }
  int result = 0;
  if (iCurBufSize + pointerField >= iSectionLen) {
    StorePiece(payload + 1, pointerField);
    iLastConIndex = counter;
    GetAssembleData(out);
    result = 1;
  } else {
    RAVEL_TRACE(RAVEL_PARSER_ERROR, "Section Length Invalid!! Section Len=[%d], Cur Size=[%d], Remained Size=[%d]\n",
                iSectionLen, iCurBufSize, pointerField);
    Reset();
  }

  const unsigned char* section = payload + 1 + pointerField;
  const int remaining = payloadBytes - 1 - pointerField;
  if (remaining >= 3) {
    iSectionLen = RavelSectionSize(section);
    if (iSectionLen <= remaining) {
      // Whole in this packet: emitted at once; iSectionLen keeps its size and
      // whatever follows it in the packet is not looked at.
      EmitSection(section, iSectionLen, out);
      return 1;
    }
  }
  StorePiece(section, remaining);
  iPID = header.iPID;
  iLastConIndex = counter;
  return result;
}

void RavelCTSPktStore::GetAssembleData(RavelCSectionData& out) {
  if (iPacketArray.iCount == 0 || iCurBufSize == 0 || iSectionLen == kUnknownSectionLen) {
    RAVEL_TRACE(RAVEL_PARSER_ERROR, "GetAssembleData Called! But no data is in the buffer!\n");
    return;
  }
  // Every collected byte is copied (the last piece may run past the section
  // end); the entry counts only the section. The buffer is never shorter than
  // the section, and bytes that no piece supplied are cleared. Some byte was
  // collected, so the buffer is never empty.
  const int capacity = iCurBufSize > iSectionLen ? iCurBufSize : iSectionLen;
  unsigned char* buffer = static_cast<unsigned char*>(malloc(static_cast<size_t>(capacity)));
  int copied = 0;
  for (int i = 0; i < iPacketArray.iCount; ++i) {
    RavelCPktEntry* piece = iPacketArray.ipArray[i];
    if (piece == 0) continue;
    if (piece->iDataLen <= capacity - copied) {
      int count = 0;
      piece->GetData(buffer + copied, count);
      copied += count;
    } else {
      memcpy(buffer + copied, piece->aData, static_cast<size_t>(capacity - copied));
      piece->iDataLen = 0;
      copied = capacity;
    }
  }
  if (copied < capacity) memset(buffer + copied, 0, static_cast<size_t>(capacity - copied));
  // A section handed out with another section's size (see AddTSPacket) may
  // declare more bytes than were collected: those read as zero.
  out.Append(OwnedSectionBuffer(buffer, capacity, iSectionLen), iSectionLen);
  if (copied != iCurBufSize) {
    RAVEL_TRACE(RAVEL_PARSER_ERROR, "Data size not matched! bufPos=[%d], iCurBufSize=[%d], iSectionLen=[%d]\n", copied,
                iCurBufSize, iSectionLen);
  }
  Reset();
}
