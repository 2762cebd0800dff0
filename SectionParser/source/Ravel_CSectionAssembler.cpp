#include "Ravel_CSectionAssembler.h"

#include <string.h>

#include "Ravel_ByteOrder.h"
#include "Ravel_CTSPacket.h"

namespace {

const int kNoCounter = -1;
const int kHeaderBytes = 3;  // table_id and section_length
const unsigned char kStuffingByte = 0xFF;

}  // namespace

// The steps of AddTSPacket are declared inline so that they can be inlined into
// it: in the position-independent library, a call to an exported function
// could be interposed and is never inlined. All their callers are in this file.

RavelCSectionAssembler::RavelCSectionAssembler(RavelSectionHandler handler, void* context)
    : pHandler(handler), pContext(context), iLastCounter(kNoCounter) {}

RavelCSectionAssembler::~RavelCSectionAssembler() {}

void RavelCSectionAssembler::ClearPacketBuffer() {
  CutPending();
  iLastCounter = kNoCounter;
  iRepeats = 0;
}

void RavelCSectionAssembler::CutPending() {
  if (iHeld > 0) ++iSectionsCut;
  iHeld = 0;
  iSectionSize = 0;
}

inline bool RavelCSectionAssembler::TakeCounter(int counter, bool announcedDiscontinuity) {
  const int last = iLastCounter;
  iLastCounter = counter;
  if (last == kNoCounter || counter == ((last + 1) & 0x0F)) {
    iRepeats = 0;
    return true;
  }
  // 2.4.3.3: a packet may be sent twice in a row, no more.
  if (counter == last && iRepeats == 0 && !announcedDiscontinuity) {
    ++iRepeats;
    ++iPacketsRepeated;
    return false;
  }
  if (!announcedDiscontinuity) ++iContinuityBreaks;
  iRepeats = 0;
  CutPending();
  return true;
}

inline void RavelCSectionAssembler::Deliver(int& delivered) {
  ++iSectionsDelivered;
  ++delivered;
  const int size = iSectionSize;
  iHeld = 0;
  iSectionSize = 0;
  if (pHandler != 0) pHandler(pContext, aSection, size);
}

inline int RavelCSectionAssembler::Continue(const unsigned char* data, int count, int& delivered) {
  int taken = 0;
  if (iSectionSize == 0) {
    // The header is split over two packets: complete it first.
    taken = kHeaderBytes - iHeld;
    if (taken > count) taken = count;
    memcpy(aSection + iHeld, data, static_cast<size_t>(taken));
    iHeld += taken;
    if (iHeld < kHeaderBytes) return taken;
    iSectionSize = RavelSectionSize(aSection);
  }
  int wanted = iSectionSize - iHeld;
  if (wanted > count - taken) wanted = count - taken;
  memcpy(aSection + iHeld, data + taken, static_cast<size_t>(wanted));
  iHeld += wanted;
  taken += wanted;
  if (iHeld == iSectionSize) Deliver(delivered);
  return taken;
}

inline void RavelCSectionAssembler::StartSections(const unsigned char* data, int count, int& delivered) {
  int at = 0;
  while (at < count && data[at] != kStuffingByte) {
    // A new section: its bytes go to the buffer as far as this packet holds them.
    iHeld = 0;
    iSectionSize = 0;
    at += Continue(data + at, count - at, delivered);
  }
}

int RavelCSectionAssembler::AddTSPacket(const unsigned char* packet) {
  if (packet == 0 || packet[0] != RAVEL_TS_SYNC_BYTE) {
    ++iPacketsInvalid;
    return 0;
  }
  if (packet[1] & 0x80) {
    ++iPacketsTransportError;
    return 0;
  }
  const bool unitStart = (packet[1] & 0x40) != 0;
  const int control = (packet[3] >> 4) & 0x03;
  const int counter = packet[3] & 0x0F;
  if (control == 0x02) return 0;  // adaptation field only: no payload, the counter stays
  int payload = 4;
  bool announcedDiscontinuity = false;
  if (control == 0x03) {
    const int adaptationLength = packet[4];
    payload += 1 + adaptationLength;
    announcedDiscontinuity = adaptationLength > 0 && (packet[5] & 0x80) != 0;
  }
  if (control == 0x00 || payload >= RAVEL_TS_PACKET_SIZE) {
    // No usable payload though the counter may have stepped: what is in
    // progress cannot be trusted to continue.
    ++iPacketsInvalid;
    CutPending();
    iLastCounter = kNoCounter;
    return 0;
  }
  if (!TakeCounter(counter, announcedDiscontinuity)) return 0;

  const unsigned char* data = packet + payload;
  int count = RAVEL_TS_PACKET_SIZE - payload;
  int delivered = 0;
  if (!unitStart) {
    if (iHeld == 0) {
      iBytesWithoutStart += static_cast<unsigned int>(count);
      return 0;
    }
    Continue(data, count, delivered);
    return delivered;  // no section starts here: the rest is stuffing
  }

  const int pointerField = data[0];
  if (1 + pointerField > count) {
    ++iPacketsInvalid;
    CutPending();
    return 0;
  }
  if (iHeld > 0) {
    Continue(data + 1, pointerField, delivered);
    // The section in progress must end before the first one starting here.
    if (iHeld > 0) CutPending();
  } else {
    iBytesWithoutStart += static_cast<unsigned int>(pointerField);
  }
  StartSections(data + 1 + pointerField, count - 1 - pointerField, delivered);
  return delivered;
}
