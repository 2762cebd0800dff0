// What a receiver does with a section when it first arrives.
#include "Capture.h"
#include "Ravel_CDsmccDDB.h"
#include "Ravel_CDsmccDII.h"
#include "Ravel_CDsmccDSI.h"
#include "Ravel_CTablePAT.h"
#include "Ravel_CTablePMT.h"

namespace ravel_dump {
namespace {

// The PAT names the PMT PIDs (the one-segment one included) and the network PID.
void FollowPat(int pid, RavelCPAT& pat, Demux* demux) {
  if (demux == nullptr || pid != 0x0000) return;
  for (int i = 0; i < pat.aProgramList.iCount; ++i) demux->AddSectionPid(pat.aProgramList.ipArray[i]->iPID, PidRole::kPmt);
  if (pat.iNetworkPID != 0xFFFF) demux->AddSectionPid(pat.iNetworkPID, PidRole::kNit);
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
void ListModules(int pid, RavelCDsmccDII& dii, const unsigned char* message, std::size_t messageSize,
                 CarouselCollector& carousel) {
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
}

// A DSI's private data is the IOR of the object carousel's service gateway.
void NameServiceGateway(int pid, const RavelCDsmccDSI& dsi, const unsigned char* message, std::size_t messageSize,
                        CarouselCollector& carousel) {
  if (dsi.pPrivateData == nullptr || dsi.iPrivateDataLength <= 0) return;
  const std::size_t offset = static_cast<std::size_t>(dsi.pPrivateData - message);
  const std::size_t length = static_cast<std::size_t>(dsi.iPrivateDataLength);
  if (offset > messageSize || messageSize - offset < length) return;  // declared past the message
  carousel.AddServiceGateway(pid, std::vector<uint8_t>(dsi.pPrivateData, dsi.pPrivateData + length));
}

// The DSM-CC message of a carousel section: the section less its 8-byte header
// and its CRC_32.
const unsigned char* Message(const RavelCSafeSection& parsed) { return parsed.GetData() + 8; }
std::size_t MessageSize(const RavelCSafeSection& parsed) {
  return parsed.GetDataSize() >= 12 ? static_cast<std::size_t>(parsed.GetDataSize() - 12) : 0;
}

// A DDB carries one block of a module; its header's transaction id is the downloadId.
void KeepBlock(int pid, RavelCDsmccDDB& ddb, CarouselCollector& carousel) {
  carousel.AddBlock(pid, ddb.iTransactionId, ddb.iModuleId, ddb.iModuleVersion, ddb.iBlockNumber, ddb.pBlockData,
                    ddb.pBlockData != nullptr && ddb.iBlockDataLen > 0 ? static_cast<std::size_t>(ddb.iBlockDataLen) : 0);
}

}  // namespace

// The table of tables made the object of the kind's class.
void UseOnArrival(int pid, TableKind kind, RavelCSafeSection& parsed, Demux* demux, CarouselCollector& carousel) {
  switch (kind) {
    case kRavelKindPAT:
      FollowPat(pid, static_cast<RavelCPAT&>(*parsed.GetTable()), demux);
      break;
    case kRavelKindPMT:
      FollowPmt(static_cast<RavelCPMT&>(*parsed.GetTable()), demux);
      break;
    case kRavelKindDSI:
      NameServiceGateway(pid, static_cast<RavelCDsmccDSI&>(*parsed.GetMessage()), Message(parsed), MessageSize(parsed),
                         carousel);
      break;
    case kRavelKindDII:
      ListModules(pid, static_cast<RavelCDsmccDII&>(*parsed.GetMessage()), Message(parsed), MessageSize(parsed),
                  carousel);
      break;
    case kRavelKindDDB:
      KeepBlock(pid, static_cast<RavelCDsmccDDB&>(*parsed.GetMessage()), carousel);
      break;
    default:
      break;
  }
}

}  // namespace ravel_dump
