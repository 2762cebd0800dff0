// Compressed carousel modules. A DII's module info may say that a module is
// sent compressed with zlib, and how large it is once inflated: the DVB
// compressed module descriptor (tag 0x09, ETSI TR 101 202, in the user info of
// an object carousel's BIOP::ModuleInfo) or the ARIB / ABNT compression type
// descriptor (tag 0xC2, straight in a data carousel's module info).
#ifndef RAVEL_DUMP_MODULEINFLATE_H
#define RAVEL_DUMP_MODULEINFLATE_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace ravel_dump {

struct ModuleCompression {
  bool compressed = false;
  uint32_t originalSize = 0;
};

// Inflated modules larger than this are refused: the declared size comes from
// the air and the memory is the receiver's.
const uint32_t kMaxInflatedModuleSize = 64u << 20;

// What the module info bytes of one DII module record declare.
ModuleCompression ReadModuleCompression(const uint8_t* info, std::size_t length);

// The module info of each module record of a DII message (from its 12-byte
// header on, `size` bytes), in message order; fewer when the message is cut.
std::vector<ModuleCompression> DiiModuleCompressions(const uint8_t* message, std::size_t size);

// Inflates a zlib stream that must come to exactly `originalSize` bytes. False
// with a one-line reason otherwise.
bool InflateModule(const std::vector<uint8_t>& compressed, uint32_t originalSize, std::vector<uint8_t>& inflated,
                   std::string& error);

}  // namespace ravel_dump

#endif
