#include "CarouselBuilder.h"

#include <zlib.h>

#include <algorithm>

namespace cb {

using sb::Cat;
using sb::U16;
using sb::U32;
using sb::U8;

Bytes DsmccMessage(uint16_t messageId, uint32_t transactionId, const Bytes& body) {
  return Cat({U8(0x11), U8(0x03), U16(messageId), U32(transactionId), U8(0xFF), U8(0), U16(body.size()), body});
}

Bytes DiiSection(uint32_t downloadId, uint16_t blockSize, const std::vector<ModuleEntry>& modules) {
  Bytes body = Cat({U32(downloadId), U16(blockSize), U8(0), U8(0), U32(0), U32(0), U16(0), U16(modules.size())});
  for (const ModuleEntry& m : modules) {
    sb::Append(body, Cat({U16(m.id), U32(m.size), U8(m.version), U8(m.info.size()), m.info}));
  }
  sb::Append(body, U16(0));
  sb::SectionOptions options;
  options.tableId = 0x3B;
  options.tableIdExtension = 0x0002;
  return sb::LongSection(options, DsmccMessage(0x1002, 0x80000002, body));
}

Bytes DdbSection(uint32_t downloadId, uint16_t moduleId, uint8_t version, uint16_t block, const Bytes& data) {
  Bytes body = Cat({U16(moduleId), U8(version), U8(0xFF), U16(block), data});
  sb::SectionOptions options;
  options.tableId = 0x3C;
  options.tableIdExtension = moduleId;
  options.version = version & 0x1F;
  options.sectionNumber = block & 0xFF;
  return sb::LongSection(options, DsmccMessage(0x1003, downloadId, body));
}

Bytes DsiSection(const Bytes& ior) {
  Bytes body = Cat({Bytes(20, 0xFF), U16(0), U16(ior.size()), ior});
  sb::SectionOptions options;
  options.tableId = 0x3B;
  options.tableIdExtension = 0x0000;
  return sb::LongSection(options, DsmccMessage(0x1006, 0x80000000, body));
}

Bytes Ior(const std::string& typeId, uint16_t moduleId, const std::string& key) {
  Bytes location = Cat({U32(1), U16(moduleId), U8(1), U8(0), U8(key.size()), sb::Text(key)});
  Bytes profile = Cat({U8(0), U8(1), U32(0x49534F50), U8(location.size()), location});
  Bytes type = Cat({sb::Text(typeId), U8(0)});
  return Cat({U32(type.size()), type, U32(1), U32(0x49534F06), U32(profile.size()), profile});
}

Bytes Binding(const std::string& name, const std::string& kind, const Bytes& ior) {
  Bytes id = Cat({sb::Text(name), U8(0)});
  Bytes kindBytes = Cat({sb::Text(kind), U8(0)});
  return Cat({U8(1), U8(id.size()), id, U8(kindBytes.size()), kindBytes, U8(1), ior, U16(0)});
}

Bytes BiopMessage(const std::string& key, const std::string& kind, const Bytes& body) {
  Bytes kindBytes = Cat({sb::Text(kind), U8(0)});
  Bytes rest = Cat({U8(key.size()), sb::Text(key), U32(kindBytes.size()), kindBytes, U16(0), U8(0),
                    U32(body.size()), body});
  return Cat({sb::Text("BIOP"), U8(1), U8(0), U8(0), U8(0), U32(rest.size()), rest});
}

Bytes DirectoryMessage(const std::string& key, const std::string& kind, const std::vector<Bytes>& bindings) {
  return BiopMessage(key, kind, Cat({U16(bindings.size()), Cat(bindings)}));
}

Bytes FileMessage(const std::string& key, const std::string& content) {
  return BiopMessage(key, "fil", Cat({U32(content.size()), sb::Text(content)}));
}

Bytes ObjectModuleInfo(bool compressed, uint32_t originalSize) {
  Bytes user = compressed ? sb::Descriptor(0x09, Cat({U8(0x78), U32(originalSize)})) : Bytes();
  Bytes tap = Cat({U16(0), U16(0x0017), U16(0x000A), U8(0)});
  return Cat({U32(0), U32(0), U32(0), U8(1), tap, U8(user.size()), user});
}

Bytes Deflate(const Bytes& bytes) {
  uLongf size = compressBound(bytes.size());
  Bytes out(size);
  compress(out.data(), &size, bytes.data(), bytes.size());
  out.resize(size);
  return out;
}

std::vector<Bytes> ModuleBlocks(uint32_t downloadId, uint16_t moduleId, uint8_t version, uint16_t blockSize,
                                const Bytes& module) {
  std::vector<Bytes> sections;
  for (size_t from = 0, block = 0; from < module.size(); from += blockSize, ++block) {
    Bytes data(module.begin() + from, module.begin() + std::min(module.size(), from + blockSize));
    sections.push_back(DdbSection(downloadId, moduleId, version, static_cast<uint16_t>(block), data));
  }
  return sections;
}

Bytes AitSection(const std::string& name, const std::string& base, const std::string& initial) {
  Bytes nameBody = Cat({sb::Text("por"), U8(name.size()), sb::Text(name)});
  Bytes locationBody = Cat({U8(base.size()), sb::Text(base), U8(0), sb::Text(initial)});
  Bytes descriptors = Cat({sb::Descriptor(0x01, nameBody), sb::Descriptor(0x07, locationBody)});
  Bytes application = Cat({U32(0x0000000A), U16(0x0001), U8(0x01),
                           U16(0xC000 | descriptors.size()), descriptors});
  sb::SectionOptions options;
  options.tableId = 0x74;
  options.tableIdExtension = 0x0009;
  Bytes body = Cat({U16(0xF000), U16(0xF000 | application.size()), application});
  return sb::LongSection(options, body);
}

}  // namespace cb
