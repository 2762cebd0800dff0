#include "Ravel_CReadWindow.h"

#include <string.h>

#include "Ravel_ByteOrder.h"

namespace {

// The window of the parse in progress on this thread; no window while begin is null.
thread_local const unsigned char* tWindowBegin = 0;
thread_local const unsigned char* tWindowEnd = 0;

// Whether a window is open and holds the byte at `at`.
bool WindowHolds(const unsigned char* at) { return tWindowBegin != 0 && at >= tWindowBegin && at < tWindowEnd; }

const int kSectionHeaderBytes = 3;        // table_id to section_length
const int kDsmccMessageOffset = 8;        // a DSM-CC message follows the long section header

}  // namespace

RavelCReadWindow::RavelCReadWindow(const unsigned char* section) : pOuterBegin(tWindowBegin), pOuterEnd(tWindowEnd) {
  if (section == 0) return;
  // section_length itself is read through the outer window, if there is one.
  Open(section, section + kSectionHeaderBytes + (Read12(section + 1)));
}

RavelCReadWindow::RavelCReadWindow(const unsigned char* begin, const unsigned char* end)
    : pOuterBegin(tWindowBegin), pOuterEnd(tWindowEnd) {
  if (begin == 0) return;
  Open(begin, end);
}

void RavelCReadWindow::Open(const unsigned char* begin, const unsigned char* end) {
  if (WindowHolds(begin) && end > tWindowEnd) end = tWindowEnd;
  tWindowBegin = begin;
  tWindowEnd = end;
}

RavelCReadWindow::~RavelCReadWindow() {
  tWindowBegin = pOuterBegin;
  tWindowEnd = pOuterEnd;
}

const unsigned char* RavelCReadWindow::SectionOfMessage(const unsigned char* message) {
  if (message == 0) return 0;
  const bool heldAlone = WindowHolds(message) && message - tWindowBegin < kDsmccMessageOffset;
  return heldAlone ? 0 : message - kDsmccMessageOffset;
}

int RavelCReadWindow::OwnedSize(const unsigned char* section, int size) {
  if (section == 0 || size < kSectionHeaderBytes) return size;
  const int declared = RavelSectionSize(section);
  return declared > size ? declared : size;
}

int RavelCReadWindow::Readable(const unsigned char* at, int wanted) {
  if (wanted <= 0) return 0;
  if (tWindowBegin == 0) return wanted;
  if (!WindowHolds(at)) return 0;
  const long left = static_cast<long>(tWindowEnd - at);
  return left < wanted ? static_cast<int>(left) : wanted;
}

bool RavelCReadWindow::Unreadable(const unsigned char* at) { return tWindowBegin != 0 && !WindowHolds(at); }

RavelCBitInputStream RavelCReadWindow::Reader(const unsigned char* at, int length) {
  return RavelCBitInputStream(at, static_cast<unsigned int>(Readable(at, length)), 0);
}

const unsigned char* RavelCReadWindow::Clamp(const unsigned char* at, const unsigned char* end) {
  if (tWindowBegin == 0) return end;
  if (!WindowHolds(at)) return at;  // nothing of it is readable
  return end > tWindowEnd ? tWindowEnd : end;
}

unsigned char RavelCReadWindow::Read8(const unsigned char* at) { return Unreadable(at) ? 0 : at[0]; }

unsigned short RavelCReadWindow::Read16(const unsigned char* at) {
  if (Readable(at, 2) == 2) return RavelRead16(at);
  return static_cast<unsigned short>((Read8(at) << 8) | Read8(at + 1));
}

unsigned short RavelCReadWindow::Read12(const unsigned char* at) {
  return static_cast<unsigned short>(Read16(at) & 0x0FFF);
}

unsigned int RavelCReadWindow::Read24(const unsigned char* at) {
  if (Readable(at, 3) == 3) return RavelRead24(at);
  return (static_cast<unsigned int>(Read8(at)) << 16) | (static_cast<unsigned int>(Read8(at + 1)) << 8) | Read8(at + 2);
}

unsigned int RavelCReadWindow::Read32(const unsigned char* at) {
  if (Readable(at, 4) == 4) return RavelRead32(at);
  return (static_cast<unsigned int>(Read16(at)) << 16) | Read16(at + 2);
}

void RavelCReadWindow::Copy(unsigned char* destination, const unsigned char* source, int count) {
  if (destination == 0 || count <= 0) return;
  const int readable = Readable(source, count);
  if (readable > 0) memcpy(destination, source, static_cast<size_t>(readable));
  if (readable < count) memset(destination + readable, 0, static_cast<size_t>(count - readable));
}
