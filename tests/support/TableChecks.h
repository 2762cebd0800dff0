// Checks every table class shares: the sections its parse refuses, with the
// result and the one trace each gives.
#ifndef RAVEL_TESTS_TABLE_CHECKS_H
#define RAVEL_TESTS_TABLE_CHECKS_H

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "Ravel_ResultCode.h"
#include "StreamBuilder.h"
#include "TestHelpers.h"
#include "TraceRecorder.h"

namespace tc {

struct Refusal {
  const char* label;
  Bytes* section;  // null: a null section
  int result;
  TraceLines traces;
};

// The four refusals of a table named `name`: null, a bad CRC, a foreign table_id
// (printed as `foreignId`) and both damages, where the CRC is checked first.
inline std::vector<Refusal> Refusals(const std::string& name, Bytes& badCrc, Bytes& foreign,
                                     const std::string& foreignId, Bytes& both) {
  const TraceLines crcError{{th::kWarning, name + " Section: CRC Error!\n"}};
  return {{"null", nullptr, kRavelErrInvalidArgument, {}},
          {"bad CRC", &badCrc, kRavelErrCorruptSection, crcError},
          {"foreign table_id", &foreign, kRavelErrInvalidArgument,
           {{th::kError, "Table ID isn't for " + name + "! Table ID=[" + foreignId + "]\n"}}},
          {"the CRC is checked before the table_id", &both, kRavelErrCorruptSection, crcError}};
}

// Each refusal parsed into a table first built over `good`; `check` then sees
// what the refusal left of it.
template <class Table, class Check>
void ExpectRefusals(Bytes& good, const std::vector<Refusal>& refusals, Check check) {
  for (const Refusal& r : refusals) {
    SCOPED_TRACE(r.label);
    Table table(good.data());
    TraceRecorder recorder;
    EXPECT_EQ(r.result, table.ParseRawData(r.section ? r.section->data() : nullptr));
    EXPECT_EQ(r.traces, recorder.Lines());
    check(table, r, recorder);
  }
}

}  // namespace tc

#endif
