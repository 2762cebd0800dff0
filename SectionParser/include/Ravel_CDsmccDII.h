// DownloadInfoIndication, ISO/IEC 13818-6 7.3.2, after the message header
// (offsets from the start of the body, 12 + adaptationLength into the message):
//   0 downloadId 32 | 4 blockSize 16 | 6 windowSize 8 | 7 ackPeriod 8
//   8 tCDownloadWindow 32 | 12 tCDownloadScenario 32
//   16 compatibilityDescriptorLength 16 | compatibilityDescriptor (skipped)
//   numberOfModules 16 | module records | privateDataLength 16 | privateData
// Module record (RavelCModuleInfo):
//   moduleId 16 | moduleSize 32 | moduleVersion 8 | moduleInfoLength 8 | descriptors
// The module info descriptors are those of ARIB STD-B24 Vol. 3 / ABNT NBR
// 15606-3: type, name, info, module link, CRC32, estimated download time and
// compression type are kept; any other is traced and skipped.
#ifndef RAVEL_CDSMCCDII_H
#define RAVEL_CDSMCCDII_H

#include "Ravel_CArray.h"
#include "Ravel_CDescriptorCRC32.h"
#include "Ravel_CDescriptorCompressionType.h"
#include "Ravel_CDescriptorEstDownloadTime.h"
#include "Ravel_CDescriptorInfo.h"
#include "Ravel_CDescriptorModuleLink.h"
#include "Ravel_CDescriptorName.h"
#include "Ravel_CDescriptorType.h"
#include "Ravel_CDsmccMsgBase.h"

class RavelCModuleInfo {
 public:
  explicit RavelCModuleInfo(unsigned char* record);
  RavelCModuleInfo(RavelCModuleInfo& other);
  RavelCModuleInfo& operator=(RavelCModuleInfo& other);
  virtual ~RavelCModuleInfo();

  // 0, or -8 with a trace for a null record.
  virtual int ParseRawData(unsigned char* record);
  virtual void Show();

  unsigned short GetModuleId() const { return iModuleId; }
  // Size of the module as carried in the DDB blocks.
  unsigned int GetModuleSize() const { return iModuleSize; }
  unsigned char GetModuleVersion() const { return iModuleVersion; }
  unsigned char GetModuleInfoLength() const { return iModuleInfoLength; }
  // The descriptors of the record, null when it has none of that kind.
  RavelCTypeDescriptor* GetTypeDescriptor() const { return pTypeDescriptor; }
  RavelCNameDescriptor* GetNameDescriptor() const { return pNameDescriptor; }
  RavelCInfoDescriptor* GetInfoDescriptor() const { return pInfoDescriptor; }
  RavelCModuleLinkDescriptor* GetModuleLinkDescriptor() const { return pModuleLinkDescriptor; }
  RavelCCRC32Descriptor* GetCRC32Descriptor() const { return pCRC32Descriptor; }
  RavelCEstDownloadTimeDescriptor* GetEstDownloadTimeDescriptor() const { return pEstDownloadTimeDescriptor; }
  RavelCCompressionTypeDescriptor* GetCompressionTypeDescriptor() const { return pCompressionTypeDescriptor; }

  unsigned short iModuleId = 0;
  unsigned int iModuleSize = 0;
  unsigned char iModuleVersion = 0;
  unsigned char iModuleInfoLength = 0;
  RavelCTypeDescriptor* pTypeDescriptor = 0;
  RavelCNameDescriptor* pNameDescriptor = 0;
  RavelCInfoDescriptor* pInfoDescriptor = 0;
  RavelCModuleLinkDescriptor* pModuleLinkDescriptor = 0;
  RavelCCRC32Descriptor* pCRC32Descriptor = 0;
  RavelCEstDownloadTimeDescriptor* pEstDownloadTimeDescriptor = 0;
  RavelCCompressionTypeDescriptor* pCompressionTypeDescriptor = 0;

 private:
  void DeleteDescriptors();
};

class RavelCDsmccDII : public RavelCDsmccBase {
 public:
  explicit RavelCDsmccDII(unsigned char* data);
  RavelCDsmccDII(RavelCDsmccDII& other);
  RavelCDsmccDII& operator=(RavelCDsmccDII& other);
  virtual ~RavelCDsmccDII();

  // 0, or -8 for null data.
  virtual int ParseRawData(unsigned char* data);
  virtual void Show();

  unsigned int GetDownloadId() const { return iDownloadId; }
  unsigned short GetBlockSize() const { return iBlockSize; }
  unsigned char GetWindowSize() const { return iWindowSize; }
  unsigned char GetAckPeriod() const { return iAckPeriod; }
  unsigned int GetTCDownloadWindow() const { return iTCDownloadWindow; }
  unsigned int GetTCDownloadScenario() const { return iTCDownloadScenario; }

  int GetNumberOfModules() const { return cModuleInfos.iCount; }
  // The record at `index` in message order, or null after a trace when out of range.
  RavelCModuleInfo* GetModuleInfo(int index);
  // The first record with that module id, or null.
  RavelCModuleInfo* GetModuleInfoByID(unsigned short moduleId);

  unsigned int iDownloadId;
  unsigned short iBlockSize;
  unsigned char iWindowSize;
  unsigned char iAckPeriod;
  unsigned int iTCDownloadWindow;
  unsigned int iTCDownloadScenario;
  RavelCPointerArray<RavelCModuleInfo> cModuleInfos;  // owns its records

 private:
  void ClearDownloadParameters();
};

#endif
