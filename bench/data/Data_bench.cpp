// Cost per logical unit of rebuilding the adapter data set and discovering
// the SAN (buildAdapterData + buildSANData) over sites of 1x, 10x and 100x the
// sample's FC targets and LUNs, with the peak resident memory of each run.
//
// The simulator reads its site once per process, so each size runs in a
// child process of its own: the parent re-executes this program with
// NRV_SITE naming the size's site and NRV_DATA_BENCH_SCALE the size.
#include <benchmark/benchmark.h>

#include <stdlib.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <string>
#include <vector>

#include "access/NRV_Runtime_Loader.h"
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

int runChild(const char* self, const std::string& scale, int argc, char** argv) {
  const pid_t pid = fork();
  if (pid < 0) return -1;
  if (pid == 0) {
    const std::string site = std::string(NRV_DATA_BENCH_SITE_DIR) + "/site_x" + scale + ".json";
    setenv("NRV_SITE", site.c_str(), 1);
    setenv("NRV_DATA_BENCH_SCALE", scale.c_str(), 1);
    std::vector<char*> args(argv, argv + argc);
    args.push_back(nullptr);
    execv(self, args.data());
    _exit(127);
  }
  int status = 0;
  waitpid(pid, &status, 0);
  return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

}  // namespace

int main(int argc, char** argv) {
  const char* scale = getenv("NRV_DATA_BENCH_SCALE");
  if (scale == nullptr) {
    char self[4096];
    const ssize_t n = readlink("/proc/self/exe", self, sizeof self - 1);
    if (n <= 0) return 1;
    self[n] = '\0';
    int failures = 0;
    for (const char* s : {"1", "10", "100"}) failures += runChild(self, s, argc, argv) != 0;
    return failures == 0 ? 0 : 1;
  }
  if (cimple::NRV_Runtime_Loader::loadLibraries() != 0) return 1;
  benchmark::RegisterBenchmark((std::string("BM_BuildAdapterAndSANData/x") + scale).c_str(),
                               BM_BuildAdapterAndSANData)
      ->Unit(benchmark::kMillisecond);
  benchmark::Initialize(&argc, argv);
  benchmark::RunSpecifiedBenchmarks();
  benchmark::Shutdown();
  cimple::NRV_Runtime_Loader::unloadLibraries();
  return 0;
}
