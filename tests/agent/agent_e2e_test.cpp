// The provider settings end to end: the module loaded by the CIMOM stand-in,
// requests through its command-line client, the simulated site behind it.
#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <sstream>
#include <string>
#include <vector>

#include "AgentTestSupport.h"
#include "agent/NrvConfigFile.h"
#include "CimReply.h"

namespace nrv_test {
namespace {

const std::string kTimeout = "NRVTAVO_ProviderConfigSetting.InstanceID=\"Norvane TAVO Provider:cachetimeout\"";
const std::string kSanRefresh = "NRVTAVO_ProviderConfigSetting.InstanceID=\"Norvane TAVO Provider:sanrefresh\"";

TEST(AgentEndToEnd, ProviderSettingsAreReadAndModifiedThroughCMPI) {
  ASSERT_NE(std::getenv("NRV_MODULE"), nullptr);
  remove_file(sysroot_path(cimple::kNrvConfigFile));

  Reply all = cim({"ei", "NRVTAVO_ProviderConfigSetting"});
  ASSERT_EQ(all.status, 0) << all.err;
  EXPECT_NE(all.out.find("InstanceID = \"Norvane TAVO Provider:cachetimeout\";"), std::string::npos);
  EXPECT_NE(all.out.find("InstanceID = \"Norvane TAVO Provider:adapterrefresh\";"), std::string::npos);
  EXPECT_NE(all.out.find("InstanceID = \"Norvane TAVO Provider:sanrefresh\";"), std::string::npos);
  EXPECT_NE(all.out.find("current = 10;"), std::string::npos);

  Reply changed = cim({"mi", kTimeout, "current=3"});
  EXPECT_EQ(changed.status, 0) << changed.err;
  Reply one = cim({"gi", kTimeout});
  ASSERT_EQ(one.status, 0) << one.err;
  EXPECT_NE(one.out.find("current = 3;"), std::string::npos) << one.out;

  Reply refused = cim({"mi", kTimeout, "current=31"});
  EXPECT_EQ(refused.status, 1);
  EXPECT_NE(refused.err.find("CMPI_RC_ERR_INVALID_PARAMETER"), std::string::npos) << refused.err;
  Reply san = cim({"mi", kSanRefresh, "current=2"});
  EXPECT_EQ(san.status, 1);
  EXPECT_NE(san.err.find("CMPI_RC_ERR_INVALID_PARAMETER"), std::string::npos) << san.err;
  // The accepted value reached the file.
  EXPECT_NE(read_file(sysroot_path(cimple::kNrvConfigFile)).find("NRV_PROVIDER_CACHE_TIMEOUT = 3\n"),
            std::string::npos);
}

TEST(AgentEndToEnd, AChangeThatCannotBeSavedFailsAndTheOldValueStays) {
  const std::string config = sysroot_path(cimple::kNrvConfigFile);
  const std::string moved = sysroot() + "/etc-moved";
  const std::string etc = config.substr(0, config.rfind('/'));
  remove_file(config);
  ASSERT_EQ(::rename(etc.c_str(), moved.c_str()), 0);  // the configuration's folder is gone
  Reply changed = cim({"mi", kTimeout, "current=7"});
  Reply one = cim({"gi", kTimeout});
  ASSERT_EQ(::rename(moved.c_str(), etc.c_str()), 0);
  EXPECT_EQ(changed.status, 1);
  EXPECT_NE(changed.err.find("CMPI_RC_ERR_FAILED"), std::string::npos) << changed.err;
  ASSERT_EQ(one.status, 0) << one.err;
  EXPECT_NE(one.out.find("current = 10;"), std::string::npos) << one.out;
}

}  // namespace
}  // namespace nrv_test
