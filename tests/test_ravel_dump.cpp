// ravel-dump run as a process, the way its users run it: bad input, packet
// formats and resynchronisation, repeated tables, escaping of broadcast texts,
// the summary and its JSON, filters, live inputs and signals, and the real
// captures when present.
#include <arpa/inet.h>
#include <netinet/in.h>
#include <sys/ioctl.h>
#include <sys/socket.h>

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <functional>
#include <regex>
#include <set>

#include "CarouselBuilder.h"
#include "Captures.h"
#include "Ravel_CSafeSection.h"
#include "RavelDumpFixture.h"  // the tool run as a process, and what it needs

#ifdef RAVEL_DUMP_PATH

namespace {

using namespace ravel_dump_test;
using namespace cb;

// --- Built streams ---------------------------------------------------------

Bytes PatSection(uint16_t tsId, uint8_t version, const std::vector<std::pair<int, int>>& programs) {
  sb::SectionOptions options;
  options.tableId = 0x00;
  options.tableIdExtension = tsId;
  options.version = version;
  Bytes body;
  for (const auto& p : programs) {
    sb::Append(body, sb::U16(p.first));
    sb::Append(body, sb::U16(0xE000 | p.second));
  }
  return sb::LongSection(options, body);
}

Bytes ModuleBytes(size_t size, uint8_t seed) {
  Bytes bytes(size);
  for (size_t i = 0; i < size; ++i) bytes[i] = static_cast<uint8_t>(seed + i * 7 + (i >> 8));
  return bytes;
}

// 192-byte packets: a 4-byte time stamp before each; 204-byte: a 16-byte trailer.
Bytes Reframe(const Bytes& stream, int size) {
  Bytes out;
  for (size_t at = 0; at + 188 <= stream.size(); at += 188) {
    if (size == 192) sb::Append(out, {0x12, 0x34, 0x56, 0x78});
    out.insert(out.end(), stream.begin() + at, stream.begin() + at + 188);
    if (size == 204) out.insert(out.end(), 16, 0xA5);
  }
  return out;
}

// The committed sample: a one-segment broadcast as a receiver meets it.
Bytes Sample() {
  const std::string text = ReadFile(RAVEL_SAMPLES_DIR "/oneseg-brazil.ts");
  return Bytes(text.begin(), text.end());
}

const char kNetworkLine[] = "Network: \"Rede Exemplo\"";

const Bytes kNoBytes;
const uint16_t kBlock = 4066;  // the most a DDB section holds

const Bytes& SamplePatStream() {
  static const Bytes stream = Packets(0x0000, {PatSection(0x1234, 3, {{1, 0x0300}, {2, 0x1FC8}})}, 6);
  return stream;
}

// --- Bad input --------------------------------------------------------------

// `args` with each "@" replaced by `file`.
std::vector<std::string> WithFile(const std::vector<std::string>& args, const std::string& file) {
  std::vector<std::string> out;
  for (const std::string& a : args) out.push_back(a == "@" ? file : a);
  return out;
}

TEST_F(RavelDumpTest, BadInputGivesOneLineAndNonZeroExitAndNoOutput) {
  Bytes text(2000, 'x');
  struct Case {
    std::vector<std::string> args;  // "@": the file of `file`, when given
    const Bytes* file;
    const char* message;
  } cases[] = {
      {/*args=*/{"@"}, /*file=*/nullptr, /*message=*/"No such file or directory"},
      {/*args=*/{"/"}, /*file=*/nullptr, /*message=*/"is a directory"},
      {/*args=*/{"@"}, /*file=*/&kNoBytes, /*message=*/"empty input"},
      {/*args=*/{"-"}, /*file=*/nullptr, /*message=*/"standard input: empty input"},
      {/*args=*/{"@"}, /*file=*/&text, /*message=*/"not a transport stream"},
      {/*args=*/{"--sections", "@"}, /*file=*/&text, /*message=*/"not a file of raw sections"},
      {/*args=*/{"--sections", "@"}, /*file=*/&SamplePatStream(), /*message=*/"a transport stream, not raw sections"},
      {/*args=*/{"udp://@:99999"}, /*file=*/nullptr, /*message=*/"bad port '99999'"},
      {/*args=*/{"udp://tuner:1234"}, /*file=*/nullptr, /*message=*/"'tuner' is not an IPv4 address"},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.message);
    std::string file = Path("input.bin");
    fs::remove(file);
    if (c.file != nullptr) WriteFile(file, *c.file);
    std::vector<std::string> args = WithFile(c.args, file);
    args.insert(args.begin(), {"--extract-modules", Path("modules")});
    ToolRun run = Run(args);
    EXPECT_EQ(1, run.status);
    EXPECT_EQ("", run.out);
    EXPECT_EQ(1u, Lines(run.err)) << run.err;
    EXPECT_EQ(0u, run.err.find("ravel-dump: ")) << run.err;
    EXPECT_NE(std::string::npos, run.err.find(c.message)) << run.err;
    EXPECT_FALSE(fs::exists(Path("modules")));
  }
}

