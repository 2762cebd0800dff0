// Event information table and its event records.
#include <gtest/gtest.h>

#include <map>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "Captures.h"
#include "Ravel_ByteOrder.h"
#include "Ravel_CDescriptorAudioComponent.h"
#include "Ravel_CDescriptorComponent.h"
#include "Ravel_CDescriptorContent.h"
#include "Ravel_CDescriptorCopyright.h"
#include "Ravel_CDescriptorExtendedEvent.h"
#include "Ravel_CDescriptorParentalRating.h"
#include "Ravel_CDescriptorSeries.h"
#include "Ravel_CDescriptorShortEvent.h"
#include "Ravel_CTableEIT.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Util.h"
#include "StreamBuilder.h"
#include "TableChecks.h"
#include "TestHelpers.h"
#include "TraceRecorder.h"

using namespace th;

namespace {

const std::string kRule = Rule(kLongRule);
const std::string kParseFail = "EIT Info Parsing Fail! Maybe data has been corrupted!\n";

// ---------------------------------------------------------------------------
// Builders

Bytes ShortEvent(const std::string& name, const std::string& text = "") {
  return sb::Descriptor(0x4D,
                        sb::Cat({sb::Text("jpn"), sb::U8(name.size()), sb::Text(name), sb::U8(text.size()), sb::Text(text)}));
}

Bytes ExtendedEvent(unsigned int number, unsigned int last, const std::string& text) {
  return sb::Descriptor(
      0x4E, sb::Cat({sb::U8(number << 4 | last), sb::Text("jpn"), sb::U8(0), sb::U8(text.size()), sb::Text(text)}));
}

// stream_content 2 (audio), main component, quality 1, sampling rate 7.
Bytes AudioComponent(uint8_t componentTag) {
  return sb::Descriptor(0xC4, sb::Cat({Bytes{0xF2, 0x03, componentTag, 0x0F, 0xFF, 0x5F}, sb::Text("jpn")}));
}

Bytes Component(uint8_t tag) { return sb::Descriptor(0x50, sb::Cat({Bytes{0xF1, 0xB3, tag}, sb::Text("jpn")})); }

Bytes Content(uint8_t genre) { return sb::Descriptor(0x54, sb::Cat({sb::U8(genre), sb::U8(0xFF)})); }

Bytes ParentalRating(uint8_t rating) { return sb::Descriptor(0x55, sb::Cat({sb::Text("BRA"), sb::U8(rating)})); }

Bytes Copyright(uint32_t id) { return sb::Descriptor(0x0D, sb::Cat({sb::U32(id), sb::Text("(c)")})); }

Bytes Series(uint16_t seriesId, const std::string& name) {
  return sb::Descriptor(0xD5, sb::Cat({sb::U16(seriesId), Bytes{0x11, 0xE4, 0xCD, 0x00, 0x10, 0x02}, sb::Text(name)}));
}

Bytes DigitalCopyControl() { return sb::Descriptor(0xC1, sb::U8(0x84)); }

struct EventRecord {
  uint16_t eventId;
  Bytes start;     // 16-bit MJD and three BCD bytes
  Bytes duration;  // three BCD bytes
  uint8_t runningStatus;
  uint8_t freeCAMode;
  std::vector<Bytes> descriptors;
};

Bytes EventBytes(const EventRecord& e) {
  Bytes d = sb::Cat(e.descriptors);
  return sb::Cat({sb::U16(e.eventId), e.start, e.duration,
                  sb::Length12(d.size(), static_cast<uint8_t>(e.runningStatus << 1 | e.freeCAMode)), d});
}

Bytes At(int year, int month, int day, int hour, int minute, int second = 0) {
  return sb::UtcTime(year, month, day, hour, minute, second);
}

Bytes Duration(int hours, int minutes, int seconds = 0) { return Bytes{sb::Bcd(hours), sb::Bcd(minutes), sb::Bcd(seconds)}; }

// An event at `start` lasting 30 minutes, with descriptors.
EventRecord Ev(uint16_t eventId, const Bytes& start, const std::vector<Bytes>& descriptors = {}) {
  return EventRecord{eventId, start, Duration(0, 30), 4, 0, descriptors};
}

struct EitOptions {
  uint8_t tableId = 0x4E;
  uint16_t serviceId = 0x4800;
  uint8_t version = 4;
  uint8_t sectionNumber = 0;
  uint8_t lastSectionNumber = 1;
  uint16_t transportStreamId = 0x7ED0;
  uint16_t originalNetworkId = 0x7ED1;
  uint8_t segmentLastSectionNumber = 1;
  uint8_t lastTableId = 0x4E;
  bool corruptCrc = false;
};

Bytes EitSection(const EitOptions& options, const Bytes& events) {
  sb::SectionOptions sectionOptions;
  sectionOptions.tableId = options.tableId;
  sectionOptions.tableIdExtension = options.serviceId;
  sectionOptions.version = options.version;
  sectionOptions.sectionNumber = options.sectionNumber;
  sectionOptions.lastSectionNumber = options.lastSectionNumber;
  sectionOptions.corruptCrc = options.corruptCrc;
  return sb::LongSection(sectionOptions,
                         sb::Cat({sb::U16(options.transportStreamId), sb::U16(options.originalNetworkId),
                                  sb::U8(options.segmentLastSectionNumber), sb::U8(options.lastTableId), events}));
}

Bytes EitSection(const EitOptions& options, const std::vector<EventRecord>& events) {
  Bytes all;
  for (const EventRecord& e : events) sb::Append(all, EventBytes(e));
  return EitSection(options, all);
}

// ---------------------------------------------------------------------------
// Readers

typedef std::vector<int> Ints;

// year, month, day, hour, minute, second, and the three remaining fields.
Ints TimeOf(const RavelCDateTime& t) {
  return {t.iYear, t.iMonth, t.iDay, t.iHour, t.iMinute, t.iSecond, t.iMilliSecond, t.iDayOfWeek, t.iTimeZone};
}

std::vector<int> EventIds(RavelCEIT& eit) {
  std::vector<int> ids;
  for (int i = 0; i < eit.GetEventCount(); ++i) ids.push_back(eit.GetEventInfo(i)->iEventId);
  return ids;
}

// One line naming what an event holds, kind by kind, in the dump order.
std::string Holdings(RavelCEventInfo& e) {
  std::string s = e.pShortEventDescriptor ? "short:" + std::string(e.pShortEventDescriptor->GetEventName()) + " " : "";
  auto add = [&](const char* kind, int value) { s += kind + std::to_string(value) + " "; };
  if (e.pContentDescriptor) add("content:", e.pContentDescriptor->pGenre[0]);
  if (e.pComponentDescriptor) add("component:", e.pComponentDescriptor->GetComponentTag());
  if (e.pParentalRatingDescriptor) add("rating:", e.pParentalRatingDescriptor->GetParentalRating(0)->GetMinimumAge());
  for (int i = 0; i < e.GetAudioComponentCount(); ++i) add("audio:", e.GetAudioComponent(i)->GetComponentTag());
  if (e.pCopyrightDescriptor) add("copyright:", e.pCopyrightDescriptor->GetCopyrightId());
  if (e.pExtendedEventDescriptor) add("extended:", e.pExtendedEventDescriptor->GetDescriptorNumber());
  if (e.pSeriesDescriptor) add("series:", e.pSeriesDescriptor->GetSeriesId());
  return s;
}

}  // namespace

