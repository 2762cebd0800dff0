// Distinct tables in the order first seen. Broadcasters resend PSI/SI many
// times a second: a section that comes again unchanged only counts as seen
// once more. Sections of one table (same PID, table_id, table id extension,
// version and, for the EIT and SDT, the stream ids of the body) are gathered
// by section number so that they can be joined with the table's operator+=.
#ifndef RAVEL_DUMP_TABLEREGISTRY_H
#define RAVEL_DUMP_TABLEREGISTRY_H

#include <cstddef>
#include <cstdint>
#include <map>
#include <memory>
#include <tuple>
#include <vector>

#include "TableKind.h"

namespace ravel_dump {

// The PID given for sections read from a file of raw sections.
const int kNoPid = -1;

struct StoredSection {
  std::vector<uint8_t> bytes;
  uint64_t hash = 0;  // content identity: size and CRC_32, or a hash of the bytes
  uint64_t seen = 0;
  int parseResult = 0;  // what the library's parse gave when it first arrived
};

struct TableEntry {
  std::size_t order = 0;
  int pid = kNoPid;
  TableKind kind = TableKind::kOther;
  uint8_t tableId = 0;
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
  bool CountRepeat(int pid, TableKind kind, const uint8_t* section, std::size_t size);
  // Records a checked section of `size` bytes. Gives the stored section when
  // it is new (the first copy of these bytes for its table), null for a repeat.
  StoredSection* Add(int pid, TableKind kind, const uint8_t* section, std::size_t size);

  const std::vector<std::unique_ptr<TableEntry>>& Tables() const { return tables_; }
  uint64_t SectionsAdded() const { return arrivals_; }

 private:
  typedef std::tuple<int, int, int, int, uint32_t, int, uint64_t> Key;

  // Where a section belongs: its table's key, section number and content
  // identity, the table it joins (null for a new one) and whether the same
  // bytes are stored there already.
  struct Place {
    Key key;
    unsigned int number = 0;
    uint64_t identity = 0;
    TableEntry* table = nullptr;
    bool same = false;
  };
  Place Locate(int pid, TableKind kind, const uint8_t* section, std::size_t size) const;
  TableEntry* NewEntry(const Key& key, int pid, TableKind kind, const uint8_t* section);

  std::vector<std::unique_ptr<TableEntry>> tables_;
  std::map<Key, std::size_t> latest_;
  uint64_t arrivals_ = 0;
};

// 64-bit FNV-1a of a byte run: the identity of a section's contents.
uint64_t HashBytes(const uint8_t* data, std::size_t size);

}  // namespace ravel_dump

#endif
