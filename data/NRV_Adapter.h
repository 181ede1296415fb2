// An adapter of the data set: one PCI function that the management library
// reports as a NIC, iSCSI or FCoE function (FC exists for symmetry; discovery
// never builds it), with its attribute set, statistics and ports.
//
// Contract: an adapter owns its attributes, statistics and ports; it is built
// once from the adapter information record and never changes afterwards,
// except for its ports' statistics and targets (see NRV_Port.h).  Constructors
// throw only what allocation throws.
#pragma once

#include <stdint.h>

#include <memory>
#include <string>
#include <vector>

#include "access/RM_Types.h"
#include "data/NRV_AdapterAttributes.h"
#include "data/NRV_HbaApiName.h"
#include "data/NRV_Port.h"
#include "data/NRV_Statistics.h"

namespace cimple {

enum AdapterType : uint32_t {
  kFCAdapterType = 1,
  kNICAdapterType = 2,
  kiSCSIAdapterType = 3,
  kFCoEAdapterType = 4,
};

// What distinguishes the adapter kinds: their texts.
struct AdapterKind;

class Adapter {
 public:
  Adapter(const Adapter&) = delete;
  Adapter& operator=(const Adapter&) = delete;
  virtual ~Adapter();

  // "Norvane <model>-<function number>".
  virtual const std::string& getAdapterName() const;
  // The management library's instance index of the function.
  virtual uint32_t getAdapterNumber() const;
  virtual uint32_t getReserved() const;  // always 0
  virtual const AdapterAttributes* getAttributes() const;
  virtual const AdapterStatistics* getStatistics() const;
  virtual size_t getNumberOfPorts() const;
  virtual const std::vector<std::unique_ptr<Port>>& getPorts() const;
  // Throws std::out_of_range("vector::_M_range_check") past the end.
  virtual Port* getPort(size_t index) const;
  // Asks every port to rescan its targets; a port that throws is logged and
  // skipped.  NIC adapters only log that they have no targets.
  virtual void rescanTargets();

  uint32_t getAdapterType() const { return m_AdapterType; }
  // FCoE (and FC): the HBA API adapter name whose port matches the adapter
  // identifier, "" when none matched; iSCSI and NIC: "".
  const std::string& getHbaApiName() const { return m_HbaApiName; }
  // The identifier by which the management library names the function and
  // each of its ports, and its text (16 upper-case hex digits).
  const HBA_NAME& getIdentifier() const { return m_Identifier; }
  const std::string& getIdentifierText() const { return m_IdentifierText; }

 protected:
  Adapter(const AdapterKind& kind, const std::string& name, uint32_t number,
          const RM_LOCAL_HBA_INFO_V4& info);

  // Reads the attribute set, creates the statistics and one port per port
  // the set reports; a port that throws is logged and skipped.
  template <class Attributes, class Statistics, class PortType>
  void build(const RM_LOCAL_HBA_INFO_V4& info);

  // Looks the adapter up in the HBA API by its identifier (FC and FCoE),
  // through `names` when given, else through a look-up of its own.
  void findHbaApiName(HbaApiNameIndex* names);

 private:
  const AdapterKind& m_Kind;
  std::unique_ptr<AdapterAttributes> m_Attributes;
  std::unique_ptr<AdapterStatistics> m_Statistics;
  std::vector<std::unique_ptr<Port>> m_Ports;
  std::string m_AdapterName;
  uint32_t m_AdapterNumber;
  uint32_t m_Reserved = 0;
  uint32_t m_AdapterType;
  std::string m_HbaApiName;
  HBA_NAME m_Identifier;
  std::string m_IdentifierText;
};

// Each kind takes the adapter name, the instance index and the information
// record (identifier in its first 8 bytes).
// The FC and FCoE kinds also take the build's index of HBA API names (null:
// the adapter reads the HBA API itself); it need not outlive the constructor.
class FCAdapter : public Adapter {
 public:
  FCAdapter(const std::string& name, uint32_t number, const RM_LOCAL_HBA_INFO_V4& info,
            HbaApiNameIndex* names = nullptr);
};

class NICAdapter : public Adapter {
 public:
  NICAdapter(const std::string& name, uint32_t number, const RM_LOCAL_HBA_INFO_V4& info);
};

class iSCSIAdapter : public Adapter {
 public:
  iSCSIAdapter(const std::string& name, uint32_t number, const RM_LOCAL_HBA_INFO_V4& info);
};

class FCoEAdapter : public Adapter {
 public:
  FCoEAdapter(const std::string& name, uint32_t number, const RM_LOCAL_HBA_INFO_V4& info,
              HbaApiNameIndex* names = nullptr);
};

}  // namespace cimple