// ---------------------------------------------------------------------------
// Event fields

TEST(EITEventFields, StartTimesFollowTheDateRuleAndBcdIsNotValidated) {
  struct Case {
    const char* label;
    Bytes start;
    Bytes duration;
    uint8_t flags;  // running_status and free_CA_mode nibble
    Ints time;
    Ints duration3;
    int runningStatus;
    int freeCA;
  } cases[] = {
      {"leap day", At(2012, 2, 29, 23, 59, 59), Duration(1, 0, 5), 0x9, {2012, 2, 29, 23, 59, 59, 0, 0, 0}, {1, 0, 5}, 4, 1},
      {"1 January: previous year's 32 December", At(2013, 1, 1, 0, 0), Duration(0, 1), 0x2,
       {2012, 12, 32, 0, 0, 0, 0, 0, 0}, {0, 1, 0}, 1, 0},
      {"BCD digits unchecked", Bytes{0xE4, 0x89, 0x99, 0x9A, 0xFF}, Bytes{0xFF, 0x9A, 0x99}, 0x1,
       {2019, 1, 22, 99, 100, 165, 0, 0, 0}, {165, 100, 99}, 0, 1},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes events = sb::Cat({sb::U16(0x1234), c.start, c.duration, Bytes{static_cast<uint8_t>(c.flags << 4), 0x00}});
    Bytes section = EitSection(EitOptions(), events);
    RavelCEIT eit(section.data());
    RavelCEventInfo* e = eit.GetEventInfo(0);
    EXPECT_EQ(c.time, TimeOf(e->cStartTime));
    EXPECT_EQ(c.duration3, (Ints{e->iDurationHour, e->iDurationMinute, e->iDurationSecond}));
    EXPECT_EQ(c.runningStatus, e->iRunningStatus);
    EXPECT_EQ(c.freeCA, e->bFreeCAMode);
  }
}

