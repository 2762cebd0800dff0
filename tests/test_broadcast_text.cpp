// Broadcast texts as ravel-dump shows them: ARIB STD-B24 8-unit code and
// ISO/IEC 8859-15 decoded to UTF-8, the standard told from the capture, times
// in the broadcast's time base.
#include <cstdio>
#include <string>
#include <vector>

#include "Captures.h"
#include "RavelDumpFixture.h"

#ifdef RAVEL_DUMP_PATH

namespace {

using namespace ravel_dump_test;

class BroadcastText : public RavelDumpTest {
 protected:
  // What the tool prints on standard output when run quietly with `args`.
  std::string Output(std::vector<std::string> args) const {
    args.insert(args.begin(), "-q");
    return Run(args).out;
  }

  nlohmann::json JsonSummary(std::vector<std::string> args) const {
    args.insert(args.begin(), "--json");
    return nlohmann::json::parse(Output(args), nullptr, false);
  }

  // A file of one SDT section whose one service is named `name`.
  std::string SdtFileNaming(const std::string& name) const {
    sb::SectionOptions options;
    options.tableId = 0x42;
    options.tableIdExtension = 0x0001;
    Bytes descriptor = sb::Descriptor(0x48, sb::Cat({sb::U8(0x01), sb::U8(0), sb::U8(name.size()), sb::Text(name)}));
    Bytes service = sb::Cat({sb::U16(0x0101), sb::U8(0xFD), sb::U16(0x8000 | descriptor.size()), descriptor});
    return Write("sdt.sections", sb::LongSection(options, sb::Cat({sb::U16(0x0001), sb::U8(0xFF), service})));
  }

