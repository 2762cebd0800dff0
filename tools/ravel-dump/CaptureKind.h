// What a capture holds, told from its first bytes: transport stream packets
// (sync bytes 188, 192 or 204 bytes apart from the start) or concatenated raw
// sections (a chain of declared lengths whose CRC_32s verify).
#ifndef RAVEL_DUMP_CAPTUREKIND_H
#define RAVEL_DUMP_CAPTUREKIND_H

#include <cstddef>
#include <cstdint>
#include <string>

#include "Input.h"

namespace ravel_dump {

// Whether `head`, the first `size` bytes of an input (all of it when `whole`),
// starts a chain of raw sections: each declared length lands on the next
// section or on 0xFF stuffing, every section that carries a CRC_32 in the
// first few verifies, and at least one does.
bool LooksLikeRawSections(const uint8_t* head, std::size_t size, bool whole);

// Looks at the beginning of `input` without consuming it and sets `sections`
// when it holds raw sections rather than a transport stream. False with
// `error` set on a read error.
bool HoldsRawSections(InputFile& input, bool& sections, std::string& error);

}  // namespace ravel_dump

#endif
