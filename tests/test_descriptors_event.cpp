// Event, content and rating descriptors: what every class shares (null and
// wrong-tag handling, re-parse, deep copies, Show banners) and the text and
// component classes. The rating, time offset and country classes have their
// own behaviours in test_descriptors_event_rating.cpp.
#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "Ravel_CDescriptorAudioComponent.h"
#include "Ravel_CDescriptorComponent.h"
#include "Ravel_CDescriptorContent.h"
#include "Ravel_CDescriptorCopyright.h"
#include "Ravel_CDescriptorCountryAvailability.h"
#include "Ravel_CDescriptorDataComponent.h"
#include "Ravel_CDescriptorExtendedEvent.h"
#include "Ravel_CDescriptorLocalTimeOffset.h"
#include "Ravel_CDescriptorParentalRating.h"
#include "Ravel_CDescriptorSeries.h"
#include "Ravel_CDescriptorShortEvent.h"
#include "BitWalk.h"
#include "Ravel_CDescriptorTargetRegion.h"
#include "StreamBuilder.h"
#include "TraceRecorder.h"

namespace {

const unsigned int kDump = 0x10000020u;
const unsigned int kWarning = 0x40000020u;

// The descriptor followed by bytes that the parsers may read past its end
// (several classes trust their length byte or read a fixed header regardless).
Bytes Padded(const Bytes& descriptor, uint8_t fill = 0x00) {
  Bytes padded = descriptor;
  padded.insert(padded.end(), 300, fill);
  return padded;
}

// tag, an explicit length byte, body: for lengths that disagree with the body.
Bytes RawDescriptor(uint8_t tag, uint8_t length, const Bytes& body) {
  Bytes d{tag, length};
  sb::Append(d, body);
  return d;
}

// Show's trace. Not to be called while another recorder is alive: the trace
// hook is one global and a recorder's end removes it.
TraceLines ShowLines(RavelCDescriptorBase& descriptor) {
  TraceRecorder recorder;
  descriptor.Show();
  return recorder.Lines();
}

TraceLines Dump(const std::vector<std::string>& texts) {
  TraceLines lines;
  for (const std::string& text : texts) lines.push_back(std::make_pair(kDump, text));
  return lines;
}

std::string BaseLine(unsigned int tag, unsigned int length, const std::string& name) {
  char text[160];
  std::snprintf(text, sizeof(text), "\tDescriptor Tag=[0x%x], Descriptor Length=[%u], Name=[%s]\n", tag, length,
                name.c_str());
  return text;
}

template <class T>
RavelCDescriptorBase* Make(unsigned char* raw) {
  return new T(raw);
}
template <class T>
RavelCDescriptorBase* CopyOf(RavelCDescriptorBase* source) {
  return new T(*static_cast<T*>(source));
}
template <class T>
void Assign(RavelCDescriptorBase* target, RavelCDescriptorBase* source) {
  *static_cast<T*>(target) = *static_cast<T*>(source);
}

// Rich descriptors of every class, used by the shared tables.
Bytes RichCopyright() { return sb::Descriptor(0x0D, sb::Cat({sb::U32(0x12345678), sb::Text("(C) TV")})); }
Bytes RichCountryAvailability() { return sb::Descriptor(0x49, sb::Cat({sb::U8(0x80), sb::Text("BRAARG")})); }
Bytes RichShortEvent() {
  return sb::Descriptor(0x4D, sb::Cat({sb::Text("por"), sb::U8(6), sb::Text("Jornal"), sb::U8(4), sb::Text("News")}));
}
Bytes RichExtendedEvent() {
  return sb::Descriptor(0x4E, sb::Cat({sb::U8(0x13), sb::Text("por"), sb::U8(14), sb::U8(5), sb::Text("Actor"),
                                       sb::U8(3), sb::Text("Ana"), sb::U8(3), sb::Text("Dir"), sb::U8(1),
                                       sb::Text("B"), sb::U8(3), sb::Text("ABC")}));
}
Bytes RichComponent() {
  return sb::Descriptor(0x50, sb::Cat({sb::U8(0xF5), sb::U8(0xB3), sb::U8(0x10), sb::Text("por"), sb::Text("HD")}));
}
Bytes RichAudioComponent() {
  return sb::Descriptor(0xC4, sb::Cat({sb::U8(0x02), sb::U8(0x03), sb::U8(0x11), sb::U8(0x0F), sb::U8(0x01),
                                       sb::U8(0xEB), sb::Text("porspa")}));
}
Bytes RichContent() { return sb::Descriptor(0x54, Bytes{0x12, 0x34, 0xF0, 0x0F}); }
Bytes RichParentalRating() { return sb::Descriptor(0x55, sb::Cat({sb::Text("BRA"), sb::U8(0x23)})); }
Bytes RichLocalTimeOffset() {
  return sb::Descriptor(0x58, sb::Cat({sb::Text("BRA"), sb::U8(0x06), sb::U16(0x0300), sb::UtcTime(2013, 2, 17, 0, 0, 0),
                                       sb::U16(0x0200)}));
}
Bytes RichTargetRegion() { return sb::Descriptor(0xC6, sb::Cat({sb::U8(1), sb::Text("SP-RJ")})); }
Bytes RichSeries() {
  return sb::Descriptor(0xD5, sb::Cat({sb::U16(0x0102), sb::U8(0xA7), sb::U16(0xC079), sb::U24(0x00A00C),
                                       sb::Text("Novela")}));
}
Bytes RichDataComponent() { return sb::Descriptor(0xFD, sb::Cat({sb::U16(0x00A0), sb::U8(0x33)})); }

struct ClassCase {
  const char* name;
  uint8_t tag;
  Bytes rich;
  RavelCDescriptorBase* (*make)(unsigned char*);
  RavelCDescriptorBase* (*copy)(RavelCDescriptorBase*);
  void (*assign)(RavelCDescriptorBase*, RavelCDescriptorBase*);
  const char* displayName;
  const char* wrongTag;  // with the tag 0x99 filled in
  const char* banner;
  std::vector<std::string> emptyLines;  // Show lines of the class's fields when empty
};

#define RAVEL_CLASS(T) Make<T>, CopyOf<T>, Assign<T>

std::vector<ClassCase> AllClasses() {
  const std::string audioZero =
      "\tiStreamContent=[0x0], iComponentType=[0x0], iComponentTag=[0x0],iStreamType=[0x0], iSimulcastGroupTag=[0x0], "
      "iESMultiLingualFlag=[0x0], iMainComponentFlag=[0x0], iQualityIndicator=[0x0], iSampleRate=[0x0], ISO "
      "Language Code=[0x0], ISO Language Code2=[0x0]\n";
  return {
      {"Copyright", 0x0D, RichCopyright(), RAVEL_CLASS(RavelCCopyrightDescriptor), "Copyright Descriptor",
       "This Descriptor isn't Copyright Descriptor! Descriptor Tag=[0x99]\n",
       "\t=================== Copyright Descriptor =====================\n",
       {"\t Copyright id: 0 \n", "\t Copyright info: (null) \n"}},
      {"CountryAvailability", 0x49, RichCountryAvailability(), RAVEL_CLASS(RavelCCountryAvailabilityDescriptor),
       "Country Availabilty Descriptor",
       "This Descriptor isn't Country Availability Descriptor! Descriptor Tag=[0x99]\n",
       "\t=================== Country Availability Descriptor =====================\n",
       {"\t Ability flag = 0\n", "\t Codes: \n"}},
      {"ShortEvent", 0x4D, RichShortEvent(), RAVEL_CLASS(RavelCShortEventDescriptor), "Short Event Descriptor",
       "This Descriptor isn't Short Event Descriptor! Descriptor Tag=[0x99]\n",
       "\t=================== Short Event Descriptor ===================\n",
       {"\tLanguageCode=[]\n", "\tEventName=[(null)]\n", "\tEventDescription=[(null)]\n"}},
      {"ExtendedEvent", 0x4E, RichExtendedEvent(), RAVEL_CLASS(RavelCExtendedEventDescriptor),
       "Extended Event Descriptor", "This Descriptor isn't Extended Event Descriptor! Descriptor Tag=[0x99]\n",
       "\t=================== Extended Event Descriptor ===================\n",
       {"\tDescriptorNumber=[0]\n", "\tLastDescriptorNumber=[0]\n"}},
      {"Component", 0x50, RichComponent(), RAVEL_CLASS(RavelCComponentDescriptor), "Component Descriptor",
       "This Descriptor isn't Component Descriptor! Descriptor Tag=[0x99]\n",
       "\t=================== Component Descriptor ===================\n",
       {"\tiStreamContent=[0x0], iComponentType=[0x0], iComponentTag=[0x0], ISO Language Code=[0x0]\n"}},
      {"AudioComponent", 0xC4, RichAudioComponent(), RAVEL_CLASS(RavelCAudioComponentDescriptor),
       "Audio Component Descriptor", "This Descriptor isn't Component Descriptor! Descriptor Tag=[0x99]\n",
       "\t=================== Component Descriptor ===================\n", {audioZero}},
      {"Content", 0x54, RichContent(), RAVEL_CLASS(RavelCContentDescriptor), "Content Descriptor",
       "This Descriptor isn't Content Descriptor! Descriptor Tag=[0x99]\n",
       "\t=================== Content Descriptor =====================\n", {}},
      {"ParentalRating", 0x55, RichParentalRating(), RAVEL_CLASS(RavelCParentalRatingDescriptor),
       "Parental Rating Descriptor", "This Descriptor isn't ParentalRating Descriptor! Descriptor Tag=[0x99]\n",
       "\t=================== Parental Rating Descriptor =====================\n", {}},
      {"LocalTimeOffset", 0x58, RichLocalTimeOffset(), RAVEL_CLASS(RavelCLocalTimeOffsetDescriptor),
       "Time Offset Descriptor", "This Descriptor isn't LocalTimeOffset Descriptor! Descriptor Tag=[0x99]\n",
       "\t=================== Local Time Offset Descriptor =====================\n", {}},
      {"TargetRegion", 0xC6, RichTargetRegion(), RAVEL_CLASS(RavelCTargetRegionDescriptor), "Region Descriptor",
       "This Descriptor isn't Target Region Descriptor! Descriptor Tag=[0x99]\n",
       "\t=================== Target Region Descriptor =====================\n",
       {"\t Region Spec Type: 0 \n", "\t Region Spec: (null) \n"}},
      {"Series", 0xD5, RichSeries(), RAVEL_CLASS(RavelCSeriesDescriptor), "Series Descriptor",
       "This Descriptor isn't Series Descriptor! Descriptor Tag=[0x99]\n",
       "\t=================== Series Descriptor ===================\n",
       {"\tSeriesId=[0]\n", "\tRepeatLabel=[0]\n", "\tProgramPattern=[0]\n", "\tExpireDateValidFlag=[0]\n",
        "\tExpireDate=[0]\n", "\tEpisodeNumber=[0]\n", "\tLastEpisodeNumber=[0]\n", "\tSeriesName=[(null)]\n"}},
      {"DataComponent", 0xFD, RichDataComponent(), RAVEL_CLASS(RavelCDataComponentDescriptor),
       "Data Component Descriptor", "This Descriptor isn't Data Component Descriptor! Descriptor Tag=[0x99]\n",
       "\t=================== Data Component Descriptor ===================\n", {"\tiDataComponentId=[0x0000]\n"}},
  };
}

TraceLines EmptyShow(const ClassCase& c, unsigned int tag, unsigned int length, const std::string& name) {
  std::vector<std::string> texts{c.banner, BaseLine(tag, length, name)};
  texts.insert(texts.end(), c.emptyLines.begin(), c.emptyLines.end());
  return Dump(texts);
}

}  // namespace

