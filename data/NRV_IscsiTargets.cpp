#include "data/NRV_IscsiTargets.h"

#include <algorithm>
#include <cstring>

#include "access/NRV_Common.h"
#include "access/NRV_MethodWrapper.h"
#include "data/NRV_DataLog.h"

namespace cimple {

namespace {

constexpr RM_STATUS kNameDoesNotConvert = 1;

// The entries of a count-prefixed list, bounded by the bytes it holds
// whatever count the library wrote.
template <class Entry>
std::vector<Entry> list_entries(const std::vector<uint8_t>& list) {
  std::vector<Entry> out;
  if (list.size() < kRmIscsiListHeader) return out;
  HBA_UINT32 count = 0;
  std::memcpy(&count, list.data(), sizeof count);
  const size_t held = (list.size() - kRmIscsiListHeader) / sizeof(Entry);
  out.resize(std::min<size_t>(count, held));
  if (!out.empty()) std::memcpy(out.data(), list.data() + kRmIscsiListHeader, out.size() * sizeof(Entry));
  return out;
}

template <class Record>
bool read_record(const std::vector<uint8_t>& bytes, Record& out) {
  std::memset(&out, 0, sizeof out);
  if (bytes.empty()) return false;
  std::memcpy(&out, bytes.data(), std::min(bytes.size(), sizeof out));
  return true;
}

template <size_t N>
std::string field(const char (&text)[N]) {
  return std::string(text, strnlen(text, N));
}

std::string address_text(const RM_IP_ADDRESS& a) {
  if (a.flags & RM_IP_FLAG_IPV6) {
    std::string text;
    char group[8];
    for (size_t i = 0; i < 16; i += 2) {
      snprintf(group, sizeof group, i == 0 ? "%x" : ":%x", (a.address[i] << 8) | a.address[i + 1]);
      text += group;
    }
    return text;
  }
  char text[16];
  snprintf(text, sizeof text, "%u.%u.%u.%u", a.address[0], a.address[1], a.address[2], a.address[3]);
  return text;
}

Iscsi_Connection connection_of(const RM_ISCSI_CONNECTION_INFO& c) {
  return {c.cid, c.state, address_text(c.local), c.local.port, address_text(c.remote), c.remote.port};
}

// Sessions of a target that reports some; a failure is kept in the target.
RM_STATUS read_sessions(const HBA_NAME& name, Iscsi_Target& target) {
  std::vector<uint8_t> list;
  RM_STATUS status = NRV_MethodWrapper::GetiSCSISessions(name, target.name, list);
  if (status != RM_STATUS_SUCCESS) {
    NRV_DATA_LOG(NRV_ERR, "ERROR: RM_iSCSI_GetSessions() Failed.");
    target.session_status = status;
    return status;
  }
  const std::vector<RM_ISCSI_SESSION_ENTRY> entries = list_entries<RM_ISCSI_SESSION_ENTRY>(list);
  NRV_DATA_LOG(NRV_DBG, " RM_iSCSI_GetSessions() succesful.");
  NRV_DATA_LOG(NRV_DBG, "Total Sessions: %d", static_cast<int>(entries.size()));
  RM_STATUS last = RM_STATUS_SUCCESS;
  for (size_t i = 0; i < entries.size(); ++i) {
    std::vector<uint8_t> bytes;
    RM_ISCSI_SESSION_INFO info;
    status = NRV_MethodWrapper::GetSessionInfo(name, &entries[i], bytes);
    if (status != RM_STATUS_SUCCESS || !read_record(bytes, info)) {
      NRV_DATA_LOG(NRV_ERR, "Unable to list session information for session %d (%s=%d).\n", static_cast<int>(i),
                   "TSIH", static_cast<int>(entries[i].tsih));
      last = status != RM_STATUS_SUCCESS ? status : RM_STATUS_ERROR;
      continue;
    }
    NRV_DATA_LOG(NRV_DBG, "RM_iSCSI_GetSessionInfo() succesful.");
    Iscsi_Session session;
    session.number = static_cast<uint32_t>(i);
    session.isid = info.isid;
    session.tsih = info.tsih;
    session.state = info.state;
    session.initiator_name = field(info.initiatorName);
    const size_t used = std::min<size_t>(info.connectionCount, kRmIscsiMaxConnections);
    for (size_t c = 0; c < used; ++c) session.connections.push_back(connection_of(info.connections[c]));
    target.sessions.push_back(std::move(session));
  }
  return last;
}

RM_STATUS read_luns(const HBA_NAME& name, Iscsi_Target& target) {
  std::vector<uint8_t> list;
  RM_STATUS status = NRV_MethodWrapper::GetiSCSILuns(name, target.name, list);
  if (status != RM_STATUS_SUCCESS) {
    NRV_DATA_LOG(NRV_CRIT, "GetiSCSILuns failed for target %s", target.name.c_str());
    target.lun_status = status;
    return status;
  }
  RM_STATUS last = RM_STATUS_SUCCESS;
  for (const RM_ISCSI_LUN_ENTRY& entry : list_entries<RM_ISCSI_LUN_ENTRY>(list)) {
    std::vector<uint8_t> bytes;
    RM_ISCSI_LUN_PROPERTIES p;
    status = NRV_MethodWrapper::GetiSCSILunProperties(name, target.name, entry.lun, bytes);
    if (status != RM_STATUS_SUCCESS || !read_record(bytes, p)) {
      NRV_DATA_LOG(NRV_ERR, "Unable to get properties for LUN %d for target %s", static_cast<int>(entry.lun),
                   target.name.c_str());
      last = status != RM_STATUS_SUCCESS ? status : RM_STATUS_ERROR;
      continue;
    }
    Iscsi_Lun lun;
    lun.lun = p.lun;
    lun.device_type = p.deviceType & 0x1F;
    lun.blocks = p.blocks;
    lun.block_size = p.blockSize;
    lun.vendor = field(p.vendor);
    lun.product = field(p.product);
    lun.revision = field(p.revision);
    lun.serial = field(p.serialNumber);
    lun.os_device = field(p.osDeviceName);
    lun.naa.assign(p.naa, p.naa + std::min<size_t>(p.naaLength, sizeof p.naa));
    target.luns.push_back(std::move(lun));
  }
  return last;
}

}  // namespace

const char* iscsi_session_state_text(uint32_t state) {
  static constexpr const char* kStates[] = {"OPEN",   "CLOSED",   "LOGIN_IN_PROGRESS",
                                            "LOGIN_FAILED", "RECOVERY", "DELETED"};
  return state < std::size(kStates) ? kStates[state] : "UNKNOWN";
}

RM_STATUS GetiSCSITargets(const std::string& port_name, uint8_t flag, Iscsi_Port_Targets& out) {
  NRV_DATA_LOG(NRV_DBG, "Entered GetiSCSITargets.");
  out.port_name = port_name;
  out.targets.clear();
  HBA_NAME name{};
  if (string2HBAName(&name, port_name.c_str()) != 1) return out.status = kNameDoesNotConvert;

  std::vector<uint8_t> list;
  RM_STATUS status = NRV_MethodWrapper::GetiSCSITargetList(name, flag, list);
  if (status != RM_STATUS_SUCCESS) {
    NRV_DATA_LOG(NRV_ERR, "ERROR: GetiSCSITargets Failed.");
    NRV_MethodWrapper::logStatus(status);
    return out.status = status;
  }
  NRV_DATA_LOG(NRV_DBG, "RM_iSCSI_GetTargets succeded.");
  const std::vector<RM_ISCSI_TARGET_ENTRY> entries = list_entries<RM_ISCSI_TARGET_ENTRY>(list);
  RM_STATUS last = RM_STATUS_SUCCESS;
  out.targets.reserve(entries.size());
  for (size_t i = 0; i < entries.size(); ++i) {
    NRV_DATA_LOG(NRV_DBG, "targetList index: %u", static_cast<unsigned>(i));
    Iscsi_Target target;
    target.name = field(entries[i].name);
    target.flags = entries[i].flags;
    if (target.flags & RM_ISCSI_TARGET_HAS_SESSIONS)
      if (RM_STATUS s = read_sessions(name, target); s != RM_STATUS_SUCCESS) last = s;
    if (RM_STATUS s = read_luns(name, target); s != RM_STATUS_SUCCESS) last = s;
    out.targets.push_back(std::move(target));
  }
  return out.status = last;
}

}  // namespace cimple
