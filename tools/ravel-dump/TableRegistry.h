// Tables in the order first seen, each in its latest version only (a new
// version or new contents take the old one's place, so that memory does not
// grow with the length of a live input). Broadcasters resend PSI/SI many
// times a second: a section that comes again unchanged only counts as seen
// once more. Sections of one table (same PID, table_id, table id extension,
// version and, for the EIT and SDT, the stream ids of the body) are gathered
// by section number so that they can be joined with the table's operator+=.
// Each distinct section is kept as the library's safe entry gave it: its bytes
// and the object its one parse made, which every output then uses.
#ifndef RAVEL_DUMP_TABLEREGISTRY_H
#define RAVEL_DUMP_TABLEREGISTRY_H

#include <cstddef>
#include <cstdint>
#include <deque>
#include <map>
#include <memory>
#include <tuple>
#include <unordered_map>
#include <vector>

#include "Ravel_CSafeSection.h"
#include "SkippedDescriptors.h"
#include "TableKind.h"

namespace ravel_dump {

// The PID given for sections read from a file of raw sections.
const int kNoPid = -1;

struct StoredSection {
  std::unique_ptr<RavelCSafeSection> parsed;  // the checked bytes and the parsed object
  RavelSafeResult result = kRavelSafeOk;      // kRavelSafeOk, kRavelSafeRefused or kRavelSafeUnknownTable
  uint64_t hash = 0;  // content identity: size and CRC_32, or a hash of the bytes
  uint64_t seen = 0;
  std::vector<SkippedDescriptor> skipped;  // as the library told at its parse

  const uint8_t* Bytes() const { return parsed->GetData(); }
  std::size_t Size() const { return static_cast<std::size_t>(parsed->GetDataSize()); }
  // Whether the library made an object of it.
  bool Parsed() const { return result == kRavelSafeOk; }
};

struct TableEntry {
  std::size_t order = 0;
  // What tells this table from others across its versions (PID, table_id,
  // id, the EIT's and SDT's stream ids; the section number of a section that
  // is a table of its own), and which version this is of all seen.
  uint64_t identity = 0;
  uint64_t serial = 0;
  int pid = kNoPid;
  TableKind kind = kRavelKindOther;
  uint8_t tableId = 0;
  bool longForm = false;
  uint16_t extension = 0;
  uint8_t version = 0;
  uint8_t lastSectionNumber = 0;
  uint64_t firstSeen = 0;  // arrival number of the first and latest section
  uint64_t lastSeen = 0;
  std::map<unsigned int, StoredSection> sections;  // by section_number

  // Every section the table announces has arrived (for the EIT: every section
  // of each segment up to the segment's last section number).
  bool Complete() const;
  // How many times the whole table was seen: its least repeated section.
  uint64_t TimesSeen() const;
  // Section numbers the table announces but that never arrived.
  std::vector<unsigned int> Missing() const;
};

class TableRegistry {
 public:
  // A section identical to one already stored for its table is counted as
  // seen once more: true. Such a section passed every check when it was stored,
  // so a repeat needs none of them again.
  bool CountRepeat(int pid, const uint8_t* section, std::size_t size);
  // Keeps a section that is not a repeat, as the safe entry checked and parsed it.
  StoredSection& Add(int pid, TableKind kind, std::unique_ptr<RavelCSafeSection> parsed, RavelSafeResult result);

  const std::vector<std::unique_ptr<TableEntry>>& Tables() const { return tables_; }
  // Stream-event tables a newer version replaced, oldest first: the events
  // each version carried stay in the summary, the oldest dropped past a cap.
  const std::deque<std::unique_ptr<TableEntry>>& ReplacedStreamEvents() const { return replacedStreamEvents_; }
  // The table the last section counted or kept went to.
  const TableEntry& LastTable() const { return *last_; }
  uint64_t SectionsAdded() const { return arrivals_; }

 private:
  typedef std::tuple<int, int, int, int, uint32_t, int, uint64_t> Key;

  // Where a section belongs: its table's key, section number and content
  // identity, the table it joins (null for a new one) and whether the same
  // bytes are stored there already.
  struct Place {
    Key key;
    RavelSectionHeader header;
    unsigned int number = 0;
    uint64_t identity = 0;
    TableEntry* table = nullptr;
    bool same = false;
  };
  Place Locate(int pid, const uint8_t* section, std::size_t size) const;
  TableEntry* NewEntry(const Key& key, int pid, TableKind kind, const RavelSectionHeader& header,
                       unsigned int number);

  std::vector<std::unique_ptr<TableEntry>> tables_;
  std::vector<Key> keys_;  // the key of each of tables_
  std::unordered_map<uint64_t, std::size_t> byIdentity_;
  uint64_t serials_ = 0;
  // Looked up for every section that arrives, repeats included.
  struct KeyHash {
    std::size_t operator()(const Key& key) const;
  };
  std::unordered_map<Key, std::size_t, KeyHash> latest_;
  uint64_t arrivals_ = 0;
  const TableEntry* last_ = nullptr;
  std::deque<std::unique_ptr<TableEntry>> replacedStreamEvents_;

  // Where a repeat was counted, by PID, size and CRC_32: the same bytes again
  // find the same place with one look-up, until a section is added (which may
  // start a new table for them).
  struct Repeat {
    TableEntry* table;
    StoredSection* stored;
  };
  std::unordered_map<uint64_t, Repeat> repeats_;
  void Count(TableEntry& table, StoredSection& stored);
};

// 64-bit FNV-1a of a byte run: the identity of a section's contents.
uint64_t HashBytes(const uint8_t* data, std::size_t size);

}  // namespace ravel_dump

#endif