// Damage costs the bytes it spoils, never the intact part around it: its
// tables are printed, the damage is in the report, and the run succeeds.
TEST_F(RavelDumpTest, DamageKeepsTheIntactPart) {
  const Bytes good = SamplePatStream();
  const Bytes cut(good.begin(), good.end() - 100);
  Bytes decoy(204, 0x00);
  decoy[0] = 0x47;
  Bytes sections = sb::Cat({PatSection(0x1234, 3, {{1, 0x100}}), PatSection(0x1234, 4, {{1, 0x100}})});
  struct Case {
    std::vector<std::string> args;  // "-": the file on standard input
    Bytes file;
    const char* damage;
  } cases[] = {
      {/*args=*/{"-"}, /*file=*/cut, /*damage=*/"the input ends inside a packet (88 of 188 bytes)"},
      {/*args=*/{}, /*file=*/sb::Cat({good, Bytes(300, 0x00)}), /*damage=*/"bytes that do not make a whole packet"},
      {/*args=*/{}, /*file=*/sb::Cat({decoy, good}), /*damage=*/"204 bytes skipped"},
      {/*args=*/{}, /*file=*/sb::Cat({good, Reframe(good, 204)}),
       /*damage=*/"packet size changes from 188 to 204 bytes"},
      {/*args=*/{"--sections"}, /*file=*/Bytes(sections.begin(), sections.end() - 3), /*damage=*/"truncated"},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.damage);
    std::vector<std::string> args = {"--table", "pat"};
    args.insert(args.end(), c.args.begin(), c.args.end());
    if (c.args.empty() || c.args.back() != "-") args.push_back(Write("damaged.bin", c.file));
    ToolRun run = Run(args, c.file);
    EXPECT_EQ(0, run.status) << run.err;
    EXPECT_NE(std::string::npos, run.out.find("0x1234")) << run.out;
    EXPECT_NE(std::string::npos, run.err.find(c.damage)) << run.err;
  }
}

TEST_F(RavelDumpTest, UsageErrorsExitWithTwoAndOneLine) {
  std::string file = Write("pat.ts", SamplePatStream());
  struct Case {
    std::vector<std::string> args;
    const char* message;
  } cases[] = {
      {{"--frobnicate", file}, "frobnicate"}, {{"--standard", "mars", file}, "unknown standard 'mars'"},
      {{"--pid", "0x10,zz", file}, "bad PID 'zz'"}, {{"--table", "pat,nonsense", file}, "unknown table 'nonsense'"},
      {{"--trace", "loud", file}, "unknown trace level 'loud'"},
      {{"--sections", "--pid", "1", file}, "--pid applies to transport streams"}, {{file, file}, "only one capture"},
      {{"--summary", "--jsonl", file}, "--summary and --jsonl each choose what is printed"},
      {{"--json", "--table", "pat", file}, "--table chooses the tables of the dump"},
      {{"--xmltv", "", file}, "--xmltv needs a file"},
  };
  for (const Case& c : cases) {
    ToolRun run = Run(c.args);
    EXPECT_EQ(2, run.status) << c.message;
    EXPECT_EQ("", run.out) << c.message;
    EXPECT_EQ(1u, Lines(run.err)) << run.err;
    EXPECT_NE(std::string::npos, run.err.find(c.message)) << run.err;
  }
}

// Without a file a pipe is read (see the raw sections' cases), a terminal not.
TEST_F(RavelDumpTest, WithoutAFileATerminalIsRefused) {
  ToolRun terminal = RunAtTerminal({});
  EXPECT_EQ(2, terminal.status);
  EXPECT_EQ("", terminal.out);
  EXPECT_NE(std::string::npos, terminal.err.find("no capture given")) << terminal.err;
}

// Long options named anywhere in `text`; troff writes "\-" for "-".
std::set<std::string> LongOptions(const std::string& text) {
  const std::string plain = std::regex_replace(text, std::regex(R"(\\-)"), "-");
  const std::regex option("--[a-z][a-z-]*");
  std::set<std::string> options;
  for (std::sregex_iterator it(plain.begin(), plain.end(), option), end; it != end; ++it) options.insert(it->str());
  return options;
}

TEST_F(RavelDumpTest, EveryOptionIsInTheHelpAndTheManualPage) {
  ToolRun help = Run({"--help"});
  EXPECT_EQ(0, help.status);
  EXPECT_EQ("", help.err);
  const std::set<std::string> inHelp = LongOptions(help.out);
  EXPECT_GE(inHelp.size(), 12u) << help.out;
  EXPECT_EQ(inHelp, LongOptions(ReadFile(RAVEL_DUMP_MANUAL)));
  ToolRun version = Run({"--version"});
  EXPECT_EQ(0, version.status);
  EXPECT_EQ(0u, version.out.find("ravel-dump "));
  EXPECT_EQ(1u, Lines(version.out));
}

TEST_F(RavelDumpTest, BashCompletionOffersOptionsAndTheirValues) {
#ifdef RAVEL_DUMP_EMULATOR
  GTEST_SKIP() << "the completion runs the tool itself, which needs the emulator here";
#endif
  struct Case {
    std::string words;  // the command line up to the word being completed
    std::string offered;
  } cases[] = {
      {/*words=*/"--sta", /*offered=*/"--standard"},
      {/*words=*/"--standard j", /*offered=*/"japan"},
      {/*words=*/"--trace dump,wa", /*offered=*/"dump,warning"},
  };
  for (const Case& c : cases) {
    std::string script = Path("complete.sh");
    std::ofstream(script) << "source '" RAVEL_DUMP_COMPLETION "'\n"
                          << "COMP_WORDS=('" RAVEL_DUMP_PATH "' " << c.words << ")\n"
                          << "COMP_CWORD=$((${#COMP_WORDS[@]} - 1))\n"
                          << "_ravel_dump\n"
                          << "printf '%s\\n' \"${COMPREPLY[@]}\"\n";
    ASSERT_EQ(0, std::system(("bash " + script + " >" + Path("offered")).c_str()));
    EXPECT_EQ(c.offered + "\n", ReadFile(Path("offered"))) << c.words;
  }
}

