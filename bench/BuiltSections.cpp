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

namespace {

sb::SectionOptions Options(uint8_t tableId, uint16_t extension, uint8_t version = 1, bool privateIndicator = true) {
  sb::SectionOptions options;
  options.tableId = tableId;
  options.tableIdExtension = extension;
  options.version = version;
  options.privateIndicator = privateIndicator;
  return options;
}

Bytes StreamEntry(uint8_t type, uint16_t pid, const std::vector<Bytes>& descriptors) {
  return sb::Cat({sb::U8(type), sb::U16(0xE000 | pid), sb::DescriptorLoop(descriptors)});
}

}  // namespace

std::vector<Bytes> BuiltPmtSections() {
  std::vector<Bytes> sections;
  const Bytes rating = sb::Descriptor(0x55, sb::Cat({sb::Text("BRA"), sb::U8(0x12)}));
  for (unsigned int audios = 1; audios <= 3; ++audios) {
    Bytes body = sb::Cat({sb::U16(0xE000 | 0x0101), sb::DescriptorLoop({rating})});
    sb::Append(body, StreamEntry(0x1B, 0x0111, {sb::Descriptor(0x52, sb::U8(0x81))}));
    for (unsigned int a = 0; a < audios; ++a) {
      sb::Append(body, StreamEntry(0x0F, static_cast<uint16_t>(0x0112 + a), {sb::Descriptor(0x52, sb::U8(0x83 + a))}));
    }
    sb::Append(body, StreamEntry(0x06, 0x0118, {sb::Descriptor(0x52, sb::U8(0x87)),
                                               sb::Descriptor(0xFD, sb::Cat({sb::U16(0x0008), sb::U8(0x3D)}))}));
    sb::Append(body, StreamEntry(0x0D, 0x0119, {sb::Descriptor(0x52, sb::U8(0x8A)),
                                               sb::Descriptor(0xFD, sb::Cat({sb::U16(0x00A0), sb::U8(0x3D)}))}));
    sections.push_back(sb::LongSection(Options(0x02, 0xE760, 3, false), body));
  }
  return sections;
}

std::vector<Bytes> BuiltSdtSections() {
  std::vector<Bytes> sections;
  for (unsigned int count = 1; count <= 4; ++count) {
    Bytes body = sb::Cat({sb::U16(0x0640), sb::U8(0xFF)});
    for (unsigned int i = 0; i < count; ++i) {
      const std::string provider = "Emissora";
      const std::string name = "Canal " + std::to_string(i + 1) + " HD";
      Bytes service = sb::Descriptor(0x48, sb::Cat({sb::U8(0x01), sb::U8(static_cast<unsigned int>(provider.size())),
                                                    sb::Text(provider), sb::U8(static_cast<unsigned int>(name.size())),
                                                    sb::Text(name)}));
      Bytes logo = sb::Descriptor(0xCF, sb::Cat({sb::U8(1), sb::U16(0xFE00 | i), sb::U16(0xF001), sb::U16(0x0010)}));
      // service_id, EIT flags (schedule and present/following), running, free
      sb::Append(body, sb::Cat({sb::U16(0xE760 + i), sb::U8(0xE3), sb::DescriptorLoop({service, logo}, 0x8)}));
    }
    sections.push_back(sb::LongSection(Options(0x42, 0x0640, 2), body));
  }
  return sections;
}

std::vector<Bytes> BuiltNitSections() {
  const std::string network = "Rede Nacional";
  const std::string tsName = "RN";
  std::vector<Bytes> networkDescriptors = {sb::Descriptor(0x40, sb::Text(network)), sb::Descriptor(0xFE, Bytes{0x03, 0x01})};
  Bytes services;
  for (unsigned int i = 0; i < 4; ++i) sb::Append(services, sb::Cat({sb::U16(0xE760 + i), sb::U8(i == 3 ? 0xC0 : 0x01)}));
  std::vector<Bytes> tsDescriptors = {
      sb::Descriptor(0x41, services),
      sb::Descriptor(0xCD, sb::Cat({sb::U8(0x05), sb::U8(static_cast<unsigned int>(tsName.size() << 2)), sb::Text(tsName)})),
      sb::Descriptor(0xFA, sb::Cat({sb::U16((0x123u << 4) | (1u << 2) | 2u), sb::U16(0x0F1C)})),
      sb::Descriptor(0xFB, sb::U16(0xE763)),
  };
  Bytes stream = sb::Cat({sb::U16(0x0640), sb::U16(0x0640), sb::DescriptorLoop(tsDescriptors)});
  Bytes body = sb::Cat({sb::DescriptorLoop(networkDescriptors), sb::Length12(static_cast<unsigned int>(stream.size())),
                        stream});
  return {sb::LongSection(Options(0x40, 0x0640, 1), body)};
}

