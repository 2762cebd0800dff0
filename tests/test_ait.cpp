// Application information table: application records, resolution codes, the
// descriptor tag table, texts, failures, copies and merge, and real sections.
#include <gtest/gtest.h>

#include <cstdio>
#include <cstring>
#include <set>
#include <string>
#include <vector>

#include "Captures.h"
#include "Ravel_CTableAIT.h"
#include "Ravel_ResultCode.h"
#include "StreamBuilder.h"
#include "TestHelpers.h"
#include "TraceRecorder.h"

using namespace th;

namespace {

const unsigned int kInfo = kWarning;  // the AIT reports at the information level

const char kProcess[] = "RavelCAIT::processDescriptors...\n";
const char kUnsupportedResolution[] = "Document resolution not supported!!\n";

std::string Field(const char* field, size_t size) { return std::string(field, strnlen(field, size)); }

// organization_id, application_id, control code, the resolution nibble and the
// application's descriptor loop.
Bytes App(unsigned int org, unsigned int appId, unsigned int control, uint8_t resolution,
          const std::vector<Bytes>& descriptors) {
  return sb::Cat({sb::U32(org), sb::U16(appId), sb::U8(control), sb::DescriptorLoop(descriptors, resolution)});
}

Bytes AitBody(const std::vector<Bytes>& apps, const std::vector<Bytes>& common = {}) {
  return sb::Cat({sb::DescriptorLoop(common), sb::DescriptorLoop(apps)});
}

Bytes Ait(const Bytes& body, uint8_t version = 3, bool corruptCrc = false, uint8_t tableId = 0x74) {
  sb::SectionOptions o;
  o.tableId = tableId;
  o.tableIdExtension = 0x0010;  // application_type: Ginga-NCL
  o.version = version;
  o.corruptCrc = corruptCrc;
  return sb::LongSection(o, body);
}

Bytes Name(const std::string& name) {
  return sb::Descriptor(0x01, sb::Cat({sb::Text("por"), sb::U8(static_cast<unsigned int>(name.size())), sb::Text(name)}));
}

Bytes Location(const std::string& base, const std::string& classPath, const std::string& initial) {
  return sb::Descriptor(0x07, sb::Cat({sb::U8(static_cast<unsigned int>(base.size())), sb::Text(base),
                                       sb::U8(static_cast<unsigned int>(classPath.size())), sb::Text(classPath),
                                       sb::Text(initial)}));
}

std::string ParseLine(const unsigned char* section) {
  char text[64];
  std::snprintf(text, sizeof(text), "RavelCAIT::ParseRawData... apRawData=[%p]\n", static_cast<const void*>(section));
  return text;
}

// The header lines of the table base's Show.
TraceLines HeaderShown(RavelCAIT& ait) {
  TraceRecorder recorder;
  ait.RavelCTableBase::Show();
  return recorder.Lines();
}

GingaAITApplicationType& At(RavelCAIT& ait, int index) { return (*ait.GetApplicationList())[index]; }

// Parses `section` into `ait`, which then holds `count` applications; gives the
// traces that follow the parse's own first line, which is checked here.
TraceLines Parsed(RavelCAIT& ait, const Bytes& section, int count = 1) {
  TraceRecorder recorder;
  EXPECT_EQ(kRavelOk, ait.ParseRawData(const_cast<unsigned char*>(section.data())));
  EXPECT_EQ(count, ait.GetApplicationList()->iCount);
  TraceLines lines = recorder.Lines();
  const bool parseLineFirst = !lines.empty() && lines.front() == TraceLines::value_type(kInfo, ParseLine(section.data()));
  EXPECT_TRUE(parseLineFirst);
  if (parseLineFirst) lines.erase(lines.begin());
  return lines;
}

}  // namespace

TEST(AitParse, MapsTheResolutionNibbleAndKeepsUnsupportedApplications) {
  struct Case {
    uint8_t code;
    int resolution;
  } cases[] = {{0xC, 1}, {0xB, 2}, {0x0, 3}, {0xF, 0}, {0x1, 0}, {0xA, 0}, {0xD, 0}};
  for (const Case& c : cases) {
    SCOPED_TRACE(int(c.code));
    RavelCAIT ait;
    EXPECT_EQ((c.resolution ? TraceLines{} : TraceLines{{kError, kUnsupportedResolution}}),
              Parsed(ait, Ait(AitBody({App(0x0000000B, 0x1AB5, 0x01, c.code, {})}))));
    EXPECT_EQ(c.resolution, At(ait, 0).iDocumentResolution);
    EXPECT_EQ((std::vector<unsigned int>{0x0B, 0x1AB5, 0x01}),
              (std::vector<unsigned int>{At(ait, 0).iOrganizationId, At(ait, 0).iApplicationId,
                                         At(ait, 0).iApplicationControlCode}));
  }
}

