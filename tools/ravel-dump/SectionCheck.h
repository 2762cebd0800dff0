// Checks made on every section before any parse operation of the library sees
// it. The library's parse operations walk the lengths they read and trust
// them; here each declared end (a loop, a loop entry, a descriptor, a DSM-CC
// message) is checked against its parent's end and against the bytes really
// held, the way the parse operations will walk them.
#ifndef RAVEL_DUMP_SECTIONCHECK_H
#define RAVEL_DUMP_SECTIONCHECK_H

#include <cstddef>
#include <cstdint>
#include <string>

namespace ravel_dump {

// Whether the section carries a CRC_32 that a receiver checks: every section
// with the syntax indicator set, and the TOT (a short section with a CRC).
// DSM-CC sections with the indicator clear carry a checksum instead.
bool SectionHasCrc(const uint8_t* section);

// The CRC_32 of a section of `size` bytes (3 + section_length) verifies.
bool SectionCrcOk(const uint8_t* section, std::size_t size);

// The structure of a section of `size` bytes (exactly 3 + section_length):
// returns true when every loop and entry ends inside its parent, else false
// with a short reason ("descriptor loop runs past its end at byte 42").
bool CheckSectionStructure(const uint8_t* section, std::size_t size, std::string& reason);

}  // namespace ravel_dump

#endif
