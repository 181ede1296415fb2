// Opening the built simulator libraries for tests.
#include "SimLibrary.h"

#include <cstdlib>
#include <fstream>

namespace nrvsim_test {

std::string library_path(const std::string& dir, const std::string& file) {
  const char* build = std::getenv("NRV_BUILD_DIR");
  return std::string(build ? build : ".") + "/lib/" + dir + "/" + file;
}

Library::Library(const std::string& path) { handle_ = dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL); }

Library::~Library() {
  if (handle_) dlclose(handle_);
}

const Library& lrmapi() {
  static Library lib(library_path("sim", "liblrmapi.so"));
  return lib;
}

const Library& hbaapi() {
  static Library lib(library_path("sim", "libHBAAPI.so.2"));
  return lib;
}

std::string sample_site() { return std::string(NRVSIM_SOURCE_DIR) + "/sim/sites/sample.json"; }

std::string write_site(const std::string& name, const std::string& json) {
  const char* build = std::getenv("NRV_BUILD_DIR");
  const std::string path = std::string(build ? build : ".") + "/" + name;
  std::ofstream(path) << json;
  return path;
}

}  // namespace nrvsim_test
