#include "TableRegistry.h"

#include <algorithm>
#include <cstring>
#include <set>

#include "Ravel_ByteOrder.h"

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

// Stream-event tables kept after a newer version replaced them: each version
// is a few events, and a live input sending new ones for hours stays bounded.
const std::size_t kReplacedStreamEvents = 64;

// Section numbers a table announces. EIT sections are numbered by segments of
// eight (ETSI EN 300 468 5.2.4): a segment runs from its first number to the
// segment_last_section_number its sections carry; a segment not seen yet is
// expected to bring at least its first section.
std::set<unsigned int> Announced(const TableEntry& table) {
  std::set<unsigned int> numbers;
  if (!RavelCSafeSection::IsSegmented(table.tableId)) {
    for (unsigned int n = 0; n <= table.lastSectionNumber; ++n) numbers.insert(n);
    return numbers;
  }
  for (unsigned int segment = 0; segment * 8 <= table.lastSectionNumber; ++segment) {
    unsigned int first = segment * 8;
    unsigned int last = first;
    for (const auto& kv : table.sections) {
      RavelSectionHeader header;
      if (kv.first / 8 == segment &&
          RavelCSafeSection::ReadHeader(kv.second.Bytes(), static_cast<int>(kv.second.Size()), header)) {
        last = std::max<unsigned int>(last, header.iSegmentLastSectionNumber);
      }
    }
    last = std::min<unsigned int>({last, first + 7, table.lastSectionNumber});
    for (unsigned int n = first; n <= last; ++n) numbers.insert(n);
  }
  return numbers;
}

}  // namespace

std::size_t TableRegistry::KeyHash::operator()(const Key& key) const {
  const uint64_t fields[] = {static_cast<uint64_t>(std::get<0>(key)), static_cast<uint64_t>(std::get<1>(key)),
                             static_cast<uint64_t>(std::get<2>(key)), static_cast<uint64_t>(std::get<3>(key)),
                             std::get<4>(key),                        static_cast<uint64_t>(std::get<5>(key)),
                             std::get<6>(key)};
  uint64_t hash = 0;
  for (uint64_t field : fields) {
    hash = (hash ^ field) * 0x9E3779B97F4A7C15ull;  // multiply and fold: a word at a time
    hash ^= hash >> 29;
  }
  return static_cast<std::size_t>(hash);
}

bool TableEntry::Complete() const { return Missing().empty(); }

