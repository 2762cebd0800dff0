// Any section through the safe entry layer, parsed with the class its table_id
// (and, in a carousel section, its message id) selects; then copied and dumped.
#include <cstddef>
#include <cstdint>
#include <vector>

#include "FuzzSupport.h"
#include "Ravel_CDsmccMsgBase.h"
#include "Ravel_CSafeSection.h"
#include "Ravel_CTableBase.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  fuzz::SilenceTraces();
  std::vector<unsigned char> section = fuzz::Section(data, size);
  fuzz::ParseSafely(section.data(), static_cast<int>(section.size()));
  return 0;
}
