// NRVTAVO_ProviderConfigSetting through its provider procedure: the three
// published settings, and modifications that reach the agent at once and the
// configuration file when the agent ends.
#include <sys/resource.h>

#include <type_traits>

#include "AgentFixture.h"
#include "logging/Log.h"
#include "module/Provider_For.h"
#include "schema/Classes.h"

namespace nrv_test {
namespace {

using namespace cimple;
using Setting = NRVTAVO_ProviderConfigSetting;

static_assert(std::is_same_v<Provider_For<Setting>::type, NRVTAVO_ProviderConfigSetting_Provider>,
              "the setting class is claimed by its own provider");

class ConfigSettingTest : public AgentTest {
 protected:
  void load(const std::string& config = "") {
    if (!config.empty()) write_file(sysroot_path(kNrvConfigFile), config);
    provider = make_slot<Provider_For<Setting>::type, Setting>();
    ASSERT_EQ(provider->load(), LOAD_OK);
    agent = ProviderAgent::peekInstance();
  }
  void unload() {
    if (provider) provider->unload();
    provider.reset();
  }
  void TearDown() override {
    unload();
    AgentTest::TearDown();
  }

  static Setting* keys_of(const char* param) {
    Setting* s = Setting::create();
    s->InstanceID.set(String(std::string("Norvane TAVO Provider:") + param));
    return s;
  }

  // modify_instance with a model that lists `current` (unless told not to).
  int modify(const char* param, uint32_t value, bool model_lists_current = true) {
    Setting* instance = keys_of(param);
    instance->current.set(value);
    Setting* model = Setting::create();
    set_null_flags(model, true, true, 1);
    if (model_lists_current) model->current.set(0);
    const int result = provider->handle().modify_instance(model, instance);
    unref(model);
    unref(instance);
    return result;
  }

  std::vector<uint32_t> currents() {
    Collected all;
    provider->enumerate(all);
    std::vector<uint32_t> values;
    for (Instance* i : all.instances) values.push_back(static_cast<Setting*>(i)->current.value);
    return values;
  }