TEST_F(RavelDumpTest, RawSectionsAreToldFromPacketsByTheirBytes) {
  Bytes sections = sb::Cat({Bytes(3, 0xFF), PatSection(0x1234, 3, {{1, 0x0100}}), AitSection("Quiz", "/", "a.ncl")});
  Bytes badCrc = sections;
  badCrc[3 + 8] ^= 0x01;
  struct Case {
    const char* what;
    std::vector<std::string> args;  // "@" stands for the case's file
    Bytes file;
    Bytes input;
    int status;
    const char* inReport;
  } cases[] = {
      {/*what=*/"sections", /*args=*/{"@"}, /*file=*/sections, /*input=*/{}, /*status=*/0,
       /*inReport=*/"bytes of raw sections"},
      {/*what=*/"sections piped", /*args=*/{}, /*file=*/{}, /*input=*/sections, /*status=*/0,
       /*inReport=*/"bytes of raw sections"},
      {/*what=*/"packets", /*args=*/{"@"}, /*file=*/SamplePatStream(), /*input=*/{}, /*status=*/0,
       /*inReport=*/"packets of 188 bytes"},
      {/*what=*/"sections failing their CRC", /*args=*/{"@"}, /*file=*/badCrc, /*input=*/{}, /*status=*/1,
       /*inReport=*/"nor a file of raw sections"},
      {/*what=*/"sections failing their CRC, forced", /*args=*/{"--sections", "@"}, /*file=*/badCrc, /*input=*/{},
       /*status=*/0, /*inReport=*/"1 CRC failures"},
      {/*what=*/"sections with --pid", /*args=*/{"--pid", "0x10", "@"}, /*file=*/sections, /*input=*/{}, /*status=*/1,
       /*inReport=*/"--pid does not apply"},
  };
  for (const Case& c : cases) {
    ToolRun run = Run(WithFile(c.args, Write("input.bin", c.file)), c.input);
    EXPECT_EQ(c.status, run.status) << c.what << ": " << run.err;
    EXPECT_NE(std::string::npos, run.err.find(c.inReport)) << c.what << ": " << run.err;
  }
}

// --- Packets ------------------------------------------------------------------

TEST_F(RavelDumpTest, PacketSizesAndGarbageGiveTheSameTables) {
  Bytes plain = SamplePatStream();
  Bytes garbage = plain;
  // Garbage holding a stray sync byte between the fifth and sixth packets.
  Bytes junk(77, 0x00);
  junk[10] = 0x47;
  garbage.insert(garbage.begin() + 5 * 188, junk.begin(), junk.end());
  Bytes leading = junk;
  sb::Append(leading, plain);
  struct Case {
    Bytes stream;
    const char* input;  // the report's line, after "input: 6 packets of "
  } cases[] = {
      {.stream = plain, .input = "188 bytes, 0 bytes skipped, 0 resyncs"},
      {.stream = Reframe(plain, 192), .input = "192 bytes, 0 bytes skipped, 0 resyncs"},
      {.stream = Reframe(plain, 204), .input = "204 bytes, 0 bytes skipped, 0 resyncs"},
      {.stream = garbage, .input = "188 bytes, 77 bytes skipped, 1 resyncs"},
      {.stream = leading, .input = "188 bytes, 77 bytes skipped, 0 resyncs"},
  };
  ToolRun reference = Run({Write("plain.ts", plain)});
  ASSERT_EQ(0, reference.status) << reference.err;
  EXPECT_NE(std::string::npos, reference.out.find("== PAT on PID 0x0000: table_id 0x00, id 0x1234, version 3"));
  for (const Case& c : cases) {
    ToolRun run = Run({Write("case.ts", c.stream)});
    EXPECT_EQ(0, run.status) << c.input << run.err;
    EXPECT_EQ(reference.out, run.out) << c.input;
    EXPECT_NE(std::string::npos, run.err.find(std::string("input: 6 packets of ") + c.input)) << run.err;
  }
}

// A live input runs for days: a table that changes is shown again, and only
// its latest version is kept, however many came before.
TEST_F(RavelDumpTest, RepeatedTableIsShownAgainOnlyWhenItChangesAndOnlyItsLatestVersionIsKept) {
  Bytes v3 = PatSection(0x1234, 3, {{1, 0x0100}});
  Bytes v4 = PatSection(0x1234, 4, {{1, 0x0100}, {2, 0x0101}});
  sb::PacketWriter writer(0x0000);
  for (int i = 0; i < 4; ++i) writer.AddSection(v3);
  for (int i = 0; i < 2; ++i) writer.AddSection(v4);
  writer.SetCounter(9);  // a continuity break, counted for this PID
  writer.AddSection(v3);  // back to the first contents: the same table again
  ToolRun run = Run({Write("pat.ts", writer.Stream())});
  ASSERT_EQ(0, run.status) << run.err;
  // The first table, the change, and the first contents again, nothing else.
  std::regex header("== PAT.*version (\\d), section 0 of 1(, changed)?\n");
  std::string shown;
  for (std::sregex_iterator it(run.out.begin(), run.out.end(), header), end; it != end; ++it)
    shown += it->str(1) + it->str(2) + ";";
  EXPECT_EQ("3;4, changed;3, changed;", shown) << run.out;
  EXPECT_NE(std::string::npos, run.err.find("  0x0000          7          1        0         7  PAT\n")) << run.err;
  EXPECT_NE(std::string::npos, run.err.find("  PAT                          7         3       1 ")) << run.err;
}

TEST_F(RavelDumpTest, SectionsWhoseLoopsOverrunAreCountedAndNeverParsed) {
  // Each section has a good CRC; one declared length points past its parent.
  // One table, one DSM-CC message and one DSM-CC section: each kind of refusal.
  sb::SectionOptions pmt, dii;
  pmt.tableId = 0x02;
  dii.tableId = 0x3B;
  Bytes diiBody = sb::Cat({sb::U32(1), sb::U16(512), sb::U8(0), sb::U8(0), sb::U32(0), sb::U32(0), sb::U16(0),
                           sb::U16(3), sb::U16(1), sb::U32(10), sb::U8(1), sb::U8(0), sb::U16(0)});
  Bytes ddb = DdbSection(1, 1, 1, 0, ModuleBytes(10, 0));
  ddb[8 + 10] = 0x01;  // messageLength: 256 more than the section holds
  sb::FixCrc(ddb);
  struct Case {
    Bytes section;
    const char* kind;
    const char* reason;
  } cases[] = {
      {/*section=*/sb::LongSection(pmt, sb::Cat({sb::U16(0xE100), sb::Length12(200)})), /*kind=*/"PMT",
       /*reason=*/"loop runs past its parent's end at byte 10"},
      {/*section=*/sb::LongSection(dii, DsmccMessage(0x1002, 2, diiBody)), /*kind=*/"DII",
       /*reason=*/"DII module record cut by the message end"},
      {/*section=*/ddb, /*kind=*/"DDB", /*reason=*/"DSM-CC message runs past the section at byte 18"},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.reason);
    ToolRun run = Run({"--sections", Write("bad.sections", sb::Cat({PatSection(1, 0, {{1, 0x100}}), c.section}))});
    ASSERT_EQ(0, run.status) << run.err;
    EXPECT_EQ(std::string::npos, run.out.find(std::string("== ") + c.kind));
    EXPECT_NE(std::string::npos, run.err.find(", 1 malformed,")) << run.err;
    EXPECT_NE(std::string::npos, run.err.find(c.reason)) << run.err;
  }
}

