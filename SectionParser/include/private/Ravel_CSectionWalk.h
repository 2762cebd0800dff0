// The structure walk of a section before any parse operation sees it. The parse
// operations trust every length they read; here each declared end (a loop, a
// loop entry, a descriptor, a DSM-CC message and its parts) is checked against
// its parent's end, the way the parse operations walk them. A walk that finds an
// overrun fills the refusal with the check that failed and the byte offset of the
// length that declared it.
#ifndef RAVEL_CSECTIONWALK_H
#define RAVEL_CSECTIONWALK_H

#include "Ravel_CSafeSection.h"

class RavelCSectionWalk {
 public:
  // One walk per section layout; `size` is the declared section, 3 + section_length.
  typedef bool (*Function)(const unsigned char* section, int size, RavelSafeRefusal& refusal);

  static bool PMT(const unsigned char* section, int size, RavelSafeRefusal& refusal);
  static bool NIT(const unsigned char* section, int size, RavelSafeRefusal& refusal);
  static bool SDT(const unsigned char* section, int size, RavelSafeRefusal& refusal);
  static bool EIT(const unsigned char* section, int size, RavelSafeRefusal& refusal);
  static bool BIT(const unsigned char* section, int size, RavelSafeRefusal& refusal);
  static bool TDT(const unsigned char* section, int size, RavelSafeRefusal& refusal);
  static bool TOT(const unsigned char* section, int size, RavelSafeRefusal& refusal);
  static bool AIT(const unsigned char* section, int size, RavelSafeRefusal& refusal);
  static bool StreamEvents(const unsigned char* section, int size, RavelSafeRefusal& refusal);
  // A carousel section: its DSM-CC message from byte 8 to the CRC_32 (or checksum).
  static bool Carousel(const unsigned char* section, int size, RavelSafeRefusal& refusal);

  // A DSM-CC message of `end` bytes (12 + messageLength), read as the class of
  // `messageId`; offsets are given from `base` bytes before the message.
  static bool Message(const unsigned char* message, int end, unsigned short messageId, int base,
                      RavelSafeRefusal& refusal);

  // Runs `walk` over the section, telling `visit` of each descriptor it passes.
  static bool Visit(Function walk, const unsigned char* section, int size, RavelCSafeSection::DescriptorVisit visit,
                    void* context, RavelSafeRefusal& refusal);

 private:
  RavelCSectionWalk(const unsigned char* bytes, int base, RavelSafeRefusal& refusal);

  bool Fail(RavelSafeResult result, const char* check, int at);
  bool Descriptors(int start, int end);
  bool Loop12(int at, int limit, int& loopEnd);
  bool Entries(int start, int end, int fixed);
  bool Shorter(int size, int fixed, const char* check);
  bool MessageParts(int end, unsigned short messageId);

  const unsigned char* pBytes;
  int iBase;  // added to every offset reported
  RavelSafeRefusal& rRefusal;
};

#endif
