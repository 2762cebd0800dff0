// DownloadDataBlock, ISO/IEC 13818-6 7.3.7, after the download data header:
//   moduleId 16 | moduleVersion 8 | reserved 8 | blockNumber 16
//   blockDataByte: messageLength - adaptationLength - 6 bytes, at most 4096
// The block is copied, so the object outlives the section it came from. The
// comparisons order blocks of one module version by block number.
#ifndef RAVEL_CDSMCCDDB_H
#define RAVEL_CDSMCCDDB_H

#include "Ravel_CDsmccMsgBase.h"

// The longest block accepted.
#define RAVEL_DSMCC_MAX_BLOCK_LENGTH 4096

class RavelCDsmccDDB : public RavelCDsmccBase {
 public:
  explicit RavelCDsmccDDB(unsigned char* data);
  RavelCDsmccDDB(const RavelCDsmccDDB& other);
  RavelCDsmccDDB& operator=(const RavelCDsmccDDB& other);
  virtual ~RavelCDsmccDDB();

  // 0; -8 for null data; -24 for a block longer than 4096 bytes (no block kept).
  virtual int ParseRawData(unsigned char* data);
  virtual void Show();

  // Same module, version and block.
  int operator==(const RavelCDsmccDDB& other) const;
  // By block number within one module and version. Blocks of different modules
  // or versions are traced and compare false every way.
  int operator>(const RavelCDsmccDDB& other) const;
  int operator>=(const RavelCDsmccDDB& other) const;
  int operator<(const RavelCDsmccDDB& other) const;
  int operator<=(const RavelCDsmccDDB& other) const;

  unsigned short GetModuleId() const { return iModuleId; }
  unsigned char GetModuleVersion() const { return iModuleVersion; }
  unsigned short GetBlockNumber() const { return iBlockNumber; }
  // The copied block bytes, or null when none are held.
  const unsigned char* GetBlockData() const { return pBlockData; }
  int GetBlockDataLen() const { return iBlockDataLen; }

  unsigned short iModuleId = 0;
  unsigned char iModuleVersion = 0;
  unsigned short iBlockNumber = 0;
  unsigned char* pBlockData = 0;  // malloc'ed, iBlockDataLen bytes
  int iBlockDataLen = 0;

 private:
  void ReleaseBlock();
  // True when moduleId and moduleVersion match; traces the mismatch otherwise.
  bool SameModule(const RavelCDsmccDDB& other) const;
};

#endif