  std::unique_ptr<ProviderSlot> provider;
  ProviderAgent* agent = nullptr;
};

TEST_F(ConfigSettingTest, PublishesTheThreeSettingsInOrder) {
  load();
  Collected all;
  ASSERT_EQ(provider->enumerate(all), ENUM_INSTANCES_OK);
  ASSERT_EQ(all.instances.size(), 3u);
  struct Row {
    const char* id;
    const char* param;
    uint32_t low, high, def, current;
  };
  const Row rows[] = {{"Norvane TAVO Provider:cachetimeout", "cachetimeout", 5, 30, 10, 10},
                      {"Norvane TAVO Provider:adapterrefresh", "adapterrefresh", 0, 1, 0, 0},
                      {"Norvane TAVO Provider:sanrefresh", "sanrefresh", 0, 1, 1, 1}};
  for (size_t i = 0; i < 3; ++i) {
    const auto* s = static_cast<const Setting*>(all.instances[i]);
    EXPECT_EQ(s->InstanceID.value, String(rows[i].id));
    EXPECT_EQ(s->paramname.value, String(rows[i].param));
    EXPECT_EQ(s->lowRange.value, rows[i].low);
    EXPECT_EQ(s->highRange.value, rows[i].high);
    EXPECT_EQ(s->def.value, rows[i].def);
    EXPECT_EQ(s->current.value, rows[i].current);
    EXPECT_FALSE(s->current.is_null());
    EXPECT_TRUE(s->Caption.is_null());
    EXPECT_TRUE(s->ElementName.is_null());
    EXPECT_EQ(s->__name_space, String("root/norvane"));
  }
  EXPECT_EQ(static_cast<const Setting*>(all.instances[0])->Description.value,
            String("This setting defines the timeout value of Norvane CIM Provider's internal cache"));
  EXPECT_EQ(static_cast<const Setting*>(all.instances[2])->Description.value,
            String("This setting represents the SAN data refresh setting value of Norvane CIM Provider's internal "
                   "cache"));
}

TEST_F(ConfigSettingTest, CurrentValuesComeFromTheConfigurationFile) {
  load("NRV_PROVIDER_CACHE_TIMEOUT = 20\nNRV_PROVIDER_REFRESH_ADAPTERDATA = TRUE\n"
       "NRV_PROVIDER_REFRESH_SANDATA = FALSE\n");
  EXPECT_EQ(currents(), (std::vector<uint32_t>{20, 1, 0}));
  EXPECT_EQ(agent->m_CacheTimeout, 20);
  EXPECT_TRUE(agent->m_bRefreshAdapterData);
  EXPECT_FALSE(agent->m_bRefreshSANData);
}

TEST_F(ConfigSettingTest, GetInstanceFindsASettingByItsKey) {
  load();
  Setting* keys = keys_of("sanrefresh");
  Instance* found = nullptr;
  EXPECT_EQ(provider->handle().get_instance(keys, found), GET_INSTANCE_OK);
  ASSERT_NE(found, nullptr);
  EXPECT_EQ(static_cast<Setting*>(found)->paramname.value, String("sanrefresh"));
  unref(found);
  unref(keys);
}

const char* const kSavedSettings =
    "##################################################\n"
    "# Norvane HBA CIM Provider Configuration Settings #\n"
    "##################################################\n"
    "NRV_PROVIDER_CACHE_TIMEOUT = 3\n"
    "NRV_PROVIDER_REFRESH_ADAPTERDATA = TRUE\n"
    "NRV_PROVIDER_REFRESH_SANDATA = FALSE\n";

// A CIMOM may never bring the agent's count to zero (SFCB cleans up once per
// MI type): a change is saved when it is made.
TEST_F(ConfigSettingTest, AModificationTakesEffectAndReachesTheFileAtOnce) {
  load();
  EXPECT_EQ(modify("cachetimeout", 3), MODIFY_INSTANCE_OK);  // below the published low range, inside the setter's
  EXPECT_EQ(capture.count("Cache time-out is modified successfully", NRV_WARN), 1);
  EXPECT_TRUE(capture.contains("NRVTAVO_ProviderConfigSetting_Provider::modify_instance()"));
  EXPECT_EQ(agent->m_CacheTimeout, 3);
  EXPECT_EQ(agent->m_ConfigFile.getCacheTimeout(), 3);
  EXPECT_EQ(modify("adapterrefresh", 1), MODIFY_INSTANCE_OK);
  EXPECT_EQ(capture.count("Adapter refresh is modified successfully", NRV_WARN), 1);
  EXPECT_TRUE(agent->m_bRefreshAdapterData);
  EXPECT_EQ(modify("sanrefresh", 0), MODIFY_INSTANCE_OK);
  EXPECT_EQ(capture.count("SAN refresh is modified successfully", NRV_WARN), 1);
  EXPECT_FALSE(agent->m_bRefreshSANData);
  EXPECT_EQ(currents(), (std::vector<uint32_t>{3, 1, 0}));
  EXPECT_EQ(read_file(sysroot_path(kNrvConfigFile)), kSavedSettings);

  unload();
  EXPECT_EQ(read_file(sysroot_path(kNrvConfigFile)), kSavedSettings);
  // And the next agent starts from them.
  capture.arm();
  load();
  EXPECT_EQ(currents(), (std::vector<uint32_t>{3, 1, 0}));
}

// Run in a child: the file-size limit there makes every write of the
// settings fail, as a full disk or a competing limit would.
TEST_F(ConfigSettingTest, DISABLED_ChildAChangeThatCannotBeSavedFailsAndChangesNothing) {
  const std::string original = "NRV_PROVIDER_CACHE_TIMEOUT = 20\n";
  write_file(sysroot_path(kNrvDumpFile), "1,5,1\n");  // record log only: no trace file to grow
  load(original);
  const struct rlimit tiny = {8, 8};
  ASSERT_EQ(::setrlimit(RLIMIT_FSIZE, &tiny), 0);
  capture.reset();
  EXPECT_EQ(modify("cachetimeout", 25), MODIFY_INSTANCE_FAILED);
  EXPECT_EQ(capture.count("Cache time-out is modified successfully"), 0);
  EXPECT_EQ(agent->m_CacheTimeout, 20);
  EXPECT_EQ(agent->m_ConfigFile.getCacheTimeout(), 20);
  EXPECT_EQ(currents(), (std::vector<uint32_t>{20, 0, 1}));
  // The rewrite at unload fails the same way and leaves the file whole.
  unload();
  EXPECT_EQ(read_file(sysroot_path(kNrvConfigFile)), original);
}

TEST(ConfigSettingFailure, AChangeThatCannotBeSavedFailsAndChangesNothing) {
  EXPECT_EQ(run_in_child("ConfigSettingTest.DISABLED_ChildAChangeThatCannotBeSavedFailsAndChangesNothing",
                         NRV_AGENT_STUB_DIR),
            0);
}

TEST_F(ConfigSettingTest, OutOfRangeValuesAreRefusedAndChangeNothing) {
  load();
  EXPECT_EQ(modify("cachetimeout", 31), MODIFY_INSTANCE_INVALID_PARAMETER);
  EXPECT_EQ(capture.count("The value provided for cache time-out is out of range", NRV_ERR), 1);
  EXPECT_EQ(modify("cachetimeout", 0), MODIFY_INSTANCE_INVALID_PARAMETER);
  EXPECT_EQ(modify("adapterrefresh", 2), MODIFY_INSTANCE_INVALID_PARAMETER);
  EXPECT_EQ(capture.count("The value provided for adapter refresh out is out of range", NRV_ERR), 1);
  EXPECT_EQ(modify("sanrefresh", 2), MODIFY_INSTANCE_INVALID_PARAMETER);
  EXPECT_EQ(capture.count("The value provided for SAN refresh out is out of range", NRV_ERR), 1);
  EXPECT_EQ(modify("sanrefresh", 0xFFFFFFFFu), MODIFY_INSTANCE_INVALID_PARAMETER);
  EXPECT_EQ(currents(), (std::vector<uint32_t>{10, 0, 1}));
  EXPECT_EQ(agent->m_CacheTimeout, 10);
  EXPECT_TRUE(agent->m_bRefreshSANData);
}

TEST_F(ConfigSettingTest, UnknownInstancesAndMissingArgumentsAreRefused) {
  load();
  EXPECT_EQ(modify("nosuchsetting", 5), MODIFY_INSTANCE_FAILED);
  EXPECT_EQ(capture.count("Instance does not exist", NRV_ERR), 1);
  EXPECT_EQ(modify("cachetimeout", 5, /*model_lists_current=*/false), MODIFY_INSTANCE_FAILED);

  Setting* instance = keys_of("cachetimeout");
  instance->current.set(5);
  EXPECT_EQ(provider->handle().modify_instance(nullptr, instance), MODIFY_INSTANCE_INVALID_PARAMETER);
  EXPECT_EQ(provider->handle().modify_instance(instance, nullptr), MODIFY_INSTANCE_INVALID_PARAMETER);
  EXPECT_EQ(capture.count("NRVTAVO_ProviderConfigSetting_Provider::modify_instance invalid parameter", NRV_ERR), 2);
  // An instance of another class is not read through this layout.
  NRVTAVO_Chip* chip = NRVTAVO_Chip::create();
  EXPECT_EQ(provider->handle().modify_instance(chip, chip), MODIFY_INSTANCE_INVALID_PARAMETER);
  unref(chip);
  // A null value is no setting.
  instance->current.set_null();
  Setting* model = Setting::create();
  EXPECT_EQ(provider->handle().modify_instance(model, instance), MODIFY_INSTANCE_INVALID_PARAMETER);
  unref(model);
  unref(instance);
  EXPECT_EQ(currents(), (std::vector<uint32_t>{10, 0, 1}));
}

TEST_F(ConfigSettingTest, TheNewTimeoutGovernsTheNextCheck) {
  load();
  currents();
  wait_fetch_idle(*agent);
  ASSERT_EQ(modify("cachetimeout", 1), MODIFY_INSTANCE_OK);
  {
    std::lock_guard<std::mutex> lock(agent->m_BuildMutex);
    const Datetime now = Datetime::now();
    agent->m_LoadedTime = Datetime::timestamp(now.usec() - 61000000ULL, now.utc_offset());
  }
  capture.reset();
  agent->BuildCimpleInfo();
  EXPECT_TRUE(capture.contains("PERF: TimeOut"));
  wait_fetch_idle(*agent);
}

}  // namespace
}  // namespace nrv_test
