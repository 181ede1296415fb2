#include "agent/Status_Refresh.h"

#include <cstring>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "access/NRV_Common.h"
#include "access/NRV_MethodWrapper.h"
#include "access/RM_Api.h"
#include "agent/Catalogue_Values.h"
#include "agent/ProviderAgent.h"
#include "data/NRV_Adapter.h"
#include "data/NRV_Data.h"
#include "logging/Log.h"
#include "schema/Classes.h"

namespace cimple {

namespace {

// ---- the common frame --------------------------------------------------------

struct Refresh_Clock {
  const char* entry;
  const char* not_yet;
  uint64_t interval_usec;  // a pass is due when more time than this has passed
  Datetime last;           // zero interval until the first pass
};

enum Clock_Id { kEthernet, kFCoEPort, kFCoEStats, kBoard, kPhy, kDriver, kClockCount };

// Touched only under the agent's m_DataMutex.
Refresh_Clock g_clocks[kClockCount] = {
    {"PERF: UpdateEthernetPortStatus: Entry", "PERF: Refresh Not yet required", 9999999, {}},
    {"PERF: UpdateFCoEPortStatus: Entry", "PERF: Refresh Not yet required", 9999999, {}},
    {"Entering GetFCoEPortStats()", "GetFCoEPortStats() :Refresh Not yet required", 9999999, {}},
    {"UpdateBoardTemp(): Entry", "UpdateBoardTemp refresh Not yet required", 9999999, {}},
    {"UpdatePhyLinkDownReason(): Entry", "UpdatePhyLinkDownReason:Refresh Not yet required", 4999999, {}},
    {"Checking driver TimeOut...", "Refresh Not yet required", 4999999, {}},
};

// Logs the entry; true (and the clock set to now) when a pass is due.
bool pass_due(Clock_Id id) {
  Refresh_Clock& clock = g_clocks[id];
  NRV_LOG(NRV_DBG, "%s", clock.entry);
  const Datetime now = Datetime::now();
  if (now.usec() - clock.last.usec() <= clock.interval_usec) {
    NRV_LOG(NRV_DBG, "%s", clock.not_yet);
    return false;
  }
  clock.last = now;
  return true;
}

// ---- attribute blobs ---------------------------------------------------------

using Blob_Read = RM_STATUS (*)(HBA_NAME, void*, HBA_UINT32*);

// One attribute blob of a port or adapter, read once.
class Attribute_Blob {
 public:
  Attribute_Blob(Blob_Read read, const HBA_NAME& name, HBA_UINT32 size) : bytes_(size) {
    HBA_UINT32 length = size;
    status_ = read(name, bytes_.data(), &length);
  }
  RM_STATUS status() const { return status_; }
  bool ok() const { return status_ == RM_STATUS_SUCCESS; }

  // The value of an integer attribute; logs `failure` (with the status) at
  // NRV_ERR when it cannot be read.
  std::optional<uint32_t> integer(uint16_t attribute, const char* failure) {
    const auto raw = value(attribute, failure);
    if (!raw) return std::nullopt;
    uint32_t v = 0;
    memcpy(&v, raw->data(), raw->size() < sizeof v ? raw->size() : sizeof v);
    return v;
  }
  std::optional<std::string> text(uint16_t attribute, const char* failure) {
    const auto raw = value(attribute, failure);
    if (!raw) return std::nullopt;
    return std::string(raw->data(), strnlen(raw->data(), raw->size()));
  }

 private:
  std::optional<std::string_view> value(uint16_t attribute, const char* failure) {
    HBA_UINT16 length = 0;
    HBA_UINT32 status = RM_STATUS_ERROR;
    const void* found = RM_GetAttributeValue(bytes_.data(), attribute, &length, &status);
    if (found == nullptr || status != RM_STATUS_SUCCESS) {
      NRV_LOG(NRV_ERR, failure, static_cast<int>(status));
      return std::nullopt;
    }
    return std::string_view(static_cast<const char*>(found), length);
  }

