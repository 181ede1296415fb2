#include "data/NRV_Adapter.h"

#include <stdexcept>

#include "access/NRV_Common.h"
#include "data/NRV_DataLog.h"
#include "data/NRV_HbaApiName.h"

namespace cimple {

struct AdapterKind {
  uint32_t type;
  const char* rescanEntry;        // logged by rescanTargets
  bool scansPorts;                // NIC adapters have no targets
  const char* statisticsError;    // destructor failure texts
  const char* attributesError;
  const char* portError;
  const char* portClearError;     // null: clearing the list is not guarded
};

namespace {

const AdapterKind kFCAdapterKind{kFCAdapterType, "FCAdapter::rescanTargets", true,
                                 "Adapter statistics delete failed",
                                 "Adapter attribute delete failed", "Error in port freeing",
                                 nullptr};
const AdapterKind kNICAdapterKind{kNICAdapterType, "NICAdapter::rescanTargets", false,
                                  "NIC Adapter statistics cleanup error",
                                  "NIC Adapter attribute cleanup error", "Port cleanup error",
                                  "Port clear error"};
const AdapterKind kiSCSIAdapterKind{kiSCSIAdapterType, "iSCSIAdapter::rescanTargets", true,
                                    "iSCSIAdapter _AdapterStatistics error",
                                    "iSCSIAdapter _AdapterAttributes error",
                                    "iSCSIAdapter Port cleanup error", nullptr};
const AdapterKind kFCoEAdapterKind{kFCoEAdapterType, "FCoEAdapter::rescanTargets", true,
                                   "FCoEAdapter _AdapterStatistics error",
                                   "FCoEAdapter _AdapterAttributes error",
                                   "FCoEAdapter Port cleanup error", nullptr};

// Runs one step of tearing down; a failure is logged and the caller goes on.
template <class Step>
void guarded(const char* failure, Step step) {
  try {
    step();
  } catch (...) {
    NRV_DATA_LOG(NRV_ERR, "%s", failure);
  }
}

}  // namespace

Adapter::Adapter(const AdapterKind& kind, const std::string& name, uint32_t number,
                 const RM_LOCAL_HBA_INFO_V4& info)
    : m_Kind(kind),
      m_AdapterName(name),
      m_AdapterNumber(number),
      m_AdapterType(kind.type),
      m_Identifier(info.wwpn) {
  NRV_DATA_LOG(NRV_DBG, "Adapter( adapterName[%s], adapterNumber[%d], adapterType[%d] )",
               m_AdapterName.c_str(), static_cast<int>(m_AdapterNumber),
               static_cast<int>(m_AdapterType));
  char text[kHbaNamePlainSize] = {};
  HBAName2string(m_Identifier, text);
  m_IdentifierText = text;
}

Adapter::~Adapter() {
  guarded(m_Kind.statisticsError, [&] { m_Statistics.reset(); });
  guarded(m_Kind.attributesError, [&] { m_Attributes.reset(); });
  for (auto& port : m_Ports) {
    NRV_DATA_LOG(NRV_DBG, "Freeing Port: %s", port->getPortName().c_str());
    guarded(m_Kind.portError, [&] { port.reset(); });
  }
  guarded(m_Kind.portClearError != nullptr ? m_Kind.portClearError : m_Kind.portError,
          [&] { m_Ports.clear(); });
  NRV_DATA_LOG(NRV_DBG, "~Adapter");
}

template <class Attributes, class Statistics, class PortType>
void Adapter::build(const RM_LOCAL_HBA_INFO_V4& info) {
  m_Attributes = std::make_unique<Attributes>(m_IdentifierText);
  m_Statistics = std::make_unique<Statistics>();
  const uint32_t ports = m_Attributes->getNumberOfPorts();
  for (uint32_t p = 0; p < ports; ++p) {
    try {
      m_Ports.push_back(std::make_unique<PortType>(*this, p, m_IdentifierText, info));
    } catch (...) {
      NRV_DATA_LOG(NRV_ERR, "Failed to fetch information for port: [%d] on adapter: [%s]",
                   static_cast<int>(p), m_AdapterName.c_str());
    }
  }
}

const std::string& Adapter::getAdapterName() const { return m_AdapterName; }
uint32_t Adapter::getAdapterNumber() const { return m_AdapterNumber; }
uint32_t Adapter::getReserved() const { return m_Reserved; }
const AdapterAttributes* Adapter::getAttributes() const { return m_Attributes.get(); }
const AdapterStatistics* Adapter::getStatistics() const { return m_Statistics.get(); }
size_t Adapter::getNumberOfPorts() const { return m_Ports.size(); }
const std::vector<std::unique_ptr<Port>>& Adapter::getPorts() const { return m_Ports; }

Port* Adapter::getPort(size_t index) const {
  if (index >= m_Ports.size()) throw std::out_of_range("vector::_M_range_check");
  return m_Ports[index].get();
}

void Adapter::rescanTargets() {
  NRV_DATA_LOG(NRV_DBG, "%s", m_Kind.rescanEntry);
  if (!m_Kind.scansPorts) {
    NRV_DATA_LOG(NRV_DBG, "Target Scanning for NICAdapter not supported");
    return;
  }
  for (auto& port : m_Ports) {
    try {
      port->rescanTargets(*this);
    } catch (...) {
      NRV_DATA_LOG(NRV_ERR, "Issue with Target Rescan - moving to the next Port");
    }
  }
}

NICAdapter::NICAdapter(const std::string& name, uint32_t number, const RM_LOCAL_HBA_INFO_V4& info)
    : Adapter(kNICAdapterKind, name, number, info) {
  build<NICAdapterAttributes, NICAdapterStatistics, NICPort>(info);
}

iSCSIAdapter::iSCSIAdapter(const std::string& name, uint32_t number,
                           const RM_LOCAL_HBA_INFO_V4& info)
    : Adapter(kiSCSIAdapterKind, name, number, info) {
  build<iSCSIAdapterAttributes, iSCSIAdapterStatistics, iSCSIPort>(info);
}

void Adapter::findHbaApiName(HbaApiNameIndex* names) {
  m_HbaApiName = names ? names->find(m_IdentifierText) : findHbaApiAdapterName(m_IdentifierText);
  NRV_DATA_LOG(NRV_DBG, "HBAAPI AdapterName:%s:RMAPI AdapterName%s", m_HbaApiName.c_str(),
               m_AdapterName.c_str());
}

// The FC and FCoE kinds first find their name in the HBA API, which target
// discovery opens.
FCoEAdapter::FCoEAdapter(const std::string& name, uint32_t number,
                         const RM_LOCAL_HBA_INFO_V4& info, HbaApiNameIndex* names)
    : Adapter(kFCoEAdapterKind, name, number, info) {
  findHbaApiName(names);
  build<FCoEAdapterAttributes, FCoEAdapterStatistics, FCoEPort>(info);
}

FCAdapter::FCAdapter(const std::string& name, uint32_t number, const RM_LOCAL_HBA_INFO_V4& info,
                     HbaApiNameIndex* names)
    : Adapter(kFCAdapterKind, name, number, info) {
  findHbaApiName(names);
  build<FCAdapterAttributes, FCAdapterStatistics, FCPort>(info);
}

}  // namespace cimple
