// Transport stream packets into the section assembler, and every section it
// completes on into the tables through the safe entry layer (copied and dumped).
// Each packet also goes through the packet header parser and the PCR reader.
// The input is cut into 188-byte packets; a shorter tail is dropped.
#include <cstddef>
#include <cstdint>
#include <cstring>

#include "FuzzSupport.h"
#include "Ravel_CDsmccMsgBase.h"
#include "Ravel_CPCR.h"
#include "Ravel_CSafeSection.h"
#include "Ravel_CTSPacket.h"
#include "Ravel_CTSPktAssembler.h"
#include "Ravel_CTableBase.h"

namespace {

const size_t kPacketSize = 188;

void ParseSections(const RavelCSectionData& out) {
  for (int i = 0; i < out.iSectionCount; ++i) fuzz::ParseSafely(out.pSection[i], out.iSectionSize[i]);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  fuzz::SilenceTraces();
  RavelCTSPktStore store;
  for (size_t at = 0; at + kPacketSize <= size; at += kPacketSize) {
    // Each packet in a buffer of its own, exactly 188 bytes long.
    unsigned char* packet = new unsigned char[kPacketSize];
    std::memcpy(packet, data + at, kPacketSize);

    RavelCTSPacket header(0);
    if (header.ParseRawData(packet) == 0) header.Show();
    RavelCPCR pcr(packet);
    pcr.Show();

    RavelCSectionData out;
    if (store.AddTSPacket(packet, out)) {
      RavelCSectionData copy(out);
      ParseSections(copy);
    }
    delete[] packet;
  }
  RavelCTSPktStore copy(store);
  RavelCSectionData out;
  copy.GetAssembleData(out);
  ParseSections(out);
  store.ClearPacketBuffer();
  return 0;
}
