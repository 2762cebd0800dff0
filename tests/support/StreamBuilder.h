// Builds broadcast data for tests and samples: sections with a correct (or a
// deliberately wrong) CRC_32, descriptors and loops, and 188-byte packets that
// carry sections the way broadcasters cut them.
#ifndef RAVEL_TESTS_STREAMBUILDER_H
#define RAVEL_TESTS_STREAMBUILDER_H

#include <cstdint>
#include <string>
#include <vector>

typedef std::vector<uint8_t> Bytes;

namespace sb {

// Concatenation helpers.
Bytes Cat(const std::vector<Bytes>& parts);
void Append(Bytes& target, const Bytes& more);
Bytes U8(unsigned int value);
Bytes U16(unsigned int value);
Bytes U24(unsigned int value);
Bytes U32(unsigned int value);
Bytes Text(const std::string& text);

// tag, length, body.
Bytes Descriptor(uint8_t tag, const Bytes& body);
// A descriptor loop preceded by its 12-bit length (upper 4 bits `reserved`).
Bytes DescriptorLoop(const std::vector<Bytes>& descriptors, uint8_t reserved = 0xF);
// 12-bit length with 4 reserved bits set, as a 2-byte prefix.
Bytes Length12(unsigned int length, uint8_t reserved = 0xF);

// 16-bit MJD of a calendar date (Gregorian), and a 40-bit UTC field.
unsigned int Mjd(int year, int month, int day);
uint8_t Bcd(int value);
Bytes UtcTime(int year, int month, int day, int hour, int minute, int second);

struct SectionOptions {
  uint8_t tableId = 0x00;
  uint16_t tableIdExtension = 0x0001;
  uint8_t version = 0;
  bool currentNext = true;
  uint8_t sectionNumber = 0;
  uint8_t lastSectionNumber = 0;
  bool syntaxIndicator = true;
  bool privateIndicator = true;  // the '0'/private bit after the syntax indicator
  bool corruptCrc = false;
};

// A long-form section: 8-byte header, body, CRC_32 (section_length computed).
Bytes LongSection(const SectionOptions& options, const Bytes& body);
// A short-form section (TDT): table_id, length, body; optionally a CRC_32.
Bytes ShortSection(uint8_t tableId, const Bytes& body, bool withCrc, bool corruptCrc = false);
// Recomputes the CRC_32 of a complete section in place.
void FixCrc(Bytes& section);

// Cuts sections into 188-byte packets of one PID.
class PacketWriter {
 public:
  explicit PacketWriter(uint16_t pid, uint8_t firstCounter = 0);

  // Each section starts a new packet (pointer_field 0) and the last packet is
  // filled with 0xFF stuffing.
  void AddSection(const Bytes& section);
  // Sections packed back to back: a section may start in the packet where the
  // previous one ends (the pointer_field says where).
  void AddPackedSections(const std::vector<Bytes>& sections);

  // A raw packet of this PID built from the given fields (payload padded with 0xFF).
  Bytes MakePacket(bool pusi, const Bytes& payload, uint8_t adaptationControl = 1,
                   const Bytes& adaptation = Bytes());

  void SetCounter(uint8_t counter) { counter_ = counter & 0x0F; }
  const std::vector<Bytes>& Packets() const { return packets_; }
  Bytes Stream() const;
  void Clear() { packets_.clear(); }

 private:
  uint16_t pid_;
  uint8_t counter_;
  std::vector<Bytes> packets_;
};

}  // namespace sb

#endif
