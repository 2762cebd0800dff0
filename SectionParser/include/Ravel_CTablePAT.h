// Program association table (table_id 0x00, ISO/IEC 13818-1 2.4.4.3), after the
// long section header (table id extension = transport_stream_id):
//   { program_number 16 | reserved 3 | network_PID or program_map_PID 13 } ... | CRC_32
// program_number 0 gives the network PID; every other entry is a program.
#ifndef RAVEL_CTABLEPAT_H
#define RAVEL_CTABLEPAT_H

#include "Ravel_CArray.h"
#include "Ravel_CTableBase.h"

// One program of the PAT loop.
class RavelCPMTInfo {
 public:
  explicit RavelCPMTInfo(unsigned char* entry);
  virtual ~RavelCPMTInfo();

  // Reads one 4-byte entry; null clears both members and gives -8.
  virtual int ParseRawData(unsigned char* entry);
  virtual void Show();

  unsigned short GetProgramNumber() const { return iProgramNumber; }
  unsigned short GetPID() const { return iPID; }

  unsigned short iProgramNumber = 0;
  unsigned short iPID = 0;  // program_map_PID, 13 bits
};

class RavelCPAT : public RavelCTableBase {
 public:
  explicit RavelCPAT(unsigned char* section);
  RavelCPAT(RavelCPAT& other);
  RavelCPAT& operator=(RavelCPAT& other);
  virtual ~RavelCPAT();

  virtual int ParseRawData(unsigned char* section);
  virtual void Show();

  int GetProgramCount() const { return aProgramList.iCount; }
  // The program at `index` of the list (bounds-checked by the array).
  RavelCPMTInfo* GetPMTInfo(int index) { return aProgramList[index]; }
  unsigned short GetNetworkPID() const { return iNetworkPID; }

  // Ascending program_number, except that the first program whose PMT PID is a
  // one-segment PMT PID (0x1FC8..0x1FCF) comes last. Owned.
  RavelCArray<RavelCPMTInfo*> aProgramList;
  // From the program_number 0 entry; 0xFFFF until one has been seen.
  unsigned short iNetworkPID;

 private:
  void DeletePrograms();
  void InsertInProgramOrder(RavelCPMTInfo* program);
};

// Whether `pid` is a one-segment PMT PID (0x1FC8..0x1FCF).
bool RavelPAT_IsOneSegPMTPID(unsigned short pid);

#endif
