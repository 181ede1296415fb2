// Cost of a full adapter rebuild (buildAdapterData, then updateAdapterMaps)
// per physical port over sites of 1x, 10x and 100x, and the memory the
// catalogue takes per instance.  A rebuild that grows faster than the site
// (a quadratic look-up of cards, chips or port controllers) shows as a rising
// cost per port.
#include <benchmark/benchmark.h>
#include <malloc.h>
#include <sys/resource.h>

#include <mutex>
#include <set>
#include <string>

#include "agent/ProviderAgent.h"
#include "bench/Bench_Scales.h"
#include "data/NRV_Data.h"
#include "schema/Classes.h"

namespace {

using namespace cimple;

void nothing(ProviderAgent&) {}

size_t catalogue_instances(ProviderAgent& agent) {
  size_t n = agent.m_CIM_ComputerSystem_map.size() + agent.m_CIM_Chassis_map.size();
#define NRV_BENCH_COUNT(C) n += agent.m_##C##_map.size();
  NRV_FOR_EACH_PROVIDER_CLASS(NRV_BENCH_COUNT)
#undef NRV_BENCH_COUNT
  return n;
}

size_t physical_ports(ProviderAgent& agent) {
  std::set<std::string> ports;
  const Instance_Map& controllers = agent.m_NRVTAVO_PortController_map;
  for (size_t i = 0; i < controllers.size(); ++i)
    ports.insert(static_cast<NRVTAVO_PortController*>(controllers[i])->DeviceID.value.str());
  return ports.size();
}

void BM_AdapterRebuild(benchmark::State& state) {
  ProviderAgent& agent = *ProviderAgent::getInstance();
  std::lock_guard<std::recursive_mutex> data(agent.m_DataMutex);
  size_t heap_before = 0;
  for (auto _ : state) {
    state.PauseTiming();
    agent.clearAdapterMaps();
    heap_before = mallinfo2().uordblks;
    state.ResumeTiming();
    agent.m_pData->buildAdapterData();
    agent.updateAdapterMaps();
  }
  const size_t instances = catalogue_instances(agent);
  const size_t ports = physical_ports(agent);
  const double heap = static_cast<double>(mallinfo2().uordblks) - static_cast<double>(heap_before);
  state.counters["ports"] = static_cast<double>(ports);
  state.counters["instances"] = static_cast<double>(instances);
  state.counters["us_per_port"] = benchmark::Counter(static_cast<double>(state.iterations() * ports) / 1e6,
                                                     benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
  // What the catalogue adds to the heap, per instance (the data set a rebuild
  // makes replaces one of the same size).
  state.counters["bytes_per_instance"] = instances ? heap / static_cast<double>(instances) : 0.0;
  rusage usage{};
  getrusage(RUSAGE_SELF, &usage);
  state.counters["peak_rss_MiB"] = static_cast<double>(usage.ru_maxrss) / 1024.0;
}

bool run(const std::string& scale) {
  // The agent without its data-fetch thread: the benchmark drives the build.
  ProviderAgent::useBuilders({nothing, nothing, nothing, nothing, nothing, nothing});
  if (!ProviderAgent::acquireLoaded()) return false;
  benchmark::RegisterBenchmark(("BM_AdapterRebuild/x" + scale).c_str(), BM_AdapterRebuild)
      ->Unit(benchmark::kMillisecond);
  return true;
}

}  // namespace

int main(int argc, char** argv) {
  const int status = nrv_bench::run_scales(argc, argv, NRV_CATALOGUE_BENCH_SITE_DIR, run);
  if (ProviderAgent::peekInstance()) ProviderAgent::releaseRef();
  return status;
}
