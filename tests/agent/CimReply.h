// One request through the host's command-line client against the module the
// test environment names (NRV_MODULE), with what it printed.
#pragma once

#include <cstdlib>
#include <sstream>
#include <string>
#include <vector>

#include "host/CimClient.h"

namespace nrv_test {

struct Reply {
  int status;
  std::string out, err;
};

inline Reply cim(std::vector<std::string> args) {
  args.insert(args.begin(), {"-m", std::getenv("NRV_MODULE")});
  std::ostringstream out, err;
  const int status = nrv::host::runCimClient(args, out, err);
  return {status, out.str(), err.str()};
}

}  // namespace nrv_test
