// Filling an instance map and looking every instance up again must cost
// O(n) overall: the time per instance stays flat from 10^3 to 10^5.
#include <benchmark/benchmark.h>

#include <memory>
#include <string>
#include <vector>

#include "framework/Instance_Map.h"
#include "schema/NRVTAVO_Chip.h"

using namespace cimple;

namespace {

std::vector<NRVTAVO_Chip*> make_chips(size_t n) {
  std::vector<NRVTAVO_Chip*> chips;
  chips.reserve(n);
  for (size_t i = 0; i < n; ++i) {
    auto* chip = NRVTAVO_Chip::create();
    chip->CreationClassName.set("NRVTAVO_Chip");
    chip->Tag.set("NRV:10000000c9a1b2" + std::to_string(i));
    chips.push_back(chip);
  }
  return chips;
}

void BM_InsertAndLookUp(benchmark::State& state) {
  const size_t n = static_cast<size_t>(state.range(0));
  std::vector<NRVTAVO_Chip*> probes = make_chips(n);
  for (auto _ : state) {
    state.PauseTiming();
    std::vector<NRVTAVO_Chip*> chips = make_chips(n);
    state.ResumeTiming();
    auto map = std::make_unique<Instance_Map>(&NRVTAVO_Chip::static_meta_class);
    for (NRVTAVO_Chip* chip : chips) map->insert(chip);
    for (NRVTAVO_Chip* probe : probes) benchmark::DoNotOptimize(map->find(probe));
    state.PauseTiming();
    map.reset();  // releasing the instances is not what is measured
    state.ResumeTiming();
  }
  state.SetItemsProcessed(static_cast<int64_t>(state.iterations() * n));
  for (NRVTAVO_Chip* probe : probes) unref(probe);
}
BENCHMARK(BM_InsertAndLookUp)->Arg(1000)->Arg(10000)->Arg(100000)->Unit(benchmark::kMillisecond);

}  // namespace
