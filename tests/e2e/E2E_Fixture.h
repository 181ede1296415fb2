// The common ground of the end-to-end tests: the test module loaded into a
// fresh host per test with a freshly seeded store, host paths of its
// instances, and the framework trace written since the test began
// (CIMPLE_HOME points at a scratch directory with LOG_LEVEL=DBG, set before
// the module writes its first trace).
#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "host/Host.h"
#include "tests/adapter/Test_Providers.h"

namespace e2e {

using namespace nrv::host;

inline constexpr const char* kNs = "root/norvane";

inline std::string test_module() { return NRV_E2E_MODULE; }

// Sets CIMPLE_HOME to a scratch directory with a DBG ".cimplerc", once.
const std::string& trace_home();
// Everything in "$CIMPLE_HOME/.cimple/messages".
std::string read_traces();

PathData class_path(const std::string& class_name);
PathData card_path(const std::string& tag);
PathData chip_path(const std::string& tag);
PathData service_path(const std::string& name);

// One property's value in an instance, or null when absent.
const Datum* property(const HostInstance& instance, const std::string& name);

class E2E_Test : public ::testing::Test {
 protected:
  void SetUp() override;
  void TearDown() override;

  // The module's store (the test module's hook); only between operations.
  test::Store& module_store();
  // Another hook the test module exports, or null.
  void* module_symbol(const char* name);
  // Traces written since SetUp.
  std::string traces() const;

  std::unique_ptr<Host> host_;

 private:
  void* handle_ = nullptr;  // our own reference to the loaded test module
  size_t trace_start_ = 0;
};

}  // namespace e2e
