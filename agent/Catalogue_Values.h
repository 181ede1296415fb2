// The tables that turn the management library's port numbers into CIM
// values: port state to operational status, physical port state to enabled
// state, HBA API speed bits to bits per second and FC port types.  Used when
// ports are built and when their status is refreshed.
//
// Contract: pure functions; every input has an answer (the "any other" rows).
#pragma once

#include <cstdint>

namespace cimple {

struct Port_Status {
  uint16_t operational_status;
  const char* description;
};
// The FCoE refresh reads state 6 as "Other" (1) instead of "Link Down".
Port_Status port_status(uint32_t port_state, bool fcoe = false);

// EnabledState of a port from its physical port state.
uint16_t enabled_state(uint32_t physical_port_state);

// 1 -> 1 Gb/s, 2 -> 2, 4 -> 10, 8 -> 4, 16 -> 8; anything else 0.
uint64_t speed_bps(uint32_t speed_code);

struct FC_Port_Type {
  uint16_t port_type;
  const char* other;
};
FC_Port_Type fc_port_type(uint32_t hba_port_type);

}  // namespace cimple
