#include "agent/Catalogue_Ports.h"

#include <stdexcept>

#include "access/RM_Api.h"
#include "agent/Association_Builder.h"
#include "agent/Catalogue_Profiles.h"
#include "agent/Catalogue_Services.h"
#include "agent/Catalogue_Values.h"
#include "agent/ProviderAgent.h"
#include "schema/Classes.h"

namespace cimple {

namespace {

// The keys a logical device or endpoint takes from the host system.
template <class D>
D* make_hosted(const Catalogue_Build& build, const char* creation_class_name) {
  D* device = D::create(true);
  const Host_Keys host = host_keys(build);
  device->SystemCreationClassName.set(host.creation_class_name);
  device->SystemName.set(host.name);
  device->CreationClassName.set(creation_class_name);
  return device;
}

// Status, speeds and identity every port kind shares.
template <class P>
void set_port_values(P* port, const Function_View& fn, bool fcoe) {
  const Port_Status status = port_status(fn.p.integer(RM_PA_PORT_STATE), fcoe);
  port->OperationalStatus.set({status.operational_status});
  port->StatusDescriptions.set({status.description});
  port->EnabledState.set(enabled_state(fn.p.integer(RM_PA_PHYSICAL_PORT_STATE)));
  port->RequestedState.set(12);
  port->Speed.set(speed_bps(fn.p.integer(RM_PA_PORT_SPEED)));
  port->MaxSpeed.set(speed_bps(fn.p.integer(RM_PA_PORT_SUPPORTED_SPEED)));
  port->PortNumber.set(static_cast<uint16>(fn.physical_port()));
  port->Generation.set(fn.a.integer(RM_HA_PCI_FUNCTION_NUMBER));
  port->Description.set(fcoe ? fn.model() : fn.model_description());
}

// LocationIndicator from the beacon: 2 on, 3 off, 4 unknown.
uint16 beacon_indicator(const std::string& device_id) {
  HBA_NAME handle{};
  if (!port_handle(device_id, handle, "NRVTAVO_Ethernetport::Id2HBAName failed",
                   "NRVTAVO_Ethernetport::str2HBAName failed"))
    return 4;
  HBA_UINT32 state = 0;
  if (RM_DiagBeaconState(handle, &state) != 0) {
    NRV_LOG(NRV_DBG, "NRVTAVO_DiagTestFunc::GetBeaconLEDState failed");
    return 4;
  }
  return state == 3 ? 2 : state == 2 ? 3 : 4;
}

void create_vlan_endpoint(Catalogue_Build& build, const Function_View& fn, Instance* lan) {
  const std::string& id = fn.name();
  NRV_LOG(NRV_DBG, "Port %s is virtual NIC port", id.c_str());
  auto* vlan = make_hosted<NRVTAVO_VLANEndpoint>(build, "NRVTAVO_VLANEndpoint");
  vlan->Name.set(format_text("VLAN Endpoint:%s", id.c_str()));
  vlan->ElementName.set(vlan->Name.value);
  vlan->OtherTypeDescription.set("vNIC");
  vlan->EnabledState.set(2);
  Instance* endpoint = insert_instance(build.agent, vlan);
  if (endpoint == nullptr) return;
  const std::string vlan_id = std::to_string(fn.p.integer(RM_PA_VNIC_OUTER_VLAN_ID));
  auto* setting = NRVTAVO_VLANEndpointSettingData::create(true);
  setting->InstanceID.set(format_text("NRV:VLANEndpointSettingData TAVO:%s:VNIC:%s:%s", fn.serial().c_str(),
                                      fn.p.text(RM_PA_VNIC_NAME).c_str(), vlan_id.c_str()));
  setting->ElementName.set(format_text("VLAN EndpointSettingData:%s", id.c_str()));
  setting->AccessVLAN.set(static_cast<uint16>(fn.p.integer(RM_PA_VNIC_OUTER_VLAN_ID)));
  Instance* data = insert_instance(build.agent, setting);
  associate<NRVTAVO_HostedVLANEndpoint>(build, id, build.host, endpoint);
  associate<NRVTAVO_VLANEndPointidentity>(build, id, lan, endpoint);
  associate<NRVTAVO_VLANSettingData>(build, id, endpoint, data);
}

}  // namespace

Instance* create_ethernet_port(Catalogue_Build& build, const Function_View& fn, Physical_Port_Entry& physical,
                               bool iscsi) {
  const std::string& id = fn.name();
  auto* port = make_hosted<NRVTAVO_EthernetPort>(build, "NRVTAVO_EthernetPort");
  port->DeviceID.set(id);
  port->InstanceID.set(format_text("%s:%s", fn.model().c_str(), id.c_str()));
  port->ElementName.set(format_text("%s %s Port %u", fn.model().c_str(), iscsi ? "iscsi" : "nic", fn.physical_port()));
  set_port_values(port, fn, false);
  port->DetailedStatus.set(static_cast<uint16>(fn.p.integer(RM_PA_PORT_STATE)));
  port->PhysicalPortSpeed.set(port->Speed.value);
  port->FunctionalPortSpeed.set(fn.p.text(RM_PA_FUNC_PORT_SPEED));
  const std::string& mac = fn.p.text(RM_PA_PERMANENT_MAC_ADDRESS);
  port->PermanentAddress.set(mac);
  port->NetworkAddresses.set({String(mac)});
  port->LinkTechnology.set(2);  // Ethernet
  port->ActiveMaximumTransmissionUnit.set(fn.p.integer(RM_PA_CURRENT_MTU));
  port->SupportedMaximumTransmissionUnit.set(fn.p.integer(RM_PA_MAXIMUM_MTU));
  port->SRIOVState.set(static_cast<uint16>(fn.p.integer(RM_PA_SRIOV_STATE)));
  port->OtherIdentifyingInfo.set({String(fn.chip_tag()), String(fn.port_key()), String(fn.serial())});
  port->IdentifyingDescriptions.set({"SerialNumber + Sub-AdapterID", "SerialNumber:PhysicalPortNumber", "SerialNumber"});
  port->CapabilityDescriptions.set({"AlertOnLan", "WakeOnLan", "FailOver"});
  port->LocationIndicator.set(beacon_indicator(id));
  Instance* inserted =
      insert_instance(build.agent, port, iscsi ? "Insert Failed iSCSI : m_NRVTAVO_EthernetPort_map" : nullptr);
  if (inserted == nullptr) return nullptr;
  if (!iscsi && physical.ethernet_port == nullptr) physical.ethernet_port = inserted;
  associate<NRVTAVO_EthernetPortSystemDevice>(build, id, build.host, inserted);
  associate<NRVTAVO_Realizes>(build, id, physical.connector, inserted);
  associate<NRVTAVO_ControlledBy>(build, id, physical.controller, inserted);
  if (!iscsi) {
    associate<NRVTAVO_NICPortConformsToProfile>(build, id, find_profile(build.agent, Profile::kEthernetPort),
                                                inserted);
    associate<NRVTAVO_EthernetPortSoftwareIdentity>(build, id, build.nic_driver, inserted);
  }
  return inserted;
}

Instance* create_lan_endpoint(Catalogue_Build& build, const Function_View& fn, Instance* ethernet_port) {
  const std::string& id = fn.name();
  auto* lan = make_hosted<NRVTAVO_LANEndpoint>(build, "NRVTAVO_LANEndpoint");
  lan->Name.set(id);
  lan->ElementName.set(format_text("LAN Endpoint:%s", id.c_str()));
  lan->MACAddress.set(fn.p.text(RM_PA_PERMANENT_MAC_ADDRESS));
  lan->ProtocolIFType.set(6);  // ethernetCsmacd
  lan->OtherTypeDescription.set("Ethernet CSMA/CD");
  lan->EnabledState.set(2);
  lan->MaxDataSize.set(fn.p.integer(RM_PA_CURRENT_MTU));
  Instance* endpoint = insert_instance(build.agent, lan);
  if (endpoint == nullptr) return nullptr;
  auto* caps = NRVTAVO_EnabledLogicalElementCapabilities::create(true);
  caps->InstanceID.set(format_text("Capabilities:%s", id.c_str()));
  caps->ElementName.set(caps->InstanceID.value);
  caps->RequestedStatesSupported.set({2, 3});
  Instance* capabilities = insert_instance(build.agent, caps);
  associate<NRVTAVO_NICSAPImplementation>(build, id, ethernet_port, endpoint);
  associate<NRVTAVO_HostedLANEndpoint>(build, id, build.host, endpoint);
  associate<NRVTAVO_EndpointCapabilities>(build, id, endpoint, capabilities);
  associate<NRVTAVO_NICCapabilities>(build, id, ethernet_port, capabilities);
  if (fn.p.integer(RM_PA_VNIC_ENABLED_STATE) != 0) create_vlan_endpoint(build, fn, endpoint);
  return endpoint;
}

Instance* create_fc_port(Catalogue_Build& build, const Function_View& fn, Physical_Port_Entry& physical) {
  ProviderAgent& agent = build.agent;
  const std::string& id = fn.name();
  auto* port = make_hosted<NRVTAVO_FCPort>(build, "NRVTAVO_FCPort");
  port->DeviceID.set(id);
  port->Name.set(id);
  port->ElementName.set(format_text("%s FCoE Port %u", fn.model().c_str(), fn.physical_port()));
  set_port_values(port, fn, true);
  port->UsageRestriction.set(4);
  const FC_Port_Type type = fc_port_type(fn.p.integer(RM_PA_PORT_TYPE));
  port->PortType.set(type.port_type);
  port->OtherPortType.set(type.other);
  port->PermanentAddress.set(id);
  port->OtherIdentifyingInfo.set({String(fn.p.text(RM_PA_OS_DEVICE_NAME)), String(fn.a.text(RM_HA_IEEE_ADDRESS)),
                                  String(fn.port.getSecondaryName()), String(fn.chip_tag())});
  port->IdentifyingDescriptions.set({"OS Device Name", "NORVANE:IEEE_ADDRESS", "NodeWWN", "SerialNumber + Sub-AdapterID"});
  Instance* fc = insert_instance(agent, port);
  if (fc == nullptr) return nullptr;
  associate<NRVTAVO_FCSystemDevice>(build, id, build.host, fc);
  associate<NRVTAVO_FCPortConformsToProfile>(build, id, find_profile(agent, Profile::kFCoEInitiatorPorts), fc);
  associate<NRVTAVO_FCPortSoftwareIdentity>(build, id, build.fcoe_driver, fc);
  associate<NRVTAVO_FCControlledBy>(build, id, physical.controller, fc);
  associate<NRVTAVO_FCRealizes>(build, id, physical.connector, fc);
  if (physical.ethernet_port) associate<NRVTAVO_HostedDependency>(build, id, physical.ethernet_port, fc);
  associate<NRVTAVO_FCWWNServiceAffectsFCPort>(build, id, fc, build.wwn_service);
  associate<NRVTAVO_DriverServiceAffectsElement>(build, id, fc, build.driver_parameter_service);

  // Counters stay null until the statistics are read on request.
  auto* stats = NRVTAVO_FCPortStatistics::create(true);
  stats->InstanceID.set(format_text("NRVTAVO :FC Statistics:%s", id.c_str()));
  stats->ElementName.set(id);
  stats->Description.set("Statistics for the FCOE port.");
  Instance* statistics = insert_instance(agent, stats, "Insert Failed : m_NRVTAVO_FCPortStatistics_map");
  if (statistics == nullptr) throw std::runtime_error("FC port statistics refused");
  if (!associate<NRVTAVO_ElementStatisticalData>(build, id, fc, statistics))
    throw std::runtime_error("FC port statistics association refused");

  auto* initiator = make_hosted<NRVTAVO_SCSIProtocolInitiatorEndpoint>(build, "NRVTAVO_SCSIProtocolInitiatorEndpoint");
  initiator->Name.set(id);
  initiator->ElementName.set(format_text("SCSI Initiator Endpoint:%s", id.c_str()));
  initiator->ConnectionType.set(2);  // Fibre Channel
  initiator->Role.set(2);            // initiator
  initiator->ProtocolIFType.set(56);
  initiator->EnabledState.set(2);
  if (Instance* endpoint = insert_instance(agent, initiator)) {
    associate<NRVTAVO_LocalHostedInitiatorAccessPoint>(build, id, build.host, endpoint);
    associate<NRVTAVO_DeviceSAPImplementation>(build, id, fc, endpoint);
  }
  return fc;
}

}  // namespace cimple