TEST(EITEventFields, ComparisonsOrderByStartTime) {
  Bytes earlyRaw = EventBytes(Ev(1, At(2020, 4, 5, 19, 0)));
  Bytes lateRaw = EventBytes(Ev(2, At(2020, 4, 5, 19, 30)));
  RavelCEventInfo early(earlyRaw.data()), late(lateRaw.data());
  auto order = [](RavelCEventInfo& a, RavelCEventInfo& b) { return Ints{a < b, a <= b, a > b, a >= b}; };
  EXPECT_EQ((Ints{1, 1, 0, 0}), order(early, late));
  EXPECT_EQ((Ints{0, 0, 1, 1}), order(late, early));
  EXPECT_EQ((Ints{0, 1, 0, 1}), order(early, early));
}

// ---------------------------------------------------------------------------
// Event descriptors

TEST(EITEventDescriptors, LastOfEachKindWinsAndEveryAudioComponentIsKept) {
  struct Case {
    const char* label;
    std::vector<Bytes> descriptors;
    std::string holdings;
    std::vector<std::string> warnings;
  } cases[] = {
      {"every kept kind, in wire order unlike the dump order",
       {Series(77, "S"), AudioComponent(0x10), Copyright(9), ExtendedEvent(0, 0, "ext"), ParentalRating(0x02),
        Component(0x00), Content(0x12), ShortEvent("News")},
       "short:News content:18 component:0 rating:10 audio:16 copyright:9 extended:0 series:77 ",
       {"raw genre = 0x12!\n"}},
      {"two short events and three extended ones: the last of each",
       {ShortEvent("First"), ExtendedEvent(0, 2, "a"), ShortEvent("Second"), ExtendedEvent(1, 2, "b"),
        ExtendedEvent(2, 2, "c")}, "short:Second extended:2 ", {}},
      {"repeated single kinds interleaved with audio components, all kept in arrival order",
       {Component(1), AudioComponent(0x11), Component(2), Content(0x20), AudioComponent(0x10), Content(0x30),
        ParentalRating(0x03), ParentalRating(0x04), Copyright(1), Copyright(2), Series(1, "a"), Series(2, "b")},
       "content:48 component:2 rating:14 audio:17 audio:16 copyright:2 series:2 ",
       {"raw genre = 0x20!\n", "raw genre = 0x30!\n"}},
      {"digital copy control and unknown tags are traced, not kept",
       {DigitalCopyControl(), ShortEvent("N"), sb::Descriptor(0xD6, Bytes{0x11, 0x48, 0x00, 0x0E, 0xDD})}, "short:N ",
       {"EIT EventInfo Parsing.. Digital Copy Control Descriptor Tag=[0xc1]\n",
        "EIT EventInfo Parsing.. Unknown Descriptor Tag=[0xd6]\n"}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes section = EitSection(EitOptions(), {Ev(7, At(2020, 4, 5, 19, 0), c.descriptors)});
    TraceRecorder recorder;
    RavelCEIT eit(section.data());
    EXPECT_EQ(At(kWarning, c.warnings), recorder.Lines());
    ASSERT_EQ(1, eit.GetEventCount());
    EXPECT_EQ(c.holdings, Holdings(*eit.GetEventInfo(0)));
    EXPECT_EQ(sb::Cat(c.descriptors).size(), eit.GetEventInfo(0)->iDescriptorsLoopLength);
  }
}

TEST(EITEventDescriptors, ReparseReplacesAndFailureReleasesTheAudioList) {
  Bytes rich = EventBytes(Ev(1, At(2020, 4, 5, 19, 0), {ShortEvent("A"), AudioComponent(0x10), AudioComponent(0x11)}));
  Bytes bare = EventBytes(Ev(2, At(2020, 4, 5, 19, 30)));
  Bytes broken = EventBytes(Ev(3, At(2020, 4, 5, 20, 0), {ShortEvent("B"), AudioComponent(0x12), Bytes{0x54, 0x00}}));
  RavelCEventInfo event(rich.data());
  EXPECT_EQ(kRavelOk, event.ParseRawData(bare.data()));
  EXPECT_EQ("", Holdings(event));

  // A zero-length descriptor clears everything and frees the list itself.
  TraceRecorder recorder;
  EXPECT_EQ(kRavelErrCorruptSection, event.ParseRawData(broken.data()));
  EXPECT_EQ((TraceLines{{kWarning, Invalid(0x54, 0)}}), recorder.Lines());
  EXPECT_EQ(nullptr, event.pAudioComponentList);
  EXPECT_EQ(nullptr, event.pShortEventDescriptor);
  EXPECT_EQ(0, event.iEventId);
  EXPECT_EQ(0, event.iDescriptorsLoopLength);
  EXPECT_EQ(Ints(9, 0), TimeOf(event.cStartTime));
  EXPECT_EQ(nullptr, event.GetAudioComponent(0));
  // Without a list the event still dumps and copies; a copy gets a list of its own.
  EXPECT_EQ(6u, ShowLines(event).size());
  EXPECT_NE(nullptr, RavelCEventInfo(event).pAudioComponentList);

  EXPECT_EQ(kRavelOk, event.ParseRawData(rich.data()));
  EXPECT_EQ("short:A audio:16 audio:17 ", Holdings(event));
  // Null: fields cleared, no descriptors, an empty list; parsing never writes iSpare.
  event.iSpare = 0x5A;
  EXPECT_EQ(kRavelErrInvalidArgument, event.ParseRawData(nullptr));
  EXPECT_EQ(0, event.iRunningStatus);
  EXPECT_EQ("", Holdings(event));
  EXPECT_NE(nullptr, event.pAudioComponentList);
  EXPECT_EQ(0x5A, event.iSpare);
}

TEST(EITEventDescriptors, CopiesAreDeepAndSelfAssignmentDropsTheDescriptors) {
  Bytes raw = EventBytes(EventRecord{0x0EDE, At(2020, 4, 5, 19, 30), Duration(0, 30), 2, 1,
                                     {ShortEvent("Name", "Text"), Content(0x82), Component(0xB3), ParentalRating(0x05),
                                      AudioComponent(0x10), AudioComponent(0x11), Copyright(4),
                                      ExtendedEvent(1, 1, "more"), Series(9, "Series")}});
  Bytes other = EventBytes(Ev(5, At(2021, 1, 1, 0, 0), {AudioComponent(0x20), ShortEvent("Old")}));
  tc::ExpectCopies<RavelCEventInfo>(raw.data(), other.data(), [](RavelCEventInfo& e) { e.iSpare = 0x33; },
                                     [](RavelCEventInfo& copy, const TraceLines& shown) {
                                       EXPECT_EQ(shown, ShowLines(copy));  // every field and descriptor
                                       EXPECT_EQ(0x33, copy.iSpare);
                                     });

  // The list's count is 8 bits wide: of 257 audio components a copy and the
  // dump take one, although the list holds (and releases) all of them.
  std::vector<Bytes> many(257, AudioComponent(0x30));
  many.front() = AudioComponent(0x31);
  Bytes crowded = EventBytes(Ev(6, At(2020, 4, 5, 19, 0), many));
  RavelCEventInfo full(crowded.data());
  EXPECT_EQ(0x30, full.GetAudioComponent(256)->GetComponentTag());
  RavelCEventInfo fullCopy(full);
  EXPECT_EQ("audio:49 ", Holdings(fullCopy));

  // Assigning an event to itself releases its descriptors before reading them.
  RavelCEventInfo self(raw.data());
  self = self;
  EXPECT_EQ("", Holdings(self));
  EXPECT_EQ(0x0EDE, self.iEventId);
}

// ---------------------------------------------------------------------------
// Table parse

namespace {

// Service 0x4801, version 9, body fields unlike the defaults; the second event
// holds `descriptors`.
Bytes Candidate(uint8_t tableId, const std::vector<Bytes>& descriptors = {}, bool corruptCrc = false) {
  EitOptions options;
  options.tableId = tableId;
  options.serviceId = 0x4801;
  options.version = 9;
  options.transportStreamId = 0x1111;
  options.originalNetworkId = 0x2222;
  options.segmentLastSectionNumber = 8;
  options.lastTableId = 0x51;
  options.corruptCrc = corruptCrc;
  return EitSection(options, {Ev(2, At(2020, 4, 5, 20, 0), {ShortEvent("ok")}), Ev(3, At(2020, 4, 5, 21, 0), descriptors)});
}

TraceLines Foreign(const char* id) { return {{kError, std::string("Table ID isn't for EIT! Table ID=[") + id + "]\n"}}; }

}  // namespace

Bytes StrayByteBeforeCrc() {
  Bytes section = Candidate(0x4F);
  section.insert(section.end() - 4, 0x01);
  section[2] = static_cast<uint8_t>(section[2] + 1);
  sb::FixCrc(section);
  return section;
}

TEST(EITParse, AcceptsItsTableIdsAndFailuresClearTheEventsAndBodyFields) {
  const TraceLines crcError{{kWarning, "EIT Section: CRC Error!\n"}};
  struct Case {
    const char* label;
    Bytes section;  // empty: null
    int result;
    TraceLines traces;
    bool headerRead;
    const char* name;  // a refused table_id leaves the earlier one, and the EIT's own table_id
    int eitTableId;
  } cases[] = {
      {"0x4D", Candidate(0x4D), kRavelErrInvalidArgument, Foreign("0x4d"), true, "EIT Actual", 0x4E},
      {"0x4E", Candidate(0x4E), kRavelOk, {}, true, "EIT Actual", 0x4E},
      {"0x4F", Candidate(0x4F), kRavelOk, {}, true, "EIT Other", 0x4F},
      {"0x50", Candidate(0x50), kRavelOk, {}, true, "EIT schedule Actual", 0x50},
      {"0x51", Candidate(0x51), kRavelErrInvalidArgument, Foreign("0x51"), true, "EIT Actual", 0x4E},
      {"0x5F", Candidate(0x5F), kRavelErrInvalidArgument, Foreign("0x5f"), true, "EIT Actual", 0x4E},
      {"0x60", Candidate(0x60), kRavelOk, {}, true, "EIT schedule Other", 0x60},
      {"0x6F", Candidate(0x6F), kRavelOk, {}, true, "EIT schedule Other", 0x6F},
      {"0x70", Candidate(0x70), kRavelErrInvalidArgument, Foreign("0x70"), true, "EIT Actual", 0x4E},
      {"null", Bytes(), kRavelErrInvalidArgument, {}, false, "EIT Actual", 0x4E},
      {"bad CRC: the header is not parsed", Candidate(0x4F, {}, true), kRavelErrCorruptSection, crcError, false,
       "EIT Actual", 0x4E},
      {"the CRC is checked before the table_id", Candidate(0x51, {}, true), kRavelErrCorruptSection, crcError, false,
       "EIT Actual", 0x4E},
      {"zero-length descriptor in the second event", Candidate(0x4F, {Bytes{0x4D, 0x00}}), kRavelErrCorruptSection,
       {{kWarning, Invalid(0x4D, 0)}, {kWarning, kParseFail}}, true, "EIT Other", 0x4F},
      {"descriptor tag 0", Candidate(0x4F, {Bytes{0x00, 0x03, 1, 2, 3}}), kRavelErrCorruptSection,
       {{kWarning, Invalid(0x00, 3)}, {kWarning, kParseFail}}, true, "EIT Other", 0x4F},
  };
  Bytes previous = EitSection(EitOptions(), {Ev(1, At(2020, 4, 5, 19, 0)), Ev(5, At(2020, 4, 5, 19, 30))});
  for (Case& c : cases) {
    SCOPED_TRACE(c.label);
    RavelCEIT eit(previous.data());
    TraceRecorder recorder;
    EXPECT_EQ(c.result, eit.ParseRawData(c.section.empty() ? nullptr : c.section.data()));
    EXPECT_EQ(c.traces, recorder.Lines());
    EXPECT_EQ((c.headerRead ? std::vector<int>{c.section[0], 9, 0x4801} : std::vector<int>{0x4E, 4, 0x4800}),
              (std::vector<int>{eit.iTableId, eit.iVersionNumber, eit.iTableIdExtension}));
    EXPECT_STREQ(c.name, eit.sTableName.GetString());
    EXPECT_EQ(c.eitTableId, eit.iEITTableId);
    const bool ok = c.result == kRavelOk;
    EXPECT_EQ((ok ? std::vector<int>{0x1111, 0x2222, 8, 0x51} : std::vector<int>(4, 0)),
              (std::vector<int>{eit.iTransportStreamId, eit.iOriginalNetworkId, eit.iSegmentLastSectionNumber,
                                eit.iLastTableId}));
    EXPECT_EQ((ok ? std::vector<int>{2, 3} : std::vector<int>{}), EventIds(eit));
  }
  // The event loop runs to the first CRC_32 byte: a stray byte before it starts an event.
  Bytes stray = StrayByteBeforeCrc();
  RavelCEIT withStray(stray.data());
  EXPECT_EQ((std::vector<int>{2, 3, 0x0100 | stray[stray.size() - 4]}), EventIds(withStray));
}

// ---------------------------------------------------------------------------
// Merge

TEST(EITMerge, JoinsMatchingTablesSortedByStartTimeKeepingTiesInOrder) {
  struct Case {
    const char* label;
    std::vector<EventRecord> mine;
    std::vector<EventRecord> theirs;
    std::vector<int> ids;
  } cases[] = {
      {"out of order across sections", {Ev(3, At(2020, 4, 5, 21, 0)), Ev(1, At(2020, 4, 5, 19, 0))},
       {Ev(2, At(2020, 4, 5, 20, 0)), Ev(0, At(2020, 4, 5, 18, 0))}, {0, 1, 2, 3}},
      {"ties: held events before appended ones, each in its order",
       {Ev(10, At(2020, 4, 5, 20, 0)), Ev(11, At(2020, 4, 5, 20, 0)), Ev(12, At(2020, 4, 5, 19, 0))},
       {Ev(20, At(2020, 4, 5, 20, 0)), Ev(21, At(2020, 4, 5, 19, 0)), Ev(22, At(2020, 4, 5, 20, 0))},
       {12, 21, 10, 11, 20, 22}},
      {"the first of a month sorts as day 32 of the month before",
       {Ev(1, At(2013, 3, 1, 0, 0)), Ev(2, At(2013, 2, 28, 23, 0))}, {Ev(3, At(2013, 3, 2, 0, 0))}, {2, 1, 3}},
      {"empty other: the held events are sorted", {Ev(2, At(2020, 4, 5, 21, 0)), Ev(1, At(2020, 4, 5, 19, 0))}, {},
       {1, 2}},
      {"empty target", {}, {Ev(2, At(2020, 4, 5, 21, 0)), Ev(1, At(2020, 4, 5, 19, 0))}, {1, 2}},
  };
  // Table_id, service_id and section numbers are not compared.
  EitOptions theirOptions;
  theirOptions.tableId = 0x4F;
  theirOptions.serviceId = 0x4801;
  theirOptions.sectionNumber = 1;
  theirOptions.segmentLastSectionNumber = 7;
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes a = EitSection(EitOptions(), c.mine);
    Bytes b = EitSection(theirOptions, c.theirs);
    RavelCEIT target(a.data());
    RavelCEIT other(b.data());
    TraceRecorder recorder;
    EXPECT_EQ(&target, &(target += other));
    EXPECT_TRUE(recorder.Lines().empty());
    EXPECT_EQ(c.ids, EventIds(target));
    EXPECT_EQ(static_cast<int>(c.theirs.size()), other.GetEventCount());
    EXPECT_EQ((std::vector<int>{0x4E, 0x4800, 1}),
              (std::vector<int>{target.iTableId, target.iTableIdExtension, target.iSegmentLastSectionNumber}));
  }
}

