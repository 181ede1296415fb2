#include "agent/Catalogue_IP.h"

#include "agent/Association_Builder.h"
#include "agent/Catalogue_Profiles.h"
#include "agent/Catalogue_Services.h"
#include "agent/ProviderAgent.h"
#include "schema/Classes.h"

namespace cimple {

namespace {

// Inserts `instance`; on refusal logs the map's insert text and the class's
// creation-failure text.
template <class C>
C* insert_logged(ProviderAgent& agent, C* instance) {
  C* inserted = insert_instance(agent, instance);
  if (inserted == nullptr) NRV_LOG(NRV_ERR, "Failed to create %s", C::static_meta_class.name);
  return inserted;
}

bool create_gateway(Catalogue_Build& build, Instance* endpoint, const std::string& interface,
                    const std::string& gateway) {
  auto* sap = NRVTAVO_RemoteServiceAccessPoint::create(true);
  const Host_Keys host = host_keys(build);
  sap->SystemCreationClassName.set(host.creation_class_name);
  sap->SystemName.set(host.name);
  sap->CreationClassName.set("NRVTAVO_RemoteServiceAccessPoint");
  sap->Name.set("Default Gateway Address for Interface:" + interface);
  sap->ElementName.set("Default Gateway Address");
  sap->AccessInfo.set(gateway);
  sap->InfoFormat.set(3);  // IPv4 address
  sap->AccessContext.set(2);  // default gateway
  Instance* inserted = insert_logged(build.agent, sap);
  if (inserted == nullptr) return false;
  associate<NRVTAVO_RemoteAccessAvailableToElement>(build, interface, inserted, endpoint);
  associate<NRVTAVO_RemoteHostedAccessPoint>(build, interface, build.host, inserted);
  return true;
}

bool create_static_assignment(Catalogue_Build& build, const Function_View& fn, Instance* endpoint,
                              Instance* assignment, const std::string& interface) {
  auto* data = NRVTAVO_StaticIPAssignmentSettingData::create(true);
  data->InstanceID.set("Static IP AssignmentSettingData for Interface:" + interface);
  data->ElementName.set(data->InstanceID.value);
  data->AddressOrigin.set(3);
  data->ProtocolIFType.set(4096);
  data->IPv4Address.set(fn.p.text(RM_PA_IPV4_ADDRESS));
  data->SubnetMask.set(fn.p.text(RM_PA_SUBNET_MASK));
  data->GatewayIPv4Address.set(fn.p.text(RM_PA_GATEWAY_ADDRESS));
  Instance* inserted = insert_logged(build.agent, data);
  if (inserted == nullptr) return false;
  associate<NRVTAVO_IPProtocolEndpointIPAssignmentSettingData>(build, interface, endpoint, assignment);
  associate<NRVTAVO_StaticIPProtocolEndpointIPAssignmentSettingData>(build, interface, endpoint, inserted);
  associate<NRVTAVO_OrderedIPAssignmentSettingData>(build, interface, assignment, inserted);
  return true;
}

}  // namespace

bool create_ip_endpoint(Catalogue_Build& build, const Function_View& fn, Instance* ethernet_port,
                        Instance* lan_endpoint) {
  const std::string& address = fn.p.text(RM_PA_IPV4_ADDRESS);
  if (address.empty() || address == "0.0.0.0") return true;
  ProviderAgent& agent = build.agent;
  const std::string& name = fn.p.text(RM_PA_IP_PROTOCOL_ENDPOINT_NAME);
  const bool dhcp = fn.p.text(RM_PA_ADDRESS_ORIGIN) == "DHCP";
  const std::string interface = fn.name() + ":" + address;

  auto* ip = NRVTAVO_IPProtocolEndpoint::create(true);
  const Host_Keys host = host_keys(build);
  ip->SystemCreationClassName.set(host.creation_class_name);
  ip->SystemName.set(host.name);
  ip->CreationClassName.set("NRVTAVO_IPProtocolEndpoint");
  // Documented as IPv4_<AdapterNumber>_<PortNumber>_<IPv4 Address>_<IPProtocolEndName>.
  ip->Name.set(format_text("IPv4_%u_%u_%s_%s", fn.adapter.getAdapterNumber(), fn.physical_port(), address.c_str(),
                           name.c_str()));
  ip->ElementName.set(
      format_text("Norvane IP Endpoint %s:%s:%s", fn.serial().c_str(), name.c_str(), address.c_str()));
  ip->IPv4Address.set(address);
  ip->Address.set(address);
  ip->SubnetMask.set(fn.p.text(RM_PA_SUBNET_MASK));
  ip->GatewayAddress.set(fn.p.text(RM_PA_GATEWAY_ADDRESS));
  ip->AddressOrigin.set(dhcp ? 4 : 3);
  ip->AddressType.set(1);  // IPv4
  ip->ProtocolIFType.set(4096);
  ip->EnabledState.set(2);
  ip->RequestedState.set(12);
  Instance* endpoint = insert_logged(agent, ip);
  if (endpoint == nullptr) return false;
  const std::string label = static_cast<NRVTAVO_IPProtocolEndpoint*>(endpoint)->Name.value.str();
  associate<NRVTAVO_HostedIPProtocolEndpoint>(build, label, build.host, endpoint);
  associate<NRVTAVO_BindsToLANEndpoint>(build, label, lan_endpoint, endpoint);
  associate<NRVTAVO_IPProtocolEndpointSAPImplementation>(build, label, ethernet_port, endpoint);

  // The IP interface classes.
  associate<NRVTAVO_IPProtocolEndpointConformsToProfile>(
      build, label, createRegisteredProfile(agent, Profile::kIPInterface), endpoint);
  auto* caps = NRVTAVO_EnabledLogicalIPProtocolEndpointCapabilities::create(true);
  caps->InstanceID.set(format_text("NRV:Enabled Logical IPProtocol Endpoint Capabilities for %s", label.c_str()));
  caps->ElementName.set(caps->InstanceID.value);
  caps->RequestedStatesSupported.set({2, 3});
  Instance* capabilities = insert_logged(agent, caps);
  if (capabilities == nullptr) return false;
  associate<NRVTAVO_IPProtocolEndpointCapabilities>(build, label, endpoint, capabilities);
  if (build.ip_service)
    associate<NRVTAVO_IPConfigurationServiceAffectsElement>(build, label, endpoint, build.ip_service);
  auto* assignment = NRVTAVO_IPAssignmentSettingData::create(true);
  assignment->InstanceID.set("IP AssignmentSettingData for Interface:" + interface);
  assignment->ElementName.set(assignment->InstanceID.value);
  assignment->AddressOrigin.set(dhcp ? 4 : 3);
  assignment->ProtocolIFType.set(4096);
  Instance* setting = insert_logged(agent, assignment);
  if (setting == nullptr) return false;
  const std::string& gateway = fn.p.text(RM_PA_GATEWAY_ADDRESS);
  if (!gateway.empty() && gateway != "0.0.0.0" && !create_gateway(build, endpoint, interface, gateway)) return false;
  return dhcp || create_static_assignment(build, fn, endpoint, setting, interface);
}

}  // namespace cimple
