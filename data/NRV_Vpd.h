// An adapter's field-replaceable-unit data in the catalogue: merged into its
// card, published as one NRVTAVO_FRUVitalProductData per card (linked by
// NRVTAVO_FRUElementVPD), and taken into the firmware software identities.
//
// Contract: the catalogue's holder keeps it locked for the whole call; the
// object keeps nothing but the catalogue reference.  Linkage read from the
// catalogue: a firmware identity's port controller is the Dependent of its
// NRVTAVO_ElementSoftwareIdentity; a port controller's address is the
// DeviceID of the Ethernet (NRVTAVO_ControlledBy), else FC
// (NRVTAVO_FCControlledBy), port it controls.  FRU read failures leave the
// card and the identities as they were.
#pragma once

#include <stdint.h>

#include <string>

#include "access/NRV_Catalogue.h"
#include "data/NRV_FruRecord.h"
#include "schema/NRVTAVO_Card.h"

namespace cimple {

class NRV_Vpd {
 public:
  explicit NRV_Vpd(NRV_Catalogue& catalogue);
  ~NRV_Vpd();
  NRV_Vpd(const NRV_Vpd&) = delete;
  NRV_Vpd& operator=(const NRV_Vpd&) = delete;

  // Merges the FRU data of the function `deviceId` (16 hex digits) into
  // `card`: while the card's SKU is empty, its identity texts and name and a
  // new FRU instance with its association; then, once per ASIC identifier,
  // the function's firmware detail into the card's FRU instance.  `index`
  // numbers an adapter without a serial number in its name.  A card already
  // held by the card map keeps its Tag (the map's key), and so does a card
  // whose FRU UUID another card of the map carries as its Tag.
  void UpdateFRUToCard(NRVTAVO_Card& card, const std::string& asicId, const std::string& deviceId,
                       uint32_t index);

  // Takes the firmware version and name of every firmware identity (class 10)
  // from the FRU data of the adapter behind its port controller.
  void UpdateFRUToSoftwareInstance();

  // Kind 2: the address of the port controller whose DeviceID is *portText
  // (an empty text first becomes the first port controller's DeviceID).
  // 0; kNrvNotFound for another kind, no match, or a null output ("Invalid
  // PortAddress").
  uint32_t GetLogicalPortAddress(std::string* portText, int kind, std::string* address);

 private:
  void createFruInstance(const NRVTAVO_Card& card, const NRV_FruRecord& fru, const std::string& asicId);
  void addFunctionToFru(const NRVTAVO_Card& card, const std::string& asicId, const std::string& deviceId);

  NRV_Catalogue& m_Catalogue;
};

}  // namespace cimple
