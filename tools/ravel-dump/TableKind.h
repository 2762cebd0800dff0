// The kinds of table the tool tells apart are the library's (its table of
// tables chooses them by table_id and DSM-CC message id); here only the words
// the --table option takes for them.
#ifndef RAVEL_DUMP_TABLEKIND_H
#define RAVEL_DUMP_TABLEKIND_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "Ravel_CSafeSection.h"

namespace ravel_dump {

typedef RavelTableKind TableKind;

// "pat", "eit-pf", "dii" ...: the words accepted by --table.
const char* KindWord(TableKind kind);

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
