// TS packet header: field decoding, the packed byte, locations and failures.
#include <gtest/gtest.h>

#include <cstdint>
#include <cstdio>
#include <vector>

#include "Ravel_CTSPacket.h"
#include "Ravel_ResultCode.h"
#include "StreamBuilder.h"
#include "TestHelpers.h"
#include "TraceRecorder.h"

namespace {

const unsigned int kError = th::kError;

// A packet with the given header bytes; byte 4 is `byte4`, the rest a pattern.
Bytes RawPacket(uint8_t b1, uint8_t b2, uint8_t b3, uint8_t byte4 = 0x00, uint8_t sync = 0x47) {
  Bytes p = {sync, b1, b2, b3, byte4};
  for (size_t i = p.size(); i < 188; ++i) p.push_back(static_cast<uint8_t>(i * 7 + 3));
  return p;
}

// Offset of a location in the packet, -1 for null.
long OffsetIn(const Bytes& packet, const unsigned char* at) {
  if (at == nullptr) return -1;
  return static_cast<long>(reinterpret_cast<uintptr_t>(at) - reinterpret_cast<uintptr_t>(packet.data()));
}

// tei, pusi, priority, PID, scrambling, adaptation control, counter, and the
// offsets of the adaptation field and of the payload in `packet` (-1: null).
std::vector<long> Members(const RavelCTSPacket& h, const Bytes& packet) {
  return {h.bTransportErrorIndicator, h.bPayloadUnitStartIndicator, h.bTransportPriority,
          static_cast<long>(h.iPID), h.iTransportScramblingControl, h.iAdaptationFieldControl,
          h.iContinuityCounter,       OffsetIn(packet, h.pAdaptionFieldStartPtr), OffsetIn(packet, h.pPayloadStartPtr)};
}

std::string Hex32(const void* p) {
  char text[16];
  std::snprintf(text, sizeof(text), "0x%08x", static_cast<unsigned int>(reinterpret_cast<uintptr_t>(p)));
  return text;
}

}  // namespace

TEST(TSPacketHeader, DecodesFieldsAndLocatesAdaptationFieldAndPayload) {
  struct Case {
    const char* name;
    uint8_t b1, b2, b3, byte4;
    std::vector<long> members;
  } cases[] = {
      {"payload only, section start", 0x40, 0x00, 0x10, 0x00, {0, 1, 0, 0x0000, 0, 1, 0, -1, 4}},
      {"all flags and widest values", 0xBF, 0xFF, 0xDF, 0x00, {1, 0, 1, 0x1FFF, 3, 1, 15, -1, 4}},
      {"adaptation length 0: payload at byte 5", 0x01, 0x23, 0x3A, 0x00, {0, 0, 0, 0x0123, 0, 3, 10, 4, 5}},
      {"adaptation length 7", 0x07, 0x6A, 0x75, 0x07, {0, 0, 0, 0x076A, 1, 3, 5, 4, 12}},
      {"adaptation length 200: beyond the packet", 0x00, 0x11, 0x31, 200, {0, 0, 0, 0x0011, 0, 3, 1, 4, 205}},
      {"adaptation field only", 0x40, 0x00, 0x2F, 0x07, {0, 1, 0, 0x0000, 0, 2, 15, 4, -1}},
      {"scrambled and erroneous packets still parse", 0x9F, 0xC8, 0x93, 0x00, {1, 0, 0, 0x1FC8, 2, 1, 3, -1, 4}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.name);
    TraceRecorder recorder;
    Bytes packet = RawPacket(c.b1, c.b2, c.b3, c.byte4);
    RavelCTSPacket header(nullptr);
    EXPECT_EQ(kRavelOk, header.ParseRawData(packet.data()));
    EXPECT_EQ(c.members, Members(header, packet));
    EXPECT_TRUE(recorder.Records().empty());
  }
}

TEST(TSPacketHeader, PacksScramblingAdaptationAndCounterIntoOneByte) {
  // Callers read the byte after the PID: scrambling control in bits 0-1,
  // adaptation field control in bits 2-3, continuity counter in bits 4-7.
  struct Case {
    uint8_t b3;
    uint8_t packed;
  } cases[] = {{0x10, 0x04}, {0x5F, 0xF5}, {0xDA, 0xA7}, {0xB1, 0x1E}, {0x3C, 0xCC}};
  for (const Case& c : cases) {
    Bytes packet = RawPacket(0x00, 0x20, c.b3, 0x00);
    RavelCTSPacket header(packet.data());
    const unsigned char* packedByte = reinterpret_cast<const unsigned char*>(&header.iPID) + sizeof(header.iPID);
    EXPECT_EQ(c.packed, *packedByte) << std::hex << int(c.b3);
  }
}