TEST(EventDescriptorPattern, NullGivesAnEmptyObjectWithoutTrace) {
  for (const ClassCase& c : AllClasses()) {
    SCOPED_TRACE(c.name);
    RavelCDescriptorBase* d = nullptr;
    {
      TraceRecorder recorder;
      d = c.make(nullptr);
      EXPECT_TRUE(recorder.Records().empty());
    }
    EXPECT_EQ(0, d->iDescriptorTag);
    EXPECT_EQ(0, d->iDescriptorLength);
    EXPECT_STREQ("", d->GetDescriptorName());
    EXPECT_EQ(EmptyShow(c, 0, 0, ""), ShowLines(*d));

    // A parsed object given null again is emptied, and nothing is traced.
    Bytes rich = Padded(c.rich);
    EXPECT_EQ(kRavelOk, d->ParseRawData(rich.data()));
    EXPECT_STREQ(c.displayName, d->GetDescriptorName());
    {
      TraceRecorder recorder;
      EXPECT_EQ(kRavelErrInvalidArgument, d->ParseRawData(nullptr));
      EXPECT_TRUE(recorder.Records().empty());
    }
    EXPECT_EQ(0, d->iDescriptorTag);
    EXPECT_EQ(0, d->iDescriptorLength);
    EXPECT_EQ(EmptyShow(c, 0, 0, c.displayName), ShowLines(*d));  // the base keeps the name
    delete d;
  }
}

