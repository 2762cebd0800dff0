// Safe entry for section and DSM-CC message bytes received from the air
// (ISO/IEC 13818-1 2.4.4, ISO/IEC 13818-6 7.2 and 7.3).
//
// The parse operations take no buffer length: they trust section_length,
// messageLength and every length inside, as the receiver applications built on
// them expect. Broadcast reception is lossy and any transmitter can send any
// bytes, so this class is the edge where bytes are checked before a parse sees
// them:
//   - the count must hold the section the bytes declare, 3 + section_length
//     (table_id 8 | flags 4 | section_length 12 | section_length bytes), or the
//     message, 12 + messageLength;
//   - the CRC_32 must verify where the table's own parse verifies it;
//   - a DSM-CC message must end before the section's CRC_32, and its parts must
//     lie inside it: the DSI's server id and private data, the DII's download
//     parameters, compatibility descriptor, every module record and the private
//     data, the DDB's block header;
//   - the declared section or message is copied into a buffer of its own followed
//     by kPadding zeroed bytes and parsed there, so that every read a parse
//     operation makes stays inside memory this object owns.
// Bytes that fail a check get their result and are not parsed. The class traces
// nothing itself: the trace output is what the parse operations produce.
#ifndef RAVEL_CSAFESECTION_H
#define RAVEL_CSAFESECTION_H

class RavelCTableBase;
class RavelCTDT;
class RavelCTOT;
class RavelCDsmccBase;
class RavelCDsmccDSI;
class RavelCDsmccDII;
class RavelCDsmccDDB;

enum RavelSafeResult {
  kRavelSafeOk = 0,
  kRavelSafeNullInput,        // no bytes, or a negative count
  kRavelSafeTooShort,         // the bytes end before the length field (section_length,
                              // or the 12-byte message header)
  kRavelSafeLengthMismatch,   // the bytes end before the declared section or message,
                              // or a message does not end before its section's CRC_32
  kRavelSafeCrcError,         // the CRC_32 does not verify, on a table that verifies it
  kRavelSafeOutsideMessage,   // a part of a DSM-CC message lies outside the message
  kRavelSafeUnknownTable,     // no class for this table_id or DSM-CC message id
  kRavelSafeRefused           // the class's ParseRawData gave non-zero (see GetParseResult)
};

class RavelCSafeSection {
 public:
  // Zeroed bytes after the copied section or message. Every position a parse
  // operation computes is the start plus fixed offsets and lengths read from the
  // data. A length read beyond the declared end reads zero, so only lengths
  // inside the data can move a read past it: for a section (at most 3 + 4095
  // bytes) by one 12-bit length (4095) plus a record header and a nested
  // descriptor (2 + 255) with the fixed fields of its body, and loops that walk
  // on in the zeroed bytes are bounded by such a length too. The BIT's
  // broadcaster loop length is taken modulo 65536; 64 KiB also covers any 16-bit
  // offset from inside the data. The 16-bit lengths and counts of the DSM-CC
  // messages are checked against the message before a parse.
  static const int kPadding = 65536;
  // The largest section a 12-bit section_length can declare.
  static const int kMaxSectionSize = 3 + 0x0FFF;

  RavelCSafeSection();
  ~RavelCSafeSection();

  // Checks a section and keeps its padded copy (GetData); parses nothing. Bytes
  // after the declared section are ignored.
  RavelSafeResult Load(const unsigned char* bytes, int count);
  // Checks a section and parses it with the class that its table_id selects; in
  // a DSM-CC carousel section (0x3B, 0x3C) the message that follows the 8-byte
  // header is checked and parsed with the class of its message id. The object
  // is held until the next call (GetTable or GetMessage, Take...). Nothing is
  // held after a refusal.
  RavelSafeResult Parse(const unsigned char* bytes, int count);
  // Checks a section, then the caller's table parses the copy. The CRC is checked
  // first when the class that the table_id selects verifies it.
  RavelSafeResult ParseInto(const unsigned char* bytes, int count, RavelCTableBase& table);
  RavelSafeResult ParseInto(const unsigned char* bytes, int count, RavelCTDT& table);
  RavelSafeResult ParseInto(const unsigned char* bytes, int count, RavelCTOT& table);

