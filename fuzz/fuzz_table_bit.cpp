// BIT sections through the safe entry layer into a caller's table: parsed twice
// into one object, copied, merged, assigned and dumped.
#include <cstddef>
#include <cstdint>
#include <vector>

#include "FuzzSupport.h"
#include "Ravel_CSafeSection.h"
#include "Ravel_CTableBIT.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  fuzz::SilenceTraces();
  std::vector<unsigned char> section = fuzz::Section(data, size);
  RavelCSafeSection safe;
  RavelCBIT table(0);
  if (safe.ParseInto(section.data(), static_cast<int>(section.size()), table) != kRavelSafeOk) return 0;
  safe.ParseInto(section.data(), static_cast<int>(section.size()), table);
  table.Show();
  RavelCBIT copy(table);
  copy += table;
  copy.Show();
  RavelCBIT assigned(0);
  assigned = copy;
  assigned.Show();
  return 0;
}