// An EIT section of `events` events, each with a short event descriptor.
Bytes EitSection(uint8_t tableId, uint16_t serviceId, int events) {
  sb::SectionOptions options;
  options.tableId = tableId;
  options.tableIdExtension = serviceId;
  Bytes body = sb::Cat({sb::U16(0x0640), sb::U16(0x0640), sb::U8(0), sb::U8(tableId)});
  for (int e = 0; e < events; ++e) {
    Bytes descriptor = sb::Descriptor(0x4D, sb::Cat({sb::Text("por"), sb::U8(20), sb::Text(std::string(20, 'n')),
                                                     sb::U8(60), sb::Text(std::string(60, 't'))}));
    sb::Append(body, sb::Cat({sb::U16(e + 1), sb::UtcTime(2026, 11, 24, e % 24, 0, 0), sb::U24(0x010000),
                              sb::U16(0x8000 | descriptor.size()), descriptor}));
  }
  return sb::LongSection(options, body);
}

// Sections of `kind` that passed the checks, from the report's table of kinds.
unsigned long KindSections(const std::string& report, const std::string& kind) {
  const size_t at = report.find("\n  " + kind + " ");
  return at == std::string::npos ? 0 : std::stoul(report.substr(at + 3 + kind.size()));
}

// A short present/following section followed in the same packet by a long
// schedule section: the receivers' store closes the second by the size of the
// first, so it delivers none of them whole.
TEST_F(RavelDumpTest, EitPairsInOnePacketAreAllReadUnlessThroughTheReceiversStore) {
  const int kPairs = 200;
  sb::PacketWriter writer(0x0012);
  for (int i = 0; i < kPairs; ++i) writer.AddPackedSections({EitSection(0x4E, i, 1), EitSection(0x50, i, 10)});
  const std::string capture = Write("pairs.ts", writer.Stream());
  ToolRun whole = Run({capture});
  ToolRun store = Run({"--receiver", capture});
  ASSERT_EQ(0, whole.status) << whole.err;
  ASSERT_EQ(0, store.status) << store.err;
  EXPECT_EQ(static_cast<unsigned long>(kPairs), KindSections(whole.err, "EIT p/f")) << whole.err;
  EXPECT_EQ(static_cast<unsigned long>(kPairs), KindSections(whole.err, "EIT schedule")) << whole.err;
  EXPECT_EQ(std::string::npos, whole.err.find("the receivers' store")) << whole.err;
  EXPECT_EQ(static_cast<unsigned long>(kPairs), KindSections(store.err, "EIT p/f")) << store.err;
  EXPECT_EQ(0u, KindSections(store.err, "EIT schedule")) << store.err;
  EXPECT_NE(std::string::npos, store.err.find("the receivers' store did not deliver 200 sections whole")) << store.err;
}

// --- Texts, summary, JSON, filters -------------------------------------------

TEST_F(RavelDumpTest, BroadcastTextsAreEscapedInEveryOutput) {
  // An escape sequence, a bell, a C1 control byte (alone and as UTF-8), 8-bit
  // Latin text, and UTF-8 text, which is the one thing printed as it came.
  std::string name = std::string("Jogo\x1b[31m\x07") + "\x9b" + "fim\\ caf\xc3\xa9 \xe9t\xe9 \xc2\x9b";
  const std::string escaped = "Jogo\\x1b[31m\\x07\\x9bfim\\\\ caf\xc3\xa9 \\xe9t\\xe9 \\xc2\\x9b";
  const std::string file = Write("ait.ts", Packets(0x0100, {AitSection(name, "/apps", "main.ncl")}));
  struct View {
    const char* option;
    std::string shown;
  } views[] = {
      {.option = "--quiet", .shown = "\t App Name.........: " + escaped},
      {.option = "--summary", .shown = "name \"" + escaped + "\""},
      {.option = "--json", .shown = "\"name\": " + nlohmann::json(escaped).dump()},
  };
  for (const View& view : views) {
    ToolRun run = Run({"--pid", "0x100", view.option, file});
    ASSERT_EQ(0, run.status) << run.err;
    EXPECT_NE(std::string::npos, run.out.find(view.shown)) << run.out;
    for (char c : std::regex_replace(run.out, std::regex("\xc3\xa9"), "")) {
      unsigned char byte = static_cast<unsigned char>(c);
      EXPECT_TRUE(byte == '\n' || byte == '\t' || (byte >= 0x20 && byte < 0x7F)) << static_cast<int>(byte);
    }
  }
}

