// Safe entry for section and DSM-CC message bytes received from the air
// (ISO/IEC 13818-1 2.4.4, ISO/IEC 13818-6 7.2 and 7.3), and the library's one
// table of tables: for every table_id (and DSM-CC message id) the kind of table,
// the class that parses it (if any), whether that class verifies the CRC_32, the
// structure walk of its loops and descriptors, and how its objects are made,
// copied and joined (operator+=).
//
// The parse operations take no buffer length: they trust section_length,
// messageLength and every length inside, as the receiver applications built on
// them expect. Broadcast reception is lossy and any transmitter can send any
// bytes, so this class is the edge where bytes are checked before a parse sees
// them:
//   - the count must hold the section the bytes declare, 3 + section_length
//     (table_id 8 | flags 4 | section_length 12 | section_length bytes), or the
//     message, 12 + messageLength;
//   - the CRC_32 must verify on every section that carries one (section_syntax_indicator
//     set, and the TOT), whether or not the class's own parse verifies it;
//   - the structure walk of the table_id's layout: each loop, loop entry and
//     descriptor ends inside its parent; a DSM-CC message ends before its
//     section's CRC_32 and the parts its class reads lie inside it.
// Bytes that fail a check get their result and a refusal (which check, at which
// byte) and are not parsed. Accepted bytes are copied into a buffer of this object
// of the declared size and parsed there. The class traces nothing itself: the
// trace output is what the parse operations produce.
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
  kRavelSafeCrcError,         // the CRC_32 of a section that carries one does not verify
  kRavelSafeOutsideMessage,   // a part of a DSM-CC message lies outside the message
  kRavelSafeUnknownTable,     // no class for this table_id or DSM-CC message id
  kRavelSafeRefused,          // the class's ParseRawData gave non-zero (see GetParseResult)
  kRavelSafeMalformed         // a loop, loop entry or descriptor runs past its parent
};

// Why bytes were refused: the result, the check that failed (a short English
// text, null when none failed) and the byte offset from the start of the bytes
// handed in of the field it failed on (-1 when none).
struct RavelSafeRefusal {
  RavelSafeResult eResult;
  const char* pCheck;
  int iOffset;
};

// The kinds of table the table of tables tells apart.
enum RavelTableKind {
  kRavelKindPAT,
  kRavelKindCAT,
  kRavelKindPMT,
  kRavelKindNIT,
  kRavelKindSDT,
  kRavelKindEITPresentFollowing,
  kRavelKindEITSchedule,
  kRavelKindTDT,
  kRavelKindTOT,
  kRavelKindBIT,
  kRavelKindAIT,
  kRavelKindDSI,
  kRavelKindDII,
  kRavelKindDDB,
  kRavelKindDsmccOther,     // a carousel section whose message has no class
  kRavelKindStreamEvents,   // DSM-CC stream descriptor sections (0x3D)
  kRavelKindOther,          // a table_id the table of tables does not list
  kRavelKindCount
};

// The header fields that tell tables and their sections apart. The fields after
// bLongForm are zero for a short section.
struct RavelSectionHeader {
  unsigned char iTableId;
  bool bLongForm;  // section_syntax_indicator
  unsigned short iTableIdExtension;
  unsigned char iVersionNumber;
  unsigned char iSectionNumber;
  unsigned char iLastSectionNumber;
  // What else tells apart tables of one table_id and extension: the EIT's
  // transport_stream_id and original_network_id, the SDT's original_network_id.
  unsigned int iStreamIds;
  // The EIT's segment_last_section_number; the section_number for other tables.
  unsigned char iSegmentLastSectionNumber;
};

class RavelCSafeSection {
 public:
  // The largest section a 12-bit section_length can declare.
  static const int kMaxSectionSize = 3 + 0x0FFF;

  RavelCSafeSection();
  ~RavelCSafeSection();

  // Checks a section (length, CRC_32, structure walk) and keeps its copy
  // (GetData); parses nothing. Bytes after the declared section are ignored.
  RavelSafeResult Load(const unsigned char* bytes, int count);
  // Checks a section and parses it with the class that its table_id selects; in
  // a DSM-CC carousel section (0x3B, 0x3C) the message that follows the 8-byte
  // header is checked and parsed with the class of its message id. The object
  // is held until the next call (GetTable or GetMessage, Take...). Nothing is
  // held after a refusal.
  RavelSafeResult Parse(const unsigned char* bytes, int count);
  // Checks a section, then the caller's table parses the copy.
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

