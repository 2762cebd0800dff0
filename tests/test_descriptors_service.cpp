// Service, network and transmission descriptors: the rules of each class (the
// pattern they share is in test_descriptor_factory.cpp).
#include <gtest/gtest.h>

#include <memory>

#include "DescriptorShow.h"

using namespace th;
using sb::Cat;
using sb::Descriptor;
using sb::Text;
using sb::U16;
using sb::U8;

TEST(ServiceListDescriptor, CountsWholeEntriesIgnoresTheRemainderAndRefusesOtherIndexes) {
  struct Case {
    Bytes body;
    int count;
  } cases[] = {{Bytes(), 0}, {Bytes{0x01, 0x02}, 0}, {Bytes{0x01, 0x02, 0x03}, 1},
               {Bytes{0x01, 0x02, 0x03, 0x04, 0x05}, 1}, {Bytes{0x01, 0x02, 0x03, 0x04, 0x05, 0x06}, 2}};
  const TraceLines emptyTrace = At(kWarning, {"Empty Service List Descriptor!\n"});
  for (const Case& c : cases) {
    SCOPED_TRACE(c.body.size());
    Bytes raw = Descriptor(0x41, c.body);
    TraceRecorder recorder;
    RavelCServiceListDescriptor d(raw.data());
    EXPECT_EQ(c.count == 0 ? emptyTrace : TraceLines(), recorder.Lines());
    ASSERT_EQ(c.count, d.GetServiceCount());
    for (int i = 0; i < c.count; ++i) {
      unsigned short id = 0, type = 0;
      EXPECT_EQ(1, d.GetServiceInfo(i, id, type));
      EXPECT_EQ((c.body[3 * i] << 8) | c.body[3 * i + 1], id);
      EXPECT_EQ(c.body[3 * i + 2], type);
    }
    // An index outside the list traces and zeroes both outputs.
    for (int index : {-1, c.count}) {
      recorder.Clear();
      unsigned short id = 0xAAAA, type = 0xBBBB;
      EXPECT_EQ(0, d.GetServiceInfo(index, id, type));
      EXPECT_EQ(0, id | type);
      EXPECT_EQ(At(kWarning, {"Invalid Array Index! aIndex=[" + std::to_string(index) + "], array len=[" +
                                  std::to_string(c.count) + "]\n"}),
                recorder.Lines());
    }
  }
}

TEST(ServiceDescriptor, ReadsBothNamesAndLeavesEmptyOnesNull) {
  struct Case {
    Bytes body;
    const char* provider;
    const char* name;
  } cases[] = {
      {Bytes{0x01, 3, 'A', 'B', 'C', 2, 'T', 'V'}, "ABC", "TV"}, {Bytes{0x01, 0, 2, 'T', 'V'}, nullptr, "TV"},
      {Bytes{0xC0, 3, 'A', 'B', 'C', 0}, "ABC", nullptr},
      // Control codes and 8-bit text are kept byte for byte.
      {Bytes{0x01, 2, 0x1B, 0x7C, 1, 0xE9}, "\x1B\x7C", "\xE9"},
  };
  auto text = [](const char* t) { return t ? std::string(t) : std::string("(none)"); };
  for (const Case& c : cases) {
    Bytes raw = Descriptor(0x48, c.body);
    RavelCServiceDescriptor d(raw.data());
    EXPECT_EQ(c.body[0], d.GetServiceType());
    EXPECT_EQ(text(c.provider), text(d.GetServiceProviderName()));
    EXPECT_EQ(text(c.name), text(d.GetServiceName()));
  }
}

// Linkage, stream identifier, system management and type-1 logo refusals are in
// the descriptor pattern table, which compares with an object built over nothing;
// a refused linkage parse also zeroes what an earlier parse read.
TEST(LinkageDescriptor, RefusedParseZeroesEveryField) {
  Bytes raw = Descriptor(0x4A, Cat({U16(0x7ED0), U16(1), U16(0x4800), Bytes{0x02}}));
  Bytes foreign = Descriptor(0x42, Bytes{1, 2, 3, 4, 5, 6, 7});
  RavelCLinkageDescriptor d(raw.data());
  d.ParseRawData(foreign.data());
  EXPECT_EQ(Dump({"\tTransportStreamId=[0x0000], OrginalNetworkId=[0x0000], ServiceId=[0x0000], LinkageType=[0x00]\n"}),
            BodyLines(d));
}

