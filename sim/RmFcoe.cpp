// FCoE function operations of the management library: driver parameters,
// virtual ports, world-wide name management and the SCSI pass-through to the
// function's FC targets.
#include <algorithm>

#include "sim/RmCommon.h"
#include "sim/RmRecords.h"
#include "sim/ScsiData.h"

namespace nrvsim::rm {
namespace {

template <class F>
RM_STATUS on_fcoe(HBA_NAME name, F&& f) {
  return on_function(name, [&](Site& s, FunctionRef r) -> RM_STATUS {
    Function& fn = at(s, r);
    if (fn.kind != Kind::kFcoe) return RM_STATUS_ITEM_NOT_OFFERED;
    return f(s, fn);
  });
}

RM_STATUS deliver_params(const std::vector<DriverParam>& params, void* records, HBA_UINT32* count) {
  if (count == nullptr) return kStatusBadArgument;
  const HBA_UINT32 room = *count;
  *count = static_cast<HBA_UINT32>(params.size());
  if (room < params.size()) return RM_STATUS_ERROR_BUFFER_TOO_SMALL;
  if (records == nullptr && !params.empty()) return kStatusBadArgument;
  auto* out = static_cast<DriverParamRecord*>(records);
  for (size_t i = 0; i < params.size(); ++i) {
    DriverParamRecord rec;
    std::memset(&rec, 0, sizeof rec);
    put_text(rec.name, sizeof rec.name, params[i].name);
    rec.minValue = params[i].min;
    rec.maxValue = params[i].max;
    rec.defaultValue = params[i].def;
    rec.currentValue = params[i].current;
    put_text(rec.help, sizeof rec.help, params[i].help);
    rec.exportFlag = params[i].exported;
    rec.changeableType = params[i].changeable;
    std::memcpy(out + i, &rec, sizeof rec);
  }
  return RM_STATUS_SUCCESS;
}

const ScsiUnit* find_unit(const Function& fn, const HBA_NAME& target, HBA_UINT64 lun, const FcTarget** owner) {
  const Wwn wanted = to_wwn(target);
  const auto scsi = scsi_lun(static_cast<uint64_t>(lun));
  for (const auto& t : fn.fc_targets) {
    if (t.wwpn != wanted) continue;
    if (owner) *owner = &t;
    for (const auto& u : t.luns)
      if (scsi && u.lun == *scsi) return &u;
  }
  return nullptr;
}

// SCSI pass-through with the library's size-in/out convention.
RM_STATUS answer(const ScsiReply& reply, void* rsp, HBA_UINT32* rsp_size, void* sense, HBA_UINT32* sense_size) {
  auto put = [](const std::vector<uint8_t>& data, void* buf, HBA_UINT32* size) {
    if (buf == nullptr || size == nullptr) return;
    copy_reply(data, buf, *size);
    *size = static_cast<HBA_UINT32>(std::min<size_t>(data.size(), *size));
  };
  if (reply.check_condition) {
    if (rsp_size) *rsp_size = 0;
    put(reply.sense, sense, sense_size);
    return kStatusCheckCondition;
  }
  put(reply.data, rsp, rsp_size);
  if (sense_size) *sense_size = 0;
  return RM_STATUS_SUCCESS;
}

bool name_in_use(const Site& s, const Function& self, const Wwn& name) {
  for (const auto& card : s.cards)
    for (const auto& fn : card.functions) {
      if (&fn != &self && (fn.id == name || (fn.kind == Kind::kFcoe && fn.wwnn == name))) return true;
      for (const auto& v : fn.vports)
        if (v.wwpn == name) return true;
    }
  return false;
}

}  // namespace

RM_STATUS handle_GetDriverParams(HBA_NAME a1, void* records, HBA_UINT32* count) {
  return on_fcoe(a1, [&](Site&, Function& fn) { return deliver_params(fn.driver_params, records, count); });
}

RM_STATUS handle_GetDriverParamsGlobal(HBA_NAME a1, void* records, HBA_UINT32* count) {
  return on_fcoe(a1, [&](Site& s, Function&) {
    return deliver_params(s.library.global_driver_params, records, count);
  });
}

RM_STATUS handle_SetDriverParam(HBA_NAME a1, HBA_UINT32 global, HBA_UINT32 /*persistent*/, const char* name,
                                const char* value) {
  const std::string key = get_text(name, 32);
  const std::string text = get_text(value, 64);
  unsigned long long v = 0;
  try {
    size_t used = 0;
    v = std::stoull(text, &used, 0);
    if (used != text.size()) return kStatusBadValue;
  } catch (const std::exception&) {
    return kStatusBadValue;
  }
  return on_fcoe(a1, [&](Site& s, Function& fn) -> RM_STATUS {
    auto& list = global ? s.library.global_driver_params : fn.driver_params;
    auto it = std::find_if(list.begin(), list.end(), [&](const DriverParam& p) { return p.name == key; });
    if (it == list.end()) return kStatusNotFound;
    if (it->changeable == 0 || v < it->min || v > it->max) return kStatusBadValue;
    it->current = static_cast<uint32_t>(v);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_VPList(HBA_NAME a1, void* buffer, HBA_UINT32* size) {
  return on_fcoe(a1, [&](Site&, Function& fn) {
    std::vector<RM_VPORT_ENTRY> list(fn.vports.size());
    for (size_t i = 0; i < list.size(); ++i) {
      list[i] = RM_VPORT_ENTRY{};
      list[i].portName = to_name(fn.vports[i].wwpn);
      list[i].nodeName = to_name(fn.vports[i].wwnn);
      list[i].fcId = fn.vports[i].fc_id;
    }
    return deliver_list(list, sizeof(HBA_UINT32), buffer, size);
  });
}

RM_STATUS handle_VPGetAttributes(HBA_NAME a1, HBA_NAME vport, void* buffer, HBA_UINT32* size) {
  return on_fcoe(a1, [&](Site&, Function& fn) -> RM_STATUS {
    for (const auto& v : fn.vports) {
      if (v.wwpn != to_wwn(vport)) continue;
      VPortAttributes rec;
      std::memset(&rec, 0, sizeof rec);
      rec.portName = to_name(v.wwpn);
      rec.nodeName = to_name(v.wwnn);
      rec.fcId = v.fc_id;
      rec.state = v.state;
      put_text(rec.name, sizeof rec.name, v.name);
      put_text(rec.vmName, sizeof rec.vmName, v.vm_name);
      return deliver_bytes(&rec, sizeof rec, buffer, size);
    }
    return kStatusNotFound;
  });
}

// Types: 0 volatile, 1 non-volatile, 2 factory default, 3 current, 4 configured.
RM_STATUS handle_ReadWWN(HBA_NAME a1, HBA_UINT32 type, HBA_NAME* wwpn, HBA_NAME* wwnn, HBA_UINT32* pending) {
  if (wwpn == nullptr || wwnn == nullptr) return kStatusBadArgument;
  return on_fcoe(a1, [&](Site&, Function& fn) -> RM_STATUS {
    Wwn p{}, n{};
    switch (type) {
      case 0:
        if (fn.volatile_names) p = fn.id, n = fn.wwnn;
        break;
      case 1:
      case 4: p = fn.nv_id, n = fn.nv_wwnn; break;
      case 2: p = fn.factory_id, n = fn.factory_wwnn; break;
      case 3: p = fn.id, n = fn.wwnn; break;
      default: return kStatusBadValue;
    }
    *wwpn = to_name(p);
    *wwnn = to_name(n);
    if (pending) *pending = 0;
    return RM_STATUS_SUCCESS;
  });
}

// The simulated firmware applies a change at once (no reset, no reboot), so
// the next discovery already sees the new names.
RM_STATUS handle_ChangeWWN(HBA_NAME a1, HBA_UINT32 type, HBA_NAME wwpn, HBA_NAME wwnn, HBA_UINT32* op_status) {
  if (type > 1) return kStatusBadValue;
  const Wwn p = to_wwn(wwpn), n = to_wwn(wwnn);
  if (p == Wwn{} || n == Wwn{}) return kStatusBadValue;
  return on_fcoe(a1, [&](Site& s, Function& fn) -> RM_STATUS {
    if (name_in_use(s, fn, p) || (n != p && name_in_use(s, fn, n))) return kStatusBadValue;
    fn.id = p;
    fn.wwnn = n;
    fn.volatile_names = type == 0;
    if (type == 1) fn.nv_id = p, fn.nv_wwnn = n;
    if (op_status) *op_status = 0;
    return RM_STATUS_SUCCESS;
  });
}

// Types: 0 factory default, 1 non-volatile.
RM_STATUS handle_RestoreWWN(HBA_NAME a1, HBA_UINT32 type, HBA_UINT32* op_status) {
  if (type > 1) return kStatusBadValue;
  return on_fcoe(a1, [&](Site& s, Function& fn) -> RM_STATUS {
    const Wwn p = type == 0 ? fn.factory_id : fn.nv_id;
    const Wwn n = type == 0 ? fn.factory_wwnn : fn.nv_wwnn;
    if (p != fn.id && name_in_use(s, fn, p)) return kStatusBadValue;
    fn.id = p;
    fn.wwnn = n;
    if (type == 0) fn.nv_id = p, fn.nv_wwnn = n;
    fn.volatile_names = false;
    if (op_status) *op_status = 0;
    return RM_STATUS_SUCCESS;
  });
}

// Bits: 0x1 volatile names changeable, 0x2 non-volatile names changeable,
// 0x4 activation needs an HBA reset, 0x8 activation needs a reboot.
RM_STATUS handle_GetWWNCapability(HBA_NAME a1, HBA_UINT32* bits) {
  if (bits == nullptr) return kStatusBadArgument;
  return on_fcoe(a1, [&](Site&, Function&) -> RM_STATUS {
    *bits = 0x1 | 0x2;
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_GetFcpTargetMapping(HBA_NAME a1, void* buffer, HBA_UINT32* size) {
  return on_fcoe(a1, [&](Site&, Function& fn) -> RM_STATUS {
    std::vector<HBA_FCPSCSIENTRY> list;
    for (const auto& t : fn.fc_targets) {
      for (const auto& u : t.luns) {
        HBA_FCPSCSIENTRY e;
        std::memset(&e, 0, sizeof e);
        put_text(e.ScsiId.OSDeviceName, sizeof e.ScsiId.OSDeviceName, u.os_device);
        e.ScsiId.ScsiTargetNumber = t.scsi_target;
        e.ScsiId.ScsiOSLun = u.lun;
        e.FcpId.FcId = t.fc_id;
        e.FcpId.NodeWWN = to_name(t.wwnn);
        e.FcpId.PortWWN = to_name(t.wwpn);
        e.FcpId.FcpLun = static_cast<HBA_UINT64>(fcp_lun(u.lun));
        list.push_back(e);
      }
    }
    return deliver_list(list, offsetof(HBA_FCPTARGETMAPPING, entry), buffer, size);
  });
}

RM_STATUS handle_ScsiInquiry(HBA_NAME a1, HBA_NAME target, HBA_UINT64 lun, HBA_UINT8 evpd, HBA_UINT32 page,
                             void* rsp, HBA_UINT32* rsp_size, void* sense, HBA_UINT32* sense_size) {
  return on_fcoe(a1, [&](Site&, Function& fn) -> RM_STATUS {
    const FcTarget* owner = nullptr;
    const ScsiUnit* u = find_unit(fn, target, lun, &owner);
    if (owner == nullptr) return kStatusNotFound;
    const ScsiReply reply = u ? scsi_inquiry(*u, owner->wwpn, evpd != 0, page) : scsi_no_such_lun();
    return answer(reply, rsp, rsp_size, sense, sense_size);
  });
}

RM_STATUS handle_ScsiReadCapacity(HBA_NAME a1, HBA_NAME target, HBA_UINT64 lun, void* rsp, HBA_UINT32* rsp_size,
                                  void* sense, HBA_UINT32* sense_size) {
  return on_fcoe(a1, [&](Site&, Function& fn) -> RM_STATUS {
    const FcTarget* owner = nullptr;
    const ScsiUnit* u = find_unit(fn, target, lun, &owner);
    if (owner == nullptr) return kStatusNotFound;
    const ScsiReply reply = u ? scsi_read_capacity(*u) : scsi_no_such_lun();
    return answer(reply, rsp, rsp_size, sense, sense_size);
  });
}

RM_STATUS handle_SetOASLunState(HBA_NAME a1, HBA_NAME /*initiator*/, HBA_NAME target, HBA_UINT64 lun,
                                HBA_UINT32 state, HBA_UINT32 /*option*/) {
  return on_fcoe(a1, [&](Site&, Function& fn) -> RM_STATUS {
    const FcTarget* owner = nullptr;
    if (find_unit(fn, target, lun, &owner) == nullptr) return kStatusNotFound;
    for (auto& t : fn.fc_targets)
      if (&t == owner)
        for (auto& u : t.luns)
          if (scsi_lun(static_cast<uint64_t>(lun)) == u.lun) u.oas = state != 0;
    return RM_STATUS_SUCCESS;
  });
}


RM_STATUS handle_VPDelete(HBA_NAME a1, HBA_NAME vport) {
  return on_fcoe(a1, [&](Site&, Function& fn) -> RM_STATUS {
    auto it = std::find_if(fn.vports.begin(), fn.vports.end(), [&](const VPort& v) { return v.wwpn == to_wwn(vport); });
    if (it == fn.vports.end()) return kStatusNotFound;
    fn.vports.erase(it);
    return RM_STATUS_SUCCESS;
  });
}

}  // namespace nrvsim::rm
