// Cost of the SAN part of a data fetch per logical unit (SCSI and iSCSI
// discovery, the SAN catalogue built aside, its publication) over sites of
// 1x, 10x and 100x, and the heap the SAN catalogue takes per instance.  A
// rebuild that grows faster than the site shows as a rising cost per unit.
#include <benchmark/benchmark.h>
#include <malloc.h>
#include <sys/resource.h>

#include <mutex>
#include <string>

#include "agent/ProviderAgent.h"
#include "agent/San_Catalogue.h"
#include "bench/Bench_Scales.h"
#include "data/NRV_Data.h"

namespace {

using namespace cimple;

void nothing(ProviderAgent&) {}

// The SAN part as the data-fetch thread runs it, with its locks.
size_t san_rebuild(ProviderAgent& agent) {
  agent.buildSANData();
  const size_t units = agent.m_SANRebuild->scan.logical_units();
  agent.updateSANMaps();
  {
    std::lock_guard<std::mutex> san_ready(agent.m_SANMapsReadyMutex);
    std::lock_guard<std::recursive_mutex> data(agent.m_DataMutex);
    agent.publishSANMaps();
  }
  agent.m_SANRebuild.reset();
  return units;
}

size_t san_instances(ProviderAgent& agent) {
  size_t n = 0;
#define NRV_BENCH_COUNT(C) n += agent.m_##C##_map.size();
  NRV_FOR_EACH_SAN_CATALOGUE_CLASS(NRV_BENCH_COUNT)
#undef NRV_BENCH_COUNT
  return n;
}

void BM_SanRebuild(benchmark::State& state) {
  ProviderAgent& agent = *ProviderAgent::getInstance();
  {
    std::lock_guard<std::recursive_mutex> data(agent.m_DataMutex);
    agent.m_pData->buildAdapterData();
    agent.updateAdapterMaps();
  }
  size_t units = 0;
  double heap = 0;
  for (auto _ : state) {
    state.PauseTiming();
    agent.clearSANMaps();
    const size_t before = mallinfo2().uordblks;
    state.ResumeTiming();
    units = san_rebuild(agent);
    state.PauseTiming();
    heap = static_cast<double>(mallinfo2().uordblks) - static_cast<double>(before);
    state.ResumeTiming();
  }
  const size_t instances = san_instances(agent);
  state.counters["luns"] = static_cast<double>(units);
  state.counters["instances"] = static_cast<double>(instances);
  state.counters["us_per_lun"] = benchmark::Counter(static_cast<double>(state.iterations() * units) / 1e6,
                                                    benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
  // What the SAN catalogue and the targets behind the ports add to the heap, per instance.
  state.counters["bytes_per_instance"] = instances ? heap / static_cast<double>(instances) : 0.0;
  rusage usage{};
  getrusage(RUSAGE_SELF, &usage);
  state.counters["peak_rss_MiB"] = static_cast<double>(usage.ru_maxrss) / 1024.0;
}

bool run(const std::string& scale) {
  // The agent without its data-fetch thread: the benchmark drives the build.
  ProviderAgent::useBuilders({nothing, nothing, nothing, nothing, nothing, nothing});
  if (!ProviderAgent::acquireLoaded()) return false;
  benchmark::RegisterBenchmark(("BM_SanRebuild/x" + scale).c_str(), BM_SanRebuild)->Unit(benchmark::kMillisecond);
  return true;
}

}  // namespace

int main(int argc, char** argv) {
  const int status = nrv_bench::run_scales(argc, argv, NRV_SAN_BENCH_SITE_DIR, run);
  if (ProviderAgent::peekInstance()) ProviderAgent::releaseRef();
  return status;
}
