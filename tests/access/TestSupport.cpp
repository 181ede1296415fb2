#include "TestSupport.h"

#include <sys/wait.h>
#include <unistd.h>

#include <cstdlib>
#include <cstring>

extern char** environ;

namespace nrv_test {

int runInChild(const std::string& test, const std::string& libraryPath) {
  std::vector<std::string> env;
  for (char** e = environ; *e; ++e)
    if (std::strncmp(*e, "LD_LIBRARY_PATH=", 16) != 0) env.emplace_back(*e);
  env.push_back("LD_LIBRARY_PATH=" + libraryPath);
  std::vector<char*> envp;
  for (std::string& s : env) envp.push_back(s.data());
  envp.push_back(nullptr);

  std::string filter = "--gtest_filter=" + test;
  std::string disabled = "--gtest_also_run_disabled_tests";
  char exe[] = "/proc/self/exe";
  char* argv[] = {exe, filter.data(), disabled.data(), nullptr};

  const pid_t pid = fork();
  if (pid < 0) return -1;
  if (pid == 0) {
    execve(exe, argv, envp.data());
    _exit(127);
  }
  int status = 0;
  if (waitpid(pid, &status, 0) != pid) return -1;
  return WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
}

std::string stubDir(const char* name) { return std::string(NRV_ACCESS_STUB_DIR) + "/" + name; }

}  // namespace nrv_test
