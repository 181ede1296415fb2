// The data set built over the sample site holds the adapters, ports,
// attribute values and logical units the site file describes.
#include <gtest/gtest.h>

#include <stdexcept>

#include "DataExpectations.h"
#include "DataTestSupport.h"
#include "data/NRV_Data.h"

namespace {

using cimple::Data;
using namespace nrv_data_test;

class SampleSite : public ::testing::Test {
 protected:
  SampleSite() : functions(functionsOf(readSite(environmentSite()))) {}

  size_t countOf(const std::string& kind) const {
    size_t n = 0;
    for (const Function& f : functions) n += f.kind == kind;
    return n;
  }
  size_t lunCount() const {
    size_t n = 0;
    for (const Function& f : functions) n += f.luns.size();
    return n;
  }

  LogCapture log;
  std::vector<Function> functions;
};

TEST_F(SampleSite, TheSampleDescribesEveryKindWithLogicalUnits) {
  // The other tests prove little unless the site has all of these.
  EXPECT_GT(countOf("nic"), 0u);
  EXPECT_GT(countOf("iscsi"), 0u);
  EXPECT_GT(countOf("fcoe"), 1u);
  EXPECT_GT(lunCount(), 0u);
}

TEST_F(SampleSite, BuildsOneAdapterPerFunctionWithItsPortAndAttributes) {
  Data data;
  EXPECT_EQ(data.getAdapterCount(), 0u);
  EXPECT_FALSE(data.hasNicAdapter() || data.hasIscsiAdapter() || data.hasFcoeAdapter());
  data.buildAdapterData();
  expectAdapters(data, functions);
}

TEST_F(SampleSite, SanDiscoveryFindsEveryLogicalUnitBehindTheFcoePorts) {
  Data data;
  data.buildAdapterData();
  data.buildSANData();
  expectTargets(data, functions);
  EXPECT_EQ(log.countPrefix("Creating Target..."), static_cast<int>(lunCount()));
  EXPECT_EQ(log.countPrefix("End Creating Target..."), static_cast<int>(lunCount()));
}

TEST_F(SampleSite, RescanReplacesTargetsAndRebuildDropsThem) {
  Data data;
  data.buildAdapterData();
  data.buildSANData();
  data.buildSANData();
  expectTargets(data, functions);
  EXPECT_EQ(log.countPrefix("Freeing Target: "), static_cast<int>(lunCount()));

  data.buildAdapterData();
  expectAdapters(data, functions);
  expectTargets(data, functions, {}, [](const Function&) { return false; });
}

TEST_F(SampleSite, FreeAllDataEmptiesTheSet) {
  Data data;
  data.buildAdapterData();
  data.freeAllData();
  EXPECT_EQ(data.getAdapterCount(), 0u);
  EXPECT_TRUE(data.getAdapters().empty());
  EXPECT_EQ(data.getAdapter(0), nullptr);
  EXPECT_FALSE(data.hasNicAdapter() || data.hasIscsiAdapter() || data.hasFcoeAdapter());
  EXPECT_EQ(log.count("freeAllData: cleanExit"), 2);
}

TEST_F(SampleSite, StatisticsAreReadAfreshForFcoeAndIscsiPortsOnly) {
  Data data;
  data.buildAdapterData();
  for (size_t i = 0; i < functions.size(); ++i) {
    cimple::Port* port = data.getAdapter(i)->getPort(0);
    const cimple::PortStatistics* stats = port->getStatistics();
    if (functions[i].kind == "nic") {
      EXPECT_EQ(stats, nullptr);
      continue;
    }
    ASSERT_NE(stats, nullptr);
    // Counter 1 is statistic 1025, counter 18 statistic 1026: every port
    // delivers both; 1036 and 1037 (counters 6 and 7) exist on FC links only.
    EXPECT_NE(stats->counter(1), cimple::kStatisticNotAvailable);
    EXPECT_NE(stats->counter(18), cimple::kStatisticNotAvailable);
    const bool fc = functions[i].kind == "fcoe";
    EXPECT_EQ(stats->counter(6) != cimple::kStatisticNotAvailable, fc);
    EXPECT_EQ(stats->counter(0), cimple::kStatisticNotAvailable);
    EXPECT_EQ(stats->counter(26), cimple::kStatisticNotAvailable);
    EXPECT_NE(port->getStatistics(), nullptr);
  }
  EXPECT_EQ(cimple::PortStatistics::counterOf(1026), 18);
  EXPECT_EQ(cimple::PortStatistics::counterOf(1059), 25);
  EXPECT_EQ(cimple::PortStatistics::counterOf(1034), 0);
}

TEST_F(SampleSite, IndexesPastTheEndThrow) {
  Data data;
  data.buildAdapterData();
  data.buildSANData();
  const cimple::Adapter* adapter = data.getAdapter(0);
  try {
    adapter->getPort(1);
    FAIL() << "no exception";
  } catch (const std::out_of_range& e) {
    EXPECT_STREQ(e.what(), "vector::_M_range_check");
  }
  for (size_t i = 0; i < functions.size(); ++i) {
    const cimple::Port* port = data.getAdapter(i)->getPort(0);
    EXPECT_THROW(port->getTarget(port->getNumberOfTargets()), std::exception);
  }
}

TEST_F(SampleSite, LogsTheDiscoveryTraceUnderOneSourceName) {
  {
    Data data;
    data.buildAdapterData();
    data.buildSANData();
  }
  EXPECT_EQ(log.count("Data Pointer Constructed."), 1);
  EXPECT_EQ(log.count("Data Pointer deleted."), 1);
  EXPECT_EQ(log.fileOf("Data Pointer Constructed."), "NRV_Data.cpp");
  EXPECT_EQ(log.fileOf("buildSANData"), "NRV_Data.cpp");
  // A scanning pass ending at the first NIC function, then the building pass;
  // the first list (one entry) is too small and is asked for again.
  EXPECT_EQ(log.count("Invoking RM_GetAllLocalHBAInstances."), 2);
  EXPECT_EQ(log.count("Number of Adapters detected = " + std::to_string(functions.size())), 1);
  EXPECT_EQ(log.countPrefix("Got NIC adapter "), static_cast<int>(countOf("nic")));
  EXPECT_EQ(log.countPrefix("Got ISCSI adapter "), static_cast<int>(countOf("iscsi")));
  EXPECT_EQ(log.countPrefix("Got FCOE adapter "), static_cast<int>(countOf("fcoe")));
  EXPECT_EQ(log.count("match succesful"), static_cast<int>(countOf("fcoe")));
  EXPECT_EQ(log.count("Target Scanning for NICAdapter not supported"),
            static_cast<int>(countOf("nic")));
  EXPECT_EQ(log.count("iSCSI::rescanTargets"), static_cast<int>(countOf("iscsi")));
  EXPECT_EQ(log.count("FCoEPort::rescanTargets"), static_cast<int>(countOf("fcoe")));
  EXPECT_EQ(log.count("Successful target info fetched"), static_cast<int>(countOf("fcoe")));
  EXPECT_EQ(log.count("CALLING iSCSIAdapterAttributes RM CALLS"), static_cast<int>(countOf("iscsi")));
  EXPECT_EQ(log.countPrefix("Freeing adapter: Norvane "), static_cast<int>(functions.size()));
  // Nothing failed on the sample site.
  EXPECT_EQ(log.countPrefix("ERROR: RM_"), 0);
  EXPECT_EQ(log.countPrefix("Catch ALL error"), 0);
  EXPECT_EQ(log.countPrefix("Issue with Target Rescan"), 0);
}

}  // namespace
