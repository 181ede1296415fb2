// Where updateAdapterMaps hands over to code outside the catalogue frame:
// - the feature-data builders (vital product data, FRU data, transceivers,
//   FCoE driver parameters, port virtualization, the dump service), called
//   through the feature_* functions below;
// - the service features (PHY, NIC setting service, driver logs, CEE, FIP,
//   PFC throttle, down ports, diagnostics, SR-IOV, channel management, the
//   iSCSI catalogue), run by run_feature from the table in
//   Catalogue_Features.cpp.  A feature without a builder there logs its
//   not-supported message and the build goes on.
//
// Contract: everything here runs inside updateAdapterMaps, m_DataMutex held.
// Builders insert what they make into the agent's maps; they must not throw
// past run_feature (it catches and logs).
#pragma once

#include <cstdint>
#include <string>

#include "agent/Catalogue_Build.h"
#include "agent/Catalogue_Function.h"

namespace cimple {

// ---- feature data ----------------------------------------------------------
// The transceiver of the port named `device_id`, read now and held by the
// Transceiver map, or null (no module data for the port, or refused).
Instance* feature_transceiver(ProviderAgent& agent, const std::string& device_id);
// Adds the function's general VPD to the VitalProductData map (InstanceID =
// `device_id`); 0 when it did (or the map held it already).
int feature_create_vpd(ProviderAgent& agent, const std::string& device_id);
// Merges the card's FRU data into `card` and its FRU instances.  Only a card
// not yet in the card map takes the FRU UUID as its Tag (a key), so a new card
// is handed over before it is inserted; a card already there keeps its Tag.
void feature_update_fru_to_card(ProviderAgent& agent, Instance* card, const std::string& asic_id,
                                const std::string& device_id, size_t index);
// Names the firmware identities after their FRU data; 0 (a failed FRU read
// leaves that identity as it was).
int feature_update_fru_to_software(ProviderAgent& agent);
// The FCoE driver parameters (global, or of the port `port_name`) as setting
// data; a failed read is logged by the builder and makes none.
void feature_driver_parameters(ProviderAgent& agent, const std::string& port_name, bool global);
// Resource pools and virtual FC ports of every FC port; 0 when every port
// was served.
int feature_port_virtualization(ProviderAgent& agent);
// The dump service and its setting data; 0 when the service exists after.
int feature_dump_service(ProviderAgent& agent);

// ---- service features ------------------------------------------------------
enum class Feature : uint8_t {
  kPhy,                 // step 13: 10GBaseT PHY classes
  kNicSettingService,   // step 14
  kNicDriverLog,        // step 14
  kNicCee,              // step 14, per NIC port
  kDownPorts,           // step 14
  kFcPfcThrottle,       // step 16, per FCoE port
  kFcDriverLog,         // step 16
  kFcFip,               // step 16, per FCoE port
  kFcCee,               // step 16, per FCoE port
  kDiagnostics,         // step 17
  kSrIov,               // step 17
  kChannelManagement,   // step 17
  kIscsiCatalogue,      // step 18: protocol controllers, TCP/IP endpoints, iSCSI driver
};

// A feature's builder: 0 when it made its classes; `function` is the port of
// a per-port feature, null otherwise.
using Feature_Builder = int (*)(Catalogue_Build& build, const Function_View* function);

// Installs the builder of a feature (null: none).  Features register at
// module load, before any build runs; the table is not guarded.
void set_feature_builder(Feature feature, Feature_Builder builder);
// The builder installed for `feature`, or null.
Feature_Builder feature_builder(Feature feature);

enum class Feature_Result : uint8_t { kMade, kNotBuilt, kFailed };

// Runs the feature's builder and logs its success text, or its failure text
// when it has no builder (kNotBuilt), answers non-zero or throws (kFailed).
Feature_Result run_feature(Catalogue_Build& build, Feature feature, const Function_View* function = nullptr);

}  // namespace cimple
