// The management library's functions that exist under one name only:
// discovery of local functions, the blob and VPD readers, versions, status
// texts, WWN validation, firmware files, dead NIC ports, board numbers and the
// ARP and route tables.
#include <sys/stat.h>

#include <algorithm>
#include <mutex>

#include "sim/AttributeBlob.h"
#include "sim/RmCommon.h"
#include "sim/VpdImage.h"

namespace {

using namespace nrvsim;
using namespace nrvsim::rm;

std::optional<uint32_t> gate(const char* name, uint32_t unavailable, std::optional<Wwn> adapter = std::nullopt) {
  return SimSite::instance().gate(name, unavailable, adapter);
}

uint32_t protocol_mask(Kind k) {
  switch (k) {
    case Kind::kNic: return RM_PROTOCOL_NIC;
    case Kind::kIscsi: return RM_PROTOCOL_ISCSI;
    case Kind::kFcoe: return RM_PROTOCOL_FCOE;
  }
  return 0;
}

RM_STATUS local_info(const char* name, RM_ADAPTER_INSTANCE* pair, void* out, size_t size) {
  if (auto st = gate(name, RM_STATUS_ERROR)) return *st;
  if (pair == nullptr || out == nullptr) return kStatusBadArgument;
  return SimSite::instance().with([&](Site& s) -> RM_STATUS {
    auto ref = find_instance(s, pair->instance);
    if (!ref) return kStatusNoSuchAdapter;
    const Card& card = card_of(s, *ref);
    const Function& fn = at(s, *ref);
    RM_LOCAL_HBA_INFO_V4 info;
    std::memset(&info, 0, sizeof info);
    info.wwpn = to_name(fn.id);
    info.wwnn = to_name(fn.kind == Kind::kFcoe ? fn.wwnn : fn.id);
    put_text(info.serialNumber, sizeof info.serialNumber, card.serial);
    put_text(info.driverName, sizeof info.driverName, fn.driver_name);
    put_text(info.modelName, sizeof info.modelName, card.model);
    put_text(info.osDeviceName, sizeof info.osDeviceName, fn.ifname);
    info.boardNumber = static_cast<HBA_UINT32>(ref->card);
    info.pciBus = card.pci_bus;
    info.pciDevice = 0;
    info.vendorId = static_cast<HBA_UINT16>(card.vendor_id);
    info.deviceId = static_cast<HBA_UINT16>(card.device_id);
    info.subVendorId = static_cast<HBA_UINT16>(card.sub_vendor_id);
    info.subDeviceId = static_cast<HBA_UINT16>(card.sub_device_id);
    info.functionNumber = fn.pci_function;
    info.physicalPort = static_cast<HBA_UINT16>(fn.port);
    info.protocolMask = protocol_mask(fn.kind);
    info.specialFeatures = 0;
    std::copy(fn.mac.begin(), fn.mac.end(), info.macAddress);
    info.virtualPortCount = static_cast<HBA_UINT32>(fn.vports.size());
    std::memcpy(out, &info, size);
    return RM_STATUS_SUCCESS;
  });
}

struct Images {
  std::mutex mu;
  std::vector<std::string> paths;
};
Images& images() {
  static Images i;
  return i;
}

template <class Entry, class Make>
RM_STATUS table(const char* name, HBA_NAME port, void* buffer, HBA_UINT32* size, Make make) {
  if (auto st = gate(name, RM_STATUS_ERROR, to_wwn(port))) return *st;
  return on_function(port, [&](Site& s, FunctionRef r) -> RM_STATUS {
    std::vector<Entry> list = make(at(s, r));
    return deliver_list(list, sizeof(RM_TABLE_HEADER), buffer, size);
  });
}

template <class Change>
RM_STATUS edit(const char* name, HBA_NAME port, const void* entry, Change change) {
  if (auto st = gate(name, RM_STATUS_ERROR, to_wwn(port))) return *st;
  if (entry == nullptr) return kStatusBadArgument;
  return on_function(port, [&](Site& s, FunctionRef r) -> RM_STATUS {
    Function& fn = at(s, r);
    if (fn.kind == Kind::kFcoe) return RM_STATUS_ITEM_NOT_OFFERED;
    return change(fn);
  });
}

RouteEntry route_of(const RM_ROUTE_ENTRY& e) {
  return RouteEntry{ip_text(e.destination), ip_text(e.subnetMask), ip_text(e.gateway)};
}

}  // namespace

