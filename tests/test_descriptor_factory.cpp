// The shared descriptor pattern across every class, and the factory and copier
// over their one tag table.
#include <gtest/gtest.h>

#include <cstdio>
#include <memory>
#include <set>
#include <string>

#include "RavelSectionParser.h"
#include "StreamBuilder.h"
#include "TraceRecorder.h"

namespace {

template <class T>
RavelCDescriptorBase* Make(unsigned char* raw) {
  return new T(raw);
}

struct DescriptorClassCase {
  const char* name;
  const RavelCDescriptorKind* kind;
  RavelCDescriptorBase* (*make)(unsigned char* raw);
};

#define CLASS_CASE(T) \
  { #T, &T::kKind, &Make<T> }

const DescriptorClassCase kAllClasses[] = {
    CLASS_CASE(RavelCApplicationDescriptor),        CLASS_CASE(RavelCApplicationNameDescriptor),
    CLASS_CASE(RavelCAudioComponentDescriptor),     CLASS_CASE(RavelCCRC32Descriptor),
    CLASS_CASE(RavelCComponentDescriptor),          CLASS_CASE(RavelCCompressionTypeDescriptor),
    CLASS_CASE(RavelCContentDescriptor),            CLASS_CASE(RavelCCopyrightDescriptor),
    CLASS_CASE(RavelCCountryAvailabilityDescriptor), CLASS_CASE(RavelCDataComponentDescriptor),
    CLASS_CASE(RavelCEstDownloadTimeDescriptor),    CLASS_CASE(RavelCExtendedBroadcasterDescriptor),
    CLASS_CASE(RavelCExtendedEventDescriptor),      CLASS_CASE(RavelCGeneralEventDescriptor),
    CLASS_CASE(RavelCGingaAppDescriptor),           CLASS_CASE(RavelCGingaAppDataComponentDescriptor),
    CLASS_CASE(RavelCGingaAppLocDescriptor),        CLASS_CASE(RavelCInfoDescriptor),
    CLASS_CASE(RavelCLinkageDescriptor),            CLASS_CASE(RavelCLocalTimeOffsetDescriptor),
    CLASS_CASE(RavelCLocationDescriptor),           CLASS_CASE(RavelCLogoTransmissionDescriptor),
    CLASS_CASE(RavelCModuleLinkDescriptor),         CLASS_CASE(RavelCNPTReferenceDescriptor),
    CLASS_CASE(RavelCNameDescriptor),               CLASS_CASE(RavelCNetworkNameDescriptor),
    CLASS_CASE(RavelCParentalRatingDescriptor),     CLASS_CASE(RavelCPartialReceptionDescriptor),
    CLASS_CASE(RavelCSeriesDescriptor),             CLASS_CASE(RavelCServiceDescriptor),
    CLASS_CASE(RavelCServiceListDescriptor),        CLASS_CASE(RavelCShortEventDescriptor),
    CLASS_CASE(RavelCStreamIdentifierDescriptor),   CLASS_CASE(RavelCSystemManagementDescriptor),
    CLASS_CASE(RavelCTSInformationDescriptor),      CLASS_CASE(RavelCTargetRegionDescriptor),
    CLASS_CASE(RavelCTerrDeliverySystemDescriptor), CLASS_CASE(RavelCTypeDescriptor),
};

// A descriptor with the given tag and length, followed by zeroed room for any read.
Bytes RawDescriptor(uint8_t tag, uint8_t length) {
  Bytes raw(2 + 512, 0);
  raw[0] = tag;
  raw[1] = length;
  return raw;
}

std::string Format(const char* format, unsigned int value) {
  char text[256];
  std::snprintf(text, sizeof(text), format, value);
  return text;
}

const unsigned char kFactoryTags[] = {0x01, 0x02, 0x03, 0x04, 0x05, 0x06, 0x07, 0x40, 0x41,
                                      0x4A, 0x50, 0x52, 0xC2, 0xCD, 0xFA, 0xFD, 0xFE};

}  // namespace

TEST(DescriptorPattern, WrongTagIsReportedFromTheClassAndKeepsTheForeignHeader) {
  for (const DescriptorClassCase& c : kAllClasses) {
    if (c.kind->szWrongTagFormat == nullptr) continue;  // application-loop classes take any tag
    const uint8_t foreign = static_cast<uint8_t>(c.kind->iTag ^ 0x80);
    Bytes raw = RawDescriptor(foreign, 4);
    TraceRecorder recorder;
    std::unique_ptr<RavelCDescriptorBase> d(c.make(raw.data()));
    ASSERT_FALSE(recorder.Records().empty()) << c.name;
    const TraceRecord& last = recorder.Records().back();
    EXPECT_EQ(c.kind->iWrongTagMask, last.mask) << c.name;
    EXPECT_EQ(Format(c.kind->szWrongTagFormat, foreign), last.text) << c.name;
    EXPECT_EQ(std::string(c.kind->szSourcePath), last.file) << c.name;
    EXPECT_EQ(0u, std::string(c.kind->szSourcePath).find("SectionParser/source/Ravel_C")) << c.name;
    EXPECT_EQ(foreign, d->GetDescriptorTag()) << c.name;
    EXPECT_EQ(4, d->GetDescriptorLength()) << c.name;
    EXPECT_STREQ("Unknown Descriptor", d->GetDescriptorName()) << c.name;
    EXPECT_EQ(kRavelErrInvalidArgument, d->ParseRawData(raw.data())) << c.name;
  }
}

TEST(DescriptorPattern, MatchingTagNamesTheDescriptorAndNullLeavesItEmpty) {
  for (const DescriptorClassCase& c : kAllClasses) {
    Bytes raw = RawDescriptor(c.kind->iTag, 0);
    TraceRecorder recorder;
    std::unique_ptr<RavelCDescriptorBase> d(c.make(raw.data()));
    EXPECT_STREQ(c.kind->szDisplayName, d->GetDescriptorName()) << c.name;
    EXPECT_EQ(kRavelOk, d->ParseRawData(raw.data())) << c.name;

    std::unique_ptr<RavelCDescriptorBase> empty(c.make(nullptr));
    EXPECT_EQ(0, empty->GetDescriptorTag()) << c.name;
    EXPECT_EQ(0, empty->GetDescriptorLength()) << c.name;
    EXPECT_STREQ("", empty->GetDescriptorName()) << c.name;
    EXPECT_EQ(kRavelErrInvalidArgument, empty->ParseRawData(nullptr)) << c.name;
    if (c.kind->szBanner == nullptr) continue;
    recorder.Clear();
    empty->Show();
    ASSERT_GE(recorder.Records().size(), 2u) << c.name;
    EXPECT_EQ(c.kind->szBanner, recorder.Records()[0].text) << c.name;
    EXPECT_EQ(std::string(c.kind->szSourcePath), recorder.Records()[0].file) << c.name;
    EXPECT_EQ("\tDescriptor Tag=[0x0], Descriptor Length=[0], Name=[]\n", recorder.Records()[1].text) << c.name;
    EXPECT_EQ(0x10000020u, recorder.Records()[1].mask) << c.name;
  }
}

TEST(DescriptorFactory, FactoryAndCopierAcceptExactlyTheSameSeventeenTags) {
  std::set<unsigned int> expected(std::begin(kFactoryTags), std::end(kFactoryTags));
  int made = 0;
  for (unsigned int tag = 0; tag < 256; ++tag) {
    Bytes raw = RawDescriptor(static_cast<uint8_t>(tag), 0);
    TraceRecorder recorder;
    std::unique_ptr<RavelCDescriptorBase> d(RavelSM_GetDescriptor(raw.data()));
    if (expected.count(tag) == 0) {
      EXPECT_EQ(nullptr, d.get()) << tag;
      ASSERT_EQ(1u, recorder.Records().size()) << tag;
      EXPECT_EQ(0x10000020u, recorder.Records()[0].mask);
      EXPECT_EQ(Format("Unsupoorted descriptor. Tag=[0x%x]\n", tag), recorder.Records()[0].text);
      EXPECT_EQ("SectionParser/source/Ravel_CDescriptors", recorder.Records()[0].file);
      continue;
    }
    ++made;
    ASSERT_NE(nullptr, d.get()) << tag;
    EXPECT_EQ(tag, d->GetDescriptorTag());
    EXPECT_STRNE("Unknown Descriptor", d->GetDescriptorName()) << tag;
    std::unique_ptr<RavelCDescriptorBase> copy(RavelSM_CopyDescriptor(d.get()));
    ASSERT_NE(nullptr, copy.get()) << tag;
    EXPECT_EQ(tag, copy->GetDescriptorTag());
    EXPECT_STREQ(d->GetDescriptorName(), copy->GetDescriptorName());
  }
  EXPECT_EQ(17, made);
}

TEST(DescriptorFactory, SharedTagNumbersYieldTheFactoryClass) {
  struct Case {
    Bytes raw;
    const char* name;
  } cases[] = {
      // A stream event descriptor (tag 0x40 in stream descriptor sections) becomes a network name.
      {sb::Descriptor(0x40, Bytes{0x00, 0x01, 0x00, 0x00, 0x00, 0x00, 0x00, 0x05}), "Network Name Descriptor"},
      // A Ginga application data component becomes a plain data component.
      {sb::Descriptor(0xFD, Bytes{0x00, 0xA0, 0x01}), "Data Component Descriptor"},
  };
  for (Case& c : cases) {
    TraceRecorder recorder;
    std::unique_ptr<RavelCDescriptorBase> d(RavelSM_GetDescriptor(c.raw.data()));
    ASSERT_NE(nullptr, d.get());
    EXPECT_STREQ(c.name, d->GetDescriptorName());
  }
  std::unique_ptr<RavelCDescriptorBase> dc(RavelSM_GetDescriptor(cases[1].raw.data()));
  EXPECT_EQ(0x00A0, static_cast<RavelCDataComponentDescriptor*>(dc.get())->GetDataComponentId());
}

TEST(DescriptorFactory, NullInputAndTagsOutsideTheTableAreRefused) {
  TraceRecorder recorder;
  EXPECT_EQ(nullptr, RavelSM_GetDescriptor(nullptr));
  Bytes service = sb::Descriptor(0x48, Bytes{0x01, 0x00, 0x00});
  RavelCServiceDescriptor source(service.data());
  EXPECT_EQ(nullptr, RavelSM_CopyDescriptor(&source));
  TraceLines expected = {
      {0x80000020u, "RavelSM_GetDescriptor: apRawData is NULL!\n"},
      {0x80000020u, "Unknown Descriptor Tag. Tag=[72]\n"},
  };
  EXPECT_EQ(expected, recorder.Lines());
}

TEST(DescriptorCopier, CopiesOwnTheirDataAndFollowTheHeaderTag) {
  TraceRecorder recorder;
  Bytes list = sb::Descriptor(0x41, Bytes{0x00, 0x10, 0x01, 0x00, 0x11, 0xC0});
  RavelCDescriptorBase* source = RavelSM_GetDescriptor(list.data());
  RavelCDescriptorBase* copy = RavelSM_CopyDescriptor(source);
  delete source;
  RavelCServiceListDescriptor* copied = static_cast<RavelCServiceListDescriptor*>(copy);
  ASSERT_EQ(2, copied->GetServiceCount());
  unsigned short id = 0, type = 0;
  EXPECT_EQ(1, copied->GetServiceInfo(1, id, type));
  EXPECT_EQ(0x0011, id);
  EXPECT_EQ(0xC0, type);
  delete copy;

  // A network name object whose parse refused a service list tag is copied as
  // a service list: the header it holds decides, and it has no entries to give.
  RavelCNetworkNameDescriptor refused(list.data());
  std::unique_ptr<RavelCDescriptorBase> foreign(RavelSM_CopyDescriptor(&refused));
  ASSERT_NE(nullptr, foreign.get());
  EXPECT_EQ(0x41, foreign->GetDescriptorTag());
  EXPECT_EQ(6, foreign->GetDescriptorLength());
  EXPECT_STREQ("Unknown Descriptor", foreign->GetDescriptorName());
  EXPECT_EQ(0, static_cast<RavelCServiceListDescriptor*>(foreign.get())->GetServiceCount());
}
