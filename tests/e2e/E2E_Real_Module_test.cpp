// The real module in the host: it loads, every provider's factories resolve
// and make MIs, and a catalogue-backed class answers the site's instances
// through the nrv-cim client, and an empty success without the management
// library.
#include <cstdlib>
#include <set>

#include "schema/ProviderClasses.h"
#include "tests/e2e/E2E_Fixture.h"
#include "tests/host/HostTestSupport.h"

namespace e2e {
namespace {

#define NRV_NAME(C) #C,
const std::vector<std::string> all_classes = {NRV_FOR_EACH_PROVIDER_CLASS(NRV_NAME)};
const std::vector<std::string> association_classes = {NRV_FOR_EACH_ASSOCIATION_PROVIDER_CLASS(NRV_NAME)};
#undef NRV_NAME

std::string real_module() {
  const char* path = std::getenv("NRV_MODULE");
  return path ? path : "";
}

TEST(RealModule, LoadsAndEveryProvidersFactoriesResolve) {
  ASSERT_NE(std::getenv("NRV_SYSROOT"), nullptr);
  Host host(real_module());
  ASSERT_TRUE(host.moduleLoaded()) << host.loadError();
  ASSERT_FALSE(all_classes.empty());
  std::set<std::string> associations(association_classes.begin(), association_classes.end());
  for (const std::string& c : all_classes) {
    EXPECT_TRUE(host.resolves(c + "_Provider_Create_InstanceMI")) << c;
    EXPECT_TRUE(host.resolves(c + "_Provider_Create_MethodMI")) << c;
    EXPECT_EQ(host.resolves(c + "_Provider_Create_AssociationMI"), associations.count(c) == 1) << c;
  }
  // The factories the host lists are exactly those of the provider classes.
  size_t expected = 2 * 2 * all_classes.size() + 2 * associations.size();
  EXPECT_EQ(host.factorySymbols().size(), expected);
}

TEST(RealModule, EveryProviderMakesItsMisAndCleansUp) {
  Host host(real_module());
  ASSERT_TRUE(host.moduleLoaded()) << host.loadError();
  for (const std::string& c : all_classes) {
    ClassMis mis = host.mis(c);
    EXPECT_NE(mis.instance, nullptr) << c;
    EXPECT_NE(mis.method, nullptr) << c;
  }
  host.shutdown();
  for (const CleanupRecord& record : host.cleanupRecords()) EXPECT_EQ(record.rc, CMPI_RC_OK) << record.factory;
}

TEST(RealModule, ChipEnumerationThroughTheClientAnswersTheSampleSitesChips) {
  auto run = nrv::host::test::runClient({"-m", real_module(), "ein", "root/norvane:NRVTAVO_Chip"});
  EXPECT_EQ(run.status, 0) << run.err;
  EXPECT_NE(run.out.find("NRVTAVO_Chip.Tag=\"NV52C4213A07719\""), std::string::npos) << run.out;
  EXPECT_NE(run.out.find("NRVTAVO_Chip.Tag=\"NV41T5120A03342\""), std::string::npos) << run.out;
  EXPECT_EQ(run.err.find("CMPI_RC_ERR"), std::string::npos) << run.err;
}

// Without the management library the module serves what needs none: the
// settings answer, so a client can tell a missing library from a host
// without adapters, and adapter classes answer an empty success, so a
// CIMOM's request across every provider still succeeds.
TEST(RealModule, WithoutTheManagementLibraryTheSettingsAreStillServed) {
  const std::vector<std::string> no_management = {"LD_LIBRARY_PATH=" + std::string(std::getenv("NRV_BUILD_DIR")) +
                                                  "/lib/sim-nomgmt"};
  auto settings = nrv::host::test::runClient(
      {"-m", real_module(), "ei", "root/norvane:NRVTAVO_ProviderConfigSetting"}, no_management);
  EXPECT_EQ(settings.status, 0) << settings.err;
  for (const char* name : {"cachetimeout", "adapterrefresh", "sanrefresh"})
    EXPECT_NE(settings.out.find(std::string("paramname = \"") + name + "\""), std::string::npos) << settings.out;
  // Empty, so left unset: SFCB refuses any array value of this EmbeddedObject
  // property, and its clients cannot read the explicit null it accepts.
  EXPECT_EQ(settings.out.find("ComponentSetting"), std::string::npos) << settings.out;
  auto chips = nrv::host::test::runClient({"-m", real_module(), "ei", "root/norvane:NRVTAVO_Chip"}, no_management);
  EXPECT_EQ(chips.status, 0) << chips.err;
  EXPECT_EQ(chips.out, "");
}

}  // namespace
}  // namespace e2e