extern "C" {

RM_STATUS RM_GetAdapterType(HBA_NAME a1, HBA_UINT32* type) {
  if (auto st = gate("RM_GetAdapterType", RM_STATUS_ERROR, to_wwn(a1))) return *st;
  if (type == nullptr) return kStatusBadArgument;
  return on_function(a1, [&](Site& s, FunctionRef r) -> RM_STATUS {
    const Kind k = at(s, r).kind;
    *type = k == Kind::kNic ? 2 : k == Kind::kIscsi ? 3 : 4;
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS RM_GetAllLocalHBAInstances(HBA_UINT32* count, HBA_UINT32* list) {
  if (auto st = gate("RM_GetAllLocalHBAInstances", RM_STATUS_ERROR)) return *st;
  if (count == nullptr) return kStatusBadArgument;
  return SimSite::instance().with([&](Site& s) -> RM_STATUS {
    std::vector<HBA_UINT32> all;
    for (const auto& card : s.cards)
      for (const auto& fn : card.functions) all.push_back(fn.instance);
    const HBA_UINT32 room = *count;
    *count = static_cast<HBA_UINT32>(all.size());
    if (room < all.size()) return RM_STATUS_ERROR_BUFFER_TOO_SMALL;
    if (list == nullptr && !all.empty()) return kStatusBadArgument;
    std::copy(all.begin(), all.end(), list);
    return RM_STATUS_SUCCESS;
  });
}

void* RM_GetAttributeValue(void* blob, HBA_UINT16 number, HBA_UINT16* length, HBA_UINT32* status) {
  if (auto st = gate("RM_GetAttributeValue", RM_STATUS_ERROR)) {
    if (status) *status = *st;
    if (length) *length = 0;
    return nullptr;
  }
  return const_cast<void*>(find_attribute(blob, number, length, status));
}

RM_STATUS RM_GetLocalHBAInfo(RM_ADAPTER_INSTANCE* pair, RM_LOCAL_HBA_INFO* info) {
  return local_info("RM_GetLocalHBAInfo", pair, info, sizeof *info);
}

RM_STATUS RM_GetLocalHBAInfoV3(RM_ADAPTER_INSTANCE* pair, RM_LOCAL_HBA_INFO_V3* info) {
  return local_info("RM_GetLocalHBAInfoV3", pair, info, sizeof *info);
}

RM_STATUS RM_GetLocalHBAInfoV4(RM_ADAPTER_INSTANCE* pair, RM_LOCAL_HBA_INFO_V4* info) {
  return local_info("RM_GetLocalHBAInfoV4", pair, info, sizeof *info);
}

void* RM_GetNextVpdEntry(void* cursor, char* keyword, char* value) {
  if (gate("RM_GetNextVpdEntry", RM_STATUS_ERROR)) return nullptr;
  return const_cast<uint8_t*>(next_vpd_entry(static_cast<const uint8_t*>(cursor), keyword, value));
}

HBA_UINT32 RM_GetNumberOfLocalAdapters() {
  if (gate("RM_GetNumberOfLocalAdapters", 0)) return 0;
  return SimSite::instance().with([](Site& s) {
    HBA_UINT32 n = 0;
    for (const auto& card : s.cards) n += static_cast<HBA_UINT32>(card.functions.size());
    return n;
  });
}

// Every library code answers the one version of this library.
RM_STATUS RM_GetVersion(HBA_UINT32 /*library code*/, char* text, HBA_UINT32 size) {
  if (auto st = gate("RM_GetVersion", RM_STATUS_ERROR)) return *st;
  if (text == nullptr || size == 0) return kStatusBadArgument;
  return SimSite::instance().with([&](Site& s) {
    put_text(text, size, s.library.version);
    return RM_STATUS(RM_STATUS_SUCCESS);
  });
}

RM_STATUS RM_TiroVersion(char* text, HBA_UINT32 size) {
  if (auto st = gate("RM_TiroVersion", RM_STATUS_ERROR)) return *st;
  if (text == nullptr || size == 0) return kStatusBadArgument;
  return SimSite::instance().with([&](Site& s) {
    put_text(text, size, s.library.tiro_version);
    return RM_STATUS(RM_STATUS_SUCCESS);
  });
}

RM_STATUS RM_ImportHBAFileA(const char* path, HBA_UINT32* image) {
  if (auto st = gate("RM_ImportHBAFileA", RM_STATUS_ERROR)) return *st;
  if (path == nullptr || image == nullptr) return kStatusBadArgument;
  struct stat sb {};
  if (stat(path, &sb) != 0 || !S_ISREG(sb.st_mode) || sb.st_size == 0) return kStatusNotFound;
  auto& im = images();
  std::lock_guard<std::mutex> lock(im.mu);
  im.paths.push_back(path);
  *image = static_cast<HBA_UINT32>(im.paths.size());  // 0 never names an image
  return RM_STATUS_SUCCESS;
}

RM_STATUS RM_VerifyFirmwareA(HBA_NAME a1, HBA_UINT32 image) {
  if (auto st = gate("RM_VerifyFirmwareA", RM_STATUS_ERROR, to_wwn(a1))) return *st;
  {
    auto& im = images();
    std::lock_guard<std::mutex> lock(im.mu);
    if (image == 0 || image > im.paths.size()) return kStatusNotFound;
  }
  return on_function(a1, [](Site&, FunctionRef) { return RM_STATUS(RM_STATUS_SUCCESS); });
}

RM_STATUS RM_IsLocalHBA(HBA_NAME a1, HBA_UINT32* is_local) {
  if (auto st = gate("RM_IsLocalHBA", RM_STATUS_ERROR, to_wwn(a1))) return *st;
  if (is_local == nullptr) return kStatusBadArgument;
  *is_local = SimSite::instance().with([&](Site& s) { return find_function(s, to_wwn(a1)) ? 1u : 0u; });
  return RM_STATUS_SUCCESS;
}

// NIC functions whose physical port has no link, by identifier text.
RM_STATUS RM_ListDeadNicPorts(void* buffer, HBA_UINT32* size) {
  if (auto st = gate("RM_ListDeadNicPorts", RM_STATUS_ERROR)) return *st;
  struct Entry {
    char id[RM_DEAD_NIC_PORT_ENTRY_SIZE];
  };
  return SimSite::instance().with([&](Site& s) {
    std::vector<Entry> list;
    for (const auto& card : s.cards)
      for (const auto& fn : card.functions)
        if (fn.kind == Kind::kNic && !card.ports[fn.port].link_up) {
          Entry e{};
          put_text(e.id, sizeof e.id, wwn_plain(fn.id));
          list.push_back(e);
        }
    return deliver_list(list, sizeof(RM_TABLE_HEADER), buffer, size);
  });
}

RM_STATUS RM_StatusString(RM_STATUS status, char* text, HBA_UINT32 size) {
  if (text == nullptr || size == 0) return kStatusBadArgument;
  const char* t = "";
  switch (status) {
    case RM_STATUS_SUCCESS: t = "Success"; break;
    case RM_STATUS_ERROR: t = "General error"; break;
    case RM_STATUS_NOT_SUPPORTED: t = "Not supported"; break;
    case kStatusNoSuchAdapter: t = "Adapter not found"; break;
    case kStatusBadArgument: t = "Invalid argument"; break;
    case kStatusNotFound: t = "Item not found"; break;
    case kStatusBadValue: t = "Invalid value"; break;
    case RM_STATUS_ERROR_BUFFER_TOO_SMALL: t = "Buffer too small"; break;
    case kStatusCheckCondition: t = "SCSI check condition"; break;
    case RM_STATUS_ERROR_DIAG_IN_PROGRESS: t = "Diagnostic in progress"; break;
    case RM_STATUS_DIAG_NOT_AVAILABLE: t = "Diagnostics not available"; break;
    case RM_STATUS_ISCSI_DIGEST_MISMATCH: t = "Digest settings refused"; break;
    case RM_STATUS_ITEM_NOT_OFFERED: t = "Not offered by this adapter"; break;
    case RM_STATUS_ERROR_MORE_DATA: t = "More data"; break;
    case RM_STATUS_REBOOT_REQUIRED: t = "Reboot required"; break;
    default: break;  // unknown statuses leave the text empty
  }
  put_text(text, size, t);
  return RM_STATUS_SUCCESS;
}

// A usable port or node name: not all zeros, not all ones, and with a known
// NAA (1, 2, 5 or 6) in its top nibble.
RM_STATUS RM_ValidateWwn(HBA_NAME a1) {
  if (auto st = gate("RM_ValidateWwn", RM_STATUS_ERROR)) return *st;
  const Wwn w = to_wwn(a1);
  Wwn ones;
  ones.fill(0xFF);
  const int naa = w[0] >> 4;
  if (w == Wwn{} || w == ones || !(naa == 1 || naa == 2 || naa == 5 || naa == 6)) return kStatusBadValue;
  return RM_STATUS_SUCCESS;
}

RM_STATUS LRM_Ini_GetARPTable(HBA_NAME a1, void* buffer, HBA_UINT32* size) {
  return table<RM_ARP_ENTRY>("LRM_Ini_GetARPTable", a1, buffer, size, [](const Function& fn) {
    std::vector<RM_ARP_ENTRY> out;
    for (const auto& e : fn.arp) {
      RM_ARP_ENTRY r{};
      r.ipAddress = ip_record(e.ip, 0);
      std::copy(e.mac.begin(), e.mac.end(), r.macAddress);
      out.push_back(r);
    }
    return out;
  });
}

RM_STATUS LRM_Ini_GetRouteTable(HBA_NAME a1, void* buffer, HBA_UINT32* size) {
  return table<RM_ROUTE_ENTRY>("LRM_Ini_GetRouteTable", a1, buffer, size, [](const Function& fn) {
    std::vector<RM_ROUTE_ENTRY> out;
    for (const auto& e : fn.routes) {
      RM_ROUTE_ENTRY r{};
      r.destination = ip_record(e.destination, 0);
      r.subnetMask = ip_record(e.netmask, 0);
      r.gateway = ip_record(e.gateway, 0);
      out.push_back(r);
    }
    return out;
  });
}

RM_STATUS LRM_Ini_AddARPTableEntry(HBA_NAME a1, const RM_ARP_ENTRY* e) {
  return edit("LRM_Ini_AddARPTableEntry", a1, e, [&](Function& fn) -> RM_STATUS {
    const std::string ip = ip_text(e->ipAddress);
    if (ip.empty()) return kStatusBadValue;
    auto it = std::find_if(fn.arp.begin(), fn.arp.end(), [&](const ArpEntry& x) { return x.ip == ip; });
    if (it != fn.arp.end()) return kStatusBadValue;
    ArpEntry entry{ip, {}};
    std::copy_n(e->macAddress, 6, entry.mac.begin());
    fn.arp.push_back(entry);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS LRM_Ini_DeleteARPTableEntry(HBA_NAME a1, const RM_ARP_ENTRY* e) {
  return edit("LRM_Ini_DeleteARPTableEntry", a1, e, [&](Function& fn) -> RM_STATUS {
    const std::string ip = ip_text(e->ipAddress);
    auto it = std::find_if(fn.arp.begin(), fn.arp.end(), [&](const ArpEntry& x) { return x.ip == ip; });
    if (it == fn.arp.end()) return kStatusNotFound;
    fn.arp.erase(it);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS LRM_Ini_AddRouteTableEntry(HBA_NAME a1, const RM_ROUTE_ENTRY* e) {
  return edit("LRM_Ini_AddRouteTableEntry", a1, e, [&](Function& fn) -> RM_STATUS {
    const RouteEntry r = route_of(*e);
    if (r.destination.empty() || r.netmask.empty()) return kStatusBadValue;
    auto it = std::find_if(fn.routes.begin(), fn.routes.end(), [&](const RouteEntry& x) {
      return x.destination == r.destination && x.netmask == r.netmask;
    });
    if (it != fn.routes.end()) return kStatusBadValue;
    fn.routes.push_back(r);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS LRM_Ini_DeleteRouteTableEntry(HBA_NAME a1, const RM_ROUTE_ENTRY* e) {
  return edit("LRM_Ini_DeleteRouteTableEntry", a1, e, [&](Function& fn) -> RM_STATUS {
    const RouteEntry r = route_of(*e);
    auto it = std::find_if(fn.routes.begin(), fn.routes.end(), [&](const RouteEntry& x) {
      return x.destination == r.destination && x.netmask == r.netmask;
    });
    if (it == fn.routes.end()) return kStatusNotFound;
    fn.routes.erase(it);
    return RM_STATUS_SUCCESS;
  });
}

// The card a function sits on, counted from 0 in site order.
HBA_INT32 NrvGetBoardNumber(HBA_NAME a1) {
  if (gate("NrvGetBoardNumber", RM_STATUS_ERROR, to_wwn(a1))) return -1;
  return SimSite::instance().with([&](Site& s) -> HBA_INT32 {
    auto ref = find_function(s, to_wwn(a1));
    return ref ? static_cast<HBA_INT32>(ref->card) : -1;
  });
}

}  // extern "C"