std::vector<unsigned int> TableEntry::Missing() const {
  std::vector<unsigned int> missing;
  if (!RavelCSafeSection::JoinsSections(tableId)) return missing;
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

TableEntry* TableRegistry::NewEntry(const Key& key, int pid, TableKind kind, const RavelSectionHeader& header,
                                    unsigned int number) {
  std::unique_ptr<TableEntry> entry(new TableEntry);
  uint64_t identity = (static_cast<uint64_t>(pid & 0x1FFF) << 48) | (static_cast<uint64_t>(header.iTableId) << 40) |
                      (static_cast<uint64_t>(header.bLongForm ? header.iTableIdExtension : 0) << 24);
  if (header.bLongForm && RavelCSafeSection::JoinsSections(header.iTableId)) {
    identity ^= header.iStreamIds * 0x9E3779B97F4A7C15ull;
  } else {
    identity |= number;
  }
  entry->identity = identity;
  entry->serial = ++serials_;
  entry->pid = pid;
  entry->kind = kind;
  entry->tableId = header.iTableId;
  entry->longForm = header.bLongForm;
  entry->extension = header.iTableIdExtension;
  entry->version = header.iVersionNumber;
  entry->lastSectionNumber = header.iLastSectionNumber;
  entry->firstSeen = arrivals_;
  auto previous = byIdentity_.find(identity);
  if (previous != byIdentity_.end()) {
    // The new version takes the old one's place; the old one is forgotten.
    const std::size_t slot = previous->second;
    latest_.erase(keys_[slot]);
    entry->order = slot;
    entry->firstSeen = tables_[slot]->firstSeen;
    if (tables_[slot]->kind == kRavelKindStreamEvents) {
      replacedStreamEvents_.push_back(std::move(tables_[slot]));
      if (replacedStreamEvents_.size() > kReplacedStreamEvents) replacedStreamEvents_.pop_front();
    }
    tables_[slot] = std::move(entry);
    keys_[slot] = key;
    latest_[key] = slot;
    return tables_[slot].get();
  }
  entry->order = tables_.size();
  byIdentity_[identity] = tables_.size();
  latest_[key] = tables_.size();
  keys_.push_back(key);
  tables_.push_back(std::move(entry));
  return tables_.back().get();
}

TableRegistry::Place TableRegistry::Locate(int pid, const uint8_t* section,
                                           std::size_t size) const {
  Place place;
  // A section with a CRC_32 is told apart by its size and CRC, confirmed byte
  // for byte against the stored copy; a short section without one by a hash.
  place.identity = RavelCSafeSection::CarriesCrc(section) && size >= 4
                       ? (static_cast<uint64_t>(size) << 32) | RavelRead32(section + size - 4)
                       : HashBytes(section, size);
  RavelSectionHeader header;
  RavelCSafeSection::ReadHeader(section, static_cast<int>(size), header);
  place.header = header;
  place.number = header.iSectionNumber;
  const int extension = header.bLongForm ? header.iTableIdExtension : -1;
  const int version = header.bLongForm ? header.iVersionNumber : -1;
  if (header.bLongForm && RavelCSafeSection::JoinsSections(header.iTableId)) {
    place.key = Key(pid, header.iTableId, extension, version, header.iStreamIds, header.iLastSectionNumber, 0);
  } else {
    place.key = Key(pid, header.iTableId, extension, version, 0, static_cast<int>(place.number), place.identity);
  }
  auto found = latest_.find(place.key);
  if (found == latest_.end()) return place;
  place.table = tables_[found->second].get();
  auto slot = place.table->sections.find(place.number);
  if (slot != place.table->sections.end()) {
    const StoredSection& stored = slot->second;
    place.same = stored.hash == place.identity && stored.Size() == size &&
                 std::memcmp(stored.Bytes(), section, size) == 0;
    // Same table and section number, other contents (sent without a version
    // change): a table of its own from here on.
    if (!place.same) place.table = nullptr;
  }
  return place;
}

void TableRegistry::Count(TableEntry& table, StoredSection& stored) {
  ++arrivals_;
  last_ = &table;
  table.lastSeen = arrivals_;
  ++stored.seen;
}

bool TableRegistry::CountRepeat(int pid, const uint8_t* section, std::size_t size) {
  // A section is at most 4096 bytes and a PID (kNoPid included) fits in 14
  // bits: PID, size and CRC_32 make one key.
  const bool keyed = RavelCSafeSection::CarriesCrc(section) && size >= 4;
  const uint64_t key = keyed ? (static_cast<uint64_t>(pid + 1) << 45) | (static_cast<uint64_t>(size) << 32) |
                                   RavelRead32(section + size - 4)
                             : 0;
  if (keyed) {
    auto known = repeats_.find(key);
    if (known != repeats_.end()) {
      StoredSection& stored = *known->second.stored;
      if (stored.Size() == size && std::memcmp(stored.Bytes(), section, size) == 0) {
        Count(*known->second.table, stored);
        return true;
      }
    }
  }
  Place place = Locate(pid, section, size);
  if (!place.same) return false;
  StoredSection& stored = place.table->sections[place.number];
  Count(*place.table, stored);
  if (keyed) repeats_[key] = Repeat{place.table, &stored};
  return true;
}

StoredSection& TableRegistry::Add(int pid, TableKind kind, std::unique_ptr<RavelCSafeSection> parsed,
                                  RavelSafeResult result) {
  if (!repeats_.empty()) repeats_.clear();
  ++arrivals_;
  Place place = Locate(pid, parsed->GetData(), static_cast<std::size_t>(parsed->GetDataSize()));
  TableEntry* table = place.table;
  if (table == nullptr) table = NewEntry(place.key, pid, kind, place.header, place.number);
  last_ = table;
  table->lastSeen = arrivals_;

  StoredSection& stored = table->sections[place.number];
  stored.seen = 1;
  stored.parsed = std::move(parsed);
  stored.result = result;
  stored.hash = place.identity;
  return stored;
}

}  // namespace ravel_dump
