// Diagnostics, firmware download, reset and dumps.  A started diagnostic
// finishes at once: its first DiagGetResults reports the finished run (a site
// fault with status 60 on DiagGetResults makes the caller poll instead).
#include <algorithm>

#include "sim/RmCommon.h"

namespace nrvsim::rm {
namespace {

enum DiagKind : uint32_t { kLoopback = 1, kPciLoopback, kEcho, kPost, kTdr };

RM_STATUS start(HBA_NAME name, DiagKind kind, uint32_t cycles, HBA_UINT32* handle) {
  if (handle == nullptr) return kStatusBadArgument;
  return on_function(name, [&](Site& s, FunctionRef r) -> RM_STATUS {
    const PhysicalPort& port = card_of(s, r).ports[at(s, r).port];
    if (kind == kTdr && !port.is_10gbaset) return RM_STATUS_NOT_SUPPORTED;
    if (!port.enabled) return RM_STATUS_ERROR;
    const uint32_t h = s.next_diag_handle++;
    s.diagnostics[h] = DiagRun{to_wwn(name), kind, cycles == 0 ? 1 : cycles};
    *handle = h;
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS loopback(HBA_NAME name, HBA_UINT32 type, HBA_UINT32 cycles, HBA_UINT32* handle) {
  // 0 external, 2 DMA, 3 MAC, 4 PHY
  if (type != 0 && (type < 2 || type > 4)) return kStatusBadValue;
  return start(name, kLoopback, cycles, handle);
}

RM_STATUS echo(HBA_NAME name, HBA_NAME target, HBA_UINT32 cycles, HBA_UINT32* handle) {
  const RM_STATUS st = on_function(name, [&](Site& s, FunctionRef r) -> RM_STATUS {
    const Function& fn = at(s, r);
    if (fn.kind != Kind::kFcoe) return RM_STATUS_ITEM_NOT_OFFERED;
    if (!card_of(s, r).ports[fn.port].link_up) return RM_STATUS_ERROR;
    const bool known = std::any_of(fn.fc_targets.begin(), fn.fc_targets.end(),
                                   [&](const FcTarget& t) { return t.wwpn == to_wwn(target); });
    return known ? RM_STATUS(RM_STATUS_SUCCESS) : RM_STATUS(kStatusNotFound);
  });
  return st != RM_STATUS_SUCCESS ? st : start(name, kEcho, cycles, handle);
}

RM_STATUS fat_dump(HBA_NAME name, char* file, HBA_UINT32 size) {
  if (file == nullptr || size == 0) return kStatusBadArgument;
  return on_function(name, [&](Site& s, FunctionRef r) -> RM_STATUS {
    const std::string path = s.library.dump_directory + "/" + card_of(s, r).serial + "_" +
                             wwn_plain(at(s, r).id) + "_fat.bin";
    if (path.size() >= size) return RM_STATUS_ERROR_MORE_DATA;
    put_text(file, size, path);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS new_dump(HBA_NAME name, const char* what) {
  return on_function(name, [&](Site& s, FunctionRef r) -> RM_STATUS {
    const std::string file = card_of(s, r).serial + "_" + wwn_plain(at(s, r).id) + "_" + what + "_" +
                             std::to_string(s.dump_files.size() + 1) + ".dmp";
    s.dump_files.push_back(file);
    while (s.dump_files.size() > s.library.dump_retention) s.dump_files.erase(s.dump_files.begin());
    return RM_STATUS_SUCCESS;
  });
}

}  // namespace

RM_STATUS handle_DiagLoopBackTest(HBA_NAME a1, HBA_UINT32 type, HBA_UINT32 cycles, HBA_UINT32, HBA_UINT32* h) {
  return loopback(a1, type, cycles, h);
}
RM_STATUS handle_DiagLoopBackTestV2(HBA_NAME a1, HBA_UINT32 type, HBA_UINT32 cycles, HBA_UINT32, HBA_UINT32* h,
                                    const char*) {
  return loopback(a1, type, cycles, h);
}
RM_STATUS handle_DiagLoopBackTestV3(HBA_NAME a1, HBA_UINT32 type, HBA_UINT32 cycles, HBA_UINT32, HBA_UINT32* h,
                                    HBA_UINT32, const char*) {
  return loopback(a1, type, cycles, h);
}
RM_STATUS handle_DiagPciLoopBackTest(HBA_NAME a1, HBA_UINT32 cycles, HBA_UINT32, HBA_UINT32* h) {
  return start(a1, kPciLoopback, cycles, h);
}
RM_STATUS handle_DiagPciLoopBackTestV2(HBA_NAME a1, HBA_UINT32 cycles, HBA_UINT32, HBA_UINT32* h, const char*) {
  return start(a1, kPciLoopback, cycles, h);
}
RM_STATUS handle_DiagEchoTest(HBA_NAME a1, HBA_NAME target, HBA_UINT32 cycles, HBA_UINT32, const char*,
                              HBA_UINT32* h) {
  return echo(a1, target, cycles, h);
}
RM_STATUS handle_DiagEchoTestV2(HBA_NAME a1, HBA_NAME target, HBA_UINT32 cycles, HBA_UINT32, const char*,
                                HBA_UINT32* h) {
  return echo(a1, target, cycles, h);
}
RM_STATUS handle_DiagRunPOST(HBA_NAME a1, HBA_UINT32* h) { return start(a1, kPost, 1, h); }
RM_STATUS handle_DiagRunTDR(HBA_NAME a1, HBA_UINT32* h) { return start(a1, kTdr, 1, h); }

RM_STATUS handle_DiagGetResults(HBA_NAME a1, HBA_UINT32 handle, RM_DIAG_RESULT* result) {
  if (result == nullptr) return kStatusBadArgument;
  return SimSite::instance().with([&](Site& s) -> RM_STATUS {
    auto it = s.diagnostics.find(handle);
    if (it == s.diagnostics.end() || it->second.function != to_wwn(a1)) return kStatusNotFound;
    const DiagRun run = it->second;
    s.diagnostics.erase(it);
    *result = RM_DIAG_RESULT{};
    result->state = RM_DIAG_STATE_FINISHED;
    result->cyclesComplete = run.cycles;
    result->timeToExecuteMs = 10 + 2 * run.cycles;
    put_text(result->resultText, sizeof result->resultText, "Success");
    if (run.kind == kTdr) {
      for (int pair = 0; pair < 4; ++pair) {
        result->pairLengthCm[pair] = 1250 + 5 * pair;
        result->pairStatus[pair] = 0;
      }
    }
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_DiagCancelDiagnostic(HBA_NAME a1, HBA_UINT32 handle) {
  return SimSite::instance().with([&](Site& s) -> RM_STATUS {
    auto it = s.diagnostics.find(handle);
    if (it == s.diagnostics.end() || it->second.function != to_wwn(a1)) return kStatusNotFound;
    s.diagnostics.erase(it);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_DiagSetNVP(HBA_NAME a1, HBA_UINT32 nvp) {
  if (nvp < 1 || nvp > 100) return kStatusBadValue;
  return on_function(a1, [&](Site& s, FunctionRef r) -> RM_STATUS {
    PhysicalPort& port = card_of(s, r).ports[at(s, r).port];
    if (!port.is_10gbaset) return RM_STATUS_ITEM_NOT_OFFERED;
    port.cable_nvp = nvp;
    return RM_STATUS_SUCCESS;
  });
}

// A converged adapter takes new firmware on the next boot.
RM_STATUS handle_DownloadFirmware(HBA_NAME a1, HBA_UINT32 image, HBA_UINT32) {
  if (image == 0) return kStatusNotFound;
  return on_function(a1, [](Site&, FunctionRef) { return RM_STATUS(RM_STATUS_REBOOT_REQUIRED); });
}

RM_STATUS handle_ResetHBA(HBA_NAME a1) {
  return on_function(a1, [](Site&, FunctionRef) { return RM_STATUS(RM_STATUS_SUCCESS); });
}

RM_STATUS handle_GenerateDump(HBA_UINT32, HBA_NAME a2) { return new_dump(a2, "fat"); }
RM_STATUS handle_GenerateEfdDump(HBA_NAME a1, HBA_INT32, HBA_UINT32) { return new_dump(a1, "efd"); }
RM_STATUS handle_GenerateCoreDump(HBA_NAME a1, const char*) { return new_dump(a1, "core"); }

// A 32-bit count (in: room, out: names held) and 256-byte names; 191 when
// the room is too small.
RM_STATUS handle_GetDumpFileNames(HBA_NAME a1, void* buffer) {
  if (buffer == nullptr) return kStatusBadArgument;
  return on_function(a1, [&](Site& s, FunctionRef) -> RM_STATUS {
    HBA_UINT32 room = 0;
    std::memcpy(&room, buffer, sizeof room);
    const HBA_UINT32 count = static_cast<HBA_UINT32>(s.dump_files.size());
    std::memcpy(buffer, &count, sizeof count);
    if (room < count) return RM_STATUS_ERROR_MORE_DATA;
    auto* names = static_cast<char*>(buffer) + sizeof count;
    for (size_t i = 0; i < s.dump_files.size(); ++i)
      put_text(names + i * RM_DUMP_FILE_NAME_SIZE, RM_DUMP_FILE_NAME_SIZE, s.dump_files[i]);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_DeleteDumpFiles(HBA_NAME a1) {
  return on_function(a1, [](Site& s, FunctionRef) {
    s.dump_files.clear();
    return RM_STATUS(RM_STATUS_SUCCESS);
  });
}

RM_STATUS handle_RetrieveFATDump(HBA_NAME a1, char* file, HBA_UINT32 size) { return fat_dump(a1, file, size); }
RM_STATUS handle_RetrieveFATDump2(HBA_NAME a1, char* file, HBA_UINT32 size) { return fat_dump(a1, file, size); }

}  // namespace nrvsim::rm
