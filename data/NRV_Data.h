// The adapter data set: every NIC, iSCSI and FCoE function of the host as an
// Adapter with its ports and attribute sets (buildAdapterData), and the SCSI
// targets behind the FCoE ports (buildSANData).
//
// Contract: owned by the provider agent.  Building and reading run under the
// agent's data lock; the data set has no lock of its own.  The HBA API and
// management libraries must be loaded (NRV_Runtime_Loader::loadLibraries)
// before building; without them the set simply stays empty.  No operation
// throws: every failure skips the item concerned, is logged and the build
// goes on.  Adapters, ports and targets handed out stay valid until the next
// buildAdapterData / freeAllData (targets: until the next buildSANData).
#pragma once

#include <stdint.h>

#include <memory>
#include <vector>

#include "data/NRV_Adapter.h"
#include "data/NRV_HbaApiName.h"
#include "data/NRV_Port.h"
#include "data/NRV_Target.h"

namespace cimple {

class Data {
 public:
  // Empty; calls HBA_LoadLibrary (result ignored).
  Data();
  Data(const Data&) = delete;
  Data& operator=(const Data&) = delete;
  ~Data();

  // Frees everything, then enumerates the management library's functions and
  // builds one adapter per NIC, iSCSI or FCoE function.
  void buildAdapterData();
  // Asks every adapter to rescan its targets (FCoE ports only find any).
  void buildSANData();
  // Destroys every adapter and resets count and presence flags.
  void freeAllData();

  const std::vector<std::unique_ptr<Adapter>>& getAdapters() const { return m_Adapters; }
  // Null past the end.
  Adapter* getAdapter(size_t index) const;
  // Number of adapters created by the last buildAdapterData.
  uint32_t getAdapterCount() const { return m_AdapterCount; }
  bool hasNicAdapter() const { return m_HasNicAdapter; }
  bool hasFcoeAdapter() const { return m_HasFcoeAdapter; }
  bool hasIscsiAdapter() const { return m_HasIscsiAdapter; }

 private:
  // One enumeration pass with a list of *capacity entries (grown when the
  // library asks).  A scanning pass (*nicSeen false) ends at the first NIC
  // function and sets *nicSeen; a building pass creates the adapters.
  void enumeratePass(HBA_UINT32* capacity, bool* nicSeen);
  void createAdapter(uint32_t index, const RM_LOCAL_HBA_INFO_V4& info);

  std::vector<std::unique_ptr<Adapter>> m_Adapters;
  // The HBA API's adapter names, read once per build for all FCoE functions.
  HbaApiNameIndex m_HbaApiNames;
  uint32_t m_AdapterCount = 0;
  bool m_HasNicAdapter = false;
  bool m_HasFcoeAdapter = false;
  bool m_HasIscsiAdapter = false;
};

}  // namespace cimple
