// Section reassembly from the transport stream packets of one PID, every
// section handed out whole (ISO/IEC 13818-1 2.4.3.2, 2.4.3.3, 2.4.4):
//   packet: sync_byte 8 | transport_error_indicator 1 | payload_unit_start_indicator 1 |
//           transport_priority 1 | PID 13 | scrambling 2 | adaptation_field_control 2 |
//           continuity_counter 4 | adaptation_field | payload
//   payload with payload_unit_start_indicator 1:
//     pointer_field 8 | end of the section in progress (pointer_field bytes) |
//     section | section | ... | 0xFF stuffing to the end of the packet
//   payload with payload_unit_start_indicator 0: the next bytes of the section in
//     progress, then 0xFF stuffing (no section starts in such a packet)
//   section: table_id 8 | flags 4 | section_length 12 | section_length bytes
//
// Unlike RavelCTSPktStore, which keeps the receivers' long-standing behaviour,
// every section is closed by its own section_length, however many share a
// packet, so no valid section is lost. What cannot be delivered whole is
// dropped and counted, never handed out cut:
//   - a packet with transport_error_indicator set is ignored (its PID and
//     counter cannot be trusted either); the next packet's counter tells
//     whether it was one of ours;
//   - a repeated packet (the same continuity_counter once more) is dropped; a
//     counter that does not step by one (or repeats twice) loses the section in
//     progress;
//   - packets with adaptation_field_control 2 carry no payload and do not step
//     the counter; 0 (reserved) and an adaptation field running to or past the
//     end of a packet that claims a payload make the packet invalid;
//   - a section still short when the next one starts (by the pointer_field), or
//     when the counter breaks, is cut.
//
// A handler receives each section in a buffer the assembler owns, exactly
// 3 + section_length bytes (so RavelCReadWindow::OwnedSize of it is its size),
// valid until the handler returns. A handler rather than a RavelCSectionData:
// one packet can complete any number of sections (up to 61 short ones) where a
// RavelCSectionData holds five, and no section costs an allocation unless the
// receiver keeps it.
#ifndef RAVEL_CSECTIONASSEMBLER_H
#define RAVEL_CSECTIONASSEMBLER_H

// Receives one whole section: `size` is 3 + section_length.
typedef void (*RavelSectionHandler)(void* context, unsigned char* section, int size);

#define RAVEL_MAX_SECTION_SIZE 4098  // 3 + the largest 12-bit section_length

class RavelCSectionAssembler {
 public:
  // `handler` (may be null: sections are then only counted) is called with `context`.
  RavelCSectionAssembler(RavelSectionHandler handler, void* context);
  ~RavelCSectionAssembler();

  // One 188-byte packet of this assembler's PID, in arrival order. Gives the
  // number of sections it completed and handed to the handler.
  int AddTSPacket(const unsigned char* packet);
  // Drops the section in progress (counted as cut) and forgets the continuity
  // counter: at the end of the input, or after a change of channel.
  void ClearPacketBuffer();

  // Sections handed out whole.
  unsigned int iSectionsDelivered = 0;
  // Sections started but lost: a packet missing or repeated too often, the
  // next section starting early, or an invalid packet in the middle.
  unsigned int iSectionsCut = 0;
  // Packets dropped: transport_error_indicator set; a repeat of the previous
  // packet; no sync byte, reserved adaptation_field_control, an adaptation
  // field leaving no payload or a pointer_field past the packet end.
  unsigned int iPacketsTransportError = 0;
  unsigned int iPacketsRepeated = 0;
  unsigned int iPacketsInvalid = 0;
  // Counter steps other than +1 that the adaptation field did not announce
  // with its discontinuity_indicator.
  unsigned int iContinuityBreaks = 0;
  // Payload bytes of sections whose start was never received (after a break
  // or at the start of the stream), skipped until the next section start.
  unsigned int iBytesWithoutStart = 0;

 private:
  RavelCSectionAssembler(const RavelCSectionAssembler&);
  RavelCSectionAssembler& operator=(const RavelCSectionAssembler&);

  // Whether `counter` continues the PID; drops the section in progress when not.
  // False for a repeat, which is then dropped.
  bool TakeCounter(int counter, bool announcedDiscontinuity);
  // Adds up to `count` bytes to the section in progress; gives the bytes taken
  // and delivers the section when it is whole.
  int Continue(const unsigned char* data, int count, int& delivered);
  // Reads the sections starting at `data` up to the end of the payload.
  void StartSections(const unsigned char* data, int count, int& delivered);
  void Deliver(int& delivered);
  void CutPending();

  RavelSectionHandler pHandler;
  void* pContext;
  int iLastCounter;   // -1 before the first packet with payload
  int iRepeats = 0;       // times the last counter has been seen again
  int iHeld = 0;          // bytes of the section in progress; 0 when none
  int iSectionSize = 0;   // its size, 0 while its first three bytes are not all held
  unsigned char aSection[RAVEL_MAX_SECTION_SIZE];
};

#endif
