// Driver parameter records to setting-data instances, one table row per kind
// of value.
#include "data/NRV_DriverParameters.h"

#include <cstring>

#include "access/NRV_Common.h"
#include "access/NRV_MethodWrapper.h"
#include "access/NRV_VpdWalk.h"
#include "logging/Log.h"
#include "schema/NRVTAVO_DriverParameterSettingData.h"

namespace cimple {

namespace {

// One kind of value of a parameter: the word in its InstanceID and the field.
struct Value_Kind {
  const char* word;
  HBA_UINT32 RM_DRIVER_PARAM::*value;
};

constexpr Value_Kind kCurrent{"Current", &RM_DRIVER_PARAM::currentValue};
constexpr Value_Kind kDefault{"Default", &RM_DRIVER_PARAM::defaultValue};
constexpr Value_Kind kMaximum{"Maximum", &RM_DRIVER_PARAM::maxValue};
constexpr Value_Kind kMinimum{"Minimum", &RM_DRIVER_PARAM::minValue};

constexpr Value_Kind kGlobalOrder[] = {kCurrent, kMaximum, kMinimum, kDefault};
constexpr Value_Kind kLocalOrder[] = {kCurrent, kDefault, kMaximum, kMinimum};

template <size_t N>
std::string fieldText(const char (&field)[N]) {
  return printableText(std::string(field, strnlen(field, N)));
}

Instance* makeSetting(const RM_DRIVER_PARAM& record, const Value_Kind& kind, const std::string& portName,
                      bool global) {
  const std::string parameter = fieldText(record.name);
  auto* s = makeInstance<NRVTAVO_DriverParameterSettingData>();
  std::string id = std::string("NRV:FCoE ") + kind.word + (global ? " Global" : " Local") + " Driver Parameter:";
  id += global ? parameter : portName + ":" + parameter;
  s->InstanceID.set(String(id));
  s->ParameterName.set(String(parameter));
  s->Value.set(record.*(kind.value));
  s->help.set(String(fieldText(record.help)));
  s->ChangeableType.set(static_cast<uint16>(record.changeableType));
  s->exportFlag.set(static_cast<uint16>(record.exportFlag));
  if (!global) {
    s->ConfigurationName.set("local");
    s->ElementName.set(String(portName));
  }
  return s;
}

}  // namespace

std::vector<Instance*> driverParamInstances(const std::vector<RM_DRIVER_PARAM>& records,
                                            const std::string& portName, bool global) {
  std::vector<Instance*> out;
  try {
    for (const RM_DRIVER_PARAM& record : records) {
      NRV_LOG(NRV_DBG, "%s: %s", fieldText(record.name).c_str(), fieldText(record.help).c_str());
      for (const Value_Kind& kind : global ? kGlobalOrder : kLocalOrder)
        out.push_back(makeSetting(record, kind, portName, global));
    }
  } catch (...) {
    for (Instance* made : out) destroy(made);
    throw;
  }
  return out;
}

uint32_t FCoEGetDriverParam(NRV_Catalogue& catalogue, const std::string& portName, bool global) {
  NRV_LOG(NRV_DBG, "Entering NRV_MethodWrapper::FCoEGetDriverParam()");
  HBA_NAME name{};
  if (string2HBAName(&name, portName.c_str()) != 1) return kNrvFailure;
  std::vector<RM_DRIVER_PARAM> records;
  const RM_STATUS status = NRV_MethodWrapper::ReadDriverParams(name, global, records);
  if (status != RM_STATUS_SUCCESS) return status;
  for (Instance* setting : driverParamInstances(records, portName, global))
    if (!catalogue.insert(setting)) NRV_LOG(NRV_CRIT, "Insert Failed : m_NRVTAVO_DriverParameterSettingData_map");
  NRV_LOG(NRV_DBG, "Exiting NRV_MethodWrapper::FCoEGetDriverParam()");
  return 0;
}

}  // namespace cimple
