// SFF record to transceiver instance.
#include "data/NRV_Transceiver.h"

#include <cmath>
#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

#include "access/NRV_Common.h"
#include "access/NRV_VpdWalk.h"
#include "access/RM_Api.h"
#include "logging/Log.h"

namespace cimple {

namespace {

using Transceiver = NRVTAVO_Transceiver;
using Reading = Property<real32> Transceiver::*;

// Byte offsets of the record.
enum : size_t {
  kSerialIdPresent = 584,
  kDiagnosticsPresent = 585,
  kThirdStatus = 586,
  kIdentifier = 588,
  kExtIdentifier = 589,
  kConnector = 590,
  kWavelength = 592,
  kOui = 616,
  kVendorName = 620,
  kVendorPart = 638,
  kVendorRevision = 656,
  kVendorSerial = 662,
  kDateCode = 680,
  kDateCodeEnd = 686,
};

// A threshold group: four 16-bit raw values (high alarm, low alarm, high
// warning, low warning) and the factor to the published unit.
struct Threshold_Group {
  size_t offset;
  bool isSigned;
  double factor;
  Reading members[4];
};

constexpr Threshold_Group kThresholds[] = {
    {296, true, 1.0 / 256,
     {&Transceiver::TemperatureHighAlarm, &Transceiver::TemperatureLowAlarm, &Transceiver::TemperatureHighWarning,
      &Transceiver::TemperatureLowWarning}},
    {304, false, 100.0 / 1000000,
     {&Transceiver::VoltageHighAlarm, &Transceiver::VoltageLowAlarm, &Transceiver::VoltageHighWarning,
      &Transceiver::VoltageLowWarning}},
    {312, false, 2.0 / 1000,
     {&Transceiver::CurrentHighAlarm, &Transceiver::CurrentLowAlarm, &Transceiver::CurrentHighWarning,
      &Transceiver::CurrentLowWarning}},
    {320, false, 0.1 / 1000,
     {&Transceiver::TxPowerHighAlarm, &Transceiver::TxPowerLowAlarm, &Transceiver::TxPowerHighWarning,
      &Transceiver::TxPowerLowWarning}},
    {328, false, 0.1 / 1000,
     {&Transceiver::RxPowerHighAlarm, &Transceiver::RxPowerLowAlarm, &Transceiver::RxPowerHighWarning,
      &Transceiver::RxPowerLowWarning}},
};

// The live readings: offset, member and log format.
struct Live_Reading {
  size_t offset;
  Reading member;
  const char* format;
};

constexpr Live_Reading kReadings[] = {
    {596, &Transceiver::Temperature, "Temperature: %-6.2f C"},
    {600, &Transceiver::Vcc, "Vcc:  %-6.2f V"},
    {604, &Transceiver::TxBiasCurrent, "TxBiasCurrent: %-6.2f mA"},
    {608, &Transceiver::TxPower, "TxPower: %-6.2f mW"},
    {612, &Transceiver::RxPower, "RxPower: %-6.2f mW"},
};

template <class T>
T read(const uint8_t* record, size_t offset) {
  T value;
  std::memcpy(&value, record + offset, sizeof value);
  return value;
}

// A text field running to the next field, printable and without its padding.
std::string field(const uint8_t* record, size_t offset, size_t end) {
  const auto* text = reinterpret_cast<const char*>(record + offset);
  std::string value = printableText(std::string(text, strnlen(text, end - offset)));
  value.erase(value.find_last_not_of(' ') + 1);
  return value;
}

// "YYMMDD" as a CIM datetime; false when it is not a calendar date.
bool manufactureDate(const std::string& code, std::string& text) {
  if (code.size() != 6) return false;
  for (char c : code)
    if (c < '0' || c > '9') return false;
  int year = std::stoi(code.substr(0, 2));
  const int month = std::stoi(code.substr(2, 2));
  const int day = std::stoi(code.substr(4, 2));
  year += year < 70 ? 2000 : 1900;
  static constexpr int kDays[] = {31, 29, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31};
  if (month < 1 || month > 12 || day < 1 || day > kDays[month - 1]) return false;
  if (month == 2 && day == 29 && !(year % 4 == 0 && (year % 100 != 0 || year % 400 == 0))) return false;
  char out[64];
  std::snprintf(out, sizeof out, "%04d%02d%02d000000.000000+000", year, month, day);
  text = out;
  return true;
}

void setReading(Transceiver& t, Reading member, double value) {
  if (std::isfinite(value) && std::fabs(value) <= 3.4e38) (t.*member).set(static_cast<real32>(value));
}

}  // namespace

NRVTAVO_Transceiver* transceiverFromSff(const uint8_t* record, const char* deviceId) {
  auto* t = makeInstance<Transceiver>();
  t->CreationClassName.set("NRVTAVO_Transceiver");
  t->ElementName.set("NRVTAVO_Transceiver");
  t->Description.set("Norvane PhysicalComponent Data");
  t->RemovalConditions.set(2);
  t->OperationalStatus.set(Array<uint16>{0});
  t->StatusDescriptions.set(Array<String>{String("unknown")});
  NRV_LOG(NRV_DBG, "PhysicalComponentInstance for : %s", deviceId);

  const std::string vendor = field(record, kVendorName, kVendorPart);
  const std::string part = field(record, kVendorPart, kVendorRevision);
  const std::string revision = field(record, kVendorRevision, kVendorSerial);
  const std::string serial = field(record, kVendorSerial, kDateCode);
  char oui[16];
  std::snprintf(oui, sizeof oui, "%02X-%02X-%02x", record[kOui], record[kOui + 1], record[kOui + 2]);
  NRV_LOG(NRV_DBG, "VendorName: %s", vendor.c_str());
  t->Manufacturer.set(String(vendor));
  NRV_LOG(NRV_DBG, "VendorOUI: %s", oui);
  t->OUI.set(oui);
  NRV_LOG(NRV_DBG, "VendorPN: %s", part.c_str());
  t->PartNumber.set(String(part));
  NRV_LOG(NRV_DBG, "VendorRev: %s", revision.c_str());
  t->Version.set(String(revision));
  t->SerialNumber.set(String(serial));
  const String id(std::string(deviceId) + ":" + serial);
  t->InstanceID.set(id);
  t->ElementName.set(id);
  t->Name.set(id);
  t->Tag.set(id);
  NRV_LOG(NRV_DBG, "VendorSN: %s#", serial.c_str());

  const std::string code = field(record, kDateCode, kDateCodeEnd);
  NRV_LOG(NRV_DBG, "DateCode: %s", code.c_str());
  std::string date;
  Datetime manufactured;
  if (manufactureDate(code, date) && manufactured.set(date.c_str())) {
    t->ManufactureDate.set(manufactured);
    NRV_LOG(NRV_DBG, "ManufactureDate: %s", date.c_str());
  } else {
    NRV_LOG(NRV_ERR, "DateCode %s is not a date; ManufactureDate left unset", code.c_str());
  }

  if (record[kSerialIdPresent] != 0) {
    t->Identifier.set(record[kIdentifier]);
    t->ExtIdentifier.set(record[kExtIdentifier]);
    t->Connector.set(record[kConnector]);
    t->WaveLength.set(read<uint16_t>(record, kWavelength));
    NRV_LOG(NRV_DBG, "Identifier: %xh", record[kIdentifier]);
    NRV_LOG(NRV_DBG, "ExtIdentifier: %xh", record[kExtIdentifier]);
    NRV_LOG(NRV_DBG, "Connector: %xh", record[kConnector]);
    NRV_LOG(NRV_DBG, "Wavelength: %d nm", read<uint16_t>(record, kWavelength));
    const bool allPresent = record[kSerialIdPresent] && record[kDiagnosticsPresent] && record[kThirdStatus];
    t->SFPStatus.set(allPresent ? 0 : 1);
  }

  if (record[kDiagnosticsPresent] != 0) {
    for (const Live_Reading& r : kReadings) {
      const float value = read<float>(record, r.offset);
      NRV_LOG(NRV_DBG, r.format, static_cast<double>(value));
      setReading(*t, r.member, value);
    }
    t->TemperatureUnit.set("Celsius");
    for (const Threshold_Group& g : kThresholds)
      for (size_t i = 0; i < 4; ++i) {
        const size_t at = g.offset + 2 * i;
        const double raw = g.isSigned ? read<int16_t>(record, at) : read<uint16_t>(record, at);
        setReading(*t, g.members[i], raw * g.factor);
      }
  }
  return t;
}

NRVTAVO_Transceiver* GetSffData(NRV_Catalogue& catalogue, const char* deviceId) {
  HBA_NAME name{};
  if (!deviceIdToHBAName(deviceId, name, "Id2HBAName failed", "str2HBAName failed")) return nullptr;
  std::vector<uint8_t> record(RM_SFF_DATA_SIZE, 0);
  HBA_UINT32 size = RM_SFF_DATA_SIZE;
  const RM_STATUS status = LRM_GetSffData(name, record.data(), &size);
  if (status != RM_STATUS_SUCCESS) {
    NRV_LOG(NRV_DBG, "Unable to obtain transceiver data for this host bus adapter.");
    return nullptr;
  }
  NRV_LOG(NRV_DBG, "RM_GetSffData succesful");
  NRVTAVO_Transceiver* transceiver = transceiverFromSff(record.data(), deviceId);
  if (!catalogue.insert(transceiver)) {
    NRV_LOG(NRV_CRIT, "Insert Failed : m_CIM_PhysicalComponent_map ");
    return nullptr;
  }
  NRV_LOG(NRV_DBG, "Success...");
  return transceiver;
}

}  // namespace cimple