TEST_F(RavelDumpTest, PidAndTableFiltersLimitWhatIsRead) {
  Bytes stream = sb::Cat({SamplePatStream(), Packets(0x0100, {AitSection("Quiz", "/", "a.ncl")})});
  std::string file = Write("mix.ts", stream);
  struct Case {
    std::vector<std::string> args;
    bool pat, ait;
  } cases[] = {
      {/*args=*/{file}, /*pat=*/true, /*ait=*/false},  // nothing names PID 0x0100 as an AIT PID
      {/*args=*/{"--pid", "0x100", file}, /*pat=*/false, /*ait=*/true},
      {/*args=*/{"--pid", "0,0x100", file}, /*pat=*/true, /*ait=*/true},
      {/*args=*/{"--pid", "0,0x100", "--table", "ait", file}, /*pat=*/false, /*ait=*/true},
      {/*args=*/{"--pid", "0,0x100", "--table", "0x00", file}, /*pat=*/true, /*ait=*/false},
  };
  for (const Case& c : cases) {
    ToolRun run = Run(c.args);
    ASSERT_EQ(0, run.status) << run.err;
    EXPECT_EQ(c.pat, run.out.find("== PAT") != std::string::npos) << c.args[0];
    EXPECT_EQ(c.ait, run.out.find("== AIT on PID 0x0100") != std::string::npos) << c.args[0];
  }
}

TEST_F(RavelDumpTest, TraceLevelsShowTheLibrarysOwnTraces) {
  std::string file = Write("ait.ts", Packets(0x0100, {AitSection("Quiz", "/", "a.ncl")}));
  ToolRun quiet = Run({"--pid", "0x100", "--quiet", file});
  EXPECT_EQ("", quiet.err);
  ToolRun traced = Run({"--pid", "0x100", "--quiet", "--trace", "warning", file});
  EXPECT_NE(std::string::npos, traced.err.find("RavelCAIT::ParseRawData... apRawData=")) << traced.err;
  EXPECT_NE(std::string::npos, traced.err.find("[0x40000020 SectionParser/source/Ravel_CTableAIT:"));
  EXPECT_EQ(quiet.out, traced.out);
}

// --- Data carousel ------------------------------------------------------------

TEST_F(RavelDumpTest, CompleteModulesAreRebuiltAndWrittenAtomically) {
  Bytes big = ModuleBytes(10000, 1);    // three blocks, the last one short
  Bytes small = ModuleBytes(300, 2);    // one block
  Bytes gappy = ModuleBytes(9000, 3);   // block 1 never comes
  Bytes wrong = ModuleBytes(5000, 4);   // its last block comes too long
  std::vector<Bytes> sections = {
      ModuleBlocks(7, 1, 5, kBlock, big)[2],  // blocks before the DII and out of order
      DiiSection(7, kBlock, {{1, 10000, 5}, {2, 300, 5}, {3, 9000, 5}, {4, 5000, 5}, {5, 0, 5}}),
      ModuleBlocks(7, 1, 5, kBlock, big)[0],
      DdbSection(7, 1, 4, 1, ModuleBytes(kBlock, 9)),  // an older version of the module: not used
      DdbSection(8, 1, 5, 1, ModuleBytes(kBlock, 9)),  // another download: not used
      DdbSection(7, 2, 5, 0, small),
      ModuleBlocks(7, 3, 5, kBlock, gappy)[0],
      ModuleBlocks(7, 3, 5, kBlock, gappy)[2],
      ModuleBlocks(7, 4, 5, kBlock, wrong)[0],
      DdbSection(7, 4, 5, 1, ModuleBytes(1000, 4)),
      ModuleBlocks(7, 1, 5, kBlock, big)[1],
      ModuleBlocks(7, 1, 5, kBlock, big)[0],  // a repeat
  };
  const std::string out = Path("modules"), capture = Write("dc.ts", Packets(0x0200, sections));
  auto file = [&out](int id) { return out + "/pid0200_dl00000007_module000" + std::to_string(id) + "_v5.bin"; };
  ToolRun run = Run({"--pid", "0x0200", "--extract-modules", out, "--json", capture});
  ASSERT_EQ(0, run.status) << run.err;
  nlohmann::json carousels = nlohmann::json::parse(run.out)["carousels"];
  ASSERT_EQ(1u, carousels.size());
  ExpectMembers({{"pid", 0x200}, {"download_id", 7}, {"block_size", kBlock}}, carousels[0]);
  const nlohmann::json& modules = carousels[0]["modules"];
  ASSERT_EQ(5u, modules.size());
  const unsigned received[] = {3, 1, 2, 1, 0}, total[] = {3, 1, 3, 2, 0};
  for (int id = 1; id <= 5; ++id) {
    const bool complete = received[id - 1] == total[id - 1];
    ExpectMembers({{"id", id}, {"version", 5}, {"blocks_received", received[id - 1]}, {"blocks_total", total[id - 1]},
                   {"complete", complete}, {"file", complete ? nlohmann::json(file(id)) : nlohmann::json()}},
                  modules[id - 1]);
  }
  EXPECT_EQ(std::string(big.begin(), big.end()), ReadFile(file(1)));
  EXPECT_EQ(std::string(small.begin(), small.end()), ReadFile(file(2)));
  EXPECT_EQ("", ReadFile(file(5)));
  // Without --json the written files are listed; no temporary file is left.
  ToolRun list = Run({"--pid", "0x0200", "--extract-modules", out, capture});
  EXPECT_EQ(file(1) + "\n" + file(2) + "\n" + file(5) + "\n", list.out);
  EXPECT_EQ(3, std::distance(fs::directory_iterator(out), fs::directory_iterator()));
}

// A module version its DII no longer lists will not come whole: its blocks
// are dropped, so that a carousel that changes holds no stale blocks.
TEST_F(RavelDumpTest, ModulesInProgressAreDroppedWhenTheirDiiChanges) {
  Bytes module = ModuleBytes(8000, 1);  // two blocks
  std::vector<Bytes> sections = {
      DiiSection(7, kBlock, {{1, 8000, 1}}),
      ModuleBlocks(7, 1, 1, kBlock, module)[0],
      DiiSection(7, kBlock, {{1, 8000, 2}}),  // version 2 replaces version 1
      ModuleBlocks(7, 1, 1, kBlock, module)[1],
  };
  ToolRun run = Run({"--pid", "0x0200", "--summary", Write("dc.ts", Packets(0x0200, sections))});
  ASSERT_EQ(0, run.status) << run.err;
  EXPECT_NE(std::string::npos, run.out.find("    module 0x0001 version 1, 8000 bytes, 1 of 2 blocks\n")) << run.out;
}