TEST(AitParse, ReportsEachDescriptorTagAsItsTableSays) {
  struct Case {
    uint8_t tag;
    const char* name;  // null: reported invalid
  } cases[] = {{0x00, "APPLICATION_DESCRIPTOR"}, {0x02, "APPLICATION_TRANSP_PROT_DESCRIPTOR"}, {0x03, nullptr},
               {0x04, nullptr}, {0x05, "APPLICATION_AUTH_EXT_DESCRIPTOR"}, {0x06, "APPLICATION_GINGA_APP_DESCRIPTOR"},
               {0x08, nullptr}, {0x09, nullptr}, {0x0A, nullptr}, {0x0B, "APPLICATION_ICON_DESCRIPTOR"},
               {0x0C, "APPLICATION_PREFETCH_DESCRIPTOR"}, {0x0D, "APPLICATION_DII_LOCATION_DESCRIPTOR"}, {0x0E, nullptr},
               {0x40, nullptr}, {0xFD, "APPLICATION_DATA_COMPONENT_DESCRIPTOR"}, {0xFE, nullptr}};
  for (const Case& c : cases) {
    SCOPED_TRACE(int(c.tag));
    // A body that every class could read as text: nothing of it may reach the record.
    Bytes descriptor = sb::Descriptor(c.tag, sb::Cat({sb::U8(3), sb::Text("abc"), sb::U8(2), sb::Text("de"), sb::Text("fg")}));
    RavelCAIT ait;
    EXPECT_EQ((TraceLines{{kInfo, kProcess},
                          {c.name ? kInfo : kDump, "Detected an " + std::string(c.name ? c.name : "Invalid Descriptor")}}),
              Parsed(ait, Ait(AitBody({App(1, 2, 1, 0xC, {descriptor})}))));
    EXPECT_EQ("", At(ait, 0).szAppName + std::string(At(ait, 0).szAppFilePath) + At(ait, 0).szAppFileName);
  }
}

