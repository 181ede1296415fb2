// The driver-log readers: the lines of the system log that name a driver,
// newest first, into that driver's bounded holder.
#include <fstream>
#include <string>
#include <vector>

#include "logging/NRV_SystemPaths.h"
#include "agent/ProviderAgent.h"
#include "logging/Log.h"

namespace cimple {

void ProviderAgent::readDriverEvents(const char* tag, DeviceLog& holder) {
  NRV_LOG(NRV_DBG, "Reading Events for %s", tag);
  std::ifstream messages(system_path(kNrvSystemLogFile));
  std::vector<std::string> kept;
  for (std::string line; std::getline(messages, line);)
    if (line.find(tag) != std::string::npos) kept.push_back(line);
  for (auto it = kept.rbegin(); it != kept.rend(); ++it)
    if (holder.add(*it) != 0) break;  // full
  NRV_LOG(NRV_DBG, "Finished reading Events for %s", tag);
}

void ProviderAgent::logFCDriverEvents() {
  readDriverEvents("nvfc", m_FCDriverLog);
  NRV_LOG(NRV_DBG, "Logging of FCoE-FC Driver Log Ends");
}

void ProviderAgent::logNICDriverEvents() {
  readDriverEvents("nvnic", m_NICDriverLog);
  NRV_LOG(NRV_DBG, "Logging of TAVO - NIC Driver Log Ends");
}

void ProviderAgent::logISCSIDriverEvents() {
  readDriverEvents("nviscsi", m_ISCSIDriverLog);
  NRV_LOG(NRV_DBG, "Logging of TAVO - iSCSI Driver Log Ends");
}

}  // namespace cimple
