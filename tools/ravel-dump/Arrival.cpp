// What a receiver does with a section when it first arrives.
#include "Capture.h"
#include "Ravel_CDsmccDDB.h"
#include "Ravel_CDsmccDII.h"
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
void ListModules(int pid, RavelCDsmccDII& dii, CarouselCollector& carousel) {
  std::vector<ModuleListing> modules;
  for (int i = 0; i < dii.cModuleInfos.iCount; ++i) {
    const RavelCModuleInfo* info = dii.cModuleInfos.ipArray[i];
    ModuleListing module;
    module.id = info->iModuleId;
    module.size = info->iModuleSize;
    module.version = info->iModuleVersion;
    if (info->pNameDescriptor != nullptr) module.name = info->pNameDescriptor->GetFileName();
    modules.push_back(module);
  }
  carousel.AddModuleList(pid, dii.iDownloadId, dii.iBlockSize, modules);
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
    case kRavelKindDII:
      ListModules(pid, static_cast<RavelCDsmccDII&>(*parsed.GetMessage()), carousel);
      break;
    case kRavelKindDDB:
      KeepBlock(pid, static_cast<RavelCDsmccDDB&>(*parsed.GetMessage()), carousel);
      break;
    default:
      break;
  }
}

}  // namespace ravel_dump