TEST(EITMerge, RefusesTablesThatDisagreeWithThreeTraceLines) {
  Bytes a = EitSection(EitOptions(), {Ev(2, At(2020, 4, 5, 20, 0)), Ev(1, At(2020, 4, 5, 19, 0))});
  for (int differing = 0; differing < 3; ++differing) {
    SCOPED_TRACE(differing);
    EitOptions options;
    if (differing == 0) options.transportStreamId = 0x7ED2;
    if (differing == 1) options.originalNetworkId = 0x0001;
    if (differing == 2) options.version = 5;
    Bytes b = EitSection(options, {Ev(0, At(2020, 4, 5, 18, 0))});
    RavelCEIT target(a.data());
    RavelCEIT other(b.data());
    TraceRecorder recorder;
    target += other;
    const std::string otherLine = "OTHER: TS ID=[" + std::to_string(options.transportStreamId) + "], Org Network ID=[" +
                                  std::to_string(options.originalNetworkId) + "], VersionNum=[" +
                                  std::to_string(options.version) + "]\n";
    EXPECT_EQ(At(kError, {"Two EIT Information have different information!\n",
                          "THIS: TS ID=[32464], Org Network ID=[32465], VersionNum=[4]\n", otherLine}),
              recorder.Lines());
    EXPECT_EQ((std::vector<int>{2, 1}), EventIds(target));  // not even sorted
  }
}

