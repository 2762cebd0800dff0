// Safe entry for section bytes received from the air (ISO/IEC 13818-1 2.4.4).
//
// The parse operations take no buffer length: they trust section_length and every
// length inside a section, as the receiver applications built on them expect.
// Broadcast reception is lossy and any transmitter can send any bytes, so this
// class is the edge where bytes are checked before a parse sees them:
//   - the count must hold the section the bytes declare: 3 + section_length
//     (table_id 8 | flags 4 | section_length 12 | section_length bytes);
//   - the CRC_32 must verify where the table's own parse verifies it;
//   - the declared section is copied into a buffer of its own followed by
//     kPadding zeroed bytes, and parsed there, so that every read a parse
//     operation makes stays inside memory this object owns.
// A section that fails a check gets its result and is not parsed. The class
// traces nothing itself: the trace output is what the parse operations produce.
#ifndef RAVEL_CSAFESECTION_H
#define RAVEL_CSAFESECTION_H

class RavelCTableBase;

enum RavelSafeResult {
  kRavelSafeOk = 0,
  kRavelSafeNullInput,       // no bytes, or a negative count
  kRavelSafeTooShort,        // the bytes end before the section_length field
  kRavelSafeLengthMismatch,  // the bytes end before the declared section
  kRavelSafeCrcError,        // the CRC_32 does not verify, on a table that verifies it
  kRavelSafeUnknownTable,    // no table class for this table_id
  kRavelSafeRefused          // the class's ParseRawData gave non-zero (see GetParseResult)
};

class RavelCSafeSection {
 public:
  // Zeroed bytes after the copied section. Every position a parse operation
  // computes is the section start plus fixed offsets and lengths read from the
  // section. A length field read beyond the declared end reads zero, so only
  // lengths inside the section (at most 3 + 4095 bytes) can move a read past it,
  // and by at most one 12-bit length (4095) plus a record header and a nested
  // descriptor (2 + 255) with the fixed fields of its body; loops that walk on
  // in the zeroed bytes are bounded by such a length too. The BIT's broadcaster
  // loop length is taken modulo 65536, and 64 KiB also covers any 16-bit offset
  // from inside the section.
  static const int kPadding = 65536;
  // The largest section a 12-bit section_length can declare.
  static const int kMaxSectionSize = 3 + 0x0FFF;

  RavelCSafeSection();
  ~RavelCSafeSection();

  // Checks the bytes and keeps the padded copy of the declared section
  // (GetSection); parses nothing. Bytes after the declared section are ignored.
  RavelSafeResult Load(const unsigned char* bytes, int count);
  // Load, then parse with the table class that the table_id selects. The table
  // is held by this object until the next call (GetTable, TakeTable). A refused
  // section leaves no table.
  RavelSafeResult Parse(const unsigned char* bytes, int count);
  // Load, then the caller's table parses the copy. The CRC is checked first when
  // the class that the table_id selects verifies it.
  RavelSafeResult ParseInto(const unsigned char* bytes, int count, RavelCTableBase& table);

  // What the last ParseRawData returned (0 when nothing was parsed).
  int GetParseResult() const { return iParseResult; }
  RavelCTableBase* GetTable() const { return pTable; }
  // Hands the held table to the caller, who deletes it.
  RavelCTableBase* TakeTable();
  // A deep copy of the held table through its class's copy operation, or null
  // when none is held. The caller deletes it.
  RavelCTableBase* CopyTable() const;
  // The Show() of the held table, if any.
  void Show();
  // Releases the table and the copy.
  void Clear();

  // The padded copy of the last loaded section (null when none), valid until the
  // next call or the destruction of this object, and its declared size.
  unsigned char* GetSection() const { return pBuffer; }
  int GetSectionSize() const { return iSectionSize; }

  // A short English name of a result, for tools and logs.
  static const char* GetResultText(RavelSafeResult result);
  // Whether a table class exists for this table_id, and whether it verifies the
  // CRC_32 of a section with this table_id and section_syntax_indicator.
  static bool IsKnownTable(unsigned char tableId);
  static bool ChecksCrc(unsigned char tableId, unsigned char sectionSyntaxIndicator);

 private:
  RavelCSafeSection(const RavelCSafeSection&);
  RavelCSafeSection& operator=(const RavelCSafeSection&);

  RavelSafeResult CheckAndCopy(const unsigned char* bytes, int count);

  unsigned char* pBuffer;  // iSectionSize bytes of section, then kPadding zeroed bytes
  int iSectionSize;
  int iParseResult;
  RavelCTableBase* pTable;
  int iTableRow;  // row of the table class that made pTable, -1 when none
};

#endif
