// The SNIA Common HBA API over the simulated site: one HBA API adapter, with
// one port, per FCoE function, named "com.norvane-<model>-<n>" with n counting
// the site's FCoE functions from 0.  SCSI commands reach the logical units
// that the site puts behind the function's FC targets.
#include <time.h>  // hbaapi.h uses struct tm without including it

#include <hbaapi.h>

#include <algorithm>
#include <cstring>
#include <mutex>
#include <set>

#include "sim/ScsiData.h"
#include "sim/SimSite.h"

namespace {

using nrvsim::FunctionRef;
using nrvsim::SimSite;
using nrvsim::Site;
using nrvsim::Wwn;

Wwn to_wwn(const HBA_WWN& w) {
  Wwn out{};
  std::memcpy(out.data(), w.wwn, 8);
  return out;
}
HBA_WWN to_hba(const Wwn& w) {
  HBA_WWN out{};
  std::memcpy(out.wwn, w.data(), 8);
  return out;
}

void copy_text(char* dst, size_t size, const std::string& s) {
  std::memset(dst, 0, size);
  std::memcpy(dst, s.data(), std::min(s.size(), size - 1));
}

std::vector<FunctionRef> fcoe_functions(const Site& site) {
  std::vector<FunctionRef> out;
  for (size_t c = 0; c < site.cards.size(); ++c)
    for (size_t f = 0; f < site.cards[c].functions.size(); ++f)
      if (site.cards[c].functions[f].kind == nrvsim::Kind::kFcoe && site.cards[c].functions[f].in_hba_api)
        out.push_back({c, f});
  return out;
}

// The identifier of the function a handle is open on, for fault matching.
std::optional<Wwn> handle_id(HBA_HANDLE handle) {
  auto& sim = SimSite::instance();
  auto ref = sim.handle_target(handle);
  if (!ref) return std::nullopt;
  return sim.with([&](Site& s) { return nrvsim::at(s, *ref).id; });
}

struct Callbacks {
  std::mutex mu;
  std::set<void*> live;
  uintptr_t next = 1;
};
Callbacks& callbacks() {
  static Callbacks c;
  return c;
}

// Runs a SCSI command against the unit (port, fcLUN) behind the handle.
template <class Command>
HBA_STATUS scsi_command(const char* name, HBA_HANDLE handle, HBA_WWN port, HBA_UINT64 fc_lun, void* rsp,
                        HBA_UINT32 rsp_size, void* sense, HBA_UINT32 sense_size, Command command) {
  auto& sim = SimSite::instance();
  const auto lun = nrvsim::scsi_lun(static_cast<uint64_t>(fc_lun));
  if (auto st = sim.gate(name, HBA_STATUS_ERROR, handle_id(handle), lun)) return *st;
  auto ref = sim.handle_target(handle);
  if (!ref) return HBA_STATUS_ERROR_INVALID_HANDLE;
  return sim.with([&](Site& s) -> HBA_STATUS {
    const auto& fn = nrvsim::at(s, *ref);
    const Wwn target = to_wwn(port);
    auto t = std::find_if(fn.fc_targets.begin(), fn.fc_targets.end(),
                          [&](const nrvsim::FcTarget& x) { return x.wwpn == target; });
    if (t == fn.fc_targets.end()) return HBA_STATUS_ERROR_ILLEGAL_WWN;
    nrvsim::ScsiReply reply = nrvsim::scsi_no_such_lun();
    if (lun) {
      for (const auto& unit : t->luns)
        if (unit.lun == *lun) reply = command(unit, target);
    }
    if (reply.check_condition) {
      if (rsp) std::memset(rsp, 0, rsp_size);
      nrvsim::copy_reply(reply.sense, sense, sense_size);
      return HBA_STATUS_SCSI_CHECK_CONDITION;
    }
    nrvsim::copy_reply(reply.data, rsp, rsp_size);
    if (sense) std::memset(sense, 0, sense_size);
    return HBA_STATUS_OK;
  });
}

}  // namespace

