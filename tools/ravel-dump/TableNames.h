// Names of the tables the library has no class for, so that what is on the
// air is named even where the receivers' library does not read it.
#ifndef RAVEL_DUMP_TABLENAMES_H
#define RAVEL_DUMP_TABLENAMES_H

#include <cstdint>
#include <cstddef>
#include <string>
#include <vector>

#include "TableRegistry.h"

namespace ravel_dump {

// "SDTT", "CDT", "LIT" ...: by the standards' table_id assignments (ISO/IEC
// 13818-1, ETSI EN 300 468, ARIB STD-B10, ABNT NBR 15603); "" for a
// table_id none of them assigns.
std::string TableIdName(uint8_t tableId);

// The name shown for a stored table: the library's kind name, or for the
// kinds it does not tell apart, the name above when there is one.
std::string TableName(const TableEntry& table);

// A descriptor the library skipped in a table's sections, and how often.
struct SkippedCount {
  SkippedDescriptor descriptor;
  std::size_t times = 0;
};

// The table's skipped descriptors, each tag and length once, in the order
// first seen.
std::vector<SkippedCount> TableSkipped(const TableEntry& table);

// Whether the library made an object of none of the table's sections.
bool WithoutClass(const TableEntry& table);

}  // namespace ravel_dump

#endif
