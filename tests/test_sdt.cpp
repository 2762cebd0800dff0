// Service description table: services, their descriptors, merge, copies and dump.
#include <gtest/gtest.h>

#include <cstdio>
#include <memory>
#include <string>
#include <vector>

#include "Ravel_CTableSDT.h"
#include "Ravel_ResultCode.h"
#include "StreamBuilder.h"
#include "TableChecks.h"
#include "TestHelpers.h"
#include "TraceRecorder.h"

using namespace th;

namespace {

struct ServiceDef {
  uint16_t serviceId;
  uint8_t eitUserDefined;  // 3 bits
  bool schedule, presentFollowing;
  uint8_t runningStatus;  // 3 bits
  bool freeCA;
  std::vector<Bytes> descriptors;
};

Bytes ServiceEntry(const ServiceDef& s) {
  Bytes entry = sb::U16(s.serviceId);
  sb::Append(entry, sb::U8(0xE0 | (s.eitUserDefined << 2) | (s.schedule ? 2 : 0) | (s.presentFollowing ? 1 : 0)));
  sb::Append(entry, sb::DescriptorLoop(s.descriptors, static_cast<uint8_t>((s.runningStatus << 1) | (s.freeCA ? 1 : 0))));
  return entry;
}

// A service with the flags of a running free service: only id and descriptors vary.
ServiceDef Service(uint16_t id, const std::vector<Bytes>& descriptors = {}) { return {id, 0, true, true, 4, false, descriptors}; }

sb::SectionOptions SdtOptions(uint8_t tableId = 0x42, uint8_t version = 2, uint16_t transportStreamId = 0x7ED0) {
  sb::SectionOptions options;
  options.tableId = tableId;
  options.tableIdExtension = transportStreamId;
  options.version = version;
  return options;
}

Bytes SdtBody(uint16_t originalNetworkId, const std::vector<ServiceDef>& services) {
  Bytes body = sb::Cat({sb::U16(originalNetworkId), sb::U8(0xFF)});
  for (const ServiceDef& s : services) sb::Append(body, ServiceEntry(s));
  return body;
}

Bytes SdtSection(const std::vector<ServiceDef>& services, uint8_t tableId = 0x42, uint8_t version = 2,
                 uint16_t originalNetworkId = 0x0640) {
  return sb::LongSection(SdtOptions(tableId, version), SdtBody(originalNetworkId, services));
}

Bytes ServiceDescriptor(uint8_t type, const std::string& provider, const std::string& name) {
  return sb::Descriptor(0x48, sb::Cat({sb::U8(type), sb::U8(provider.size()), sb::Text(provider), sb::U8(name.size()),
                                       sb::Text(name)}));
}
Bytes LogoType1(uint16_t logoId, uint16_t version, uint16_t downloadId) {
  return sb::Descriptor(0xCF, sb::Cat({sb::U8(1), sb::U16(0xFE00 | logoId), sb::U16(0xF000 | version), sb::U16(downloadId)}));
}
Bytes CountryAvailability(const std::string& codes) { return sb::Descriptor(0x49, sb::Cat({sb::U8(0xFF), sb::Text(codes)})); }

std::vector<unsigned int> ServiceIdsOf(RavelCSDT& sdt) {
  std::vector<unsigned int> ids;
  for (int i = 0; i < sdt.GetServiceCount(); ++i) ids.push_back(sdt.GetServiceDescription(i)->GetServiceId());
  return ids;
}

// The descriptors a service holds: "service:NAME logo:ID countries:N", each part when present.
std::string Kept(RavelCServiceDescription& service) {
  std::string kept;
  if (service.GetService()) kept += "service:" + std::string(service.GetService()->GetServiceName());
  if (service.GetLogoTransmission()) kept += " logo:" + std::to_string(service.GetLogoTransmission()->GetLogoId());
  if (service.GetCountryAvailability()) {
    kept += " countries:" + std::to_string(service.GetCountryAvailability()->GetNumOfCountryCodes());
  }
  return kept.size() && kept[0] == ' ' ? kept.substr(1) : kept;
}

}  // namespace

