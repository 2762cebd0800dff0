// TDT sections through the safe entry layer into a caller's table: parsed twice
// into one object, built over the copy again and dumped.
#include <cstddef>
#include <cstdint>
#include <vector>

#include "FuzzSupport.h"
#include "Ravel_CSafeSection.h"
#include "Ravel_CTableTDT.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  fuzz::SilenceTraces();
  std::vector<unsigned char> section = fuzz::Section(data, size);
  RavelCSafeSection safe;
  RavelCTDT table(0);
  if (safe.ParseInto(section.data(), static_cast<int>(section.size()), table) != kRavelSafeOk) return 0;
  safe.ParseInto(section.data(), static_cast<int>(section.size()), table);
  table.Show();
  RavelCTDT other(safe.GetData());
  other.Show();
  return 0;
}
