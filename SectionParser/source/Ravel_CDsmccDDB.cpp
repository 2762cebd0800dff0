#include "Ravel_CDsmccDDB.h"

#include <cstdlib>
#include <cstring>

#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDsmccDDB");

namespace {

// A block of `length` bytes from malloc; a length of 0 still gets a buffer.
unsigned char* CopyBlock(const unsigned char* source, int length) {
  unsigned char* block = static_cast<unsigned char*>(std::malloc(length > 0 ? static_cast<std::size_t>(length) : 1));
  if (block != 0) RavelCReadWindow::Copy(block, source, length);
  return block;
}

}  // namespace

RavelCDsmccDDB::RavelCDsmccDDB(unsigned char* data)
    : RavelCDsmccBase(0) {
  ParseRawData(data);
}

RavelCDsmccDDB::RavelCDsmccDDB(const RavelCDsmccDDB& other)
    : RavelCDsmccBase(0) {
  *this = other;
}

RavelCDsmccDDB& RavelCDsmccDDB::operator=(const RavelCDsmccDDB& other) {
  if (this == &other) return *this;
  ReleaseBlock();
  RavelCDsmccBase::operator=(other);  // the message header, member for member
  iModuleId = other.iModuleId;
  iModuleVersion = other.iModuleVersion;
  iBlockNumber = other.iBlockNumber;
  iBlockDataLen = other.iBlockDataLen;
  if (other.pBlockData != 0) pBlockData = CopyBlock(other.pBlockData, other.iBlockDataLen);
  return *this;
}

RavelCDsmccDDB::~RavelCDsmccDDB() { ReleaseBlock(); }

void RavelCDsmccDDB::ReleaseBlock() {
  std::free(pBlockData);
  pBlockData = 0;
}

int RavelCDsmccDDB::ParseRawData(unsigned char* data) {
  RavelCReadWindow window(RavelCReadWindow::SectionOfMessage(data));
  ReleaseBlock();
  RavelCDsmccBase::ParseRawData(data);
  if (data == 0) {
    iModuleId = 0;
    iModuleVersion = 0;
    iBlockNumber = 0;
    iBlockDataLen = 0;
    return kRavelErrInvalidArgument;
  }
  const unsigned char* body = data + 12 + iAdaptationLength;
  iModuleId = RavelCReadWindow::Read16(body);
  iModuleVersion = RavelCReadWindow::Read8(body + 2);
  // body[3] is reserved.
  iBlockNumber = RavelCReadWindow::Read16(body + 4);
  iBlockDataLen = iMessageLength - iAdaptationLength - 6;
  if (iBlockDataLen > RAVEL_DSMCC_MAX_BLOCK_LENGTH) {
    RAVEL_TRACE(RAVEL_CAROUSEL_ERROR, "Invalid Block Data Length=[%d]\n", iBlockDataLen);
    iBlockDataLen = 0;
    return kRavelErrCorruptSection;
  }
  // A messageLength too short for the 6 header bytes leaves a negative length:
  // then no block is copied (the length is kept as computed).
  if (iBlockDataLen >= 0) pBlockData = CopyBlock(body + 6, iBlockDataLen);
  return kRavelOk;
}

void RavelCDsmccDDB::Show() {
  RavelCDsmccBase::Show();
  RAVEL_TRACE(RAVEL_CAROUSEL_DUMP, "moduleId=[0x%04x], moduleVersion=[0x%02x], blockNumber=[%d], blockDataLen=[%d]\n",
              iModuleId, iModuleVersion, iBlockNumber, iBlockDataLen);
}

int RavelCDsmccDDB::operator==(const RavelCDsmccDDB& other) const {
  return iModuleId == other.iModuleId && iModuleVersion == other.iModuleVersion && iBlockNumber == other.iBlockNumber;
}

bool RavelCDsmccDDB::SameModule(const RavelCDsmccDDB& other) const {
  if (iModuleId == other.iModuleId && iModuleVersion == other.iModuleVersion) return true;
  RAVEL_TRACE(RAVEL_CAROUSEL_WARNING,
              "Two Messages are totally different! This module id, version=[%d, %d], Compared One=[%d, %d]\n",
              iModuleId, iModuleVersion, other.iModuleId, other.iModuleVersion);
  return false;
}

int RavelCDsmccDDB::operator>(const RavelCDsmccDDB& other) const {
  return SameModule(other) && iBlockNumber > other.iBlockNumber;
}

int RavelCDsmccDDB::operator>=(const RavelCDsmccDDB& other) const {
  return SameModule(other) && iBlockNumber >= other.iBlockNumber;
}

int RavelCDsmccDDB::operator<(const RavelCDsmccDDB& other) const {
  return SameModule(other) && iBlockNumber < other.iBlockNumber;
}

int RavelCDsmccDDB::operator<=(const RavelCDsmccDDB& other) const {
  return SameModule(other) && iBlockNumber <= other.iBlockNumber;
}