TEST(EITMerge, TheSameSectionTwiceDoublesItsEventsAsCopies) {
  Bytes a = EitSection(EitOptions(), {Ev(2, At(2020, 4, 5, 20, 0), {ShortEvent("kept"), AudioComponent(9)}),
                                      Ev(1, At(2020, 4, 5, 19, 0))});
  RavelCEIT target(a.data());
  std::unique_ptr<RavelCEIT> again(new RavelCEIT(a.data()));
  target += *again;
  again.reset();
  EXPECT_EQ((std::vector<int>{1, 1, 2, 2}), EventIds(target));
  EXPECT_EQ("short:kept audio:9 ", Holdings(*target.GetEventInfo(3)));
  target += target;  // the count is taken before appending
  EXPECT_EQ((std::vector<int>{1, 1, 1, 1, 2, 2, 2, 2}), EventIds(target));
}

// ---------------------------------------------------------------------------
// Copies

TEST(EITCopy, DeepCopiesWithoutTheTableIdCopyAndSelfAssignmentEmpties) {
  EitOptions options;
  options.tableId = 0x4F;
  options.serviceId = 0x4801;
  options.version = 19;
  options.lastTableId = 0x4F;
  Bytes section = EitSection(options, {Ev(1, At(2020, 4, 5, 19, 0), {ShortEvent("One"), AudioComponent(0x10)}),
                                       Ev(2, At(2020, 4, 5, 19, 30), {ExtendedEvent(0, 0, "Two")})});
  Bytes otherSection = EitSection(EitOptions(), {Ev(7, At(2020, 1, 1, 0, 0))});
  // The table_id the EIT keeps apart is not copied: a new copy has 0, a target keeps its own.
  std::vector<int> eitTableIds;
  tc::ExpectCopies<RavelCEIT>(section.data(), otherSection.data(), [](RavelCEIT& t) { t.iSession = 0x42; },
                               [&](RavelCEIT& copy, const TraceLines& shown) {
                                 EXPECT_EQ(shown, ShowLines(copy));  // header, body, events and their descriptors
                                 eitTableIds.push_back(copy.iEITTableId);
                               });
  EXPECT_EQ((std::vector<int>{0x00, 0x4E}), eitTableIds);

  RavelCEIT self(section.data());
  self = self;
  EXPECT_EQ(0, self.GetEventCount());
  EXPECT_EQ(0x4801, self.iTableIdExtension);
  EXPECT_EQ(0x7ED0, self.iTransportStreamId);
}

