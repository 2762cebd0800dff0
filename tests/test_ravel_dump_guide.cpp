// ravel-dump's view of everything on the air, on the shared captures: the
// programme guide (text, JSON, XMLTV), stream events, values as broadcast
// beside the library's reading, tables without a class; every JSON output
// checked against the tool's schema.
#include <gtest/gtest.h>

#include <cstdlib>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include <nlohmann/json.hpp>

#include "Captures.h"
#include "RavelDumpFixture.h"

#ifdef RAVEL_DUMP_PATH

namespace {

using namespace ravel_dump_test;
using nlohmann::json;

// The exit status of a shell command, its output thrown away.
int Shell(const std::string& command) {
  const int status = std::system((command + " >/dev/null 2>&1").c_str());
  return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

class RavelDumpGuideTest : public RavelDumpTest {
 protected:
  // The capture's --json output, or null (with the test skipped) when absent.
  json Json(const std::string& capture) {
    const std::string path = captures::Path(capture);
    if (path.empty()) return nullptr;
    ToolRun run = Run({"-q", "--json", path});
    EXPECT_EQ(0, run.status) << run.err;
    return json::parse(run.out);
  }
};

// The one event of the guide of `summary` of that service and id; null when
// there is none, which fails the test, as more than one does.
json EventOf(const json& summary, int serviceId, int eventId) {
  json found;
  for (const json& e : summary["epg"]) {
    if (e["service_id"] != serviceId || e["event_id"] != eventId) continue;
    EXPECT_TRUE(found.is_null()) << "event " << eventId << " of service " << serviceId << " twice";
    found = e;
  }
  EXPECT_FALSE(found.is_null()) << "no event " << eventId << " of service " << serviceId;
  return found;
}

// A TOT of the broadcast's time, its local time offset changing at the same
// moment, and a descriptor of a tag no standard assigns.
Bytes Tot(int year, int month, int day) {
  Bytes offset = sb::Cat({sb::Text("BRA"), {0x06, 0x03, 0x00}, sb::UtcTime(year, month, day, 12, 34, 56), {0x02, 0x00}});
  return sb::ShortSection(
      0x73,
      sb::Cat({sb::UtcTime(year, month, day, 12, 34, 56),
               sb::DescriptorLoop({sb::Descriptor(0x58, offset), sb::Descriptor(0x9F, {0x01, 0x02})})}),
      /*withCrc=*/true);
}

TEST_F(RavelDumpGuideTest, GuideHoldsEveryEventOfPresentFollowingAndScheduleActualAndOther) {
  json summary = Json("dvb-epg.ts");
  if (summary.is_null()) GTEST_SKIP() << "shared capture dvb-epg.ts absent";
  EXPECT_EQ(346u, summary["epg"].size());
  struct Case {
    int serviceId, eventId;
    int tableId;
    const char* name;
    const char* start;
    const char* stop;
    bool extended;  // has extended event text or items
  } cases[] = {
      {/*serviceId=*/0x0402, /*eventId=*/0x1C, /*tableId=*/0x4E, /*name=*/"NCIS", /*start=*/"2019-01-22T12:35:00-03:00",
       /*stop=*/"2019-01-22T13:25:00-03:00", /*extended=*/true},
      {/*serviceId=*/0x0101, /*eventId=*/0x19, /*tableId=*/0x4F, /*name=*/"Météo 2",
       /*start=*/"2019-01-22T12:42:00-03:00", /*stop=*/"2019-01-22T12:55:00-03:00", /*extended=*/false},
      {/*serviceId=*/0x0401, /*eventId=*/0x0F, /*tableId=*/0x50, /*name=*/"Météo",
       /*start=*/"2019-01-22T01:30:00-03:00", /*stop=*/"2019-01-22T01:35:00-03:00", /*extended=*/false},
  };
  for (const Case& c : cases) {
    const json e = EventOf(summary, c.serviceId, c.eventId);
    if (e.is_null()) continue;
    ExpectMembers({{"table_id", c.tableId}, {"name", c.name}, {"start", c.start}, {"stop", c.stop}}, e);
    EXPECT_EQ(c.extended, !e["extended_text"].get<std::string>().empty() || !e["items"].empty()) << c.name;
  }
  ToolRun text = Run({"-q", "--epg", captures::Path("dvb-epg.ts")});
  ASSERT_EQ(0, text.status) << text.err;
  EXPECT_EQ(0u, text.out.find("Programme guide: 346 events of 31 services")) << text.out.substr(0, 200);
  EXPECT_NE(std::string::npos, text.out.find("Service 0x0101 \"France 2\" of TS 0x0001, network 0x20fa (other stream)\n"
                                             "  2019-01-22\n"
                                             "    12:42-12:55 \"Météo 2\" (event 0x0019, table 0x4f)"));
}

// An EIT schedule section the library's EIT class refuses (0x51) carries one
// event whose extended event descriptors arrive out of order, an item going
// on in the next descriptor without a description.
TEST_F(RavelDumpGuideTest, ScheduleSectionsTheLibraryRefusesJoinTheirExtendedEventDescriptors) {
  auto extended = [](uint8_t number, uint8_t last, const Bytes& items, const std::string& text) {
    const Bytes head = {static_cast<uint8_t>(number << 4 | last), 'p', 'o', 'r', static_cast<uint8_t>(items.size())};
    return sb::Descriptor(0x4E, sb::Cat({head, items, sb::U8(text.size()), sb::Text(text)}));
  };
  const Bytes descriptors = sb::Cat({{0x4D, 9, 'p', 'o', 'r', 3, 'F', 'i', 'm', 1, 'x'},
                                     extended(1, 1, {0, 3, 'i', 's', 't'}, "B"),  // the item goes on
                                     extended(0, 1, {4, 'C', 'a', 's', 't', 2, 'A', 'l'}, "A")});
  // Stream, network, segment_last, last_table_id; event 0x0042 on 2024-05-14
  // (MJD 60444) 20:00:00 for 01:30:00, running.
  const Bytes body = sb::Cat({{0x00, 0x01, 0x00, 0x02, 0x08, 0x51},
                              {0x00, 0x42, 0xEC, 0x1C, 0x20, 0x00, 0x00, 0x01, 0x30, 0x00, 0x80,
                               static_cast<uint8_t>(descriptors.size())},
                              descriptors});
  sb::SectionOptions o;
  o.tableId = 0x51;
  o.tableIdExtension = 0x0641;
  const std::string file = Write("eit.sections", sb::LongSection(o, body));
  ToolRun run = Run({"-q", "--json", "--standard", "brazil", file});
  ASSERT_EQ(0, run.status) << run.err;
  const json epg = json::parse(run.out)["epg"];
  ASSERT_EQ(1u, epg.size()) << run.out;
  ExpectMembers({{"table_id", 0x51}, {"service_id", 0x0641}, {"event_id", 0x42}, {"name", "Fim"},
                 {"start", "2024-05-14T20:00:00-03:00"}, {"stop", "2024-05-14T21:30:00-03:00"},
                 {"items", json::array({{{"description", "Cast"}, {"item", "Alist"}}})}, {"extended_text", "AB"}},
                epg[0]);
}

TEST_F(RavelDumpGuideTest, XmltvGuidePassesTheXmltvValidator) {
  const std::string capture = captures::Path("dvb-epg.ts");
  if (capture.empty()) GTEST_SKIP() << "shared capture dvb-epg.ts absent";
  if (Shell("command -v tv_validate_file") != 0) GTEST_SKIP() << "tv_validate_file (package xmltv-util) absent";
  const std::string guide = Path("guide.xml");
  ToolRun run = Run({"-q", "--xmltv", guide, capture});
  ASSERT_EQ(0, run.status) << run.err;
  EXPECT_EQ("", run.out);
  const std::string xml = ReadFile(guide);
  size_t programmes = 0;
  for (size_t at = xml.find("<programme "); at != std::string::npos; at = xml.find("<programme ", at + 1)) ++programmes;
  EXPECT_EQ(346u, programmes);
  EXPECT_NE(std::string::npos, xml.find("<display-name>France 2</display-name>"));
  // The validator reads the DTD installed with it, not one from the network.
  EXPECT_EQ(0, Shell("XMLTV_SUPPLEMENT=/usr/share/xmltv tv_validate_file " + guide)) << xml.substr(0, 2000);
}

TEST_F(RavelDumpGuideTest, EveryJsonOutputMatchesTheSchema) {
  if (Shell("python3 -c 'import jsonschema'") != 0) GTEST_SKIP() << "python3 jsonschema (package python3-jsonschema) absent";
  struct Case {
    std::string input;
    std::vector<std::string> options;
  } cases[] = {
      {/*input=*/RAVEL_SAMPLES_DIR "/oneseg-brazil.ts", /*options=*/{}},
      {captures::Path("dvb-epg.ts"), {}},
      {captures::Path("object-carousel.ts"), {"--extract-files", Path("files")}},
      {captures::Path("isdbt-japan-psi.sections"), {}},
      {captures::Path("isdb-signalling-mix.sections"), {"--raw-text"}},
      {Write("tot.sections", Tot(2013, 1, 1)), {"--standard", "brazil"}},  // the library's own reading beside
  };
  const std::string validate =
      "python3 -c 'import json, sys, jsonschema; "
      "jsonschema.validate(json.load(open(sys.argv[1])), json.load(open(sys.argv[2])))' ";
  for (const Case& c : cases) {
    if (c.input.empty()) continue;  // a shared capture that is absent
    std::vector<std::string> args = c.options;
    args.insert(args.end(), {"-q", "--json", c.input});
    ToolRun run = Run(args);
    ASSERT_EQ(0, run.status) << c.input << run.err;
    std::ofstream(Path("out.json")) << run.out;
    EXPECT_EQ(0, Shell(validate + Path("out.json") + " " RAVEL_DUMP_SCHEMA)) << c.input;
    EXPECT_EQ(2, json::parse(run.out)["schema_version"]) << c.input;
  }
  // The check itself fails a document the schema does not describe.
  std::ofstream(Path("bad.json")) << "{\"schema_version\": 1}";
  EXPECT_NE(0, Shell(validate + Path("bad.json") + " " RAVEL_DUMP_SCHEMA));
}

TEST_F(RavelDumpGuideTest, StreamEventsGiveTheirIdsNptAndPrivateData) {
  json summary = Json("stream-events-1.ts");
  if (summary.is_null()) GTEST_SKIP() << "shared capture stream-events-1.ts absent";
  // Each version of the event's descriptor once, in the order they came.
  const json& events = summary["stream_descriptors"];
  ASSERT_EQ(4u, events.size()) << events.dump(1);
  ExpectMembers({{"pid", 0x0194}, {"tag", 0x1A}, {"name", "stream event"}, {"event_id", 1}, {"npt", 0},
                 {"version", 1}, {"private_data", "Test Message 2"}},
                events[2]);
}

TEST_F(RavelDumpGuideTest, BroadcastValuesStandBesideTheLibrarysReading) {
  json japan = Json("isdbt-japan-psi.sections");
  if (japan.is_null()) GTEST_SKIP() << "shared capture isdbt-japan-psi.sections absent";
  const json& ts = japan["network"]["transport_streams"][0];
  EXPECT_EQ(json::array({0x4980}), ts["partial_reception"]);
  EXPECT_EQ(json::array({0x49}), ts["library_partial_reception"]);
  ToolRun text = Run({"-q", "--summary", captures::Path("isdbt-japan-psi.sections")});
  EXPECT_NE(std::string::npos, text.out.find("    partial reception: 0x4980 [library reads 0x49]\n")) << text.out;

  // The SDT's original network id as the section carries it (16 bits).
  json dvb = Json("dvb-epg.ts");
  ASSERT_FALSE(dvb.is_null());
  ExpectMembers({{"id", 0x0101}, {"original_network_id", 0x20FA}, {"library_original_network_id", 0x20}},
                dvb["all_services"][0]);

  // Ratings as their country's standard defines them, the rating byte kept.
  ExpectMembers({{"country", "fra"}, {"raw", 0x07}, {"label", "10"}}, EventOf(dvb, 0x0402, 0x1C)["ratings"][0]);
  ExpectMembers({{"country", "fra"}, {"raw", 0x00}, {"label", nullptr}}, EventOf(dvb, 0x0101, 0x19)["ratings"][0]);
}

TEST_F(RavelDumpGuideTest, TablesWithoutAClassAreNamedAndDumpedAsBytes) {
  json summary = Json("isdb-signalling-mix.sections");
  if (summary.is_null()) GTEST_SKIP() << "shared capture isdb-signalling-mix.sections absent";
  std::set<std::pair<int, std::string>> named;
  for (const json& t : summary["tables_without_class"]) {
    named.insert({t["table_id"].get<int>(), t["name"].get<std::string>()});
  }
  const std::set<std::pair<int, std::string>> expected = {
      {0x01, "CAT"},       {0xC2, "PCAT"},           {0xC3, "SDTT"}, {0xC5, "NBIT body"}, {0xC6, "NBIT reference"},
      {0xC7, "LDT"},       {0xC8, "CDT"},            {0xD0, "LIT"},  {0xD1, "ERT"},       {0xD2, "ITT"}};
  EXPECT_EQ(expected, named);
  ToolRun dump = Run({"-q", captures::Path("isdb-signalling-mix.sections")});
  EXPECT_NE(std::string::npos, dump.out.find("(no class in the library for this table_id)\n"
                                             "  CDT section 0, 17 bytes:\n"
                                             "    0000  c8 f0 0e 12 34 c1 00 00 56 78 9a f0 00 81 32 ba  |....4...Vx....2.|\n"
                                             "    0010  63                                               |c|\n"))
      << dump.out;
}

TEST_F(RavelDumpGuideTest, TimesAreIso8601AsBroadcastWithTheLibrarysOwnReadingBeside) {
  struct Case {
    int year, month, day;
    const char* iso;
    json library;  // null where the library reads the same
  } cases[] = {
      {/*year=*/2024, /*month=*/5, /*day=*/14, /*iso=*/"2024-05-14T12:34:56-03:00", /*library=*/nullptr},
      // The library's date rule gives 1 January 2013 as 32 December 2012.
      {/*year=*/2013, /*month=*/1, /*day=*/1, /*iso=*/"2013-01-01T12:34:56-03:00",
       /*library=*/{{"year", 2012}, {"month", 12}, {"day", 32}, {"hour", 12}, {"minute", 34}, {"second", 56}}},
  };
  for (const Case& c : cases) {
    const std::string file = Write("tot.sections", Tot(c.year, c.month, c.day));
    ToolRun run = Run({"-q", "--json", "--standard", "brazil", file});
    ASSERT_EQ(0, run.status) << run.err;
    const json time = json::parse(run.out)["time"];
    ExpectMembers({{"time", c.iso}, {"library_time", c.library}}, time);
    ExpectMembers({{"time_of_change", c.iso}, {"library_time_of_change", c.library}}, time["local_time_offsets"][0]);
  }
}

TEST_F(RavelDumpGuideTest, DefaultDumpListsTheDescriptorsTheLibrarySkips) {
  struct Case {
    std::string input;
    const char* listed;
  } cases[] = {
      {/*input=*/Write("tot.sections", Tot(2024, 5, 14)),
       /*listed=*/"  skipped descriptor 0x9f (unknown descriptor), length 2\n"},
      {captures::Path("isdbt-japan-psi.sections"),
       "  skipped descriptor 0x09 (conditional access), length 4\n"
       "  skipped descriptor 0xf6 (access control), length 4, 3 times\n"
       "  skipped descriptor 0xc1 (digital copy control), length 1\n"
       "  skipped descriptor 0xc8 (video decode control), length 1\n== PMT"},
  };
  for (const Case& c : cases) {
    if (c.input.empty()) continue;  // a shared capture that is absent
    ToolRun dump = Run({"-q", c.input});
    ASSERT_EQ(0, dump.status) << dump.err;
    EXPECT_NE(std::string::npos, dump.out.find(c.listed)) << c.input;
  }
}

}  // namespace

#endif  // RAVEL_DUMP_PATH