// The entry constructor's initial flag values are never seen: every parse,
// a null one included, writes all of them.
TEST(ServiceDescription, DecodesFlagsFromTheirOwnBitsAndKeepsTheLastOfEachDescriptor) {
  struct Case {
    const char* label;
    Bytes entry;
    int result;
    std::vector<int> fields;  // id, EIT company flag, schedule, present/following, running, free CA, loop length
    std::string kept;
  } cases[] = {
      {"all flags set", Bytes{0x48, 0x00, 0xFF, 0xF0, 0x00}, kRavelOk, {0x4800, 7, 1, 1, 7, 1, 0}, ""},
      {"each flag alone", Bytes{0x49, 0x80, 0xE5, 0x30, 0x00}, kRavelOk, {0x4980, 1, 0, 1, 1, 1, 0}, ""},
      {"reserved bits clear", Bytes{0xFF, 0xFF, 0x1E, 0x40, 0x00}, kRavelOk, {0xFFFF, 7, 1, 0, 2, 0, 0}, ""},
      // A loop of 0xF03 bytes: one descriptor of 3 bytes, fifteen of 256.
      {"a 12-bit loop length", sb::Cat({Bytes{0x12, 0x34, 0xE2, 0xFF, 0x03, 0xC1, 0x01, 0x84}, Bytes(15 * 256, 0xFF)}),
       kRavelOk, {0x1234, 0, 1, 0, 7, 1, 0xF03}, ""},
      {"all three kept",
       ServiceEntry(Service(0x4800, {ServiceDescriptor(1, "", "A"), LogoType1(3, 1, 2), CountryAvailability("BRA")})),
       kRavelOk, {0x4800, 0, 1, 1, 4, 0, 21}, "service:A logo:3 countries:1"},
      {"later logo and country replace earlier ones",
       ServiceEntry(Service(0x4801, {LogoType1(3, 1, 2), CountryAvailability("BRA"), LogoType1(9, 1, 2),
                                     CountryAvailability("JPNBRA")})),
       kRavelOk, {0x4801, 0, 1, 1, 4, 0, 33}, "logo:9 countries:2"},
      {"length 0 clears everything read",
       ServiceEntry(Service(0x4802, {ServiceDescriptor(1, "", "A"), LogoType1(3, 1, 2), sb::Descriptor(0x49, {})})),
       kRavelErrCorruptSection, {0, 0, 0, 0, 0, 0, 0}, ""},
      {"null", Bytes(), kRavelErrInvalidArgument, {0, 0, 0, 0, 0, 0, 0}, ""},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes entry = c.entry;
    RavelCServiceDescription service(nullptr);
    EXPECT_EQ(c.result, service.ParseRawData(entry.empty() ? nullptr : entry.data()));
    EXPECT_EQ(c.fields, (std::vector<int>{service.GetServiceId(), service.GetEITCompanyDefFlag(),
                                           service.GetEITScheduleFlag(), service.GetEITPresentFollowingFlag(),
                                           service.GetRunningStatus(), service.GetFreeCAMode(),
                                           service.GetDescriptorsLoopLength()}));
    EXPECT_EQ(c.kept, Kept(service));
  }
}

TEST(SDTParse, NamesActualAndOtherAndRefusesEverythingElse) {
  const std::vector<ServiceDef> services = {Service(0x4800, {ServiceDescriptor(0x01, "", "TV")})};
  Bytes actual = SdtSection(services, 0x42);
  Bytes other = SdtSection(services, 0x46);
  for (Bytes* section : {&actual, &other}) {
    RavelCSDT sdt(nullptr);
    EXPECT_EQ(kRavelOk, sdt.ParseRawData(section->data()));
    EXPECT_STREQ(section == &actual ? "SDT Actual" : "SDT Other", sdt.sTableName.GetString());
    EXPECT_EQ(1, sdt.GetServiceCount());
    EXPECT_EQ(0x0006, sdt.GetOriginalNetworkId());
  }
  Bytes nitId = SdtSection(services, 0x40);
  sb::SectionOptions badCrcOptions = SdtOptions(0x42, 9, 0x1111);
  badCrcOptions.corruptCrc = true;
  Bytes badCrc = sb::LongSection(badCrcOptions, SdtBody(0x0640, services));
  badCrcOptions.tableId = 0x4A;
  Bytes bothBad = sb::LongSection(badCrcOptions, SdtBody(0x0640, services));
  // Only a new match replaces the name; a foreign table_id is stored.
  tc::ExpectRefusals<RavelCSDT>(actual, tc::Refusals("SDT", badCrc, nitId, "0x40", bothBad),
                                [&](RavelCSDT& sdt, const tc::Refusal& r, TraceRecorder&) {
                                  EXPECT_STREQ("SDT Actual", sdt.sTableName.GetString());
                                  EXPECT_EQ(r.section == &nitId ? 0x40 : 0x42, sdt.iTableId);
                                  EXPECT_EQ(0, sdt.GetServiceCount());
                                  EXPECT_EQ(0, sdt.GetOriginalNetworkId());
                                });
}