TEST(EventDescriptorPattern, WrongTagKeepsTheForeignHeaderAndClearsTheFields) {
  for (const ClassCase& c : AllClasses()) {
    SCOPED_TRACE(c.name);
    Bytes rich = Padded(c.rich);
    RavelCDescriptorBase* d = c.make(rich.data());
    ASSERT_EQ(c.tag, d->iDescriptorTag);

    Bytes foreign = Padded(c.rich);
    foreign[0] = 0x99;
    {
      TraceRecorder recorder;
      EXPECT_EQ(kRavelErrInvalidArgument, d->ParseRawData(foreign.data()));
      ASSERT_EQ(1u, recorder.Records().size());
      EXPECT_EQ(kWarning, recorder.Records()[0].mask);
      EXPECT_EQ(c.wrongTag, recorder.Records()[0].text);
    }

    EXPECT_EQ(0x99, d->iDescriptorTag);
    EXPECT_EQ(c.rich[1], d->iDescriptorLength);
    EXPECT_STREQ("Unknown Descriptor", d->GetDescriptorName());
    EXPECT_EQ(EmptyShow(c, 0x99, c.rich[1], "Unknown Descriptor"), ShowLines(*d));
    delete d;
  }
}

TEST(EventDescriptorPattern, ReparseLeavesNothingOfTheFirstParse) {
  for (const ClassCase& c : AllClasses()) {
    SCOPED_TRACE(c.name);
    Bytes rich = Padded(c.rich);
    Bytes empty = Padded(Bytes{c.tag, 0});
    RavelCDescriptorBase* fresh = c.make(rich.data());
    const TraceLines richShow = ShowLines(*fresh);
    RavelCDescriptorBase* freshEmpty = c.make(empty.data());
    const TraceLines emptyShow = ShowLines(*freshEmpty);

    // The same bytes twice: lists are rebuilt, not extended.
    RavelCDescriptorBase* d = c.make(rich.data());
    EXPECT_EQ(kRavelOk, d->ParseRawData(rich.data()));
    EXPECT_EQ(richShow, ShowLines(*d));
    // Length 0 after a full descriptor: nothing of the first one is left.
    EXPECT_EQ(kRavelOk, d->ParseRawData(empty.data()));
    EXPECT_EQ(emptyShow, ShowLines(*d));
    EXPECT_NE(richShow, emptyShow);
    delete d;
    delete fresh;
    delete freshEmpty;
  }
}

