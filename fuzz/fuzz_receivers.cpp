// The receivers' own path, with no safe entry layer: transport stream packets
// into one section store per PID, and every section it hands out straight into
// the class its table_id selects (a DSM-CC message 8 bytes in, by its message
// id), over the store's own buffer; then the object is copied and both are
// dumped. Each section is parsed twice: by the class's constructor over the
// store's buffer, and by ParseRawData over the buffer of a copy of the
// RavelCSectionData. The input is cut into 188-byte packets; a shorter tail is
// dropped.
//
// The custom mutator recomputes the CRC_32 of every section in the stream after
// each mutation, so that mutations reach the parse operations.
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <map>
#include <memory>

#include "FuzzSupport.h"
#include "Ravel_ByteOrder.h"
#include "Ravel_CDsmccDDB.h"
#include "Ravel_CDsmccDII.h"
#include "Ravel_CDsmccDSI.h"
#include "Ravel_CTSPktAssembler.h"
#include "Ravel_CTableAIT.h"
#include "Ravel_CTableBIT.h"
#include "Ravel_CTableEIT.h"
#include "Ravel_CTableNIT.h"
#include "Ravel_CTablePAT.h"
#include "Ravel_CTablePMT.h"
#include "Ravel_CTableSDT.h"
#include "Ravel_CTableStreamEventDescriptor.h"
#include "Ravel_CTableTDT.h"
#include "Ravel_CTableTOT.h"
#include "StreamRepair.h"

namespace {

enum ParsePath {
  kConstructOver,   // new T(buffer)
  kParseRawDataOn   // new T(0), then ParseRawData(buffer)
};

template <class T>
T* Make(unsigned char* bytes, ParsePath path) {
  if (path == kConstructOver) return new T(bytes);
  T* object = new T(0);
  object->ParseRawData(bytes);
  return object;
}

// The AIT is only ever built empty.
template <>
RavelCAIT* Make<RavelCAIT>(unsigned char* bytes, ParsePath) {
  RavelCAIT* object = new RavelCAIT();
  object->ParseRawData(bytes);
  return object;
}

template <class T>
void ShowCopy(T& object) {
  T copy(object);
  copy.Show();
}

// The PMT is copied by assignment; the TDT and the DSI have no copy.
template <>
void ShowCopy<RavelCPMT>(RavelCPMT& object) {
  RavelCPMT copy(0);
  copy = object;
  copy.Show();
}
template <>
void ShowCopy<RavelCTDT>(RavelCTDT&) {}
template <>
void ShowCopy<RavelCDsmccDSI>(RavelCDsmccDSI&) {}

template <class T>
void ParseCopyShow(unsigned char* bytes, ParsePath path) {
  T* object = Make<T>(bytes, path);
  object->Show();
  ShowCopy(*object);
  delete object;
}

const int kDsmccMessageOffset = 8;

void ParseMessage(unsigned char* section, ParsePath path) {
  unsigned char* message = section + kDsmccMessageOffset;
  switch (RavelRead16(message + 2)) {
    case RAVEL_DSMCC_MSG_DSI: return ParseCopyShow<RavelCDsmccDSI>(message, path);
    case RAVEL_DSMCC_MSG_DII: return ParseCopyShow<RavelCDsmccDII>(message, path);
    case RAVEL_DSMCC_MSG_DDB: return ParseCopyShow<RavelCDsmccDDB>(message, path);
    default: return;
  }
}

// A section of `size` bytes, as the store hands it out.
void ParseSection(unsigned char* section, int size, ParsePath path) {
  if (size < 3) return;
  const unsigned char tableId = section[0];
  if (tableId >= 0x4E && tableId <= 0x6F) return ParseCopyShow<RavelCEIT>(section, path);
  switch (tableId) {
    case 0x00: return ParseCopyShow<RavelCPAT>(section, path);
    case 0x02: return ParseCopyShow<RavelCPMT>(section, path);
    case 0x3B:
    case 0x3C:
      // A receiver reads the message id only from a section that holds it.
      if (size >= kDsmccMessageOffset + 4) ParseMessage(section, path);
      return;
    case 0x3D: return ParseCopyShow<RavelCDsmccStreamEvent>(section, path);
    case 0x40:
    case 0x41: return ParseCopyShow<RavelCNIT>(section, path);
    case 0x42:
    case 0x46: return ParseCopyShow<RavelCSDT>(section, path);
    case 0x70: return ParseCopyShow<RavelCTDT>(section, path);
    case 0x73: return ParseCopyShow<RavelCTOT>(section, path);
    case 0x74: return ParseCopyShow<RavelCAIT>(section, path);
    case 0xC4: return ParseCopyShow<RavelCBIT>(section, path);
    default: return;
  }
}

void ParseSections(const RavelCSectionData& out) {
  for (int i = 0; i < out.iSectionCount; ++i) ParseSection(out.pSection[i], out.iSectionSize[i], kConstructOver);
  RavelCSectionData copy(out);
  for (int i = 0; i < copy.iSectionCount; ++i) ParseSection(copy.pSection[i], copy.iSectionSize[i], kParseRawDataOn);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  fuzz::SilenceTraces();
  std::map<unsigned int, std::unique_ptr<RavelCTSPktStore> > stores;  // one per PID, as a receiver keeps them
  for (size_t at = 0; at + fuzz::kPacketSize <= size; at += fuzz::kPacketSize) {
    // Each packet in a buffer of its own, exactly 188 bytes long.
    unsigned char* packet = new unsigned char[fuzz::kPacketSize];
    std::memcpy(packet, data + at, fuzz::kPacketSize);
    RavelCSectionData out;
    std::unique_ptr<RavelCTSPktStore>& store = stores[((packet[1] & 0x1Fu) << 8) | packet[2]];
    if (!store) store.reset(new RavelCTSPktStore());
    if (store->AddTSPacket(packet, out)) ParseSections(out);
    delete[] packet;
  }
  for (auto& store : stores) {
    RavelCSectionData out;
    store.second->GetAssembleData(out);
    ParseSections(out);
  }
  return 0;
}

// libFuzzer's own mutations (present only in a libFuzzer build), then every
// section's CRC_32 made valid again.
extern "C" size_t LLVMFuzzerMutate(uint8_t* data, size_t size, size_t maxSize) __attribute__((weak));

extern "C" size_t LLVMFuzzerCustomMutator(uint8_t* data, size_t size, size_t maxSize, unsigned int) {
  if (LLVMFuzzerMutate != 0) size = LLVMFuzzerMutate(data, size, maxSize);
  fuzz::RepairSectionCrcs(data, size);
  return size;
}
