// Builds DSM-CC carousels for tests (ISO/IEC 13818-6, ETSI TR 101 202): DSI,
// DII and DDB sections, and the BIOP messages of an object carousel's modules,
// hostile ones included.
#ifndef RAVEL_TESTS_CAROUSELBUILDER_H
#define RAVEL_TESTS_CAROUSELBUILDER_H

#include <cstdint>
#include <string>
#include <utility>
#include <vector>

#include "StreamBuilder.h"

namespace cb {

// A download message: 12-byte header, then `body`.
Bytes DsmccMessage(uint16_t messageId, uint32_t transactionId, const Bytes& body);

struct ModuleEntry {
  ModuleEntry(uint16_t id, uint32_t size, uint8_t version, Bytes info = Bytes())
      : id(id), size(size), version(version), info(std::move(info)) {}
  uint16_t id;
  uint32_t size;
  uint8_t version;
  Bytes info;  // moduleInfo bytes
};

Bytes DiiSection(uint32_t downloadId, uint16_t blockSize, const std::vector<ModuleEntry>& modules);
Bytes DdbSection(uint32_t downloadId, uint16_t moduleId, uint8_t version, uint16_t block, const Bytes& data);
// A DSI whose private data is `ior`, the service gateway's.
Bytes DsiSection(const Bytes& ior);

// An IOR with a BIOP profile placing object `key` in module `moduleId`.
Bytes Ior(const std::string& typeId, uint16_t moduleId, const std::string& key);
// A name binding: one name component (closing NUL added), then the IOR.
Bytes Binding(const std::string& name, const std::string& kind, const Bytes& ior);
// A service gateway ("srg") or directory ("dir") message with its bindings.
Bytes DirectoryMessage(const std::string& key, const std::string& kind, const std::vector<Bytes>& bindings);
Bytes FileMessage(const std::string& key, const std::string& content);
// Any BIOP 1.0 message: key, kind, empty object info and context list, body.
Bytes BiopMessage(const std::string& key, const std::string& kind, const Bytes& body);

// BIOP::ModuleInfo whose user info holds a compressed module descriptor
// (0x09) declaring `originalSize`, or none when `compressed` is false.
Bytes ObjectModuleInfo(bool compressed, uint32_t originalSize);
Bytes Deflate(const Bytes& bytes);

// The DDB sections that carry `module` in blocks of `blockSize`.
std::vector<Bytes> ModuleBlocks(uint32_t downloadId, uint16_t moduleId, uint8_t version, uint16_t blockSize,
                                const Bytes& module);

// An AIT section with one application carrying a name and a Ginga location
// (base directory, initial class).
Bytes AitSection(const std::string& name, const std::string& base, const std::string& initial);

}  // namespace cb

#endif