TEST(EventDescriptorPattern, CopiesOwnTheirDataAndOutliveTheSource) {
  for (const ClassCase& c : AllClasses()) {
    SCOPED_TRACE(c.name);
    Bytes rich = Padded(c.rich);
    Bytes other = Padded(Bytes{c.tag, 0});
    RavelCDescriptorBase* source = c.make(rich.data());
    const TraceLines expected = ShowLines(*source);

    RavelCDescriptorBase* copied = c.copy(source);
    RavelCDescriptorBase* assigned = c.make(other.data());
    c.assign(assigned, source);
    c.assign(assigned, assigned);  // self-assignment keeps the data
    RavelCDescriptorBase* fromEmpty = c.make(rich.data());
    RavelCDescriptorBase* empty = c.make(nullptr);
    c.assign(fromEmpty, empty);

    // Re-parsing and then destroying the source must not reach the copies.
    source->ParseRawData(other.data());
    delete source;
    EXPECT_EQ(expected, ShowLines(*copied));
    EXPECT_EQ(expected, ShowLines(*assigned));
    EXPECT_EQ(EmptyShow(c, 0, 0, ""), ShowLines(*fromEmpty));
    delete copied;
    delete assigned;
    delete fromEmpty;
    delete empty;
  }
}

TEST(ShortEventDescriptor, ReadsLanguageNameAndDescription) {
  struct Case {
    const char* label;
    Bytes descriptor;
    const char* language;
    std::string name;
    std::string description;
  } cases[] = {
      {"both texts", RichShortEvent(), "por", "Jornal", "News"},
      {"empty name", sb::Descriptor(0x4D, sb::Cat({sb::Text("POR"), sb::U8(0), sb::U8(2), sb::Text("ok")})), "POR",
       "", "ok"},
      {"both empty", sb::Descriptor(0x4D, sb::Cat({sb::Text("jpn"), sb::U8(0), sb::U8(0)})), "jpn", "", ""},
      // Broadcast control codes (ARIB 8-bit coding) are kept as they are.
      {"control codes", sb::Descriptor(0x4D, sb::Cat({sb::Text("spa"), sb::U8(3), Bytes{0x1B, 0x7C, 0xA4}, sb::U8(1),
                                                       Bytes{0x0E}})),
       "spa", "\x1B\x7C\xA4", "\x0E"},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes raw = Padded(c.descriptor);
    RavelCShortEventDescriptor d(raw.data());
    EXPECT_STREQ(c.language, d.GetLanguageCode());
    ASSERT_NE(nullptr, d.GetEventName());
    ASSERT_NE(nullptr, d.GetText());
    EXPECT_EQ(c.name, d.GetEventName());
    EXPECT_EQ(c.description, d.GetEventDescription());
    EXPECT_EQ(d.GetEventDescription(), d.GetText());
    EXPECT_EQ(Dump({"\t=================== Short Event Descriptor ===================\n",
                    BaseLine(0x4D, c.descriptor[1], "Short Event Descriptor"),
                    std::string("\tLanguageCode=[") + c.language + "]\n", "\tEventName=[" + c.name + "]\n",
                    "\tEventDescription=[" + c.description + "]\n"}),
              ShowLines(d));
  }
}

TEST(ExtendedEventDescriptor, WalksItemsAndKeepsTheTextFromItsLengthByte) {
  struct Case {
    const char* label;
    Bytes descriptor;
    std::vector<std::pair<std::string, std::string> > items;
    std::string text;
  } cases[] = {
      {"two items, text ABC", RichExtendedEvent(), {{"Actor", "Ana"}, {"Dir", "B"}}, std::string("\x03" "AB")},
      {"no items, text of one letter", sb::Descriptor(0x4E, sb::Cat({sb::U8(0x00), sb::Text("por"), sb::U8(0),
                                                                      sb::U8(1), sb::Text("Z")})),
       {}, "\x01"},
      {"no items, no text", sb::Descriptor(0x4E, sb::Cat({sb::U8(0x00), sb::Text("por"), sb::U8(0), sb::U8(0)})), {},
       ""},
      {"empty description and item",
       sb::Descriptor(0x4E, sb::Cat({sb::U8(0x00), sb::Text("por"), sb::U8(2), sb::U8(0), sb::U8(0), sb::U8(2),
                                     sb::Text("xy")})),
       {{"", ""}},
       std::string("\x02" "x")},
      // length_of_items ends inside the first item: the walk finishes that item
      // and the text is read right after it.
      {"items length too short",
       sb::Descriptor(0x4E, sb::Cat({sb::U8(0x00), sb::Text("por"), sb::U8(1), sb::U8(2), sb::Text("ab"), sb::U8(1),
                                     sb::Text("c"), sb::U8(4), sb::Text("wxyz")})),
       {{"ab", "c"}},
       std::string("\x04" "wxy")},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes raw = Padded(c.descriptor);
    RavelCExtendedEventDescriptor d(raw.data());
    ASSERT_EQ(static_cast<int>(c.items.size()), d.GetNumOfItems());
    std::vector<std::string> show{"\t=================== Extended Event Descriptor ===================\n",
                                  BaseLine(0x4E, c.descriptor[1], "Extended Event Descriptor"),
                                  "\tDescriptorNumber=[" + std::to_string(c.descriptor[2] >> 4) + "]\n",
                                  "\tLastDescriptorNumber=[" + std::to_string(c.descriptor[2] & 0x0F) + "]\n"};
    for (int i = 0; i < d.GetNumOfItems(); ++i) {
      EXPECT_EQ(c.items[i].first, d.GetItem(i)->GetItemDescription());
      EXPECT_EQ(c.items[i].second, d.GetItem(i)->GetItem());
      show.push_back("\tItemDescription=[" + c.items[i].first + "]\n");
      show.push_back("\tItem=[" + c.items[i].second + "]\n");
    }
    ASSERT_NE(nullptr, d.GetText());
    EXPECT_EQ(c.text, d.GetText());
    EXPECT_STREQ("por", d.GetLanguageCode());
    EXPECT_EQ(Dump(show), ShowLines(d));
  }

  Bytes rich = Padded(RichExtendedEvent());
  RavelCExtendedEventDescriptor d(rich.data());
  EXPECT_EQ(1, d.GetDescriptorNumber());
  EXPECT_EQ(3, d.GetLastDescriptorNumber());
}

