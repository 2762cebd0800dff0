#include "SectionCheck.h"

#include "Ravel_ByteOrder.h"
#include "Ravel_Util.h"

namespace ravel_dump {
namespace {

// A walk over [start, end) of one section, reporting the first overrun.
class Walk {
 public:
  Walk(const uint8_t* section, std::size_t size, std::string& reason)
      : s_(section), size_(size), reason_(reason) {}

  bool Fail(const char* what, std::size_t at) {
    reason_ = std::string(what) + " at byte " + std::to_string(at);
    return false;
  }

  // tag, length, body ... up to `end`; each descriptor must end by `end`.
  bool Descriptors(std::size_t start, std::size_t end) {
    std::size_t pos = start;
    while (pos < end) {
      if (pos + 2 > end) return Fail("descriptor header cut by its loop's end", pos);
      std::size_t next = pos + 2 + s_[pos + 1];
      if (next > end) return Fail("descriptor runs past its loop's end", pos);
      pos = next;
    }
    return true;
  }

  // A 12-bit length at `at` opening a loop that must end by `limit`.
  bool Loop12(std::size_t at, std::size_t limit, std::size_t& loopEnd) {
    if (at + 2 > limit) return Fail("loop length cut", at);
    loopEnd = at + 2 + RavelRead12(s_ + at);
    if (loopEnd > limit) return Fail("loop runs past its parent's end", at);
    return true;
  }

  // Entries of `fixed` bytes whose last two hold a 12-bit descriptor loop length.
  bool Entries(std::size_t start, std::size_t end, std::size_t fixed) {
    std::size_t pos = start;
    while (pos < end) {
      if (pos + fixed > end) return Fail("loop entry cut by its loop's end", pos);
      std::size_t loopEnd = pos + fixed + RavelRead12(s_ + pos + fixed - 2);
      if (loopEnd > end) return Fail("loop entry runs past its loop's end", pos);
      if (!Descriptors(pos + fixed, loopEnd)) return false;
      pos = loopEnd;
    }
    return true;
  }

  bool Pmt() {
    std::size_t crc = size_ - 4;
    if (size_ < 16) return Fail("PMT shorter than its fixed fields", 0);
    std::size_t infoEnd = 0;
    if (!Loop12(10, crc, infoEnd)) return false;
    if (!Descriptors(12, infoEnd)) return false;
    return Entries(infoEnd, crc, 5);
  }

  bool Nit() {
    std::size_t crc = size_ - 4;
    if (size_ < 16) return Fail("NIT shorter than its fixed fields", 0);
    std::size_t networkEnd = 0;
    if (!Loop12(8, crc, networkEnd)) return false;
    if (!Descriptors(10, networkEnd)) return false;
    std::size_t streamsEnd = 0;
    if (!Loop12(networkEnd, crc, streamsEnd)) return false;
    return Entries(networkEnd + 2, streamsEnd, 6);
  }

  bool Sdt() {
    if (size_ < 15) return Fail("SDT shorter than its fixed fields", 0);
    return Entries(11, size_ - 4, 5);
  }

  bool Eit() {
    if (size_ < 18) return Fail("EIT shorter than its fixed fields", 0);
    return Entries(14, size_ - 4, 12);
  }

  bool Bit() {
    std::size_t crc = size_ - 4;
    if (size_ < 14) return Fail("BIT shorter than its fixed fields", 0);
    std::size_t firstEnd = 0;
    if (!Loop12(8, crc, firstEnd)) return false;
    if (!Descriptors(10, firstEnd)) return false;
    return Entries(firstEnd, crc, 3);
  }

  bool Tdt() {
    if (size_ < 8) return Fail("TDT shorter than its date and time", 0);
    return true;
  }

  bool Tot() {
    if (size_ < 14) return Fail("TOT shorter than its fixed fields", 0);
    std::size_t loopEnd = 0;
    if (!Loop12(8, size_ - 4, loopEnd)) return false;
    return Descriptors(10, loopEnd);
  }

  // The AIT reads both 12-bit lengths from bytes 8 to 11 and then starts the
  // application loop after the common descriptors; that reading is checked.
  bool Ait() {
    std::size_t crc = size_ - 4;
    if (size_ < 16) return Fail("AIT shorter than its fixed fields", 0);
    std::size_t commonEnd = 12 + RavelRead12(s_ + 8);
    if (commonEnd > crc) return Fail("common descriptors run past the section", 8);
    std::size_t appsEnd = commonEnd + RavelRead12(s_ + 10);
    if (appsEnd > crc) return Fail("application loop runs past the section", 10);
    return Entries(commonEnd, appsEnd, 9);
  }