  // The same for a DSM-CC message alone: `bytes` starts at its message header.
  RavelSafeResult LoadMessage(const unsigned char* bytes, int count);
  RavelSafeResult ParseMessage(const unsigned char* bytes, int count);
  // Into the caller's object: the parts of that class's message are checked,
  // whatever the message id says.
  RavelSafeResult ParseMessageInto(const unsigned char* bytes, int count, RavelCDsmccDSI& message);
  RavelSafeResult ParseMessageInto(const unsigned char* bytes, int count, RavelCDsmccDII& message);
  RavelSafeResult ParseMessageInto(const unsigned char* bytes, int count, RavelCDsmccDDB& message);

  // What the last ParseRawData returned (0 when nothing was parsed).
  int GetParseResult() const { return iParseResult; }
  // The object held, or null: a table, one of the time tables (which have a
  // header of their own), or a DSM-CC message. One at most is held.
  RavelCTableBase* GetTable() const { return pTable; }
  RavelCTDT* GetTDT() const { return pTDT; }
  RavelCTOT* GetTOT() const { return pTOT; }
  RavelCDsmccBase* GetMessage() const { return pMessage; }
  // Hand the held object to the caller, who deletes it. A DSI's private data
  // points into this object's copy (GetData) and lives only as long as it.
  RavelCTableBase* TakeTable();
  RavelCTDT* TakeTDT();
  RavelCTOT* TakeTOT();
  RavelCDsmccBase* TakeMessage();
  // A deep copy of the held object through its class's copy operation, owned by
  // the caller; null when none is held or the class has no copy (the TDT, the
  // DSI).
  RavelCTableBase* CopyTable() const;
  RavelCTOT* CopyTOT() const;
  RavelCDsmccBase* CopyMessage() const;
  // The Show() of the held object, if any.
  void Show();
  // Releases the held object.
  void Clear();

  // The padded copy of the last section or message that passed the length checks
  // (null when none), valid until the next call or the destruction of this
  // object, and its declared size.
  unsigned char* GetData() const { return pBuffer; }
  int GetDataSize() const { return iDataSize; }

  // A short English name of a result, for tools and logs.
  static const char* GetResultText(RavelSafeResult result);
  // Whether a class exists for this table_id, and whether that class verifies
  // the CRC_32 of a section with this table_id and section_syntax_indicator.
  static bool IsKnownTable(unsigned char tableId);
  static bool ChecksCrc(unsigned char tableId, unsigned char sectionSyntaxIndicator);
  // The checks of a DSM-CC message of `count` bytes, by its message id:
  // kRavelSafeOk, or the result of the first check that fails.
  static RavelSafeResult CheckMessage(const unsigned char* message, int count);

 private:
  RavelCSafeSection(const RavelCSafeSection&);
  RavelCSafeSection& operator=(const RavelCSafeSection&);

  void Reset();
  void CopyPadded(const unsigned char* bytes, int size);
  RavelSafeResult ParseMessageAt(unsigned char* message, int count);
  RavelSafeResult ParseMessageInto(const unsigned char* bytes, int count, unsigned short messageId,
                                   RavelCDsmccBase& message);
  template <class T>
  RavelSafeResult ParseTimeTable(T*& held);
  template <class T>
  RavelSafeResult ParseCallers(const unsigned char* bytes, int count, T& table);

  unsigned char* pBuffer;  // iDataSize bytes, then kPadding zeroed bytes
  int iDataSize;
  int iParseResult;
  RavelCTableBase* pTable;
  RavelCTDT* pTDT;
  RavelCTOT* pTOT;
  RavelCDsmccBase* pMessage;
  int iRow;  // row of the class that made pTable or pMessage, -1 when none
};

#endif
