// The dump-service catalogue and the extended FAT dump settings of each chip.
#include "access/NRV_Dump.h"

#include <strings.h>

#include <cstring>
#include <optional>
#include <vector>

#include "access/NRV_Common.h"
#include "access/NRV_MethodWrapper.h"
#include "logging/Log.h"
#include "schema/CIM_ComputerSystem.h"
#include "schema/NRVTAVO_Card.h"
#include "schema/NRVTAVO_Chip.h"
#include "schema/NRVTAVO_DownEthernetPort.h"
#include "schema/NRVTAVO_DumpService.h"
#include "schema/NRVTAVO_DumpServiceAffectsElement.h"
#include "schema/NRVTAVO_ElementExtFATDumpAdvancedData.h"
#include "schema/NRVTAVO_ElementExtFATDumpData.h"
#include "schema/NRVTAVO_EthernetPort.h"
#include "schema/NRVTAVO_ExtFATDumpAdvancedData.h"
#include "schema/NRVTAVO_ExtFATDumpData.h"
#include "schema/NRVTAVO_FCPort.h"
#include "schema/NRVTAVO_HostedDumpService.h"

namespace cimple {

namespace {

constexpr const char* kServiceName = "NRVTAVO_DumpService";
constexpr const char* kChipPortText = "SerialNumber + Sub-AdapterID";

// Level names by library number; index 0 is no level.
constexpr const char* kTraceLevels[] = {"",     "disable", "all",     "enterfunction", "verbose", "info",
                                        "test", "show",    "warning", "error",         "fatal",   "always"};
constexpr const char* kModeNames[RM_EVENT_LOG_MODE_COUNT] = {"ram", "uart", "nvram", "tftp"};

// What the library needs to know about a chip's adapter.
struct Chip_Port {
  std::string deviceId;
  std::string mac;
};

template <class Port>
const Port* portOfChip(const Instance_Map& ports, const std::string& tag) {
  return findIn<Port>(ports, [&](const Port& p) { return identifyingInfo(p, kChipPortText) == tag; });
}

std::optional<Chip_Port> chipPort(NRV_Catalogue& catalogue, const std::string& tag) {
  if (const auto* port = portOfChip<NRVTAVO_EthernetPort>(catalogue.of<NRVTAVO_EthernetPort>(), tag))
    return Chip_Port{textOf(port->DeviceID), textOf(port->PermanentAddress)};
  if (const auto* port = portOfChip<NRVTAVO_FCPort>(catalogue.of<NRVTAVO_FCPort>(), tag))
    return Chip_Port{textOf(port->DeviceID), identifyingInfo(*port, "NORVANE:IEEE_ADDRESS")};
  return std::nullopt;
}

// The modules of an event-log configuration record; only whole records
// inside the bytes delivered are read, whatever the count claims.
std::vector<RM_EVENT_LOG_MODULE> eventLogModules(const std::vector<uint8_t>& record) {
  std::vector<RM_EVENT_LOG_MODULE> modules;
  if (record.size() < sizeof(RM_EVENT_LOG_CONFIG_HEADER)) return modules;
  RM_EVENT_LOG_CONFIG_HEADER header{};
  std::memcpy(&header, record.data(), sizeof header);
  const size_t room = (record.size() - sizeof header) / sizeof(RM_EVENT_LOG_MODULE);
  modules.resize(header.count < room ? header.count : room);
  if (!modules.empty())
    std::memcpy(modules.data(), record.data() + sizeof header, modules.size() * sizeof(RM_EVENT_LOG_MODULE));
  return modules;
}

NRVTAVO_ExtFATDumpAdvancedData* advancedData(const std::string& chipTag, const RM_EVENT_LOG_MODULE& module) {
  const std::string name(module.name, strnlen(module.name, sizeof module.name));
  auto* data = makeInstance<NRVTAVO_ExtFATDumpAdvancedData>();
  data->InstanceID.set(String("NRV:TAVO ExtFATDumpAdvancedData:" + chipTag + ":" + name));
  data->ElementName.set(String(name));
  data->Description.set(String(name));
  Array<String> modes, levels;
  Array<uint32> portMasks, functionMasks;
  for (size_t m = 0; m < RM_EVENT_LOG_MODE_COUNT; ++m) {
    if ((module.modeFlags & (1u << m)) == 0) continue;
    const RM_EVENT_LOG_MODE_SETTING& setting = module.modes[m];
    std::string level = NRV_Dump::TraceLevelName(setting.traceLevel);
    if (level.empty()) level = std::to_string(setting.traceLevel);
    modes.append(kModeNames[m]);
    levels.append(String(level));
    portMasks.append(setting.portMask);
    functionMasks.append(setting.pciFuncMask);
  }
  data->Modes.set(modes);
  data->TraceLevel.set(levels);
  data->PortMask.set(portMasks);
  data->PCIFuncMask.set(functionMasks);
  return data;
}

}  // namespace

NRV_Dump::NRV_Dump(NRV_Catalogue& catalogue) : m_Catalogue(catalogue) { NRV_LOG(NRV_DBG, "NRV_Dump constructor"); }

NRV_Dump::~NRV_Dump() { NRV_LOG(NRV_DBG, "NRV_Dump destructor"); }

uint32_t NRV_Dump::TraceLevelFromName(const std::string& name, uint32_t& level) {
  if (name.size() <= 50)
    for (uint32_t i = 1; i < std::size(kTraceLevels); ++i)
      if (strcasecmp(name.c_str(), kTraceLevels[i]) == 0) {
        level = i;
        return 0;
      }
  level = 99;
  return kNrvNotFound;
}

std::string NRV_Dump::TraceLevelName(uint32_t level) {
  return level >= 1 && level < std::size(kTraceLevels) ? kTraceLevels[level] : "";
}

void NRV_Dump::ClearDumpServiceClasses(uint32_t kind) {
  if (kind & kDumpService) {
    m_Catalogue.of<NRVTAVO_DumpServiceAffectsElement>().clear();
    m_Catalogue.of<NRVTAVO_HostedDumpService>().clear();
    m_Catalogue.of<NRVTAVO_DumpService>().clear();
  }
  if (kind & kExtFATSettings) {
    m_Catalogue.of<NRVTAVO_ElementExtFATDumpData>().clear();
    m_Catalogue.of<NRVTAVO_ExtFATDumpData>().clear();
    m_Catalogue.of<NRVTAVO_ElementExtFATDumpAdvancedData>().clear();
    m_Catalogue.of<NRVTAVO_ExtFATDumpAdvancedData>().clear();
  }
}

Instance* NRV_Dump::ensureService() {
  Instance_Map& services = m_Catalogue.of<NRVTAVO_DumpService>();
  if (auto* existing = findIn<NRVTAVO_DumpService>(
          services, [](const NRVTAVO_DumpService& s) { return textOf(s.Name) == kServiceName; }))
    return existing;
  const auto* host = static_cast<const CIM_ComputerSystem*>(m_Catalogue.hostSystem());
  if (host == nullptr) {
    NRV_LOG(NRV_ERR, "Failed to create NRVTAVO_DumpService");
    return nullptr;
  }
  auto* service = makeInstance<NRVTAVO_DumpService>();
  service->SystemCreationClassName.set(host->CreationClassName.value);
  service->SystemName.set(host->Name.value);
  service->CreationClassName.set(kServiceName);
  service->Name.set(kServiceName);
  if (!m_Catalogue.insert(service)) {
    NRV_LOG(NRV_CRIT, "Insert Failed : m_NRVTAVO_DumpService_map");
    return nullptr;
  }
  auto* hosted = makeAssociation<NRVTAVO_HostedDumpService>(host, service);
  if (hosted == nullptr)
    NRV_LOG(NRV_ERR, "Failed to create NRVTAVO_HostedDumpService");
  else if (!m_Catalogue.insert(hosted))
    NRV_LOG(NRV_CRIT, "Insert Failed : m_NRVTAVO_HostedDumpService_map");
  return service;
}

void NRV_Dump::CreateDumpServiceClasses() {
  NRV_LOG(NRV_DBG, "NRV_Dump::CreateDumpServiceClasses");
  const Instance_Map& chips = m_Catalogue.of<NRVTAVO_Chip>();
  const bool haveChips = !m_Catalogue.of<NRVTAVO_Card>().empty() && !chips.empty();
  const bool haveDownPorts = !m_Catalogue.of<NRVTAVO_DownEthernetPort>().empty();
  if (!haveChips && !haveDownPorts) {
    NRV_LOG(NRV_DBG, "Unable to create the TAVO Dump service, No Card/Logical Port exist");
    return;
  }
  if (haveChips) {
    const Instance* service = nullptr;
    for (size_t i = 0; i < chips.size(); ++i) {
      if (service == nullptr && (service = ensureService()) == nullptr) break;
      auto* affects = makeAssociation<NRVTAVO_DumpServiceAffectsElement>(chips[i], service);
      if (affects == nullptr)
        NRV_LOG(NRV_ERR, "Failed to create NRVTAVO_DumpServiceAffectsElement");
      else if (!m_Catalogue.insert(affects))
        NRV_LOG(NRV_CRIT, "Insert Failed : m_NRVTAVO_DumpServiceAffectsElement_map");
    }
  } else {
    NRV_LOG(NRV_DBG, " Inside Creating DumpService for DownEthernetPort ");
    NRV_LOG(NRV_DBG, "RetrieveDownNICPorts. ");
    std::vector<std::string> dead;
    const RM_STATUS status = NRV_MethodWrapper::GetDeadNICPorts(dead);
    if (status != RM_STATUS_SUCCESS) {
      // Without the library's list of dead ports no dump of one can be taken.
      NRV_LOG(NRV_ERR, "CreateDumpServiceClasses::Failure In Getting Dead NIC Ports. Rm Error: [ %d ]",
              static_cast<int>(status));
    } else {
      NRV_LOG(NRV_DBG, "Creating dump service for DownEthernetPort ");
      ensureService();
    }
  }
  ClearDumpServiceClasses(kExtFATSettings);
  if (CreateExtFATDumpSettingClasses() != 0)
    NRV_LOG(NRV_DBG, "Failed to create the Enhanced FAT Dump Setting classes for TAVO Card");
}

uint32_t NRV_Dump::CreateExtFATDumpSettingClasses() {
  NRV_LOG(NRV_DBG, "NRV_Dump::CreateExtFATDumpSettingClasses");
  const Instance_Map& chips = m_Catalogue.of<NRVTAVO_Chip>();
  if (m_Catalogue.of<NRVTAVO_DumpService>().empty() || chips.empty()) {
    NRV_LOG(NRV_DBG, "Dump Service/Chip class not exist, Cannot continue further");
    return kNrvFailure;
  }
  uint32_t result = 0;
  for (size_t i = 0; i < chips.size(); ++i) {
    const auto* chip = static_cast<const NRVTAVO_Chip*>(chips[i]);
    const std::string tag = textOf(chip->Tag);
    const std::optional<Chip_Port> port = chipPort(m_Catalogue, tag);
    HBA_NAME name{};
    if (!deviceIdToHBAName(port ? port->deviceId.c_str() : nullptr, name,
                           "CreateExtFATDumpSettingClasses::Id2HBAName failed",
                           "CreateExtFATDumpSettingClasses::str2HBAName failed"))
      continue;
    std::vector<uint8_t> record;
    const RM_STATUS status = NRV_MethodWrapper::GetExtFATAdvancedData(name, record);
    if (status != RM_STATUS_SUCCESS) {
      NRV_LOG(NRV_ERR, "Failed to get the ExtFATDump settings for chip : %s , exited with the error code %d ",
              tag.c_str(), static_cast<int>(status));
      record.clear();
      result = kNrvNotFound;
    }
    std::string directory;
    const bool haveDirectory = NRV_MethodWrapper::nrvcimGetDumpDirectory(name, directory) == RM_STATUS_SUCCESS;
    if (!haveDirectory) NRV_LOG(NRV_ERR, "Failed to get the Dump Directory");
    HBA_UINT32 retention = 0;
    const bool haveRetention = NRV_MethodWrapper::nrvcimGetRetentionCount(name, retention) == RM_STATUS_SUCCESS;
    if (!haveRetention) NRV_LOG(NRV_ERR, "Failed to get the Retention Count");
    if (port->mac.empty()) {
      NRV_LOG(NRV_DBG, "Unable to get the Mac address for chip %s, Skipping ExtFATDump service creation",
              tag.c_str());
      continue;
    }

    auto* data = makeInstance<NRVTAVO_ExtFATDumpData>();
    data->InstanceID.set(String("NRV:TAVO ExtFATDumpData:" + tag));
    if (haveRetention) data->RetentionCount.set(retention);
    if (haveDirectory) data->DumpDirectory.set(String(directory));
    if (!m_Catalogue.insert(data)) {
      NRV_LOG(NRV_CRIT, "Insert Failed : m_NRVTAVO_ExtFATDumpData_map");
      result = kNrvFailure;
    } else if (auto* link = makeAssociation<NRVTAVO_ElementExtFATDumpData>(chip, data)) {
      link->IsCurrent.set(1);
      if (!m_Catalogue.insert(link)) {
        NRV_LOG(NRV_CRIT, "Insert Failed : m_NRVTAVO_ElementExtFATDumpData_map");
        result = kNrvFailure;
      }
    }

    for (const RM_EVENT_LOG_MODULE& module : eventLogModules(record)) {
      auto* advanced = advancedData(tag, module);
      if (!m_Catalogue.insert(advanced)) {
        NRV_LOG(NRV_CRIT, "Insert Failed : m_NRVTAVO_ExtFATDumpAdvancedData_map");
        result = kNrvFailure;
        continue;
      }
      auto* link = makeAssociation<NRVTAVO_ElementExtFATDumpAdvancedData>(chip, advanced);
      if (link == nullptr) {
        NRV_LOG(NRV_ERR, "Failed to create NRVTAVO_ElementExtFATDumpAdvancedData");
      } else if (!m_Catalogue.insert(link)) {
        NRV_LOG(NRV_CRIT, "Insert Failed : m_NRVTAVO_ElementExtFATDumpAdvancedData_map");
        result = kNrvFailure;
      }
    }
  }
  return result;
}

}  // namespace cimple
