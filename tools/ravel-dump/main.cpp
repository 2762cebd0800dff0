// ravel-dump: reads a capture end to end through the section parser's public
// interface, the way a receiver application does, and prints what it holds.
#include <cstdio>
#include <memory>
#include <string>
#include <vector>

#include "ByteText.h"
#include "Capture.h"
#include "CaptureKind.h"
#include "Demux.h"
#include "Input.h"
#include "InputBuffer.h"
#include "LiveEvents.h"
#include "Options.h"
#include "Output.h"
#include "PacketReader.h"
#include "Progress.h"
#include "Ravel_ByteOrder.h"
#include "Ravel_Cfg.h"
#include "Report.h"
#include "StandardDetection.h"
#include "Stats.h"
#include "StopSignal.h"
#include "TimeBase.h"
#include "TraceOutput.h"
#include "Xmltv.h"

namespace {

using namespace ravel_dump;

const int kExitBadInput = 1;
const int kExitUsage = 2;
// Dumps before which the standard is looked for, while no table shows a sign of either.
const int kStandardLooks = 64;
// Enough of a file of sections to tell a transport stream given as one.
const std::size_t kSectionsLook = 4096;
// A chunk of a file of sections: many sections, and always one whole (4096 bytes at most).
const std::size_t kSectionsChunk = 1u << 20;

int Fail(const std::string& message) {
  std::fprintf(stderr, "ravel-dump: %s\n", message.c_str());
  return kExitBadInput;
}

// A file of concatenated raw sections (each 3 + section_length bytes; 0xFF
// bytes between them are stuffing), read as a stream: each section is handed
// on once its bytes are in, and only one chunk and one section are held.
bool ReadSections(InputFile& input, Capture& capture, Stats& stats, InputSummary& summary, std::string& error) {
  std::vector<uint8_t> head;
  if (!input.Peek(kSectionsLook, head, error)) return false;
  if (head.empty()) {
    error = input.Name() + ": empty input";
    return false;
  }
  std::size_t syncAt = 0;
  int stride = 0;
  if (head[0] == 0x47 && PacketReader::FindLock(head.data(), head.size(), syncAt, stride) && syncAt == 0) {
    error = input.Name() + ": a transport stream, not raw sections (drop --sections)";
    return false;
  }
  InputBuffer in(kSectionsChunk);
  uint64_t sections = 0;
  bool more = true;
  for (;;) {
    while (in.pos < in.end && in.bytes[in.pos] == 0xFF) ++in.pos;
    const std::size_t left = in.end - in.pos;
    const std::size_t need = left < 3 ? 3 : static_cast<std::size_t>(RavelSectionSize(in.bytes.data() + in.pos));
    if (left < need && more) {
      // Too few bytes for the next section: read on.
      long long n = in.Refill(input, error);
      if (n < 0) {
        if (sections == 0) return false;
        stats.Problem(error);
        error.clear();
      }
      if (n <= 0) more = false;
      continue;
    }
    if (left == 0) break;
    if (left < need) {
      const std::string at = std::to_string(in.base + in.pos);
      if (sections == 0) {
        error = input.Name() + ": not a file of raw sections (the first would need " + std::to_string(need) +
                " bytes, the input holds " + std::to_string(left) + ")";
        return false;
      }
      // What came before the cut stands.
      stats.Problem(input.Name() + ": truncated: the section at byte " + at + " needs " + std::to_string(need) +
                    " bytes, " + std::to_string(left) + " are left");
      in.pos = in.end;
      break;
    }
    ++sections;
    ++stats.sectionsAssembled;
    capture.OnSection(kNoPid, in.bytes.data() + in.pos, need);
    in.pos += need;
  }
  summary.bytes = in.base + in.pos;
  uint64_t accepted = 0;
  for (const KindStats& k : stats.kinds) accepted += k.sections;
  if (sections > 0 && accepted == 0) {
    error = input.Name() + ": not a file of sections (none has a valid CRC and structure)";
    return false;
  }
  return true;
}

bool ReadTransportStream(InputFile& input, const Options& options, Demux& demux, Stats& stats,
                         InputSummary& summary, std::string& error) {
  PacketReader reader(input);
  if (!reader.Start(error)) return false;
  Progress progress(options.progress, input.Size());
  while (const uint8_t* packet = reader.Next()) {
    demux.OnPacket(packet);
    progress.Update(reader.Offset());
  }
  progress.Finish();
  demux.End();
  summary.packets = reader.Packets();
  summary.packetSize = reader.PacketSize();
  summary.skippedBytes = reader.SkippedBytes();
  summary.resyncs = reader.Resyncs();
  summary.bytes = reader.Offset();
  // Damage costs only the bytes it spoils: what was read before and after it stands.
  // A stop request ends the input where it is, inside a packet or not.
  for (const std::string& line : reader.Damage()) {
    if (!StopRequested()) stats.Problem(line);
  }
  if (!reader.Error().empty() && !StopRequested()) {
    if (reader.Packets() == 0) {
      error = reader.Error();
      return false;
    }
    stats.Problem(reader.Error());
  }
  return true;
}

}  // namespace

