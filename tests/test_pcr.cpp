// PCR reader: flag positions, the clock formula and its failures.
#include <gtest/gtest.h>

#include "Ravel_CPCR.h"
#include "Ravel_ResultCode.h"
#include "StreamBuilder.h"
#include "TraceRecorder.h"

namespace {

const unsigned int kDump = 0x10000020u;
const unsigned int kError = 0x80000020u;

// A packet of PID 0x0021 whose bytes from 4 on start with `adaptation`
// (adaptation_field_length first); `control` is header byte 3.
Bytes PcrPacket(uint8_t control, const Bytes& adaptation, uint8_t sync = 0x47) {
  Bytes p = sb::Cat({{sync, 0x00, 0x21, control}, adaptation});
  p.resize(188, 0xFF);
  return p;
}

const unsigned long long kEarlier = 777;

}  // namespace

TEST(PCRReader, TakesTheFlagsFromTheLengthByteAndTheClockFromBytesTwoToSix) {
  struct Case {
    const char* name;
    uint8_t control;
    Bytes adaptation;  // length, flags, then A[2] to A[6]
    unsigned long long pcr;
    TraceLines traces;
  } cases[] = {
      {"length 0x10: PCR whatever the flags byte says", 0x30, {0x10, 0x00, 0x00, 0x00, 0x5A, 0x00, 0x00}, 512,
       {{kError, "PCR = 512\n"}}},
      {"length 0x07 with PCR_flag in the flags byte: nothing", 0x30, {0x07, 0x10, 0x00, 0x00, 0x5A, 0x00, 0x00},
       kEarlier, {}},
      {"length 0x18: PCR then OPCR from the same bytes", 0x30, {0x18, 0x00, 0x12, 0x34, 0x56, 0x78, 0x9A}, 6787107,
       {{kError, "PCR = 6787107\n"}, {kError, "OPCR = 6787107\n"}}},
      {"length 0x08: OPCR alone", 0x20, {0x08, 0xFF, 0x12, 0x34, 0x56, 0x78, 0x9A}, 6787107,
       {{kError, "OPCR = 6787107\n"}}},
      {"top bit of A[2] becomes bit 32, not bit 32 of the low word", 0x30, {0x10, 0x00, 0x80, 0x00, 0x00, 0x00, 0x00},
       47721858, {{kError, "PCR = 47721858\n"}}},
      {"A[5] unshifted and ORed with the top bit of A[6]", 0x30, {0x10, 0x00, 0x00, 0x00, 0x00, 0xB4, 0x80}, 2,
       {{kError, "PCR = 2\n"}}},
      {"every bit set", 0x3F, {0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF}, 95443714,
       {{kError, "PCR = 95443714\n"}, {kError, "OPCR = 95443714\n"}}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.name);
    Bytes packet = PcrPacket(c.control, c.adaptation);
    RavelCPCR reader(nullptr);
    reader.mPCR = kEarlier;
    TraceRecorder recorder;
    EXPECT_EQ(kRavelOk, reader.ParseRawData(packet.data()));
    EXPECT_EQ(c.pcr, reader.mPCR);
    EXPECT_EQ(c.traces, recorder.Lines());
    for (const TraceRecord& record : recorder.Records()) EXPECT_EQ("SectionParser/source/Ravel_CPCR", record.file);
  }
}

TEST(PCRReader, FailuresKeepTheEarlierValue) {
  struct Case {
    const char* name;
    Bytes packet;  // none: a null packet
    int result;
    TraceLines traces;
  } cases[] = {
      {"null packet", {}, kRavelErrNullSection, {}},
      {"bad sync byte", PcrPacket(0x30, {0x10, 0, 0, 0, 0x5A, 0, 0}, 0x48), kRavelErrPcr,
       {{kError, "Invalid TS Packet Start Byte=[0x48]\n"}, {kError, "TS Packet Parsing Fail! iResult=[-7]\n"}}},
      {"reserved adaptation field control", PcrPacket(0x00, {0x10, 0, 0, 0, 0x5A, 0, 0}), kRavelErrPcr,
       {{kError, "Invalid Adaptation Field Control! => 0x0]"}, {kError, "TS Packet Parsing Fail! iResult=[-8]\n"}}},
      {"payload only", PcrPacket(0x10, {0x10, 0, 0, 0, 0x5A, 0, 0}), kRavelErrPcr,
       {{kError, "pAdaptionFieldStartPtr is null\n"}, {kError, "iAdaptationFieldControl(1)\n"}}},
      {"adaptation_field_length 0", PcrPacket(0x30, {0x00, 0x10, 0, 0, 0x5A, 0, 0}), kRavelErrPcr,
       {{kError, "iAdaptationLen(0)\n"}}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.name);
    RavelCPCR reader(nullptr);
    reader.mPCR = kEarlier;
    TraceRecorder recorder;
    EXPECT_EQ(c.result, reader.ParseRawData(c.packet.empty() ? nullptr : const_cast<uint8_t*>(c.packet.data())));
    EXPECT_EQ(kEarlier, reader.mPCR);
    EXPECT_EQ(c.traces, recorder.Lines());
  }
}

TEST(PCRReader, ConstructsCopiesAndShowsTheLow32Bits) {
  Bytes packet = PcrPacket(0x30, {0x10, 0x00, 0x12, 0x34, 0x56, 0x78, 0x9A});
  TraceRecorder constructing;
  RavelCPCR parsed(packet.data());
  RavelCPCR empty(nullptr);
  EXPECT_EQ(TraceLines({{kError, "PCR = 6787107\n"}}), constructing.Lines());
  EXPECT_EQ(0u, empty.mPCR);
  empty = parsed;
  EXPECT_EQ(6787107u, empty.mPCR);

  const std::string rule(49, '#');
  for (unsigned long long value : {0x100000005ull, 0xFFFFFFFFull}) {
    empty.mPCR = value;
    TraceRecorder recorder;
    empty.Show();
    const std::string line = value == 0xFFFFFFFFull ? "mPCR(-1)\n" : "mPCR(5)\n";
    EXPECT_EQ(TraceLines({{kDump, rule + "\n"}, {kError, line}, {kDump, rule + "\n"}}), recorder.Lines());
  }
}