  // Whether the tool reads ARIB texts in full. A cross-built tool may not: its
  // target's C library under the emulator has no EUC-JP converter and the
  // target no libaribb24. A native build always does.
  bool ToolDecodesArib() const {
#ifdef RAVEL_DUMP_EMULATOR
    nlohmann::json summary = JsonSummary({"--standard", "japan", "--sections", SdtFileNaming("\x30\x21\x7a\x56")});
    return !summary.is_discarded() && summary["services"][0]["name"] == "亜\U0001F211";
#else
    return true;
#endif
  }
};

TEST_F(BroadcastText, TextsReadInTheCodingOfTheirStandard) {
  struct Case {
    const char* what;
    const char* standard;
    bool rawText = false;
    std::string bytes;
    std::string shown;
  } cases[] = {
      {.what = "middle size makes alphanumerics half-width", .standard = "japan",
       .bytes = "\x89\x0eNHK G\x8a\x0eG", .shown = "NHK G\xef\xbc\xa7"},
      {.what = "APR breaks the line", .standard = "japan", .bytes = "\x0e" "A\x0d" "B",
       .shown = "\xef\xbc\xa1\n\xef\xbc\xa2"},
      {.what = "yen sign and overline of the alphanumeric set", .standard = "japan",
       .bytes = "\x0e\x5c\x7e", .shown = "\xef\xbf\xa5\xef\xbf\xa3"},
      {.what = "iteration marks of hiragana (GR) and katakana (SS3)", .standard = "japan",
       .bytes = "\xf7\xf8\x1d\x77\x1d\x78", .shown = "ゝゞヽヾ"},
      {.what = "katakana designated into G2, invoked in GR", .standard = "japan",
       .bytes = "\x1b\x2a\x31\xa2\xf3", .shown = "アン"},
      {.what = "additional symbol in row 90 of the kanji set", .standard = "japan",
       .bytes = "\x7a\x56", .shown = "\U0001F211"},
      {.what = "JIS X 0201 katakana", .standard = "japan", .bytes = "\x1b\x28\x49\x31", .shown = "\xef\xbd\xb1"},
      {.what = "controls with parameters and DRCS leave no text", .standard = "japan",
       .bytes = "\x90\x20\x41\x0e" "A\x9b\x30\x3b\x31\x20\x53" "B\x1c\x41\x42" "C\x1b\x28\x20\x41\x0f\x21\x0e" "D",
       .shown = "\xef\xbc\xa1\xef\xbc\xa2\xef\xbc\xa3\xef\xbc\xa4"},
      {.what = "code the kanji set does not assign", .standard = "japan", .bytes = "\x22\x2f", .shown = "\xef\xbf\xbd"},
      {.what = "ISO/IEC 8859-15 letters and euro sign", .standard = "brazil",
       .bytes = "\xa4 \xbc\xbd \xe7\xe3o", .shown = "€ Œœ ção"},
      {.what = "ISO/IEC 8859-15 line break and control codes", .standard = "brazil",
       .bytes = "a\x0d\x0a" "b\x05\x86" "c", .shown = "a\nbc"},
      {.what = "raw text keeps the bytes, escaped", .standard = "japan", .rawText = true,
       .bytes = "\x0eNHK\xe3", .shown = "\\x0eNHK\\xe3"},
  };
  const bool decodesArib = ToolDecodesArib();
  for (const Case& c : cases) {
    if (std::string(c.standard) == "japan" && !c.rawText && !decodesArib) {
      std::printf("%s: not checked, the tool has no JIS X 0208 or ARIB symbols for its target\n", c.what);
      continue;
    }
    std::vector<std::string> args = {"--standard", c.standard, "--sections"};
    if (c.rawText) args.push_back("--raw-text");
    args.push_back(SdtFileNaming(c.bytes));
    nlohmann::json summary = JsonSummary(args);
    ASSERT_FALSE(summary.is_discarded()) << c.what;
    EXPECT_EQ(c.shown, summary["services"][0]["name"].get<std::string>()) << c.what;
  }
}

// Expected texts written from the ARIB STD-B24 code tables: ＮＨＫ and digits
// from the alphanumeric set (full-width in normal size), kanji from JIS X 0208
// (総 0x416D, 合 0x3967, 秋 0x3D29, 田 0x4544, 携 0x3748, 帯 0x4253), ・ 0x7E of
// the hiragana set in GR, ニュース by single shifts into katakana, and the
// additional symbols of row 90: [二] cell 58 U+1F214, [字] cell 54 U+1F211,
// [解] cell 60 U+1F216.
TEST_F(BroadcastText, JapaneseCaptureReadsInArib8UnitCode) {
  std::string capture = captures::Path("isdbt-japan-psi.sections");
  if (capture.empty()) GTEST_SKIP() << "shared capture isdbt-japan-psi.sections absent";
  if (!ToolDecodesArib()) GTEST_SKIP() << "the tool has no JIS X 0208 or ARIB symbols for its target";
  nlohmann::json summary = JsonSummary({"--sections", capture});
  struct Case {
    const char* member;  // JSON pointer
    nlohmann::json shown;
  } cases[] = {
      {.member = "/network/name", .shown = "秋田０"},
      {.member = "/network/transport_streams/0/name", .shown = "ＮＨＫ総合・秋田"},
      {.member = "/services/0/name", .shown = "ＮＨＫ総合１・秋田"},
      {.member = "/services/1/name", .shown = "ＮＨＫ総合２・秋田"},
      {.member = "/services/3/name", .shown = "ＮＨＫ携帯Ｇ・秋田"},
      {.member = "/services/0/present/name", .shown = "ＮＨＫニュース７\U0001F214\U0001F211"},
      {.member = "/services/0/following/name",
       .shown = "ダーウィンが来た！「波乱のライオン学園に潜入！百獣の王を養成！！」\U0001F216\U0001F211"},
      {.member = "/services/0/present/start", .shown = "2020-04-05T19:00:00+09:00"},
      // The PAT's order: the one-segment service comes last.
      {.member = "/services/3/one_segment", .shown = true},
      {.member = "/services/3/pmt_pid", .shown = 8136},
  };
  for (const Case& c : cases) {
    nlohmann::json::json_pointer member(c.member);
    ASSERT_TRUE(summary.contains(member)) << c.member;
    EXPECT_EQ(c.shown, summary[member]) << c.member;
  }
  // The dump shows the same texts inside the library's own lines.
  std::string dump = Output({"--sections", capture});
  EXPECT_NE(std::string::npos, dump.find("\tService Name=[ＮＨＫ総合１・秋田]\n")) << dump;
  EXPECT_NE(std::string::npos, dump.find("Ts Name=[ＮＨＫ総合・秋田], Tx Type Count=")) << dump;
}

// The sample's Latin texts, local times and standard are pinned by its JSON in
// tests/golden.

TEST_F(BroadcastText, StandardIsDetectedFromTheCapture) {
  struct Case {
    const char* capture;
    std::vector<std::string> options;
    const char* standard;
    const char* reason;  // a part of the reason given
    const char* networkName = "";  // "": not checked
  } cases[] = {
      {.capture = "isdbt-japan-psi.sections", .options = {"--sections"}, .standard = "japan",
       .reason = "NIT network id 0x7ED0 in the ARIB terrestrial range"},
      // The option wins; the kanji bytes read as ISO/IEC 8859-15, as an
      // analyser told the wrong standard shows them.
      {.capture = "isdbt-japan-psi.sections", .options = {"--sections", "--standard", "brazil"}, .standard = "brazil",
       .reason = "--standard", .networkName = "=)ED#0"},
      {.capture = "dvb-epg.ts", .options = {}, .standard = "brazil", .reason = "no sign"},
  };
  for (const Case& c : cases) {
    std::string path = captures::Path(c.capture);
    if (path.empty()) {
      std::printf("shared capture %s absent: not checked\n", c.capture);
      continue;
    }
    std::vector<std::string> args = c.options;
    args.push_back(path);
    nlohmann::json summary = JsonSummary(args);
    ASSERT_FALSE(summary.is_discarded()) << c.capture;
    EXPECT_EQ(c.standard, summary["standard"].get<std::string>()) << c.capture;
    EXPECT_NE(std::string::npos, summary["standard_reason"].get<std::string>().find(c.reason))
        << c.capture << ": " << summary["standard_reason"];
    if (*c.networkName) {
      EXPECT_EQ(c.networkName, summary["network"]["name"].get<std::string>());
    }
  }
}

}  // namespace

#endif
