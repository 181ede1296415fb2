// The device side of the SAN catalogue: one instance per logical unit, of the
// class its SCSI peripheral device type selects (storage volume, tape drive,
// arbitrary logical unit, logical disk or storage extent), with its
// system-device association to the host and its three-reference path
// (initiator endpoint, target endpoint, logical unit), FC or iSCSI.
//
// Contract: runs inside build_san_catalogue, filling the staging maps of the
// San_Build; the ends handed in belong to those maps or to the anchors and
// outlive the build.  A unit whose keys are already present (seen through a
// second initiator) reuses that device and only gains its path.
#pragma once

#include <cstdint>
#include <string>

#include "agent/Association_Builder.h"
#include "agent/Catalogue_Build.h"
#include "agent/San_Maps.h"

namespace cimple {

struct San_Build {
  San_Build(ProviderAgent& agent, San_Maps& maps, Instance* host) : catalogue(agent), maps(maps) {
    catalogue.host = host;
  }
  Catalogue_Build catalogue;  // the host and the shared key copies of association ends
  San_Maps& maps;
};

// Inserts `instance` into its staging map, or answers the instance already
// there with the same keys (the new one is destroyed); `fresh` tells which.
Instance* san_insert(Instance_Map& map, Instance* instance, bool& fresh);

// What the catalogue knows of one logical unit.
struct Logical_Unit {
  uint32_t number = 0;  // the LUN
  uint32_t device_type = 0;
  std::string vendor, product, revision, serial, os_device;
  uint64_t blocks = 0;
  uint64_t block_size = 0;
  std::string identifier;       // device identifier: unique per unit behind one target port
  std::string designator;       // page 0x83 designator as hex digits; empty when unknown
  std::string second_identity;  // iSCSI: "target:unit:target name:port name"
};

enum class Path_Kind : uint8_t { kFc, kIscsi };

// The device of `unit`; its path when both ends are given.  Null when the
// device could not be made (logged).
Instance* build_logical_unit(San_Build& b, const Logical_Unit& unit, Path_Kind kind, const Instance* initiator,
                             const Instance* target);

// "Storage Volume: %d", "Tape Drive %d", ... for the unit's device type.
std::string device_name_text(uint32_t device_type, uint32_t number);

// Links two instances through A in A's staging map (Association_Builder.h).
template <class A>
A* san_associate(San_Build& b, const std::string& label, const Instance* first, const Instance* second) {
  return static_cast<A*>(
      build_association(b.catalogue, san_map<A>(b.maps), &A::static_meta_class, label, first, second));
}

}  // namespace cimple
