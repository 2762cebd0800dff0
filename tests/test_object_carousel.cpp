// The object carousel as ravel-dump rebuilds it: modules inflated to their
// declared sizes, the tree of files written under the chosen directory only,
// whatever names and keys the carousel carries, and the Ginga entry file
// looked up in it.
#include <gtest/gtest.h>

#include <algorithm>
#include <set>
#include <string>
#include <vector>

#include <nlohmann/json.hpp>

#include "CarouselBuilder.h"
#include "Captures.h"
#include "RavelDumpFixture.h"
#include "StreamBuilder.h"

#ifdef RAVEL_DUMP_PATH

namespace {

using namespace ravel_dump_test;
using namespace cb;

const uint16_t kCarouselPid = 0x0200;
const uint16_t kBlockSize = 512;

struct ModuleSpec {
  uint16_t id;
  uint8_t version;
  std::vector<Bytes> messages;
};

Bytes FileAt(const std::string& key, uint16_t module = 1) { return Ior("fil", module, key); }
Bytes DirAt(const std::string& key, uint16_t module = 1) { return Ior("dir", module, key); }

// DII and DDB sections of compressed modules.
std::vector<Bytes> ModuleSections(const std::vector<ModuleSpec>& modules) {
  std::vector<ModuleEntry> entries;
  std::vector<Bytes> blocks;
  for (const ModuleSpec& m : modules) {
    Bytes content = sb::Cat(m.messages);
    Bytes sent = Deflate(content);
    entries.push_back({m.id, static_cast<uint32_t>(sent.size()), m.version, ObjectModuleInfo(true, content.size())});
    for (const Bytes& block : ModuleBlocks(1, m.id, m.version, kBlockSize, sent)) blocks.push_back(block);
  }
  std::vector<Bytes> sections = {DiiSection(1, kBlockSize, entries)};
  sections.insert(sections.end(), blocks.begin(), blocks.end());
  return sections;
}

// A carousel whose service gateway (key "r" in module 1) binds `bindings`.
Bytes CarouselStream(const std::vector<Bytes>& bindings, const std::vector<Bytes>& moreMessages) {
  std::vector<Bytes> messages = {DirectoryMessage("r", "srg", bindings)};
  messages.insert(messages.end(), moreMessages.begin(), moreMessages.end());
  std::vector<Bytes> sections = {DsiSection(Ior("srg", 1, "r"))};
  for (const Bytes& s : ModuleSections({{1, 1, messages}})) sections.push_back(s);
  return Packets(kCarouselPid, sections);
}

// Paths below `root`, directories with a closing slash.
std::set<std::string> TreeBelow(const std::string& root) {
  std::set<std::string> paths;
  for (const auto& entry : fs::recursive_directory_iterator(root)) {
    std::string path = fs::relative(entry.path(), root).string();
    paths.insert(entry.is_directory() ? path + "/" : path);
  }
  return paths;
}

bool HasProblem(const nlohmann::json& carousel, const std::string& text) {
  for (const auto& problem : carousel["problems"]) {
    if (problem.get<std::string>().find(text) != std::string::npos) return true;
  }
  return false;
}

class ObjectCarouselTest : public RavelDumpTest {};

TEST_F(ObjectCarouselTest, SharedCaptureModulesInflateAndFilesAreRebuilt) {
  std::string capture = captures::Path("object-carousel.ts");
  if (capture.empty()) GTEST_SKIP() << "shared capture object-carousel.ts absent";
  struct Expected {
    const char* path;
    uintmax_t size;
    const char* lead;  // the file's first bytes
  } files[] = {
      {.path = "/index.html", .size = 2497, .lead = "<"},
      {.path = "/rj45.gif", .size = 29367, .lead = "GIF8"},
  };
  // Named with --pid, or found by its DSM-CC section starts when nothing names it.
  for (const std::vector<std::string>& pidOption : std::vector<std::vector<std::string>>{{"--pid", "0x076a"}, {}}) {
    SCOPED_TRACE(pidOption.empty() ? "found" : "named");
    const std::string modulesDir = Path("modules"), filesDir = Path("files");
    std::vector<std::string> args = {"-x", modulesDir, "--extract-files", filesDir, "--json", capture};
    args.insert(args.begin(), pidOption.begin(), pidOption.end());
    ToolRun run = Run(args);
    ASSERT_EQ(0, run.status) << run.err;
    nlohmann::json summary = nlohmann::json::parse(run.out);
    const nlohmann::json& modules = summary["carousels"][0]["modules"];
    ASSERT_EQ(3u, modules.size());
    std::vector<uintmax_t> inflated;
    for (const nlohmann::json& module : modules) {
      EXPECT_TRUE(module["compressed"].get<bool>());
      inflated.push_back(module["original_size"].get<uintmax_t>());
      EXPECT_EQ(inflated.back(), fs::file_size(module["file"].get<std::string>()));
    }
    EXPECT_EQ((std::vector<uintmax_t>{294, 756113, 31946}), inflated);

    const nlohmann::json& tree = summary["object_carousels"][0];
    EXPECT_EQ(0u, tree["problems"].size()) << tree.dump();
    for (const Expected& e : files) {
      SCOPED_TRACE(e.path);
      const std::string file = filesDir + e.path;
      const std::string content = ReadFile(file);
      EXPECT_EQ(e.size, content.size());
      EXPECT_EQ(0u, content.rfind(e.lead, 0));
      auto entry = std::find_if(tree["entries"].begin(), tree["entries"].end(),
                                [&e](const nlohmann::json& listed) { return listed["path"] == e.path; });
      ASSERT_NE(tree["entries"].end(), entry);
      ExpectMembers({{"kind", "file"}, {"size", e.size}, {"complete", true}, {"file", file}}, *entry);
    }
    fs::remove_all(modulesDir);
    fs::remove_all(filesDir);
  }
}

TEST_F(ObjectCarouselTest, ModuleThatDoesNotInflateAsDeclaredIsReportedNotWritten) {
  const Bytes content(1000, 'a');
  const Bytes deflated = Deflate(content);
  struct Case {
    const char* label;
    Bytes sent;
    uint32_t declared;
    const char* problem;
  } cases[] = {
      {.label = "declared too small", .sent = deflated, .declared = 999, .problem = "inflates to 1000 bytes, not the declared 999"},
      {.label = "declared too large", .sent = deflated, .declared = 1001, .problem = "1000 bytes, not the declared 1001"},
      {.label = "not zlib", .sent = content, .declared = 1000, .problem = "no complete zlib stream"},
      {.label = "beyond the limit", .sent = deflated, .declared = 0xFFFFFFF0u, .problem = "more than the 67108864 accepted"},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    std::vector<Bytes> sections = {DiiSection(1, kBlockSize, {{1, static_cast<uint32_t>(c.sent.size()), 1,
                                                                ObjectModuleInfo(true, c.declared)}})};
    for (const Bytes& block : ModuleBlocks(1, 1, 1, kBlockSize, c.sent)) sections.push_back(block);
    const std::string out = Path("modules");
    ToolRun run = Run({"--pid", "0x200", "-x", out, "--json", Write("dc.ts", Packets(kCarouselPid, sections))});
    ASSERT_EQ(0, run.status) << run.err;
    const nlohmann::json module = nlohmann::json::parse(run.out)["carousels"][0]["modules"][0];
    ExpectMembers({{"complete", true}, {"compressed", true}, {"original_size", c.declared}, {"file", nullptr}},
                  module);
    EXPECT_NE(std::string::npos, module["problem"].get<std::string>().find(c.problem)) << module.dump();
    EXPECT_NE(std::string::npos, run.err.find(c.problem)) << run.err;
    EXPECT_TRUE(fs::is_empty(out));
  }
}

TEST_F(ObjectCarouselTest, HostileNamesAndKeysAreReportedAndNothingIsWrittenOutside) {
  // Every carousel also binds ok.txt (key "k"), which is written whatever else it holds.
  std::vector<Bytes> deepDirectories;  // 21 nested names of 200 bytes: a path of more than 4096
  for (int level = 0; level < 21; ++level) {
    std::string next = "n" + std::to_string(level + 1);
    deepDirectories.push_back(DirectoryMessage("n" + std::to_string(level), "dir",
                                               {Binding(std::string(200, 'a' + level % 26), "dir", DirAt(next))}));
  }
  deepDirectories.push_back(DirectoryMessage("n21", "dir", {}));
  std::set<std::string> deepWritten = {"deep/"};  // the names that fit, one directory inside the other
  std::string deepPath = "deep/";
  for (int level = 0; level < 20; ++level) deepWritten.insert(deepPath += std::string(200, 'a' + level % 26) + "/");
  struct Case {
    const char* label;
    std::vector<Bytes> bindings;  // of the service gateway besides ok.txt
    std::vector<Bytes> messages;  // besides the gateway and ok.txt
    const char* problem;
    std::set<std::string> written;  // besides ok.txt
  } cases[] = {
      {.label = "dot-dot", .bindings = {Binding("..", "fil", FileAt("f"))}, .messages = {FileMessage("f", "evil")},
       .problem = "binding \"..\" left out: the name \"..\"", .written = {}},
      {.label = "absolute path", .bindings = {Binding("/etc/passwd", "fil", FileAt("f"))},
       .messages = {FileMessage("f", "evil")}, .problem = "left out: a name with a slash", .written = {}},
      {.label = "empty name", .bindings = {Binding("", "fil", FileAt("f"))}, .messages = {FileMessage("f", "evil")},
       .problem = "binding \"\" left out: an empty name", .written = {}},
      {.label = "NUL in the name", .bindings = {Binding(std::string("a\0b", 3), "fil", FileAt("f"))},
       .messages = {FileMessage("f", "evil")}, .problem = "left out: a name with a NUL byte", .written = {}},
      {.label = "over-long path", .bindings = {Binding("deep", "dir", DirAt("n0"))}, .messages = deepDirectories,
       .problem = "left out: the path grows too long", .written = deepWritten},
      {.label = "two bindings of one name", .bindings = {Binding("ok.txt", "fil", FileAt("f"))},
       .messages = {FileMessage("f", "evil")}, .problem = "binding \"ok.txt\" left out: a second binding of the name",
       .written = {}},
      {.label = "directory binding its ancestor", .bindings = {Binding("d", "dir", DirAt("d"))},
       .messages = {DirectoryMessage("d", "dir", {Binding("up", "dir", Ior("srg", 1, "r"))})},
       .problem = "/d: binding \"up\" left out: it binds its ancestor /", .written = {"d/"}},
      {.label = "key bound in two places", .bindings = {Binding("twin", "fil", FileAt("k"))}, .messages = {},
       .problem = "binding \"twin\" left out: its object is bound already at /ok.txt", .written = {}},
      {.label = "key bound nowhere", .bindings = {}, .messages = {FileMessage("lost", "x")},
       .problem = "object key 0x6c6f7374 in module 0x0001 (file) is bound nowhere", .written = {}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    std::vector<Bytes> bindings = {Binding("ok.txt", "fil", FileAt("k"))};
    bindings.insert(bindings.end(), c.bindings.begin(), c.bindings.end());
    std::vector<Bytes> messages = {FileMessage("k", "fine")};
    messages.insert(messages.end(), c.messages.begin(), c.messages.end());
    const std::string out = Path("out/tree");
    ToolRun run = Run({"--pid", "0x200", "--extract-files", out, "--json", Write("oc.ts", CarouselStream(bindings, messages))});
    ASSERT_EQ(0, run.status) << run.err;
    const nlohmann::json carousel = nlohmann::json::parse(run.out)["object_carousels"][0];
    EXPECT_TRUE(HasProblem(carousel, c.problem)) << carousel["problems"].dump();
    EXPECT_NE(std::string::npos, run.err.find(c.problem)) << run.err;

    // Nothing but the tree is written, and nothing outside it.
    std::set<std::string> written = {".stderr", ".stdin", ".stdout", "oc.ts", "out/", "out/tree/", "out/tree/ok.txt"};
    for (const std::string& path : c.written) written.insert("out/tree/" + path);
    EXPECT_EQ(written, TreeBelow(dir_));
    EXPECT_EQ("fine", ReadFile(out + "/ok.txt"));
    fs::remove_all(Path("out"));
  }
}

TEST_F(ObjectCarouselTest, FileIsWrittenAgainWhenItsModuleVersionChanges) {
  std::vector<Bytes> sections = {DsiSection(Ior("srg", 1, "r"))};
  auto gateway = DirectoryMessage("r", "srg", {Binding("a.txt", "fil", FileAt("a")),
                                               Binding("later.txt", "fil", FileAt("l", 2)),
                                               Binding("video", "str", Ior("str", 1, "v"))});
  const Bytes stream = BiopMessage("v", "str", Bytes(9, 0));  // listed, not written
  for (const Bytes& s : ModuleSections({{1, 1, {gateway, FileMessage("a", "first"), stream}},
                                        {2, 1, {FileMessage("l", "x")}}})) {
    // Module 2 never completes: none of its blocks (table_id_extension 2) is sent.
    const bool blockOfModule2 = s[0] == 0x3C && s[3] == 0x00 && s[4] == 0x02;
    if (!blockOfModule2) sections.push_back(s);
  }
  for (const Bytes& s : ModuleSections({{1, 2, {gateway, FileMessage("a", "second, longer"), stream}}})) {
    sections.push_back(s);
  }
  const std::string out = Path("files");
  const std::string capture = Write("oc.ts", Packets(kCarouselPid, sections));
  ToolRun run = Run({"--pid", "0x200", "--extract-files", out, "--json", capture});
  ASSERT_EQ(0, run.status) << run.err;
  EXPECT_EQ("second, longer", ReadFile(out + "/a.txt"));
  EXPECT_EQ((std::set<std::string>{"a.txt"}), TreeBelow(out));
  const nlohmann::json entries = nlohmann::json::parse(run.out)["object_carousels"][0]["entries"];
  ASSERT_EQ(4u, entries.size()) << entries.dump();
  ExpectMembers({{"path", "/a.txt"}, {"size", 14}, {"module", 1}, {"version", 2}, {"complete", true}}, entries[1]);
  ExpectMembers({{"path", "/later.txt"}, {"module", 2}, {"version", nullptr}, {"complete", false}, {"file", nullptr}},
                entries[2]);
  ExpectMembers({{"path", "/video"}, {"kind", "stream"}, {"size", 9}, {"complete", true}, {"file", nullptr}},
                entries[3]);
}

TEST_F(ObjectCarouselTest, GingaEntryFileIsLookedUpInTheTree) {
  struct Case {
    const char* base;
    const char* initial;
    const char* entry;
    bool present;
  } cases[] = {
      {.base = "/apps/quiz", .initial = "main.ncl", .entry = "/apps/quiz/main.ncl", .present = true},
      {.base = "apps/./quiz/", .initial = "main.ncl", .entry = "/apps/quiz/main.ncl", .present = true},
      {.base = "/apps/quiz", .initial = "other.ncl", .entry = "/apps/quiz/other.ncl", .present = false},
      {.base = "/apps", .initial = "quiz", .entry = "/apps/quiz", .present = false},  // a directory
  };
  Bytes carousel = CarouselStream({Binding("apps", "dir", DirAt("a"))},
                                  {DirectoryMessage("a", "dir", {Binding("quiz", "dir", DirAt("q"))}),
                                   DirectoryMessage("q", "dir", {Binding("main.ncl", "fil", FileAt("m"))}),
                                   FileMessage("m", "<ncl/>")});
  for (const Case& c : cases) {
    SCOPED_TRACE(c.entry);
    const Bytes ait = Packets(0x0100, {AitSection("Quiz", c.base, c.initial)});
    ToolRun run = Run({"--pid", "0x100,0x200", "--json", Write("app.ts", sb::Cat({ait, carousel}))});
    ASSERT_EQ(0, run.status) << run.err;
    ExpectMembers({{"entry", c.entry}, {"entry_present", c.present}},
                  nlohmann::json::parse(run.out)["applications"][0]);
    ToolRun text = Run({"--pid", "0x100,0x200", "--summary", Path("app.ts")});
    EXPECT_NE(std::string::npos, text.out.find(std::string("    entry \"") + c.entry + "\" " +
                                               (c.present ? "is in the carousel\n" : "is not in the carousel\n")))
        << text.out;
  }
}

}  // namespace

#endif  // RAVEL_DUMP_PATH
