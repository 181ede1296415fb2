#include "data/NRV_AdapterAttributes.h"

#include <vector>

#include "access/NRV_Common.h"
#include "access/RM_Api.h"
#include "data/NRV_DataLog.h"

namespace cimple {

namespace {

enum KindBit : unsigned { kNic = 1, kIscsi = 2, kFcoe = 4 };
using Kind = AdapterAttributes::Kind;

// Every member of the adapter sets: number, type, kinds that read it, label,
// and the NIC and FCoE labels where those differ.  Read in this order.
#define NRV_ADAPTER_FIELDS(X)                                                         \
  X(514, kText, kNic | kIscsi | kFcoe, "_Manufacturer", nullptr, "_MANUFACTURER")     \
  X(515, kText, kNic | kIscsi | kFcoe, "_SerialNumber", nullptr, nullptr)             \
  X(516, kText, kNic | kIscsi | kFcoe, "_Model", nullptr, nullptr)                    \
  X(517, kText, kNic | kIscsi | kFcoe, "_ModelDescription", nullptr, nullptr)         \
  X(519, kText, kFcoe, "_NodeSymbolicName", nullptr, nullptr)                         \
  /* the iSCSI set reads 528 before the hardware version as well */                   \
  X(528, kText, kIscsi, "_OpertionalFirmwareVersion", nullptr, nullptr)               \
  X(520, kText, kNic | kIscsi | kFcoe, "_HardwareVersion", "_HWVersion", nullptr)     \
  X(521, kText, kNic | kIscsi | kFcoe, "_OptionROMVersion", nullptr, nullptr)         \
  X(522, kText, kNic | kIscsi | kFcoe, "_FirmwareVersion", nullptr, nullptr)          \
  X(523, kInteger, kNic | kFcoe, "_VendorSpecificID", nullptr, nullptr)               \
  X(525, kText, kNic | kIscsi | kFcoe, "_DriverName", nullptr, nullptr)               \
  X(526, kInteger, kNic | kIscsi | kFcoe, "_DeviceID", nullptr, nullptr)              \
  X(527, kInteger, kNic | kIscsi | kFcoe, "_ModelID", nullptr, nullptr)               \
  X(528, kText, kNic | kIscsi | kFcoe, "_OpertionalFirmwareVersion", nullptr, nullptr) \
  X(531, kMac, kFcoe, "_IEEEAddress", nullptr, nullptr)                               \
  X(532, kInteger, kNic, "_BootCodeEnabled", nullptr, nullptr)                        \
  X(533, kText, kNic | kIscsi | kFcoe, "_DriverVersion", nullptr, nullptr)            \
  X(534, kText, kNic | kIscsi | kFcoe, "_BootImageExpansionROMVersion", "_BootVersion", nullptr) \
  X(544, kInteger, kNic, "_DiagVersionNumber", nullptr, nullptr)                      \
  X(545, kText, kFcoe, "_FunctionalFirmwareVersion", nullptr, nullptr)                \
  X(546, kText, kFcoe, "_KernelFirmwareVersion", nullptr, nullptr)                    \
  X(549, kInteger, kFcoe, "_SLIMode", nullptr, nullptr)                               \
  X(551, kInteger, kNic | kFcoe, "_BoardTemperature", nullptr, nullptr)               \
  X(555, kInteger, kNic | kIscsi | kFcoe, "_PCIBusNumber", nullptr, nullptr)          \
  X(556, kInteger, kNic, "_FunctionType", nullptr, nullptr)                           \
  X(557, kInteger, kNic, "_SubDeviceID", nullptr, nullptr)                            \
  X(559, kInteger, kNic | kIscsi | kFcoe, "_PortNumber", nullptr, nullptr)            \
  X(560, kInteger, kNic | kIscsi | kFcoe, "_PCIFunctionNumber", nullptr, nullptr)     \
  X(561, kInteger, kNic, "_SubVendorID", nullptr, nullptr)                            \
  X(562, kInteger, kNic | kIscsi | kFcoe, "_FirmwareStatus", nullptr, nullptr)        \
  X(563, kText, kFcoe, "_SPFirmwareVersion", nullptr, nullptr)                        \
  X(564, kText, kFcoe, "_SPFirmwareName", nullptr, nullptr)                           \
  X(565, kText, kFcoe, "_ULPFirmwareVersion", nullptr, nullptr)                       \
  X(566, kText, kFcoe, "_ULPFirmwareName", nullptr, nullptr)                          \
  X(572, kText, kNic, "_IPLFilename", nullptr, nullptr)                               \
  X(573, kText, kNic, "_NCSIVersion", nullptr, nullptr)                               \
  X(574, kText, kNic, "_FCOEUniversalVersion", nullptr, nullptr)                      \
  X(575, kText, kNic, "_FCOE_X86_BIOSVersion", nullptr, nullptr)                      \
  X(576, kText, kNic, "_FCOE_EFIVersion", nullptr, nullptr)                           \
  X(577, kText, kNic, "_FCOE_FCODEVersion", nullptr, nullptr)                         \
  X(578, kText, kNic, "_UEFI_BIOSVersion", nullptr, nullptr)                          \
  X(579, kText, kNic, "_UEFI_NICVersion", nullptr, nullptr)                           \
  X(580, kText, kNic, "_UEFI_FCODEVersion", nullptr, nullptr)                         \
  X(581, kText, kNic, "_UEFI_ISCSIVersion", nullptr, nullptr)                         \
  X(582, kText, kNic, "_PCIBusSpeed", nullptr, nullptr)                               \
  X(583, kText, kNic, "_PCIBusWidth", nullptr, nullptr)                               \
  X(585, kInteger, kNic, "_PortConnectionType", nullptr, nullptr)                     \
  X(586, kText, kNic | kIscsi | kFcoe, "_Subadapter_number", nullptr, nullptr)        \
  X(591, kText, kNic, "_FirmwareOnFlash", nullptr, nullptr)

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
      setInteger(kAttrDriverType, driverType);
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
