// HostTestSupport: shared pieces of the host tests — a scripted Router for broker tests, the
// test provider module, and running the nrv-cim binary.
#ifndef NRV_TESTS_HOST_HOSTTESTSUPPORT_H
#define NRV_TESTS_HOST_HOSTTESTSUPPORT_H

#include <mutex>
#include <string>
#include <vector>

#include "host/Broker.h"
#include "host/Request.h"

namespace nrv::host::test {

// Answers every request with `next` and remembers the last request.
class ScriptedRouter : public Router {
 public:
  Outcome route(const Request& request) override {
    std::lock_guard<std::mutex> lock(mu);
    last = request;
    ++calls;
    return next;
  }
  std::mutex mu;
  Request last;
  Outcome next;
  int calls = 0;
};

inline std::string testProvider() { return NRV_TEST_PROVIDER; }
inline std::string platformFile() { return std::string(NRV_HOST_TEST_DATA) + "/platform.json"; }

struct ProcessResult {
  int status = -1;  // exit status, or -1 when it did not exit normally
  std::string out;
  std::string err;
};

// Runs nrv-cim with `args`, the given extra environment entries ("NAME=value") added to the
// test's own, and collects its output.
ProcessResult runClient(const std::vector<std::string>& args,
                        const std::vector<std::string>& extraEnv = {});

}  // namespace nrv::host::test

#endif  // NRV_TESTS_HOST_HOSTTESTSUPPORT_H
