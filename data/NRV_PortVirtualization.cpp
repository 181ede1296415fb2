// Resource pools and virtual FC ports from the library's virtual-port lists.
#include "data/NRV_PortVirtualization.h"

#include <cstring>
#include <string>
#include <vector>

#include "access/NRV_Common.h"
#include "access/NRV_MethodWrapper.h"
#include "logging/Log.h"
#include "schema/CIM_ComputerSystem.h"
#include "schema/NRVTAVO_ElementAllocatedFromPool.h"
#include "schema/NRVTAVO_FCPort.h"
#include "schema/NRVTAVO_HostedResourcePool.h"
#include "schema/NRVTAVO_ResourcePool.h"
#include "schema/NRVTAVO_VMSystemDevice.h"
#include "schema/NRVTAVO_VPortHostedDependency.h"
#include "schema/NRVTAVO_VirtualFCPort.h"

namespace cimple {

namespace {

constexpr uint16_t kFcResourceType = 10;

// Converts a port's identifier text into `name`; false (the failure logged
// at `level`) when it does not convert.
bool toName(const std::string& id, HBA_NAME& name, int level) {
  return deviceIdToHBAName(id.c_str(), name,
                           "NRVTAVO_PortVirtualization::CreatePortVirtualizationClasses::Id2HBAName failed",
                           "NRVTAVO_PortVirtualization::CreatePortVirtualizationClasses::str2HBAName failed", level);
}

std::string plain(const HBA_NAME& name) {
  char text[kHbaNamePlainSize] = {};
  return HBAName2string(name, text);
}

// The symbolic name out of a virtual port's attribute record; "" when the
// record is too short to hold it.
std::string vportName(const std::vector<uint8_t>& record) {
  if (record.size() < sizeof(RM_VPORT_ATTRIBUTES)) return {};
  RM_VPORT_ATTRIBUTES attributes;
  std::memcpy(&attributes, record.data(), sizeof attributes);
  return std::string(attributes.name, strnlen(attributes.name, sizeof attributes.name));
}

// Inserts `instance`, logging `done` or, at NRV_CRIT, `refused`.
bool insertLogged(NRV_Catalogue& catalogue, Instance* instance, const char* done, const char* refused) {
  if (!catalogue.insert(instance)) {
    NRV_LOG(NRV_CRIT, "%s", refused);
    return false;
  }
  NRV_LOG(NRV_DBG, "%s", done);
  return true;
}

}  // namespace

NRV_PortVirtualization::NRV_PortVirtualization(NRV_Catalogue& catalogue) : m_Catalogue(catalogue) {
  NRV_LOG(NRV_DBG, "NRV_PortVirtualization::Constructor");
}

NRV_PortVirtualization::~NRV_PortVirtualization() { NRV_LOG(NRV_DBG, "NRV_PortVirtualization::Destructor"); }

void NRV_PortVirtualization::ClearPortVirtualizationMaps() {
  NRV_LOG(NRV_DBG, "ClearPortVirtualizationMaps for FCoE invoked");
  m_Catalogue.of<NRVTAVO_ResourcePool>().clear();
  m_Catalogue.of<NRVTAVO_ElementAllocatedFromPool>().clear();
  m_Catalogue.of<NRVTAVO_HostedResourcePool>().clear();
  m_Catalogue.of<NRVTAVO_VirtualFCPort>().clear();
  m_Catalogue.of<NRVTAVO_VMSystemDevice>().clear();
  m_Catalogue.of<NRVTAVO_VPortHostedDependency>().clear();
  NRV_LOG(NRV_DBG, "Exiting ClearPortVirtualizationMaps ");
}

uint32_t NRV_PortVirtualization::CreatePortVirtualizationClasses() {
  NRV_LOG(NRV_DBG, "NRV_PortVirtualization::CreatePortVirtualizationClasses");
  ClearPortVirtualizationMaps();
  const Instance_Map& ports = m_Catalogue.of<NRVTAVO_FCPort>();
  if (ports.empty()) {
    NRV_LOG(NRV_ERR, "Unable to create the Port Virtualization classes, No Physical Port(FCoE) exists");
    return kNoPhysicalPort;
  }
  NRV_LOG(NRV_DBG, "No of FC Ports: %d", static_cast<int>(ports.size()));
  uint32_t status = 0;
  for (size_t i = 0; i < ports.size(); ++i) {
    const uint32_t result = createForPort(*ports[i]);
    if (result == kListingFailed) {
      status = result;
    } else if (result != 0) {
      return result;
    }
  }
  return status;
}

uint32_t NRV_PortVirtualization::createForPort(const Instance& instance) {
  const auto& fcPort = static_cast<const NRVTAVO_FCPort&>(instance);
  const std::string id = textOf(fcPort.DeviceID);
  NRV_LOG(NRV_DBG, "FC Port ID: %s", id.c_str());
  HBA_NAME name{};
  if (!toName(id, name, NRV_ERR)) return kNrvFailure;
  std::vector<RM_VPORT_ENTRY> vports;
  const RM_STATUS listed = NRV_MethodWrapper::ListVPorts(name, vports);
  if (listed != RM_STATUS_SUCCESS) {
    NRV_LOG(NRV_ERR, "NRVTAVO_PortVirtualization::Failure in listing vports for port: %s, Rm Error: %d", id.c_str(),
            static_cast<int>(listed));
    return kListingFailed;
  }
  if (vports.empty()) {
    NRV_LOG(NRV_DBG, "Need not create any resource pools since no vports exist for FCport: %s", id.c_str());
    return 0;
  }
  NRV_LOG(NRV_DBG, "No of vports:%d for %s", static_cast<int>(vports.size()), id.c_str());
  const auto* host = static_cast<const CIM_ComputerSystem*>(m_Catalogue.hostSystem());

  NRV_LOG(NRV_DBG, "Creating Resource pool ");
  auto* pool = makeInstance<NRVTAVO_ResourcePool>();
  const String poolId("NRV:Resource Pool:" + id);
  pool->InstanceID.set(poolId);
  pool->ElementName.set(poolId);
  pool->PoolID.set(poolId);
  pool->Primordial.set(false);
  pool->Capacity.set(vports.size());
  pool->Reserved.set(0);
  pool->ResourceType.set(kFcResourceType);
  if (!insertLogged(m_Catalogue, pool, "Resource Pool created and inserted in map",
                    "Insert Failed : m_NRVTAVO_ResourcePool_map"))
    return kNrvFailure;

  NRV_LOG(NRV_DBG, "Creating HostedResource pool ");
  auto* hosted = makeAssociation<NRVTAVO_HostedResourcePool>(host, pool);
  if (hosted == nullptr) {
    NRV_LOG(NRV_CRIT, "Failed to create HostedResourcePool");
    return kCreateFailed;
  }
  if (!insertLogged(m_Catalogue, hosted, "HostedResource Pool created and inserted in map",
                    "Insert Failed : m_NRVTAVO_HostedResourcePool_map"))
    return kNrvFailure;

  uint32_t status = 0;
  for (const RM_VPORT_ENTRY& entry : vports) {
    const std::string portName = plain(entry.portName);
    const std::string nodeName = plain(entry.nodeName);
    NRV_LOG(NRV_DBG, "VPort Id :%s Node name: %s", portName.c_str(), nodeName.c_str());
    HBA_NAME vportHandle{};
    if (!toName(portName, vportHandle, NRV_DBG)) return kNrvFailure;
    std::vector<uint8_t> attributes;
    const RM_STATUS read = NRV_MethodWrapper::ListVPortAttributes(name, vportHandle, attributes);
    if (read != RM_STATUS_SUCCESS) {
      NRV_LOG(NRV_DBG, "NRVTAVO_PortVirtualization::Failure in listing vports information for port: %s, Rm Error: %d",
              portName.c_str(), static_cast<int>(read));
      status = kListingFailed;
    }
    if (host == nullptr) {
      NRV_LOG(NRV_CRIT, "Failed to create VirtualFCPort");
      return kCreateFailed;
    }
    auto* vport = makeInstance<NRVTAVO_VirtualFCPort>();
    vport->SystemCreationClassName.set(host->CreationClassName.value);
    vport->SystemName.set(host->Name.value);
    vport->CreationClassName.set("NRV_VirtualFCPort");
    vport->Name.set(String(portName));
    vport->DeviceID.set(String(portName));
    vport->NodeWWN.set(String(nodeName));
    vport->PortFCId.set(entry.fcId);
    if (read == RM_STATUS_SUCCESS) vport->VPortName.set(String(vportName(attributes)));
    if (!insertLogged(m_Catalogue, vport, "Created VirtualFCPort and inserted in map",
                      "Insert Failed : m_NRVTAVO_VirtualFCPort_map"))
      return kNrvFailure;
    if (!insertLogged(m_Catalogue, makeAssociation<NRVTAVO_VPortHostedDependency>(&fcPort, vport),
                      "VPortHostedDependency created and inserted in map",
                      "Insert Failed : m_NRVTAVO_VPortHostedDependency_map") ||
        !insertLogged(m_Catalogue, makeAssociation<NRVTAVO_ElementAllocatedFromPool>(pool, vport),
                      "ElementAllocatedFromPool created and inserted in map",
                      "Insert Failed : m_NRVTAVO_ElementAllocatedFromPool_map"))
      return kNrvFailure;
  }
  NRV_LOG(NRV_DBG, "Freeing VPList");
  return status;
}

}  // namespace cimple
