// PSI and SI of the sample: PAT, the one-segment PMT, NIT, SDT, EIT
// present/following, TDT, TOT and BIT, laid out as ISO/IEC 13818-1 and
// ABNT NBR 15603-2 put them on the air.
#include <string>

#include "SampleSections.h"

namespace sample {

using sb::Append;
using sb::Cat;
using sb::Descriptor;
using sb::DescriptorLoop;
using sb::Length12;
using sb::Text;
using sb::U16;
using sb::U32;
using sb::U8;

namespace {

// The channel: UHF 24 (533 + 1/7 MHz), counted in the 1/7 MHz units of the
// terrestrial delivery system descriptor.
const unsigned int kFrequency = 533 * 7 + 1;
// area_code: state 20 (São Paulo) in the upper 5 bits, micro-region 61 (São Paulo).
const unsigned int kAreaCode = (20 << 7) | 61;
const uint8_t kGuardInterval = 0x01;      // 1/16
const uint8_t kTransmissionMode = 0x02;   // mode 3
const uint8_t kRemoteControlKey = 0x07;

// Texts are broadcast bytes (ISO/IEC 8859-15 in Brazil), not converted.
const char kProvider[] = "Rede Exemplo";
const char kFullSegName[] = "Exemplo HD";
const char kOneSegName[] = "Exemplo S\xE3o Paulo";

Bytes Section(uint8_t tableId, uint16_t extension, uint8_t version, const Bytes& body, bool privateIndicator,
              uint8_t sectionNumber = 0, uint8_t lastSectionNumber = 0) {
  sb::SectionOptions options;
  options.tableId = tableId;
  options.tableIdExtension = extension;
  options.version = version;
  options.sectionNumber = sectionNumber;
  options.lastSectionNumber = lastSectionNumber;
  options.privateIndicator = privateIndicator;
  return sb::LongSection(options, body);
}

// 13-bit PID behind 3 reserved bits.
Bytes Pid(uint16_t pid) { return U16(0xE000u | pid); }

Bytes Language(const char* code) { return Text(std::string(code, 3)); }

// A text behind its 8-bit count.
Bytes Counted(const std::string& text) {
  Bytes b = U8(static_cast<unsigned int>(text.size()));
  Append(b, Text(text));
  return b;
}

Bytes ParentalRating(uint8_t rating) { return Descriptor(0x55, Cat({Text("BRA"), U8(rating)})); }

Bytes StreamIdentifier(uint8_t componentTag) { return Descriptor(0x52, U8(componentTag)); }

Bytes DataComponent(uint16_t id, const Bytes& additional) { return Descriptor(0xFD, Cat({U16(id), additional})); }

// additional_ginga_info of the carousel component: object carousel transmission
// (format 2), no application identifier, independent, then the carousel id and
// the on-demand / file-storable / event-section flags.
Bytes GingaCarouselInfo() {
  uint8_t flags = static_cast<uint8_t>((2 << 6) | (0 << 5) | (0x0 << 1) | 1);
  return Cat({U8(flags), U32(kCarouselId), U8(0x7F)});
}

Bytes PmtStream(uint8_t streamType, uint16_t pid, const std::vector<Bytes>& descriptors) {
  return Cat({U8(streamType), Pid(pid), DescriptorLoop(descriptors)});
}

Bytes Service(uint8_t type, const char* provider, const char* name) {
  return Descriptor(0x48, Cat({U8(type), Counted(provider), Counted(name)}));
}

// SDT service entry: EIT flags behind 3 reserved bits, then running status,
// free_CA_mode and the descriptor loop length.
Bytes SdtService(uint16_t serviceId, bool schedule, bool presentFollowing, const std::vector<Bytes>& descriptors) {
  Bytes loop = Cat(descriptors);
  uint8_t flags = static_cast<uint8_t>(0xE0 | (schedule ? 0x02 : 0) | (presentFollowing ? 0x01 : 0));
  const unsigned int running = 4;
  return Cat({U16(serviceId), U8(flags), U16((running << 13) | static_cast<unsigned int>(loop.size())), loop});
}

Bytes ShortEvent(const std::string& name, const std::string& text) {
  return Descriptor(0x4D, Cat({Language("por"), Counted(name), Counted(text)}));
}

// H.264 240p 16:9 video of the one-segment service.
Bytes VideoComponent() {
  return Descriptor(0x50, Cat({U8(0xF0 | 0x05), U8(0xE3), U8(0x81), Language("por"), Text("Video")}));
}

// HE-AAC stereo in LATM: main component, quality 1, 48 kHz.
Bytes AudioComponent() {
  uint8_t flags = static_cast<uint8_t>((0 << 7) | (1 << 6) | (1 << 4) | (7 << 1) | 1);
  return Descriptor(0xC4, Cat({U8(0xF0 | 0x02), U8(0x03), U8(0x83), U8(0x11), U8(0xFF), U8(flags), Language("por"),
                               Text("Estereo")}));
}

Bytes Content(uint8_t genre) { return Descriptor(0x54, Cat({U8(genre), U8(0xFF)})); }

struct Event {
  uint16_t id;
  int hour, minute;
  int durationHour, durationMinute;
  unsigned int runningStatus;
  std::vector<Bytes> descriptors;
};

Bytes EitEvent(const Event& e) {
  Bytes loop = Cat(e.descriptors);
  return Cat({U16(e.id), sb::UtcTime(2024, 5, 14, e.hour, e.minute, 0), U8(sb::Bcd(e.durationHour)),
              U8(sb::Bcd(e.durationMinute)), U8(sb::Bcd(0)),
              U16((e.runningStatus << 13) | static_cast<unsigned int>(loop.size())), loop});
}

// local_time_offset entry: Brazil, region 3, 3 hours behind UTC until the
// time of change, 2 hours behind after it.
Bytes LocalTimeOffset() {
  const unsigned int region = 3;
  const unsigned int polarity = 1;
  Bytes entry = Text("BRA");
  entry.push_back(static_cast<uint8_t>((region << 2) | 0x02 | polarity));
  entry.push_back(sb::Bcd(3));
  entry.push_back(sb::Bcd(0));
  Append(entry, sb::UtcTime(2024, 11, 3, 3, 0, 0));
  entry.push_back(sb::Bcd(2));
  entry.push_back(sb::Bcd(0));
  return Descriptor(0x58, entry);
}

Bytes BroadcasterName(const char* name) { return Descriptor(0xD8, Text(name)); }

Bytes BroadcasterRecord(uint8_t broadcasterId, const std::vector<Bytes>& descriptors) {
  return Cat({U8(broadcasterId), DescriptorLoop(descriptors)});
}

}  // namespace

Bytes PatSection() {
  Bytes body = Cat({U16(0x0000), Pid(kPidNit),                    // network PID
                    U16(kFullSegServiceId), Pid(kPidFullSegPmt),  // full-seg service
                    U16(kOneSegServiceId), Pid(kPidOneSegPmt)});  // one-segment service
  return Section(0x00, kTransportStreamId, 0, body, false);
}

Bytes OneSegPmtSection() {
  Bytes body = Cat({Pid(kPidVideo), DescriptorLoop({ParentalRating(0x23)})});
  Append(body, PmtStream(0x1B, kPidVideo, {StreamIdentifier(0x81)}));
  Append(body, PmtStream(0x11, kPidAudio, {StreamIdentifier(0x83)}));
  // Closed captions (ABNT NBR 15606-1): data component 0x0008 and its
  // additional caption info byte.
  Append(body, PmtStream(0x06, kPidCaptions, {StreamIdentifier(0x87), DataComponent(0x0008, U8(0x3D))}));
  Append(body, PmtStream(0x05, kPidAit, {StreamIdentifier(0x88), DataComponent(0x00A0, Bytes())}));
  Append(body, PmtStream(0x0B, kPidCarousel, {StreamIdentifier(0x8A), DataComponent(0x00A0, GingaCarouselInfo())}));
  Append(body, PmtStream(0x0C, kPidStreamEvents, {StreamIdentifier(0x8B), DataComponent(0x00A0, Bytes())}));
  return Section(0x02, kOneSegServiceId, 0, body, false);
}

Bytes NitSection() {
  // broadcasting_flag 0, broadcasting_identifier 3 (ISDB-T), additional id 1.
  Bytes network = DescriptorLoop({Descriptor(0x40, Text(kProvider)), Descriptor(0xFE, Cat({U8(0x03), U8(0x01)}))});

  Bytes serviceList = Descriptor(0x41, Cat({U16(kFullSegServiceId), U8(0x01), U16(kOneSegServiceId), U8(0xC0)}));
  const std::string tsName = "Exemplo SP";
  Bytes tsInformation = Descriptor(
      0xCD, Cat({U8(kRemoteControlKey), U8(static_cast<unsigned int>((tsName.size() << 2) | 2)), Text(tsName),
                 U8(0x0F), U8(1), U16(kFullSegServiceId),    // layer B: the full-seg service
                 U8(0xAF), U8(1), U16(kOneSegServiceId)}));  // layer A: partial reception
  Bytes partialReception = Descriptor(0xFB, U16(kOneSegServiceId));
  Bytes delivery = Descriptor(
      0xFA, Cat({U16((kAreaCode << 4) | (kGuardInterval << 2) | kTransmissionMode), U16(kFrequency)}));
  Bytes entry = Cat({U16(kTransportStreamId), U16(kOriginalNetworkId),
                     DescriptorLoop({serviceList, tsInformation, partialReception, delivery})});

  Bytes body = network;
  Append(body, Length12(static_cast<unsigned int>(entry.size())));
  Append(body, entry);
  return Section(0x40, kNetworkId, 0, body, true);
}

Bytes SdtSection() {
  // Logo transmission type 1: logo_id 1, logo_version 3, download_data_id 1.
  Bytes logo = Descriptor(0xCF, Cat({U8(0x01), U16(0xFE00 | 0x001), U16(0xF000 | 0x003), U16(0x0001)}));
  Bytes body = Cat({U16(kOriginalNetworkId), U8(0xFF),
                    SdtService(kFullSegServiceId, true, true, {Service(0x01, kProvider, kFullSegName)}),
                    SdtService(kOneSegServiceId, false, true, {Service(0xC0, kProvider, kOneSegName), logo})});
  return Section(0x42, kTransportStreamId, 0, body, true);
}

Bytes OneSegEitSection(uint8_t sectionNumber) {
  Event present = {0x3A21, 19, 0, 1, 0, 4,
                   {ShortEvent("Jornal Exemplo", "Not\xED" "cias de S\xE3o Paulo e do Brasil"), ParentalRating(0x23),
                    VideoComponent(), AudioComponent(), Content(0x00)}};
  Event following = {0x3A22, 20, 0, 1, 15, 1,
                     {ShortEvent("Novela Exemplo", "Cap\xEDtulo 42"), ParentalRating(0x04), VideoComponent(),
                      AudioComponent(), Content(0x30)}};
  Bytes body = Cat({U16(kTransportStreamId), U16(kOriginalNetworkId), U8(1), U8(0x4E),
                    EitEvent(sectionNumber == 0 ? present : following)});
  return Section(0x4E, kOneSegServiceId, 0, body, true, sectionNumber, 1);
}

Bytes TdtSection() { return sb::ShortSection(0x70, sb::UtcTime(2024, 5, 14, 22, 30, 0), false); }

Bytes TotSection() {
  Bytes body = Cat({sb::UtcTime(2024, 5, 14, 22, 30, 1), DescriptorLoop({LocalTimeOffset()})});
  return sb::ShortSection(0x73, body, true);
}

Bytes BitSection() {
  // SI parameter descriptor: version 1, updated on the day of the capture,
  // transmission cycles of the NIT, SDT and EIT.
  Bytes siParameter =
      Descriptor(0xD7, Cat({U8(0x01), U16(sb::Mjd(2024, 5, 14)), U8(0x40), U8(1), U8(0x0A), U8(0x42), U8(1),
                            U8(0x0A), U8(0x4E), U8(2), U8(0x02), U8(0x02)}));
  // Terrestrial broadcaster 1, affiliation 1, one broadcaster of this network.
  Bytes extended = Descriptor(0xCE, Cat({U8(0x1F), U16(0x0001), U8((1 << 4) | 1), U8(0x01),
                                         U16(kOriginalNetworkId), U8(0x01)}));
  const unsigned int viewPropriety = 1;
  Bytes first = Cat({siParameter});
  Bytes body = U16(0xE000 | (viewPropriety << 12) | static_cast<unsigned int>(first.size()));
  Append(body, first);
  Append(body, BroadcasterRecord(0x01, {extended, BroadcasterName(kProvider)}));
  Append(body, BroadcasterRecord(0x02, {BroadcasterName("Exemplo Campinas")}));
  return Section(0xC4, kOriginalNetworkId, 0, body, true);
}

}  // namespace sample
