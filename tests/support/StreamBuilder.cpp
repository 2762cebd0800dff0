#include "StreamBuilder.h"

#include <algorithm>

#include "Ravel_Util.h"

namespace sb {

Bytes Cat(const std::vector<Bytes>& parts) {
  Bytes all;
  for (size_t i = 0; i < parts.size(); ++i) all.insert(all.end(), parts[i].begin(), parts[i].end());
  return all;
}

void Append(Bytes& target, const Bytes& more) { target.insert(target.end(), more.begin(), more.end()); }

Bytes U8(unsigned int value) { return Bytes{static_cast<uint8_t>(value)}; }
Bytes U16(unsigned int value) { return Bytes{static_cast<uint8_t>(value >> 8), static_cast<uint8_t>(value)}; }
Bytes U24(unsigned int value) {
  return Bytes{static_cast<uint8_t>(value >> 16), static_cast<uint8_t>(value >> 8), static_cast<uint8_t>(value)};
}
Bytes U32(unsigned int value) {
  return Bytes{static_cast<uint8_t>(value >> 24), static_cast<uint8_t>(value >> 16), static_cast<uint8_t>(value >> 8),
               static_cast<uint8_t>(value)};
}
Bytes Text(const std::string& text) { return Bytes(text.begin(), text.end()); }

Bytes Descriptor(uint8_t tag, const Bytes& body) {
  return Cat({U8(tag), U8(static_cast<unsigned int>(body.size())), body});
}

Bytes Length12(unsigned int length, uint8_t reserved) {
  return Bytes{static_cast<uint8_t>((reserved << 4) | ((length >> 8) & 0x0F)), static_cast<uint8_t>(length)};
}

Bytes DescriptorLoop(const std::vector<Bytes>& descriptors, uint8_t reserved) {
  Bytes body = Cat(descriptors);
  return Cat({Length12(static_cast<unsigned int>(body.size()), reserved), body});
}

unsigned int Mjd(int year, int month, int day) {
  // Days from the civil calendar (proleptic Gregorian), then the MJD epoch.
  int y = year - (month <= 2 ? 1 : 0);
  int era = (y >= 0 ? y : y - 399) / 400;
  int yoe = y - era * 400;
  int mp = (month + 9) % 12;
  int doy = (153 * mp + 2) / 5 + day - 1;
  int doe = yoe * 365 + yoe / 4 - yoe / 100 + doy;
  long days = static_cast<long>(era) * 146097 + doe - 719468;  // days since 1970-01-01
  return static_cast<unsigned int>(days + 40587);
}

uint8_t Bcd(int value) { return static_cast<uint8_t>(((value / 10) << 4) | (value % 10)); }

Bytes UtcTime(int year, int month, int day, int hour, int minute, int second) {
  return Cat({U16(Mjd(year, month, day)), Bytes{Bcd(hour), Bcd(minute), Bcd(second)}});
}

void FixCrc(Bytes& section) {
  if (section.size() < 4) return;
  unsigned int crc = RavelUtil_CRC32(0xFFFFFFFFu, section.data(), static_cast<unsigned int>(section.size() - 4));
  const Bytes field = U32(crc);
  std::copy(field.begin(), field.end(), section.end() - 4);
}

Bytes LongSection(const SectionOptions& o, const Bytes& body) {
  unsigned int sectionLength = 5 + static_cast<unsigned int>(body.size()) + 4;
  const uint8_t flags = static_cast<uint8_t>((o.syntaxIndicator ? 0x80 : 0) | (o.privateIndicator ? 0x40 : 0) | 0x30);
  const uint8_t versionByte = static_cast<uint8_t>(0xC0 | ((o.version & 0x1F) << 1) | (o.currentNext ? 1 : 0));
  Bytes s = Cat({U8(o.tableId), U16(flags << 8 | (sectionLength & 0x0FFF)), U16(o.tableIdExtension),
                 Bytes{versionByte, o.sectionNumber, o.lastSectionNumber}, body, U32(0)});
  FixCrc(s);
  if (o.corruptCrc) s.back() ^= 0x01;
  return s;
}

Bytes ShortSection(uint8_t tableId, const Bytes& body, bool withCrc, bool corruptCrc) {
  unsigned int sectionLength = static_cast<unsigned int>(body.size()) + (withCrc ? 4 : 0);
  Bytes s = Cat({U8(tableId), U16(0x7000 | (sectionLength & 0x0FFF)), body, withCrc ? U32(0) : Bytes()});
  if (withCrc) {
    FixCrc(s);
    if (corruptCrc) s.back() ^= 0x01;
  }
  return s;
}

PacketWriter::PacketWriter(uint16_t pid, uint8_t firstCounter) : pid_(pid), counter_(firstCounter & 0x0F) {}

Bytes PacketWriter::MakePacket(bool pusi, const Bytes& payload, uint8_t adaptationControl, const Bytes& adaptation) {
  Bytes p;
  p.push_back(0x47);
  p.push_back(static_cast<uint8_t>((pusi ? 0x40 : 0) | ((pid_ >> 8) & 0x1F)));
  p.push_back(static_cast<uint8_t>(pid_));
  p.push_back(static_cast<uint8_t>(((adaptationControl & 3) << 4) | counter_));
  if (adaptationControl & 2) {
    p.push_back(static_cast<uint8_t>(adaptation.size()));
    Append(p, adaptation);
  }
  if (adaptationControl & 1) Append(p, payload);
  p.resize(188, 0xFF);
  // Only packets with payload advance the continuity counter.
  if (adaptationControl & 1) counter_ = (counter_ + 1) & 0x0F;
  packets_.push_back(p);
  return p;
}

void PacketWriter::AddSection(const Bytes& section) { AddPackedSections(std::vector<Bytes>{section}); }

void PacketWriter::AddPackedSections(const std::vector<Bytes>& sections) {
  Bytes data = Cat(sections);
  std::vector<size_t> starts;  // of each section in `data`
  for (size_t i = 0, at = 0; i < sections.size(); at += sections[i++].size()) starts.push_back(at);
  size_t nextStart = 0;
  for (size_t offset = 0; offset < data.size();) {
    // Does a section start inside the next 183 bytes?
    while (nextStart < starts.size() && starts[nextStart] < offset) ++nextStart;
    bool pusi = nextStart < starts.size() && starts[nextStart] < offset + 183;
    Bytes payload;
    if (pusi) payload.push_back(static_cast<uint8_t>(starts[nextStart] - offset));
    size_t take = std::min(184 - payload.size(), data.size() - offset);
    payload.insert(payload.end(), data.begin() + offset, data.begin() + offset + take);
    offset += take;
    MakePacket(pusi, payload);
  }
}

Bytes PacketWriter::Stream() const { return Cat(packets_); }

}  // namespace sb
