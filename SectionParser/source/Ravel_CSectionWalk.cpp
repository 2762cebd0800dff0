#include "Ravel_CSectionWalk.h"

#include "Ravel_ByteOrder.h"
#include "Ravel_CDsmccMsgBase.h"

namespace {

const int kCrcSize = 4;
const int kCarouselHeaderSize = 8;  // section header before the DSM-CC message
const int kMessageHeaderSize = 12;  // through messageLength

// The visit of the walk running on this thread, if any: the walks are plain
// functions of one signature, so the visit rides beside them.
struct DescriptorVisitor {
  RavelCSafeSection::DescriptorVisit pVisit;
  void* pContext;
};
thread_local DescriptorVisitor tVisitor = {0, 0};

}  // namespace

RavelCSectionWalk::RavelCSectionWalk(const unsigned char* bytes, int base, RavelSafeRefusal& refusal)
    : pBytes(bytes), iBase(base), rRefusal(refusal) {}

bool RavelCSectionWalk::Fail(RavelSafeResult result, const char* check, int at) {
  rRefusal.eResult = result;
  rRefusal.pCheck = check;
  rRefusal.iOffset = iBase + at;
  return false;
}

bool RavelCSectionWalk::Shorter(int size, int fixed, const char* check) {
  return size < fixed ? Fail(kRavelSafeMalformed, check, 0) : true;
}

// tag 8 | length 8 | body, up to `end`; each descriptor must end by `end`.
bool RavelCSectionWalk::Descriptors(int start, int end) {
  int at = start;
  while (at < end) {
    if (at + 2 > end) return Fail(kRavelSafeMalformed, "descriptor header cut by its loop's end", at);
    int next = at + 2 + pBytes[at + 1];
    if (next > end) return Fail(kRavelSafeMalformed, "descriptor runs past its loop's end", at);
    if (tVisitor.pVisit != 0) tVisitor.pVisit(iBase + at, pBytes[at], pBytes[at + 1], tVisitor.pContext);
    at = next;
  }
  return true;
}

// A 12-bit length at `at` opening a loop that must end by `limit`.
bool RavelCSectionWalk::Loop12(int at, int limit, int& loopEnd) {
  if (at + 2 > limit) return Fail(kRavelSafeMalformed, "loop length cut", at);
  loopEnd = at + 2 + RavelRead12(pBytes + at);
  if (loopEnd > limit) return Fail(kRavelSafeMalformed, "loop runs past its parent's end", at);
  return true;
}

// Entries of `fixed` bytes whose last two hold a 12-bit descriptor loop length.
bool RavelCSectionWalk::Entries(int start, int end, int fixed) {
  int at = start;
  while (at < end) {
    if (at + fixed > end) return Fail(kRavelSafeMalformed, "loop entry cut by its loop's end", at);
    int loopEnd = at + fixed + RavelRead12(pBytes + at + fixed - 2);
    if (loopEnd > end) return Fail(kRavelSafeMalformed, "loop entry runs past its loop's end", at);
    if (!Descriptors(at + fixed, loopEnd)) return false;
    at = loopEnd;
  }
  return true;
}

// program_info_length, descriptors, then streams of 5 bytes with their descriptors.
bool RavelCSectionWalk::PMT(const unsigned char* section, int size, RavelSafeRefusal& refusal) {
  RavelCSectionWalk walk(section, 0, refusal);
  int infoEnd = 0;
  return walk.Shorter(size, 16, "PMT shorter than its fixed fields") && walk.Loop12(10, size - kCrcSize, infoEnd) &&
         walk.Descriptors(12, infoEnd) && walk.Entries(infoEnd, size - kCrcSize, 5);
}

// Network descriptors, then transport streams of 6 bytes with their descriptors.
bool RavelCSectionWalk::NIT(const unsigned char* section, int size, RavelSafeRefusal& refusal) {
  RavelCSectionWalk walk(section, 0, refusal);
  int networkEnd = 0;
  int streamsEnd = 0;
  return walk.Shorter(size, 16, "NIT shorter than its fixed fields") && walk.Loop12(8, size - kCrcSize, networkEnd) &&
         walk.Descriptors(10, networkEnd) && walk.Loop12(networkEnd, size - kCrcSize, streamsEnd) &&
         walk.Entries(networkEnd + 2, streamsEnd, 6);
}

bool RavelCSectionWalk::SDT(const unsigned char* section, int size, RavelSafeRefusal& refusal) {
  RavelCSectionWalk walk(section, 0, refusal);
  return walk.Shorter(size, 15, "SDT shorter than its fixed fields") && walk.Entries(11, size - kCrcSize, 5);
}

bool RavelCSectionWalk::EIT(const unsigned char* section, int size, RavelSafeRefusal& refusal) {
  RavelCSectionWalk walk(section, 0, refusal);
  return walk.Shorter(size, 18, "EIT shorter than its fixed fields") && walk.Entries(14, size - kCrcSize, 12);
}

// First descriptor loop, then broadcasters of 3 bytes with their descriptors.
bool RavelCSectionWalk::BIT(const unsigned char* section, int size, RavelSafeRefusal& refusal) {
  RavelCSectionWalk walk(section, 0, refusal);
  int firstEnd = 0;
  return walk.Shorter(size, 14, "BIT shorter than its fixed fields") && walk.Loop12(8, size - kCrcSize, firstEnd) &&
         walk.Descriptors(10, firstEnd) && walk.Entries(firstEnd, size - kCrcSize, 3);
}

bool RavelCSectionWalk::TDT(const unsigned char* section, int size, RavelSafeRefusal& refusal) {
  RavelCSectionWalk walk(section, 0, refusal);
  return walk.Shorter(size, 8, "TDT shorter than its date and time");
}

