#include "BenchData.h"

#include <algorithm>
#include <map>

#include "Captures.h"

namespace bench {

namespace {

inline size_t SectionSize(const uint8_t* section) {
  return ((static_cast<size_t>(section[1] & 0x0F) << 8) | section[2]) + 3;
}

// Takes the complete sections at the front of `pending`; a 0xFF table_id is
// stuffing up to the end of the packet.
void TakeSections(Bytes& pending, std::vector<Bytes>& sections) {
  size_t at = 0;
  while (at + 3 <= pending.size() && pending[at] != 0xFF) {
    size_t size = SectionSize(&pending[at]);
    if (at + size > pending.size()) break;
    sections.push_back(Bytes(pending.begin() + static_cast<long>(at), pending.begin() + static_cast<long>(at + size)));
    at += size;
  }
  if (at < pending.size() && pending[at] == 0xFF) at = pending.size();
  pending.erase(pending.begin(), pending.begin() + static_cast<long>(at));
}

}  // namespace

std::vector<Bytes> TsSections(const Bytes& stream) {
  std::vector<Bytes> sections;
  std::map<unsigned int, Bytes> pending;   // bytes of the section in progress, per PID
  std::map<unsigned int, int> lastCounter;
  for (size_t at = 0; at + 188 <= stream.size(); at += 188) {
    const uint8_t* p = &stream[at];
    if (p[0] != 0x47 || (p[1] & 0x80) != 0) continue;
    const unsigned int pid = ((p[1] & 0x1Fu) << 8) | p[2];
    const bool unitStart = (p[1] & 0x40) != 0;
    const unsigned int control = (p[3] >> 4) & 0x3u;
    const int counter = p[3] & 0x0F;
    if ((control & 0x1) == 0) continue;
    size_t offset = 4 + ((control & 0x2) ? 1u + p[4] : 0u);
    if (offset >= 188) continue;
    Bytes& section = pending[pid];
    auto last = lastCounter.find(pid);
    if (last != lastCounter.end() && ((last->second + 1) & 0x0F) != counter) section.clear();
    lastCounter[pid] = counter;
    if (unitStart) {
      const size_t pointer = p[offset];
      const size_t start = offset + 1 + pointer;
      if (start > 188) {
        section.clear();
        continue;
      }
      if (!section.empty()) {
        section.insert(section.end(), p + offset + 1, p + start);
        TakeSections(section, sections);
      }
      section.assign(p + start, p + 188);
    } else {
      if (section.empty()) continue;
      section.insert(section.end(), p + offset, p + 188);
    }
    TakeSections(section, sections);
  }
  return sections;
}

std::vector<unsigned int> TableIds(unsigned int first, unsigned int last) {
  std::vector<unsigned int> ids;
  for (unsigned int id = first; id <= last; ++id) ids.push_back(id);
  return ids;
}

std::vector<Bytes> CaptureSections(const std::vector<std::string>& names, const std::vector<unsigned int>& tableIds,
                                   std::string& missing) {
  std::vector<Bytes> selected;
  missing.clear();
  for (const std::string& name : names) {
    Bytes contents;
    if (!captures::Load(name, contents)) {
      missing += (missing.empty() ? "" : " ") + name;
      continue;
    }
    const bool isTs = name.size() > 3 && name.compare(name.size() - 3, 3, ".ts") == 0;
    std::vector<Bytes> all = isTs ? TsSections(contents) : captures::SplitSections(contents);
    for (Bytes& s : all) {
      if (s.size() >= 3 && std::find(tableIds.begin(), tableIds.end(), s[0]) != tableIds.end()) {
        s.resize(s.size() + kSectionMargin, 0x00);
        selected.push_back(std::move(s));
      }
    }
  }
  return selected;
}

}  // namespace bench
