// Parsing an object path must cost O(n) in its length: the time per key stays flat from
// 10^3 to 10^5 keys, with and without a class schema to check the keys against.
#include <benchmark/benchmark.h>

#include <string>
#include <vector>

#include "host/PathText.h"

using namespace nrv::host;

namespace {

constexpr const char* kClass = "root/norvane:NRVTAVO_Wide";

std::string wide_path(size_t n) {
  std::string text = std::string(kClass) + ".";
  for (size_t i = 0; i < n; ++i) {
    if (i != 0) text += ',';
    text += "K" + std::to_string(i) + "=\"v." + std::to_string(i) + "=x\"";
  }
  return text;
}

std::vector<KeyDecl> wide_keys(size_t n) {
  std::vector<KeyDecl> keys;
  for (size_t i = 0; i < n; ++i) keys.push_back({"K" + std::to_string(i), CMPI_string, ""});
  return keys;
}

void BM_ParsePath(benchmark::State& state, bool with_schema) {
  const size_t n = static_cast<size_t>(state.range(0));
  const std::string text = wide_path(n);
  const std::vector<KeyDecl> keys = wide_keys(n);
  KeySchema schema;
  if (with_schema) schema = [&](const std::string&) { return std::optional(keys); };
  for (auto _ : state) benchmark::DoNotOptimize(parsePath(text, kDefaultNameSpace, schema));
  state.SetComplexityN(static_cast<benchmark::IterationCount>(n));
  state.SetBytesProcessed(static_cast<int64_t>(state.iterations() * text.size()));
}

}  // namespace

BENCHMARK_CAPTURE(BM_ParsePath, untyped, false)->RangeMultiplier(10)->Range(1000, 100000)
    ->Unit(benchmark::kMillisecond)->Complexity(benchmark::oN);
BENCHMARK_CAPTURE(BM_ParsePath, with_schema, true)->RangeMultiplier(10)->Range(1000, 100000)
    ->Unit(benchmark::kMillisecond)->Complexity(benchmark::oN);
