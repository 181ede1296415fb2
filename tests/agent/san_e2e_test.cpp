// The SAN catalogue end to end: the module in the CIMOM stand-in over the
// sample site, read through its command-line client.
#include <gtest/gtest.h>

#include <cstdlib>
#include <sstream>
#include <string>
#include <vector>

#include "CimReply.h"

namespace nrv_test {
namespace {

std::vector<std::string> lines(const std::string& text) {
  std::vector<std::string> out;
  std::istringstream in(text);
  for (std::string line; std::getline(in, line);)
    if (!line.empty()) out.push_back(line);
  return out;
}

bool has_line_with(const std::vector<std::string>& all, const std::string& part) {
  for (const std::string& l : all)
    if (l.find(part) != std::string::npos) return true;
  return false;
}

// The sample site: FC units 5 disks, 1 tape, a changer, a CD/DVD, an
// object-based device, two controllers/enclosures and three of unknown or
// well-known type behind 3 target ports; iSCSI units behind 4 targets on two
// ports, of which 3 have open sessions (one target two sessions of two
// connections), one a closed session and one none.
struct Class_Count {
  const char* name;
  size_t count;
};
constexpr Class_Count kCounts[] = {
    {"NRVTAVO_SCSIProtocolEndpoint", 3},
    {"NRVTAVO_LocalHostedAccessPoint", 3},
    {"NRVTAVO_StorageVolume", 7},
    {"NRVTAVO_TapeDrive", 2},
    {"NRVTAVO_StorageExtent", 9},
    {"NRVTAVO_SCSIArbitraryLogicalUnit", 4},
    {"NRVTAVO_LogicalDisk", 1},
    {"NRVTAVO_StorageVolumeSystemDevice", 7},
    {"NRVTAVO_TapeDriveSystemDevice", 2},
    {"NRVTAVO_StorageExtentSystemDevice", 9},
    {"NRVTAVO_SCSIArbitraryLogicalUnitSystemDevice", 4},
    {"NRVTAVO_LogicalDiskSystemDevice", 1},
    {"NRVTAVO_SCSIInitiatorTargetStorageVolumePath", 5},
    {"NRVTAVO_SCSIInitiatorTargetTapeDrivePath", 1},
    {"NRVTAVO_SCSIInitiatorTargetStorageExtentPath", 4},
    {"NRVTAVO_SCSIInitiatorTargetArbitraryLogicalUnitPath", 2},
    {"NRVTAVO_SCSIInitiatorTargetLogicalDiskPath", 1},
    {"NRVTAVO_iSCSITargetProtocolEndpoint", 4},
    {"NRVTAVO_iSCSILocalHostedAccessPoint", 4},
    {"NRVTAVO_iSCSIInitiatorTargetStorageVolumePath", 2},
    {"NRVTAVO_iSCSIInitiatorTargetTapeDrivePath", 1},
    {"NRVTAVO_iSCSIInitiatorTargetStorageExtentPath", 2},
    {"NRVTAVO_iSCSIInitiatorTargetArbitraryLogicalUnitPath", 1},
    {"NRVTAVO_iSCSIInitiatorTargetLogicalDiskPath", 0},
    {"NRVTAVO_iSCSISession", 4},
    {"NRVTAVO_iSCSIConnection", 5},
    {"NRVTAVO_iSCSIProtocolEndpoint", 3},
    {"NRVTAVO_HostedISCSIAccesspoint", 3},
    {"NRVTAVO_SAPAvailableForISCSIEndpoint", 3},
    {"NRVTAVO_iSCSISessionEndpointOfNetworkPipe", 3},
    {"NRVTAVO_NetworkPipeComposition", 5},
    {"NRVTAVO_iSCSIConnectionEndpointOfNetworkPipe", 5},
    {"NRVTAVO_ISCSISessionStatistics", 3},
    {"NRVTAVO_ISCSISessionStatisticalData", 3},
};

TEST(SanEndToEnd, EachClassEnumeratesItsInstances) {
  ASSERT_NE(std::getenv("NRV_MODULE"), nullptr);
  for (const Class_Count& c : kCounts) {
    const Reply r = cim({"ein", c.name});
    ASSERT_EQ(r.status, 0) << c.name << ": " << r.err;
    EXPECT_EQ(lines(r.out).size(), c.count) << c.name << "\n" << r.out;
  }
}

TEST(SanEndToEnd, ALogicalUnitReachesItsPathAndHost) {
  for (const char* unit : {"NRVTAVO_TapeDrive", "NRVTAVO_StorageVolume"}) {
    SCOPED_TRACE(unit);
    const Reply units = cim({"ein", unit});
    ASSERT_EQ(units.status, 0) << units.err;
    for (const std::string& path : lines(units.out)) {
      const Reply reached = cim({"ain", path});
      ASSERT_EQ(reached.status, 0) << reached.err;
      const std::vector<std::string> ends = lines(reached.out);
      EXPECT_TRUE(has_line_with(ends, "CIM_ComputerSystem")) << path;
      const bool fc = has_line_with(ends, "NRVTAVO_SCSIProtocolInitiatorEndpoint");
      const bool iscsi = has_line_with(ends, "NRVTAVO_iSCSIProtocolEndpoint");
      if (fc) {
        EXPECT_TRUE(has_line_with(ends, "NRVTAVO_SCSIProtocolEndpoint.")) << path;
      }
      if (iscsi) {
        EXPECT_TRUE(has_line_with(ends, "NRVTAVO_iSCSITargetProtocolEndpoint")) << path;
      }
    }
  }
  // One tape behind FC, one behind iSCSI: both kinds of path are reached.
  const Reply tapes = cim({"ein", "NRVTAVO_TapeDrive"});
  std::string all;
  for (const std::string& path : lines(tapes.out)) all += cim({"ain", path}).out;
  EXPECT_NE(all.find("NRVTAVO_SCSIProtocolInitiatorEndpoint"), std::string::npos);
  EXPECT_NE(all.find("NRVTAVO_iSCSIProtocolEndpoint"), std::string::npos);
  EXPECT_NE(all.find("NRVTAVO_iSCSITargetProtocolEndpoint"), std::string::npos);
}

}  // namespace
}  // namespace nrv_test
