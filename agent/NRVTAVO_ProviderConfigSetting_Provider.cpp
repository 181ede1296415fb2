#include "agent/NRVTAVO_ProviderConfigSetting_Provider.h"

#include <cstdint>
#include <mutex>

#include "agent/ProviderAgent.h"
#include "logging/Log.h"

namespace cimple {

namespace {

using Setting = NRVTAVO_ProviderConfigSetting;

// The published settings, in catalogue order; the index is their identity.
struct Setting_Row {
  const char* param;
  const char* description;
  uint32_t low, high, def;
};

constexpr Setting_Row kSettingRows[] = {
    {"cachetimeout", "This setting defines the timeout value of Norvane CIM Provider's internal cache", 5, 30, 10},
    {"adapterrefresh",
     "This setting represents the Adapter data refresh setting value of Norvane CIM Provider's internal cache", 0,
     1, 0},
    {"sanrefresh",
     "This setting represents the SAN data refresh setting value of Norvane CIM Provider's internal cache", 0, 1,
     1},
};

Setting* make_setting(const Setting_Row& row, uint32_t current) {
  Setting* s = Setting::create();
  set_null_flags(s, true, true, 1);
  s->__name_space = "root/norvane";
  s->InstanceID.set(String(std::string("Norvane TAVO Provider:") + row.param));
  s->paramname.set(row.param);
  s->Description.set(row.description);
  s->lowRange.set(row.low);
  s->highRange.set(row.high);
  s->def.set(row.def);
  s->current.set(current);
  return s;
}

// What one index changes when it accepts v, with its messages.
struct Setting_Change {
  int (NrvConfigFile::*set)(int64_t);
  void (*apply)(ProviderAgent& agent, int64_t v);
  const char* done;
  const char* refused;
};

const Setting_Change kChanges[] = {
    {&NrvConfigFile::setCacheTimeout,
     [](ProviderAgent& a, int64_t v) { a.m_CacheTimeout = static_cast<int32_t>(v); },
     "Cache time-out is modified successfully", "The value provided for cache time-out is out of range"},
    {&NrvConfigFile::setRefreshAdapterData, [](ProviderAgent& a, int64_t v) { a.m_bRefreshAdapterData = v != 0; },
     "Adapter refresh is modified successfully", "The value provided for adapter refresh out is out of range"},
    {&NrvConfigFile::setRefreshSANData, [](ProviderAgent& a, int64_t v) { a.m_bRefreshSANData = v != 0; },
     "SAN refresh is modified successfully", "The value provided for SAN refresh out is out of range"},
};

bool is_setting(const Instance* instance) {
  return instance != nullptr && instance->meta_class == &Setting::static_meta_class;
}

}  // namespace

bool insertProviderConfigSettings(ProviderAgent& agent) {
  const NrvConfigFile::Settings config = agent.m_ConfigFile.settings();
  const uint32_t current[] = {static_cast<uint32_t>(config.cacheTimeout), config.refreshAdapterData ? 1u : 0u,
                              config.refreshSANData ? 1u : 0u};
  for (size_t i = 0; i < std::size(kSettingRows); ++i) {
    Setting* s = make_setting(kSettingRows[i], current[i]);
    if (agent.m_NRVTAVO_ProviderConfigSetting_map.insert(s) < 0) {
      NRV_LOG(NRV_CRIT, "Insert Failed : m_NRVTAVO_ProviderConfigSetting_map");
      destroy(s);
      return false;
    }
  }
  return true;
}

int NRVTAVO_ProviderConfigSetting_Provider::modify_instance(const Instance* model, const Instance* instance) {
  NRV_LOG(NRV_DBG, "NRVTAVO_ProviderConfigSetting_Provider::modify_instance()");
  ProviderAgent& agent = *ProviderAgent::getInstance();
  agent.BuildCimpleInfo();
  agent.waitForAdapterData(true).unlock();
  agent.waitForAdapterMaps(true).unlock();

  std::lock_guard<std::recursive_mutex> data(agent.m_DataMutex);
  // Anything but this class would be read through the wrong layout.
  if (!is_setting(model) || !is_setting(instance)) {
    NRV_LOG(NRV_ERR, "NRVTAVO_ProviderConfigSetting_Provider::modify_instance invalid parameter");
    return MODIFY_INSTANCE_INVALID_PARAMETER;
  }
  const auto* wanted = static_cast<const Setting*>(model);
  const auto* given = static_cast<const Setting*>(instance);

  Instance_Map& map = agent.m_NRVTAVO_ProviderConfigSetting_map;
  size_t index = 0;
  while (index < map.size() && !(key_eq(map[index], instance) && !wanted->current.is_null())) ++index;
  if (index == map.size()) {
    NRV_LOG(NRV_ERR, "Instance does not exist");
    return MODIFY_INSTANCE_FAILED;
  }

  // A null value is no setting at all: every setter refuses it.
  const int64_t v = given->current.is_null() ? -1 : static_cast<int64_t>(given->current.value);
  if (index < std::size(kChanges)) {
    const Setting_Change& change = kChanges[index];
    switch (agent.m_ConfigFile.change(change.set, v)) {
      case NrvConfigFile::Change::OutOfRange:
        NRV_LOG(NRV_ERR, "%s", change.refused);
        return MODIFY_INSTANCE_INVALID_PARAMETER;
      case NrvConfigFile::Change::NotSaved:
        // A change that would be lost at the next start is no change: the
        // old value stays in force and the client is told.
        return MODIFY_INSTANCE_FAILED;
      case NrvConfigFile::Change::Saved:
        break;
    }
    change.apply(agent, v);
    NRV_LOG(NRV_WARN, "%s", change.done);
  }
  static_cast<Setting*>(map[index])->current.set(static_cast<uint32_t>(v));
  return MODIFY_INSTANCE_OK;
}

}  // namespace cimple
