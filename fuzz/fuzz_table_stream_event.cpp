// Stream descriptor sections through the safe entry layer into a caller's table:
// parsed twice into one object, copied, assigned and dumped.
#include <cstddef>
#include <cstdint>
#include <vector>

#include "FuzzSupport.h"
#include "Ravel_CSafeSection.h"
#include "Ravel_CTableStreamEventDescriptor.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  fuzz::SilenceTraces();
  std::vector<unsigned char> section = fuzz::Section(data, size);
  RavelCSafeSection safe;
  RavelCDsmccStreamEvent table(0);
  if (safe.ParseInto(section.data(), static_cast<int>(section.size()), table) != kRavelSafeOk) return 0;
  safe.ParseInto(section.data(), static_cast<int>(section.size()), table);
  table.Show();
  for (int i = 0; i < table.GetNumberOfGeneralEvents(); ++i) table.GetGeneralEvent(i)->Show();
  RavelCDsmccStreamEvent copy(table);
  copy.Show();
  RavelCDsmccStreamEvent assigned(0);
  assigned = table;
  assigned.Show();
  return 0;
}
