#include "data/NRV_AdapterAttributes.h"

#include <vector>

#include "access/NRV_Common.h"
#include "access/RM_Api.h"
#include "data/NRV_DataLog.h"

namespace cimple {

namespace {

enum KindBit : unsigned { kNic = 1, kIscsi = 2, kFcoe = 4 };
using Kind = AdapterAttributes::Kind;

// Every member of the adapter sets: attribute number, type, kinds that read
// it, label, and the NIC and FCoE labels where those differ (labels only name
// the member in the log).  Read in this order.
#define NRV_ADAPTER_FIELDS(X)                                                                                         \
  X(RM_HA_MANUFACTURER, kText, kNic | kIscsi | kFcoe, "_Manufacturer", nullptr, "_MANUFACTURER")                      \
  X(RM_HA_SERIAL_NUMBER, kText, kNic | kIscsi | kFcoe, "_SerialNumber", nullptr, nullptr)                             \
  X(RM_HA_MODEL, kText, kNic | kIscsi | kFcoe, "_Model", nullptr, nullptr)                                            \
  X(RM_HA_MODEL_DESCRIPTION, kText, kNic | kIscsi | kFcoe, "_ModelDescription", nullptr, nullptr)                     \
  X(RM_HA_NODE_SYMBOLIC_NAME, kText, kFcoe, "_NodeSymbolicName", nullptr, nullptr)                                    \
  /* the iSCSI set reads the operational version before the hardware version too */                                   \
  X(RM_HA_OPERATIONAL_FIRMWARE_VERSION, kText, kIscsi, "_OpertionalFirmwareVersion", nullptr, nullptr)                \
  X(RM_HA_HARDWARE_VERSION, kText, kNic | kIscsi | kFcoe, "_HardwareVersion", "_HWVersion", nullptr)                  \
  X(RM_HA_OPTION_ROM_VERSION, kText, kNic | kIscsi | kFcoe, "_OptionROMVersion", nullptr, nullptr)                    \
  X(RM_HA_FIRMWARE_VERSION, kText, kNic | kIscsi | kFcoe, "_FirmwareVersion", nullptr, nullptr)                       \
  X(RM_HA_VENDOR_SPECIFIC_ID, kInteger, kNic | kFcoe, "_VendorSpecificID", nullptr, nullptr)                          \
  X(RM_HA_DRIVER_NAME, kText, kNic | kIscsi | kFcoe, "_DriverName", nullptr, nullptr)                                 \
  X(RM_HA_DEVICE_ID, kInteger, kNic | kIscsi | kFcoe, "_DeviceID", nullptr, nullptr)                                  \
  X(RM_HA_MODEL_ID, kInteger, kNic | kIscsi | kFcoe, "_ModelID", nullptr, nullptr)                                    \
  X(RM_HA_OPERATIONAL_FIRMWARE_VERSION, kText, kNic | kIscsi | kFcoe, "_OpertionalFirmwareVersion", nullptr, nullptr) \
  X(RM_HA_IEEE_ADDRESS, kMac, kFcoe, "_IEEEAddress", nullptr, nullptr)                                                \
  X(RM_HA_BOOT_CODE_ENABLED, kInteger, kNic, "_BootCodeEnabled", nullptr, nullptr)                                    \
  X(RM_HA_DRIVER_VERSION, kText, kNic | kIscsi | kFcoe, "_DriverVersion", nullptr, nullptr)                           \
  X(RM_HA_BOOT_IMAGE_VERSION, kText, kNic | kIscsi | kFcoe, "_BootImageExpansionROMVersion", "_BootVersion", nullptr) \
  X(RM_HA_DIAG_VERSION_NUMBER, kInteger, kNic, "_DiagVersionNumber", nullptr, nullptr)                                \
  X(RM_HA_FUNCTIONAL_FIRMWARE_VERSION, kText, kFcoe, "_FunctionalFirmwareVersion", nullptr, nullptr)                  \
  X(RM_HA_KERNEL_FIRMWARE_VERSION, kText, kFcoe, "_KernelFirmwareVersion", nullptr, nullptr)                          \
  X(RM_HA_SLI_MODE, kInteger, kFcoe, "_SLIMode", nullptr, nullptr)                                                    \
  X(RM_HA_BOARD_TEMPERATURE, kInteger, kNic | kFcoe, "_BoardTemperature", nullptr, nullptr)                           \
  X(RM_HA_PCI_BUS_NUMBER, kInteger, kNic | kIscsi | kFcoe, "_PCIBusNumber", nullptr, nullptr)                         \
  X(RM_HA_FUNCTION_TYPE, kInteger, kNic, "_FunctionType", nullptr, nullptr)                                           \
  X(RM_HA_SUB_DEVICE_ID, kInteger, kNic, "_SubDeviceID", nullptr, nullptr)                                            \
  X(RM_HA_PORT_NUMBER, kInteger, kNic | kIscsi | kFcoe, "_PortNumber", nullptr, nullptr)                              \
  X(RM_HA_PCI_FUNCTION_NUMBER, kInteger, kNic | kIscsi | kFcoe, "_PCIFunctionNumber", nullptr, nullptr)               \
  X(RM_HA_SUB_VENDOR_ID, kInteger, kNic, "_SubVendorID", nullptr, nullptr)                                            \
  X(RM_HA_FIRMWARE_STATUS, kInteger, kNic | kIscsi | kFcoe, "_FirmwareStatus", nullptr, nullptr)                      \
  X(RM_HA_SP_FIRMWARE_VERSION, kText, kFcoe, "_SPFirmwareVersion", nullptr, nullptr)                                  \
  X(RM_HA_SP_FIRMWARE_NAME, kText, kFcoe, "_SPFirmwareName", nullptr, nullptr)                                        \
  X(RM_HA_ULP_FIRMWARE_VERSION, kText, kFcoe, "_ULPFirmwareVersion", nullptr, nullptr)                                \
  X(RM_HA_ULP_FIRMWARE_NAME, kText, kFcoe, "_ULPFirmwareName", nullptr, nullptr)                                      \
  X(RM_HA_IPL_FILENAME, kText, kNic, "_IPLFilename", nullptr, nullptr)                                                \
  X(RM_HA_NCSI_VERSION, kText, kNic, "_NCSIVersion", nullptr, nullptr)                                                \
  X(RM_HA_FCOE_UNIVERSAL_VERSION, kText, kNic, "_FCOEUniversalVersion", nullptr, nullptr)                             \
  X(RM_HA_FCOE_X86_BIOS_VERSION, kText, kNic, "_FCOE_X86_BIOSVersion", nullptr, nullptr)                              \
  X(RM_HA_FCOE_EFI_VERSION, kText, kNic, "_FCOE_EFIVersion", nullptr, nullptr)                                        \
  X(RM_HA_FCOE_FCODE_VERSION, kText, kNic, "_FCOE_FCODEVersion", nullptr, nullptr)                                    \
  X(RM_HA_UEFI_BIOS_VERSION, kText, kNic, "_UEFI_BIOSVersion", nullptr, nullptr)                                      \
  X(RM_HA_UEFI_NIC_VERSION, kText, kNic, "_UEFI_NICVersion", nullptr, nullptr)                                        \
  X(RM_HA_UEFI_FCODE_VERSION, kText, kNic, "_UEFI_FCODEVersion", nullptr, nullptr)                                    \
  X(RM_HA_UEFI_ISCSI_VERSION, kText, kNic, "_UEFI_ISCSIVersion", nullptr, nullptr)                                    \
  X(RM_HA_PCI_BUS_SPEED, kText, kNic, "_PCIBusSpeed", nullptr, nullptr)                                               \
  X(RM_HA_PCI_BUS_WIDTH, kText, kNic, "_PCIBusWidth", nullptr, nullptr)                                               \
  X(RM_HA_PORT_CONNECTION_TYPE, kInteger, kNic, "_PortConnectionType", nullptr, nullptr)                              \
  X(RM_HA_SUBADAPTER_NUMBER, kText, kNic | kIscsi | kFcoe, "_Subadapter_number", nullptr, nullptr)                    \
  X(RM_HA_FIRMWARE_ON_FLASH, kText, kNic, "_FirmwareOnFlash", nullptr, nullptr)

struct Row {
  uint16_t number;
  AttributeSet::Type type;
  unsigned kinds;
  const char* label;
  const char* nicLabel;
  const char* fcoeLabel;
};

const std::vector<AttributeSet::Field>& fieldsOf(Kind kind) {
  using Field = AttributeSet::Field;
  static const Row rows[] = {
#define NRV_ROW_(number, type, kinds, label, nic, fcoe) \
  {number, AttributeSet::Type::type, kinds, label, nic, fcoe},
      NRV_ADAPTER_FIELDS(NRV_ROW_)
#undef NRV_ROW_
  };
  auto select = [](Kind k) {
    const unsigned bit = k == Kind::kNic ? kNic : k == Kind::kIscsi ? kIscsi : kFcoe;
    std::vector<Field> out;
    for (const Row& r : rows) {
      if ((r.kinds & bit) == 0) continue;
      const char* label = r.label;
      if (k == Kind::kNic && r.nicLabel != nullptr) label = r.nicLabel;
      if (k == Kind::kFcoe && r.fcoeLabel != nullptr) label = r.fcoeLabel;
      out.push_back(Field{r.number, r.type, label});
    }
    return out;
  };
  static const std::vector<Field> nic = select(Kind::kNic);
  static const std::vector<Field> iscsi = select(Kind::kIscsi);
  static const std::vector<Field> fcoe = select(Kind::kFcoe);
  return kind == Kind::kNic ? nic : kind == Kind::kIscsi ? iscsi : fcoe;
}

}  // namespace

void AdapterAttributes::fill(Kind kind, const std::string& identifierText) {
  HBA_NAME name{};
  if (string2HBAName(&name, identifierText.c_str()) != 1) {
    NRV_DATA_LOG(NRV_DBG, "NRV_MethodWrapper::string2HBAName failed");
    return;
  }
  std::vector<unsigned char> blob(RM_HBA_ATTRIBUTES_SIZE);
  HBA_UINT32 size = RM_HBA_ATTRIBUTES_SIZE;
  const RM_STATUS status = RM_GetHBAAttributes(name, blob.data(), &size);
  if (status != RM_STATUS_SUCCESS) {
    NRV_DATA_LOG(NRV_DBG, "ERROR: RM_GetHBAAttributes call failed (%d)", static_cast<int>(status));
  } else {
    if (kind == Kind::kIscsi) NRV_DATA_LOG(NRV_DBG, "CALLING iSCSIAdapterAttributes RM CALLS");
    readFields(blob.data(), Scope::kAdapter, fieldsOf(kind));
    m_NumberOfPorts = 1;
  }
  if (kind == Kind::kFcoe) {
    HBA_UINT32 driverType = 0;
    const RM_STATUS st = RM_GetDriverType(name, &driverType);
    if (st != RM_STATUS_SUCCESS)
      NRV_DATA_LOG(NRV_DBG, "ERROR: RM_GetDriverType call failed (%d)", static_cast<int>(st));
    else
      setInteger(NRV_ATTR_DRIVER_TYPE, driverType);
  }
}

FCAdapterAttributes::FCAdapterAttributes(const std::string& identifierText) {
  fill(Kind::kFcoe, identifierText);
}

NICAdapterAttributes::NICAdapterAttributes(const std::string& identifierText) {
  fill(Kind::kNic, identifierText);
}

iSCSIAdapterAttributes::iSCSIAdapterAttributes(const std::string& identifierText) {
  fill(Kind::kIscsi, identifierText);
}

FCoEAdapterAttributes::FCoEAdapterAttributes(const std::string& identifierText) {
  fill(Kind::kFcoe, identifierText);
}

}  // namespace cimple