TEST(ExtendedEventDescriptor, ItemAccessOutOfRangePanicsAndYieldsNull) {
  Bytes rich = Padded(RichExtendedEvent());
  RavelCExtendedEventDescriptor d(rich.data());
  for (int index : {-1, 2}) {
    TraceRecorder recorder;
    EXPECT_EQ(nullptr, d.GetItem(index));
    EXPECT_EQ(1, recorder.PanicCount());
    EXPECT_EQ(TraceLines({{0x40000001u, "Array Bound Overflow! anIndex=[" + std::to_string(index) + "], iCount=[2]\n"}}),
              recorder.Lines());
  }
}

TEST(ExtendedEventItem, OwnsItsTextsAndCopiesThemDeeply) {
  RavelCExtendedEvent item(strdup("desc"), strdup("item"));
  RavelCExtendedEvent itemCopy(item);
  EXPECT_NE(item.pItem, itemCopy.pItem);
  item = RavelCExtendedEvent(strdup("other"), nullptr);
  EXPECT_STREQ("desc", itemCopy.GetItemDescription());
  EXPECT_STREQ("item", itemCopy.GetItem());
  EXPECT_STREQ("other", item.GetItemDescription());
  EXPECT_EQ(nullptr, item.GetItem());
}

TEST(SeriesDescriptor, DecodesPackedFieldsAndSizesTheNameFromTheLength) {
  // series_id 0x0102, byte 4 = 1010 011 1, expire 0xC079, episode 0xABC, last 0xDEF.
  const Bytes header = sb::Cat({sb::U16(0x0102), sb::U8(0xA7), sb::U16(0xC079), sb::U24(0xABCDEF)});
  struct Case {
    const char* label;
    uint8_t length;
    Bytes name;
    bool hasName;
    std::string storedName;
  } cases[] = {
      {"length 8: no name", 8, {}, false, ""},
      {"length 9: one byte", 9, sb::Text("N"), true, "N"},
      {"length 14: six bytes", 14, sb::Text("Novela"), true, "Novela"},
      // The name takes length - 8 bytes whatever follows.
      {"length 10 over a longer text", 10, sb::Text("Novela"), true, "No"},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes raw = Padded(RawDescriptor(0xD5, c.length, sb::Cat({header, c.name})), 'Q');
    RavelCSeriesDescriptor d(raw.data());
    EXPECT_EQ(0x0102, d.GetSeriesId());
    EXPECT_EQ(10, d.GetRepeatLabel());
    EXPECT_EQ(3, d.GetProgramPattern());
    EXPECT_EQ(1, d.GetExpireDateValidFlag());
    EXPECT_EQ(0xC079, d.GetExpireDate());  // the raw MJD
    EXPECT_EQ(0xABC, d.GetEpisodeNumber());
    EXPECT_EQ(0xDEF, d.GetLastEpisodeNumber());
    if (!c.hasName) {
      EXPECT_EQ(nullptr, d.GetSeriesName());
    } else {
      ASSERT_NE(nullptr, d.GetSeriesName());
      EXPECT_EQ(c.storedName, d.GetSeriesName());
    }
    EXPECT_EQ(Dump({"\t=================== Series Descriptor ===================\n",
                    BaseLine(0xD5, c.length, "Series Descriptor"), "\tSeriesId=[258]\n", "\tRepeatLabel=[10]\n",
                    "\tProgramPattern=[3]\n", "\tExpireDateValidFlag=[1]\n", "\tExpireDate=[49273]\n",
                    "\tEpisodeNumber=[2748]\n", "\tLastEpisodeNumber=[3567]\n",
                    "\tSeriesName=[" + (c.hasName ? c.storedName : std::string("(null)")) + "]\n"}),
              ShowLines(d));
  }
}