int main(int argc, char** argv) {
  Options options;
  std::string error;
  switch (ParseOptions(argc, argv, options, error)) {
    case ParseOutcome::kExitOk:
      return 0;
    case ParseOutcome::kUsageError:
      std::fprintf(stderr, "ravel-dump: %s (see ravel-dump --help)\n", error.c_str());
      return kExitUsage;
    case ParseOutcome::kRun:
      break;
  }
  if (options.standard >= 0) RavelCfg_SetStandard(options.standard);

  Stats stats;
  TraceOutput trace(options.traceLevels, stats);
  InputFile input;
  if (!input.Open(options.input, error)) return Fail(error);
  InstallStopSignals();

  bool sections = options.sections;
  if (!sections && !HoldsRawSections(input, sections, error)) return Fail(error);
  if (sections && !options.pids.empty()) {
    return Fail(input.Name() + ": a file of raw sections, where --pid does not apply");
  }

  Capture capture(stats, trace);
  // Tables and events go out as they happen; the summaries wait for the end.
  std::unique_ptr<LiveEvents> events;
  if (options.mode == OutputMode::kDump || options.mode == OutputMode::kJsonLines) {
    events.reset(new LiveEvents(options.mode == OutputMode::kDump ? LiveFormat::kDump : LiveFormat::kJsonLines,
                                options.tables, trace, stdout));
    capture.SetEvents(events.get());
    if (options.standard >= 0) {
      trace.SetTextCoding(TextCodingOf(options.standard, options.rawText));
    } else {
      // Until a table shows a sign of either standard, each dump looks again.
      int looks = 0;
      bool settled = false;
      events->BeforeDump([&capture, &trace, &options, looks, settled]() mutable {
        if (settled) return;
        StandardChoice choice = DetectStandard(BuildSummary(capture.Registry(), capture.Carousel(), trace));
        RavelCfg_SetStandard(choice.standard);
        trace.SetTextCoding(TextCodingOf(choice.standard, options.rawText));
        settled = choice.reason.find("no sign") != 0 || ++looks >= kStandardLooks;
      });
    }
    LiveEvents* told = events.get();
    stats.onProblem = [told](const std::string& line) { told->OnProblem(line); };
  }
  // Files are written while the capture is read, as their modules complete.
  if (!options.filesDirectory.empty() && !capture.Objects().WriteFilesTo(options.filesDirectory, error)) {
    return Fail(error);
  }
  Demux demux(stats, capture);
  InputSummary inputSummary;
  inputSummary.name = input.Name();
  inputSummary.sections = sections;
  if (sections) {
    if (!ReadSections(input, capture, stats, inputSummary, error)) return Fail(error);
  } else {
    capture.SetDemux(&demux);
    if (options.receiversStore) demux.UseReceiversStore();
    stats.receiversStore = options.receiversStore;
    if (options.pids.empty()) {
      demux.AddStandardPids();
    } else {
      demux.RestrictTo(options.pids);
    }
    if (!ReadTransportStream(input, options, demux, stats, inputSummary, error)) return Fail(error);
    if (input.Udp() != nullptr && input.Udp()->IgnoredDatagrams() > 0) {
      stats.Problem(std::to_string(input.Udp()->IgnoredDatagrams()) + " of " +
                    std::to_string(input.Udp()->Datagrams()) +
                    " UDP datagrams held neither transport stream packets nor RTP carrying them");
    }
    if (options.pids.empty() && stats.pids[0].sections == 0) {
      stats.Problem("no PAT read: only the PIDs every receiver reads and DSM-CC PIDs were read; name others with --pid");
    }
  }

  // The standard decides how ratings and regions parse, how texts read and
  // the time base: named on the command line, or told by the capture's tables.
  StandardChoice choice = options.standard >= 0
                              ? GivenStandard(options.standard)
                              : DetectStandard(BuildSummary(capture.Registry(), capture.Carousel(), trace));
  RavelCfg_SetStandard(choice.standard);
  trace.SetTextCoding(TextCodingOf(choice.standard, options.rawText));

  // Everything is read: now the outputs, modules first so that a failure to
  // write them leaves no half output behind.
  Summary summary;
  bool wantSummary = options.mode == OutputMode::kSummary || options.mode == OutputMode::kJson ||
                     options.mode == OutputMode::kEpg || !options.xmltvFile.empty() ||
                     !options.extractDirectory.empty() || !options.filesDirectory.empty();
  if (wantSummary) {
    summary = BuildSummary(capture.Registry(), capture.Carousel(), trace);
    summary.standardReason = choice.reason;
    summary.textCoding = TextCodingOf(choice.standard, options.rawText);
    summary.utcOffsetMinutes = UtcOffsetMinutesOf(choice.standard);
    summary.objectCarousels = capture.Objects().Summarize();
    ResolveApplications(summary.objectCarousels, summary.applications);
    for (const ObjectCarouselSummary& carousel : summary.objectCarousels) {
      for (const std::string& problem : carousel.problems) {
        char pid[32];
        std::snprintf(pid, sizeof pid, "PID 0x%04x: ", carousel.pid);
        stats.Problem(pid + problem);
      }
    }
  }
  if (!options.extractDirectory.empty()) {
    if (!capture.Carousel().WriteModules(options.extractDirectory, summary.carousels, error)) return Fail(error);
    for (const CarouselSummary& carousel : summary.carousels) {
      for (const ModuleSummary& module : carousel.modules) {
        if (module.problem.empty()) continue;
        char where[64];
        std::snprintf(where, sizeof where, "module 0x%04x version %d: ", module.id, module.version);
        stats.Problem(where + module.problem);
      }
    }
  }
  summary.report = FiguresOf(inputSummary, stats, capture.Registry());
  if (!options.xmltvFile.empty() && !WriteXmltv(options.xmltvFile, summary, error)) {
    return Fail(error);
  }
  switch (options.mode) {
    case OutputMode::kDump:
      events->End(capture.Registry());
      break;
    case OutputMode::kJsonLines:
      break;
    case OutputMode::kSummary:
      PrintSummaryText(summary, stdout);
      break;
    case OutputMode::kJson:
      std::fputs(SummaryJson(summary).c_str(), stdout);
      break;
    case OutputMode::kEpg:
      PrintEpgText(summary, stdout);
      break;
    case OutputMode::kNone:
      for (const CarouselSummary& carousel : summary.carousels) {
        for (const ModuleSummary& module : carousel.modules) {
          if (!module.file.empty()) std::printf("%s\n", module.file.c_str());
        }
      }
      for (const ObjectCarouselSummary& carousel : summary.objectCarousels) {
        for (const TreeEntrySummary& entry : carousel.entries) {
          if (!entry.file.empty()) std::printf("%s\n", EscapeBytes(entry.file).c_str());
        }
      }
      break;
  }
  if (std::fflush(stdout) != 0 || std::ferror(stdout)) return Fail("cannot write the output");
  if (options.report) PrintReport(stderr, inputSummary, stats, demux.Roles(), capture.Registry());
  return 0;
}
