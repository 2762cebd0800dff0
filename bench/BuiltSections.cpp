#include "BuiltSections.h"

#include <string>

namespace bench {

std::vector<Bytes> BuiltPatSections() {
  std::vector<Bytes> sections;
  const unsigned int counts[] = {1, 4, 16};
  for (unsigned int count : counts) {
    Bytes body = sb::Cat({sb::U16(0x0000), sb::U16(0xE010)});  // network PID
    for (unsigned int i = 0; i < count; ++i) {
      const unsigned int pid = i == count / 2 ? 0x1FC8 : 0x0100 + i;
      sb::Append(body, sb::U16(0xE800 - i * 3));  // descending program numbers: sorted on parse
      sb::Append(body, sb::U16(0xE000 | pid));
    }
    sb::SectionOptions options;
    options.tableId = 0x00;
    options.tableIdExtension = 0x7ED0;
    options.privateIndicator = false;
    sections.push_back(sb::LongSection(options, body));
  }
  return sections;
}

namespace {

Bytes AitApplication(unsigned int index) {
  const std::string name = "Aplicativo interativo " + std::to_string(index);
  const std::string base = "/ginga/app" + std::to_string(index);
  const std::string initial = "main.ncl";
  std::vector<Bytes> descriptors = {
      // application descriptor: profiles, flags, priority, transport protocol label
      sb::Descriptor(0x00, sb::Cat({sb::U8(5), sb::U16(0x0001), sb::U8(1), sb::U8(0), sb::U8(0), sb::U8(0xC0),
                                    sb::U8(0xFF), sb::U8(0x01)})),
      sb::Descriptor(0x01, sb::Cat({sb::Text("por"), sb::U8(static_cast<unsigned int>(name.size())), sb::Text(name)})),
      sb::Descriptor(0x07, sb::Cat({sb::U8(static_cast<unsigned int>(base.size())), sb::Text(base), sb::U8(0),
                                    sb::Text(initial)})),
  };
  return sb::Cat({sb::U32(0x0000000B), sb::U16(0x1000 + index), sb::U8(0x01), sb::DescriptorLoop(descriptors, 0xC)});
}

}  // namespace

std::vector<Bytes> BuiltAitSections() {
  std::vector<Bytes> sections;
  for (unsigned int count = 1; count <= 3; ++count) {
    std::vector<Bytes> apps;
    for (unsigned int i = 0; i < count; ++i) apps.push_back(AitApplication(i));
    sb::SectionOptions options;
    options.tableId = 0x74;
    options.tableIdExtension = 0x0010;  // application_type: Ginga-NCL
    options.version = 3;
    sections.push_back(sb::LongSection(options, sb::Cat({sb::DescriptorLoop({}), sb::DescriptorLoop(apps)})));
  }
  return sections;
}

}  // namespace bench