  bool StreamDescriptors() {
    if (size_ < 12) return Fail("stream descriptor section shorter than its header", 0);
    return Descriptors(8, size_ - 4);
  }

  // DSM-CC message (ISO/IEC 13818-6) from byte 8 to the CRC or checksum.
  bool Dsmcc() {
    if (size_ < 12 + 12) return Fail("DSM-CC message shorter than its header", 8);
    const std::size_t m = 8;
    const std::size_t regionEnd = size_ - 4;
    std::size_t adaptation = s_[m + 9];
    std::size_t messageLength = RavelRead16(s_ + m + 10);
    std::size_t messageEnd = m + 12 + messageLength;
    if (messageEnd > regionEnd) return Fail("DSM-CC message runs past the section", m + 10);
    if (m + 12 + adaptation > messageEnd) return Fail("DSM-CC adaptation runs past the message", m + 9);
    const std::size_t b = m + 12 + adaptation;  // first byte after header and adaptation
    switch (RavelRead16(s_ + m + 2)) {
      case 0x1006:  // DownloadServerInitiate: server id, compatibility length, private length
        if (b + 24 > messageEnd) return Fail("DSI shorter than its fixed fields", b);
        return true;
      case 0x1002: {  // DownloadInfoIndication
        if (b + 18 > messageEnd) return Fail("DII shorter than its fixed fields", b);
        std::size_t c = b + 16 + RavelRead16(s_ + b + 16);
        if (c + 4 > messageEnd) return Fail("DII compatibility descriptor runs past the message", b + 16);
        std::size_t modules = RavelRead16(s_ + c + 2);
        std::size_t p = c + 4;
        for (std::size_t i = 0; i < modules; ++i) {
          if (p + 8 > messageEnd) return Fail("DII module record cut by the message end", p);
          p += 8 + s_[p + 7];
          if (p > messageEnd) return Fail("DII module info runs past the message", p);
        }
        if (p + 2 > messageEnd) return Fail("DII private data length cut", p);
        std::size_t privateEnd = p + 2 + RavelRead16(s_ + p);
        if (privateEnd > messageEnd) return Fail("DII private data runs past the message", p);
        return Descriptors(p + 2, privateEnd);
      }
      case 0x1003:  // DownloadDataBlock: moduleId, version, reserved, blockNumber
        if (messageLength < adaptation + 6) return Fail("DDB shorter than its fixed fields", b);
        return true;
      default:
        return true;
    }
  }

 private:
  const uint8_t* s_;
  std::size_t size_;
  std::string& reason_;
};

}  // namespace

bool SectionHasCrc(const uint8_t* section) {
  return (section[1] & 0x80) != 0 || section[0] == 0x73;
}

bool SectionCrcOk(const uint8_t* section, std::size_t size) {
  if (size < 7 || static_cast<std::size_t>(RavelSectionSize(section)) != size) return false;
  return RavelUtil_CheckSectionCRC32(section) != 0;
}

bool CheckSectionStructure(const uint8_t* section, std::size_t size, std::string& reason) {
  if (size < 3 || static_cast<std::size_t>(RavelSectionSize(section)) != size) {
    reason = "section length does not match the bytes held";
    return false;
  }
  Walk walk(section, size, reason);
  uint8_t tableId = section[0];
  bool longForm = (section[1] & 0x80) != 0;
  if (longForm && size < 12) return walk.Fail("long section shorter than its header and CRC", 0);
  switch (tableId) {
    case 0x02:
      return walk.Pmt();
    case 0x40:
    case 0x41:
      return walk.Nit();
    case 0x42:
    case 0x46:
      return walk.Sdt();
    case 0x70:
      return walk.Tdt();
    case 0x73:
      return walk.Tot();
    case 0x74:
      return walk.Ait();
    case 0xC4:
      return walk.Bit();
    case 0x3B:
    case 0x3C:
      return walk.Dsmcc();
    case 0x3D:
      return walk.StreamDescriptors();
    default:
      break;
  }
  if (tableId >= 0x4E && tableId <= 0x6F) return walk.Eit();
  return true;
}

}  // namespace ravel_dump
