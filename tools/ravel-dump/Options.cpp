#include "Options.h"

#include <cxxopts.hpp>

#include <algorithm>
#include <cctype>
#include <iostream>

#include <unistd.h>

namespace ravel_dump {
namespace {

const char kDescription[] =
    "Reads a transport stream capture (or a file of raw sections) the way a one-segment\n"
    "receiver does, and prints the PSI/SI tables, DSM-CC carousel messages and stream\n"
    "events it holds, through the ravel_sectionparser library.\n";

std::vector<std::string> SplitList(const std::vector<std::string>& values) {
  std::vector<std::string> words;
  for (const std::string& value : values) {
    std::size_t start = 0;
    while (start <= value.size()) {
      std::size_t comma = value.find(',', start);
      if (comma == std::string::npos) comma = value.size();
      if (comma > start) words.push_back(value.substr(start, comma - start));
      start = comma + 1;
    }
  }
  return words;
}

}  // namespace

bool ParseTraceLevels(const std::string& text, unsigned int& levels, std::string& error) {
  levels = 0;
  for (std::string word : SplitList({text})) {
    std::transform(word.begin(), word.end(), word.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    unsigned long number = 0;
    if (word == "none") continue;
    if (word == "all") levels |= 0xF0000000u;
    else if (word == "dump") levels |= 0x10000000u;
    else if (word == "detail") levels |= 0x20000000u;
    else if (word == "warning" || word == "info") levels |= 0x40000000u;
    else if (word == "error") levels |= 0x80000000u;
    else if (ParseNumber(word, 0xFFFFFFFFul, number) && (number & 0x0FFFFFFFul) == 0) levels |= static_cast<unsigned int>(number);
    else {
      error = "unknown trace level '" + word + "' (use dump, detail, warning, error, all, none or a mask like 0xC0000000)";
      return false;
    }
  }
  return true;
}

ParseOutcome ParseOptions(int argc, char** argv, Options& options, std::string& error) {
  cxxopts::Options parser("ravel-dump", kDescription);
  parser.custom_help("[options]");
  parser.positional_help("[CAPTURE|-|udp://[@]ADDRESS:PORT]");
  // clang-format off
  parser.add_options()
      ("s,summary", "Print what a viewer wants to know: network, services, PIDs, events, time, applications, modules")
      ("j,json", "Print the summary as JSON (its schema: ravel-dump.schema.json)")
      ("jsonl", "Print one JSON object a line per event as it happens (a table new or changed, a module "
       "complete, a time, a problem), for programs that follow a live input")
      ("epg", "Print the programme guide: every event of the EIT present/following and schedule, "
       "actual and other, per service and day")
      ("xmltv", "Write the programme guide to FILE as XMLTV", cxxopts::value<std::string>(), "FILE")
      ("x,extract-modules", "Rebuild the carousel modules and write each complete one to DIR, inflated when "
       "its DII says it is compressed",
       cxxopts::value<std::string>(), "DIR")
      ("extract-files", "Rebuild the object carousel's directories and files under DIR, each file as soon as "
       "its module is complete", cxxopts::value<std::string>(), "DIR")
      ("sections", "Read the input as concatenated raw sections (otherwise told from its first bytes)")
      ("receiver", "Reassemble sections with the receivers' own store (RavelCTSPktStore) instead of one "
       "that delivers every section whole; the report counts what it did not deliver whole")
      ("standard", "Broadcast standard for ratings, regions, texts and times: brazil or japan "
       "(default: detected from the capture)", cxxopts::value<std::string>(), "NAME")
      ("raw-text", "Show broadcast texts as broadcast (bytes escaped as \\xNN) instead of decoded")
      ("p,pid", "Read only these PIDs, each as a section PID (comma-separated, decimal or 0x hex)",
       cxxopts::value<std::vector<std::string>>(), "PIDS")
      ("t,table", "Dump only these tables: pat, pmt, nit, sdt, eit, tdt, tot, bit, ait, dsi, dii, ddb, "
       "dsmcc, stream-events, other, or table_ids", cxxopts::value<std::vector<std::string>>(), "TABLES")
      ("trace", "Also show the library's own traces of these levels on stderr: dump, detail, warning, "
       "error, all", cxxopts::value<std::string>(), "LEVELS")
      ("q,quiet", "No final report on stderr")
      ("no-progress", "No progress bar")
      ("h,help", "Print this help and exit")
      ("V,version", "Print the version and exit")
      ("input", "Capture file, - for standard input, a FIFO or device (dvr0), or udp://[@]ADDRESS:PORT",
       cxxopts::value<std::string>());
  // clang-format on
  parser.parse_positional({"input"});

  try {
    cxxopts::ParseResult result = parser.parse(argc, argv);
    if (result.count("help")) {
      std::cout << parser.help({""}) << "\n"
                << "Without --summary, --json, --jsonl or --epg, each table is dumped by the library's own\n"
                << "Show() as soon as it is complete, and again, marked as changed, when its version or\n"
                << "contents change.\n"
                << "Section PIDs are those a receiver reads (PAT, NIT, SDT, EIT,\n"
                << "TDT/TOT, BIT, the PMTs the PAT names and the AIT, carousel and stream-event PIDs the\n"
                << "PMTs name), and any PID where a DSM-CC carousel or stream-event section starts;\n"
                << "other PIDs are read with --pid.\n"
                << "Without CAPTURE, standard input is read when it is not a terminal. Transport streams\n"
                << "and files of raw sections are told apart from their first bytes.\n"
                << "A pipe, FIFO, device (a DVB adapter's dvr0) or UDP feed (bare or RTP; a multicast group is\n"
                << "joined) is read as it arrives, until its end or SIGINT/SIGTERM, which end the run as the end\n"
                << "of the input does.\n"
                << "A report of packets, continuity breaks, CRC failures and tables goes to stderr at the end.\n"
                << "Damage (a cut end, garbage, a change of packet size) is reported and skipped.\n"
                << "Exit status: 0 something was read, 1 unreadable or bad input, 2 bad command line.\n";
      return ParseOutcome::kExitOk;
    }
    if (result.count("version")) {
      std::cout << "ravel-dump " << RAVEL_DUMP_VERSION << "\n";
      return ParseOutcome::kExitOk;
    }
    // A capture piped in needs no "-"; at a terminal, waiting for typed bytes helps no one.
    if (!result.count("input") && isatty(STDIN_FILENO)) {
      error = "no capture given (name a file, or - or a pipe for standard input)";
      return ParseOutcome::kUsageError;
    }
    if (!result.unmatched().empty()) {
      error = "only one capture can be read at a time ('" + result.unmatched().front() + "')";
      return ParseOutcome::kUsageError;
    }
    options.input = result.count("input") ? result["input"].as<std::string>() : "-";
    options.sections = result.count("sections") > 0;
    // One output on stdout: two asked for at once are refused, not one picked.
    const char* const kOutputs[] = {"summary", "json", "jsonl", "epg"};
    std::string chosen;
    for (const char* output : kOutputs) {
      if (!result.count(output)) continue;
      if (!chosen.empty()) {
        error = "--" + chosen + " and --" + output + " each choose what is printed: give one";
        return ParseOutcome::kUsageError;
      }
      chosen = output;
    }
    if (chosen == "summary") options.mode = OutputMode::kSummary;
    if (chosen == "json") options.mode = OutputMode::kJson;
    if (chosen == "jsonl") options.mode = OutputMode::kJsonLines;
    if (chosen == "epg") options.mode = OutputMode::kEpg;
    if (result.count("xmltv")) {
      options.xmltvFile = result["xmltv"].as<std::string>();
      if (options.xmltvFile.empty()) {
        error = "--xmltv needs a file";
        return ParseOutcome::kUsageError;
      }
      if (chosen.empty()) options.mode = OutputMode::kNone;
    }
    if (result.count("extract-modules")) {
      options.extractDirectory = result["extract-modules"].as<std::string>();
      if (options.extractDirectory.empty()) {
        error = "--extract-modules needs a directory";
        return ParseOutcome::kUsageError;
      }
      if (chosen.empty()) options.mode = OutputMode::kNone;
    }
    options.rawText = result.count("raw-text") > 0;
    if (result.count("extract-files")) {
      options.filesDirectory = result["extract-files"].as<std::string>();
      if (options.filesDirectory.empty()) {
        error = "--extract-files needs a directory";
        return ParseOutcome::kUsageError;
      }
      if (chosen.empty()) options.mode = OutputMode::kNone;
    }
    if (result.count("standard")) {
      std::string name = result["standard"].as<std::string>();
      std::transform(name.begin(), name.end(), name.begin(),
                     [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
      if (name == "brazil") {
        options.standard = 0;
      } else if (name == "japan") {
        options.standard = 1;
      } else {
        error = "unknown standard '" + name + "' (use brazil or japan)";
        return ParseOutcome::kUsageError;
      }
    }
    if (result.count("pid")) {
      for (const std::string& word : SplitList(result["pid"].as<std::vector<std::string>>())) {
        unsigned long pid = 0;
        if (!ParseNumber(word, 0x1FFF, pid)) {
          error = "bad PID '" + word + "' (0 to 8191, decimal or 0x hex)";
          return ParseOutcome::kUsageError;
        }
        options.pids.push_back(static_cast<int>(pid));
      }
      if (options.sections) {
        error = "--pid applies to transport streams, not to --sections";
        return ParseOutcome::kUsageError;
      }
    }
    if (result.count("table")) {
      // The events of --jsonl name tables as the dump does, and are chosen the same way.
      if (options.mode != OutputMode::kDump && options.mode != OutputMode::kJsonLines) {
        error = "--table chooses the tables of the dump, which " +
                (chosen.empty() ? std::string("is not printed here") : "--" + chosen + " replaces") +
                " (use --pid to read fewer tables)";
        return ParseOutcome::kUsageError;
      }
      for (const std::string& word : SplitList(result["table"].as<std::vector<std::string>>())) {
        if (!options.tables.Parse(word, error)) return ParseOutcome::kUsageError;
      }
    }
    if (result.count("trace") && !ParseTraceLevels(result["trace"].as<std::string>(), options.traceLevels, error)) {
      return ParseOutcome::kUsageError;
    }
    options.receiversStore = result.count("receiver") != 0;
    options.report = result.count("quiet") == 0;
    options.progress = result.count("no-progress") == 0;
  } catch (const cxxopts::exceptions::exception& e) {
    error = e.what();
    return ParseOutcome::kUsageError;
  }
  return ParseOutcome::kRun;
}

}  // namespace ravel_dump
