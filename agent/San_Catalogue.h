// The SAN catalogue: from one SAN scan (FC targets and the iSCSI targets,
// sessions and logical units of every port) it builds, aside in San_Maps,
// the target endpoints, one device per logical unit of the class its SCSI
// peripheral device type selects, the system-device associations and the
// initiator-target-LU paths, plus the iSCSI sessions and connections.
//
// Contract: build_san_catalogue runs with no agent lock held; it reads only
// the scan and the anchors, which collect_san_anchors copied out of the
// adapter catalogue under m_DataMutex.  Every failure skips the item it
// concerns (logged); a logical unit seen twice (two initiator ports, one
// target port) keeps one device and one target endpoint and gains a path
// per initiator.
#pragma once

#include <memory>
#include <string>
#include <unordered_map>

#include "agent/Catalogue_Build.h"
#include "agent/San_Maps.h"
#include "data/NRV_SanScan.h"

namespace cimple {


// The iSCSI function's instances in the adapter catalogue.
struct Iscsi_Anchor {
  Instance* controller = nullptr;    // NRVTAVO_SCSIProtocolController
  Instance* tcp_endpoint = nullptr;  // NRVTAVO_TCPProtocolEndpoint
};

// Clones of the adapter-catalogue instances the SAN instances refer to;
// owned (released with the anchors).
class San_Anchors {
 public:
  San_Anchors() = default;
  San_Anchors(const San_Anchors&) = delete;
  San_Anchors& operator=(const San_Anchors&) = delete;
  ~San_Anchors();

  Instance* host = nullptr;
  std::unordered_map<std::string, Instance*> fc_initiators;  // by FC port name
  std::unordered_map<std::string, Iscsi_Anchor> iscsi;       // by iSCSI port name

  // Keeps a clone of `instance` (null stays null).
  Instance* keep(const Instance* instance);

 private:
  std::vector<Instance*> owned_;
};

// The element name of an iSCSI function's TCP endpoint, by which the SAN
// catalogue finds it again.
std::string iscsi_tcp_element_name(const std::string& port_name);

// m_DataMutex held.  The iSCSI anchors of the scan's iSCSI ports.
std::unique_ptr<San_Anchors> collect_san_anchors(ProviderAgent& agent, const San_Scan& scan);

// One SAN rebuild between its steps: the scan, and the maps built from it
// (which hold the previous catalogue once published).
struct San_Rebuild {
  San_Scan scan;
  San_Maps maps;
  bool built = false;  // the maps hold a finished build
};

// No agent lock held.  Fills `maps`, which must be empty.
void build_san_catalogue(ProviderAgent& agent, const San_Anchors& anchors, const San_Scan& scan, San_Maps& maps);

}  // namespace cimple