TEST(ServiceDescriptorFailure, TsInfoZeroesOnNullOnlyAndTheOthersKeepScalarsButNotLists) {
  Bytes foreign = Descriptor(0x42, Bytes{0x01, 0x02, 0x03, 0x04, 0x05, 0x06, 0x07});
  Bytes tsRaw = Descriptor(0xCD, Cat({Bytes{0x05, (1 << 2) | 1}, Text("A"), Bytes{0x0F, 1}, U16(0x4800)}));
  Bytes terrRaw = Descriptor(0xFA, Cat({Bytes{0x80, 0x1B}, U16(0x1234)}));
  Bytes broadcasterRaw = Descriptor(0xCE, Bytes{0x1F, 0x01, 0x23, 0x21, 0x0A, 0x0B, 0x7E, 0xD0, 0x05});
  Bytes logoTextRaw = Descriptor(0xCF, Bytes{0x03, 'a', 'b'});
  for (bool useNull : {false, true}) {
    SCOPED_TRACE(useNull ? "null" : "foreign tag");
    unsigned char* bad = useNull ? nullptr : foreign.data();
    TraceRecorder recorder;
    // The TS information descriptor zeroes its key id and its record count on
    // null only: a foreign tag keeps both, with the records they count. The name
    // is released either way.
    RavelCTSInformationDescriptor ts(tsRaw.data());
    EXPECT_EQ(kRavelErrInvalidArgument, ts.ParseRawData(bad));
    EXPECT_STREQ("", ts.GetTsName());
    if (useNull) {
      EXPECT_EQ(0, ts.GetRemoteControlKeyId());
      EXPECT_EQ(0, ts.GetTransmissionTypeCount());
      EXPECT_EQ(0, ts.cTxTypes[0].GetNumOfService());
      EXPECT_EQ(nullptr, ts.cTxTypes[0].pServiceIds);
    } else {
      EXPECT_EQ(Dump({Banner("TS Information Descriptor"), BaseLine(0x42, 7, "Unknown Descriptor"),
                      "\tRemote Control Key Id=[0x05], Ts Name=[], Tx Type Count=[1]\n",
                      "\t\tTramsmission Type Info=[0x0f], Num of Service=[1]\n", "\t\t\tTS Info: Service Id=[0x4800]\n"}),
                ShowLines(ts));
    }

    // The others keep their scalar fields and lose their texts and lists.
    RavelCTerrDeliverySystemDescriptor terr(terrRaw.data());
    EXPECT_EQ(kRavelErrInvalidArgument, terr.ParseRawData(bad));
    EXPECT_EQ((std::vector<int>{0x801, 0}), (std::vector<int>{terr.GetAreaCode(), terr.GetFrequencyCount()}));
    EXPECT_EQ(nullptr, terr.pFrequencies);
    RavelCExtendedBroadcasterDescriptor b(broadcasterRaw.data());
    EXPECT_EQ(kRavelErrInvalidArgument, b.ParseRawData(bad));
    EXPECT_EQ((std::vector<int>{1, 0x0123, 0, 0, 0, 0, 0}),
              (std::vector<int>{b.GetBroadcasterType(), b.GetTerrestrialBroadcasterId(), b.GetNumberOfAffiliationIds(),
                                b.GetNumberOfBroadcasterIds(), b.GetAffiliationId(0), b.GetOriginalNetworkId(0),
                                b.GetBroadcasterId(0)}));
    RavelCLogoTransmissionDescriptor logoText(logoTextRaw.data());
    EXPECT_EQ(kRavelErrInvalidArgument, logoText.ParseRawData(bad));
    EXPECT_EQ(3, logoText.GetLogoTransmissionType());
    EXPECT_EQ(nullptr, logoText.GetLogoCharacters());
    EXPECT_EQ(0, logoText.GetLogoCharactersLength());
  }
}

