// The on-demand refresh of the catalogue's volatile values (link state,
// speeds, board temperature, link-down reason, FC port statistics, FCoE driver
// parameters), rewritten in place in the agent's maps just before a provider
// copies them out.
//
// Contract: each refresh runs only with the agent's m_DataMutex held (the
// refreshing providers take it first), and after the adapter data and maps
// are ready.  Each keeps the time of its own last pass and does nothing when
// called again within its interval; the time is taken before the pass, so a
// pass that fails is not retried before the interval is over.  The first
// management-library failure ends a pass (what was not reached keeps its old
// value); nothing is reported to the caller.  None throws.
#pragma once

namespace cimple {

class ProviderAgent;

// Interval 10 s: state, enabled state and speeds of every Ethernet port.
void UpdateEthernetPortStatus(ProviderAgent& agent);
// Interval 10 s: state, port type and speeds of every FC port of an FCoE adapter.
void UpdateFCoEPortStatus(ProviderAgent& agent);
// Interval 10 s: the counters of every FCoE port's statistics instance.
void GetFCoEPortStats(ProviderAgent& agent);
// Interval 10 s: BoardTemperature of every card.
void UpdateBoardTemp(ProviderAgent& agent);
// Interval 5 s: PhyLinkDownReason of every port controller.
void UpdatePhyLinkDownReason(ProviderAgent& agent);
// Interval 5 s: the current global and local FCoE driver parameters.
void UpdateDriverParameters(ProviderAgent& agent);

// Forgets every last-refresh time, so that the next call of each refreshes
// (a new agent starts with fresh values).
void resetStatusRefreshTimes();

}  // namespace cimple
