#include "ModuleInflate.h"

#include <zlib.h>

namespace ravel_dump {
namespace {

uint32_t Read32(const uint8_t* p) {
  return static_cast<uint32_t>(p[0]) << 24 | static_cast<uint32_t>(p[1]) << 16 | static_cast<uint32_t>(p[2]) << 8 |
         p[3];
}

unsigned int Read16(const uint8_t* p) { return static_cast<unsigned int>(p[0]) << 8 | p[1]; }

// A descriptor loop that fills `length` exactly, searched for the two
// compression descriptors. False when the bytes are no descriptor loop.
bool ReadDescriptors(const uint8_t* p, std::size_t length, ModuleCompression& compression) {
  std::size_t at = 0;
  while (at < length) {
    if (length - at < 2 || length - at - 2 < p[at + 1]) return false;
    const uint8_t tag = p[at];
    const uint8_t* body = p + at + 2;
    const std::size_t bodyLength = p[at + 1];
    // 0x09: compression_method (RFC 1950 CMF, deflate in its low 4 bits), original_size.
    if (tag == 0x09 && bodyLength >= 5 && (body[0] & 0x0F) == 8) {
      compression.compressed = true;
      compression.originalSize = Read32(body + 1);
    }
    // 0xC2: compression_type (0: zlib), original_size.
    if (tag == 0xC2 && bodyLength >= 5 && body[0] == 0) {
      compression.compressed = true;
      compression.originalSize = Read32(body + 1);
    }
    at += 2 + bodyLength;
  }
  return true;
}

}  // namespace

ModuleCompression ReadModuleCompression(const uint8_t* info, std::size_t length) {
  ModuleCompression compression;
  // BIOP::ModuleInfo: moduleTimeOut, blockTimeOut, minBlockTime (32 each),
  // taps_count 8, taps (id 16, use 16, association_tag 16, selector_length 8,
  // selector), userInfoLength 8, userInfo (descriptors).
  std::size_t at = 12;
  if (length > at) {
    unsigned int taps = info[at++];
    for (unsigned int i = 0; i < taps && at + 7 <= length; ++i) at += 7 + info[at + 6];
    if (at < length && length - at - 1 == info[at] && ReadDescriptors(info + at + 1, info[at], compression)) {
      return compression;
    }
  }
  compression = ModuleCompression();
  ReadDescriptors(info, length, compression);
  return compression;
}

std::vector<ModuleCompression> DiiModuleCompressions(const uint8_t* message, std::size_t size) {
  std::vector<ModuleCompression> modules;
  // Header: ..., adaptationLength at 9, messageLength at 10; the body follows
  // the 12 bytes and the adaptation header.
  if (size < 12) return modules;
  std::size_t at = 12 + message[9];
  // downloadId 32, blockSize 16, windowSize 8, ackPeriod 8, tCDownloadWindow 32,
  // tCDownloadScenario 32, compatibilityDescriptor (its 16-bit length first).
  if (size < at + 18) return modules;
  at += 16;
  at += 2 + Read16(message + at);
  if (size < at + 2) return modules;
  unsigned int count = Read16(message + at);
  at += 2;
  for (unsigned int i = 0; i < count; ++i) {
    // moduleId 16, moduleSize 32, moduleVersion 8, moduleInfoLength 8, moduleInfo.
    if (size < at + 8 || size - at - 8 < message[at + 7]) break;
    modules.push_back(ReadModuleCompression(message + at + 8, message[at + 7]));
    at += 8 + message[at + 7];
  }
  return modules;
}

bool InflateModule(const std::vector<uint8_t>& compressed, uint32_t originalSize, std::vector<uint8_t>& inflated,
                   std::string& error) {
  if (originalSize > kMaxInflatedModuleSize) {
    error = "declares " + std::to_string(originalSize) + " bytes inflated, more than the " +
            std::to_string(kMaxInflatedModuleSize) + " accepted";
    return false;
  }
  // One byte more than declared, to tell a stream that goes on from one that fits.
  inflated.assign(static_cast<std::size_t>(originalSize) + 1, 0);
  z_stream stream = z_stream();
  if (inflateInit(&stream) != Z_OK) {
    error = "zlib cannot start";
    return false;
  }
  stream.next_in = const_cast<Bytef*>(compressed.data());
  stream.avail_in = static_cast<uInt>(compressed.size());
  stream.next_out = inflated.data();
  stream.avail_out = static_cast<uInt>(inflated.size());
  int result = inflate(&stream, Z_FINISH);
  const std::size_t produced = stream.total_out;
  const char* message = stream.msg;
  inflateEnd(&stream);
  inflated.resize(produced);
  if (result != Z_STREAM_END) {
    error = produced > originalSize ? "inflates to more than the declared " + std::to_string(originalSize) + " bytes"
                                    : std::string("is no complete zlib stream") + (message ? std::string(": ") + message : "");
    return false;
  }
  if (produced != originalSize) {
    error = "inflates to " + std::to_string(produced) + " bytes, not the declared " + std::to_string(originalSize);
    return false;
  }
  return true;
}

}  // namespace ravel_dump