TEST(TSInformationDescriptor, RecordsFollowEachOtherAndAFourthNeverFills) {
  // Count 3 (the most two bits can hold); the records are 2, 4 and 6 bytes long.
  // The section's next bytes would make a fourth record.
  Bytes section = InSection(Descriptor(0xCD, Cat({Bytes{0x07, (2 << 2) | 3}, Text("NM"), Bytes{0x01, 0}, Bytes{0x02, 1},
                                                  U16(0x0101), Bytes{0x03, 2}, U16(0x0201), U16(0x0202)})),
                            Bytes{0x04, 1, 0x44, 0x44});
  RavelCTSInformationDescriptor d(DescriptorIn(section));
  ASSERT_EQ(3, d.GetTransmissionTypeCount());
  struct Expected {
    unsigned char info;
    std::vector<unsigned short> ids;
  } expected[] = {{0x01, {}}, {0x02, {0x0101}}, {0x03, {0x0201, 0x0202}}, {0x00, {}}};
  for (int i = 0; i < 4; ++i) {
    RavelCTxType* record = d.GetTxType(i);
    ASSERT_NE(nullptr, record);
    EXPECT_EQ(expected[i].info, record->GetTransmissionTypeInfo()) << i;
    ASSERT_EQ(expected[i].ids.size(), record->GetNumOfService());
    for (size_t j = 0; j < expected[i].ids.size(); ++j) EXPECT_EQ(expected[i].ids[j], record->GetServiceId(j));
  }
  EXPECT_EQ(nullptr, d.GetTxType(4));
  EXPECT_EQ(nullptr, d.GetTxType(-1));

  // A later descriptor with one record leaves the other three empty.
  Bytes one = Descriptor(0xCD, Cat({Bytes{0x01, (0 << 2) | 1}, Bytes{0x09, 1}, U16(0x0909)}));
  EXPECT_EQ(kRavelOk, d.ParseRawData(one.data()));
  EXPECT_STREQ("", d.GetTsName());
  EXPECT_EQ(0x0909, d.cTxTypes[0].GetServiceId(0));
  for (int i = 1; i < 4; ++i) {
    EXPECT_EQ(0, d.cTxTypes[i].GetTransmissionTypeInfo() | d.cTxTypes[i].GetNumOfService()) << i;
    EXPECT_EQ(nullptr, d.cTxTypes[i].pServiceIds) << i;
  }
}

TEST(TxType, IndexOutsideTheIdsPanicsAndGivesZero) {
  Bytes raw{0x0F, 2, 0x48, 0x00, 0x48, 0x01};
  RavelCTxType record(raw.data());
  RavelCTxType empty(nullptr);
  struct Case {
    RavelCTxType* record;
    int index;
  } cases[] = {{&record, -1}, {&record, 2}, {&empty, 0}};
  for (const Case& c : cases) {
    TraceRecorder recorder;
    EXPECT_EQ(0, c.record->GetServiceId(c.index)) << c.index;
    EXPECT_EQ(1, recorder.PanicCount());
    EXPECT_EQ("SectionParser/source/Ravel_CTxType", recorder.LastPanicFile());
    EXPECT_TRUE(recorder.Lines().empty());
  }
  EXPECT_EQ(kRavelErrInvalidArgument, record.ParseRawData(nullptr));
  EXPECT_EQ(0, record.GetTransmissionTypeInfo() | record.GetNumOfService());
}

TEST(ExtendedBroadcasterDescriptor, FifteenOfEachStayInsideTheArrays) {
  // 15 affiliation ids read from every second byte (29 bytes spanned), then 15
  // broadcaster entries from 15 bytes after the first affiliation id.
  Bytes body{0x1F, 0x00, 0x01, 0xFF};
  for (int i = 0; i < 15 + 45 + 15; ++i) body.push_back(static_cast<uint8_t>(i));
  Bytes raw = Descriptor(0xCE, body);
  RavelCExtendedBroadcasterDescriptor d(raw.data());
  ASSERT_EQ(15, d.GetNumberOfAffiliationIds());
  ASSERT_EQ(15, d.GetNumberOfBroadcasterIds());
  for (int i = 0; i < 15; ++i) {
    EXPECT_EQ(2 * i, d.GetAffiliationId(i)) << i;
    EXPECT_EQ(((15 + 3 * i) << 8) | (16 + 3 * i), d.GetOriginalNetworkId(i)) << i;
    EXPECT_EQ(17 + 3 * i, d.GetBroadcasterId(i)) << i;
  }
  // The sixteenth slots are never written.
  EXPECT_EQ(0, d.aAffiliationIds[15]);
  EXPECT_EQ(0, d.aOriginalNetworkIds[15]);
  EXPECT_EQ(0, d.aBroadcasterIds[15]);
  EXPECT_EQ(0, d.GetAffiliationId(16));
  EXPECT_EQ(0, d.GetOriginalNetworkId(-1));
}

