#include "DataExpectations.h"

#include <gtest/gtest.h>
#include <stdio.h>

#include <vector>

#include "access/RM_Attributes.h"

namespace nrv_data_test {

using cimple::Adapter;
using cimple::Data;
using cimple::Port;
using cimple::Target;

uint32_t adapterTypeOf(const std::string& kind) {
  if (kind == "nic") return cimple::kNICAdapterType;
  if (kind == "iscsi") return cimple::kiSCSIAdapterType;
  return cimple::kFCoEAdapterType;
}

namespace {

std::string expectedName(const Function& f) {
  char text[128];
  snprintf(text, sizeof text, "Norvane %s-%02X", f.model.c_str(), f.pciFunction);
  return text;
}

std::string lowerColonMac(const std::string& mac) {
  const std::string hex = plainHex(mac);
  std::string out;
  for (size_t i = 0; i < hex.size(); i += 2) {
    if (!out.empty()) out += ':';
    out += static_cast<char>(std::tolower(hex[i]));
    out += static_cast<char>(std::tolower(hex[i + 1]));
  }
  return out;
}

void expectAdapterAttributes(const Adapter& a, const Function& f) {
  const cimple::AdapterAttributes* attrs = a.getAttributes();
  ASSERT_NE(attrs, nullptr);
  EXPECT_EQ(attrs->text(RM_HA_MODEL), f.model);
  EXPECT_EQ(attrs->text(RM_HA_SERIAL_NUMBER), f.serial);
  EXPECT_EQ(attrs->text(RM_HA_MANUFACTURER), f.manufacturer);  // whichever label the kind logs
  EXPECT_EQ(attrs->text(RM_HA_DRIVER_NAME), f.driverName);
  EXPECT_EQ(attrs->text(RM_HA_DRIVER_VERSION), f.driverVersion);
  EXPECT_EQ(attrs->integer(RM_HA_PCI_FUNCTION_NUMBER), f.pciFunction);
  if (f.kind == "fcoe") {
    EXPECT_EQ(attrs->text(RM_HA_IEEE_ADDRESS), lowerColonMac(f.mac));
  }
  // Members of other kinds are not carried.
  if (f.kind != "nic") {
    EXPECT_FALSE(attrs->has(RM_HA_IPL_FILENAME));
  }
  if (f.kind != "fcoe") {
    EXPECT_FALSE(attrs->has(RM_HA_SLI_MODE));
  }
}

void expectPortAttributes(const Port& p, const Function& f) {
  const cimple::PortAttributes* attrs = p.getAttributes();
  ASSERT_NE(attrs, nullptr);
  EXPECT_EQ(attrs->getPortIdentifier(), f.identifier);
  if (f.kind == "nic") {
    EXPECT_EQ(attrs->text(RM_PA_IF_NAME), f.ifname);
    EXPECT_EQ(attrs->text(RM_PA_IPV4_ADDRESS), f.ipv4);
    EXPECT_EQ(plainHex(attrs->text(RM_PA_PERMANENT_MAC_ADDRESS)), plainHex(f.mac));
    EXPECT_EQ(p.getSecondaryName(), "");
  } else if (f.kind == "iscsi") {
    EXPECT_EQ(attrs->text(NRV_ATTR_INITIATOR_NAME), f.initiatorName);
    EXPECT_EQ(p.getSecondaryName(), f.initiatorName);
    EXPECT_EQ(attrs->text(NRV_ATTR_NET_IP_ADDRESS), f.ipv4);
    EXPECT_EQ(plainHex(attrs->text(RM_PA_PERMANENT_MAC_ADDRESS)), plainHex(f.mac));
    EXPECT_FALSE(attrs->text(NRV_ATTR_AUTH_METHOD).empty());
  } else {
    EXPECT_EQ(attrs->text(RM_PA_PORT_NODE_WWN), f.wwnn);
    EXPECT_EQ(attrs->text(RM_PA_PORT_PORT_WWN), f.identifier);
    EXPECT_EQ(p.getSecondaryName(), f.wwnn);
    EXPECT_EQ(attrs->text(RM_PA_OS_DEVICE_NAME), f.ifname);
    EXPECT_EQ(attrs->text(RM_PA_FABRIC).size(), 23u);
    EXPECT_EQ(attrs->text(NRV_ATTR_FABRIC_FLAGS).size(), 8u);
    // 775 fills two members, both with the same value.
    std::vector<uint32_t> serviceType;
    for (const auto& m : attrs->members())
      if (m.key == RM_PA_PORT_SERVICE_TYPE) serviceType.push_back(m.value);
    ASSERT_EQ(serviceType.size(), 2u);
    EXPECT_EQ(serviceType[0], serviceType[1]);
  }
}

bool isBlockDevice(uint32_t type) { return type == 0x00 || type == 0x05 || type == 0x07 || type == 0x0E; }

void expectTarget(const Target& t, const Lun& lun, LunExpectation expectation) {
  SCOPED_TRACE("LUN " + std::to_string(lun.lun) + " of " + lun.targetWwpn);
  EXPECT_EQ(t.getPortName(), lun.targetWwpn);
  EXPECT_EQ(t.getNodeName(), lun.targetWwnn);
  EXPECT_EQ((t.getFcpLun() >> 48) & (lun.lun < 256 ? 0xFF : 0x3FFF), lun.lun);
  EXPECT_EQ(t.getReserved(), 0u);
  if (expectation == LunExpectation::kNoInquiry) {
    EXPECT_EQ(t.getVendor(), "Unknown");
    EXPECT_EQ(t.getProduct(), "Unknown");
    EXPECT_EQ(t.getRevision(), "Unknown");
    EXPECT_EQ(t.getSerialNumber(), "Unknown");
    EXPECT_EQ(t.getDeviceIdentifier().pageCode, 0);
    EXPECT_EQ(t.getDeviceIdentifier().identifierLength, 0u);
  } else {
    EXPECT_EQ(t.getDeviceType(), lun.type);
    EXPECT_EQ(trimmed(t.getVendor()), lun.vendor.substr(0, 8));
    EXPECT_EQ(trimmed(t.getProduct()), lun.product.substr(0, 16));
    EXPECT_EQ(trimmed(t.getRevision()), lun.revision.substr(0, 4));
    EXPECT_EQ(t.getSerialNumber(), lun.serial);
    EXPECT_EQ(t.getDeviceIdentifier().pageCode, 0x83);
    EXPECT_EQ(t.getDeviceIdentifier().deviceType, lun.type);
    EXPECT_EQ(t.getDeviceIdentifier().identifierType, 3u);  // NAA
    EXPECT_GE(t.getDeviceIdentifier().identifierLength, 8u);
  }
  const bool capacity = expectation != LunExpectation::kNoCapacity && isBlockDevice(lun.type) &&
                        lun.blocks > 0;
  EXPECT_EQ(t.getBlockLength(), capacity ? lun.blockSize : 0u);
  EXPECT_EQ(t.getLastLogicalBlockAddress(), capacity ? lun.blocks - 1 : 0u);
}

}  // namespace

void expectAdapters(const Data& data, const std::vector<Function>& functions,
                    const std::set<std::string>& portless) {
  ASSERT_EQ(data.getAdapterCount(), functions.size());
  ASSERT_EQ(data.getAdapters().size(), functions.size());
  bool nic = false, iscsi = false, fcoe = false;
  for (size_t i = 0; i < functions.size(); ++i) {
    const Function& f = functions[i];
    const Adapter* a = data.getAdapter(i);
    SCOPED_TRACE("adapter " + std::to_string(i) + " (" + f.kind + " " + f.identifier + ")");
    ASSERT_NE(a, nullptr);
    nic |= f.kind == "nic";
    iscsi |= f.kind == "iscsi";
    fcoe |= f.kind == "fcoe";
    EXPECT_EQ(a->getAdapterType(), adapterTypeOf(f.kind));
    EXPECT_EQ(a->getAdapterName(), expectedName(f));
    EXPECT_EQ(a->getAdapterNumber(), f.index);
    EXPECT_EQ(a->getReserved(), 0u);
    EXPECT_EQ(a->getIdentifierText(), f.identifier);
    EXPECT_NE(a->getStatistics(), nullptr);
    if (portless.count(f.identifier) != 0) {
      EXPECT_EQ(a->getNumberOfPorts(), 0u);
      EXPECT_EQ(a->getAttributes()->getNumberOfPorts(), 0u);
      EXPECT_EQ(a->getAttributes()->text(RM_HA_MODEL), "");
      continue;
    }
    ASSERT_EQ(a->getNumberOfPorts(), 1u);
    const Port* p = a->getPort(0);
    EXPECT_EQ(p->getPortName(), f.identifier);
    EXPECT_EQ(p->getPortIndex(), 0u);
    EXPECT_EQ(p->getAdapter(), a);
    expectAdapterAttributes(*a, f);
    expectPortAttributes(*p, f);
  }
  EXPECT_EQ(data.hasNicAdapter(), nic);
  EXPECT_EQ(data.hasIscsiAdapter(), iscsi);
  EXPECT_EQ(data.hasFcoeAdapter(), fcoe);
}

void expectTargets(const Data& data, const std::vector<Function>& functions,
                   const std::function<LunExpectation(const Function&, const Lun&)>& expectation,
                   const std::function<bool(const Function&)>& scanned) {
  ASSERT_EQ(data.getAdapters().size(), functions.size());
  for (size_t i = 0; i < functions.size(); ++i) {
    const Function& f = functions[i];
    const Adapter* a = data.getAdapter(i);
    SCOPED_TRACE("adapter " + std::to_string(i) + " (" + f.kind + " " + f.identifier + ")");
    for (const auto& port : a->getPorts()) {
      if (f.kind != "fcoe" || (scanned && !scanned(f))) {
        EXPECT_EQ(port->getNumberOfTargets(), 0u);
        continue;
      }
      ASSERT_EQ(port->getNumberOfTargets(), f.luns.size());
      for (size_t t = 0; t < f.luns.size(); ++t)
        expectTarget(*port->getTarget(t), f.luns[t],
                     expectation ? expectation(f, f.luns[t]) : LunExpectation::kComplete);
    }
  }
}

}  // namespace nrv_data_test
