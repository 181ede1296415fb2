// Catalogue_Build: what one run of updateAdapterMaps carries from step to
// step: the agent, the host system and the services made so far, and the
// indexes by which a card, chip, port controller or physical port made for one
// PCI function is found again for the next function of the same card (by
// serial number or tag, never by walking a map), so a rebuild stays linear in
// the number of functions.  insert_instance is the one way builders put a new
// instance into a map.
//
// Contract: lives on the data-fetch thread's stack for one updateAdapterMaps,
// with m_DataMutex held throughout.  Pointers it keeps point into the agent's
// maps, which own the instances; the maps must not be cleared while it lives.
// endpoint() hands out shared key copies it owns until it is destroyed (each
// association that stores one takes its own reference).
#pragma once

#include <cstdio>
#include <string>
#include <unordered_map>

#include "agent/Catalogue_Maps.h"
#include "framework/Instance.h"
#include "logging/Log.h"

namespace cimple {


// The instances of one physical card (one serial number).
struct Card_Entry {
  Instance* card = nullptr;
  Instance* package = nullptr;
  Instance* product = nullptr;
  Instance* flash_image = nullptr;
};

// The instances of one physical port of a card ("serial:port number").
struct Physical_Port_Entry {
  Instance* connector = nullptr;
  Instance* controller = nullptr;
  Instance* ethernet_port = nullptr;  // the first NIC function's port
};

// The firmware identity of one chip.
struct Chip_Entry {
  Instance* chip = nullptr;
  Instance* firmware = nullptr;
};

struct Catalogue_Build {
  explicit Catalogue_Build(ProviderAgent& agent);
  Catalogue_Build(const Catalogue_Build&) = delete;
  Catalogue_Build& operator=(const Catalogue_Build&) = delete;
  ~Catalogue_Build();

  ProviderAgent& agent;

  Instance* host = nullptr;     // in m_CIM_ComputerSystem_map
  Instance* chassis = nullptr;  // in m_CIM_Chassis_map
  Instance* provider_identity = nullptr;
  Instance* install_service = nullptr;
  Instance* ip_service = nullptr;
  Instance* wwn_service = nullptr;
  Instance* driver_parameter_service = nullptr;
  Instance* nic_driver = nullptr;
  Instance* fcoe_driver = nullptr;

  std::unordered_map<std::string, Card_Entry> cards;                  // by serial number
  std::unordered_map<std::string, Chip_Entry> chips;                  // by chip tag
  std::unordered_map<std::string, Physical_Port_Entry> physical_ports;  // by "serial:port"

  // A key-only copy of `end` (makeEnd: its keys, in the namespace it lives
  // in), made once per instance and shared by every association that refers
  // to it.  Null for null.
  Instance* endpoint(const Instance* end);

 private:
  std::unordered_map<const Instance*, Instance*> endpoints_;
};

// Inserts `instance` into C's map.  On refusal logs `failure` at NRV_CRIT
// (default "Insert Failed : m_<class>_map"), destroys it and answers null.
Instance* insert_into(Instance_Map& map, Instance* instance, const char* failure = nullptr);

template <class C>
C* insert_instance(ProviderAgent& agent, C* instance, const char* failure = nullptr) {
  return static_cast<C*>(insert_into(agent_map<C>(agent), instance, failure));
}

// printf into a std::string.
std::string format_text(const char* format, ...) __attribute__((format(printf, 1, 2)));

}  // namespace cimple
