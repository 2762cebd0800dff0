// Shared by the fuzz targets: traces silenced once (every message is still
// formatted, so the formats are exercised too), and sections whose length and
// CRC_32 the fuzzer may ask to have repaired, so that mutations reach the parse
// operations instead of stopping at the checks.
#ifndef RAVEL_FUZZ_FUZZSUPPORT_H
#define RAVEL_FUZZ_FUZZSUPPORT_H

#include <cstddef>
#include <cstdint>
#include <vector>

#include "Ravel_CDsmccMsgBase.h"
#include "Ravel_CSafeSection.h"
#include "Ravel_CTableBase.h"
#include "Ravel_PGL.h"
#include "Ravel_Util.h"

namespace fuzz {

inline void IgnoreTrace(unsigned int, const char*, int, const char*, void*) {}

// Installs the no-op trace hook on the first call. A panic is left to abort:
// the parse operations must never index an array out of range, whatever the data.
inline void SilenceTraces() {
  static bool silenced = false;
  if (!silenced) {
    RavelPGL_SetTraceHook(&IgnoreTrace, 0);
    silenced = true;
  }
}

// The bytes through the safe layer; what it accepts is shown, copied and the
// copy shown, so that copies and dumps are fuzzed too.
inline void ParseSafely(const unsigned char* bytes, int count) {
  RavelCSafeSection safe;
  if (safe.Parse(bytes, count) != kRavelSafeOk) return;
  safe.Show();
  if (RavelCTableBase* table = safe.CopyTable()) {
    table->Show();
    delete table;
  }
  if (RavelCDsmccBase* message = safe.CopyMessage()) {
    message->Show();
    delete message;
  }
}

enum Repair {
  kRepairLength = 0x01,  // section_length := the bytes held - 3
  kRepairCrc = 0x02      // CRC_32 recomputed over the declared section
};

// The input minus its first byte, which chooses the repairs.
inline std::vector<unsigned char> Section(const uint8_t* data, size_t size) {
  std::vector<unsigned char> section;
  if (size == 0) return section;
  section.assign(data + 1, data + size);
  size_t count = section.size();
  if ((data[0] & kRepairLength) && count >= 3 && count - 3 <= 0x0FFF) {
    section[1] = static_cast<unsigned char>((section[1] & 0xF0) | ((count - 3) >> 8));
    section[2] = static_cast<unsigned char>(count - 3);
  }
  if ((data[0] & kRepairCrc) && count >= 3) {
    size_t declared = (static_cast<size_t>(section[1] & 0x0F) << 8 | section[2]) + 3;
    if (declared >= 4 && declared <= count) {
      unsigned int crc = RavelUtil_CRC32(0xFFFFFFFFu, section.data(), static_cast<unsigned int>(declared - 4));
      for (int i = 0; i < 4; ++i) section[declared - 4 + i] = static_cast<unsigned char>(crc >> (24 - 8 * i));
    }
  }
  return section;
}

}  // namespace fuzz

#endif
