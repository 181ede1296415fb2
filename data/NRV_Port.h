// A port of an adapter in the data set, of one of four kinds (FC, NIC, iSCSI,
// FCoE): its attribute set, its statistics and the SCSI targets found behind
// it.  Every port of an adapter is named by the adapter's identifier.
//
// Contract: a port is owned by its adapter and keeps a plain pointer to it
// (the adapter outlives its ports).  Attributes are read once, by the
// constructor; statistics are replaced by getStatistics() and targets by
// rescanTargets(), so both run only under the agent's data lock.  Targets are
// owned by the port.
#pragma once

#include <stdint.h>

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "access/RM_Types.h"
#include "data/NRV_PortAttributes.h"
#include "data/NRV_Statistics.h"
#include "data/NRV_Target.h"

namespace cimple {

class Adapter;

// What distinguishes the port kinds: their texts and their statistics class.
struct PortKind;

class Port {
 public:
  Port(const Port&) = delete;
  Port& operator=(const Port&) = delete;
  virtual ~Port();

  virtual const PortAttributes* getAttributes() const;
  // FC, iSCSI and FCoE ports read fresh statistics on every call and keep
  // them; when the read fails the previous object (null the first time) is
  // answered.  A NIC port answers its stored object, which stays null.  The
  // object answered is the port's and lives until the next call.
  virtual const PortStatistics* getStatistics();
  virtual Adapter* getAdapter() const;
  // FC and FCoE ports replace their targets by the HBA API's target mapping;
  // throws std::runtime_error when the adapter's HBA API handle cannot be
  // opened.  NIC and iSCSI ports have no targets.
  virtual void rescanTargets(Adapter& adapter);
  // The target mapping of the HBA API adapter `hbaApiName` with each entry
  // interrogated; no port state is touched, so it may run without the data
  // lock.  Throws std::runtime_error when the adapter cannot be opened.
  static std::vector<std::unique_ptr<Target>> scanTargets(const std::string& hbaApiName);
  // Destroys the current targets and keeps `targets` (data lock held).
  void replaceTargets(std::vector<std::unique_ptr<Target>> targets);
  // FC and FCoE ports find targets behind them; NIC and iSCSI ports do not.
  bool scansTargets() const;
  virtual const std::vector<std::unique_ptr<Target>>& getTargets() const;
  // Throws std::exception for an index at or past the end.
  virtual Target* getTarget(size_t index) const;
  virtual size_t getNumberOfTargets() const;

  // The port identifier text (16 upper-case hex digits).
  const std::string& getPortName() const { return m_PortName; }
  uint32_t getPortIndex() const { return m_PortIndex; }
  // FCoE and FC: the node name (RM_PA_PORT_NODE_WWN); iSCSI: the initiator
  // name; else "".
  const std::string& getSecondaryName() const { return m_SecondaryName; }

 protected:
  // Logs the kind's construction text, then reads the attribute set.
  Port(const PortKind& kind, Adapter& adapter, uint32_t index,
       const std::function<std::unique_ptr<PortAttributes>()>& readAttributes);

 private:
  void freeTargets();

  const PortKind& m_Kind;
  std::string m_PortName;
  uint32_t m_PortIndex;
  std::unique_ptr<PortAttributes> m_Attributes;
  std::unique_ptr<PortStatistics> m_Statistics;
  std::vector<std::unique_ptr<Target>> m_Targets;
  Adapter* m_Adapter;
  std::string m_SecondaryName;
};

// `identifierText` is the adapter identifier (16 upper-case hex digits);
// `info` the adapter information record.
class FCPort : public Port {
 public:
  FCPort(Adapter& adapter, uint32_t index, const std::string& identifierText,
         const RM_LOCAL_HBA_INFO_V4& info);
};

class NICPort : public Port {
 public:
  NICPort(Adapter& adapter, uint32_t index, const std::string& identifierText,
          const RM_LOCAL_HBA_INFO_V4& info);
};

class iSCSIPort : public Port {
 public:
  iSCSIPort(Adapter& adapter, uint32_t index, const std::string& identifierText,
            const RM_LOCAL_HBA_INFO_V4& info);
};

class FCoEPort : public Port {
 public:
  FCoEPort(Adapter& adapter, uint32_t index, const std::string& identifierText,
           const RM_LOCAL_HBA_INFO_V4& info);
};

}  // namespace cimple
