#include "Demux.h"

#include <cstring>

#include "PidAssembler.h"
#include "Ravel_CSafeSection.h"

namespace ravel_dump {

Demux::Demux(Stats& stats, SectionSink& sink)
    : stats_(stats), sink_(sink), restricted_(false), receiversStore_(false), allowed_(kPidCount, true),
      roles_(kPidCount, PidRole::kNone) {
  std::memset(slot_, 0xFF, sizeof slot_);
  std::memset(lastCounter_, 0xFF, sizeof lastCounter_);
}

Demux::~Demux() {}

void Demux::AddStandardPids() {
  AddSectionPid(0x0000, PidRole::kPat);
  AddSectionPid(0x0010, PidRole::kNit);
  AddSectionPid(0x0011, PidRole::kSdt);
  AddSectionPid(0x0012, PidRole::kEit);
  AddSectionPid(0x0014, PidRole::kTime);
  AddSectionPid(0x0024, PidRole::kBit);
  // EIT of the one-segment service (ARIB STD-B10 / ABNT NBR 15603).
  AddSectionPid(0x0026, PidRole::kEit);
  AddSectionPid(0x0027, PidRole::kEit);
}

void Demux::RestrictTo(const std::vector<int>& pids) {
  restricted_ = true;
  allowed_.assign(kPidCount, false);
  for (int pid : pids) allowed_[pid] = true;
  for (int pid : pids) AddSectionPid(pid, PidRole::kRequested);
}

void Demux::AddSectionPid(int pid, PidRole role) {
  if (pid < 0 || pid >= kPidCount || pid == 0x1FFF) return;
  if (restricted_ && !allowed_[pid]) return;
  if (roles_[pid] == PidRole::kNone || roles_[pid] == PidRole::kRequested) roles_[pid] = role;
  if (slot_[pid] >= 0) return;
  slot_[pid] = static_cast<int16_t>(stores_.size());
  stores_.emplace_back(new PidAssembler(pid, receiversStore_, stats_, sink_));
}

void Demux::OnPacket(const uint8_t* packet) {
  const int pid = ((packet[1] & 0x1F) << 8) | packet[2];
  PidStats& stats = stats_.pids[pid];
  ++stats.packets;
  if (packet[1] & 0x80) {  // transport_error_indicator: the receiver drops it
    ++stats.transportErrors;
    return;
  }
  const unsigned int control = (packet[3] >> 4) & 0x03;
  if (control & 0x01) {
    // ISO/IEC 13818-1 2.4.3.3: the counter steps by one per packet with
    // payload; one repeated packet is allowed, and the adaptation field's
    // discontinuity_indicator announces a jump.
    const uint8_t counter = packet[3] & 0x0F;
    const uint8_t last = lastCounter_[pid];
    if (last != 0xFF && counter != ((last + 1) & 0x0F) && counter != last) {
      bool announced = control == 0x03 && packet[4] > 0 && (packet[5] & 0x80) != 0;
      if (!announced) ++stats.continuityBreaks;
    }
    lastCounter_[pid] = counter;
  }
  // Both hand-ons end the call, so that a packet of an unread PID costs no more
  // than its header read. Only the start of a payload unit can make an unread
  // PID a section PID.
  const int slot = slot_[pid];
  if (slot >= 0) {
    HandOn(*stores_[slot], stats, packet, control);
  } else if (!restricted_ && (packet[1] & 0x40) != 0) {
    AdoptOnSectionStart(pid, packet, control);
  }
}

void Demux::HandOn(PidAssembler& store, PidStats& stats, const uint8_t* packet, unsigned int control) {
  // Payloads the assembler cannot take: none at all, or an adaptation field
  // that leaves no payload byte (its length is at most 182 when a payload follows).
  if (control == 0x00 || (control == 0x03 && packet[4] > 182)) {
    ++stats.invalidPackets;
    return;
  }
  if (control == 0x02) return;
  store.Add(packet);
}

void Demux::End() {
  for (auto& store : stores_) store->End();
}

void Demux::AdoptOnSectionStart(int pid, const uint8_t* packet, unsigned int control) {
  // Only an unscrambled packet with a payload can start a section (OnPacket
  // has seen that it starts a payload unit).
  if ((control & 0x01) == 0 || (packet[3] & 0xC0) != 0) return;
  unsigned int at = 4;
  if (control == 0x03) at += 1u + packet[4];
  if (at >= 188) return;
  at += 1u + packet[at];  // pointer_field
  if (at + 3 > 188) return;
  // A PES packet starts 00 00 01, so its "table_id" is 0 (a PAT) and never matches.
  RavelSectionHeader header;
  const int held = static_cast<int>(188 - at);
  if (!RavelCSafeSection::ReadHeader(packet + at, held, header)) return;
  PidRole role = PidRole::kNone;
  switch (RavelCSafeSection::GetKind(packet + at, held)) {
    case kRavelKindDSI:
    case kRavelKindDII:
    case kRavelKindDDB:
    case kRavelKindDsmccOther:
      role = PidRole::kCarousel;
      break;
    case kRavelKindStreamEvents:
      role = PidRole::kStreamEvents;
      break;
    default:
      break;
  }
  if (role == PidRole::kNone || !header.bLongForm) return;
  AddSectionPid(pid, role);
  HandOn(*stores_[slot_[pid]], stats_.pids[pid], packet, control);
}

}  // namespace ravel_dump