TEST(AitParse, TakesNameAndLocationTextsAndOverwritesWithoutClearing) {
  // The traces of one descriptor each: they show the record after it.
  auto name = [](const std::string& record) {
    return th::At(kInfo, {kProcess, "Detected an APPLICATION_NAME_DESCRIPTOR", "Application name = " + record});
  };
  auto location = [](const std::string& path, const std::string& file) {
    return th::At(kInfo, {kProcess, "Detected an APPLICATION_GINGA_APP_LOCATION_DESCRIPTOR", "Application path = " + path,
                      "Application filename = " + file});
  };
  struct Case {
    const char* label;
    std::vector<Bytes> descriptors;
    std::string name, path, file;
    std::vector<TraceLines> descriptorTraces;
  } cases[] = {
      {"name and location", {Name("Quiz"), Location("/quiz", "lib", "main.ncl")}, "Quiz", "/quiz", "main.ncl",
       {name("Quiz"), location("/quiz", "main.ncl")}},
      // A shorter second text overwrites only its own length.
      {"second texts shorter",
       {Name("LongerName"), Name("Short"), Location("/a/long/dir", "", "initial.ncl"), Location("/b", "cp", "x")},
       "ShortrName", "/b/long/dir", "xnitial.ncl",
       {name("LongerName"), name("ShortrName"), location("/a/long/dir", "initial.ncl"),
        location("/b/long/dir", "xnitial.ncl")}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    RavelCAIT ait;
    TraceLines expected;
    for (const TraceLines& traces : c.descriptorTraces) Add(expected, traces);
    EXPECT_EQ(expected, Parsed(ait, Ait(AitBody({App(1, 2, 1, 0xC, c.descriptors)}))));
    EXPECT_EQ(c.name, Field(At(ait, 0).szAppName, 255));
    EXPECT_EQ(c.path, Field(At(ait, 0).szAppFilePath, 255));
    EXPECT_EQ(c.file, Field(At(ait, 0).szAppFileName, 256));
  }
}

TEST(AitParse, FullTextsStayInsideTheirFieldsAndPrintTerminated) {
  // 255-byte base directory and initial class name: the location fields are full.
  Bytes location = sb::Cat({Bytes{0x07, 0xFF, 0xFF}, Bytes(255, 'P'), Bytes{0xFF}, Bytes(255, 'C'), Bytes(255, 'F')});
  Bytes descriptors = sb::Cat({Name("App"), location});
  // The loop lengths cover the name and the location's first two bytes; the
  // location's own length byte then carries the position past both loops.
  Bytes app = sb::Cat({sb::U32(1), sb::U16(2), sb::U8(1), sb::Length12(9 + 2, 0xC), descriptors});
  Bytes section = Ait(sb::Cat({sb::Length12(0), sb::Length12(9 + 9 + 2), app}));
  RavelCAIT ait;
  Parsed(ait, section);
  const GingaAITApplicationType& record = At(ait, 0);
  EXPECT_EQ("App", Field(record.szAppName, 255));
  EXPECT_EQ(std::string(255, 'P'), std::string(record.szAppFilePath, 255));
  EXPECT_EQ(std::string(255, 'F'), Field(record.szAppFileName, 256));
  EXPECT_EQ(0, record.szAppFileName[255]);  // the 256th byte keeps the file name terminated
  EXPECT_EQ(1, record.iDocumentResolution);

  TraceRecorder recorder;
  ait.Show();
  std::vector<std::string> dump = recorder.TextsAt(kDump);
  ASSERT_EQ(17u, dump.size());
  EXPECT_EQ((std::vector<std::string>{"\t App Name.........: App", "\t App File Path....: " + std::string(255, 'P'),
                                      "\t App File Name....: " + std::string(255, 'F')}),
            std::vector<std::string>(dump.begin() + 10, dump.begin() + 13));
}

TEST(AitParse, FailuresLeaveNoApplications) {
  Bytes good = Ait(AitBody({App(1, 2, 1, 0xC, {Name("A")}), App(3, 4, 2, 0xB, {})}), 5);
  const std::string crcError = "AIT Section: CRC Error!\n";
  struct Case {
    const char* label;
    Bytes section;  // empty: a null section
    int result;
    std::string message;
    int tableId, version;  // the header afterwards: a CRC failure keeps the previous one
  } cases[] = {
      {"crc", Ait(AitBody({App(9, 9, 1, 0xC, {})}), 7, true), kRavelErrCorruptSection, crcError, 0x74, 5},
      {"null", Bytes(), kRavelErrCorruptSection, crcError, 0x74, 5},
      {"foreign table_id", Ait(AitBody({App(9, 9, 1, 0xC, {})}), 7, false, 0x73), kRavelErrInvalidArgument,
       "Table ID isn't for AIT! Table ID=[0x73]\n", 0x73, 7},
  };
  for (Case& c : cases) {
    SCOPED_TRACE(c.label);
    RavelCAIT ait;
    Parsed(ait, good, 2);
    unsigned char* section = c.section.empty() ? nullptr : c.section.data();
    TraceRecorder recorder;
    EXPECT_EQ(c.result, ait.ParseRawData(section));
    EXPECT_EQ((TraceLines{{kInfo, ParseLine(section)}, {kError, c.message}}), recorder.Lines());
    EXPECT_EQ((std::vector<int>{0, c.tableId, c.version}),
              (std::vector<int>{ait.GetApplicationList()->iCount, ait.iTableId, ait.iVersionNumber}));
  }
}

TEST(AitParse, ReadsTheLoopLengthsOneAfterTheOther) {
  Bytes app1 = App(1, 1, 1, 0xC, {});
  Bytes app2 = App(2, 2, 1, 0xC, {});
  struct Case {
    const char* label;
    std::vector<Bytes> common;
    std::vector<Bytes> apps;
    int count;
  } cases[] = {
      {"empty loop", {}, {}, 0}, {"two applications", {}, {app1, app2}, 2},
      // application_loop_length comes from bytes 10-11, the common descriptor's
      // first two bytes: here 0x0 | 9, so only the first application is read.
      {"common descriptor giving 9", {sb::Descriptor(0x00, Bytes(9, 0xEE))}, {app1, app2}, 1},
      // ... and here 0x0 | 0: no application at all.
      {"common descriptor giving 0", {sb::Descriptor(0x10, Bytes())}, {app1, app2}, 0},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    RavelCAIT ait;
    EXPECT_EQ(TraceLines{}, Parsed(ait, Ait(AitBody(c.apps, c.common)), c.count));
    for (int i = 0; i < ait.GetApplicationList()->iCount; ++i) EXPECT_EQ(unsigned(i + 1), At(ait, i).iOrganizationId);
  }
  // A section shorter than the two loop lengths reads them as 0.
  RavelCAIT ait;
  Parsed(ait, Ait(Bytes{0xF0}), 0);
  // A descriptor loop of one byte still takes a whole descriptor, whose length
  // byte is the next application's first: that application is read a byte on.
  RavelCAIT late;
  Parsed(late, Ait(AitBody({App(1, 1, 1, 0xC, {Bytes{0x02}}), app2})), 2);
  EXPECT_EQ(0x200u, At(late, 1).iOrganizationId);
  // An application loop of one byte still gives an application, read as zeros past that byte.
  RavelCAIT single;
  Parsed(single, Ait(AitBody({Bytes{0x00}})), 1);
  EXPECT_EQ(0u, At(single, 0).iOrganizationId);
}

TEST(AitParse, SecondSectionReplacesTheListInPlace) {
  RavelCAIT ait;
  RavelCArray<GingaAITApplicationType>* list = ait.GetApplicationList();
  Parsed(ait, Ait(AitBody({App(1, 1, 1, 0xC, {Name("one")}), App(2, 2, 1, 0xC, {}), App(3, 3, 1, 0xC, {})})), 3);
  Parsed(ait, Ait(AitBody({App(7, 7, 2, 0xB, {})}), 4));
  EXPECT_EQ(list, ait.GetApplicationList());
  EXPECT_EQ(7u, (*list)[0].iOrganizationId);
  EXPECT_STREQ("", (*list)[0].szAppName);  // each record starts cleared
  EXPECT_EQ(2, (*list)[0].iDocumentResolution);
  EXPECT_EQ(4, ait.iVersionNumber);
}

TEST(AitCopy, CopiesTheHeaderButNoApplicationsAndMergesNothing) {
  Bytes three = Ait(AitBody({App(1, 1, 1, 0xC, {}), App(2, 2, 1, 0xC, {}), App(3, 3, 1, 0xC, {})}), 6);
  RavelCAIT source, target;
  Parsed(source, three, 3);
  Parsed(target, Ait(AitBody({App(8, 8, 1, 0xC, {}), App(9, 9, 1, 0xC, {})}), 2), 2);
  source.iSession = 0x5A;
  source.SetTableName("AIT");
  const TraceLines header = HeaderLines(0x74, "AIT", 1, static_cast<int>(three.size()) - 3, 0x0010, 6, 1, 0, 0, 0x5A);
  RavelCAIT copy(source);
  EXPECT_EQ(0, copy.GetApplicationList()->iCount);
  EXPECT_EQ(8, copy.GetApplicationList()->iMaxCount);
  EXPECT_EQ(header, HeaderShown(copy));
  // Assignment takes the header and leaves the target's own applications.
  target = source;
  EXPECT_EQ(header, HeaderShown(target));
  EXPECT_EQ(2, target.GetApplicationList()->iCount);
  EXPECT_EQ(9u, At(target, 1).iOrganizationId);
  // A merge appends nothing; another version is only traced.
  for (uint8_t version : {6, 2}) {
    RavelCAIT other;
    Parsed(other, Ait(AitBody({App(5, 5, 1, 0xC, {})}), version));
    TraceRecorder recorder;
    EXPECT_EQ(&source, &(source += other));
    EXPECT_EQ((version == 6 ? TraceLines{} : TraceLines{{kError, "Two AIT Information have different information!\n"}}),
              recorder.Lines());
    EXPECT_EQ(3, source.GetApplicationList()->iCount);
  }
}

TEST(AitShow, DumpsHeaderAndApplicationsWithoutLineEnds) {
  Bytes section = Ait(AitBody({App(0x0B, 0x1AB5, 2, 0xC, {Name("Quiz"), Location("/q", "", "main.ncl")})}), 1);
  RavelCAIT ait;
  Parsed(ait, section);
  const std::string rule = Rule(kLongRule);
  TraceLines expected = Dump({rule, "###################### AIT Table Information ######################\n", rule,
                              "####################### Header Information ########################\n"});
  Add(expected, HeaderLines(0x74, "Unknown", 1, section.size() - 3, 0x0010, 1, 1, 0, 0));
  Add(expected, Dump({"####################### Body Information ########################\n", rule,
                      "- - - - - - - - - - - - - - - - Application Information - - - - - - - - - - - - ",
                      "\t App Name.........: Quiz", "\t App File Path....: /q", "\t App File Name....: main.ncl",
                      "\t App orgId........: 11", "\t App appId........: 6837", "\t App control code.: 2",
                      "- - - - - - - - - - - - - - - End of Application Information - - - - - - - - - -"}));
  EXPECT_EQ(expected, ShowLines(ait));
}

TEST(AitCapture, RealSectionsParseAndYieldApplications) {
  Bytes stream;
  RAVEL_LOAD_CAPTURE_OR_SKIP("ait.ts", stream);
  std::set<std::string> names;
  for (unsigned int pid : {0x1EC5, 0x1EC6, 0x1EC7}) {  // named by the capture's PMTs
    for (Bytes& section : captures::SectionsOfPid(stream, pid)) {
      RavelCAIT ait;
      TraceRecorder recorder;
      ASSERT_EQ(kRavelOk, ait.ParseRawData(section.data())) << "PID " << pid;
      for (int i = 0; i < ait.GetApplicationList()->iCount; ++i) {
        names.insert(Field(At(ait, i).szAppName, 255));
        EXPECT_EQ(0, At(ait, i).iDocumentResolution);  // DVB signalling: reserved bits set, no Ginga resolution
      }
    }
  }
  EXPECT_EQ(2u, names.count("Programmi TV BB SAT") + names.count("Launcher SAT"));
}