// The loop runs from byte 11 to the first CRC_32 byte.
TEST(SDTServiceLoop, KeepsServiceLogoAndCountryDescriptorsAndFailsTheSectionOnAMalformedOne) {
  const TraceLines::value_type infoFail = {kWarning, "SDT Info Parsing Fail! Maybe data has been corrupted!\n"};
  const TraceLines::value_type copyControl = {kWarning,
                                              "SDT ServiceDescription Parsing.. Digital Copy Control Descriptor Tag=[0xc1]\n"};
  struct Case {
    const char* label;
    Bytes body;
    int result;
    TraceLines traces;
    std::vector<std::string> kept;  // service id, then what it holds
  } cases[] = {
      {"section_length 12: no service", SdtBody(0x0640, {}), kRavelOk, {}, {}},
      {"copy control and unknown tags are traced and skipped",
       SdtBody(0x0640, {Service(0x4800, {sb::Descriptor(0xC1, {0x84}), ServiceDescriptor(0x01, "P", "One"),
                                         sb::Descriptor(0xC2, {0})})}),
       kRavelOk,
       {copyControl, {kWarning, "SDT ServiceDescription Parsing.. Unknown Descriptor Tag=[0xc2]\n"}},
       {"4800 service:One"}},
      {"a later service descriptor replaces the earlier one, silently",
       SdtBody(0x0640, {Service(0x4800, {ServiceDescriptor(0x01, "", "First"), ServiceDescriptor(0x02, "", "Second")})}),
       kRavelOk, {}, {"4800 service:Second"}},
      {"services in section order, with and without descriptors",
       SdtBody(0x0640, {Service(0x4980, {ServiceDescriptor(0xC0, "", "Seg")}), Service(0x4800),
                        Service(0x4801, {LogoType1(5, 6, 7)})}),
       kRavelOk, {}, {"4980 service:Seg", "4800 ", "4801 logo:5"}},
      {"a service whose loop length reaches past the end is the last one",
       sb::Cat({SdtBody(0x0640, {Service(0x0101)}), sb::U16(0x0102), sb::U8(0xE3), sb::Length12(0x30, 0x8), sb::U8(0xC1),
                sb::U8(0x2E)}),
       kRavelOk, {copyControl}, {"0101 ", "0102 "}},
      {"length 0 in the second service drops the first as well",
       SdtBody(0x0640, {Service(0x4800, {ServiceDescriptor(0x01, "", "One")}),
                        Service(0x4801, {LogoType1(1, 2, 3), sb::Descriptor(0xC1, {})})}),
       kRavelErrCorruptSection, {{kWarning, Invalid(0xC1, 0)}, infoFail}, {}},
      {"a stray byte before the CRC_32 starts a service that reads into it",
       sb::Cat({SdtBody(0x0640, {Service(0x0101)}), sb::U8(0x01)}), kRavelOk, {}, {"0101 ", "012c "}},
      {"tag 0 fails the section", SdtBody(0x0640, {Service(0x4800, {sb::Descriptor(0x00, {0x01})})}),
       kRavelErrCorruptSection, {{kWarning, Invalid(0x00, 1)}, infoFail}, {}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes section = sb::LongSection(SdtOptions(), c.body);
    RavelCSDT sdt(nullptr);
    TraceRecorder recorder;
    EXPECT_EQ(c.result, sdt.ParseRawData(section.data()));
    EXPECT_EQ(c.traces, recorder.Lines());
    std::vector<std::string> kept;
    for (int i = 0; i < sdt.GetServiceCount(); ++i) {
      char id[8];
      std::snprintf(id, sizeof(id), "%04x ", sdt.GetServiceDescription(i)->GetServiceId());
      kept.push_back(id + Kept(*sdt.GetServiceDescription(i)));
    }
    EXPECT_EQ(c.kept, kept);
    EXPECT_EQ(c.result == kRavelOk ? 0x0006 : 0, sdt.GetOriginalNetworkId());
    EXPECT_STREQ("SDT Actual", sdt.sTableName.GetString());
  }
}

TEST(SDTMerge, AppendsCopiesOfTheOthersServicesOnlyWhenTheVersionsMatch) {
  Bytes first = SdtSection({Service(0x4800, {ServiceDescriptor(0x01, "", "One")}), Service(0x4801)}, 0x42, 5, 0x7ED0);
  Bytes sameVersion = SdtSection({Service(0x4980, {ServiceDescriptor(0xC0, "", "Seg"), LogoType1(3, 4, 5)}),
                                  Service(0x4800)},
                                 0x46, 5, 0x0640);
  Bytes otherVersion = SdtSection({Service(0x4990)}, 0x42, 6, 0x7ED0);
  RavelCSDT target(first.data());
  std::unique_ptr<RavelCSDT> other(new RavelCSDT(sameVersion.data()));
  RavelCSDT refused(otherVersion.data());
  TraceRecorder recorder;
  EXPECT_EQ(&target, &(target += *other));  // appended, duplicates included
  other.reset();                            // the appended services are the target's own copies
  EXPECT_EQ(&target, &(target += refused));
  EXPECT_EQ((TraceLines{{kError, "Two SDT Information have different information! first one=[5], second one=[6]\n"}}),
            recorder.Lines());
  target += target;  // doubled once
  EXPECT_EQ((std::vector<unsigned int>{0x4800, 0x4801, 0x4980, 0x4800, 0x4800, 0x4801, 0x4980, 0x4800}),
            ServiceIdsOf(target));
  EXPECT_STREQ("SDT Actual", target.sTableName.GetString());
  EXPECT_EQ(0x7E, target.GetOriginalNetworkId());
  EXPECT_EQ(0x7ED0, target.iTableIdExtension);
}

TEST(SDTCopy, CopiesHeaderNameNetworkIdAndEveryService) {
  Bytes section = SdtSection({Service(0x4980, {ServiceDescriptor(0xC0, "", "Seg"), CountryAvailability("BRA")}),
                              Service(0x4800)},
                             0x46, 3, 0x0640);
  Bytes other = SdtSection({Service(0x0001), Service(0x0002), Service(0x0003)}, 0x42, 1, 0x7ED0);
  tc::ExpectCopies<RavelCSDT>(section.data(), other.data(), [](RavelCSDT& t) { t.iSession = 0x11; },
                               [](RavelCSDT& copy, TraceLines expected) {
                                 // The service descriptor's own copy carries no names; all else is the source's.
                                 ASSERT_LT(22u, expected.size());
                                 expected[22].second = "\tService Name=[(null)]\n";
                                 EXPECT_EQ(expected, ShowLines(copy));
                               });
  // Assigning a table to itself clears its services before the copy.
  RavelCSDT self(section.data());
  self = self;
  EXPECT_EQ(0, self.GetServiceCount());
  EXPECT_EQ(0x0006, self.GetOriginalNetworkId());
}

TEST(SDTShow, DumpsHeaderBodyAndEachServiceWithItsDescriptors) {
  Bytes section = SdtSection({ServiceDef{0x4980, 5, false, true, 1, true,
                                         {CountryAvailability("BRA"), LogoType1(3, 0x12, 0x4980),
                                          ServiceDescriptor(0xC0, "Pr", "Seg")}},
                              Service(0x4800)},
                             0x42, 2, 0x0640);
  const std::string frame = Rule(kLongRule);
  const TraceLines head = Dump({frame, "###################### SDT Table Information ######################\n", frame,
                                "####################### Header Information ########################\n"});
  const TraceLines body = Dump({frame, "####################### Body Information #######################\n"});
  RavelCSDT sdt(section.data());
  TraceLines expected = head;
  Add(expected, HeaderLines(0x42, "SDT Actual", 1, section.size() - 3, 0x7ED0, 2, 1, 0, 0));
  Add(expected, body);
  Add(expected, Dump({"Original Network ID = [0x0006]\n",
                      "##################### Service Description [0] #####################\n", "Service ID=[0x4980]\n",
                      "EITCompanyDefFlag=[5]\n", "EITScheduleFlag=[0]\n", "EITPresentFollowingFlag=[1]\n",
                      "Running Status=[1]\n", "FreeCAMode=[1]\n", "Descriptors Loop Len=[25]\n",
                      Banner("Service Descriptor"), BaseLine(0x48, 8, "Service Descriptor"), "\tService Type=[0xc0]\n",
                      "\tService Provider Name=[Pr]\n", "\tService Name=[Seg]\n", Banner("LogoTransmission Descriptor"),
                      BaseLine(0xCF, 7, "Logo Transmission Descriptor"), "\tLogoTransmission Type=[0x01]\n",
                      "\tLogo version=[18]\n", "\tDownload ID=[18816]\n", Banner("Country Availability Descriptor", 21),
                      BaseLine(0x49, 4, "Country Availabilty Descriptor"), "\t Ability flag = 1\n", "\t Codes: \n",
                      "\t    BRA\n", "##################### Service Description [1] #####################\n",
                      "Service ID=[0x4800]\n", "EITCompanyDefFlag=[0]\n", "EITScheduleFlag=[1]\n",
                      "EITPresentFollowingFlag=[1]\n", "Running Status=[4]\n", "FreeCAMode=[0]\n",
                      "Descriptors Loop Len=[0]\n", frame}));
  EXPECT_EQ(expected, ShowLines(sdt));
  RavelCSDT empty(nullptr);
  expected = head;
  Add(expected, EmptyHeaderLines());
  Add(expected, body);
  Add(expected, Dump({"Original Network ID = [0x0000]\n", frame}));
  EXPECT_EQ(expected, ShowLines(empty));
}