// ---------------------------------------------------------------------------
// Dump

namespace {

// The dump lines of a descriptor built over the same bytes.
template <class Descriptor>
TraceLines DescriptorDump(unsigned char* raw) {
  Descriptor d(raw);
  return ShowLines(d);
}

// Offsets of the descriptors of the first event of a section, by tag (in order).
std::multimap<int, size_t> DescriptorOffsets(const Bytes& section) {
  std::multimap<int, size_t> offsets;
  size_t at = 14 + 12;
  size_t end = at + RavelRead12(&section[14 + 10]);
  for (; at < end; at += 2 + section[at + 1]) offsets.insert({section[at], at});
  return offsets;
}

TraceLines TableHead(const TraceLines& header) {
  TraceLines lines = Dump({kRule, "###################### EIT Table Information ######################\n", kRule,
                           "####################### Header Information ########################\n"});
  Add(lines, header);
  return lines;
}

}  // namespace

TEST(EITShow, DumpsHeaderBodyEventsAndDescriptorsInAFixedOrder) {
  EitOptions options;
  options.serviceId = 0x4801;
  options.version = 19;
  options.lastTableId = 0x4F;
  // Wire order differs from dump order; the audio components keep theirs.
  Bytes section = EitSection(options, {EventRecord{0x0EDD, At(2013, 1, 1, 19, 0), Duration(1, 30, 9), 4, 1,
                            {Series(12, "Ser"), AudioComponent(0x11), ExtendedEvent(0, 0, "Ext"), Copyright(7),
                             AudioComponent(0x10), ParentalRating(0x03), Component(0x00), Content(0x10),
                             ShortEvent("Name", "Text"), DigitalCopyControl()}},
                Ev(0x0EDE, At(2013, 1, 2, 0, 0))});
  std::multimap<int, size_t> at = DescriptorOffsets(section);
  auto raw = [&](int tag, int nth) { return section.data() + std::next(at.lower_bound(tag), nth)->second; };
  RavelCEIT eit(section.data());
  TraceLines expected = TableHead(HeaderLines(0x4E, "EIT Actual", 1, section.size() - 3, 0x4801, 19, 1, 0, 1));
  Add(expected, Dump({"# Body Information\n", "Transport Stream ID = [0x7ed0]\n", "Original Network ID = [0x7ed1]\n",
                      "Segment Last Section Num=[1]\n", "Last Table ID=[79]\n",
                      "##################### Event Information [0] #####################\n", "Event Id=[3805]\n",
                      "Start Time=[2012.12.32 - 19:0:0]\n", "Duration=[1:30:9]\n", "Running Status=[4]\n",
                      "FreeCAMode=[1]\n",
                      "Descriptors Loop Len=[" + std::to_string(eit.GetEventInfo(0)->iDescriptorsLoopLength) + "]\n"}));
  for (const TraceLines& part :
       {DescriptorDump<RavelCShortEventDescriptor>(raw(0x4D, 0)), DescriptorDump<RavelCContentDescriptor>(raw(0x54, 0)),
        DescriptorDump<RavelCComponentDescriptor>(raw(0x50, 0)),
        DescriptorDump<RavelCParentalRatingDescriptor>(raw(0x55, 0)),
        DescriptorDump<RavelCAudioComponentDescriptor>(raw(0xC4, 0)),
        DescriptorDump<RavelCAudioComponentDescriptor>(raw(0xC4, 1)),
        DescriptorDump<RavelCCopyrightDescriptor>(raw(0x0D, 0)),
        DescriptorDump<RavelCExtendedEventDescriptor>(raw(0x4E, 0)), DescriptorDump<RavelCSeriesDescriptor>(raw(0xD5, 0))}) {
    Add(expected, part);
  }
  Add(expected, Dump({"##################### Event Information [1] #####################\n", "Event Id=[3806]\n",
                      "Start Time=[2013.1.2 - 0:0:0]\n", "Duration=[0:30:0]\n", "Running Status=[4]\n",
                      "FreeCAMode=[0]\n", "Descriptors Loop Len=[0]\n", kRule}));
  EXPECT_EQ(expected, ShowLines(eit));

  RavelCEIT empty(nullptr);  // shows an unknown name
  expected = TableHead(EmptyHeaderLines());
  Add(expected, Dump({"# Body Information\n", "Transport Stream ID = [0x0000]\n", "Original Network ID = [0x0000]\n",
                      "Segment Last Section Num=[0]\n", "Last Table ID=[0]\n", kRule}));
  EXPECT_EQ(expected, ShowLines(empty));
}

// ---------------------------------------------------------------------------
// Real broadcasts

TEST(EITCapture, DvbEpgSectionsParseExceptTheCorruptOne) {
  Bytes stream;
  RAVEL_LOAD_CAPTURE_OR_SKIP("dvb-epg.ts", stream);
  std::map<std::pair<int, int>, int> results;  // (table_id, result) -> sections
  std::vector<Bytes> sections = captures::SectionsOfPid(stream, 0x12);
  TraceRecorder recorder;
  for (Bytes& section : sections) {
    RavelCEIT eit(nullptr);
    ++results[{section[0], eit.ParseRawData(section.data())}];
  }
  EXPECT_EQ((std::map<std::pair<int, int>, int>{{{0x4E, kRavelOk}, 597}, {{0x4E, kRavelErrCorruptSection}, 1},
                                                {{0x4F, kRavelOk}, 636}, {{0x50, kRavelOk}, 205}}),
            results);
  // DVB descriptors the receiver does not keep are only traced.
  EXPECT_TRUE(recorder.TextsAt(kError).empty());
  for (const std::string& t : recorder.TextsAt(kWarning)) EXPECT_EQ(std::string::npos, t.find("Invalid Descriptor"));
}
