// Names of descriptors by tag, so that a descriptor the receivers' library
// skips is still named in what the tool shows.
#ifndef RAVEL_DUMP_DESCRIPTORNAMES_H
#define RAVEL_DUMP_DESCRIPTORNAMES_H

#include <cstdint>
#include <string>

namespace ravel_dump {

// "digital copy control", "partial reception" ...: by the standards' tag
// assignments (ISO/IEC 13818-1 and -6, ETSI EN 300 468, ARIB STD-B10, ABNT
// NBR 15603); "unknown descriptor" for a tag none of them assigns.
std::string DescriptorName(uint8_t tag);

}  // namespace ravel_dump

#endif