bool RavelCSectionWalk::TOT(const unsigned char* section, int size, RavelSafeRefusal& refusal) {
  RavelCSectionWalk walk(section, 0, refusal);
  int loopEnd = 0;
  return walk.Shorter(size, 14, "TOT shorter than its fixed fields") && walk.Loop12(8, size - kCrcSize, loopEnd) &&
         walk.Descriptors(10, loopEnd);
}

// The AIT reads both 12-bit lengths from bytes 8 to 11 and then starts the
// application loop after the common descriptors; that reading is checked.
bool RavelCSectionWalk::AIT(const unsigned char* section, int size, RavelSafeRefusal& refusal) {
  RavelCSectionWalk walk(section, 0, refusal);
  if (!walk.Shorter(size, 16, "AIT shorter than its fixed fields")) return false;
  const int crc = size - kCrcSize;
  int commonEnd = 12 + RavelRead12(section + 8);
  if (commonEnd > crc) return walk.Fail(kRavelSafeMalformed, "common descriptors run past the section", 8);
  int applicationsEnd = commonEnd + RavelRead12(section + 10);
  if (applicationsEnd > crc) return walk.Fail(kRavelSafeMalformed, "application loop runs past the section", 10);
  return walk.Entries(commonEnd, applicationsEnd, 9);
}

bool RavelCSectionWalk::StreamEvents(const unsigned char* section, int size, RavelSafeRefusal& refusal) {
  RavelCSectionWalk walk(section, 0, refusal);
  return walk.Shorter(size, 12, "stream descriptor section shorter than its header") &&
         walk.Descriptors(8, size - kCrcSize);
}

bool RavelCSectionWalk::Carousel(const unsigned char* section, int size, RavelSafeRefusal& refusal) {
  RavelCSectionWalk walk(section, 0, refusal);
  const int regionEnd = size - kCrcSize;
  if (regionEnd - kCarouselHeaderSize < kMessageHeaderSize) {
    return walk.Fail(kRavelSafeTooShort, "DSM-CC message shorter than its header", kCarouselHeaderSize);
  }
  const unsigned char* message = section + kCarouselHeaderSize;
  int end = kMessageHeaderSize + RavelRead16(message + 10);
  if (kCarouselHeaderSize + end > regionEnd) {
    return walk.Fail(kRavelSafeLengthMismatch, "DSM-CC message runs past the section", kCarouselHeaderSize + 10);
  }
  return Message(message, end, RavelRead16(message + 2), kCarouselHeaderSize, refusal);
}

bool RavelCSectionWalk::Message(const unsigned char* message, int end, unsigned short messageId, int base,
                                RavelSafeRefusal& refusal) {
  RavelCSectionWalk walk(message, base, refusal);
  return walk.MessageParts(end, messageId);
}

// ISO/IEC 13818-6 7.2 and 7.3: the parts each message class reads.
bool RavelCSectionWalk::MessageParts(int end, unsigned short messageId) {
  const int body = kMessageHeaderSize + pBytes[9];  // after the adaptation header
  if (body > end) return Fail(kRavelSafeOutsideMessage, "DSM-CC adaptation runs past the message", 9);
  switch (messageId) {
    case RAVEL_DSMCC_MSG_DSI: {
      // serverId 20 | compatibilityDescriptorLength 16 | privateDataLength 16 | privateData
      if (body + 24 > end) return Fail(kRavelSafeOutsideMessage, "DSI shorter than its fixed fields", body);
      if (body + 24 + RavelRead16(pBytes + body + 22) > end) {
        return Fail(kRavelSafeOutsideMessage, "DSI private data runs past the message", body + 22);
      }
      return true;
    }
    case RAVEL_DSMCC_MSG_DII: {
      // download parameters 16 | compatibilityDescriptorLength 16 | descriptor |
      // numberOfModules 16 | records | privateDataLength 16 | privateData
      if (body + 18 > end) return Fail(kRavelSafeOutsideMessage, "DII shorter than its fixed fields", body);
      int at = body + 16 + RavelRead16(pBytes + body + 16);
      if (at + 4 > end) {
        return Fail(kRavelSafeOutsideMessage, "DII compatibility descriptor runs past the message", body + 16);
      }
      unsigned int numberOfModules = RavelRead16(pBytes + at + 2);
      at += 4;
      for (unsigned int i = 0; i < numberOfModules; ++i) {
        if (at + 8 > end) return Fail(kRavelSafeOutsideMessage, "DII module record cut by the message end", at);
        at += 8 + pBytes[at + 7];  // moduleInfoLength
        if (at > end) return Fail(kRavelSafeOutsideMessage, "DII module info runs past the message", at);
      }
      if (at + 2 > end) return Fail(kRavelSafeOutsideMessage, "DII private data length cut", at);
      if (at + 2 + RavelRead16(pBytes + at) > end) {
        return Fail(kRavelSafeOutsideMessage, "DII private data runs past the message", at);
      }
      return true;
    }
    case RAVEL_DSMCC_MSG_DDB:
      // moduleId 16 | moduleVersion 8 | reserved 8 | blockNumber 16 | block to the end
      if (body + 6 > end) return Fail(kRavelSafeOutsideMessage, "DDB shorter than its fixed fields", body);
      return true;
    default:
      return Fail(kRavelSafeUnknownTable, "no class for this DSM-CC message id", 2);
  }
}

bool RavelCSectionWalk::Visit(Function walk, const unsigned char* section, int size,
                              RavelCSafeSection::DescriptorVisit visit, void* context, RavelSafeRefusal& refusal) {
  const DescriptorVisitor outer = tVisitor;
  tVisitor.pVisit = visit;
  tVisitor.pContext = context;
  const bool walked = walk(section, size, refusal);
  tVisitor = outer;
  return walked;
}
