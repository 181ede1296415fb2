#include "data/NRV_Port.h"

#include <exception>
#include <stdexcept>

#include "access/RM_Api.h"
#include "data/NRV_Adapter.h"
#include "data/NRV_DataLog.h"
#include "data/NRV_HbaHandle.h"
#include "data/NRV_TargetMapping.h"

namespace cimple {

struct PortKind {
  const char* constructed;        // logged when a port of the kind is built
  const char* rescanEntry;        // logged by rescanTargets
  bool scansTargets;              // FC and FCoE ports have targets
  const char* statisticsError;    // null: statistics are not read (NIC)
  const char* statisticsDeleteError;
  const char* attributesDeleteError;
  uint16_t secondaryKey;          // attribute member behind getSecondaryName(); 0: none
  std::unique_ptr<PortStatistics> (*makeStatistics)(const std::string& portName);
};

namespace {

template <class Statistics>
std::unique_ptr<PortStatistics> makeStatistics(const std::string& portName) {
  return std::make_unique<Statistics>(portName);
}

const PortKind kFCPortKind{
    "FC Port ", "FCPort::rescanTargets", true,
    "FC Port statistics error occurred,retain the old statistics !!!",
    "FC Port statistics deletion failed!!!", "FC Port attribute deletion failed!!!",
    RM_PA_PORT_NODE_WWN, makeStatistics<FCPortStatistics>};
const PortKind kNICPortKind{
    "NICPort::NICPort", "NICPort::rescanTargets", false, nullptr,
    "Port Statistics delete error !!!", "Port Attribute delete error!!!",
    0, makeStatistics<NICPortStatistics>};
const PortKind kiSCSIPortKind{
    "iSCSI Port ", "iSCSI::rescanTargets", false,
    "iSCSI Port statistics error occurred,retain the old statistics !!!",
    "Port Statistics delete error!!!", "Port Attribute delete error!!!",
    NRV_ATTR_INITIATOR_NAME, makeStatistics<iSCSIPortStatistics>};
const PortKind kFCoEPortKind{
    "FCoE Port ", "FCoEPort::rescanTargets", true,
    "FCoE Port statistics error occurred,retain the old statistics !!!",
    "Port Statistics delete error!!!", "Port Attribute delete error!!!",
    RM_PA_PORT_NODE_WWN, makeStatistics<FCoEPortStatistics>};

// Destroys one owned object; a failure is logged and the caller goes on.
template <class T>
void destroyLogged(std::unique_ptr<T>& object, const char* failure) {
  try {
    object.reset();
  } catch (...) {
    NRV_DATA_LOG(NRV_ERR, "%s", failure);
  }
}

}  // namespace

Port::Port(const PortKind& kind, Adapter& adapter, uint32_t index,
           const std::function<std::unique_ptr<PortAttributes>()>& readAttributes)
    : m_Kind(kind), m_PortIndex(index), m_Adapter(&adapter) {
  NRV_DATA_LOG(NRV_DBG, "%s", kind.constructed);
  m_Attributes = readAttributes();
  m_PortName = m_Attributes->getPortIdentifier();
  if (kind.secondaryKey != 0) m_SecondaryName = m_Attributes->text(kind.secondaryKey);
}

Port::~Port() {
  destroyLogged(m_Statistics, m_Kind.statisticsDeleteError);
  destroyLogged(m_Attributes, m_Kind.attributesDeleteError);
  NRV_DATA_LOG(NRV_DBG, "~Port");
  freeTargets();
}

void Port::freeTargets() {
  for (auto& target : m_Targets) {
    NRV_DATA_LOG(NRV_DBG, "Freeing Target: %s", target->getPortName().c_str());
    destroyLogged(target, "Target deletion failed !!!");
  }
  m_Targets.clear();
}

const PortAttributes* Port::getAttributes() const { return m_Attributes.get(); }

const PortStatistics* Port::getStatistics() {
  if (m_Kind.statisticsError == nullptr) return m_Statistics.get();
  try {
    m_Statistics = m_Kind.makeStatistics(m_PortName);
  } catch (const std::exception&) {
    NRV_DATA_LOG(NRV_ERR, "%s", m_Kind.statisticsError);
  }
  return m_Statistics.get();
}

Adapter* Port::getAdapter() const { return m_Adapter; }

void Port::rescanTargets(Adapter& adapter) {
  NRV_DATA_LOG(NRV_DBG, "%s", m_Kind.rescanEntry);
  if (!m_Kind.scansTargets) {
    NRV_DATA_LOG(NRV_DBG, "Nothing to do...");
    return;
  }
  freeTargets();
  m_Targets = scanTargets(adapter.getHbaApiName());
}

bool Port::scansTargets() const { return m_Kind.scansTargets; }

void Port::replaceTargets(std::vector<std::unique_ptr<Target>> targets) {
  freeTargets();
  m_Targets = std::move(targets);
}

std::vector<std::unique_ptr<Target>> Port::scanTargets(const std::string& hbaName) {
  std::vector<std::unique_ptr<Target>> targets;
  NRV_DATA_LOG(NRV_DBG, "TAVOadaptername:%s", hbaName.c_str());
  HbaAdapterHandle handle(hbaName);
  if (handle.get() == 0) {
    NRV_DATA_LOG(NRV_ERR, "HBA_OpenAdapter failed, skipping Adapter %s", hbaName.c_str());
    throw std::runtime_error("HBA_OpenAdapter failed");
  }
  std::unique_ptr<TargetMapping> mapping;
  const HBA_STATUS status = getFcpTargetMapping(handle.get(), mapping);
  const size_t entries = mapping ? mapping->size() : 0;
  NRV_DATA_LOG(NRV_DBG, "found target mappings:%d", static_cast<int>(entries));
  if (mapping && entries == 0) {
    NRV_DATA_LOG(NRV_DBG, "HBA_GetFcpTargetMapping_t() found no target mappings");
    mapping.reset();
  }
  if (status == HBA_STATUS_OK && entries > 0) {
    targets.reserve(entries);
    for (size_t i = 0; i < entries; ++i) {
      try {
        targets.push_back(std::make_unique<Target>(hbaName, mapping->entry(i)));
      } catch (...) {
        NRV_DATA_LOG(NRV_ERR, "target creation failed - moving to the next target");
      }
    }
  }
  NRV_DATA_LOG(NRV_DBG, "Number of targets:%d", static_cast<int>(targets.size()));
  return targets;
}

const std::vector<std::unique_ptr<Target>>& Port::getTargets() const { return m_Targets; }

Target* Port::getTarget(size_t index) const {
  if (index >= m_Targets.size()) throw std::exception();
  return m_Targets[index].get();
}

size_t Port::getNumberOfTargets() const { return m_Targets.size(); }

FCPort::FCPort(Adapter& adapter, uint32_t index, const std::string& identifierText,
               const RM_LOCAL_HBA_INFO_V4&)
    : Port(kFCPortKind, adapter, index,
           [&] { return std::make_unique<FCPortAttributes>(identifierText); }) {}

NICPort::NICPort(Adapter& adapter, uint32_t index, const std::string& identifierText,
                 const RM_LOCAL_HBA_INFO_V4& info)
    : Port(kNICPortKind, adapter, index,
           [&] { return std::make_unique<NICPortAttributes>(identifierText, info); }) {}

iSCSIPort::iSCSIPort(Adapter& adapter, uint32_t index, const std::string& identifierText,
                     const RM_LOCAL_HBA_INFO_V4&)
    : Port(kiSCSIPortKind, adapter, index,
           [&] { return std::make_unique<iSCSIPortAttributes>(identifierText); }) {}

FCoEPort::FCoEPort(Adapter& adapter, uint32_t index, const std::string& identifierText,
                   const RM_LOCAL_HBA_INFO_V4&)
    : Port(kFCoEPortKind, adapter, index,
           [&] { return std::make_unique<FCoEPortAttributes>(identifierText); }) {}

}  // namespace cimple
