// The real module in the host as a CIMOM routes it, by the registration and class repository
// the build writes beside the module: namespaces and classes are checked, an enumeration of a
// DMTF superclass reaches the module's subclasses, object path keys are checked against the
// class, and cleanup as SFCB calls it (once per MI type) still leaves a changed setting in the
// configuration file for the next process.
#include <sys/stat.h>

#include <cstdlib>
#include <fstream>
#include <iostream>
#include <sstream>

#include "tests/e2e/E2E_Fixture.h"
#include "tests/host/HostTestSupport.h"

namespace e2e {
namespace {

constexpr const char* kSetting = "NRVTAVO_ProviderConfigSetting";
constexpr const char* kTimeout =
    "root/norvane:NRVTAVO_ProviderConfigSetting.InstanceID=\"Norvane TAVO Provider:cachetimeout\"";

std::string real_module() { return std::getenv("NRV_MODULE"); }

PathData timeout_path(const Host& host, const std::string& ns = kNs) {
  auto parsed = parsePath(kTimeout, kNs, host.keySchema());
  PathData p = std::get<PathData>(parsed);
  p.nameSpace = ns;
  return p;
}

HostInstance with_current(const PathData& path, CMPIUint32 value) {
  HostInstance changed;
  changed.path = path;
  changed.properties = path.keys;
  changed.properties.emplace_back("current", Datum::unsignedInt(CMPI_uint32, value));
  return changed;
}

CMPISint64 current_of(Host& host) {
  Result r = host.getInstance(timeout_path(host));
  if (!r.ok() || r.instances.empty()) return -1;
  const Datum* d = property(r.instances.front(), "current");
  return d == nullptr ? -1 : d->asInteger();
}

TEST(Cimom, NamespacesAndClassesAreCheckedAsSfcbChecksThem) {
  Host host(real_module());
  ASSERT_TRUE(host.catalogError().empty()) << host.catalogError();
  ASSERT_NE(host.registration(), nullptr);
  struct Case {
    const char* ns;
    const char* cls;
    CMPIrc rc;
  };
  const Case cases[] = {
      {"root/norvane", kSetting, CMPI_RC_OK},
      {"root/pg_interop", kSetting, CMPI_RC_ERR_INVALID_CLASS},
      {"root/bogus", kSetting, CMPI_RC_ERR_INVALID_NAMESPACE},
      {"root/norvane", "NRVTAVO_NoSuchClass", CMPI_RC_ERR_INVALID_CLASS},
      {"root/pg_interop", "NRVTAVO_RegisteredProfile", CMPI_RC_OK},
      // Declared there (the module's MOF is), served only where profiles live: no instances.
      {"root/norvane", "NRVTAVO_RegisteredProfile", CMPI_RC_OK},
  };
  for (const Case& c : cases) {
    EXPECT_EQ(host.enumerateInstances(c.ns, c.cls).rc, c.rc) << c.ns << ":" << c.cls;
  }
  // A modification in a foreign namespace never reaches the provider.
  EXPECT_EQ(host.modifyInstance(with_current(timeout_path(host, "root/bogus"), 25)).rc,
            CMPI_RC_ERR_INVALID_NAMESPACE);
  EXPECT_EQ(host.modifyInstance(with_current(timeout_path(host, "root/pg_interop"), 25)).rc,
            CMPI_RC_ERR_INVALID_CLASS);
  EXPECT_EQ(current_of(host), 10);
  // A declared class without a provider has no instances.
  PathData dmtf = timeout_path(host);
  dmtf.className = "CIM_SettingData";
  EXPECT_EQ(host.getInstance(dmtf).rc, CMPI_RC_ERR_NOT_FOUND);
}

TEST(Cimom, SuperclassEnumerationReachesTheModulesSubclasses) {
  Host host(real_module());
  for (const char* superclass : {"CIM_SettingData", "CIM_ManagedElement"}) {
    Result r = host.enumerateInstanceNames(kNs, superclass);
    ASSERT_TRUE(r.ok()) << superclass << ": " << r.errorText();
    size_t settings = 0;
    for (const PathData& p : r.paths) settings += p.className == kSetting ? 1 : 0;
    EXPECT_EQ(settings, 3u) << superclass;
  }
}

TEST(Cimom, ClientRefusesAKeyTheClassDoesNotHave) {
  auto run = nrv::host::test::runClient(
      {"-m", real_module(), "gi", std::string(kTimeout) + ",Colour=\"red\""});
  EXPECT_EQ(run.status, 2);
  EXPECT_NE(run.err.find("has no key Colour"), std::string::npos) << run.err;
}

// Settings must reach the file although SFCB never releases every provider: expected to fail
// until a modified setting is written when it is made; flip the mark then.
constexpr bool kPersistenceExpectedToFail = true;

TEST(Cimom, SettingSurvivesSfcbStyleCleanup) {
  const std::string root = std::getenv("NRV_SYSROOT");
  ::mkdir((root + "/etc").c_str(), 0755);
  {
    Host::Options sfcb;
    sfcb.cleanup = Host::Cleanup::OncePerMiType;
    Host host(real_module(), sfcb);
    // Every provider loaded, as after a client's enumeration of CIM_ManagedElement.
    ASSERT_TRUE(host.enumerateInstanceNames(kNs, "CIM_ManagedElement").ok());
    ASSERT_TRUE(host.modifyInstance(with_current(timeout_path(host), 20)).ok());
    host.shutdown();
    EXPECT_LE(host.cleanupRecords().size(), 4u);
  }
  auto run = nrv::host::test::runClient({"-m", real_module(), "gi", kTimeout});
  ASSERT_EQ(run.status, 0) << run.err;
  std::ifstream in(root + "/etc/norvane_tavo_provider.conf");
  std::ostringstream file;
  file << in.rdbuf();
  const bool persisted = run.out.find("current = 20;") != std::string::npos &&
                         file.str().find("NRV_PROVIDER_CACHE_TIMEOUT = 20") != std::string::npos;
  if (kPersistenceExpectedToFail && !persisted) {
    GTEST_SKIP() << "expected failure: the change is lost with SFCB-style cleanup\n" << run.out;
  }
  EXPECT_TRUE(persisted) << run.out << "\nconfiguration file:\n" << file.str();
  if (kPersistenceExpectedToFail) std::cout << "XPASS: remove the expected-failure mark\n";
}

}  // namespace
}  // namespace e2e
