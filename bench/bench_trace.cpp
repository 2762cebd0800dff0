// What tracing costs. With dumps off (no hook, default mask) a trace call
// returns before formatting anything, so a parse or a Show() costs the same as
// if it had no trace calls; with a hook installed every message is formatted.
// The pairs below differ only by that hook.
#include <benchmark/benchmark.h>

#include <vector>

#include "BuiltSections.h"
#include "Ravel_CTableAIT.h"
#include "Ravel_CTablePAT.h"
#include "Ravel_PGL.h"

namespace {

void CountTrace(unsigned int, const char*, int, const char* text, void* context) {
  benchmark::DoNotOptimize(text);
  ++*static_cast<long long*>(context);
}

// Runs `body` once per iteration with or without a hook. The trace calls one
// pass makes are counted beforehand, through a hook, in both cases.
template <class Body>
void WithOrWithoutHook(benchmark::State& state, Body body) {
  const bool hooked = state.range(0) != 0;
  long long calls = 0;
  RavelPGL_SetTraceMask(0x80000000u);
  RavelPGL_SetTraceHook(CountTrace, &calls);
  body();
  long long timedCalls = 0;
  RavelPGL_SetTraceHook(hooked ? CountTrace : 0, &timedCalls);
  for (auto _ : state) body();
  RavelPGL_SetTraceHook(0, 0);
  state.counters["trace calls/pass"] = static_cast<double>(calls);
  state.SetLabel(hooked ? "hook installed: all formatted" : "dumps off: none formatted");
}

void BM_Trace_AITParse(benchmark::State& state) {
  static std::vector<Bytes> sections = bench::BuiltAitSections();
  RavelCAIT ait;
  WithOrWithoutHook(state, [&] {
    for (Bytes& s : sections) benchmark::DoNotOptimize(ait.ParseRawData(s.data()));
  });
  state.SetItemsProcessed(state.iterations() * static_cast<long long>(sections.size()));
}
BENCHMARK(BM_Trace_AITParse)->ArgName("hook")->Arg(0)->Arg(1);

void BM_Trace_PATShow(benchmark::State& state) {
  static std::vector<Bytes> sections = bench::BuiltPatSections();
  RavelCPAT pat(sections.back().data());
  WithOrWithoutHook(state, [&] { pat.Show(); });
  state.SetItemsProcessed(state.iterations());
}
BENCHMARK(BM_Trace_PATShow)->ArgName("hook")->Arg(0)->Arg(1);

void BM_Trace_AITShow(benchmark::State& state) {
  static std::vector<Bytes> sections = bench::BuiltAitSections();
  RavelCAIT ait;
  ait.ParseRawData(sections.back().data());
  WithOrWithoutHook(state, [&] { ait.Show(); });
  state.SetItemsProcessed(state.iterations());
}
BENCHMARK(BM_Trace_AITShow)->ArgName("hook")->Arg(0)->Arg(1);

}  // namespace
