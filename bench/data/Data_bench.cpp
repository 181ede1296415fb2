// Cost per logical unit of rebuilding the adapter data set and discovering
// the SAN (buildAdapterData + buildSANData) over sites of 1x, 10x and 100x the
// sample's FC targets and LUNs, with the peak resident memory of each run.
//
// Each size runs in a child process of its own (Bench_Scales.h).
#include <benchmark/benchmark.h>

#include <sys/resource.h>

#include <chrono>
#include <string>

#include "access/NRV_Runtime_Loader.h"
#include "bench/Bench_Scales.h"
#include "data/NRV_Data.h"

namespace {

size_t targetCount(const cimple::Data& data) {
  size_t n = 0;
  for (const auto& adapter : data.getAdapters())
    for (const auto& port : adapter->getPorts()) n += port->getNumberOfTargets();
  return n;
}

void BM_BuildAdapterAndSANData(benchmark::State& state) {
  cimple::Data data;
  size_t luns = 0;
  const auto start = std::chrono::steady_clock::now();
  for (auto _ : state) {
    data.buildAdapterData();
    data.buildSANData();
    luns = targetCount(data);
  }
  const std::chrono::duration<double, std::micro> wall = std::chrono::steady_clock::now() - start;
  const double processed = static_cast<double>(state.iterations() * luns);
  state.SetItemsProcessed(static_cast<int64_t>(processed));
  state.counters["luns"] = static_cast<double>(luns);
  // CPU microseconds per logical unit (the simulator runs on this thread),
  // and wall-clock microseconds, which a loaded machine inflates.
  state.counters["cpu_us_per_lun"] = benchmark::Counter(
      processed / 1e6, benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
  state.counters["wall_us_per_lun"] = processed > 0 ? wall.count() / processed : 0.0;
  rusage usage{};
  getrusage(RUSAGE_SELF, &usage);
  state.counters["peak_rss_MiB"] = static_cast<double>(usage.ru_maxrss) / 1024.0;
}

}  // namespace

bool run(const std::string& scale) {
  if (cimple::NRV_Runtime_Loader::loadLibraries() != 0) return false;
  benchmark::RegisterBenchmark(("BM_BuildAdapterAndSANData/x" + scale).c_str(), BM_BuildAdapterAndSANData)
      ->Unit(benchmark::kMillisecond);
  return true;
}

int main(int argc, char** argv) {
  const int status = nrv_bench::run_scales(argc, argv, NRV_DATA_BENCH_SITE_DIR, run);
  cimple::NRV_Runtime_Loader::unloadLibraries();
  return status;
}
