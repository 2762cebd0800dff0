// The section assembler of one PID. By default the library's
// RavelCSectionAssembler, which hands out every section whole; with
// --receiver the receivers' RavelCTSPktStore, whose sections closed by the
// size of the one before them are counted (as length mismatches) instead of
// being handed on.
#ifndef RAVEL_DUMP_PIDASSEMBLER_H
#define RAVEL_DUMP_PIDASSEMBLER_H

#include <cstdint>
#include <memory>

#include "Stats.h"

class RavelCSectionAssembler;
class RavelCTSPktStore;

namespace ravel_dump {

class SectionSink;

class PidAssembler {
 public:
  PidAssembler(int pid, bool receiversStore, Stats& stats, SectionSink& sink);
  ~PidAssembler();
  PidAssembler(const PidAssembler&) = delete;
  PidAssembler& operator=(const PidAssembler&) = delete;

  // One 188-byte packet of the PID starting with its sync byte.
  void Add(const uint8_t* packet);
  // The input has ended: a section still in progress is counted as cut.
  void End();

 private:
  static void OnWholeSection(void* context, unsigned char* section, int size);
  void AddToStore(const uint8_t* packet);
  void Deliver(const uint8_t* section, int size);

  int pid_;
  Stats& stats_;
  SectionSink& sink_;
  std::unique_ptr<RavelCSectionAssembler> assembler_;
  std::unique_ptr<RavelCTSPktStore> store_;
  // The packet handed to the store, with a zeroed margin behind it: the store
  // may look a few bytes past a short payload.
  alignas(16) uint8_t scratch_[188 + 64];
};

}  // namespace ravel_dump

#endif
