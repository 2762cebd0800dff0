// What a receiver does with a section when it first arrives.
#include "Capture.h"
#include "LibraryTables.h"
#include "ParseBuffer.h"
#include "RavelSectionParser.h"

namespace ravel_dump {
namespace {

// The PAT names the PMT PIDs (the one-segment one included) and the network PID.
int FollowPat(int pid, RavelCPAT& pat, Demux* demux) {
  if (demux == nullptr || pid != 0x0000) return 0;
  for (int i = 0; i < pat.aProgramList.iCount; ++i) demux->AddSectionPid(pat.aProgramList.ipArray[i]->iPID, PidRole::kPmt);
  if (pat.iNetworkPID != 0xFFFF) demux->AddSectionPid(pat.iNetworkPID, PidRole::kNit);
  return 0;
}

}  // namespace

int ParseOnArrival(int pid, TableKind kind, const uint8_t* section, std::size_t size, Demux* demux,
                   CarouselCollector& carousel) {
  (void)carousel;
  ParseBuffer buffer(section, size);
  if (kind == TableKind::kPat) {
    RavelCPAT pat(nullptr);
    int result = pat.ParseRawData(buffer.Section());
    if (result == 0) FollowPat(pid, pat, demux);
    return result;
  }
  std::unique_ptr<TableObject> object = MakeTableObject(kind);
  return object ? object->Parse(buffer.Section()) : 0;
}

}  // namespace ravel_dump
