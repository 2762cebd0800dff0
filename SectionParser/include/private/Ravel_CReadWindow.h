// The memory a parse may read.
//
// A section handed out by the section store owns at least table_id to the end
// of its declared section_length (3 + section_length bytes), whatever its
// iSectionSize says; bytes the packets did not supply are zero. Every parse of a
// section reads inside that window: a read beyond it gives zero, a copy beyond it
// is completed with zeros, and a loop that would carry the parse past it stops
// there. A section that tells the truth about its lengths never reaches the end
// of its window, so nothing a receiver observes of it changes.
//
// The window belongs to the parse in progress on the calling thread. A table
// (or a DSM-CC message, 8 bytes into its section) opens it for the length of its
// ParseRawData; the records and descriptors parsed inside read through it. A
// parse called on bytes outside any open window (a caller's own buffer handed
// straight to ParseRawData) is not bounded: it trusts the lengths in the data.
//
// Only pointers into the parsed bytes go through the window; a parse reading its
// own members reads them directly.
#ifndef RAVEL_CREADWINDOW_H
#define RAVEL_CREADWINDOW_H

#include "Ravel_CBitInputStream.h"

class RavelCReadWindow {
 public:
  // Opens the window of the section starting at `section`:
  // [section, section + 3 + section_length). Inside an open window that holds
  // `section`, the nearer of the two ends is kept. A null section opens nothing.
  explicit RavelCReadWindow(const unsigned char* section);
  // Opens [begin, end) for bytes without a section header of their own (a
  // DSM-CC message held alone), with the same rule inside an open window.
  RavelCReadWindow(const unsigned char* begin, const unsigned char* end);
  // The window of a DSM-CC message: `message` lies 8 bytes into its section,
  // whose header gives the end. Null (no window of its own: the open one
  // applies) when an open window holds the message but not those 8 bytes.
  static const unsigned char* SectionOfMessage(const unsigned char* message);
  // Closes this window; the one it was opened in applies again.
  ~RavelCReadWindow();

  // Bytes a section buffer must own so that the window of its parse lies
  // inside it: `size`, or 3 + section_length when that is more. `size` bytes of
  // `section` are read (only the first three).
  static int OwnedSize(const unsigned char* section, int size);

  // Bytes readable from `at` up to `wanted`: all of them without an open window,
  // none when `at` lies outside the open one.
  static int Readable(const unsigned char* at, int wanted);
  // True when an open window does not hold the byte at `at`: where a loop
  // over the parsed bytes stops.
  static bool Unreadable(const unsigned char* at);
  // A bit reader over `length` bytes from `at`, cut at the window's end.
  static RavelCBitInputStream Reader(const unsigned char* at, int length);
  // The nearer of `end` and the open window's end (for the end of a loop).
  static const unsigned char* Clamp(const unsigned char* at, const unsigned char* end);
  // Field reads: zero beyond the window, big-endian like RavelRead16 and co.
  static unsigned char Read8(const unsigned char* at);
  static unsigned short Read16(const unsigned char* at);
  static unsigned short Read12(const unsigned char* at);
  static unsigned int Read24(const unsigned char* at);
  static unsigned int Read32(const unsigned char* at);
  // Copies `count` bytes; what lies beyond the window is written as zero.
  static void Copy(unsigned char* destination, const unsigned char* source, int count);

 private:
  RavelCReadWindow(const RavelCReadWindow&);
  RavelCReadWindow& operator=(const RavelCReadWindow&);
  void Open(const unsigned char* begin, const unsigned char* end);

  const unsigned char* pOuterBegin;
  const unsigned char* pOuterEnd;
};

#endif
