// The kinds of table the tool tells apart, chosen by table_id (and, for the
// DSM-CC download messages, by the message id), with their short names.
#ifndef RAVEL_DUMP_TABLEKIND_H
#define RAVEL_DUMP_TABLEKIND_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace ravel_dump {

enum class TableKind {
  kPat,
  kCat,
  kPmt,
  kNit,
  kSdt,
  kEitPf,
  kEitSchedule,
  kTdt,
  kTot,
  kBit,
  kAit,
  kDsi,
  kDii,
  kDdb,
  kDsmccOther,
  kStreamDescriptors,
  kOther,
  kCount
};

// Kind of the section starting at `section` (at least 20 bytes are read only
// for the DSM-CC sections, whose structure has been checked before).
TableKind KindOfSection(const uint8_t* section, std::size_t size);
// "PAT", "EIT p/f", "DII" ...
const char* KindName(TableKind kind);
// "pat", "eit-pf", "dii" ...: the words accepted by --table.
const char* KindWord(TableKind kind);

// Whether the kind's sections of one table are joined with the table's own
// operator+= (PMT, NIT, SDT, EIT, BIT); the others stand alone per section.
bool KindJoinsSections(TableKind kind);

// The --table filter: kinds and/or raw table_ids. Empty means everything.
class TableFilter {
 public:
  // Parses "pat,pmt,0x4e,eit" (names as KindWord, "eit" for both EIT kinds,
  // "dsmcc" for every DSM-CC kind, numbers for table_ids). False with `error`.
  bool Parse(const std::string& list, std::string& error);
  bool Empty() const { return kinds_.empty() && tableIds_.empty(); }
  bool Accepts(TableKind kind, uint8_t tableId) const;

 private:
  std::vector<TableKind> kinds_;
  std::vector<int> tableIds_;
};

// Parses a number given as decimal or 0x-prefixed hexadecimal, within [0, max].
bool ParseNumber(const std::string& text, unsigned long max, unsigned long& value);

}  // namespace ravel_dump

#endif
