#include "agent/Catalogue_Host.h"

#include <netdb.h>
#include <netinet/in.h>
#include <sys/socket.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

#include "agent/ProviderAgent.h"
#include "framework/cimom.h"
#include "schema/Classes.h"

namespace cimple {

namespace {

constexpr const char* kPlatformNameSpace = "root/kvlhost";

struct Up_Call_Texts {
  const char* started;
  const char* calling;
  const char* found;
};

// The first instance the platform answers for its class `model_class` whose
// class is `wanted` or derived from it, as a copy in the platform's name space.
Instance* platform_instance(const Meta_Class* model_class, const Meta_Class* wanted, const Up_Call_Texts& texts) {
  NRV_LOG(NRV_DBG, "%s", texts.started);
  Instance* model = create(model_class, true);
  NRV_LOG(NRV_DBG, "%s", texts.calling);
  Instance* found = nullptr;
  if (std::unique_ptr<Instance_Cursor> cursor = cimom::enum_instances(kPlatformNameSpace, model)) {
    while (Instance* next = cursor->next()) {
      if (found == nullptr && is_subclass(wanted, next->meta_class)) {
        NRV_LOG(NRV_DBG, "%s", texts.found);
        found = next;
        found->__name_space = kPlatformNameSpace;
      } else {
        unref(next);
      }
    }
  }
  destroy(model);
  return found;
}

Instance* own_computer_system(ProviderAgent& agent) {
  const Host_Identity host = resolve_host_identity();
  agent.m_HostName = host.name;
  agent.m_HostIPAddress = host.address;
  NRV_LOG(NRV_DBG, "Generating an norvane specific m_CIM_ComputerSystem_map[0]");
  CIM_ComputerSystem* cs = CIM_ComputerSystem::create(true);
  cs->CreationClassName.set("CIM_ComputerSystem");
  cs->Name.set(host.name);
  cs->ElementName.set(host.name);
  cs->NameFormat.set("Other");
  cs->Description.set(format_text("%s with Norvane CMPI HBA Provider v%d.%d.%d-%d", agent.m_OSName.c_str(),
                                  kNrvVersion[0], kNrvVersion[1], kNrvVersion[2], kNrvVersion[3]));
  cs->OtherIdentifyingInfo.set({String(host.address), String(agent.m_OSName), String(agent.m_OSDistribution)});
  cs->IdentifyingDescriptions.set({"NORVANE:IP_ADDRESS", "NORVANE:OS_NAME", "NORVANE:OS_EXTENDED_INFO"});
  cs->EnabledState.set(0);
  cs->RequestedState.set(12);
  cs->EnabledDefault.set(2);
  cs->TransitioningToState.set(12);
  cs->Dedicated.set({0});
  cs->ResetCapability.set(2);
  cs->PowerManagementCapabilities.set({0});
  cs->OperationalStatus.set({2});
  agent.m_bOwnComputerSystem = true;
  return cs;
}

}  // namespace

Host_Identity resolve_host_identity() {
  char name[512] = {};
  if (gethostname(name, sizeof name - 1) != 0) {
    NRV_LOG(NRV_ERR, "Error! gethostname() failed err : %d , using 'unknown' for hostname and IP address", errno);
    return {"unknown", "unknown"};
  }
  NRV_LOG(NRV_DBG, "Host Name : %s", name);
  Host_Identity identity{name, "unknown"};
  // getaddrinfo instead of gethostbyname: its answer belongs to this call, so
  // a CIMOM thread resolving at the same time cannot overwrite it.
  addrinfo hints{};
  hints.ai_family = AF_INET;
  hints.ai_flags = AI_CANONNAME;
  addrinfo* answer = nullptr;
  if (getaddrinfo(name, nullptr, &hints, &answer) != 0 || answer == nullptr) {
    NRV_LOG(NRV_ERR, "Error! gethostbyname() failed, using 'unknown' for IP address.");
    return identity;
  }
  if (answer->ai_canonname != nullptr && answer->ai_canonname[0] != '\0') identity.name = answer->ai_canonname;
  const auto* in = reinterpret_cast<const sockaddr_in*>(answer->ai_addr);
  const auto* b = reinterpret_cast<const unsigned char*>(&in->sin_addr.s_addr);
  identity.address = format_text("%d.%d.%d.%d", b[0], b[1], b[2], b[3]);
  NRV_LOG(NRV_DBG, "Host ipAddress : %s", identity.address.c_str());
  freeaddrinfo(answer);
  return identity;
}

bool build_host_system(Catalogue_Build& build) {
  ProviderAgent& agent = build.agent;
  Instance* cs = platform_instance(&KVLD_ComputerSystem::static_meta_class, &CIM_ComputerSystem::static_meta_class,
                                   {"up-call to enumerate CIM_ComputerSystem started",
                                    "up-call to enumerate CIM_ComputerSystem created--calling now",
                                    "up-call - found the correct CIM_ComputerSystem to link"});
  NRV_LOG(NRV_INFO, "up-call to enumerate CIM_ComputerSystem created");
  if (cs == nullptr) {
    NRV_LOG(NRV_DBG, "up-call method failed");
    cs = own_computer_system(agent);
  }
  NRV_LOG(NRV_DBG, "All clear -created nrvhba computer system instance");
  build.host = insert_into(agent.m_CIM_ComputerSystem_map, cs, "Insert Failed : m_NRVHBA_ComputerSystem_map");
  return build.host != nullptr;
}

bool chassis_up_call(Catalogue_Build& build) {
  Instance* chassis = platform_instance(&KVLD_Chassis::static_meta_class, &CIM_Chassis::static_meta_class,
                                        {"up-call to enumerate CIM_Chassis started",
                                         "up-call to enumerate CIM_Chassis created--calling now",
                                         "up-call - found the correct CIM_Chassis to link"});
  if (chassis == nullptr) return false;
  build.chassis = insert_into(build.agent.m_CIM_Chassis_map, chassis, "Insert Failed : m_CIM_Chassis_map");
  return build.chassis != nullptr;
}

bool build_own_chassis(Catalogue_Build& build) {
  NRV_LOG(NRV_DBG, "up-call method to get the chassis is failed");
  CIM_Chassis* chassis = CIM_Chassis::create(true);
  chassis->Tag.set("NRV TAVO:Chassis");
  chassis->ElementName.set("NRV TAVO:Chassis");
  chassis->CreationClassName.set("CIM_Chassis");
  chassis->PackageType.set(3);
  chassis->ChassisPackageType.set(0);
  build.chassis = insert_into(build.agent.m_CIM_Chassis_map, chassis, "Insert Failed : m_CIM_Chassis_map");
  if (build.chassis == nullptr) NRV_LOG(NRV_CRIT, "Could not create the Chassis Instance");
  return build.chassis != nullptr;
}

}  // namespace cimple
