#include "TableRegistry.h"

#include <algorithm>
#include <set>

namespace ravel_dump {

uint64_t HashBytes(const uint8_t* data, std::size_t size) {
  uint64_t hash = 1469598103934665603ull;
  for (std::size_t i = 0; i < size; ++i) {
    hash ^= data[i];
    hash *= 1099511628211ull;
  }
  return hash;
}

namespace {

bool IsEit(TableKind kind) { return kind == TableKind::kEitPf || kind == TableKind::kEitSchedule; }

// Section numbers a table announces. EIT sections are numbered by segments of
// eight (ETSI EN 300 468 5.2.4): a segment runs from its first number to the
// segment_last_section_number its sections carry; a segment not seen yet is
// expected to bring at least its first section.
std::set<unsigned int> Announced(const TableEntry& table) {
  std::set<unsigned int> numbers;
  if (!IsEit(table.kind)) {
    for (unsigned int n = 0; n <= table.lastSectionNumber; ++n) numbers.insert(n);
    return numbers;
  }
  for (unsigned int segment = 0; segment * 8 <= table.lastSectionNumber; ++segment) {
    unsigned int first = segment * 8;
    unsigned int last = first;
    for (const auto& kv : table.sections) {
      if (kv.first / 8 == segment && kv.second.bytes.size() > 12) {
        last = std::max<unsigned int>(last, kv.second.bytes[12]);
      }
    }
    last = std::min<unsigned int>({last, first + 7, table.lastSectionNumber});
    for (unsigned int n = first; n <= last; ++n) numbers.insert(n);
  }
  return numbers;
}

}  // namespace

bool TableEntry::Complete() const { return Missing().empty(); }

std::vector<unsigned int> TableEntry::Missing() const {
  std::vector<unsigned int> missing;
  if (!KindJoinsSections(kind)) return missing;
  for (unsigned int n : Announced(*this))
    if (sections.find(n) == sections.end()) missing.push_back(n);
  return missing;
}

uint64_t TableEntry::TimesSeen() const {
  uint64_t times = 0;
  bool first = true;
  for (const auto& kv : sections) {
    if (first || kv.second.seen < times) times = kv.second.seen;
    first = false;
  }
  return times;
}

TableEntry* TableRegistry::NewEntry(const Key& key, int pid, TableKind kind, const uint8_t* section) {
  std::unique_ptr<TableEntry> entry(new TableEntry);
  entry->order = tables_.size();
  entry->pid = pid;
  entry->kind = kind;
  entry->tableId = section[0];
  bool longForm = (section[1] & 0x80) != 0;
  if (longForm) {
    entry->extension = static_cast<uint16_t>((section[3] << 8) | section[4]);
    entry->version = static_cast<uint8_t>((section[5] >> 1) & 0x1F);
    entry->lastSectionNumber = section[7];
  }
  entry->firstSeen = arrivals_;
  latest_[key] = tables_.size();
  tables_.push_back(std::move(entry));
  return tables_.back().get();
}

StoredSection* TableRegistry::Add(int pid, TableKind kind, const uint8_t* section, std::size_t size) {
  ++arrivals_;
  uint64_t hash = HashBytes(section, size);
  bool longForm = size >= 8 && (section[1] & 0x80) != 0;
  int extension = longForm ? ((section[3] << 8) | section[4]) : -1;
  int version = longForm ? ((section[5] >> 1) & 0x1F) : -1;
  unsigned int number = longForm ? section[6] : 0;
  bool joins = longForm && KindJoinsSections(kind);

  Key key;
  if (joins) {
    // Stream ids of the body tell apart EIT sub-tables and SDTs of other streams.
    uint32_t extra = 0;
    if (IsEit(kind) && size >= 12) extra = (section[8] << 24) | (section[9] << 16) | (section[10] << 8) | section[11];
    if (kind == TableKind::kSdt && size >= 10) extra = (section[8] << 8) | section[9];
    key = Key(pid, section[0], extension, version, extra, section[7], 0);
  } else {
    key = Key(pid, section[0], extension, version, 0, static_cast<int>(number), hash);
  }

  TableEntry* table = nullptr;
  auto found = latest_.find(key);
  if (found != latest_.end()) {
    table = tables_[found->second].get();
    auto slot = table->sections.find(number);
    if (slot != table->sections.end() && slot->second.hash != hash) {
      // Same table and section number, other contents (sent without a version
      // change): a table of its own from here on.
      table = nullptr;
    }
  }
  if (table == nullptr) table = NewEntry(key, pid, kind, section);
  table->lastSeen = arrivals_;

  StoredSection& stored = table->sections[number];
  ++stored.seen;
  if (stored.seen > 1) return nullptr;
  stored.bytes.assign(section, section + size);
  stored.hash = hash;
  return &stored;
}

}  // namespace ravel_dump