TEST_F(RavelDumpTest, ModuleDirectoryThatCannotBeMadeFailsCleanly) {
  Bytes stream = Packets(0x0200, {DiiSection(7, 100, {{1, 10, 1}}), DdbSection(7, 1, 1, 0, ModuleBytes(10, 0))});
  std::string blocker = Write("file", Bytes(1, 0));
  ToolRun run = Run({"--pid", "0x200", "--extract-modules", blocker + "/sub", Write("dc.ts", stream)});
  EXPECT_EQ(1, run.status);
  EXPECT_EQ("", run.out);
  EXPECT_EQ(1u, Lines(run.err)) << run.err;
  EXPECT_NE(std::string::npos, run.err.find("cannot make the module directory"));
}

// --- A receiver's whole path -------------------------------------------------

// A PID is read once a table names it, as a receiver does; each rating reads
// by its country's standard, the library's reading by the standard setting
// (ARIB: rating + 3 years) beside it. The sample's whole summary is in
// tests/golden.
TEST_F(RavelDumpTest, SummaryFollowsTheReceiversPath) {
  sb::PacketWriter early(0x0188);  // an AIT before the PMT names its PID
  early.SetCounter(15);
  early.AddSection(AitSection("Quiz", "/apps/quiz", "main.ncl"));
  const std::string file = Write("oneseg.ts", sb::Cat({early.Stream(), Sample()}));
  ToolRun run = Run({"--summary", file});
  ASSERT_EQ(0, run.status) << run.err;
  EXPECT_NE(std::string::npos, run.err.find("  0x0188          3          0        0         2  AIT\n")) << run.err;
  EXPECT_EQ(std::string::npos, run.out.find("Quiz")) << run.out;
  ToolRun japan = Run({"--standard", "japan", "--raw-text", "--summary", file});
  EXPECT_NE(std::string::npos, japan.out.find("Standard: japan (--standard)\n"));
  for (const char* event : {"\"Jornal Exemplo\" rating BRA 12 (0x23) [library: age 0] (event 0x3a21)",
                            "\"Novela Exemplo\" rating BRA 14 (0x04) [library: age 7] (event 0x3a22)"}) {
    EXPECT_NE(std::string::npos, japan.out.find(event)) << japan.out;
  }
}

// --- Real captures --------------------------------------------------------------

TEST_F(RavelDumpTest, AitCaptureGivesItsGingaApplications) {
  std::string capture = captures::Path("ait.ts");
  if (capture.empty()) GTEST_SKIP() << "shared capture ait.ts absent";
  ToolRun run = Run({"--json", capture});
  ASSERT_EQ(0, run.status) << run.err;
  // The AIT PIDs are found as a receiver finds them: named by the PMTs.
  EXPECT_NE(std::string::npos, run.err.find("  0x1ec5          2          0        0         2  AIT\n")) << run.err;
  nlohmann::json applications = nlohmann::json::parse(run.out)["applications"];
  ASSERT_EQ(3u, applications.size()) << applications.dump(1);
  auto launcher = std::find_if(applications.begin(), applications.end(),
                               [](const nlohmann::json& a) { return a["pid"] == 7878; });  // in arrival order
  ASSERT_NE(applications.end(), launcher);
  ExpectMembers({{"application_id", 6838}, {"control_code", 1}, {"name", "Launcher SAT"}, {"organization_id", 11},
                 {"application_type", 1}},
                *launcher);
}

// --- Live inputs: UDP over the loopback interface, pipes, FIFOs, signals ------
// (not through a cross build's emulator)

#ifndef RAVEL_DUMP_EMULATOR

using std::chrono::milliseconds;

sockaddr_in Ipv4(const char* address, int port) {
  sockaddr_in socketAddress{};
  socketAddress.sin_family = AF_INET;
  socketAddress.sin_port = htons(port);
  inet_pton(AF_INET, address, &socketAddress.sin_addr);
  return socketAddress;
}

// A UDP port of 127.0.0.1 that was free a moment ago.
int FreePort() {
  int fd = socket(AF_INET, SOCK_DGRAM, 0);
  sockaddr_in address = Ipv4("127.0.0.1", 0);
  bind(fd, reinterpret_cast<sockaddr*>(&address), sizeof address);
  socklen_t size = sizeof address;
  getsockname(fd, reinterpret_cast<sockaddr*>(&address), &size);
  close(fd);
  return ntohs(address.sin_port);
}

// The bytes waiting in the receive queue of the UDP socket bound to `port`,
// -1 while there is none.
long UdpQueue(int port) {
  std::istringstream table(ReadFile("/proc/net/udp"));
  char local[16];
  std::snprintf(local, sizeof local, ":%04X", port);
  // Lines of "sl local_address rem_address st tx_queue:rx_queue ..."
  for (std::string line; std::getline(table, line);) {
    std::istringstream fields(line);
    std::string slot, address, remote, state, queues;
    fields >> slot >> address >> remote >> state >> queues;
    if (address.size() > 5 && address.compare(address.size() - 5, 5, local) == 0) {
      return std::stol(queues.substr(queues.find(':') + 1), nullptr, 16);
    }
  }
  return -1;
}

// RTP headers of MPEG-2 transport (payload type 33): plain, and with two
// CSRCs, an extension of one word and three bytes of padding after the payload.
const Bytes kRtp = sb::Cat({sb::U8(0x80), sb::U8(33), sb::U16(1), sb::U32(0), sb::U32(0x1234)});
const Bytes kRtpWithCsrcExtension = sb::Cat({sb::U8(0xB2), sb::U8(33), sb::U16(1), sb::U32(0), sb::U32(0x1234),
                                             sb::U32(1), sb::U32(2), sb::U16(0xABAC), sb::U16(1), sb::U32(0)});