std::vector<Bytes> BuiltBitSections() {
  std::vector<Bytes> sections;
  const unsigned int counts[] = {1, 3};
  for (unsigned int count : counts) {
    Bytes body = sb::Length12(0, 0xF);  // view propriety, no first descriptors
    for (unsigned int i = 0; i < count; ++i) {
      Bytes extended = sb::Descriptor(0xCE, sb::Cat({sb::U8(0x1F), sb::U16(0x0A01 + i), sb::U8(0x01), sb::U16(0x7FE1),
                                                     sb::U8(static_cast<unsigned int>(i + 1))}));
      sb::Append(body, sb::Cat({sb::U8(i + 1), sb::DescriptorLoop({extended})}));
    }
    sections.push_back(sb::LongSection(Options(0xC4, 0x7FE1, 3), body));
  }
  return sections;
}

std::vector<Bytes> BuiltEitSections() {
  std::vector<Bytes> sections;
  struct Shape {
    uint8_t tableId;
    unsigned int events;
  } shapes[] = {{0x4E, 1}, {0x4E, 2}, {0x50, 8}};
  for (const Shape& shape : shapes) {
    Bytes body = sb::Cat({sb::U16(0x0640), sb::U16(0x0640), sb::U8(0), sb::U8(shape.tableId)});
    for (unsigned int e = 0; e < shape.events; ++e) {
      const std::string name = "Programa " + std::to_string(e + 1);
      const std::string text = "Resumo do programa, com os participantes e o tema do dia.";
      Bytes d = sb::Cat({
          sb::Descriptor(0x4D, sb::Cat({sb::Text("por"), sb::U8(static_cast<unsigned int>(name.size())), sb::Text(name),
                                        sb::U8(static_cast<unsigned int>(text.size())), sb::Text(text)})),
          sb::Descriptor(0x50, sb::Cat({sb::U8(0xF1), sb::U8(0xB3), sb::U8(0x00), sb::Text("por")})),
          sb::Descriptor(0xC4, sb::Cat({sb::U8(0xF2), sb::U8(0x03), sb::U8(0x10), sb::U8(0x0F), sb::U8(0xFF),
                                        sb::U8(0x5F), sb::Text("por")})),
          sb::Descriptor(0x54, sb::Cat({sb::U8(0x20), sb::U8(0xFF)})),
          sb::Descriptor(0x55, sb::Cat({sb::Text("BRA"), sb::U8(0x12)})),
      });
      sb::Append(body, sb::Cat({sb::U16(0x1000 + e), sb::UtcTime(2024, 5, 6, 18 + e % 6, 0, 0), Bytes{0x01, 0x00, 0x00},
                                sb::Length12(static_cast<unsigned int>(d.size()), 0x8), d}));
    }
    sections.push_back(sb::LongSection(Options(shape.tableId, 0xE760, 4), body));
  }
  return sections;
}

std::vector<Bytes> BuiltTdtSections() { return {sb::ShortSection(0x70, sb::UtcTime(2024, 5, 6, 18, 30, 15), false)}; }

std::vector<Bytes> BuiltTotSections() {
  Bytes offset = sb::Cat({sb::Text("BRA"), sb::U8(1 << 2 | 0x03), Bytes{sb::Bcd(3), 0x00}, sb::UtcTime(2024, 11, 3, 3, 0, 0),
                          Bytes{sb::Bcd(2), 0x00}});
  const Bytes time = sb::UtcTime(2024, 5, 6, 18, 30, 15);
  return {sb::ShortSection(0x73, sb::Cat({time, sb::DescriptorLoop({})}), true),
          sb::ShortSection(0x73, sb::Cat({time, sb::DescriptorLoop({sb::Descriptor(0x58, offset)})}), true)};
}

