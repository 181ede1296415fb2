// Catalogue reads as a CIM client makes them, through the CIMOM stand-in and
// the real module's CMPI tables, over sites of 1x, 10x and 100x: get instance
// of one logical unit, associators, associator names and reference names from
// one logical unit and from one FC port, enumeration of the largest class,
// and a client's walk (names of every logical unit, then associators of each,
// sampled at the larger sizes and reported per unit).  Each read runs twice
// over the same catalogue: "indexed" (the module's own answers) and
// "generic" (NRV_GENERIC_READS: the enumeration-based fallbacks and the
// CIMOM up-calls).  A read whose cost per call grows with the site shows as
// a rising time from x1 to x100.  The retained heap and the peak resident
// size that the catalogue adds are reported per catalogue instance.
// NRV_BENCH_MIN_TIME (seconds) lengthens each timed read, for profiling.
#include <benchmark/benchmark.h>
#include <malloc.h>
#include <stdlib.h>
#include <sys/resource.h>

#include <chrono>
#include <cstdio>
#include <fstream>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "bench/Bench_Scales.h"
#include "host/Host.h"

namespace {

using namespace nrv::host;
using Clock = std::chrono::steady_clock;

constexpr const char* kNs = "root/norvane";
const char* const kLunClasses[] = {"NRVTAVO_StorageVolume", "NRVTAVO_LogicalDisk", "NRVTAVO_SCSIArbitraryLogicalUnit",
                                   "NRVTAVO_TapeDrive", "NRVTAVO_StorageExtent"};

// What one size's benchmarks read, found once per process.
struct Scene {
  std::unique_ptr<Host> host;
  std::vector<PathData> luns;
  PathData lun;
  PathData fc_port;
  std::string largest;
  size_t largest_count = 0;
  size_t instances = 0;
  double heap_per_instance = 0;
  double peak_rss_per_instance = 0;
};
Scene scene;

void set_generic(bool generic) {
  if (generic)
    setenv("NRV_GENERIC_READS", "1", 1);
  else
    unsetenv("NRV_GENERIC_READS");
}

long resident_kib() {
  std::ifstream status("/proc/self/status");
  std::string line;
  while (std::getline(status, line))
    if (line.rfind("VmRSS:", 0) == 0) return std::stol(line.substr(6));
  return 0;
}

long peak_resident_kib() {
  rusage usage{};
  getrusage(RUSAGE_SELF, &usage);
  return usage.ru_maxrss;
}

std::string name_space_of(const RegisteredClass& c) {
  for (const std::string& ns : c.namespaces)
    if (ns == kNs) return ns;
  return c.namespaces.empty() ? kNs : c.namespaces.front();
}

// Builds the catalogue (adapter and SAN) and finds what the reads start from.
bool set_scene() {
  scene.host = std::make_unique<Host>(NRV_HOST_BENCH_MODULE, Host::Options{std::nullopt});
  if (!scene.host->moduleLoaded() || scene.host->registration() == nullptr) return false;
  const size_t heap_before = mallinfo2().uordblks;
  const long rss_before = resident_kib();
  for (const char* name : kLunClasses) {
    Result r = scene.host->enumerateInstanceNames(kNs, name);
    if (!r.ok()) return false;
    scene.luns.insert(scene.luns.end(), r.paths.begin(), r.paths.end());
  }
  size_t classes = 0;
  for (const RegisteredClass& c : scene.host->registration()->entries()) {
    Result r = scene.host->enumerateInstanceNames(name_space_of(c), c.className);
    scene.instances += r.paths.size();
    ++classes;
    if (r.paths.size() > scene.largest_count) {
      scene.largest_count = r.paths.size();
      scene.largest = c.className;
    }
    if (c.className == "NRVTAVO_FCPort" && !r.paths.empty()) scene.fc_port = r.paths.front();
  }
  if (scene.luns.empty() || scene.fc_port.className.empty() || scene.instances == 0) return false;
  scene.lun = scene.luns[scene.luns.size() / 2];
  scene.heap_per_instance = (static_cast<double>(mallinfo2().uordblks) - static_cast<double>(heap_before)) /
                            static_cast<double>(scene.instances);
  scene.peak_rss_per_instance =
      static_cast<double>(peak_resident_kib() - rss_before) * 1024.0 / static_cast<double>(scene.instances);
  std::fprintf(stderr, "%zu logical units, %zu catalogue instances in %zu classes, largest %s (%zu)\n",
               scene.luns.size(), scene.instances, classes, scene.largest.c_str(), scene.largest_count);
  return true;
}

// One request per iteration, in the mode asked for.
void BM_Read(benchmark::State& state, bool generic, const std::function<Result()>& read) {
  set_generic(generic);
  size_t results = 0;
  for (auto _ : state) {
    Result r = read();
    if (!r.ok()) {
      state.SkipWithError(r.errorText().c_str());
      break;
    }
    results = r.instances.size() + r.paths.size();
  }
  set_generic(false);
  state.counters["results"] = static_cast<double>(results);
}

void BM_EnumerateLargest(benchmark::State& state, bool generic) {
  set_generic(generic);
  size_t delivered = 0;
  // One untimed enumeration first: the first also faults in the memory its answer takes,
  // which at 100x is more than all the rest of its work.
  scene.host->enumerateInstances(kNs, scene.largest);
  for (auto _ : state) {
    Result r = scene.host->enumerateInstances(kNs, scene.largest);
    delivered = r.instances.size();
    // Delivery ends when the client holds the answer; its freeing is the client's own work.
    state.PauseTiming();
    r = Result();
    state.ResumeTiming();
  }
  set_generic(false);
  state.counters["instances"] = static_cast<double>(delivered);
  state.counters["us_per_instance"] =
      benchmark::Counter(static_cast<double>(state.iterations() * delivered) / 1e6,
                         benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

// A client's walk: the names of every logical unit, then the associators of
// each (of `sample` of them, evenly spread).  us_per_lun is the enumeration's
// share per unit plus the mean associators call.
void BM_Walk(benchmark::State& state, bool generic, size_t sample) {
  set_generic(generic);
  const size_t walked = std::min(sample, scene.luns.size());
  double per_lun_us = 0;
  for (auto _ : state) {
    const Clock::time_point start = Clock::now();
    size_t names = 0;
    for (const char* name : kLunClasses) names += scene.host->enumerateInstanceNames(kNs, name).paths.size();
    const Clock::time_point listed = Clock::now();
    for (size_t i = 0; i < walked; ++i) scene.host->associators(scene.luns[i * scene.luns.size() / walked]);
    const Clock::time_point done = Clock::now();
    per_lun_us = std::chrono::duration<double, std::micro>(listed - start).count() / static_cast<double>(names) +
                 std::chrono::duration<double, std::micro>(done - listed).count() / static_cast<double>(walked);
  }
  set_generic(false);
  state.counters["luns_walked"] = static_cast<double>(walked);
  state.counters["us_per_lun"] = per_lun_us;
}

void BM_Memory(benchmark::State& state) {
  for (auto _ : state) benchmark::DoNotOptimize(scene.instances);
  state.counters["catalogue_instances"] = static_cast<double>(scene.instances);
  state.counters["heap_bytes_per_instance"] = scene.heap_per_instance;
  state.counters["peak_rss_bytes_per_instance"] = scene.peak_rss_per_instance;
}

double read_min_time() {
  const char* seconds = getenv("NRV_BENCH_MIN_TIME");
  const double chosen = seconds != nullptr ? atof(seconds) : 0.0;
  return chosen > 0.0 ? chosen : 0.2;
}

bool run(const std::string& scale) {
  char root[] = "/tmp/nrv_host_bench_XXXXXX";
  if (mkdtemp(root) == nullptr) return false;
  setenv("NRV_SYSROOT", root, 1);
  if (!set_scene()) return false;
  const bool large = scale == "100";
  const std::string x = "/x" + scale;
  Host& host = *scene.host;
  struct Named {
    const char* name;
    std::function<Result()> read;
  };
  const std::vector<Named> reads = {
      {"BM_GetLun", [&host] { return host.getInstance(scene.lun); }},
      {"BM_AssociatorNamesLun", [&host] { return host.associatorNames(scene.lun); }},
      {"BM_AssociatorsLun", [&host] { return host.associators(scene.lun); }},
      {"BM_ReferenceNamesLun", [&host] { return host.referenceNames(scene.lun); }},
      {"BM_AssociatorNamesFCPort", [&host] { return host.associatorNames(scene.fc_port); }},
      {"BM_AssociatorsFCPort", [&host] { return host.associators(scene.fc_port); }},
      {"BM_ReferenceNamesFCPort", [&host] { return host.referenceNames(scene.fc_port); }},
  };
  for (bool generic : {false, true}) {
    const std::string mode = generic ? "/generic" : "/indexed";
    // The generic reads of the largest site take a second or more each.
    const double min_time = generic && large ? 0.0 : read_min_time();
    auto limit = [&](benchmark::internal::Benchmark* b) {
      if (min_time == 0.0)
        b->Iterations(2);
      else
        b->MinTime(min_time);
      b->Unit(benchmark::kMicrosecond);
    };
    for (const Named& r : reads)
      limit(benchmark::RegisterBenchmark((r.name + x + mode).c_str(), BM_Read, generic, r.read));
    limit(benchmark::RegisterBenchmark(("BM_EnumerateLargest" + x + mode).c_str(), BM_EnumerateLargest, generic));
    benchmark::RegisterBenchmark(("BM_Walk" + x + mode).c_str(), BM_Walk, generic, generic && large ? 8 : 64)
        ->Iterations(1)
        ->Unit(benchmark::kMillisecond);
  }
  benchmark::RegisterBenchmark(("BM_Memory" + x).c_str(), BM_Memory)->Iterations(1);
  return true;
}

}  // namespace

int main(int argc, char** argv) {
  setenv("LD_LIBRARY_PATH", NRV_HOST_BENCH_SIM_DIR, 1);  // the simulated libraries, for every size's process
  const int status = nrv_bench::run_scales(argc, argv, NRV_HOST_BENCH_SITE_DIR, run);
  if (scene.host) scene.host->shutdown();
  scene.host.reset();
  return status;
}
