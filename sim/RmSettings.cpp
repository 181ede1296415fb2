// Settings of the converged functions: FIP and FCF lists of an FCoE function,
// DCB (CEE) state of a physical port, QoS limits, adapter attributes written
// by number, boot and network-boot state, PHY speed and server attributes.
#include <algorithm>
#include <numeric>

#include "access/RM_SettingRecords.h"
#include "sim/AttributeBlob.h"
#include "sim/RmCommon.h"

namespace nrvsim::rm {
namespace {

constexpr HBA_UINT16 kFirstPortAttribute = 768;

template <class F>
RM_STATUS on_fcoe_fn(HBA_NAME name, F&& f) {
  return on_function(name, [&](Site& s, FunctionRef r) -> RM_STATUS {
    Function& fn = at(s, r);
    if (fn.kind != Kind::kFcoe) return RM_STATUS_ITEM_NOT_OFFERED;
    return f(s, r, fn);
  });
}

// DCB belongs to the physical port; a card without the DCB feature has none.
template <class F>
RM_STATUS on_dcb(HBA_NAME name, F&& f) {
  return on_function(name, [&](Site& s, FunctionRef r) -> RM_STATUS {
    const auto list = features_of(card_of(s, r), at(s, r));
    if (std::find(list.begin(), list.end(), RM_FEATURE_DCB) == list.end()) return RM_STATUS_ITEM_NOT_OFFERED;
    return f(card_of(s, r).ports[at(s, r).port].dcb);
  });
}

template <class Record>
bool read_record(const void* data, HBA_UINT32 size, Record& out) {
  if (data == nullptr || size < sizeof(Record)) return false;
  std::memcpy(&out, data, sizeof out);
  return true;
}

RM_STATUS set_item(HBA_NAME name, const void* data, HBA_UINT32 size, std::initializer_list<HBA_UINT32> allowed) {
  RM_CEE_ITEM item{};
  if (!read_record(data, size, item)) return kStatusBadArgument;
  if (std::find(allowed.begin(), allowed.end(), item.item) == allowed.end()) return kStatusBadValue;
  return on_dcb(name, [&](DcbSettings& d) -> RM_STATUS {
    switch (item.item) {
      case RM_CEE_DCBX_STATE: d.dcbx_state = item.value; break;
      case RM_CEE_LLDP_TX_STATE: d.lldp_tx = item.value; break;
      case RM_CEE_LLDP_RX_STATE: d.lldp_rx = item.value; break;
      case RM_CEE_PFC_ENABLED: d.pfc_enabled = item.value; break;
      case RM_CEE_FCOE_PRIORITY:
      case RM_CEE_ISCSI_PRIORITY:
      case RM_CEE_ROCE_PRIORITY:
        if (item.value > 7) return kStatusBadValue;
        (item.item == RM_CEE_FCOE_PRIORITY    ? d.fcoe_priority
         : item.item == RM_CEE_ISCSI_PRIORITY ? d.iscsi_priority
                                              : d.roce_priority) = item.value;
        break;
    }
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS set_groups(HBA_NAME name, const void* data, HBA_UINT32 size) {
  RM_PG_PRIORITY_BITMAPS groups{};
  if (!read_record(data, size, groups)) return kStatusBadArgument;
  // Each priority belongs to one group at most.
  uint8_t seen = groups.group15;
  for (uint8_t g : groups.groups) {
    if (seen & g) return kStatusBadValue;
    seen |= g;
  }
  return on_dcb(name, [&](DcbSettings& d) {
    std::copy(std::begin(groups.groups), std::end(groups.groups), d.groups.begin());
    d.group15 = groups.group15;
    return RM_STATUS(RM_STATUS_SUCCESS);
  });
}

uint32_t tlv_index(HBA_UINT32 tlv) { return tlv - RM_TLV_PORT_DESCRIPTION; }
bool tlv_known(HBA_UINT32 tlv) { return tlv >= RM_TLV_PORT_DESCRIPTION && tlv <= RM_TLV_SYSTEM_CAPABILITIES; }

}  // namespace

RM_STATUS handle_CNA_FCOE_GetFIPParams(HBA_NAME a1, void* buffer, HBA_UINT32* size) {
  return on_fcoe_fn(a1, [&](Site&, FunctionRef, Function& fn) {
    RM_FIP_PARAMS rec{};
    std::copy(fn.fip.fc_map.begin(), fn.fip.fc_map.end(), rec.fcMap);
    rec.cinVlanId = fn.fip.cin_vlan;
    return deliver_bytes(&rec, sizeof rec, buffer, size);
  });
}

RM_STATUS handle_CNA_FCOE_SetFIPParams(HBA_NAME a1, const void* data, HBA_UINT32 size) {
  RM_FIP_PARAMS rec{};
  if (!read_record(data, size, rec)) return kStatusBadArgument;
  if (rec.cinVlanId > 4094) return kStatusBadValue;
  return on_fcoe_fn(a1, [&](Site&, FunctionRef, Function& fn) {
    std::copy(std::begin(rec.fcMap), std::end(rec.fcMap), fn.fip.fc_map.begin());
    fn.fip.cin_vlan = rec.cinVlanId;
    return RM_STATUS(RM_STATUS_SUCCESS);
  });
}

RM_STATUS handle_CNA_FCOE_GetFCFConnectList(HBA_NAME a1, void* buffer, HBA_UINT32* size) {
  return on_fcoe_fn(a1, [&](Site&, FunctionRef, Function& fn) {
    RM_FCF_CONNECT_LIST rec{};
    rec.fabricName = to_name(fn.fip.connect_fabric);
    rec.switchName = to_name(fn.fip.connect_switch);
    rec.flags = fn.fip.connect_flags;
    rec.vlanId = fn.fip.connect_vlan;
    return deliver_bytes(&rec, sizeof rec, buffer, size);
  });
}

RM_STATUS handle_CNA_FCOE_SetFCFConnectList(HBA_NAME a1, const void* data, HBA_UINT32 size) {
  RM_FCF_CONNECT_LIST rec{};
  if (!read_record(data, size, rec)) return kStatusBadArgument;
  if ((rec.flags & RM_FCF_CONNECT_VLAN_VALID) && (rec.vlanId == 0 || rec.vlanId > 4094)) return kStatusBadValue;
  return on_fcoe_fn(a1, [&](Site&, FunctionRef, Function& fn) {
    fn.fip.connect_fabric = to_wwn(rec.fabricName);
    fn.fip.connect_switch = to_wwn(rec.switchName);
    fn.fip.connect_flags = rec.flags;
    fn.fip.connect_vlan = rec.vlanId;
    return RM_STATUS(RM_STATUS_SUCCESS);
  });
}

// One FCF per FCoE function: the fabric's, active while the link is up.
RM_STATUS handle_CNA_FCOE_GetFcfList(HBA_NAME a1, void* buffer) {
  if (buffer == nullptr) return kStatusBadArgument;
  return on_fcoe_fn(a1, [&](Site& s, FunctionRef r, Function& fn) -> RM_STATUS {
    RM_FCF_LIST_HEADER header{};
    std::memcpy(&header, buffer, sizeof header);
    const bool up = card_of(s, r).ports[fn.port].link_up;
    const HBA_UINT32 room = header.count;
    header.count = 1;
    header.activeCount = up ? 1 : 0;
    std::memcpy(buffer, &header, sizeof header);
    if (room < 1) return RM_STATUS_ERROR_BUFFER_TOO_SMALL;
    RM_FCF_ENTRY e;
    std::memset(&e, 0, sizeof e);
    e.fabricName = to_name(fn.fabric);
    Wwn sw = fn.fabric;
    sw[0] = 0x20;
    e.switchName = to_name(sw);
    std::copy(fn.fip.fcf_mac.begin(), fn.fip.fcf_mac.end(), e.fcfMac);
    e.state = up ? 1 : 0;
    e.vlanBitmap[fn.fip.fcf_vlan / 8] = static_cast<HBA_UINT8>(1u << (fn.fip.fcf_vlan % 8));
    std::copy(fn.fip.fc_map.begin(), fn.fip.fc_map.end(), e.fcMap);
    e.period = 8000;
    e.priority = 128;
    std::memcpy(static_cast<char*>(buffer) + sizeof header, &e, sizeof e);
    return RM_STATUS_SUCCESS;
  });
}

// The CEE parameters are an attribute blob keyed by the RM_CEE_* item
// numbers, 100 + TLV number (transmit flags), 20-27 and 28 (priority-group
// bitmaps and group 15), 30-37 (group bandwidths), 38 (PFC priority bitmap),
// 40 and 41 (DCBX operating and maximum version), 42 (groups supported).
RM_STATUS handle_CNA_GetCEE_Params(HBA_NAME a1, void* buffer, HBA_UINT32* size) {
  return on_dcb(a1, [&](DcbSettings& d) {
    BlobWriter w;
    w.u32(RM_CEE_DCBX_STATE, d.dcbx_state);
    w.u32(RM_CEE_LLDP_TX_STATE, d.lldp_tx);
    w.u32(RM_CEE_LLDP_RX_STATE, d.lldp_rx);
    w.u32(RM_CEE_PFC_ENABLED, d.pfc_enabled);
    w.u32(RM_CEE_FCOE_PRIORITY, d.fcoe_priority);
    w.u32(RM_CEE_ISCSI_PRIORITY, d.iscsi_priority);
    w.u32(RM_CEE_ROCE_PRIORITY, d.roce_priority);
    for (uint32_t t = RM_TLV_PORT_DESCRIPTION; t <= RM_TLV_SYSTEM_CAPABILITIES; ++t)
      w.u32(static_cast<uint16_t>(100 + t), d.tlv_transmit[tlv_index(t)]);
    for (uint16_t g = 0; g < 8; ++g) {
      w.u32(static_cast<uint16_t>(20 + g), d.groups[g]);
      w.u32(static_cast<uint16_t>(30 + g), d.bandwidth[g]);
    }
    w.u32(28, d.group15);
    w.u32(38, d.pfc_bitmap);
    w.u32(40, 2);
    w.u32(41, 2);
    w.u32(42, 8);
    return deliver(w.finish(), buffer, size);
  });
}

RM_STATUS handle_CNA_GetPGPriorityBitmaps(HBA_NAME a1, void* buffer, HBA_UINT32* size) {
  return on_dcb(a1, [&](DcbSettings& d) {
    RM_PG_PRIORITY_BITMAPS rec{};
    std::copy(d.groups.begin(), d.groups.end(), rec.groups);
    rec.group15 = d.group15;
    return deliver_bytes(&rec, sizeof rec, buffer, size);
  });
}

RM_STATUS handle_CNA_SetPGPriorityBitmaps(HBA_NAME a1, const void* data, HBA_UINT32 size) {
  return set_groups(a1, data, size);
}
RM_STATUS handle_CNA_SetPGPriorityBitmapsExt(HBA_NAME a1, const void* data, HBA_UINT32 size) {
  return set_groups(a1, data, size);
}

RM_STATUS handle_CNA_SetPGBandwidth(HBA_NAME a1, const void* data, HBA_UINT32 size) {
  RM_PG_BANDWIDTH bw{};
  if (!read_record(data, size, bw)) return kStatusBadArgument;
  if (std::accumulate(std::begin(bw.percent), std::end(bw.percent), 0) != 100) return kStatusBadValue;
  return on_dcb(a1, [&](DcbSettings& d) {
    std::copy(std::begin(bw.percent), std::end(bw.percent), d.bandwidth.begin());
    return RM_STATUS(RM_STATUS_SUCCESS);
  });
}

// Either the PFC priority bitmap (4 bytes) or a CEE item (8 bytes).
RM_STATUS handle_CNA_SetPFC(HBA_NAME a1, const void* data, HBA_UINT32 size) {
  if (size >= sizeof(RM_CEE_ITEM)) return set_item(a1, data, size, {RM_CEE_PFC_ENABLED});
  RM_PFC_SETTING pfc{};
  if (!read_record(data, size, pfc)) return kStatusBadArgument;
  return on_dcb(a1, [&](DcbSettings& d) {
    d.pfc_bitmap = pfc.priorityBitmap;
    return RM_STATUS(RM_STATUS_SUCCESS);
  });
}

RM_STATUS handle_CNA_SetDcbxPortVars(HBA_NAME a1, const void* data, HBA_UINT32 size) {
  return set_item(a1, data, size, {RM_CEE_DCBX_STATE});
}
RM_STATUS handle_CNA_SetLldp(HBA_NAME a1, const void* data, HBA_UINT32 size) {
  return set_item(a1, data, size, {RM_CEE_LLDP_TX_STATE, RM_CEE_LLDP_RX_STATE});
}
RM_STATUS handle_CNA_SetPGSetting(HBA_NAME a1, const void* data, HBA_UINT32 size) {
  return set_item(a1, data, size, {RM_CEE_FCOE_PRIORITY, RM_CEE_ISCSI_PRIORITY, RM_CEE_ROCE_PRIORITY});
}

RM_STATUS handle_CNA_SetTLV(HBA_NAME a1, HBA_UINT32 tlv, const void* data, HBA_UINT32 size) {
  HBA_UINT32 value = 0;
  if (!tlv_known(tlv)) return kStatusBadValue;
  if (!read_record(data, size, value)) return kStatusBadArgument;
  return on_dcb(a1, [&](DcbSettings& d) {
    d.tlv_transmit[tlv_index(tlv)] = value != 0 ? 1 : 0;
    return RM_STATUS(RM_STATUS_SUCCESS);
  });
}

RM_STATUS handle_CNA_GetTLV(HBA_NAME a1, HBA_UINT32 tlv, void* buffer, HBA_UINT32* size) {
  if (!tlv_known(tlv)) return kStatusBadValue;
  return on_dcb(a1, [&](DcbSettings& d) {
    const HBA_UINT32 value = d.tlv_transmit[tlv_index(tlv)];
    return deliver_bytes(&value, sizeof value, buffer, size);
  });
}

RM_STATUS handle_GetQoS(HBA_NAME a1, void* buffer, HBA_UINT32* size) {
  return on_function(a1, [&](Site& s, FunctionRef r) {
    const QosLimits& q = at(s, r).qos;
    RM_QOS_LIMITS rec{q.max_bytes_per_second, q.max_ios_per_second, q.max_bits_per_second, 0};
    return deliver_bytes(&rec, sizeof rec, buffer, size);
  });
}

RM_STATUS handle_SetQoS(HBA_NAME a1, const void* data, HBA_UINT32 size) {
  RM_QOS_LIMITS rec{};
  if (!read_record(data, size, rec)) return kStatusBadArgument;
  return on_function(a1, [&](Site& s, FunctionRef r) {
    at(s, r).qos = QosLimits{rec.maxBytesPerSecond, rec.maxIOsPerSecond, rec.maxBitsPerSecond};
    return RM_STATUS(RM_STATUS_SUCCESS);
  });
}

// The value lands among the site's overrides, so the next attribute blob
// carries it: 4-byte values as integers, anything else as text.
RM_STATUS handle_SetAdapterAttribute(HBA_NAME a1, HBA_UINT32 attribute, const void* data, HBA_UINT32 size) {
  if (data == nullptr || size == 0 || attribute > UINT16_MAX) return kStatusBadArgument;
  AttrValue value;
  if (size == sizeof(uint32_t)) {
    uint32_t v = 0;
    std::memcpy(&v, data, sizeof v);
    value = v;
  } else {
    value = get_text(static_cast<const char*>(data), size);
  }
  return on_function(a1, [&](Site& s, FunctionRef r) {
    Function& fn = at(s, r);
    auto& overrides = attribute >= kFirstPortAttribute ? fn.port_overrides : fn.hba_overrides;
    overrides[static_cast<uint16_t>(attribute)] = value;
    return RM_STATUS(RM_STATUS_SUCCESS);
  });
}

RM_STATUS handle_SetBootBiosState(HBA_NAME a1, HBA_UINT32 state) {
  if (state > 1) return kStatusBadValue;
  return on_function(a1, [&](Site& s, FunctionRef r) {
    at(s, r).hba_overrides[RM_HA_BOOT_CODE_ENABLED] = state;
    return RM_STATUS(RM_STATUS_SUCCESS);
  });
}

// 'E' enables network boot with `method` ("pxe" or "ibft"), 'D' disables it.
RM_STATUS handle_SetNetbootParams(HBA_NAME a1, char mode, const char* method) {
  const std::string m = get_text(method, 16);
  if ((mode != 'E' && mode != 'D') || (mode == 'E' && m != "pxe" && m != "ibft")) return kStatusBadValue;
  return on_function(a1, [&](Site& s, FunctionRef r) {
    Function& fn = at(s, r);
    fn.hba_overrides[RM_HA_BOOT_CODE_ENABLED] = uint32_t{mode == 'E' ? 1u : 0u};
    if (mode == 'E') fn.hba_overrides[RM_HA_NETBOOT_METHOD] = m;
    return RM_STATUS(RM_STATUS_SUCCESS);
  });
}

// Speed texts: "auto", "10G", "1G", "100M" (case ignored).
RM_STATUS handle_SetPhyPortSpeedSettings(HBA_NAME a1, const char* speed, HBA_UINT32, HBA_UINT32) {
  std::string text = get_text(speed, 16);
  std::transform(text.begin(), text.end(), text.begin(), [](unsigned char c) { return static_cast<char>(std::toupper(c)); });
  uint32_t mbps = 0;
  if (text == "10G") mbps = 10000;
  else if (text == "1G") mbps = 1000;
  else if (text == "100M") mbps = 100;
  else if (text != "AUTO") return kStatusBadValue;
  return on_function(a1, [&](Site& s, FunctionRef r) {
    PhysicalPort& port = card_of(s, r).ports[at(s, r).port];
    port.speed_mbps = mbps == 0 ? port.max_speed_mbps : std::min(mbps, port.max_speed_mbps);
    return RM_STATUS(RM_STATUS_SUCCESS);
  });
}

RM_STATUS handle_GetServerAttributes(HBA_NAME a1, void* buffer, HBA_UINT32* size) {
  return on_function(a1, [&](Site& s, FunctionRef) {
    std::vector<char> rec(RM_SERVER_ATTRIBUTES_SIZE, 0);
    put_text(rec.data(), RM_TARGET_OS_TEXT_SIZE, s.library.target_os);
    return deliver_bytes(rec.data(), rec.size(), buffer, size);
  });
}

}  // namespace nrvsim::rm
