// Checks every table class shares: the sections its parse refuses, with the
// result and the one trace each gives; copies, merges and the short dump.
#ifndef RAVEL_TESTS_TABLE_CHECKS_H
#define RAVEL_TESTS_TABLE_CHECKS_H

#include <gtest/gtest.h>

#include <memory>
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
// what the refusal left of it. Only a foreign table_id's header is read: after
// a CRC error the good section's header stays.
template <class Table, class Check>
void ExpectRefusals(Bytes& good, const std::vector<Refusal>& refusals, Check check) {
  for (const Refusal& r : refusals) {
    SCOPED_TRACE(r.label);
    Table table(good.data());
    TraceRecorder recorder;
    EXPECT_EQ(r.result, table.ParseRawData(r.section ? r.section->data() : nullptr));
    EXPECT_EQ(r.traces, recorder.Lines());
    check(table, r, recorder);
    if (r.section == nullptr) continue;
    const Bytes& header = r.result == kRavelErrInvalidArgument ? *r.section : good;
    EXPECT_EQ(header[0], table.iTableId);
    EXPECT_EQ(header[3] << 8 | header[4], table.iTableIdExtension);
  }
}

// Copies made by construction and by assignment over `target` look as the
// source did, and stay so once the source is gone: they share nothing with it.
template <class T, class Describe>
void ExpectDeepCopies(T* source, T& target, Describe describe) {
  std::unique_ptr<T> owned(source);
  const auto expected = describe(*owned);
  T constructed(*owned);
  target = *owned;
  owned.reset();
  EXPECT_EQ(expected, describe(constructed));
  EXPECT_EQ(expected, describe(target));
}

// The same for a table built over `source`: `prepare` sets what no parse writes,
// and `check(copy, sourceDump)` sees each copy against the source's dump.
template <class T, class Prepare, class Check>
void ExpectCopies(unsigned char* source, unsigned char* over, Prepare prepare, Check check) {
  std::unique_ptr<T> original(new T(source));
  prepare(*original);
  const TraceLines shown = th::ShowLines(*original);
  T constructed(*original);
  T assigned(over);
  assigned = *original;
  original.reset();
  for (T* copy : {&constructed, &assigned}) {
    SCOPED_TRACE(copy == &constructed ? "constructed" : "assigned");
    check(*copy, shown);
  }
}

// Assignment to itself, as a caller holding two references to one object does it.
template <class T>
T& SelfAssign(T& object) {
  T& same = object;
  return object = same;
}

// `target += other`, or `target += target` for a null `other`: the result is the
// target and the other is left as `describe` saw it. The other is gone on return,
// so what the target took from it must be its own copies. Gives the traces.
template <class Table, class Describe>
TraceLines MergeInto(Table& target, unsigned char* other, Describe describe) {
  std::unique_ptr<Table> source(new Table(other));
  const auto before = describe(*source);
  TraceRecorder recorder;
  EXPECT_EQ(&target, other ? &(target += *source) : &(target += target));
  EXPECT_EQ(before, describe(*source));
  return recorder.Lines();
}

// The short-rule dump of `table`: title, header lines, body lines, closing rule.
inline TraceLines ShortDump(const std::string& table, const TraceLines& header, std::vector<std::string> body) {
  const std::string rule = th::Rule(th::kShortRule);
  TraceLines lines = th::Dump({rule, "#### " + table + " Table Information\n", "# Header Information\n"});
  th::Add(lines, header);
  body.push_back(rule);
  th::Add(lines, th::Dump(body));
  return lines;
}

}  // namespace tc

#endif