// The datagrams of `stream`: 7 packets each, as IPTV sends them, between
// `header` and `trailer`.
std::vector<Bytes> Datagrams(const Bytes& stream, const Bytes& header, const Bytes& trailer) {
  std::vector<Bytes> datagrams;
  for (size_t at = 0; at < stream.size(); at += 7 * 188) {
    const size_t end = std::min(stream.size(), at + 7 * 188);
    datagrams.push_back(sb::Cat({header, Bytes(stream.begin() + at, stream.begin() + end), trailer}));
  }
  return datagrams;
}

void Send(const std::string& address, int port, const std::vector<Bytes>& datagrams, int rounds) {
  int fd = socket(AF_INET, SOCK_DGRAM, 0);
  // Multicast stays on the loopback interface and on this machine.
  const in_addr loopback = Ipv4("127.0.0.1", 0).sin_addr;
  setsockopt(fd, IPPROTO_IP, IP_MULTICAST_IF, &loopback, sizeof loopback);
  const unsigned char ttl = 0;
  setsockopt(fd, IPPROTO_IP, IP_MULTICAST_TTL, &ttl, sizeof ttl);
  sockaddr_in target = Ipv4(address.c_str(), port);
  for (int r = 0; r < rounds; ++r) {
    for (const Bytes& d : datagrams) {
      sendto(fd, d.data(), d.size(), 0, reinterpret_cast<sockaddr*>(&target), sizeof target);
    }
    std::this_thread::sleep_for(milliseconds(10));
  }
  close(fd);
}

// Polls `done` for 5 s at most.
bool WaitUntil(const std::function<bool()>& done) {
  const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(5);
  while (!done()) {
    if (std::chrono::steady_clock::now() > deadline) return false;
    std::this_thread::sleep_for(milliseconds(10));
  }
  return true;
}

TEST_F(RavelDumpTest, UdpFeedsAreReadUntilStopped) {
  struct Case {
    const char* name;
    const char* url;         // %d: the port
    const char* sendTo;
    Bytes header = {}, trailer = {};  // around the packets of each datagram
  } cases[] = {
      {.name = "unicast, bare packets", .url = "udp://127.0.0.1:%d", .sendTo = "127.0.0.1"},
      {.name = "every local address (VLC), RTP", .url = "udp://@:%d", .sendTo = "127.0.0.1", .header = kRtp},
      {.name = "unicast, RTP with CSRCs, an extension and padding", .url = "udp://127.0.0.1:%d",
       .sendTo = "127.0.0.1", .header = kRtpWithCsrcExtension, .trailer = {0, 0, 3}},
      {.name = "a sender's address, as ffmpeg reads it: every local address", .url = "udp://192.0.2.1:%d",
       .sendTo = "127.0.0.1"},
      {.name = "multicast group joined on the loopback interface", .url = "udp://239.255.42.1:%d?localaddr=127.0.0.1",
       .sendTo = "239.255.42.1", .header = kRtp},
  };
  const Bytes sample = Sample();
  for (const Case& c : cases) {
    SCOPED_TRACE(c.name);
    const int port = FreePort();
    char url[128];
    std::snprintf(url, sizeof url, c.url, port);
    const pid_t tool = Start({"--summary", url}, -1);
    const bool bound = WaitUntil([port] { return UdpQueue(port) >= 0; });
    std::vector<Bytes> datagrams = Datagrams(sample, c.header, c.trailer);
    datagrams.insert(datagrams.begin(), Bytes(100, 0x00));  // neither packets nor RTP: reported, not read
    if (bound) Send(c.sendTo, port, datagrams, 3);
    // Every datagram is read before the signal, which ends the input there.
    const bool drained = bound && WaitUntil([port] { return UdpQueue(port) == 0; });
    ToolRun run = Finish(tool, SIGINT);
    ASSERT_TRUE(bound) << run.err;
    EXPECT_TRUE(drained);
    EXPECT_EQ(0, run.status) << run.err;
    EXPECT_NE(std::string::npos, run.out.find(kNetworkLine)) << run.out;
    // A header left in front of the packets would show as skipped bytes.
    EXPECT_NE(std::string::npos, run.err.find("input: 429 packets of 188 bytes, 0 bytes skipped, 0 resyncs"))
        << run.err;
    EXPECT_NE(std::string::npos, run.err.find("3 of 66 UDP datagrams held neither")) << run.err;
  }
}

// A pipe or FIFO stays open while a tuner or a growing recording feeds it:
// the stop signal ends the run as the end of the input does, and a live user
// sees each table as it completes, not at the end.
TEST_F(RavelDumpTest, LiveInputsEndAtTheirEndOrTheStopSignal) {
  struct Case {
    const char* name;
    std::vector<std::string> args;  // "@": the FIFO
    int signal;                     // 0: the input is closed instead
    size_t cutPacketBytes;          // bytes of one more packet written before the end
    const char* shown;              // in the output before the end
  } cases[] = {
      {.name = "SIGTERM on a FIFO", .args = {"--summary", "@"}, .signal = SIGTERM, .cutPacketBytes = 0, .shown = ""},
      {.name = "SIGINT inside a packet", .args = {"--summary", "-"}, .signal = SIGINT, .cutPacketBytes = 100,
       .shown = ""},
      {.name = "dump", .args = {"-"}, .signal = 0, .cutPacketBytes = 0, .shown = "== PAT on PID 0x0000"},
      {.name = "JSON lines", .args = {"--jsonl", "-"}, .signal = 0, .cutPacketBytes = 0, .shown = "\"kind\":\"PAT\""},
  };
  const Bytes sample = Sample();
  for (const Case& c : cases) {
    SCOPED_TRACE(c.name);
    const std::string fifo = Path("dvr0");
    const bool named = c.args.back() == "@";
    int ends[2] = {-1, -1};
    // The tool holds no writing end: closing ours ends its input.
    ASSERT_EQ(0, named ? mkfifo(fifo.c_str(), 0600) : pipe2(ends, O_CLOEXEC));
    const pid_t tool = Start(WithFile(c.args, fifo), ends[0]);
    if (ends[0] >= 0) close(ends[0]);
    const int writer = named ? open(fifo.c_str(), O_WRONLY) : ends[1];
    Bytes written = sb::Cat({sample, Bytes(sample.begin(), sample.begin() + c.cutPacketBytes)});
    const bool whole = write(writer, written.data(), written.size()) == static_cast<ssize_t>(written.size());
    // Once the tool has read everything, its handlers are in place.
    const bool drained = WaitUntil([writer] {
      int waiting = -1;
      return ioctl(writer, FIONREAD, &waiting) == 0 && waiting == 0;
    });
    const bool shown = WaitUntil([&] { return ReadFile(Path(".stdout")).find(c.shown) != std::string::npos; });
    if (c.signal == 0) close(writer);
    ToolRun run = Finish(tool, c.signal);
    if (c.signal != 0) close(writer);
    ASSERT_TRUE(whole);
    EXPECT_TRUE(drained);
    EXPECT_TRUE(shown) << run.out;
    EXPECT_EQ(0, run.status) << run.err;
    if (c.signal != 0) {
      EXPECT_NE(std::string::npos, run.out.find(kNetworkLine)) << run.out;
      EXPECT_NE(std::string::npos, run.err.find("input: 143 packets of 188 bytes")) << run.err;
    }
  }
}
#endif  // RAVEL_DUMP_EMULATOR

}  // namespace