  std::vector<unsigned char> bytes_;
  RM_STATUS status_ = RM_STATUS_ERROR;
};

bool handle_of(const String& name, HBA_NAME& handle) {
  if (string2HBAName(&handle, name.c_str()) == 1) return true;
  NRV_LOG(NRV_ERR, "NRV_MethodWrapper::string2HBAName failed");
  return false;
}

// The OtherIdentifyingInfo entry paired with `description`, or null.
template <class I>
const String* identifying(const I& instance, const char* description) {
  const auto& names = instance.IdentifyingDescriptions.value;
  const auto& values = instance.OtherIdentifyingInfo.value;
  for (size_t i = 0; i < names.size() && i < values.size(); ++i)
    if (names[i] == description) return &values[i];
  return nullptr;
}

template <class C>
C* at(Instance_Map& map, size_t i) {
  return static_cast<C*>(map[i]);
}

template <class P>
void set_status(P* port, uint32_t state, bool fcoe) {
  const Port_Status status = port_status(state, fcoe);
  port->OperationalStatus.set({status.operational_status});
  port->StatusDescriptions.set({String(status.description)});
}

// The Ethernet port whose identifying entry `description` is `value`, or null.
const NRVTAVO_EthernetPort* port_with(Instance_Map& ports, const char* description, const String& value) {
  for (size_t p = 0; p < ports.size(); ++p) {
    const auto* port = at<NRVTAVO_EthernetPort>(ports, p);
    const String* entry = port ? identifying(*port, description) : nullptr;
    if (entry && *entry == value) return port;
  }
  return nullptr;
}

constexpr const char* kPortKey = "SerialNumber:PhysicalPortNumber";

struct Blob_Kind {
  Blob_Read read;
  HBA_UINT32 size;
  const char* failure;
};
constexpr Blob_Kind kAdapterBlob{RM_GetHBAAttributes, RM_HBA_ATTRIBUTES_SIZE, "ERROR: RM_GetHBAAttributes call failed (%d)"};
constexpr Blob_Kind kPortBlob{RM_GetPortAttributes, RM_PORT_ATTRIBUTES_SIZE, "ERROR: RM_GetPortAttributes call failed (%d)"};

// One integer attribute of the function behind `port`, from a fresh blob of
// `kind`; nullopt after logging what failed.
std::optional<uint32_t> function_attribute(const NRVTAVO_EthernetPort& port, const Blob_Kind& kind, uint16_t attribute,
                                           const char* failure) {
  HBA_NAME handle{};
  if (!handle_of(port.DeviceID.value, handle)) return std::nullopt;
  Attribute_Blob blob(kind.read, handle, kind.size);
  if (!blob.ok()) {
    NRV_LOG(NRV_ERR, kind.failure, static_cast<int>(blob.status()));
    return std::nullopt;
  }
  return blob.integer(attribute, failure);
}

// ---- Ethernet ports ------------------------------------------------------------

bool refresh_ethernet_port(NRVTAVO_EthernetPort* port) {
  NRV_LOG(NRV_DBG, "Fetching portstates for EthernetPort: %s", port->DeviceID.value.c_str());
  HBA_NAME handle{};
  if (!handle_of(port->DeviceID.value, handle)) return false;
  Attribute_Blob state(RM_GetPortState, handle, RM_PORT_ATTRIBUTES_SIZE);
  if (!state.ok()) {
    NRV_LOG(NRV_DBG, "RM_GetPortState failed, Proceeding with RM_GetPortAttributes");
    state = Attribute_Blob(RM_GetPortAttributes, handle, RM_PORT_ATTRIBUTES_SIZE);
    if (!state.ok()) {
      NRV_LOG(NRV_ERR, "RM_GetPortAttributes call failed (%d)\n", static_cast<int>(state.status()));
      return false;
    }
  }
  const auto port_state = state.integer(RM_PA_PORT_STATE, "ERROR: RM_GetttributeValue for PortState call failed (%d)");
  if (!port_state) return false;
  NRV_LOG(NRV_DBG, "NRV_MethodWrapper::PortState: %d", static_cast<int>(*port_state));
  set_status(port, *port_state, false);
  port->DetailedStatus.set(static_cast<uint16>(*port_state));
  const auto physical =
      state.integer(RM_PA_PHYSICAL_PORT_STATE, "ERROR: RM_GetttributeValue for PhysicalPortState call failed (%d)");
  if (!physical) return false;
  NRV_LOG(NRV_DBG, "NRV_MethodWrapper::PhyPortState: %d", static_cast<int>(*physical));
  port->EnabledState.set(enabled_state(*physical));
  NRV_LOG(NRV_DBG, "Updating port speeds.");
  if (*physical != 2) {
    port->Speed.set(0);
    port->PhysicalPortSpeed.set(0);
    port->FunctionalPortSpeed.set("Not Available");
  }
  return true;
}

// ---- FCoE adapters -------------------------------------------------------------

// Runs `each(port)` for every port of every FCoE adapter; false at the first
// port for which it answers false.
template <class F>
bool for_each_fcoe_port(ProviderAgent& agent, const char* skip_text, F&& each) {
  if (!agent.m_pData) return true;
  for (const auto& adapter : agent.m_pData->getAdapters()) {
    if (adapter->getAdapterType() != kFCoEAdapterType) {
      NRV_LOG(NRV_DBG, skip_text, adapter->getAdapterName().c_str());
      continue;
    }
    for (const auto& port : adapter->getPorts())
      if (!each(*port)) return false;
  }
  return true;
}

constexpr const char* kSkipFCoE = "Skippping Adapter [%s] since it is not an FCoE Adapter";

bool refresh_fc_port(NRVTAVO_FCPort* port, const Port& data_port) {
  HBA_NAME handle{};
  if (!handle_of(String(data_port.getPortName()), handle)) return false;
  Attribute_Blob attributes(RM_GetPortAttributes, handle, RM_PORT_ATTRIBUTES_SIZE);
  if (!attributes.ok()) {
    NRV_LOG(NRV_ERR, "RM_GetPortAttributes call failed (%d)\n", static_cast<int>(attributes.status()));
    return false;
  }
  const auto state = attributes.integer(RM_PA_PORT_STATE, "ERROR: RM_GetttributeValue for PortState call failed (%d)");
  if (!state) return false;
  set_status(port, *state, true);
  const auto type = attributes.integer(RM_PA_PORT_TYPE, "ERROR: RM_GetttributeValue for PortType call failed (%d)");
  if (!type) return false;
  const FC_Port_Type fc_type = fc_port_type(*type);
  port->PortType.set(fc_type.port_type);
  port->OtherPortType.set(fc_type.other);
  NRV_LOG(NRV_DBG, "Fetching Port Speeds.");
  const auto speed = attributes.integer(RM_PA_PORT_SPEED, "RM_GetttributeValue for PortSpeed call failed (%d)");
  port->Speed.set(speed ? speed_bps(*speed) : 0);
  const auto functional =
      attributes.text(RM_PA_FUNC_PORT_SPEED, "ERROR: RM_GetttributeValue for FunctionalPortSpeed call failed (%d)");
  if (!functional) return false;
  NRV_LOG(NRV_DBG, "FunctionalPortSpeed : [ %s ]", functional->c_str());
  return true;
}

// ---- FC port statistics -----------------------------------------------------------

struct Counter_Copy {
  Property<uint64> NRVTAVO_FCPortStatistics::*property;
  int counter;
  uint64_t factor;
  bool guarded;  // a counter the library did not deliver leaves the property alone
};

constexpr Counter_Copy kCounterCopies[] = {
    {&NRVTAVO_FCPortStatistics::PacketsTransmitted, 2, 1, false},
    {&NRVTAVO_FCPortStatistics::BytesTransmitted, 3, 4, false},
    {&NRVTAVO_FCPortStatistics::PacketsReceived, 4, 1, false},
    {&NRVTAVO_FCPortStatistics::BytesReceived, 5, 4, false},
    {&NRVTAVO_FCPortStatistics::LIPCount, 6, 1, false},
    {&NRVTAVO_FCPortStatistics::NOSCount, 7, 1, true},
    {&NRVTAVO_FCPortStatistics::ErrorFrames, 8, 1, false},
    {&NRVTAVO_FCPortStatistics::DumpedFrames, 9, 1, true},
    {&NRVTAVO_FCPortStatistics::LinkFailures, 10, 1, false},
    {&NRVTAVO_FCPortStatistics::LossOfSyncCounter, 11, 1, false},
    {&NRVTAVO_FCPortStatistics::LossOfSignalCounter, 12, 1, false},
    {&NRVTAVO_FCPortStatistics::PrimitiveSeqProtocolErrCount, 13, 1, false},
    {&NRVTAVO_FCPortStatistics::InvalidTransmissionWords, 14, 1, false},
    {&NRVTAVO_FCPortStatistics::CRCErrors, 15, 1, false},
    {&NRVTAVO_FCPortStatistics::TxSequences, 16, 1, false},
    {&NRVTAVO_FCPortStatistics::RxSequences, 17, 1, false},
    {&NRVTAVO_FCPortStatistics::ExCountOrig, 18, 1, false},
    {&NRVTAVO_FCPortStatistics::ExCountResp, 19, 1, false},
    {&NRVTAVO_FCPortStatistics::ActiveXRIs, 20, 1, false},
    {&NRVTAVO_FCPortStatistics::ActiveRPIs, 21, 1, false},
    {&NRVTAVO_FCPortStatistics::ElasticBufOverruns, 22, 1, false},
    {&NRVTAVO_FCPortStatistics::LinkTransitions, 23, 1, false},
    {&NRVTAVO_FCPortStatistics::PrimitiveSeqTimesouts, 24, 1, false},
    {&NRVTAVO_FCPortStatistics::ArbitrationTimeouts, 25, 1, false},
};

void copy_counters(NRVTAVO_FCPortStatistics* stats, const PortStatistics& counters) {
  for (const Counter_Copy& c : kCounterCopies) {
    const uint64_t value = counters.counter(c.counter);
    if (c.guarded && value >= kStatisticNotAvailable) continue;
    (stats->*c.property).set(value * c.factor);
  }
  stats->StatisticTime.set(Datetime::now());
}

// ---- driver parameters --------------------------------------------------------------

std::string field_text(const char* field, size_t size) { return std::string(field, strnlen(field, size)); }

// Rewrites Value of the current-value instances of `records` whose InstanceID
// is `prefix` followed by the parameter's name.
void update_current_values(Instance_Map& map, const std::vector<RM_DRIVER_PARAM>& records, const std::string& prefix) {
  for (const RM_DRIVER_PARAM& record : records) {
    const std::string id = prefix + field_text(record.name, sizeof record.name);
    for (size_t i = 0; i < map.size(); ++i) {
      auto* setting = at<NRVTAVO_DriverParameterSettingData>(map, i);
      if (setting && setting->InstanceID.value == id.c_str()) setting->Value.set(record.currentValue);
    }
  }
}

bool refresh_driver_parameters(ProviderAgent& agent, const Port& port, bool global) {
  HBA_NAME handle{};
  if (!handle_of(String(port.getPortName()), handle)) return false;
  std::vector<RM_DRIVER_PARAM> records;
  const RM_STATUS status = NRV_MethodWrapper::ReadDriverParams(handle, global, records);
  if (global) {
    NRV_LOG(NRV_DBG, "RM_GetDriverParamsGlobal: status=%d", static_cast<int>(status));
    NRV_LOG(NRV_DBG, "number of driver parameters %d", static_cast<int>(records.size()));
  } else {
    NRV_LOG(NRV_DBG, "RM_GetDriverParams: status=%d", static_cast<int>(status));
  }
  if (status != RM_STATUS_SUCCESS) {
    if (!global) NRV_LOG(NRV_ERR, "RM_GetDriverParams:failed");
    NRV_LOG(NRV_ERR, global ? "Found issue with Global Driver Refresh" : "Found issue with local Driver Refresh");
    return false;
  }
  update_current_values(agent.m_NRVTAVO_DriverParameterSettingData_map, records,
                        global ? "NRV:FCoE Current Global Driver Parameter:"
                               : "NRV:FCoE Current Local Driver Parameter:" + port.getPortName() + ":");
  return true;
}

}  // namespace

void resetStatusRefreshTimes() {
  for (Refresh_Clock& clock : g_clocks) clock.last = Datetime();
}

void UpdateEthernetPortStatus(ProviderAgent& agent) {
  if (!pass_due(kEthernet)) return;
  Instance_Map& ports = agent.m_NRVTAVO_EthernetPort_map;
  for (size_t i = 0; i < ports.size(); ++i) {
    auto* port = at<NRVTAVO_EthernetPort>(ports, i);
    if (port == nullptr || port->SRIOVState.value == 3) continue;
    if (!refresh_ethernet_port(port)) {
      NRV_LOG(NRV_ERR, "Error occurred while retrieving NicPort status...");
      NRV_LOG(NRV_ERR, "Error getting Nic Port status");
      return;
    }
  }
}

void UpdateFCoEPortStatus(ProviderAgent& agent) {
  if (!pass_due(kFCoEPort)) return;
  NRV_LOG(NRV_DBG, "PERF: update driver map");
  Instance_Map& ports = agent.m_NRVTAVO_FCPort_map;
  const bool ok = for_each_fcoe_port(agent, kSkipFCoE, [&](const Port& data_port) {
    for (size_t i = 0; i < ports.size(); ++i) {
      auto* port = at<NRVTAVO_FCPort>(ports, i);
      if (port && port->DeviceID.value == data_port.getPortName().c_str()) return refresh_fc_port(port, data_port);
    }
    return true;  // a port the catalogue does not hold
  });
  if (!ok) {
    NRV_LOG(NRV_ERR, "Error occurred while retrieving FCoEPort status...");
    NRV_LOG(NRV_ERR, "Error getting FCoE Port status");
  }
}

void GetFCoEPortStats(ProviderAgent& agent) {
  if (!pass_due(kFCoEStats)) return;
  Instance_Map& statistics = agent.m_NRVTAVO_FCPortStatistics_map;
  NRV_LOG(NRV_DBG, "GetFCoEPortStats(): Update");
  const bool ok = for_each_fcoe_port(agent, kSkipFCoE, [&](Port& port) {
    NRVTAVO_FCPortStatistics* stats = nullptr;
    for (size_t i = 0; i < statistics.size() && stats == nullptr; ++i) {
      auto* candidate = at<NRVTAVO_FCPortStatistics>(statistics, i);
      if (candidate && candidate->InstanceID.value.view().find(port.getPortName()) != std::string_view::npos)
        stats = candidate;
    }
    if (stats == nullptr) return true;
    const PortStatistics* counters = port.getStatistics();
    if (counters == nullptr) return false;
    copy_counters(stats, *counters);
    NRV_LOG(NRV_DBG, "PERF: GetFCoEPortStats: cleanExit");
    return true;
  });
  if (!ok) {
    NRV_LOG(NRV_ERR, "Error occurred while retrieving FCoEPort Statistics...");
    NRV_LOG(NRV_ERR, "Error getting FCoE Port statistics");
  }
}

void UpdateBoardTemp(ProviderAgent& agent) {
  if (!pass_due(kBoard)) return;
  NRV_LOG(NRV_DBG, "PERF: UpdateBoardTemp");
  Instance_Map& cards = agent.m_NRVTAVO_Card_map;
  for (size_t c = 0; c < cards.size(); ++c) {
    auto* card = at<NRVTAVO_Card>(cards, c);
    const NRVTAVO_EthernetPort* port =
        card ? port_with(agent.m_NRVTAVO_EthernetPort_map, "SerialNumber", card->SerialNumber.value) : nullptr;
    if (port == nullptr) continue;  // the card keeps its value
    const auto temperature = function_attribute(*port, kAdapterBlob, RM_HA_BOARD_TEMPERATURE,
                                                "ERROR: RM_GetttributeValue for _BoardTemperature call failed (%d)");
    if (!temperature) {
      NRV_LOG(NRV_ERR, "Error Updating Borad Temperature");
      return;
    }
    card->BoardTemperature.set(static_cast<sint32>(*temperature & 0xff));
    NRV_LOG(NRV_DBG, "UpdateBoardTemp(): Successful");
  }
}

void UpdatePhyLinkDownReason(ProviderAgent& agent) {
  if (!pass_due(kPhy)) return;
  Instance_Map& controllers = agent.m_NRVTAVO_PortController_map;
  for (size_t c = 0; c < controllers.size(); ++c) {
    auto* controller = at<NRVTAVO_PortController>(controllers, c);
    const String* key = controller ? identifying(*controller, kPortKey) : nullptr;
    // The key names a physical port, not a function: the library is asked
    // through the first Ethernet function on that port.
    const NRVTAVO_EthernetPort* port = key ? port_with(agent.m_NRVTAVO_EthernetPort_map, kPortKey, *key) : nullptr;
    if (port == nullptr) continue;  // the controller keeps its value
    const auto reason = function_attribute(*port, kPortBlob, RM_PA_PHY_LINK_DOWN_REASON,
                                           "ERROR: RM_GetttributeValue for _PhyLinkDownReason call failed (%d)");
    if (!reason) {
      NRV_LOG(NRV_ERR, "Error Updating Physical Link Down Reason");
      return;
    }
    controller->PhyLinkDownReason.set(*reason);
  }
  NRV_LOG(NRV_DBG, "UpdatePhyLinkDownReason(): Successful");
}

void UpdateDriverParameters(ProviderAgent& agent) {
  if (!pass_due(kDriver)) return;
  bool global_done = false;
  for_each_fcoe_port(agent, "Skippping Adapter [%s] -- not an FCoE Adapter", [&](const Port& port) {
    if (!global_done) global_done = refresh_driver_parameters(agent, port, true);
    return refresh_driver_parameters(agent, port, false);
  });
}

}  // namespace cimple