TEST(LogoTransmissionDescriptor, DecodesEachTransmissionType) {
  struct Case {
    Bytes body;
    unsigned short logoId;
    std::vector<std::string> lines;
  } cases[] = {
      {Bytes{0x02, 0xFE, 0x07}, 0x007, {"\tLogoTransmission Type=[0x02]\n", "\tLogo version=[0]\n", "\tDownload ID=[0]\n"}},
      {Bytes{0x03, 'L', 'O', 'G', 'O'}, 0, {"\tLogoTransmission Type=[0x03]\n", "\tLogo Char String=[LOGO]\n"}},
      {Bytes{0x03}, 0, {"\tLogoTransmission Type=[0x03]\n", "\tLogo Char String=[]\n"}},
      {Bytes{0x07, 0xFF, 0xFF, 0xFF, 0xFF}, 0,
       {"\tLogoTransmission Type=[0x07]\n", "\tLogo version=[0]\n", "\tDownload ID=[0]\n"}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(static_cast<int>(c.body.size()));
    Bytes raw = Descriptor(0xCF, c.body);
    // Parsed over a type-1 descriptor first: nothing of it may remain.
    Bytes first = Descriptor(0xCF, Bytes{0x01, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF});
    RavelCLogoTransmissionDescriptor d(first.data());
    EXPECT_EQ(kRavelOk, d.ParseRawData(raw.data()));
    EXPECT_EQ(c.logoId, d.GetLogoId());
    EXPECT_EQ(c.body[0] == 3, d.GetLogoCharacters() != nullptr);
    EXPECT_EQ(c.body[0] == 3 ? static_cast<int>(c.body.size()) - 1 : 0, d.GetLogoCharactersLength());
    EXPECT_EQ(Dump(c.lines), BodyLines(d));
  }
  // Length 0: the type is the byte after the descriptor, and type 3 then holds no characters.
  Bytes empty = Cat({Descriptor(0xCF, Bytes()), Bytes{0x03}});
  RavelCLogoTransmissionDescriptor d(empty.data());
  EXPECT_EQ(3, d.GetLogoTransmissionType());
  EXPECT_STREQ("", d.GetLogoCharacters());
  EXPECT_EQ(0, d.GetLogoCharactersLength());
}

TEST(LogoTransmissionDescriptor, CopiesTheCharactersUpToTheirFirstZeroByte) {
  // The characters are the length - 1 bytes after the type, whatever follows.
  // Like every owned text, copies duplicate them as a C text: a 0 byte among
  // them ends the copy, and the rest of the copy's characters are 0.
  struct Case {
    Bytes characters;
    Bytes copied;
  } cases[] = {
      {Bytes{'a', 'b', 'c'}, Bytes{'a', 'b', 'c'}}, {Bytes{'a', 0x00, 'c', 'd'}, Bytes{'a', 0x00, 0x00, 0x00}},
  };
  for (const Case& c : cases) {
    Bytes raw = Cat({Descriptor(0xCF, Cat({U8(0x03), c.characters})), Bytes{'X', 'Y', 'Z'}});
    std::unique_ptr<RavelCLogoTransmissionDescriptor> source(new RavelCLogoTransmissionDescriptor(raw.data()));
    RavelCLogoTransmissionDescriptor constructed(*source);
    Bytes other = Descriptor(0xCF, Bytes{0x03, 'z'});
    RavelCLogoTransmissionDescriptor assigned(other.data());
    assigned = *source;
    const int count = static_cast<int>(c.characters.size());
    ASSERT_EQ(count, source->GetLogoCharactersLength());
    EXPECT_EQ(c.characters, Bytes(source->GetLogoCharacters(), source->GetLogoCharacters() + count));
    EXPECT_EQ(0, source->GetLogoCharacters()[count]);
    source.reset();
    for (RavelCLogoTransmissionDescriptor* copy : {&constructed, &assigned}) {
      ASSERT_EQ(count, copy->GetLogoCharactersLength());
      EXPECT_EQ(c.copied, Bytes(copy->GetLogoCharacters(), copy->GetLogoCharacters() + count));
      EXPECT_EQ(0, copy->GetLogoCharacters()[count]);
    }
  }
}

// The area, guard interval and mode bits are walked below.
TEST(TerrDeliverySystemDescriptor, CountsWholeFrequenciesAndPanicsOutsideThem) {
  struct Case {
    Bytes body;
    std::vector<unsigned short> frequencies;
  } cases[] = {
      {Cat({Bytes{0x80, 0x1B}, U16(0x1234), U16(0x0D4A)}), {0x1234, 0x0D4A}}, {Bytes{0xFF, 0xF4}, {}},
      {Bytes{0x12, 0x38, 0x99}, {}},  // a lone byte is no frequency
      {Cat({Bytes{0x00, 0x01}, U16(0x0100), U8(0x55)}), {0x0100}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.body.size());
    Bytes raw = Descriptor(0xFA, c.body);
    RavelCTerrDeliverySystemDescriptor d(raw.data());
    const int count = static_cast<int>(c.frequencies.size());
    ASSERT_EQ(count, d.GetFrequencyCount());
    for (int i = 0; i < count; ++i) EXPECT_EQ(c.frequencies[i], d.GetFrequency(i));
    RavelCTerrDeliverySystemDescriptor copy(d);  // its own array, or none at all
    EXPECT_EQ(count == 0, copy.pFrequencies == 0);
    for (int i = 0; i < count; ++i) EXPECT_EQ(c.frequencies[i], copy.GetFrequency(i));
    for (int index : {-1, count}) {
      TraceRecorder recorder;
      EXPECT_EQ(0, d.GetFrequency(index)) << index;
      EXPECT_EQ(1, recorder.PanicCount());
      EXPECT_EQ("SectionParser/source/Ravel_CDescriptorTerrDeliverySystem", recorder.LastPanicFile());
      EXPECT_TRUE(recorder.Lines().empty());
    }
  }
  // A descriptor of length 0 still reads the two area bytes and counts (0 - 2) / 2 = -1.
  Bytes zero = Cat({Descriptor(0xFA, Bytes()), Bytes{0x80, 0x10}});
  RavelCTerrDeliverySystemDescriptor d(zero.data());
  EXPECT_EQ(Dump({"\tArea Code=[0x0801], Guard Interval=[0x00], Tx Mode=[0x00], Num Of Freq=[-1]\n"}), BodyLines(d));
}

TEST(TerrDeliverySystemDescriptor, RegionOfTheAreaCodesStateUnderEachStandard) {
  const std::string unknown = "Unknown State! Area Code=[0x%x], State=[0]\n";
  struct Case {
    unsigned short area;  // state in the top five bits
    int region;
  } cases[] = {{0x000, 0}, {0x080, 4}, {0x27F, 4}, {0x280, 2}, {0x801, 2}, {0x880, 3}, {0xBFF, 3},
               {0xC00, 5}, {0xC80, 5}, {0xD00, 3}, {0xD80, 0}, {0xE00, 0}};
  for (const Case& c : cases) {
    SCOPED_TRACE(c.area);
    Bytes raw = Descriptor(0xFA, Bytes{static_cast<uint8_t>(c.area >> 4), static_cast<uint8_t>((c.area & 0xF) << 4)});
    RavelCTerrDeliverySystemDescriptor d(raw.data());
    TraceLines expected;
    char text[80];
    std::snprintf(text, sizeof(text), unknown.c_str(), c.area);
    if (c.area == 0xD80) expected = {{kWarning, "State Id[27]: But the region id of ths state isn't specified by ABNT!\n"}};
    if (c.region == 0 && c.area != 0xD80) expected = {{kWarning, text}};
    for (int standard : {static_cast<int>(RAVEL_STANDARD_BRAZIL), 2}) {  // any value but 1 selects the Brazilian table
      StandardScope scope(standard);
      TraceRecorder recorder;
      EXPECT_EQ(c.region, d.GetRegionId());
      EXPECT_EQ(expected, recorder.Lines());
    }
    StandardScope japan(RAVEL_STANDARD_JAPAN);
    TraceRecorder recorder;
    EXPECT_EQ(0, d.GetRegionId());
    EXPECT_TRUE(recorder.Lines().empty());
  }
}

TEST(PartialReceptionDescriptor, KeepsOnlyTheHighByteOfEachServiceId) {
  struct Case {
    Bytes descriptor;  // with whatever follows it
    std::vector<unsigned short> ids;
  } cases[] = {
      {Descriptor(0xFB, Cat({U16(0x1234), U16(0x5678)})), {0x12, 0x56}}, {Descriptor(0xFB, Bytes()), {}},
      // An odd length takes its last byte as one more id.
      {Cat({Descriptor(0xFB, Bytes{0x12, 0x34, 0x56}), Bytes{0x78, 0x9A}}), {0x12, 0x56}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.descriptor.size());
    Bytes raw = c.descriptor;
    RavelCPartialReceptionDescriptor d(raw.data());
    ASSERT_EQ(static_cast<int>(c.ids.size()), d.GetServiceIdCount());
    for (size_t i = 0; i < c.ids.size(); ++i) EXPECT_EQ(c.ids[i], d.GetServiceId(i));
    EXPECT_EQ(0xFFFF, d.GetServiceId(d.GetServiceIdCount()));
  }
  // A negative index is left to the array's bounds check.
  Bytes raw = Descriptor(0xFB, Cat({U16(0x1234), U16(0x5678)}));
  RavelCPartialReceptionDescriptor d(raw.data());
  ExpectBoundPanic(-1, 2, [&](int i) { return d.GetServiceId(i); });
}

// ---------------------------------------------------------------------------
// Every wire bit of the fixed fields, one at a time

namespace {

const bitwalk::Reader LogoFields =
    RAVEL_WALK_READER(RavelCLogoTransmissionDescriptor, d.GetLogoId(), d.GetLogoVersion(), d.GetDownloadDataId());

}  // namespace

// The other fixed fields are pinned by their Show lines in the descriptor pattern
// table and by the classes' own tests above.
TEST(ServiceDescriptorBits, OneSetBitChangesOnlyTheFieldsItBelongsTo) {
  const bitwalk::Walk walks[] = {
      {"logo transmission type 1", Base({0xCF, 7, 0x01}, 9), 24, 72,
       {{"logo id", {{31, 9}}}, {"logo version", {{44, 12}}}, {"download data id", {{56, 16}}}}, LogoFields},
      {"logo transmission type 2", Base({0xCF, 7, 0x02}, 9), 24, 72,
       {{"logo id", {{31, 9}}}, {"logo version", {}}, {"download data id", {}}}, LogoFields},
      {"terrestrial delivery system", Base({0xFA, 2}, 4), 16, 32,
       {{"area code", {{16, 12}}}, {"guard interval", {{28, 2}}}, {"transmission mode", {{30, 2}}}},
       RAVEL_WALK_READER(RavelCTerrDeliverySystemDescriptor, d.GetAreaCode(), d.GetGuardInterval(),
                         d.GetTransmissionMode())},
      // The flag is the two lowest bits, inside the identifier; the two top bits
      // of the byte are read by nobody.
      {"system management", Base({0xFE, 2}, 4), 16, 32, {{"broadcasting flag", {{22, 2}}},
        {"broadcasting identifier", {{18, 6}}}, {"additional broadcasting identification", {{24, 8}}}},
       RAVEL_WALK_READER(RavelCSystemManagementDescriptor, d.GetBroadcastingFlag(), d.GetBroadcastingIdentifier(),
                         d.GetAdditionalBroadcastingIdentification())},
  };
  RunWalks(walks);
}
