// Reading what the receivers' library does not keep straight from the stored
// sections' bytes: descriptor loops, and the latest version of each table.
#ifndef RAVEL_DUMP_SECTIONBYTES_H
#define RAVEL_DUMP_SECTIONBYTES_H

#include <cstddef>
#include <cstdint>
#include <map>

#include "TableRegistry.h"

namespace ravel_dump {

// Calls `use(tag, body, length)` for each descriptor of the loop of `size`
// bytes at `loop`; a descriptor that overruns the loop ends the walk.
template <class Use>
void EachDescriptor(const uint8_t* loop, std::size_t size, Use use) {
  for (std::size_t at = 0; at + 2 <= size && at + 2 + loop[at + 1] <= size; at += 2 + loop[at + 1]) {
    use(loop[at], loop + at + 2, static_cast<std::size_t>(loop[at + 1]));
  }
}

// The table seen last for each key: `keyOf(table, key)` gives a table's key,
// or false for a table that is not wanted.
template <class Key, class KeyOf>
std::map<Key, const TableEntry*> LatestTables(const TableRegistry& registry, KeyOf keyOf) {
  std::map<Key, const TableEntry*> latest;
  for (const auto& entry : registry.Tables()) {
    Key key;
    if (entry->sections.empty() || !keyOf(*entry, key)) continue;
    const TableEntry*& kept = latest[key];
    if (kept == nullptr || entry->lastSeen > kept->lastSeen) kept = entry.get();
  }
  return latest;
}

}  // namespace ravel_dump

#endif
