// PMT sections through the safe entry layer into a caller's table: parsed twice
// into one object, assigned, merged, its streams selected and dumped.
#include <cstddef>
#include <cstdint>
#include <vector>

#include "FuzzSupport.h"
#include "Ravel_CSafeSection.h"
#include "Ravel_CTablePMT.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  fuzz::SilenceTraces();
  std::vector<unsigned char> section = fuzz::Section(data, size);
  RavelCSafeSection safe;
  RavelCPMT table(0);
  if (safe.ParseInto(section.data(), static_cast<int>(section.size()), table) != kRavelSafeOk) return 0;
  safe.ParseInto(section.data(), static_cast<int>(section.size()), table);
  table.Show();
  RavelCPMT copy(0);
  copy = table;
  copy += table;
  copy.Show();
  for (unsigned char n = 0; n < copy.GetAudioPIDCount(); ++n) copy.GetAudioPID(n);
  copy.GetVideoPID();
  copy.GetCCPID();
  return 0;
}
