// Transport stream packet header (ISO/IEC 13818-1 2.4.3.2), 188-byte packets:
//   sync_byte 8 (0x47)
//   transport_error_indicator 1 | payload_unit_start_indicator 1 | transport_priority 1 | PID 13
//   transport_scrambling_control 2 | adaptation_field_control 2 | continuity_counter 4
//   adaptation_field (when adaptation_field_control is 2 or 3): adaptation_field_length 8, then that many bytes
//   payload (when adaptation_field_control is 1 or 3): to the end of the packet
// Nothing is copied: both locations point into the caller's packet buffer.
#ifndef RAVEL_CTSPACKET_H
#define RAVEL_CTSPACKET_H

#define RAVEL_TS_PACKET_SIZE 188
#define RAVEL_TS_SYNC_BYTE 0x47

class RavelCTSPacket {
 public:
  // Clears every member, then parses `packet` (the result is dropped; a null
  // packet leaves the object cleared).
  explicit RavelCTSPacket(unsigned char* packet);
  virtual ~RavelCTSPacket();

  // 0, -7 (no sync byte: members unchanged) or -8 (null packet: members
  // cleared; reserved adaptation_field_control: both pointers null).
  virtual int ParseRawData(unsigned char* packet);
  virtual void Show();

  unsigned char bTransportErrorIndicator;
  unsigned char bPayloadUnitStartIndicator;
  unsigned char bTransportPriority;
  unsigned short iPID;
  // One byte, scrambling control in the low bits, continuity counter in the high bits.
  unsigned char iTransportScramblingControl : 2;
  unsigned char iAdaptationFieldControl : 2;  // 1 payload only, 2 adaptation field only, 3 both
  unsigned char iContinuityCounter : 4;
  // The adaptation_field_length byte (packet + 4), or null.
  unsigned char* pAdaptionFieldStartPtr;
  // The first payload byte, or null. With an adaptation_field_length above 183
  // it lies beyond the packet and must not be read.
  unsigned char* pPayloadStartPtr;

 private:
  void Clear();
};

#endif
