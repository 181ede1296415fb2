// A small provider set over real module classes, built with the framework
// exactly as module providers are: NRVTAVO_Card (every instance operation),
// NRVTAVO_Chip (enumeration only, so get-instance falls back), the
// association NRVTAVO_CardContainsChip (enumeration only, so references and
// associators fall back) and NRVTAVO_ChannelMgmtService (extrinsic methods).
// On request their operations throw, as a faulty provider would.  The test
// module adds embedded instances: NRVTAVO_ConcreteJob (embedded objects in
// properties) and NRVTAVO_EnabledLogicalElementCapabilities
// (CreateGoalSettings answers its embedded goal settings).
// Their data lives in one test store that each test resets.
#pragma once

#include <condition_variable>
#include <mutex>
#include <string>

#include "framework/CMPI_Static_Data.h"
#include "framework/Instance_Map.h"
#include "framework/Thread.h"
#include "schema/CIM_ConcreteJob.h"
#include "schema/CIM_SettingData.h"
#include "schema/NRVTAVO_Card.h"
#include "schema/NRVTAVO_CardContainsChip.h"
#include "schema/NRVTAVO_ChannelMgmtService.h"
#include "schema/NRVTAVO_ChannelSettingData.h"
#include "schema/NRVTAVO_Chip.h"
#include "schema/NRVTAVO_ConcreteJob.h"
#include "schema/NRVTAVO_EnabledLogicalElementCapabilities.h"

namespace test {

using namespace cimple;

struct Store {
  Instance_Map cards{&NRVTAVO_Card::static_meta_class};
  Instance_Map chips{&NRVTAVO_Chip::static_meta_class};
  Instance_Map links{&NRVTAVO_CardContainsChip::static_meta_class};
  Instance_Map services{&NRVTAVO_ChannelMgmtService::static_meta_class};
  Instance_Map jobs{&NRVTAVO_ConcreteJob::static_meta_class};
  int loads = 0;
  int unloads = 0;
  bool associators_supported = false;
  int card_enumeration_result = 0;  // what the card provider's enumeration answers
  // Every operation of the card, link and service providers throws.
  bool throw_in_operations = false;
  // What the last method call saw.
  bool requested_state_null = true;
  uint16_t requested_state = 0;
  bool timeout_null = true;
  std::string target_name;
  std::string min_bandwidths;  // "1,2,3"

  // A background fetch (test module only): once requested, the chip
  // enumeration starts a framework thread that counts the cards through the
  // broker, then waits for `go_on` and counts them again.
  struct Fetch {
    bool requested = false;
    std::mutex mutex;
    std::condition_variable changed;
    bool counted_before = false;
    bool go_on = false;
    int cards_before = -1;
    int cards_after = -1;
    Thread thread;
  } fetch;
};

Store& store();
void reset_store();

NRVTAVO_Card* make_card(const char* tag, const char* model = "LPe");
NRVTAVO_Chip* make_chip(const char* tag);
NRVTAVO_CardContainsChip* make_link(const char* card_tag, const char* chip_tag);
NRVTAVO_ChannelMgmtService* make_service(const char* name);

// A provider's registration and static adapter record.
struct Provider_Slot {
  const Provider_Registration* registration;
  CMPI_Static_Data* record;
};
Provider_Slot card_slot();
Provider_Slot chip_slot();
Provider_Slot link_slot();
Provider_Slot service_slot();

}  // namespace test