namespace {

// dsmccMessageHeader (no adaptation header) followed by `body`.
Bytes DsmccMessage(uint16_t messageId, uint32_t transactionId, const Bytes& body) {
  return sb::Cat({sb::U8(0x11), sb::U8(0x03), sb::U16(messageId), sb::U32(transactionId), sb::U8(0xFF), sb::U8(0),
                  sb::U16(static_cast<unsigned int>(body.size())), body});
}

Bytes CarouselSection(uint8_t tableId, uint16_t extension, const Bytes& message) {
  sb::SectionOptions options;
  options.tableId = tableId;
  options.tableIdExtension = extension;
  options.version = 1;
  return sb::LongSection(options, message);
}

Bytes Pattern(size_t size, uint8_t seed) {
  Bytes b(size);
  for (size_t i = 0; i < size; ++i) b[i] = static_cast<uint8_t>(seed + i * 7);
  return b;
}

}  // namespace

std::vector<Bytes> BuiltDsiSections() {
  // serverId (NSAP: AFI, type, carousel id, specifier, ts id, network id, service id, reserved)
  Bytes body = sb::Cat({sb::U8(0x00), sb::U8(0x01), sb::U32(0x0000ABCD), sb::U32(0x00010203), sb::U16(0x0421),
                        sb::U16(0x0422), sb::U16(0xE760), sb::U32(0xEEEEEEEE)});
  sb::Append(body, sb::U16(0));   // compatibilityDescriptorLength
  sb::Append(body, sb::U16(64));  // privateDataLength
  sb::Append(body, Pattern(64, 0x10));
  return {CarouselSection(0x3B, 0x0002, DsmccMessage(0x1006, 0x80000002u, body))};
}

std::vector<Bytes> BuiltDiiSections() {
  std::vector<Bytes> sections;
  const unsigned int counts[] = {1, 3, 8};
  for (unsigned int count : counts) {
    Bytes body = sb::Cat({sb::U32(0x80000002u), sb::U16(4066), sb::U8(0), sb::U8(0), sb::U32(0), sb::U32(0xFFFFFFFFu),
                          sb::U16(0), sb::U16(count)});
    for (unsigned int m = 0; m < count; ++m) {
      const std::string name = "modulo" + std::to_string(m) + ".ncl";
      Bytes info = sb::Cat({sb::Descriptor(0x01, sb::Text("application/x-ncl")), sb::Descriptor(0x02, sb::Text(name)),
                            sb::Descriptor(0x05, sb::U32(0x12345678 + m)), sb::Descriptor(0x07, sb::U32(30))});
      sb::Append(body, sb::Cat({sb::U16(m + 1), sb::U32(20000 + m), sb::U8(1),
                                sb::U8(static_cast<unsigned int>(info.size())), info}));
    }
    sb::Append(body, sb::U16(0));  // privateDataLength
    sections.push_back(CarouselSection(0x3B, 0x0002, DsmccMessage(0x1002, 0x80000002u, body)));
  }
  return sections;
}

std::vector<Bytes> BuiltDdbSections() {
  std::vector<Bytes> sections;
  for (unsigned int block = 0; block < 4; ++block) {
    Bytes body = sb::Cat({sb::U16(1), sb::U8(1), sb::U8(0xFF), sb::U16(block), Pattern(4066, static_cast<uint8_t>(block))});
    sections.push_back(CarouselSection(0x3C, 0x0001, DsmccMessage(0x1003, 0x000000ABu, body)));
  }
  return sections;
}

std::vector<Bytes> BuiltStreamEventSections() {
  std::vector<Bytes> sections;
  // STC_Reference 0x10 and NPT_Reference 0x2000 under set reserved bits, scale 1/1.
  const Bytes npt = sb::Descriptor(0x17, Bytes{0x01, 0xFE, 0, 0, 0, 0x10, 0xFF, 0xFF, 0xFF, 0xFE, 0, 0, 0x20, 0, 0, 1, 0, 1});
  for (unsigned int count = 1; count <= 4; ++count) {
    std::vector<Bytes> descriptors = {npt};
    for (unsigned int e = 0; e < count; ++e) {
      // event group 1, time mode 0, event type 1, event id, private data
      descriptors.push_back(sb::Descriptor(0x40, sb::Cat({Bytes{0x00, 0x10, 0x00, 0, 0, 0, 0, 0, 0x01}, sb::U16(e + 1),
                                                          sb::Text("evento")})));
    }
    sb::SectionOptions options;
    options.tableId = 0x3D;
    options.tableIdExtension = 0x0001;
    options.version = 3;
    sections.push_back(sb::LongSection(options, sb::Cat(descriptors)));
  }
  return sections;
}

}  // namespace bench
