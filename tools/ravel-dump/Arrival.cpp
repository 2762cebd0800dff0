// What a receiver does with a section when it first arrives.
#include "Capture.h"
#include "LibraryTables.h"
#include "ParseBuffer.h"
#include "Ravel_CDsmccDDB.h"
#include "Ravel_CDsmccDII.h"
#include "Ravel_CDsmccDSI.h"
#include "Ravel_CTablePAT.h"
#include "Ravel_CTablePMT.h"

namespace ravel_dump {
namespace {

// The PAT names the PMT PIDs (the one-segment one included) and the network PID.
int FollowPat(int pid, RavelCPAT& pat, Demux* demux) {
  if (demux == nullptr || pid != 0x0000) return 0;
  for (int i = 0; i < pat.aProgramList.iCount; ++i) demux->AddSectionPid(pat.aProgramList.ipArray[i]->iPID, PidRole::kPmt);
  if (pat.iNetworkPID != 0xFFFF) demux->AddSectionPid(pat.iNetworkPID, PidRole::kNit);
  return 0;
}

// A PMT names the PIDs of its streams; those that carry sections are read:
// the AIT (private sections, stream_type 0x05), DSM-CC carousels (0x0B, 0x0D)
// and stream descriptors (0x0C) (ISO/IEC 13818-1 table 2-34, ABNT NBR 15606-3).
void FollowPmt(RavelCPMT& pmt, Demux* demux) {
  if (demux == nullptr) return;
  for (int i = 0; i < pmt.aMapInfoList.iCount; ++i) {
    const RavelCMapInfo* stream = pmt.aMapInfoList.ipArray[i];
    switch (stream->iStreamType) {
      case 0x05:
        demux->AddSectionPid(stream->iElementaryPID, PidRole::kAit);
        break;
      case 0x0B:
      case 0x0D:
        demux->AddSectionPid(stream->iElementaryPID, PidRole::kCarousel);
        break;
      case 0x0C:
        demux->AddSectionPid(stream->iElementaryPID, PidRole::kStreamEvents);
        break;
      default:
        break;
    }
  }
}

// The DII lists the modules of a download with their sizes and versions.
int ListModules(int pid, unsigned char* message, std::size_t messageSize, CarouselCollector& carousel) {
  RavelCDsmccDII dii(nullptr);
  int result = dii.ParseRawData(message);
  if (result != 0) return result;
  // The library keeps the ARIB compression descriptor only; the object
  // carousel's one sits deeper in the module info, read here from the bytes.
  std::vector<ModuleCompression> compressions = DiiModuleCompressions(message, messageSize);
  std::vector<ModuleListing> modules;
  for (int i = 0; i < dii.cModuleInfos.iCount; ++i) {
    const RavelCModuleInfo* info = dii.cModuleInfos.ipArray[i];
    ModuleListing module;
    module.id = info->iModuleId;
    module.size = info->iModuleSize;
    module.version = info->iModuleVersion;
    if (info->pNameDescriptor != nullptr) module.name = info->pNameDescriptor->GetFileName();
    if (static_cast<std::size_t>(i) < compressions.size()) module.compression = compressions[static_cast<std::size_t>(i)];
    modules.push_back(module);
  }
  carousel.AddModuleList(pid, dii.iDownloadId, dii.iBlockSize, modules);
  return 0;
}

// A DSI's private data is the IOR of the object carousel's service gateway.
int NameServiceGateway(int pid, unsigned char* message, std::size_t messageSize, CarouselCollector& carousel) {
  RavelCDsmccDSI dsi(nullptr);
  int result = dsi.ParseRawData(message);
  if (result != 0 || dsi.pPrivateData == nullptr || dsi.iPrivateDataLength <= 0) return result;
  const std::size_t offset = static_cast<std::size_t>(dsi.pPrivateData - message);
  const std::size_t length = static_cast<std::size_t>(dsi.iPrivateDataLength);
  if (offset > messageSize || messageSize - offset < length) return result;  // declared past the message
  carousel.AddServiceGateway(pid, std::vector<uint8_t>(dsi.pPrivateData, dsi.pPrivateData + length));
  return result;
}

// A DDB carries one block of a module; its header's transaction id is the downloadId.
int KeepBlock(int pid, unsigned char* message, CarouselCollector& carousel) {
  RavelCDsmccDDB ddb(nullptr);
  int result = ddb.ParseRawData(message);
  if (result != 0) return result;
  carousel.AddBlock(pid, ddb.iTransactionId, ddb.iModuleId, ddb.iModuleVersion, ddb.iBlockNumber, ddb.pBlockData,
                    ddb.pBlockData != nullptr && ddb.iBlockDataLen > 0 ? static_cast<std::size_t>(ddb.iBlockDataLen) : 0);
  return 0;
}

}  // namespace

int ParseOnArrival(int pid, TableKind kind, const uint8_t* section, std::size_t size, Demux* demux,
                   CarouselCollector& carousel) {
  ParseBuffer buffer(section, size);
  if (kind == TableKind::kPat) {
    RavelCPAT pat(nullptr);
    int result = pat.ParseRawData(buffer.Section());
    if (result == 0) FollowPat(pid, pat, demux);
    return result;
  }
  if (kind == TableKind::kPmt) {
    RavelCPMT pmt(nullptr);
    int result = pmt.ParseRawData(buffer.Section());
    if (result == 0) FollowPmt(pmt, demux);
    return result;
  }
  // The DSM-CC message: the section less its 8-byte header and its CRC.
  const std::size_t messageSize = size >= 12 ? size - 12 : 0;
  if (kind == TableKind::kDsi && buffer.Message() != nullptr) {
    return NameServiceGateway(pid, buffer.Message(), messageSize, carousel);
  }
  if (kind == TableKind::kDii) return ListModules(pid, buffer.Message(), messageSize, carousel);
  if (kind == TableKind::kDdb) return KeepBlock(pid, buffer.Message(), carousel);
  std::unique_ptr<TableObject> object = MakeTableObject(kind);
  return object ? object->Parse(buffer.Section()) : 0;
}

}  // namespace ravel_dump
