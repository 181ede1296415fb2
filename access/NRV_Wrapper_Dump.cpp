// Wrapper operations of the dump service, the extended FAT dump settings and
// firmware installation.
#include <algorithm>
#include <cctype>

#include "access/NRV_WrapperCall.h"

namespace cimple {

using wrapper::validated;

RM_STATUS NRV_MethodWrapper::nrvcimReset(const HBA_NAME& name) {
  return validated(name, "nrvcimReset", [&] { return LRM_ResetHBA(name); });
}

RM_STATUS NRV_MethodWrapper::nrvcimGetRetentionCount(const HBA_NAME& name, HBA_UINT32& count) {
  return validated(name, "nrvcimGetRetentionCount",
                   [&] { return LRM_GetDumpRetentionCount(name, &count); });
}

RM_STATUS NRV_MethodWrapper::nrvcimSetRetentionCount(const HBA_NAME& name, HBA_UINT32 count) {
  return validated(name, "nrvcimSetRetentionCount",
                   [&] { return LRM_SetDumpRetentionCount(name, count); });
}

RM_STATUS NRV_MethodWrapper::nrvcimDeleteDumpFiles(const HBA_NAME& name) {
  return validated(name, "nrvcimDeleteDumpFiles", [&] { return LRM_DeleteDumpFiles(name); });
}

RM_STATUS NRV_MethodWrapper::nrvcimGetDumpDirectory(const HBA_NAME& name, std::string& directory) {
  return validated(name, "nrvcimGetDumpDirectory", [&] {
    char text[256] = {};
    const RM_STATUS status = LRM_GetDumpDirectoryA(name, text, sizeof text - 1);
    if (status == RM_STATUS_SUCCESS) directory = text;
    return status;
  });
}

RM_STATUS NRV_MethodWrapper::nrvcimSetDumpDirectory(const HBA_NAME& name,
                                                    const std::string& directory) {
  return validated(name, "nrvcimSetDumpDirectory",
                   [&] { return LRM_SetDumpDirectory(name, directory.c_str()); });
}

RM_STATUS NRV_MethodWrapper::nrvcimDumpDiagnostic(const HBA_NAME& name, HBA_INT32 snapshotMode) {
  return validated(name, "nrvcimDumpDiagnostic", [&] {
    if (snapshotMode == -1) return LRM_GenerateDump(0, name);
    return LRM_GenerateEfdDump(name, snapshotMode, 0);
  });
}

RM_STATUS NRV_MethodWrapper::nrvcimRetrieveFATDump(const HBA_NAME& name, std::string& fileName) {
  return validated(name, "nrvcimRetrieveFATDump", [&] {
    char text[256] = {};
    const RM_STATUS status = LRM_RetrieveFATDump2(name, text, sizeof text - 1);
    if (status == RM_STATUS_SUCCESS) fileName = text;
    return status;
  });
}

namespace {

// Letters and digits of an identifier text, upper-cased: "02-11-22..." and
// "021122..." name the same port.
std::string identifierDigits(const std::string& text) {
  std::string digits;
  for (char c : text)
    if (std::isxdigit(static_cast<unsigned char>(c)))
      digits += static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
  return digits;
}

// A port the library lists as a dead NIC port: its MAC (first six bytes) or
// its full name matches the entry.
bool isDeadNicPort(const HBA_NAME& name) {
  std::vector<std::string> dead;
  if (NRV_MethodWrapper::GetDeadNICPorts(dead) != RM_STATUS_SUCCESS) return false;
  char plain[kHbaNamePlainSize];
  const std::string full = HBAName2string(name, plain);
  const std::string mac = full.substr(0, 12);
  for (const std::string& entry : dead) {
    const std::string digits = identifierDigits(entry);
    if (digits == full || digits == mac) return true;
  }
  return false;
}

}  // namespace

RM_STATUS NRV_MethodWrapper::nrvcimGetCoreDump(const HBA_NAME& name, const std::string& options) {
  NRV_LOG(NRV_DBG, "Entering NRV_MethodWrapper::nrvcimGetCoreDump");
  // A port that went down no longer answers as a local adapter; the library
  // still takes a core dump of it when it lists it as dead.
  if (Validatewwpn(name) != 0 && !isDeadNicPort(name)) {
    NRV_LOG(NRV_ERR, "INVALID wwpn");
    return RM_STATUS_ERROR;
  }
  NRV_LOG(NRV_DBG, "GenerateCoreDump options: %s", options.c_str());
  const RM_STATUS status = LRM_GenerateCoreDump(name, options.c_str());
  if (status != RM_STATUS_SUCCESS && status != RM_STATUS_REBOOT_REQUIRED) {
    NRV_LOG(NRV_ERR, "NRV_MethodWrapper::nrvcimGetCoreDump failed with %d",
            static_cast<int>(status));
    logStatus(status);
  }
  return status;
}

RM_STATUS NRV_MethodWrapper::GetDumpFileNames(const HBA_NAME& name,
                                              std::vector<std::string>& files) {
  return validated(name, "GetDumpFileNames", [&] {
    files.clear();
    std::vector<uint8_t> buffer;
    auto attempt = [&](HBA_UINT32 capacity) {
      buffer.assign(sizeof(HBA_UINT32) + capacity * RM_DUMP_FILE_NAME_SIZE, 0);
      std::memcpy(buffer.data(), &capacity, sizeof capacity);
      return LRM_GetDumpFileNames(name, buffer.data());
    };
    const HBA_UINT32 initial = 4;
    RM_STATUS status = attempt(initial);
    if (status == RM_STATUS_ERROR_MORE_DATA) {
      HBA_UINT32 needed = 0;
      std::memcpy(&needed, buffer.data(), sizeof needed);
      if (needed <= initial) return status;
      status = attempt(needed);
    }
    if (status != RM_STATUS_SUCCESS) return status;
    HBA_UINT32 count = 0;
    std::memcpy(&count, buffer.data(), sizeof count);
    const size_t room = (buffer.size() - sizeof(HBA_UINT32)) / RM_DUMP_FILE_NAME_SIZE;
    for (size_t i = 0; i < std::min<size_t>(count, room); ++i) {
      const char* entry = reinterpret_cast<const char*>(buffer.data() + sizeof(HBA_UINT32) +
                                                        i * RM_DUMP_FILE_NAME_SIZE);
      files.push_back(wrapper::fieldText(entry, RM_DUMP_FILE_NAME_SIZE));
    }
    return status;
  });
}

RM_STATUS NRV_MethodWrapper::GetExtFATAdvancedData(const HBA_NAME& name,
                                                   std::vector<uint8_t>& record) {
  return validated(name, "GetExtFATAdvancedData", [&] {
    return wrapper::readSized(record, 4096, [&](void* buffer, HBA_UINT32* size) {
      return LRM_Get_VG_EventLogConfigDataAll(name, buffer, size);
    });
  });
}

RM_STATUS NRV_MethodWrapper::SetExtFATAdvancedData(const HBA_NAME& name, const std::string& module,
                                                   HBA_UINT32 modeFlags,
                                                   const std::vector<HBA_UINT32>& levels) {
  return validated(name, "SetExtFATAdvancedData", [&] {
    return LRM_Set_VG_EventLogConfigDataModule(name, module.c_str(), modeFlags, levels.data(),
                                               static_cast<HBA_UINT32>(levels.size()));
  });
}

RM_STATUS NRV_MethodWrapper::nrvcimSetAdvancedDumpTraceLevel(const HBA_NAME& name, HBA_UINT32 level,
                                                             HBA_UINT32 modeFlags) {
  return validated(name, "nrvcimSetAdvancedDumpTraceLevel",
                   [&] { return LRM_Set_VG_EventLogTraceLevel(name, level, modeFlags); });
}

RM_STATUS NRV_MethodWrapper::nrvcimRestoreDefaultSettings(const HBA_NAME& name) {
  return validated(name, "nrvcimRestoreDefaultSettings",
                   [&] { return LRM_Set_VG_DefaultLoggingConfig(name); });
}

// ---- Firmware ---------------------------------------------------------------------------

RM_STATUS NRV_MethodWrapper::nrvcimDownloadFW(const HBA_NAME& name, const std::string& path) {
  NRV_LOG(NRV_DBG, "Entering NRV_MethodWrapper::nrvcimDownloadFW");
  if (Validatewwpn(name) != 0) {
    NRV_LOG(NRV_ERR, "INVALID wwpn");
    return RM_STATUS_ERROR;
  }
  HBA_UINT32 image = 0;
  RM_STATUS status = RM_ImportHBAFileA(path.c_str(), &image);
  if (status != RM_STATUS_SUCCESS) {
    NRV_LOG(NRV_ERR, "ERROR: RM_ImportHBAFileA: failed with %d for %s", static_cast<int>(status),
            path.c_str());
    logStatus(status);
    return status;
  }
  status = RM_VerifyFirmwareA(name, image);
  if (status != RM_STATUS_SUCCESS) {
    NRV_LOG(NRV_ERR, "ERROR: RM_VerifyFirmwareA: failed with %d", static_cast<int>(status));
    logStatus(status);
    return status;
  }
  status = LRM_DownloadFirmware(name, image, 0);
  if (status == RM_STATUS_MAILBOX_BUSY)
    NRV_LOG(NRV_ERR, "ERROR: RM_DownloadFirmware: Mailbox busy; retry.");
  else if (status == RM_STATUS_MAILBOX_FAILED)
    NRV_LOG(NRV_ERR, "ERROR: RM_DownloadFirmware: Mailbox failed; Internal Driver Error.");
  else if (status != RM_STATUS_SUCCESS && status != RM_STATUS_REBOOT_REQUIRED)
    NRV_LOG(NRV_ERR, "ERROR: RM_DownloadFirmware: failed with %d", static_cast<int>(status));
  if (status != RM_STATUS_SUCCESS && status != RM_STATUS_REBOOT_REQUIRED) logStatus(status);
  return status;
}

RM_STATUS NRV_MethodWrapper::UpdateFirmwareOnFlash(const HBA_NAME& name, std::string& version) {
  return validated(name, "UpdateFirmwareOnFlash", [&] {
    std::vector<uint8_t> blob;
    const RM_STATUS status = wrapper::readSized(
        blob, RM_HBA_ATTRIBUTES_FLASH_QUERY_SIZE,
        [&](void* buffer, HBA_UINT32* size) { return LRM_GetHBAAttributes(name, buffer, size); });
    if (status != RM_STATUS_SUCCESS) return status;
    if (!wrapper::blobText(blob.data(), RM_HA_FIRMWARE_ON_FLASH, version)) version.clear();
    return status;
  });
}

}  // namespace cimple