// --- Events as they happen -------------------------------------------------

TEST_F(RavelDumpTest, JsonLinesTellEachEventOnce) {
  const std::vector<std::pair<int, int>> programs = {{0xE760, 0x01F0}, {0xE778, 0x1FC8}};
  Bytes corrupt = PatSection(0x0640, 1, programs);
  corrupt[9] ^= 0x01;  // the CRC no longer verifies
  Bytes stream = sb::Cat({Sample(), Packets(0x0012, {corrupt}), Packets(0x0000, {PatSection(0x0640, 1, programs)}, 3)});
  ToolRun run = Run({"--jsonl", Write("events.ts", stream)});
  ASSERT_EQ(0, run.status) << run.err;
  std::vector<nlohmann::json> events;
  std::istringstream lines(run.out);
  for (std::string line; std::getline(lines, line);) events.push_back(nlohmann::json::parse(line));
  struct Case {
    const char* what;
    nlohmann::json members;
  } cases[] = {
      {.what = "first PAT", .members = {{"event", "table"}, {"kind", "PAT"}, {"change", false}, {"version", 0}}},
      {.what = "changed PAT", .members = {{"event", "table"}, {"kind", "PAT"}, {"change", true}, {"version", 1}}},
      {.what = "module", .members = {{"event", "module"}, {"pid", 0x018A}, {"module_id", 1}, {"version", 1}}},
      {.what = "time", .members = {{"event", "time"}, {"kind", "TOT"}, {"time", "2024-05-14 22:30:01"}}},
      {.what = "problem", .members = {{"event", "problem"}, {"problem", "PID 0x0012 table_id 0x00: CRC failure"}}},
  };
  for (const Case& c : cases) {
    size_t count = 0;
    for (const nlohmann::json& event : events) {
      bool match = true;
      for (const auto& member : c.members.items()) match = match && event.value(member.key(), nlohmann::json()) == member.value();
      count += match;
    }
    EXPECT_EQ(1u, count) << c.what << "\n" << run.out;
  }
}

// --- One table of tables -----------------------------------------------------

TEST_F(RavelDumpTest, EveryTableIdIsShownAsTheLibrarysTableOfTablesSaysIt) {
  // One section per table_id, each with a good CRC; the library's answer for
  // each decides what the tool must show. Two bodies: the short one passes the
  // walk of the EIT layout, the long one those of the PMT, NIT, SDT and BIT.
  // 0xFF is the stuffing byte between sections, never a table.
  for (size_t bodySize : {6u, 16u}) {
    Bytes file;
    std::vector<Bytes> sections;
    for (int tableId = 0x00; tableId < 0xFF; ++tableId) {
      sb::SectionOptions o;
      o.tableId = static_cast<uint8_t>(tableId);
      o.tableIdExtension = static_cast<uint16_t>(tableId);
      sections.push_back(sb::LongSection(o, Bytes(bodySize, 0x00)));
      sb::Append(file, sections.back());
    }
    ToolRun run = Run({"-q", "--sections", Write("all.sections", file)});
    ASSERT_EQ(0, run.status) << run.err;
    for (const Bytes& section : sections) {
      char where[32];
      std::snprintf(where, sizeof where, ": table_id 0x%02x,", section[0]);
      size_t at = run.out.find(where);
      RavelCSafeSection safe;
      RavelSafeResult result = safe.Parse(section.data(), static_cast<int>(section.size()));
      if (result != kRavelSafeOk && result != kRavelSafeRefused && result != kRavelSafeUnknownTable) {
        EXPECT_EQ(std::string::npos, at) << where << " refused by the library but shown";
        continue;
      }
      ASSERT_NE(std::string::npos, at) << where << " accepted by the library but not shown";
      std::string line = run.out.substr(run.out.rfind('\n', at) + 1);
      line = line.substr(0, line.find('\n'));
      RavelTableKind kind = RavelCSafeSection::GetKind(section.data(), static_cast<int>(section.size()));
      EXPECT_EQ(0u, line.find("== " + std::string(RavelCSafeSection::GetKindName(kind)) + where)) << line;
      EXPECT_EQ(result == kRavelSafeUnknownTable,
                line.find("(no class in the library for this table_id)") != std::string::npos)
          << line;
      EXPECT_EQ(result == kRavelSafeRefused, line.find("refused by the library") != std::string::npos) << line;
    }
  }
}

#endif  // RAVEL_DUMP_PATH
