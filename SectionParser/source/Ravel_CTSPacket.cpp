#include "Ravel_CTSPacket.h"

#include <stdint.h>

#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CTSPacket");

RavelCTSPacket::RavelCTSPacket(unsigned char* packet) {
  Clear();
  ParseRawData(packet);
}

RavelCTSPacket::~RavelCTSPacket() {}

void RavelCTSPacket::Clear() {
  bTransportErrorIndicator = 0;
  bPayloadUnitStartIndicator = 0;
  bTransportPriority = 0;
  iPID = 0;
  iTransportScramblingControl = 0;
  iAdaptationFieldControl = 0;
  iContinuityCounter = 0;
  pAdaptionFieldStartPtr = 0;
  pPayloadStartPtr = 0;
}

// Every packet of every PID passes here, so the four header bytes are taken
// with masks instead of a bit reader; the fields are read in wire order.
int RavelCTSPacket::ParseRawData(unsigned char* packet) {
  if (packet == 0) {
    Clear();
    return kRavelErrInvalidArgument;
  }
  if (packet[0] != RAVEL_TS_SYNC_BYTE) {
    RAVEL_TRACE(RAVEL_PARSER_ERROR, "Invalid TS Packet Start Byte=[0x%02x]\n", packet[0]);
    return kRavelErrSyncByte;
  }

  const unsigned char flags = packet[1];
  bTransportErrorIndicator = (flags >> 7) & 0x01;                         // 1xxxxxxx
  bPayloadUnitStartIndicator = (flags >> 6) & 0x01;                       // x1xxxxxx
  bTransportPriority = (flags >> 5) & 0x01;                               // xx1xxxxx
  iPID = static_cast<unsigned short>(((flags & 0x1F) << 8) | packet[2]);  // xxx11111 + 8 bits
  const unsigned char control = packet[3];
  iTransportScramblingControl = (control >> 6) & 0x03;  // 11xxxxxx
  iAdaptationFieldControl = (control >> 4) & 0x03;      // xx11xxxx
  iContinuityCounter = control & 0x0F;                  // xxxx1111

  switch (iAdaptationFieldControl) {
    case 3: {
      pAdaptionFieldStartPtr = packet + 4;
      // adaptation_field_length is not checked against the packet: above 183
      // the payload position lies beyond the packet. The address is formed as
      // an integer so that no pointer leaves the buffer; readers check it.
      const unsigned int adaptationLength = packet[4];
      pPayloadStartPtr = reinterpret_cast<unsigned char*>(reinterpret_cast<uintptr_t>(packet) + 5u + adaptationLength);
      return kRavelOk;
    }
    case 2:
      pAdaptionFieldStartPtr = packet + 4;
      pPayloadStartPtr = 0;
      return kRavelOk;
    case 1:
      pAdaptionFieldStartPtr = 0;
      pPayloadStartPtr = packet + 4;
      return kRavelOk;
    default:
      RAVEL_TRACE(RAVEL_PARSER_ERROR, "Invalid Adaptation Field Control! => 0x%x]",
                  static_cast<unsigned int>(iAdaptationFieldControl));
      pAdaptionFieldStartPtr = 0;
      pPayloadStartPtr = 0;
      return kRavelErrInvalidArgument;
  }
}

void RavelCTSPacket::Show() {
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#################################################\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#### TS Packet Header Information\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP,
              "Transport Error Indicator=[%d], Payload Unit Start Indicator=[%d], Transport Pritoriry=[%d]\n",
              bTransportErrorIndicator, bPayloadUnitStartIndicator, bTransportPriority);
  RAVEL_TRACE(RAVEL_PARSER_DUMP,
              "PID=[0x%02x], Transport Scrambling Control=[%d], Adaptation Field Control=[%d], "
              "Contiuity Index=[%d]\n",
              static_cast<unsigned int>(iPID), static_cast<int>(iTransportScramblingControl),
              static_cast<int>(iAdaptationFieldControl), static_cast<int>(iContinuityCounter));
  // The receiver prints addresses as 32-bit numbers.
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "Adaptation Field Start Ptr Addr=[0x%08x], Payload Start Ptr Addr=[0x%08x]\n",
              static_cast<unsigned int>(reinterpret_cast<uintptr_t>(pAdaptionFieldStartPtr)),
              static_cast<unsigned int>(reinterpret_cast<uintptr_t>(pPayloadStartPtr)));
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "#################################################\n");
}
