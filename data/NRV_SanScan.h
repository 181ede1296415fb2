// One SAN discovery in three steps, so that its slow part holds no lock:
// plan() notes, under the agent's data lock, which ports to scan; run() sends
// the SCSI commands and management-library calls with no lock held; and
// publish() moves the FC targets found into their ports, again under the data
// lock.  The iSCSI targets stay in the scan for the SAN catalogue.
//
// Contract: the data set must not be rebuilt between plan() and publish()
// (only the data-fetch thread rebuilds it, and it runs all three).  publish()
// checks each port is still in the data set and drops what it cannot place.
// A port whose rescan fails keeps no targets, as a failed rescan leaves it.
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "data/NRV_IscsiTargets.h"
#include "data/NRV_Target.h"

namespace cimple {

class Data;
class Port;

struct San_Fc_Port {
  size_t adapter = 0;   // position of the adapter in the data set
  const Port* port = nullptr;
  uint32_t port_index = 0;
  std::string port_name;
  std::string adapter_name;
  std::string hba_api_name;
  std::vector<std::unique_ptr<Target>> targets;
};

struct San_Iscsi_Port {
  size_t adapter = 0;
  uint32_t port_index = 0;
  std::string initiator_name;
  Iscsi_Port_Targets found;
};

class San_Scan {
 public:
  // Data lock held.
  static San_Scan plan(const Data& data);
  // No lock needed; touches only the scan.
  void run();
  // Data lock held.  The FC targets move into their ports.
  void publish(Data& data);

  // Logical units found (FC targets and iSCSI LUNs).
  size_t logical_units() const;

  std::vector<San_Fc_Port> fc_ports;
  std::vector<San_Iscsi_Port> iscsi_ports;
};

}  // namespace cimple
