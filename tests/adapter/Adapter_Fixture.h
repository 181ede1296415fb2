// The common ground of the adapter tests: a fake broker and context, MI
// objects from the adapter's factory entry for the test providers, owned
// CMPI inputs, and the framework trace written since the test began
// (CIMPLE_HOME points at a scratch directory with LOG_LEVEL = DBG).
#pragma once

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "framework/CMPI_Adapter.h"
#include "tests/adapter/Fake_Broker.h"
#include "tests/adapter/Test_Providers.h"

namespace test {

inline constexpr const char* kNs = "root/norvane";

// The scratch CIMPLE_HOME (set up once, before the first trace).
const std::string& trace_home();
// Everything in the trace file.
std::string read_traces();

// The code of a status, its message (a broker string) released.
inline CMPIrc code_of(CMPIStatus status) {
  if (status.msg) CMRelease(status.msg);
  return status.rc;
}

class Adapter_Test : public ::testing::Test {
 protected:
  void SetUp() override;
  void TearDown() override;

  void* factory(Provider_Slot slot, char kind);
  CMPIInstanceMI* instance_mi(Provider_Slot slot) { return static_cast<CMPIInstanceMI*>(factory(slot, 'I')); }
  CMPIMethodMI* method_mi(Provider_Slot slot) { return static_cast<CMPIMethodMI*>(factory(slot, 'M')); }
  CMPIAssociationMI* association_mi(Provider_Slot slot) {
    return static_cast<CMPIAssociationMI*>(factory(slot, 'A'));
  }

  // Inputs released at the end of the test.
  CMPIObjectPath* path(const char* class_name, const char* ns = kNs);
  CMPIObjectPath* card_path(const char* tag);
  CMPIObjectPath* chip_path(const char* tag);
  CMPIObjectPath* service_path(const char* name);
  CMPIArgs* args();
  CMPIInstance* instance(const CMPIObjectPath* on);
  // Traces written since SetUp.
  std::string traces() const;

  fake::Broker broker_;
  CMPIContext* context_ = nullptr;

 private:
  std::vector<CMPIObjectPath*> paths_;
  std::vector<CMPIArgs*> args_;
  std::vector<CMPIInstance*> instances_;
  size_t trace_mark_ = 0;
};

}  // namespace test
