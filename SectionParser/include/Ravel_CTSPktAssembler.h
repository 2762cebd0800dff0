// Section reassembly from the transport stream packets of one PID
// (ISO/IEC 13818-1 2.4.4.1/2.4.4.2):
//   payload of a packet with payload_unit_start_indicator 1:
//     pointer_field 8 | pointer_field bytes ending the previous section | new section ...
//   payload of a packet with payload_unit_start_indicator 0: continuation bytes
//   section: table_id 8 | flags 4 | section_length 12 | section_length bytes
// Trailing 0xFF bytes after a section are stuffing.
#ifndef RAVEL_CTSPKTASSEMBLER_H
#define RAVEL_CTSPKTASSEMBLER_H

#include "Ravel_CArray.h"

#define RAVEL_MAX_ASSEMBLED_SECTIONS 5

// One stored payload piece: up to a whole packet.
class RavelCPktEntry {
 public:
  RavelCPktEntry();
  RavelCPktEntry(const unsigned char* data, int len);

  // Copies `len` bytes; 189 or more is refused with a trace and leaves the piece empty.
  void SetData(const unsigned char* data, int len);
  // Copies the piece out once: afterwards it is empty. Gives the count copied.
  int GetData(unsigned char* destination, int& count);

  unsigned char aData[188] = {};
  unsigned char iDataLen = 0;  // 0 to 188; 0 once consumed
};

// Completed sections of one or two AddTSPacket calls. The buffers are malloc'ed
// and belong to the record. Each owns iSectionSize bytes, or 3 + section_length
// when that is more (bytes no packet supplied are zero), so that a parse of it
// stays inside it whatever its lengths say; copies own as much.
class RavelCSectionData {
 public:
  RavelCSectionData();
  RavelCSectionData(const RavelCSectionData& other);
  RavelCSectionData& operator=(const RavelCSectionData& other);
  ~RavelCSectionData();

  unsigned char* pSection[RAVEL_MAX_ASSEMBLED_SECTIONS] = {};
  int iSectionSize[RAVEL_MAX_ASSEMBLED_SECTIONS] = {};  // table_id to the end of the CRC
  int iSectionCount = 0;

  // Takes ownership of a malloc'ed section that owns the bytes said above. A record already holding five
  // sections cannot store more: the buffer is freed and the section dropped.
  void Append(unsigned char* section, int size);

 private:
  void Release();
  void CopyFrom(const RavelCSectionData& other);
};

// Reassembles the sections of one PID; hand it every packet of that PID in order.
class RavelCTSPktStore {
 public:
  RavelCTSPktStore();
  RavelCTSPktStore(RavelCTSPktStore& other);
  RavelCTSPktStore& operator=(RavelCTSPktStore& other);
  ~RavelCTSPktStore();

  // 1 when this packet completed at least one section (appended to `out`, at
  // index out.iSectionCount; `out` is never cleared), else 0.
  int AddTSPacket(const unsigned char* packet, RavelCSectionData& out);
  // Joins the stored pieces into one section of `out` and resets the store.
  void GetAssembleData(RavelCSectionData& out);
  // Drops whatever is pending. Gives 0.
  int ClearPacketBuffer();

  unsigned short iPID;  // of the packet that started the section in progress; 0xFFFF when idle
  int iCurBufSize = 0;      // bytes held in the pieces
  int iLastConIndex;    // continuity_counter of the last stored packet; 255 when idle
  int iSectionLen;      // section_length + 3 of the section in progress; -1 while unknown
  RavelCPointerArray<RavelCPktEntry> iPacketArray;

 private:
  void Reset();
  void StorePiece(const unsigned char* data, int len);
};

#endif
