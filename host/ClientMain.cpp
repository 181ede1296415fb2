// nrv-cim: command-line entry point; see CimClient.h.
#include <iostream>
#include <string>
#include <vector>

#include "host/CimClient.h"

int main(int argc, char** argv) {
  std::vector<std::string> args(argv + 1, argv + argc);
  const int status = nrv::host::runCimClient(args, std::cout, std::cerr);
  std::cout.flush();
  return status;
}
