// Transport stream packets into RavelCSectionAssembler. Every section it hands
// out must be whole (exactly 3 + section_length bytes) and goes on into the
// tables through the safe entry layer (copied and dumped). The input is cut
// into 188-byte packets; a shorter tail is dropped.
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>

#include "FuzzSupport.h"
#include "Ravel_ByteOrder.h"
#include "Ravel_CDsmccMsgBase.h"
#include "Ravel_CSafeSection.h"
#include "Ravel_CSectionAssembler.h"
#include "Ravel_CTableBase.h"

namespace {

const size_t kPacketSize = 188;

void ParseWholeSection(void*, unsigned char* section, int size) {
  if (size < 3 || size != RavelSectionSize(section)) std::abort();
  fuzz::ParseSafely(section, size);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  fuzz::SilenceTraces();
  RavelCSectionAssembler assembler(ParseWholeSection, 0);
  unsigned int delivered = 0;
  for (size_t at = 0; at + kPacketSize <= size; at += kPacketSize) {
    // Each packet in a buffer of its own, exactly 188 bytes long.
    unsigned char* packet = new unsigned char[kPacketSize];
    std::memcpy(packet, data + at, kPacketSize);
    delivered += static_cast<unsigned int>(assembler.AddTSPacket(packet));
    delete[] packet;
  }
  assembler.ClearPacketBuffer();
  if (delivered != assembler.iSectionsDelivered) std::abort();
  return 0;
}
