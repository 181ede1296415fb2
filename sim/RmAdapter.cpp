// Management-library operations on a function as a whole: initialisation,
// attribute and statistics blobs, features, PCI registers, port enable,
// beacon, the dump settings and the event-log configuration.
#include <algorithm>

#include "access/RM_SettingRecords.h"
#include "sim/AttributeBlob.h"
#include "sim/AttributeSets.h"
#include "sim/RmCommon.h"
#include "sim/RmRecords.h"

namespace nrvsim::rm {
namespace {

template <class Build>
RM_STATUS blob_call(HBA_NAME name, void* buffer, HBA_UINT32* size, Build build) {
  return on_function(name, [&](Site& s, FunctionRef r) -> RM_STATUS {
    return deliver(build(card_of(s, r), at(s, r)), buffer, size);
  });
}

}  // namespace

RM_STATUS handle_InitLib() {
  return SimSite::instance().with([](Site& s) { return s.library.init_status; });
}

RM_STATUS handle_ExitLib() { return RM_STATUS_SUCCESS; }

RM_STATUS handle_GetHBAAttributes(HBA_NAME a1, void* a2, HBA_UINT32* a3) {
  return blob_call(a1, a2, a3, hba_attribute_blob);
}

RM_STATUS handle_GetPortAttributes(HBA_NAME a1, void* a2, HBA_UINT32* a3) {
  return blob_call(a1, a2, a3, port_attribute_blob);
}

RM_STATUS handle_GetPortState(HBA_NAME a1, void* a2, HBA_UINT32* a3) {
  return blob_call(a1, a2, a3, port_attribute_blob);
}

RM_STATUS handle_GetPortStatistics(HBA_NAME a1, void* a2, HBA_UINT32* a3) {
  return blob_call(a1, a2, a3, port_statistics_blob);
}

RM_STATUS handle_GetHBAFeature(HBA_NAME a1, HBA_UINT32 feature, HBA_UINT32* flag) {
  if (flag == nullptr) return kStatusBadArgument;
  return on_function(a1, [&](Site& s, FunctionRef r) -> RM_STATUS {
    const auto list = features_of(card_of(s, r), at(s, r));
    *flag = std::find(list.begin(), list.end(), feature) != list.end() ? 1 : 0;
    return RM_STATUS_SUCCESS;
  });
}

// One byte per feature number, 1 when offered.
RM_STATUS handle_GetHBAFeatureList(HBA_NAME a1, void* buffer, HBA_UINT32* size) {
  return on_function(a1, [&](Site& s, FunctionRef r) -> RM_STATUS {
    const auto list = features_of(card_of(s, r), at(s, r));
    std::vector<uint8_t> bytes(512, 0);
    for (uint32_t f : list)
      if (f < bytes.size()) bytes[f] = 1;
    return deliver_bytes(bytes.data(), bytes.size(), buffer, size);
  });
}

RM_STATUS handle_GetDriverType(HBA_NAME a1, HBA_UINT32* type) {
  if (type == nullptr) return kStatusBadArgument;
  return on_function(a1, [&](Site& s, FunctionRef r) -> RM_STATUS {
    *type = at(s, r).driver_type;
    return RM_STATUS_SUCCESS;
  });
}

// The function's PCI configuration header (type 0), little-endian.
RM_STATUS handle_DiagReadPCIRegistersV2(HBA_NAME a1, void* buffer, HBA_UINT32* size) {
  return on_function(a1, [&](Site& s, FunctionRef r) -> RM_STATUS {
    const Card& card = card_of(s, r);
    const Function& fn = at(s, r);
    uint8_t cfg[kPciConfigSize] = {};
    auto put16 = [&](size_t at, uint32_t v) {
      cfg[at] = static_cast<uint8_t>(v);
      cfg[at + 1] = static_cast<uint8_t>(v >> 8);
    };
    put16(0x00, card.vendor_id);
    put16(0x02, card.device_id + (fn.kind == Kind::kIscsi ? 2 : fn.kind == Kind::kFcoe ? 4 : 0));
    put16(0x04, 0x0406);  // memory space, bus master, interrupt disable
    put16(0x06, 0x0010);  // capabilities list
    cfg[0x08] = 0x03;     // revision
    cfg[0x0B] = fn.kind == Kind::kFcoe ? 0x0C : fn.kind == Kind::kIscsi ? 0x01 : 0x02;  // class
    cfg[0x0A] = fn.kind == Kind::kFcoe ? 0x04 : 0x00;                                   // subclass
    cfg[0x0E] = 0x80;  // multi-function device
    put16(0x2C, card.sub_vendor_id);
    put16(0x2E, card.sub_device_id);
    cfg[0x3C] = static_cast<uint8_t>(card.pci_bus);
    cfg[0x3D] = 1;  // INTA
    return deliver_bytes(cfg, sizeof cfg, buffer, size);
  });
}

RM_STATUS handle_SetPortEnabled(HBA_NAME a1, HBA_UINT32 enabled, HBA_UINT8* config_status) {
  return on_function(a1, [&](Site& s, FunctionRef r) -> RM_STATUS {
    card_of(s, r).ports[at(s, r).port].enabled = enabled != 0;
    if (config_status) *config_status = 0;
    return RM_STATUS_SUCCESS;
  });
}

// Beacon states: 1 not available, 2 off, 3 on.
RM_STATUS handle_DiagBeacon(HBA_NAME a1, HBA_UINT32 state) {
  if (state != 2 && state != 3) return kStatusBadValue;
  return on_function(a1, [&](Site& s, FunctionRef r) -> RM_STATUS {
    uint32_t& beacon = card_of(s, r).ports[at(s, r).port].beacon;
    if (beacon == 1) return RM_STATUS_NOT_SUPPORTED;
    beacon = state;
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_DiagBeaconState(HBA_NAME a1, HBA_UINT32* state) {
  if (state == nullptr) return kStatusBadArgument;
  return on_function(a1, [&](Site& s, FunctionRef r) -> RM_STATUS {
    *state = card_of(s, r).ports[at(s, r).port].beacon;
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_GetDumpDirectoryA(HBA_NAME a1, char* text, HBA_UINT32 size) {
  if (text == nullptr || size == 0) return kStatusBadArgument;
  return on_function(a1, [&](Site& s, FunctionRef) -> RM_STATUS {
    if (s.library.dump_directory.size() >= size) return RM_STATUS_ERROR_MORE_DATA;
    put_text(text, size, s.library.dump_directory);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_SetDumpDirectory(HBA_NAME a1, const char* dir) {
  if (dir == nullptr) return kStatusBadArgument;
  const std::string value = get_text(dir, 4096);
  if (value.empty() || value.size() > 255) return kStatusBadValue;
  return on_function(a1, [&](Site& s, FunctionRef) -> RM_STATUS {
    s.library.dump_directory = value;
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_GetDumpRetentionCount(HBA_NAME a1, HBA_UINT32* count) {
  if (count == nullptr) return kStatusBadArgument;
  return on_function(a1, [&](Site& s, FunctionRef) -> RM_STATUS {
    *count = s.library.dump_retention;
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_SetDumpRetentionCount(HBA_NAME a1, HBA_UINT32 count) {
  if (count == 0 || count > 1000) return kStatusBadValue;
  return on_function(a1, [&](Site& s, FunctionRef) -> RM_STATUS {
    s.library.dump_retention = count;
    return RM_STATUS_SUCCESS;
  });
}

// The card's event-log configuration: the header, then one module record each.
RM_STATUS handle_Get_VG_EventLogConfigDataAll(HBA_NAME a1, void* buffer, HBA_UINT32* size) {
  return on_function(a1, [&](Site& s, FunctionRef r) -> RM_STATUS {
    const std::vector<EventLogModule>& modules = card_of(s, r).event_log;
    if (modules.empty()) return RM_STATUS_ITEM_NOT_OFFERED;
    std::vector<RM_EVENT_LOG_MODULE> records(modules.size());
    for (size_t i = 0; i < modules.size(); ++i) {
      RM_EVENT_LOG_MODULE& rec = records[i];
      std::memset(&rec, 0, sizeof rec);
      put_text(rec.name, sizeof rec.name, modules[i].name);
      for (size_t m = 0; m < RM_EVENT_LOG_MODE_COUNT; ++m) {
        const EventLogMode& mode = modules[i].modes[m];
        if (!mode.enabled) continue;
        rec.modeFlags |= 1u << m;
        rec.modes[m] = {mode.level, mode.port_mask, mode.pci_func_mask};
      }
    }
    return deliver_list(records, sizeof(RM_EVENT_LOG_CONFIG_HEADER), buffer, size);
  });
}

// Registrations are kept so that they can be removed; the site never changes
// on its own, so no event is ever delivered.
RM_STATUS handle_RegisterForAdapterPortEvents(HBA_NAME a1, RM_EVENT_CALLBACK callback, void*, void** registration) {
  if (callback == nullptr || registration == nullptr) return kStatusBadArgument;
  return on_function(a1, [&](Site& s, FunctionRef) -> RM_STATUS {
    const uint32_t id = s.next_registration++;
    s.registrations.insert(id);
    *registration = reinterpret_cast<void*>(static_cast<uintptr_t>(id));  // opaque to the caller
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_UnRegisterForAdapterPortEvents(HBA_NAME a1, void* registration) {
  const auto id = static_cast<uint32_t>(reinterpret_cast<uintptr_t>(registration));
  return on_function(a1, [&](Site& s, FunctionRef) -> RM_STATUS {
    return s.registrations.erase(id) ? RM_STATUS(RM_STATUS_SUCCESS) : RM_STATUS(kStatusNotFound);
  });
}

RM_STATUS handle_SetDebugTraces(HBA_UINT32, HBA_UINT32 level) {
  return level > 11 ? RM_STATUS(kStatusBadValue) : RM_STATUS(RM_STATUS_SUCCESS);
}

}  // namespace nrvsim::rm