extern "C" {

HBA_API HBA_UINT32 HBA_GetVersion() { return 2; }

HBA_API HBA_STATUS HBA_LoadLibrary() {
  if (auto st = SimSite::instance().gate("HBA_LoadLibrary", HBA_STATUS_ERROR)) return *st;
  return HBA_STATUS_OK;
}

HBA_API HBA_STATUS HBA_FreeLibrary() { return HBA_STATUS_OK; }

HBA_API HBA_UINT32 HBA_GetNumberOfAdapters() {
  auto& sim = SimSite::instance();
  if (sim.gate("HBA_GetNumberOfAdapters", 0)) return 0;
  return sim.with([](Site& s) { return static_cast<HBA_UINT32>(fcoe_functions(s).size()); });
}

HBA_API HBA_STATUS HBA_GetAdapterName(HBA_UINT32 index, char* name) {
  auto& sim = SimSite::instance();
  if (auto st = sim.gate("HBA_GetAdapterName", HBA_STATUS_ERROR)) return *st;
  if (name == nullptr) return HBA_STATUS_ERROR_ARG;
  return sim.with([&](Site& s) -> HBA_STATUS {
    const auto fns = fcoe_functions(s);
    if (index >= fns.size()) return HBA_STATUS_ERROR_ILLEGAL_INDEX;
    copy_text(name, 256, nrvsim::at(s, fns[index]).hba_name);
    return HBA_STATUS_OK;
  });
}

// A fault rule's "adapter" filter names the function the adapter name belongs to.
HBA_API HBA_HANDLE HBA_OpenAdapter(char* name) {
  auto& sim = SimSite::instance();
  const std::string wanted = name ? std::string(name, strnlen(name, 256)) : std::string();
  auto ref = sim.with([&](Site& s) -> std::optional<FunctionRef> {
    for (const FunctionRef& r : fcoe_functions(s))
      if (nrvsim::at(s, r).hba_name == wanted) return r;
    return std::nullopt;
  });
  std::optional<Wwn> id;
  if (ref) id = sim.with([&](Site& s) { return nrvsim::at(s, *ref).id; });
  if (sim.gate("HBA_OpenAdapter", HBA_HANDLE_INVALID, id)) return HBA_HANDLE_INVALID;
  return ref ? sim.open_handle(*ref) : HBA_HANDLE_INVALID;
}

HBA_API void HBA_CloseAdapter(HBA_HANDLE handle) {
  auto& sim = SimSite::instance();
  (void)sim.gate("HBA_CloseAdapter", 0, handle_id(handle));
  sim.close_handle(handle);
}

HBA_API HBA_STATUS HBA_GetAdapterAttributes(HBA_HANDLE handle, HBA_ADAPTERATTRIBUTES* attrs) {
  auto& sim = SimSite::instance();
  if (auto st = sim.gate("HBA_GetAdapterAttributes", HBA_STATUS_ERROR, handle_id(handle))) return *st;
  if (attrs == nullptr) return HBA_STATUS_ERROR_ARG;
  auto ref = sim.handle_target(handle);
  if (!ref) return HBA_STATUS_ERROR_INVALID_HANDLE;
  return sim.with([&](Site& s) {
    const auto& card = nrvsim::card_of(s, *ref);
    const auto& fn = nrvsim::at(s, *ref);
    std::memset(attrs, 0, sizeof *attrs);
    copy_text(attrs->Manufacturer, sizeof attrs->Manufacturer, card.manufacturer);
    copy_text(attrs->SerialNumber, sizeof attrs->SerialNumber, card.serial);
    copy_text(attrs->Model, sizeof attrs->Model, card.model);
    copy_text(attrs->ModelDescription, sizeof attrs->ModelDescription, card.description);
    attrs->NodeWWN = to_hba(fn.wwnn);
    copy_text(attrs->NodeSymbolicName, sizeof attrs->NodeSymbolicName,
              card.model + " FV" + card.firmware.operational + " DV" + fn.driver_version);
    copy_text(attrs->HardwareVersion, sizeof attrs->HardwareVersion, card.hardware_version);
    copy_text(attrs->DriverVersion, sizeof attrs->DriverVersion, fn.driver_version);
    copy_text(attrs->OptionROMVersion, sizeof attrs->OptionROMVersion, card.firmware.option_rom);
    copy_text(attrs->FirmwareVersion, sizeof attrs->FirmwareVersion, card.firmware.operational);
    attrs->VendorSpecificID = (card.device_id << 16) | card.vendor_id;
    attrs->NumberOfPorts = 1;
    copy_text(attrs->DriverName, sizeof attrs->DriverName, fn.driver_name);
    return HBA_STATUS(HBA_STATUS_OK);
  });
}

HBA_API HBA_STATUS HBA_GetAdapterPortAttributes(HBA_HANDLE handle, HBA_UINT32 portindex,
                                                HBA_PORTATTRIBUTES* attrs) {
  auto& sim = SimSite::instance();
  if (auto st = sim.gate("HBA_GetAdapterPortAttributes", HBA_STATUS_ERROR, handle_id(handle))) return *st;
  if (attrs == nullptr) return HBA_STATUS_ERROR_ARG;
  auto ref = sim.handle_target(handle);
  if (!ref) return HBA_STATUS_ERROR_INVALID_HANDLE;
  if (portindex != 0) return HBA_STATUS_ERROR_ILLEGAL_INDEX;
  return sim.with([&](Site& s) {
    const auto& card = nrvsim::card_of(s, *ref);
    const auto& fn = nrvsim::at(s, *ref);
    const auto& phys = card.ports[fn.port];
    std::memset(attrs, 0, sizeof *attrs);
    attrs->NodeWWN = to_hba(fn.wwnn);
    attrs->PortWWN = to_hba(fn.id);
    attrs->PortFcId = fn.fc_id;
    attrs->PortType = phys.link_up ? HBA_PORTTYPE_NPORT : HBA_PORTTYPE_UNKNOWN;
    attrs->PortState = !phys.enabled ? HBA_PORTSTATE_OFFLINE
                       : phys.link_up ? HBA_PORTSTATE_ONLINE
                                      : HBA_PORTSTATE_LINKDOWN;
    attrs->PortSupportedClassofService = 0x08;  // class 3
    attrs->PortSupportedFc4Types.bits[2] = 0x01;  // FCP
    attrs->PortActiveFc4Types.bits[2] = 0x01;
    copy_text(attrs->PortSymbolicName, sizeof attrs->PortSymbolicName, card.model + " " + fn.hba_name);
    copy_text(attrs->OSDeviceName, sizeof attrs->OSDeviceName, fn.ifname);
    attrs->PortSupportedSpeed = HBA_PORTSPEED_10GBIT;
    attrs->PortSpeed = phys.link_up ? HBA_PORTSPEED_10GBIT : HBA_PORTSPEED_UNKNOWN;
    attrs->PortMaxFrameSize = 2048;
    attrs->FabricName = to_hba(fn.fabric);
    attrs->NumberofDiscoveredPorts = static_cast<HBA_UINT32>(fn.fc_targets.size());
    return HBA_STATUS(HBA_STATUS_OK);
  });
}

HBA_API HBA_STATUS HBA_GetFcpTargetMapping(HBA_HANDLE handle, HBA_FCPTARGETMAPPING* mapping) {
  auto& sim = SimSite::instance();
  if (auto st = sim.gate("HBA_GetFcpTargetMapping", HBA_STATUS_ERROR, handle_id(handle))) return *st;
  if (mapping == nullptr) return HBA_STATUS_ERROR_ARG;
  auto ref = sim.handle_target(handle);
  if (!ref) return HBA_STATUS_ERROR_INVALID_HANDLE;
  return sim.with([&](Site& s) -> HBA_STATUS {
    const auto& fn = nrvsim::at(s, *ref);
    size_t needed = 0;
    for (const auto& t : fn.fc_targets) needed += t.luns.size();
    const HBA_UINT32 capacity = mapping->NumberOfEntries;
    mapping->NumberOfEntries = static_cast<HBA_UINT32>(needed);
    if (capacity < needed) return HBA_STATUS_ERROR_MORE_DATA;
    size_t i = 0;
    for (const auto& t : fn.fc_targets) {
      for (const auto& unit : t.luns) {
        HBA_FCPSCSIENTRY& e = mapping->entry[i++];
        std::memset(&e, 0, sizeof e);
        copy_text(e.ScsiId.OSDeviceName, sizeof e.ScsiId.OSDeviceName, unit.os_device);
        e.ScsiId.ScsiBusNumber = 0;
        e.ScsiId.ScsiTargetNumber = t.scsi_target;
        e.ScsiId.ScsiOSLun = unit.lun;
        e.FcpId.FcId = t.fc_id;
        e.FcpId.NodeWWN = to_hba(t.wwnn);
        e.FcpId.PortWWN = to_hba(t.wwpn);
        e.FcpId.FcpLun = static_cast<HBA_UINT64>(nrvsim::fcp_lun(unit.lun));
      }
    }
    return HBA_STATUS_OK;
  });
}

HBA_API HBA_STATUS HBA_SendScsiInquiry(HBA_HANDLE handle, HBA_WWN PortWWN, HBA_UINT64 fcLUN, HBA_UINT8 EVPD,
                                       HBA_UINT32 PageCode, void* pRspBuffer, HBA_UINT32 RspBufferSize,
                                       void* pSenseBuffer, HBA_UINT32 SenseBufferSize) {
  return scsi_command("HBA_SendScsiInquiry", handle, PortWWN, fcLUN, pRspBuffer, RspBufferSize, pSenseBuffer,
                      SenseBufferSize, [&](const nrvsim::ScsiUnit& unit, const Wwn& target) {
                        return nrvsim::scsi_inquiry(unit, target, EVPD != 0, PageCode);
                      });
}

HBA_API HBA_STATUS HBA_SendReadCapacity(HBA_HANDLE handle, HBA_WWN portWWN, HBA_UINT64 fcLUN, void* pRspBuffer,
                                        HBA_UINT32 RspBufferSize, void* pSenseBuffer,
                                        HBA_UINT32 SenseBufferSize) {
  return scsi_command("HBA_SendReadCapacity", handle, portWWN, fcLUN, pRspBuffer, RspBufferSize, pSenseBuffer,
                      SenseBufferSize,
                      [](const nrvsim::ScsiUnit& unit, const Wwn&) { return nrvsim::scsi_read_capacity(unit); });
}

HBA_API void HBA_RefreshInformation(HBA_HANDLE handle) {
  (void)SimSite::instance().gate("HBA_RefreshInformation", 0, handle_id(handle));
}

HBA_API HBA_STATUS HBA_RegisterForAdapterPortEvents(void (*callback)(void*, HBA_WWN, HBA_UINT32, HBA_UINT32),
                                                    void* userData, HBA_HANDLE handle, HBA_WWN PortWWN,
                                                    HBA_CALLBACKHANDLE* callbackHandle) {
  auto& sim = SimSite::instance();
  if (auto st = sim.gate("HBA_RegisterForAdapterPortEvents", HBA_STATUS_ERROR, handle_id(handle))) return *st;
  if (callback == nullptr || callbackHandle == nullptr) return HBA_STATUS_ERROR_ARG;
  if (!sim.handle_target(handle)) return HBA_STATUS_ERROR_INVALID_HANDLE;
  // The site never changes behind the caller's back, so no event is ever
  // delivered; the registration only has to be removable.
  auto& cb = callbacks();
  std::lock_guard<std::mutex> lock(cb.mu);
  void* token = reinterpret_cast<void*>(cb.next++);  // opaque to the caller, never dereferenced
  cb.live.insert(token);
  *callbackHandle = token;
  return HBA_STATUS_OK;
}

HBA_API HBA_STATUS HBA_RemoveCallback(HBA_CALLBACKHANDLE callbackHandle) {
  if (auto st = SimSite::instance().gate("HBA_RemoveCallback", HBA_STATUS_ERROR)) return *st;
  auto& cb = callbacks();
  std::lock_guard<std::mutex> lock(cb.mu);
  return cb.live.erase(callbackHandle) ? HBA_STATUS_OK : HBA_STATUS_ERROR_INVALID_HANDLE;
}

}  // extern "C"
