// Sorts the packets of a capture by PID, the way a receiver's demultiplexer
// does: every packet's header is read (packet counts and continuity for the
// report), and only the packets of section PIDs go on, each PID to its own
// section assembler. Other packets cost a header read and nothing more: no
// allocation and no copy per packet here.
#ifndef RAVEL_DUMP_DEMUX_H
#define RAVEL_DUMP_DEMUX_H

#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

#include "Stats.h"

namespace ravel_dump {

class PidAssembler;

class SectionSink {
 public:
  virtual ~SectionSink() {}
  // A section assembled on `pid`: `size` is exactly 3 + section_length bytes.
  virtual void OnSection(int pid, const uint8_t* section, std::size_t size) = 0;
};

class Demux {
 public:
  Demux(Stats& stats, SectionSink& sink);
  ~Demux();
  Demux(const Demux&) = delete;
  Demux& operator=(const Demux&) = delete;

  // Sections are read through the receivers' RavelCTSPktStore (--receiver)
  // instead of an assembler that hands out every section whole. Before any PID is added.
  void UseReceiversStore() { receiversStore_ = true; }
  // The PIDs every receiver reads (PAT, NIT, SDT, EIT, TDT/TOT, BIT).
  void AddStandardPids();
  // Only these PIDs are read from now on, each as a section PID.
  void RestrictTo(const std::vector<int>& pids);
  // Reads `pid` as a section PID from now on (a PID the PAT or a PMT names).
  // Under a restriction, PIDs outside it stay unread.
  void AddSectionPid(int pid, PidRole role);
  bool IsSectionPid(int pid) const { return slot_[pid] >= 0; }

  // One 188-byte packet starting with its sync byte.
  void OnPacket(const uint8_t* packet);
  // The input has ended: sections still in progress are counted as cut.
  void End();

  const std::vector<PidRole>& Roles() const { return roles_; }

 private:
  // A capture of one carousel or stream-event PID has no PAT or PMT to name
  // it: the start of a DSM-CC section on an unread PID makes it a section PID
  // from that packet on. (An AIT waits for its PMT, as in a receiver.)
  void AdoptOnSectionStart(int pid, const uint8_t* packet, unsigned int control);
  // A packet of a section PID goes to its assembler when it carries a payload.
  void HandOn(PidAssembler& store, PidStats& stats, const uint8_t* packet, unsigned int control);

  Stats& stats_;
  SectionSink& sink_;
  int16_t slot_[kPidCount];   // index into stores_, -1 for a PID not read
  uint8_t lastCounter_[kPidCount];  // 0xFF before the first packet with payload
  bool restricted_;
  bool receiversStore_;
  std::vector<bool> allowed_;
  std::vector<PidRole> roles_;
  std::vector<std::unique_ptr<PidAssembler>> stores_;
};

}  // namespace ravel_dump

#endif
