// Finds the HBA API adapter whose port carries the world-wide port name by
// which the management library knows an FCoE function.  HbaApiNameIndex reads
// every HBA API adapter once and then answers each function from memory, so
// a data build opens each adapter once however many FCoE functions it has.
//
// Contract: opens and closes its own HBA API handles; never throws (beyond
// allocation).  An index reflects the HBA API as it was at its first find();
// the data set makes a fresh one for every build.
#pragma once

#include <string>
#include <unordered_map>

namespace cimple {

class HbaApiNameIndex {
 public:
  // The HBA API adapter name with a port whose world-wide port name, as 16
  // upper-case hex digits, equals `identifierText`; "" when no port matches
  // (a name that matched nothing must not lead target discovery to another
  // adapter).  The first adapter listed wins when two share a port name.
  std::string find(const std::string& identifierText);

 private:
  void read();

  bool read_ = false;
  std::unordered_map<std::string, std::string> names_;  // port name text -> adapter name
};

// One look-up through a fresh index.
std::string findHbaApiAdapterName(const std::string& identifierText);

}  // namespace cimple
