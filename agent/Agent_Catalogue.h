// The agent's maps as the feature builders of data/ and access/ see them
// (NRV_Catalogue): every provider class and the two host classes, looked up
// by meta-class.
//
// Contract: the caller holds the agent's m_DataMutex for as long as it uses
// the view; the view keeps a reference to the agent and nothing else.  A
// class without a map of its own is served by the map of its nearest
// superclass that has one; map() throws std::out_of_range when none has.
#pragma once

#include "access/NRV_Catalogue.h"
#include "agent/ProviderAgent.h"

namespace cimple {

class Agent_Catalogue final : public NRV_Catalogue {
 public:
  explicit Agent_Catalogue(ProviderAgent& agent) : m_Agent(agent) {}
  Instance_Map& map(const Meta_Class& mc) override;

 private:
  ProviderAgent& m_Agent;
};

}  // namespace cimple
