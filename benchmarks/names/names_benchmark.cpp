// Comparing names: two of 16 ASCII bytes that differ in case only, against strcasecmp, and two beyond ASCII.
#include <benchmark/benchmark.h>
#include <strings.h>

#include <string>

#include "ktcheckname/compareNames.h"

namespace {

void compareAscii(benchmark::State& state) {
  const std::string a = "Burst_Segment_07";
  const std::string b = "BURST_SEGMENT_07";
  for (auto _ : state) {
    benchmark::DoNotOptimize(a.data());
    benchmark::DoNotOptimize(b.data());
    benchmark::DoNotOptimize(ktcheckname::compareNames(a, b));
  }
}
BENCHMARK(compareAscii)->Name("names/ours");

void systemCaseCompare(benchmark::State& state) {
  const std::string a = "Burst_Segment_07";
  const std::string b = "BURST_SEGMENT_07";
  for (auto _ : state) {
    benchmark::DoNotOptimize(a.data());
    benchmark::DoNotOptimize(b.data());
    benchmark::DoNotOptimize(strcasecmp(a.c_str(), b.c_str()));
  }
}
BENCHMARK(systemCaseCompare)->Name("names/strcasecmp");

void compareLatin(benchmark::State& state) {
  const std::string a = "Gr\u00F6\u00DFe_\u00C4nderung";
  const std::string b = "GR\u00D6SSE_\u00E4NDERUNG";
  for (auto _ : state) benchmark::DoNotOptimize(ktcheckname::compareNames(a, b));
}
BENCHMARK(compareLatin)->Name("names_beyond_ascii/ours");

}  // namespace