  // The copy of the last section or message that passed the length checks (null
  // when none), valid until the next call or the destruction of this object, and
  // its declared size. The buffer is kept from call to call and grows only for a
  // larger section; the bytes after the declared size read zero.
  unsigned char* GetData() const { return iDataSize > 0 ? pBuffer : 0; }
  int GetDataSize() const { return iDataSize; }

  // Why the last call refused its bytes (eResult kRavelSafeOk when it did not).
  const RavelSafeRefusal& GetRefusal() const { return cRefusal; }

  // A short English name of a result, for tools and logs.
  static const char* GetResultText(RavelSafeResult result);

  // The table of tables.
  // The kind of the section of `count` bytes at `section`: by table_id, and for
  // a carousel section by the message id of its DSM-CC message.
  static RavelTableKind GetKind(const unsigned char* section, int count);
  // "PAT", "EIT p/f", "EIT schedule", "DII", "stream descriptors", "other" ...
  static const char* GetKindName(RavelTableKind kind);
  // Whether a class exists for this table_id. The EIT schedule actual sections
  // 0x51 to 0x5F have none (the EIT class refuses them): they are walked and
  // refused with kRavelSafeUnknownTable.
  static bool IsKnownTable(unsigned char tableId);
  // Whether the class verifies the CRC_32 of a section with this table_id and
  // section_syntax_indicator in its own parse.
  static bool ChecksCrc(unsigned char tableId, unsigned char sectionSyntaxIndicator);
  // Whether the section ends with a CRC_32 (checked by Load and Parse): every
  // section with section_syntax_indicator 1, and the TOT.
  static bool CarriesCrc(const unsigned char* section);
  // Whether the sections of one table of this table_id make one table (joined
  // with the class's operator+=), rather than each standing alone.
  static bool JoinsSections(unsigned char tableId);
  // Whether the table describes another transport stream than the one it
  // arrives on (NIT, SDT and EIT "other").
  static bool DescribesOtherStream(unsigned char tableId);
  // Whether the table's sections come in segments of eight (the EIT).
  static bool IsSegmented(unsigned char tableId);
  // Reads the header of a section of `count` bytes; false when it is too short
  // for its header (3 bytes, 8 for a long section).
  static bool ReadHeader(const unsigned char* section, int count, RavelSectionHeader& header);
  // table += other with the class's operator+=; false (nothing joined) when the
  // table_ids have no join or not the same class.
  static bool Join(RavelCTableBase& table, RavelCTableBase& other);
  // A deep copy through the class's copy operation, owned by the caller.
  static RavelCTableBase* Copy(RavelCTableBase& table);
  // The checks of a DSM-CC message of `count` bytes, by its message id:
  // kRavelSafeOk, or the result of the first check that fails.
  static RavelSafeResult CheckMessage(const unsigned char* message, int count);
  // Told of a descriptor: its offset in the section, its tag and its length.
  typedef void (*DescriptorVisit)(int offset, unsigned char tag, unsigned char length, void* context);
  // Walks the descriptor loops of the section of `count` bytes the way its
  // table's parse reads them, telling `visit` of each descriptor in that order.
  // False when the table_id has no walk, the bytes end before the section or the
  // walk refuses it; the descriptors before the refusal have been told.
  static bool EachDescriptor(const unsigned char* section, int count, DescriptorVisit visit, void* context);

 private:
  RavelCSafeSection(const RavelCSafeSection&);
  RavelCSafeSection& operator=(const RavelCSafeSection&);

  void Reset();
  RavelSafeResult Refuse(RavelSafeResult result, const char* check, int offset);
  void Keep(const unsigned char* bytes, int size);
  RavelSafeResult ParseMessageAt(unsigned char* message);
  RavelSafeResult ParseMessageInto(const unsigned char* bytes, int count, unsigned short messageId,
                                   RavelCDsmccBase& message);
  RavelSafeResult ParseHeld(int row);
  template <class T>
  RavelSafeResult ParseTimeTable(T*& held);
  template <class T>
  RavelSafeResult ParseCallers(const unsigned char* bytes, int count, T& table);

  unsigned char* pBuffer = 0;  // iCapacity bytes, the first iDataSize the checked bytes
  int iCapacity = 0;
  int iDataSize = 0;
  RavelSafeRefusal cRefusal;
  int iParseResult = 0;
  RavelCTableBase* pTable = 0;
  RavelCTDT* pTDT = 0;
  RavelCTOT* pTOT = 0;
  RavelCDsmccBase* pMessage = 0;
  int iRow;  // row of the class that made pTable or pMessage, -1 when none
};

#endif
