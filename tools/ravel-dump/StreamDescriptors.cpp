// Stream descriptor sections read from their bytes: the library's table of
// stream descriptors keeps no stream event descriptor (0x1A), so its event
// ids, NPT and private data are read here.
#include <set>
#include <tuple>

#include "DescriptorNames.h"
#include "Output.h"
#include "SectionBytes.h"

namespace ravel_dump {
namespace {

const std::size_t kHeaderSize = 8;
const std::size_t kTrailerSize = 4;  // CRC_32 or checksum

long long Bits33(const uint8_t* p) {
  return (static_cast<long long>(p[0] & 0x01) << 32) | (static_cast<long long>(p[1]) << 24) | (p[2] << 16) |
         (p[3] << 8) | p[4];
}

// In a stream descriptor section, tag 0x40 is the general event descriptor
// (ABNT NBR 15606-3), not the SI's network name.
const uint8_t kGeneralEventTag = 0x40;

StreamDescriptorSummary Read(const TableEntry& table, int tag, const uint8_t* body, std::size_t length) {
  StreamDescriptorSummary d;
  d.pid = table.pid;
  d.extension = table.extension;
  d.version = table.version;
  d.tag = tag;
  d.name = tag == kGeneralEventTag ? std::string("general event") : DescriptorName(static_cast<uint8_t>(tag));
  d.length = length;
  if (tag == 0x1A && length >= 10) {
    d.eventId = (body[0] << 8) | body[1];
    d.npt = Bits33(body + 5);
    d.privateData.assign(reinterpret_cast<const char*>(body + 10), length - 10);
  } else if (tag == 0x17 && length >= 18) {
    d.stc = Bits33(body + 1);
    d.npt = Bits33(body + 9);
    d.scaleNumerator = (body[14] << 8) | body[15];
    d.scaleDenominator = (body[16] << 8) | body[17];
  }
  return d;
}

}  // namespace

std::vector<StreamDescriptorSummary> BuildStreamDescriptors(const TableRegistry& registry) {
  std::vector<StreamDescriptorSummary> found;
  // Stream events are sent again and again: each distinct one once.
  std::set<std::tuple<int, int, int, int, std::string>> seen;
  auto readTable = [&](const TableEntry& table) {
    if (table.kind != kRavelKindStreamEvents) return;
    for (const auto& kv : table.sections) {
      const uint8_t* s = kv.second.Bytes();
      const std::size_t end = kv.second.Size() >= kHeaderSize + kTrailerSize ? kv.second.Size() - kTrailerSize : 0;
      if (end <= kHeaderSize) continue;
      EachDescriptor(s + kHeaderSize, end - kHeaderSize,
                     [&](uint8_t tag, const uint8_t* body, std::size_t length) {
                       std::string bytes(reinterpret_cast<const char*>(body), length);
                       if (seen.insert(std::make_tuple(table.pid, table.extension, static_cast<int>(table.version),
                                                       static_cast<int>(tag), bytes)).second) {
                         found.push_back(Read(table, tag, body, length));
                       }
                     });
    }
  };
  // Versions a newer one replaced came first on the air.
  for (const auto& entry : registry.ReplacedStreamEvents()) readTable(*entry);
  for (const auto& entry : registry.Tables()) readTable(*entry);
  return found;
}

}  // namespace ravel_dump
