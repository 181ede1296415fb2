// Test access to the built simulator libraries the way the module reaches
// them: dlopen by file name from a library directory, dlsym by name.
#pragma once

#include <dlfcn.h>

#include <string>

#include "access/RM_Api.h"

namespace nrvsim_test {

// $NRV_BUILD_DIR/lib/<dir>/<file>.
std::string library_path(const std::string& dir, const std::string& file);

class Library {
 public:
  explicit Library(const std::string& path);
  ~Library();
  Library(const Library&) = delete;
  Library& operator=(const Library&) = delete;

  bool ok() const { return handle_ != nullptr; }
  void* symbol(const char* name) const { return handle_ ? dlsym(handle_, name) : nullptr; }
  // Typed lookup: lib.fn<decltype(RM_GetVersion)>("RM_GetVersion").
  template <class F>
  F* fn(const char* name) const {
    return reinterpret_cast<F*>(symbol(name));
  }

 private:
  void* handle_ = nullptr;
};

// The primary libraries of lib/sim, opened once per test process.
const Library& lrmapi();
const Library& hbaapi();

// Sample site and a scratch file for modified copies of it.
std::string sample_site();
std::string write_site(const std::string& name, const std::string& json);

}  // namespace nrvsim_test

// Calls a library function through dlsym: CALL(lrmapi(), RM_GetVersion, buf, n).
#define SIM_CALL(lib, name, ...) ((lib).fn<decltype(name)>(#name))(__VA_ARGS__)