// Copyright info and target region spec take (length - 1) mod 256 bytes into a
// buffer one byte larger, closed by a 0; the copyright copy starts at byte 6.
TEST(FixedLengthTexts, CopyLengthMinusOneBytesAndStayTerminated) {
  struct Case {
    const char* label;
    uint8_t tag;
    uint8_t length;
    Bytes body;
    size_t storedLength;
    std::string storedPrefix;
  } cases[] = {
      // Copyright: 4 id bytes, then length - 1 bytes from byte 6, three more
      // than the descriptor holds (the padding letters).
      {"copyright with info", 0x0D, 8, sb::Cat({sb::U32(7), sb::Text("ABCD")}), 7, "ABCDQQQ"},
      {"copyright length 4", 0x0D, 4, sb::U32(7), 3, "QQQ"},
      {"copyright length 1", 0x0D, 1, sb::U32(7), 0, ""},
      {"copyright length 0", 0x0D, 0, sb::U32(7), 255, "QQQ"},
      {"region with three letters", 0xC6, 4, sb::Cat({sb::U8(2), sb::Text("RJ1")}), 3, "RJ1"},
      {"region length 1", 0xC6, 1, sb::U8(2), 0, ""},
      {"region length 0", 0xC6, 0, sb::U8(2), 255, "QQQ"},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes raw = Padded(RawDescriptor(c.tag, c.length, c.body), 'Q');
    const char* text = nullptr;
    RavelCCopyrightDescriptor copyright(nullptr);
    RavelCTargetRegionDescriptor region(nullptr);
    TraceRecorder recorder;
    if (c.tag == 0x0D) {
      ASSERT_EQ(kRavelOk, copyright.ParseRawData(raw.data()));
      EXPECT_EQ(7u, copyright.GetCopyrightId());
      text = copyright.GetCopyrightInfo();
    } else {
      ASSERT_EQ(kRavelOk, region.ParseRawData(raw.data()));
      EXPECT_EQ(2, region.GetRegionSpecType());
      text = region.GetRegionSpec();
    }
    EXPECT_TRUE(recorder.Records().empty());
    ASSERT_NE(nullptr, text);
    EXPECT_EQ(c.storedLength, std::strlen(text));
    EXPECT_EQ(c.storedPrefix, std::string(text).substr(0, c.storedPrefix.size()));
  }
}

TEST(FixedLengthTexts, ShowPrintsTheStoredText) {
  Bytes copyrightRaw = Padded(RawDescriptor(0x0D, 7, sb::Cat({sb::U32(0x80000001), sb::Text("TV")})));
  RavelCCopyrightDescriptor copyright(copyrightRaw.data());
  EXPECT_EQ(0x80000001u, copyright.GetCopyrightId());
  // The id is printed with %d, so ids above 0x7FFFFFFF come out negative.
  EXPECT_EQ(Dump({"\t=================== Copyright Descriptor =====================\n",
                  BaseLine(0x0D, 7, "Copyright Descriptor"), "\t Copyright id: -2147483647 \n",
                  "\t Copyright info: TV \n"}),
            ShowLines(copyright));

  Bytes regionRaw = Padded(RichTargetRegion());
  RavelCTargetRegionDescriptor region(regionRaw.data());
  EXPECT_EQ(Dump({"\t=================== Target Region Descriptor =====================\n",
                  BaseLine(0xC6, 6, "Region Descriptor"), "\t Region Spec Type: 1 \n", "\t Region Spec: SP-RJ \n"}),
            ShowLines(region));
}

TEST(ComponentDescriptor, ReadsBitFieldsAndTheCodeAsOneInteger) {
  struct Case {
    const char* label;
    Bytes descriptor;
    unsigned int streamContent, componentType, componentTag, language;
    std::string line;
  } cases[] = {
      {"reserved bits ignored", RichComponent(), 0x5, 0xB3, 0x10, 0x706F72,
       "\tiStreamContent=[0x5], iComponentType=[0xb3], iComponentTag=[0x10], ISO Language Code=[0x706f72]\n"},
      {"all ones", sb::Descriptor(0x50, Bytes{0x0F, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF}), 0xF, 0xFF, 0xFF, 0xFFFFFF,
       "\tiStreamContent=[0xf], iComponentType=[0xff], iComponentTag=[0xff], ISO Language Code=[0xffffff]\n"},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes raw = Padded(c.descriptor);
    RavelCComponentDescriptor d(raw.data());
    EXPECT_EQ(c.streamContent, d.GetStreamContent());
    EXPECT_EQ(c.componentType, d.GetComponentType());
    EXPECT_EQ(c.componentTag, d.GetComponentTag());
    EXPECT_EQ(c.language, d.GetISO639LanguageCode());
    EXPECT_EQ(Dump({"\t=================== Component Descriptor ===================\n",
                    BaseLine(0x50, c.descriptor[1], "Component Descriptor"), c.line}),
              ShowLines(d));
  }
}

