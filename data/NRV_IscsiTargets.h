// What the management library knows about the iSCSI targets of one iSCSI
// port: each target with its sessions (and their connections) and its
// logical units, read by GetiSCSITargets into plain records that the SAN
// catalogue turns into instances.
//
// Contract: GetiSCSITargets only calls the management library and fills
// `out`; it touches no agent state, so it runs without the agent's locks.
// A failure on one target's session list, one session or one LUN skips that
// item only (its status is kept in the record); the result is the last
// failing status, or 0.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "access/RM_IscsiRecords.h"

namespace cimple {

struct Iscsi_Connection {
  uint16_t cid = 0;
  uint16_t state = 0;  // 0 connected
  std::string local_address;
  uint16_t local_port = 0;
  std::string remote_address;
  uint16_t remote_port = 0;
};

struct Iscsi_Session {
  uint32_t number = 0;  // position in the target's session list
  uint64_t isid = 0;
  uint16_t tsih = 0;
  uint32_t state = 0;  // 0 open, 1 closed, ...
  std::string initiator_name;
  std::vector<Iscsi_Connection> connections;
};

struct Iscsi_Lun {
  uint32_t lun = 0;
  uint8_t device_type = 0;
  uint64_t blocks = 0;
  uint32_t block_size = 0;
  std::string vendor, product, revision, serial, os_device;
  std::vector<uint8_t> naa;
};

struct Iscsi_Target {
  std::string name;
  uint8_t flags = 0;
  RM_STATUS session_status = 0;  // non-zero: the session list could not be read
  RM_STATUS lun_status = 0;      // non-zero: the LUN list could not be read
  std::vector<Iscsi_Session> sessions;
  std::vector<Iscsi_Lun> luns;
};

struct Iscsi_Port_Targets {
  std::string port_name;  // the iSCSI port's identifier text
  RM_STATUS status = 0;   // GetiSCSITargets' result
  std::vector<Iscsi_Target> targets;
};

// The text of a session state: "OPEN", "CLOSED", ... or "UNKNOWN".
const char* iscsi_session_state_text(uint32_t state);

// 0; 1 when the port name does not convert; 8 when a list cannot be
// allocated; else the management library's status (the target list failed,
// or the last item that failed).
RM_STATUS GetiSCSITargets(const std::string& port_name, uint8_t flag, Iscsi_Port_Targets& out);

}  // namespace cimple
