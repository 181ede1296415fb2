#include "agent/Catalogue_Iscsi.h"

#include <unordered_map>

#include "access/RM_Api.h"
#include "agent/Association_Builder.h"
#include "agent/Catalogue_Features.h"
#include "agent/Catalogue_Profiles.h"
#include "agent/Catalogue_Services.h"
#include "agent/San_Catalogue.h"
#include "data/NRV_Data.h"
#include "schema/Classes.h"

namespace cimple {

namespace {

constexpr uint32 kIscsiTcpPort = 3260;

template <class E>
E* hosted(const Catalogue_Build& build) {
  E* e = E::create(true);
  const Host_Keys host = host_keys(build);
  e->SystemCreationClassName.set(host.creation_class_name);
  e->SystemName.set(host.name);
  e->CreationClassName.set(E::static_meta_class.name);
  return e;
}

void protocol_controller(Catalogue_Build& build, const Function_View& fn, Instance* ethernet_port) {
  const std::string& id = fn.name();
  auto* c = hosted<NRVTAVO_SCSIProtocolController>(build);
  c->DeviceID.set(id);
  c->Name.set(format_text("SCSI Protocol Controller:%s", id.c_str()));
  c->ElementName.set(c->Name.value);
  c->EnabledState.set(2);
  Instance* controller = insert_instance(build.agent, c);
  if (controller == nullptr) return;
  associate<NRVTAVO_ProtocolControllerForPort>(build, id, controller, ethernet_port);
  associate<NRVTAVO_SCSIProtocolControllerSystemDevice>(build, id, build.host, controller);
}

struct Iscsi_Address {
  std::string address = "0.0.0.0";
  std::string netmask;
};

std::string dotted(const RM_IP_ADDRESS& a) {
  return format_text("%u.%u.%u.%u", a.address[0], a.address[1], a.address[2], a.address[3]);
}

// The iSCSI function's own IPv4 settings (its port attributes carry none).
Iscsi_Address iscsi_address(const Function_View& fn) {
  Iscsi_Address out;
  HBA_NAME handle{};
  if (!port_handle(fn.name(), handle, "iSCSI port Id2HBAName failed", "iSCSI port str2HBAName failed")) return out;
  RM_NETWORK_SETTINGS settings{};
  HBA_UINT32 size = sizeof settings;
  const RM_STATUS status = LRM_Ini_GetNetworkProperties(handle, &settings, &size);
  if (status != RM_STATUS_SUCCESS) {
    NRV_LOG(NRV_ERR, "GetNetworkProperties failed for port %s with %d", fn.name().c_str(), static_cast<int>(status));
    return out;
  }
  out.address = dotted(settings.ipv4Address);
  out.netmask = dotted(settings.subnetMask);
  return out;
}

void network_endpoints(Catalogue_Build& build, const Function_View& fn, Instance* ethernet_port) {
  const std::string& id = fn.name();
  const Iscsi_Address ipv4 = iscsi_address(fn);
  const std::string& address = ipv4.address;
  auto* ip = hosted<NRVTAVO_IPProtocolEndpoint>(build);
  // Documented as IPv4_<AdapterNumber>_<PortNumber>_<IPv4 Address>.
  ip->Name.set(format_text("IPv4_%zu_%d_%s", fn.index, static_cast<int>(fn.port.getPortIndex()), address.c_str()));
  ip->ElementName.set(format_text("IP Protocol Endpoint %s", address.c_str()));
  ip->IPv4Address.set(address);
  ip->Address.set(address);
  ip->SubnetMask.set(ipv4.netmask);
  ip->AddressType.set(1);
  ip->ProtocolIFType.set(4096);
  ip->EnabledState.set(2);
  Instance* ip_endpoint = insert_instance(build.agent, ip);
  if (ip_endpoint == nullptr) return;
  associate<NRVTAVO_HostedIPAccessPoint>(build, id, build.host, ip_endpoint);
  associate<NRVTAVO_IPProtocolEndpointSAPImplementation>(build, id, ethernet_port, ip_endpoint);
  if (build.ip_service)
    associate<NRVTAVO_IPConfigurationServiceAffectsElement>(build, id, ip_endpoint, build.ip_service);
  if (address.empty() || address == "0.0.0.0") {
    NRV_LOG(NRV_DBG, "ip not set skipping creating the instance for NRVTAVO_TCPProtocolEndpoint for %s", id.c_str());
    return;
  }
  auto* tcp = hosted<NRVTAVO_TCPProtocolEndpoint>(build);
  tcp->Name.set(format_text("NRV:TCP Endpoint:%s:%d", address.c_str(), static_cast<int>(kIscsiTcpPort)));
  tcp->ElementName.set(iscsi_tcp_element_name(id));
  tcp->PortNumber.set(kIscsiTcpPort);
  tcp->EnabledState.set(2);
  Instance* tcp_endpoint = insert_instance(build.agent, tcp);
  if (tcp_endpoint == nullptr) return;
  associate<NRVTAVO_TCPBindsToIP>(build, id, ip_endpoint, tcp_endpoint);
  associate<NRVTAVO_HostedTCPAccesspoint>(build, id, build.host, tcp_endpoint);
}

// The adapter build's last step is this unit's from the module's load on.
const bool kRegistered = (set_feature_builder(Feature::kIscsiCatalogue, build_iscsi_functions), true);

}  // namespace

int build_iscsi_functions(Catalogue_Build& build, const Function_View*) {
  ProviderAgent& agent = build.agent;
  if (!agent.m_pData) {
    NRV_LOG(NRV_CRIT, "Could not locate the data pointer for iSCSI - Serious issue");
    return 1;
  }
  if (!agent.m_pData->hasIscsiAdapter()) return 0;
  Instance* initiator_profile = createRegisteredProfile(agent, Profile::kISCSIInitiator);
  createRegisteredProfile(agent, Profile::kISCSIInitiatorPorts);
  // The iSCSI functions' Ethernet ports, made earlier in this build, by DeviceID.
  std::unordered_map<std::string, Instance*> ethernet_ports;
  const Instance_Map& ports = agent.m_NRVTAVO_EthernetPort_map;
  for (size_t i = 0; i < ports.size(); ++i) {
    const auto* port = static_cast<const NRVTAVO_EthernetPort*>(ports[i]);
    if (!port->DeviceID.null) ethernet_ports.emplace(port->DeviceID.value.str(), ports[i]);
  }
  const auto& adapters = agent.m_pData->getAdapters();
  for (size_t i = 0; i < adapters.size(); ++i) {
    const Adapter& adapter = *adapters[i];
    if (adapter.getAdapterType() != kiSCSIAdapterType) continue;
    for (const auto& port : adapter.getPorts()) {
      const Function_View fn(adapter, *port, i);
      const auto found = ethernet_ports.find(fn.name());
      if (found == ethernet_ports.end()) continue;  // its Ethernet port was refused (logged)
      Instance* ethernet_port = found->second;
      associate<NRVTAVO_iSCSIPortConformsToProfile>(build, fn.name(), initiator_profile, ethernet_port);
      protocol_controller(build, fn, ethernet_port);
      network_endpoints(build, fn, ethernet_port);
    }
  }
  return 0;
}

}  // namespace cimple