TEST(TSPacketHeader, FailuresClearKeepOrPartlyKeepTheMembers) {
  struct Case {
    const char* name;
    Bytes packet;  // none: a null packet
    int result;
    std::vector<long> members;  // offsets into the earlier packet
    TraceLines traces;
  } cases[] = {
      {"null packet: cleared", {}, kRavelErrInvalidArgument, {0, 0, 0, 0, 0, 0, 0, -1, -1}, {}},
      {"sync byte 0x48: unchanged", RawPacket(0x41, 0x00, 0x13, 0x00, 0x48), kRavelErrSyncByte,
       {0, 1, 0, 0x1FFE, 0, 3, 7, 4, 10}, {{kError, "Invalid TS Packet Start Byte=[0x48]\n"}}},
      {"reserved adaptation field control: header kept, pointers null", RawPacket(0x81, 0x23, 0xC9),
       kRavelErrInvalidArgument, {1, 0, 0, 0x0123, 3, 0, 9, -1, -1}, {{kError, "Invalid Adaptation Field Control! => 0x0]"}}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.name);
    Bytes earlier = RawPacket(0x5F, 0xFE, 0x37, 0x05);  // PUSI, PID 0x1FFE, AF+payload, counter 7
    RavelCTSPacket header(earlier.data());
    TraceRecorder recorder;
    EXPECT_EQ(c.result, header.ParseRawData(c.packet.empty() ? nullptr : const_cast<uint8_t*>(c.packet.data())));
    EXPECT_EQ(c.traces, recorder.Lines());
    EXPECT_EQ(c.members, Members(header, earlier));
  }
}

TEST(TSPacketHeader, ConstructorClearsOnFailureAndTracesFromItsSourceFile) {
  TraceRecorder recorder;
  Bytes bad = RawPacket(0x40, 0x10, 0x1C, 0x00, 0x46);
  RavelCTSPacket rejected(bad.data());  // the result is dropped; the object stays cleared
  EXPECT_EQ((std::vector<long>{0, 0, 0, 0, 0, 0, 0, -1, -1}), Members(rejected, bad));
  ASSERT_EQ(1u, recorder.Records().size());
  EXPECT_EQ("SectionParser/source/Ravel_CTSPacket", recorder.Records()[0].file);
  EXPECT_EQ("Invalid TS Packet Start Byte=[0x46]\n", recorder.Records()[0].text);
}

TEST(TSPacketHeader, ShowDumpsTheMembersWithAddressesAsNumbers) {
  struct Case {
    bool parsed;
    uint8_t b1, b2, b3;
    std::string flagsLine, fieldsLine;
  } cases[] = {
      {true, 0xE0, 0x21, 0x75, "Transport Error Indicator=[1], Payload Unit Start Indicator=[1], Transport Pritoriry=[1]\n",
       "PID=[0x21], Transport Scrambling Control=[1], Adaptation Field Control=[3], Contiuity Index=[5]\n"},
      {true, 0x07, 0x6A, 0x1F, "Transport Error Indicator=[0], Payload Unit Start Indicator=[0], Transport Pritoriry=[0]\n",
       "PID=[0x76a], Transport Scrambling Control=[0], Adaptation Field Control=[1], Contiuity Index=[15]\n"},
      {false, 0, 0, 0, "Transport Error Indicator=[0], Payload Unit Start Indicator=[0], Transport Pritoriry=[0]\n",
       "PID=[0x00], Transport Scrambling Control=[0], Adaptation Field Control=[0], Contiuity Index=[0]\n"},
  };
  for (const Case& c : cases) {
    Bytes packet = RawPacket(c.b1, c.b2, c.b3, 0x02);
    RavelCTSPacket header(c.parsed ? packet.data() : nullptr);
    const std::string rule(49, '#');
    EXPECT_EQ(th::Dump({rule + "\n", "#### TS Packet Header Information\n", c.flagsLine, c.fieldsLine,
                        "Adaptation Field Start Ptr Addr=[" + Hex32(header.pAdaptionFieldStartPtr) +
                            "], Payload Start Ptr Addr=[" + Hex32(header.pPayloadStartPtr) + "]\n",
                        rule + "\n"}),
              th::ShowLines(header));
  }
}
