// Interactivity of the sample's one-segment service: the Ginga-NCL application
// signalled in the AIT, the data carousel that carries its two files (DSI, DII
// and DDB messages of ISO/IEC 13818-6) and the stream descriptor section with
// its NPT reference and stream events.
#include <string>

#include "Ravel_Util.h"
#include "SampleSections.h"

namespace sample {

using sb::Append;
using sb::Cat;
using sb::Descriptor;
using sb::Text;
using sb::U16;
using sb::U32;
using sb::U8;

namespace {

const uint32_t kOrganizationId = 0x00000640;
const uint16_t kApplicationId = 0x0001;
const uint16_t kApplicationTypeGingaNcl = 0x0009;
const uint32_t kDsiTransactionId = 0x80000000u;
const uint32_t kDiiTransactionId = 0x80000002u;  // also the DSI's group id

// NPT of the running programme at the STC reference: 30 minutes in.
const uint64_t kNptAtReference = 30ull * 60 * 90000;

Bytes DsmccSection(uint8_t tableId, uint16_t extension, uint8_t version, const Bytes& message,
                   uint8_t sectionNumber = 0, uint8_t lastSectionNumber = 0) {
  sb::SectionOptions options;
  options.tableId = tableId;
  options.tableIdExtension = extension;
  options.version = version;
  options.sectionNumber = sectionNumber;
  options.lastSectionNumber = lastSectionNumber;
  options.privateIndicator = false;
  return sb::LongSection(options, message);
}

// dsmccMessageHeader (DSI, DII) or dsmccDownloadDataHeader (DDB), without
// adaptation header.
Bytes MessageHeader(uint16_t messageId, uint32_t transactionId, size_t messageLength) {
  return Cat({U8(0x11), U8(0x03), U16(messageId), U32(transactionId), U8(0xFF), U8(0),
              U16(static_cast<unsigned int>(messageLength))});
}

// Pads `text` with a comment of the file's language to exactly `size` bytes.
Bytes FileOfSize(const std::string& text, const std::string& open, const std::string& close, size_t size) {
  std::string file = text + open;
  const std::string filler = "Rede Exemplo, carrossel de dados de exemplo. ";
  size_t room = size - file.size() - close.size();
  for (size_t i = 0; i < room; ++i) file += filler[i % filler.size()];
  file += close;
  return Text(file);
}

Bytes NclDocument() {
  const std::string ncl =
      "<?xml version=\"1.0\" encoding=\"ISO-8859-1\"?>\n"
      "<ncl id=\"exemplo\" xmlns=\"http://www.ncl.org.br/NCL3.0/EDTVProfile\">\n"
      "<head>\n"
      "<regionBase>\n"
      "<region id=\"rgTela\" width=\"100%\" height=\"100%\"/>\n"
      "<region id=\"rgFaixa\" left=\"5%\" top=\"80%\" width=\"90%\" height=\"15%\" zIndex=\"2\"/>\n"
      "</regionBase>\n"
      "<descriptorBase>\n"
      "<descriptor id=\"dTela\" region=\"rgTela\"/>\n"
      "<descriptor id=\"dFaixa\" region=\"rgFaixa\"/>\n"
      "</descriptorBase>\n"
      "<connectorBase>\n"
      "<causalConnector id=\"onBeginStart\">\n"
      "<simpleCondition role=\"onBegin\"/>\n"
      "<simpleAction role=\"start\"/>\n"
      "</causalConnector>\n"
      "</connectorBase>\n"
      "</head>\n"
      "<body>\n"
      "<port id=\"pInicio\" component=\"video\"/>\n"
      "<media id=\"video\" src=\"sbtvd-ts://video\" descriptor=\"dTela\"/>\n"
      "<media id=\"faixa\" src=\"script.lua\" descriptor=\"dFaixa\"/>\n"
      "<link xconnector=\"onBeginStart\">\n"
      "<bind role=\"onBegin\" component=\"video\"/>\n"
      "<bind role=\"start\" component=\"faixa\"/>\n"
      "</link>\n"
      "</body>\n"
      "</ncl>\n";
  return FileOfSize(ncl, "<!-- ", " -->\n", 3000);
}

Bytes LuaScript() {
  const std::string lua =
      "-- script.lua: faixa de texto do Exemplo\n"
      "local texto = 'Jornal Exemplo'\n"
      "function desenha()\n"
      "  canvas:attrColor('white')\n"
      "  canvas:clear()\n"
      "  canvas:attrColor('black')\n"
      "  canvas:attrFont('Tiresias', 20)\n"
      "  canvas:drawText(10, 10, texto)\n"
      "  canvas:flush()\n"
      "end\n"
      "function trata(evt)\n"
      "  if evt.class == 'ncl' and evt.action == 'start' then desenha() end\n"
      "end\n"
      "event.register(trata)\n";
  return FileOfSize(lua, "--[[ ", " ]]\n", 500);
}

// The 33-bit STC and NPT references of the NPT reference descriptor.
Bytes Bit32AndLow(uint8_t reserved, uint64_t value) {
  return Cat({U8(reserved | static_cast<unsigned int>((value >> 32) & 1)), U32(static_cast<uint32_t>(value))});
}

// General event descriptor: event_msg_group_id 1, a 5-byte time field in the
// chosen time mode, the message type and id, and the private data.
Bytes GeneralEvent(uint8_t timeMode, const Bytes& time, uint8_t type, uint16_t id, const std::string& data) {
  return Descriptor(0x40, Cat({U16((0x001 << 4) | 0xF), U8(timeMode), time, U8(type), U16(id), Text(data)}));
}

}  // namespace

Bytes AitSection() {
  // Application descriptor: one profile (1, version 1.0.0), service bound,
  // visible, priority 1, transport protocol label 1.
  Bytes application =
      Descriptor(0x00, Cat({U8(5), U16(0x0001), U8(1), U8(0), U8(0), U8(0xFF), U8(0x01), U8(0x01)}));
  Bytes name = Descriptor(0x01, Cat({Text("por"), U8(7), Text("Exemplo")}));
  // Transport protocol: object carousel (protocol 1), label 1, carried in this
  // service on the carousel component (tag 0x8A).
  Bytes transport = Descriptor(0x02, Cat({U16(0x0001), U8(0x01), U8(0x7F), U8(0x8A)}));
  const std::string base = "/exemplo";
  const std::string initial = "main.ncl";
  Bytes location =
      Descriptor(0x07, Cat({U8(static_cast<unsigned int>(base.size())), Text(base), U8(0), Text(initial)}));
  Bytes descriptors = Cat({application, name, transport, location});

  // The 4 bits before the descriptor loop length carry the document
  // resolution code (0xC).
  Bytes app = Cat({U32(kOrganizationId), U16(kApplicationId), U8(0x01 /* AUTOSTART */),
                   U16(0xC000 | static_cast<unsigned int>(descriptors.size())), descriptors});
  Bytes body = Cat({sb::Length12(0), sb::Length12(static_cast<unsigned int>(app.size())), app});
  sb::SectionOptions options;
  options.tableId = 0x74;
  options.tableIdExtension = kApplicationTypeGingaNcl;
  return sb::LongSection(options, body);
}

std::vector<CarouselModule> CarouselModules() {
  return {{0x0001, 1, "application/x-ginga-NCL", "main.ncl", NclDocument()},
          {0x0002, 1, "application/x-ginga-NCLua", "script.lua", LuaScript()}};
}

Bytes DsiSection() {
  // serverId: the carousel NSAP address with this service's location.
  Bytes serverId = Cat({U8(0x00), U8(0x00), U32(kCarouselId), U32(0x0100015Au), U16(kTransportStreamId),
                        U16(kOriginalNetworkId), U16(kOneSegServiceId), U32(0xFFFFFFFFu)});
  // GroupInfoIndication: one group, the DII below, with the size of both modules.
  uint32_t groupSize = 0;
  for (const CarouselModule& module : CarouselModules()) groupSize += static_cast<uint32_t>(module.data.size());
  Bytes groups = Cat({U16(1), U32(kDiiTransactionId), U32(groupSize), U16(0), U16(0), U16(0)});
  Bytes body = Cat({serverId, U16(0), U16(static_cast<unsigned int>(groups.size())), groups});
  Bytes message = Cat({MessageHeader(0x1006, kDsiTransactionId, body.size()), body});
  return DsmccSection(0x3B, static_cast<uint16_t>(kDsiTransactionId), 0, message);
}

Bytes DiiSection(const std::vector<CarouselModule>& modules) {
  Bytes body = Cat({U32(kDownloadId), U16(kBlockSize), U8(0), U8(0), U32(0), U32(0), U16(0)});
  Append(body, U16(static_cast<unsigned int>(modules.size())));
  for (const CarouselModule& module : modules) {
    unsigned int crc = RavelUtil_CRC32(0xFFFFFFFFu, module.data.data(), static_cast<unsigned int>(module.data.size()));
    Bytes info = Cat({Descriptor(0x01, Text(module.type)), Descriptor(0x02, Text(module.name)),
                      Descriptor(0x05, U32(crc))});
    Append(body, Cat({U16(module.id), U32(static_cast<uint32_t>(module.data.size())), U8(module.version),
                      U8(static_cast<unsigned int>(info.size())), info}));
  }
  Append(body, U16(0));  // privateDataLength
  Bytes message = Cat({MessageHeader(0x1002, kDiiTransactionId, body.size()), body});
  return DsmccSection(0x3B, static_cast<uint16_t>(kDiiTransactionId), 0, message);
}

std::vector<Bytes> DdbSections(const CarouselModule& module) {
  std::vector<Bytes> sections;
  size_t blocks = (module.data.size() + kBlockSize - 1) / kBlockSize;
  for (size_t n = 0; n < blocks; ++n) {
    size_t offset = n * kBlockSize;
    size_t length = module.data.size() - offset < kBlockSize ? module.data.size() - offset : kBlockSize;
    Bytes block(module.data.begin() + offset, module.data.begin() + offset + length);
    Bytes message = Cat({MessageHeader(0x1003, kDownloadId, 6 + length), U16(module.id), U8(module.version), U8(0xFF),
                         U16(static_cast<unsigned int>(n)), block});
    // table_id_extension: the module id; version: the module version; section
    // number: the block number.
    sections.push_back(DsmccSection(0x3C, module.id, module.version, message, static_cast<uint8_t>(n),
                                    static_cast<uint8_t>(blocks - 1)));
  }
  return sections;
}

Bytes StreamDescriptorSection() {
  const uint64_t stc = kFirstPcrBase;
  // NPT reference: content id 1, STC and NPT references, rate 1/1.
  Bytes npt = Descriptor(0x17, Cat({U8(0x01), Bit32AndLow(0xFE, stc), sb::U24(0xFFFFFF), Bit32AndLow(0xFE, kNptAtReference),
                                    U16(1), U16(1)}));
  // Stream events: a start 10 s of NPT later, and a quiz at 19:45 local time.
  Bytes start = GeneralEvent(0x02, Bit32AndLow(0xFE, kNptAtReference + 10 * 90000), 0x01, 0x0001, "inicio");
  Bytes quiz = GeneralEvent(0x01, sb::UtcTime(2024, 5, 14, 19, 45, 0), 0x02, 0x0002, "quiz");
  return DsmccSection(0x3D, 0x0001, 0, Cat({npt, start, quiz}));
}

}  // namespace sample