TEST(AudioComponentDescriptor, ReadsEveryFieldAndTheSecondCodeOnlyWhenMultiLingual) {
  struct Case {
    const char* label;
    uint8_t flags;  // ES_multi_lingual, main_component, quality (2), sampling_rate (3), reserved
    unsigned int multiLingual, main, quality, sampleRate;
    unsigned int code2;
    const char* text2;
  } cases[] = {
      {"multi-lingual", 0xEB, 1, 1, 2, 5, 0x737061, "spa"},          // 1 1 10 101 1
      {"single language", 0x7F, 0, 1, 3, 7, 0, ""},                  // 0 1 11 111 1
      {"all flags clear", 0x01, 0, 0, 0, 0, 0, ""},                  // 0 0 00 000 1
      {"multi-lingual, rest clear", 0x80, 1, 0, 0, 0, 0x737061, "spa"},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes descriptor = sb::Descriptor(0xC4, sb::Cat({sb::U8(0xF2), sb::U8(0x03), sb::U8(0x11), sb::U8(0x0F),
                                                     sb::U8(0x01), sb::U8(c.flags), sb::Text("porspa")}));
    Bytes raw = Padded(descriptor);
    RavelCAudioComponentDescriptor d(nullptr);
    // A multi-lingual descriptor first, so that a single-language one must clear its second code.
    Bytes rich = Padded(RichAudioComponent());
    d.ParseRawData(rich.data());
    ASSERT_EQ(kRavelOk, d.ParseRawData(raw.data()));
    EXPECT_EQ(0x2, d.GetStreamContent());
    EXPECT_EQ(0x03, d.GetComponentType());
    EXPECT_EQ(0x11, d.GetComponentTag());
    EXPECT_EQ(0x0F, d.GetStreamType());
    EXPECT_EQ(0x01, d.GetSimulcastGroupTag());
    EXPECT_EQ(c.multiLingual, d.GetESMultiLingualFlag());
    EXPECT_EQ(c.main, d.GetMainComponentFlag());
    EXPECT_EQ(c.quality, d.GetQualityIndicator());
    EXPECT_EQ(c.sampleRate, d.GetSampleRate());
    EXPECT_EQ(0x706F72u, d.GetISO639LanguageCode());
    EXPECT_STREQ("por", d.GetLanguageCode());
    EXPECT_EQ(c.code2, d.GetISO639LanguageCode2());
    EXPECT_STREQ(c.text2, d.GetLanguageCode2());
    char line[400];
    std::snprintf(line, sizeof(line),
                  "\tiStreamContent=[0x2], iComponentType=[0x3], iComponentTag=[0x11],iStreamType=[0xf], "
                  "iSimulcastGroupTag=[0x1], iESMultiLingualFlag=[0x%x], iMainComponentFlag=[0x%x], "
                  "iQualityIndicator=[0x%x], iSampleRate=[0x%x], ISO Language Code=[0x706f72], ISO Language "
                  "Code2=[0x%x]\n",
                  c.multiLingual, c.main, c.quality, c.sampleRate, c.code2);
    EXPECT_EQ(Dump({"\t=================== Component Descriptor ===================\n",
                    BaseLine(0xC4, descriptor[1], "Audio Component Descriptor"), line}),
              ShowLines(d));
  }
}

TEST(DataComponentDescriptor, ReadsTheIdAndZeroesItOnFailure) {
  Bytes raw = Padded(RichDataComponent());
  RavelCDataComponentDescriptor d(raw.data());
  EXPECT_EQ(0x00A0, d.GetDataComponentId());
  EXPECT_EQ(Dump({"\t=================== Data Component Descriptor ===================\n",
                  BaseLine(0xFD, 3, "Data Component Descriptor"), "\tiDataComponentId=[0x00a0]\n"}),
            ShowLines(d));
  Bytes foreign = raw;
  foreign[0] = 0xFC;
  TraceRecorder recorder;
  EXPECT_EQ(kRavelErrInvalidArgument, d.ParseRawData(foreign.data()));
  EXPECT_EQ(0, d.GetDataComponentId());
}

TEST(ContentDescriptor, SplitsGenresAndTracesEachOne) {
  struct Case {
    const char* label;
    Bytes descriptor;
    std::vector<uint8_t> genres;
    std::vector<uint8_t> userGenres;
    TraceLines parseTrace;
  } cases[] = {
      {"length 0", RawDescriptor(0x54, 0, {}), {}, {}, {{kWarning, "Empty Content Descriptor!\n"}}},
      {"length 1", RawDescriptor(0x54, 1, {0x12}), {}, {}, {{kWarning, "Empty Content Descriptor!\n"}}},
      {"two genres", RichContent(), {0x12, 0xF0}, {0x34, 0x0F},
       {{kWarning, "raw genre = 0x12!\n"}, {kWarning, "raw genre = 0xf0!\n"}}},
      // An odd length drops the last byte.
      {"length 3", RawDescriptor(0x54, 3, {0x00, 0x00, 0x55}), {0x00}, {0x00}, {{kWarning, "raw genre = 0x0!\n"}}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes raw = Padded(c.descriptor);
    TraceRecorder recorder;
    RavelCContentDescriptor d(raw.data());
    EXPECT_EQ(c.parseTrace, recorder.Lines());
    ASSERT_EQ(static_cast<int>(c.genres.size()), d.GetGenreCount());
    std::vector<std::string> show{"\t=================== Content Descriptor =====================\n",
                                  BaseLine(0x54, c.descriptor[1], "Content Descriptor")};
    for (int i = 0; i < d.GetGenreCount(); ++i) {
      unsigned char level1 = 0xAA, level2 = 0xAA;
      EXPECT_EQ(1, d.GetGenre(i, level1, level2));
      EXPECT_EQ(c.genres[i] >> 4, level1);
      EXPECT_EQ(c.genres[i] & 0x0F, level2);
      EXPECT_EQ(c.userGenres[i], d.GetUserGenre(i));
      char line[32];
      std::snprintf(line, sizeof(line), "\tGenre[%d]=[0x%02x]", i, c.genres[i]);
      show.push_back(line);
    }
    EXPECT_EQ(Dump(show), ShowLines(d));
  }
}

TEST(ContentDescriptor, GenreIndexOutOfRangeTracesAndGivesZero) {
  Bytes raw = Padded(RichContent());
  RavelCContentDescriptor d(raw.data());
  Bytes empty = Padded(RawDescriptor(0x54, 0, {}));
  RavelCContentDescriptor none(empty.data());
  struct Case {
    RavelCContentDescriptor* descriptor;
    int index;
    const char* message;
  } cases[] = {
      {&d, -1, "Invalid Array Index! aIndex=[-1], array len=[2]\n"},
      {&d, 2, "Invalid Array Index! aIndex=[2], array len=[2]\n"},
      {&none, 0, "Invalid Array Index! aIndex=[0], array len=[0]\n"},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.message);
    TraceRecorder recorder;
    unsigned char level1 = 0xAA, level2 = 0xAA;
    EXPECT_EQ(0, c.descriptor->GetGenre(c.index, level1, level2));
    EXPECT_EQ(0, level1);
    EXPECT_EQ(0, level2);
    EXPECT_EQ(0, c.descriptor->GetUserGenre(c.index));
    EXPECT_EQ(TraceLines({{kWarning, c.message}, {kWarning, c.message}}), recorder.Lines());
    EXPECT_EQ(0, recorder.PanicCount());
  }
}

