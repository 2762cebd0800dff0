#include "Ravel_CDsmccDII.h"

#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"
#include "Ravel_DescriptorSlot.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDsmccDII");

// ---------------------------------------------------------------------------
// RavelCModuleInfo

RavelCModuleInfo::RavelCModuleInfo(unsigned char* record) {
  ParseRawData(record);
}

RavelCModuleInfo::RavelCModuleInfo(RavelCModuleInfo& other) {
  *this = other;
}

RavelCModuleInfo& RavelCModuleInfo::operator=(RavelCModuleInfo& other) {
  if (this == &other) return *this;
  iModuleId = other.iModuleId;
  iModuleSize = other.iModuleSize;
  iModuleVersion = other.iModuleVersion;
  iModuleInfoLength = other.iModuleInfoLength;
  RavelDescriptorSlot_CopyFrom(pTypeDescriptor, other.pTypeDescriptor);
  RavelDescriptorSlot_CopyFrom(pNameDescriptor, other.pNameDescriptor);
  RavelDescriptorSlot_CopyFrom(pInfoDescriptor, other.pInfoDescriptor);
  RavelDescriptorSlot_CopyFrom(pModuleLinkDescriptor, other.pModuleLinkDescriptor);
  RavelDescriptorSlot_CopyFrom(pCRC32Descriptor, other.pCRC32Descriptor);
  RavelDescriptorSlot_CopyFrom(pEstDownloadTimeDescriptor, other.pEstDownloadTimeDescriptor);
  RavelDescriptorSlot_CopyFrom(pCompressionTypeDescriptor, other.pCompressionTypeDescriptor);
  return *this;
}

RavelCModuleInfo::~RavelCModuleInfo() { DeleteDescriptors(); }

void RavelCModuleInfo::DeleteDescriptors() {
  RavelDescriptorSlot_Release(pTypeDescriptor);
  RavelDescriptorSlot_Release(pNameDescriptor);
  RavelDescriptorSlot_Release(pInfoDescriptor);
  RavelDescriptorSlot_Release(pModuleLinkDescriptor);
  RavelDescriptorSlot_Release(pCRC32Descriptor);
  RavelDescriptorSlot_Release(pEstDownloadTimeDescriptor);
  RavelDescriptorSlot_Release(pCompressionTypeDescriptor);
}

int RavelCModuleInfo::ParseRawData(unsigned char* record) {
  DeleteDescriptors();
  if (record == 0) {
    RAVEL_TRACE(RAVEL_CAROUSEL_ERROR, "Module Info Parsing Error. Input Data is NULL!\n");
    iModuleId = 0;
    iModuleSize = 0;
    iModuleVersion = 0;
    iModuleInfoLength = 0;
    return kRavelErrInvalidArgument;
  }
  iModuleId = RavelCReadWindow::Read16(record);
  iModuleSize = RavelCReadWindow::Read32(record + 2);
  iModuleVersion = RavelCReadWindow::Read8(record + 6);
  iModuleInfoLength = RavelCReadWindow::Read8(record + 7);
  if (iModuleInfoLength == 0) return kRavelOk;

  // The descriptor lengths are trusted; the walk stops once past the record,
  // or at the end of the section it is read from.
  unsigned char* at = record + 8;
  const unsigned char* end = RavelCReadWindow::Clamp(at, at + iModuleInfoLength);
  do {
    if (RavelCReadWindow::Unreadable(at)) break;
    unsigned char tag = at[0];
    switch (tag) {
      case 0x01:
        RavelDescriptorSlot_Replace(pTypeDescriptor, at);
        break;
      case 0x02:
        RavelDescriptorSlot_Replace(pNameDescriptor, at);
        break;
      case 0x03:
        RavelDescriptorSlot_Replace(pInfoDescriptor, at);
        break;
      case 0x04:
        RavelDescriptorSlot_Replace(pModuleLinkDescriptor, at);
        break;
      case 0x05:
        RavelDescriptorSlot_Replace(pCRC32Descriptor, at);
        break;
      case 0x07:
        RavelDescriptorSlot_Replace(pEstDownloadTimeDescriptor, at);
        break;
      case 0xC2:
        RavelDescriptorSlot_Replace(pCompressionTypeDescriptor, at);
        break;
      default:  // the location descriptor (0x06) included
        RAVEL_TRACE(RAVEL_PARSER_WARNING, "DSMCC DII: Module Info Parsing! Unknown Tag=[0x%02x]\n", tag);
        break;
    }
    at += RavelCReadWindow::Read8(at + 1) + 2;
  } while (at < end);
  return kRavelOk;
}

void RavelCModuleInfo::Show() {
  RAVEL_TRACE(RAVEL_CAROUSEL_DUMP,
              "\tModule Info: moduleId=[0x%04x], moduleSize=[%d], moduleVersion=[0x%02x], moduleInfoLength=[%d]\n",
              iModuleId, static_cast<int>(iModuleSize), iModuleVersion, iModuleInfoLength);
  if (pTypeDescriptor != 0) pTypeDescriptor->Show();
  if (pNameDescriptor != 0) pNameDescriptor->Show();
  if (pInfoDescriptor != 0) pInfoDescriptor->Show();
  if (pModuleLinkDescriptor != 0) pModuleLinkDescriptor->Show();
  if (pCRC32Descriptor != 0) pCRC32Descriptor->Show();
  if (pEstDownloadTimeDescriptor != 0) pEstDownloadTimeDescriptor->Show();
  if (pCompressionTypeDescriptor != 0) pCompressionTypeDescriptor->Show();
}

