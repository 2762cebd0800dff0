#include "PidAssembler.h"

#include <cstring>

#include "Demux.h"
#include "Ravel_ByteOrder.h"
#include "Ravel_CSectionAssembler.h"
#include "Ravel_CTSPktAssembler.h"

namespace ravel_dump {

PidAssembler::PidAssembler(int pid, bool receiversStore, Stats& stats, SectionSink& sink)
    : pid_(pid), stats_(stats), sink_(sink) {
  std::memset(scratch_, 0, sizeof scratch_);
  if (receiversStore) {
    store_.reset(new RavelCTSPktStore);
  } else {
    assembler_.reset(new RavelCSectionAssembler(OnWholeSection, this));
  }
}

PidAssembler::~PidAssembler() {}

void PidAssembler::Add(const uint8_t* packet) {
  if (assembler_) {
    assembler_->AddTSPacket(packet);
  } else {
    AddToStore(packet);
  }
}

void PidAssembler::End() {
  if (!assembler_) return;
  assembler_->ClearPacketBuffer();
  stats_.sectionsCut += assembler_->iSectionsCut;
}

void PidAssembler::OnWholeSection(void* context, unsigned char* section, int size) {
  static_cast<PidAssembler*>(context)->Deliver(section, size);
}

void PidAssembler::Deliver(const uint8_t* section, int size) {
  ++stats_.sectionsAssembled;
  ++stats_.pids[pid_].sections;
  sink_.OnSection(pid_, section, static_cast<std::size_t>(size));
}

void PidAssembler::AddToStore(const uint8_t* packet) {
  std::memcpy(scratch_, packet, 188);
  // A fresh record for every call: the store appends at most two sections to it.
  RavelCSectionData out;
  store_->AddTSPacket(scratch_, out);
  for (int i = 0; i < out.iSectionCount && i < RAVEL_MAX_ASSEMBLED_SECTIONS; ++i) {
    const uint8_t* section = out.pSection[i];
    const int held = out.iSectionSize[i];
    if (section == nullptr || held < 3) {
      ++stats_.lengthMismatches;
      continue;
    }
    if (section[0] == 0xFF) continue;  // stuffing
    const int size = RavelSectionSize(section);
    if (size > held) {
      // Closed by the size of the section before it: not the whole section.
      ++stats_.sectionsAssembled;
      ++stats_.lengthMismatches;
      continue;
    }
    Deliver(section, size);
  }
}

}  // namespace ravel_dump
