// Runs a benchmark once per site size, each in a child process of its own:
// the simulated libraries read their site once per process.  The parent
// re-executes this program with NRV_SITE naming "<site_dir>/site_x<scale>.json"
// and NRV_BENCH_SCALE the size; the child registers its benchmark for that
// size and runs it.
//
// Contract: call from main() and return its answer (0 when every size ran).
#pragma once

#include <stdlib.h>
#include <sys/wait.h>
#include <unistd.h>

#include <benchmark/benchmark.h>

#include <initializer_list>
#include <string>
#include <vector>

namespace nrv_bench {

inline int run_child(const char* self, const std::string& site, const std::string& scale, int argc, char** argv) {
  const pid_t pid = fork();
  if (pid < 0) return -1;
  if (pid == 0) {
    setenv("NRV_SITE", site.c_str(), 1);
    setenv("NRV_BENCH_SCALE", scale.c_str(), 1);
    std::vector<char*> args(argv, argv + argc);
    args.push_back(nullptr);
    execv(self, args.data());
    _exit(127);
  }
  int status = 0;
  waitpid(pid, &status, 0);
  return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

// `run(scale)` registers the size's benchmarks in the child and answers
// false when the child cannot run them.
inline int run_scales(int argc, char** argv, const std::string& site_dir, bool (*run)(const std::string& scale)) {
  const char* scale = getenv("NRV_BENCH_SCALE");
  if (scale == nullptr) {
    char self[4096];
    const ssize_t n = readlink("/proc/self/exe", self, sizeof self - 1);
    if (n <= 0) return 1;
    self[n] = '\0';
    int failures = 0;
    for (const char* s : {"1", "10", "100"})
      failures += run_child(self, site_dir + "/site_x" + s + ".json", s, argc, argv) != 0;
    return failures == 0 ? 0 : 1;
  }
  if (!run(scale)) return 1;
  benchmark::Initialize(&argc, argv);
  benchmark::RunSpecifiedBenchmarks();
  benchmark::Shutdown();
  return 0;
}

}  // namespace nrv_bench