// ---------------------------------------------------------------------------
// Every wire bit of the fixed fields, one at a time

namespace {

using bitwalk::Base;
using bitwalk::Field;
using Values = std::vector<int64_t>;

Values AudioComponentFields(unsigned char* raw) {
  RavelCAudioComponentDescriptor d(raw);
  return {d.GetStreamContent(),      d.GetComponentType(),     d.GetComponentTag(),
          d.GetStreamType(),         d.GetSimulcastGroupTag(), d.GetESMultiLingualFlag(),
          d.GetMainComponentFlag(),  d.GetQualityIndicator(),  d.GetSampleRate(),
          d.GetISO639LanguageCode(), d.GetISO639LanguageCode2()};
}

const std::vector<Field> kAudioComponentFields = {
    {"stream content", {{20, 4}}},          {"component type", {{24, 8}}},
    {"component tag", {{32, 8}}},           {"stream type", {{40, 8}}},
    {"simulcast group tag", {{48, 8}}},     {"ES multi-lingual flag", {{56, 1}}},
    {"main component flag", {{57, 1}}},     {"quality indicator", {{58, 2}}},
    {"sampling rate", {{60, 3}}},           {"ISO 639 language code", {{64, 24}}},
    {"ISO 639 language code 2", {{88, 24}}},
};

}  // namespace

TEST(EventDescriptorBits, OneSetBitChangesOnlyTheFieldsItBelongsTo) {
  const bitwalk::Walk walks[] = {
      {"extended event", Base({0x4E, 5}, 8), 16, 24,
       {{"descriptor number", {{16, 4}}}, {"last descriptor number", {{20, 4}}}},
       [](unsigned char* raw) -> Values {
         RavelCExtendedEventDescriptor d(raw);
         return {d.GetDescriptorNumber(), d.GetLastDescriptorNumber()};
       }},
      {"component", Base({0x50, 6}, 8), 16, 64,
       {{"stream content", {{20, 4}}},
        {"component type", {{24, 8}}},
        {"component tag", {{32, 8}}},
        {"ISO 639 language code", {{40, 24}}}},
       [](unsigned char* raw) -> Values {
         RavelCComponentDescriptor d(raw);
         return {d.GetStreamContent(), d.GetComponentType(), d.GetComponentTag(), d.GetISO639LanguageCode()};
       }},
      // The ES multi-lingual bit alone reads a second code, from zeros here.
      {"audio component", Base({0xC4, 0x20}, 40), 16, 88, kAudioComponentFields, AudioComponentFields},
      {"audio component, second code", Base({0xC4, 0x20, 0, 0, 0, 0, 0, 0x80}, 40), 88, 112, kAudioComponentFields,
       AudioComponentFields},
      {"content", Base({0x54, 2}, 4), 16, 32,
       {{"content nibble level 1", {{16, 4}}}, {"content nibble level 2", {{20, 4}}}, {"user genre", {{24, 8}}}},
       [](unsigned char* raw) -> Values {
         RavelCContentDescriptor d(raw);
         unsigned char level1 = 0, level2 = 0;
         d.GetGenre(0, level1, level2);
         return {level1, level2, d.GetUserGenre(0)};
       }},
      {"data component", Base({0xFD, 2}, 4), 16, 32, {{"data component id", {{16, 16}}}},
       [](unsigned char* raw) -> Values {
         RavelCDataComponentDescriptor d(raw);
         return {d.GetDataComponentId()};
       }},
      {"series", Base({0xD5, 8}, 12), 16, 80,
       {{"series id", {{16, 16}}},
        {"repeat label", {{32, 4}}},
        {"program pattern", {{36, 3}}},
        {"expire date valid flag", {{39, 1}}},
        {"expire date", {{40, 16}}},
        {"episode number", {{56, 12}}},
        {"last episode number", {{68, 12}}}},
       [](unsigned char* raw) -> Values {
         RavelCSeriesDescriptor d(raw);
         return {d.GetSeriesId(),   d.GetRepeatLabel(),     d.GetProgramPattern(),     d.GetExpireDateValidFlag(),
                 d.GetExpireDate(), d.GetEpisodeNumber(), d.GetLastEpisodeNumber()};
       }},
      {"copyright", Base({0x0D, 4}, 12), 16, 48, {{"copyright id", {{16, 32}}}},
       [](unsigned char* raw) -> Values {
         RavelCCopyrightDescriptor d(raw);
         return {d.GetCopyrightId()};
       }},
  };
  TraceRecorder recorder;  // the content descriptor reports every genre
  for (const bitwalk::Walk& walk : walks) bitwalk::Run(walk);
}
