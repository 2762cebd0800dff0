// The reference a section parser is measured against: the same job as
// `ravel-dump --summary` written on libdvbpsi. It reads a TS file with the
// reading loop of ts-bare-loop, attaches a PAT decoder on PID 0, a PMT decoder
// on each PMT PID the PAT names, and subtable demultiplexers with NIT (PID
// 0x10), SDT (0x11), EIT (0x12) and TDT/TOT (0x14) decoders, and counts the
// tables the decoders deliver.
#include <cstdint>
#include <cstdio>

extern "C" {
#include <dvbpsi/dvbpsi.h>
#include <dvbpsi/demux.h>
#include <dvbpsi/descriptor.h>
#include <dvbpsi/eit.h>
#include <dvbpsi/nit.h>
#include <dvbpsi/pat.h>
#include <dvbpsi/pmt.h>
#include <dvbpsi/psi.h>
#include <dvbpsi/sdt.h>
#include <dvbpsi/tot.h>
}

#include "TsFileReader.h"

namespace {

const unsigned int kPidCount = 8192;
const uint16_t kNitPid = 0x10, kSdtPid = 0x11, kEitPid = 0x12, kTotPid = 0x14;

struct Counts {
  unsigned long long pat = 0, pmt = 0, nit = 0, sdt = 0, eit = 0, tot = 0;
};

struct Harness {
  dvbpsi_t* handle[kPidCount] = {};
  bool isDemux[kPidCount] = {};
  bool isPmt[kPidCount] = {};
  Counts counts;
};

Harness gHarness;

void Quiet(dvbpsi_t*, const dvbpsi_msg_level_t, const char*) {}

void OnPMT(void* data, dvbpsi_pmt_t* pmt) {
  ++static_cast<Harness*>(data)->counts.pmt;
  dvbpsi_pmt_delete(pmt);
}
void OnNIT(void* data, dvbpsi_nit_t* nit) {
  ++static_cast<Harness*>(data)->counts.nit;
  dvbpsi_nit_delete(nit);
}
void OnSDT(void* data, dvbpsi_sdt_t* sdt) {
  ++static_cast<Harness*>(data)->counts.sdt;
  dvbpsi_sdt_delete(sdt);
}
void OnEIT(void* data, dvbpsi_eit_t* eit) {
  ++static_cast<Harness*>(data)->counts.eit;
  dvbpsi_eit_delete(eit);
}
void OnTOT(void* data, dvbpsi_tot_t* tot) {
  ++static_cast<Harness*>(data)->counts.tot;
  dvbpsi_tot_delete(tot);
}

// A subtable seen for the first time on a demultiplexed PID.
void OnNewSubtable(dvbpsi_t* handle, uint8_t tableId, uint16_t extension, void* data) {
  if (tableId == 0x40 || tableId == 0x41) {
    dvbpsi_nit_attach(handle, tableId, extension, OnNIT, data);
  } else if (tableId == 0x42 || tableId == 0x46) {
    dvbpsi_sdt_attach(handle, tableId, extension, OnSDT, data);
  } else if (tableId >= 0x4E && tableId <= 0x6F) {
    dvbpsi_eit_attach(handle, tableId, extension, OnEIT, data);
  } else if (tableId == 0x70 || tableId == 0x73) {
    dvbpsi_tot_attach(handle, tableId, extension, OnTOT, data);
  }
}

void OnPAT(void* data, dvbpsi_pat_t* pat) {
  Harness* harness = static_cast<Harness*>(data);
  ++harness->counts.pat;
  for (dvbpsi_pat_program_t* program = pat->p_first_program; program != nullptr; program = program->p_next) {
    if (program->i_number == 0 || program->i_pid >= kPidCount) continue;  // the network PID
    if (harness->handle[program->i_pid] != nullptr) continue;               // already read
    dvbpsi_t* handle = dvbpsi_new(Quiet, DVBPSI_MSG_NONE);
    if (handle == nullptr) continue;
    if (!dvbpsi_pmt_attach(handle, program->i_number, OnPMT, harness)) {
      dvbpsi_delete(handle);
      continue;
    }
    harness->handle[program->i_pid] = handle;
    harness->isPmt[program->i_pid] = true;
  }
  dvbpsi_pat_delete(pat);
}

bool AttachStandardPids(Harness& harness) {
  dvbpsi_t* pat = dvbpsi_new(Quiet, DVBPSI_MSG_NONE);
  if (pat == nullptr || !dvbpsi_pat_attach(pat, OnPAT, &harness)) return false;
  harness.handle[0] = pat;
  for (uint16_t pid : {kNitPid, kSdtPid, kEitPid, kTotPid}) {
    dvbpsi_t* handle = dvbpsi_new(Quiet, DVBPSI_MSG_NONE);
    if (handle == nullptr || !dvbpsi_AttachDemux(handle, OnNewSubtable, &harness)) return false;
    harness.handle[pid] = handle;
    harness.isDemux[pid] = true;
  }
  return true;
}

void Release(Harness& harness) {
  for (unsigned int pid = 0; pid < kPidCount; ++pid) {
    dvbpsi_t* handle = harness.handle[pid];
    if (handle == nullptr) continue;
    if (pid == 0) {
      dvbpsi_pat_detach(handle);
    } else if (harness.isDemux[pid]) {
      dvbpsi_DetachDemux(handle);
    } else if (harness.isPmt[pid]) {
      dvbpsi_pmt_detach(handle);
    }
    dvbpsi_delete(handle);
    harness.handle[pid] = nullptr;
  }
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2) {
    std::fprintf(stderr, "usage: %s FILE.ts\n", argv[0]);
    return 2;
  }
  Harness& harness = gHarness;
  if (!AttachStandardPids(harness)) {
    std::fprintf(stderr, "libdvbpsi: cannot attach the decoders\n");
    return 1;
  }
  unsigned long long packets = 0;
  unsigned long long bytes = 0;
  bool ok = tsref::ForEachPacket(
      argv[1],
      [&](const uint8_t* p) {
        ++packets;
        dvbpsi_t* handle = harness.handle[((p[1] & 0x1Fu) << 8) | p[2]];
        if (handle != nullptr) dvbpsi_packet_push(handle, const_cast<uint8_t*>(p));
      },
      bytes);
  Release(harness);
  if (!ok) return 1;
  const Counts& c = harness.counts;
  std::printf("bytes %llu packets %llu tables PAT %llu PMT %llu NIT %llu SDT %llu EIT %llu TOT/TDT %llu\n", bytes,
              packets, c.pat, c.pmt, c.nit, c.sdt, c.eit, c.tot);
  return 0;
}