// ---------------------------------------------------------------------------
// RavelCDsmccDII

RavelCDsmccDII::RavelCDsmccDII(unsigned char* data) : RavelCDsmccBase(0), cModuleInfos() {
  ClearDownloadParameters();
  ParseRawData(data);
}

RavelCDsmccDII::RavelCDsmccDII(RavelCDsmccDII& other) : RavelCDsmccBase(0), cModuleInfos() {
  ClearDownloadParameters();
  *this = other;
}

RavelCDsmccDII& RavelCDsmccDII::operator=(RavelCDsmccDII& other) {
  if (this == &other) return *this;
  cModuleInfos.RemoveAll();
  RavelCDsmccBase::operator=(other);  // the message header, member for member
  iDownloadId = other.iDownloadId;
  iBlockSize = other.iBlockSize;
  iWindowSize = other.iWindowSize;
  iAckPeriod = other.iAckPeriod;
  iTCDownloadWindow = other.iTCDownloadWindow;
  iTCDownloadScenario = other.iTCDownloadScenario;
  for (int i = 0; i < other.cModuleInfos.iCount; ++i) {
    cModuleInfos.Append(new RavelCModuleInfo(*other.cModuleInfos.ipArray[i]));
  }
  return *this;
}

RavelCDsmccDII::~RavelCDsmccDII() {}

void RavelCDsmccDII::ClearDownloadParameters() {
  iDownloadId = 0;
  iBlockSize = 0;
  iWindowSize = 0;
  iAckPeriod = 0;
  iTCDownloadWindow = 0;
  iTCDownloadScenario = 0;
}

int RavelCDsmccDII::ParseRawData(unsigned char* data) {
  RavelCReadWindow window(RavelCReadWindow::SectionOfMessage(data));
  cModuleInfos.RemoveAll();
  RavelCDsmccBase::ParseRawData(data);
  if (data == 0) {
    ClearDownloadParameters();
    return kRavelErrInvalidArgument;
  }
  unsigned char* body = data + 12 + iAdaptationLength;
  iDownloadId = RavelCReadWindow::Read32(body);
  iBlockSize = RavelCReadWindow::Read16(body + 4);
  iWindowSize = RavelCReadWindow::Read8(body + 6);
  iAckPeriod = RavelCReadWindow::Read8(body + 7);
  iTCDownloadWindow = RavelCReadWindow::Read32(body + 8);
  iTCDownloadScenario = RavelCReadWindow::Read32(body + 12);

  // The compatibility descriptor is skipped by its length.
  unsigned char* compatibilityEnd = body + 16 + RavelCReadWindow::Read16(body + 16);
  unsigned short numberOfModules = RavelCReadWindow::Read16(compatibilityEnd + 2);
  unsigned char* record = compatibilityEnd + 4;
  for (unsigned short i = 0; i < numberOfModules; ++i) {
    // A count that would carry the loop past the section stops at its end.
    if (RavelCReadWindow::Unreadable(record)) break;
    RavelCModuleInfo* module = new RavelCModuleInfo(record);
    cModuleInfos.Append(module);
    record += 8 + module->iModuleInfoLength;
  }

  // Nothing of the private data is kept; its descriptors are only reported.
  unsigned short privateDataLength = RavelCReadWindow::Read16(record);
  if (privateDataLength != 0) {
    const unsigned char* at = record + 2;
    const unsigned char* end = RavelCReadWindow::Clamp(at, at + privateDataLength);
    while (at < end) {
      RAVEL_TRACE(RAVEL_PARSER_WARNING, "DSMCC DII: Unsupported Descriptor. Tag=[0x%02x]\n", at[0]);
      at += RavelCReadWindow::Read8(at + 1) + 2;
    }
  }
  return kRavelOk;
}

void RavelCDsmccDII::Show() {
  RavelCDsmccBase::Show();
  RAVEL_TRACE(RAVEL_CAROUSEL_DUMP, "downloadId=[0x%08x], blockSize=[%d], windowSize=[%d], ackPeriod=[%d]\n",
              iDownloadId, iBlockSize, iWindowSize, iAckPeriod);
  RAVEL_TRACE(RAVEL_CAROUSEL_DUMP, "tCDownloadWindow=[0x%08x], tCDownloadScenario=[0x%08x], numOfMOdules=[%d]\n",
              iTCDownloadWindow, iTCDownloadScenario, cModuleInfos.iCount);
  for (int i = 0; i < cModuleInfos.iCount; ++i) cModuleInfos.ipArray[i]->Show();
}

RavelCModuleInfo* RavelCDsmccDII::GetModuleInfo(int index) {
  if (index < 0 || index >= cModuleInfos.iCount) {
    RAVEL_TRACE(RAVEL_CAROUSEL_ERROR, "GetModuleInfo: Invalid Array Index=[%d], Module Info Len=[%d]\n", index,
                cModuleInfos.iCount);
    return 0;
  }
  return cModuleInfos.ipArray[index];
}

RavelCModuleInfo* RavelCDsmccDII::GetModuleInfoByID(unsigned short moduleId) {
  for (int i = 0; i < cModuleInfos.iCount; ++i) {
    if (cModuleInfos.ipArray[i]->iModuleId == moduleId) return cModuleInfos.ipArray[i];
  }
  return 0;
}
