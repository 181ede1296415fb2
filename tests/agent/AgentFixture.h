// The fixture every agent test starts from: no agent alive, the fake
// catalogue installed as the agent's builders, no configuration files, and a
// log capture armed.
#pragma once

#include <gtest/gtest.h>

#include "AgentTestSupport.h"
#include "agent/NrvConfigFile.h"
#include "logging/NRV_LogDataFile.h"

namespace nrv_test {

class AgentTest : public ::testing::Test {
 protected:
  void SetUp() override {
    ASSERT_EQ(cimple::ProviderAgent::peekInstance(), nullptr) << "an earlier test left the agent alive";
    FakeCatalogue::get().reset();
    cimple::ProviderAgent::useBuilders(FakeCatalogue::builders());
    remove_file(sysroot_path(cimple::kNrvConfigFile));
    remove_file(sysroot_path(cimple::kNrvDumpFile));
    remove_file(sysroot_path(cimple::kNrvSystemLogFile));
    capture.arm();
    capture.reset();
  }

  void TearDown() override {
    // A failed test may leave references behind; never leak the agent into the next.
    FakeCatalogue::get().adapterDataGate.open();
    FakeCatalogue::get().sanDataGate.open();
    while (cimple::ProviderAgent::refCount() > 0) cimple::ProviderAgent::releaseRef();
    EXPECT_EQ(cimple::ProviderAgent::peekInstance(), nullptr);
    cimple::ProviderAgent::useBuilders(cimple::ProviderAgent::defaultBuilders());
  }

  LogCapture capture;
};

}  // namespace nrv_test
