#include "data/NRV_Target.h"

#include <stdio.h>
#include <string.h>

#include <stdexcept>
#include <string>

#include "access/NRV_Common.h"
#include "access/RM_Api.h"
#include "data/NRV_Adapter.h"
#include "data/NRV_DataLog.h"
#include "data/NRV_HbaHandle.h"

namespace cimple {

namespace {

constexpr HBA_UINT32 kResponseSize = 255;
constexpr HBA_UINT32 kSenseSize = 128;
constexpr int kSendAttempts = 3;
constexpr size_t kSenseBytesLogged = 24;

// The buffers of one SCSI command, cleared for each command.
struct ScsiBuffers {
  uint8_t response[kResponseSize];
  uint8_t sense[kSenseSize];
  void clear() {
    memset(response, 0, sizeof response);
    memset(sense, 0, sizeof sense);
  }
};

// Sends `command` until it stops answering check condition, at most three times.
template <class Command>
HBA_STATUS sendScsi(ScsiBuffers& b, Command command) {
  HBA_STATUS status = HBA_STATUS_ERROR;
  for (int attempt = 0; attempt < kSendAttempts; ++attempt) {
    b.clear();
    status = command(b);
    if (status != HBA_STATUS_SCSI_CHECK_CONDITION) break;
  }
  return status;
}

HBA_STATUS inquiry(HBA_HANDLE handle, const HBA_WWN& port, HBA_UINT64 lun, HBA_UINT8 evpd,
                   HBA_UINT32 page, ScsiBuffers& b) {
  return sendScsi(b, [&](ScsiBuffers& x) {
    return HBA_SendScsiInquiry(handle, port, lun, evpd, page, x.response, kResponseSize, x.sense,
                               kSenseSize);
  });
}

void logFailure(HBA_STATUS status) {
  NRV_DATA_LOG(NRV_DBG, "HBA_SendScsiInquiry_t(0x80) returns %d.", static_cast<int>(status));
}

// "%.<n>s" of a fixed field: at most n bytes, cut at a NUL.
std::string field(const uint8_t* bytes, size_t n) {
  const char* p = reinterpret_cast<const char*>(bytes);
  return std::string(p, strnlen(p, n));
}

uint32_t bigEndian32(const uint8_t* p) {
  return (uint32_t{p[0]} << 24) | (uint32_t{p[1]} << 16) | (uint32_t{p[2]} << 8) | p[3];
}

std::string plainName(const HBA_WWN& wwn) {
  char text[kHbaNamePlainSize] = {};
  HBAName2string(wwn, text);
  return text;
}

const char kUnknown[] = "Unknown";
constexpr uint32_t kUnknownDeviceType = 0x1F;  // SPC: unknown or no device type

}  // namespace

uint32_t parseDeviceIdentifier(const uint8_t* page, size_t size, DeviceIdentifier* out) {
  if (page == nullptr || out == nullptr) return kNrvFailure;
  memset(out, 0, sizeof *out);
  if (size < 8) return kNrvFailure;
  out->deviceType = page[0] & 0x1F;
  out->pageCode = page[1];
  out->pageLength = page[3];
  out->identifierType = page[5] & 0x0F;
  // The answer may claim more identifier bytes than it holds.
  size_t length = page[7];
  if (length > size - 8) length = size - 8;
  if (length > sizeof out->identifier) length = sizeof out->identifier;
  out->identifierLength = static_cast<uint32_t>(length);
  memcpy(out->identifier, page + 8, length);
  return 0;
}

Target::Target(const Adapter& adapter, const HBA_FCPSCSIENTRY& entry) : Target(adapter.getHbaApiName(), entry) {}

Target::Target(const std::string& hbaApiName, const HBA_FCPSCSIENTRY& entry) {
  NRV_DATA_LOG(NRV_DBG, "Creating Target...");
  m_NodeName = plainName(entry.FcpId.NodeWWN);
  NRV_DATA_LOG(NRV_DBG, "Target NodeWWN: %s", m_NodeName.c_str());
  m_PortName = plainName(entry.FcpId.PortWWN);
  NRV_DATA_LOG(NRV_DBG, "Target PortWWN: %s", m_PortName.c_str());
  m_FcpLun = entry.FcpId.FcpLun;
  m_OSDeviceName = field(reinterpret_cast<const uint8_t*>(entry.ScsiId.OSDeviceName),
                         sizeof entry.ScsiId.OSDeviceName);

  HbaAdapterHandle handle(hbaApiName);
  if (handle.get() == 0) {
    NRV_DATA_LOG(NRV_ERR, "HBA_OpenAdapter failed, skipping Adapter %s", hbaApiName.c_str());
    throw std::runtime_error("HBA_OpenAdapter failed");
  }
  const HBA_WWN port = entry.FcpId.PortWWN;
  inquireStandard(handle.get(), port);
  inquireSerial(handle.get(), port);
  inquireIdentifier(handle.get(), port);
  readCapacity(handle.get(), port);
  NRV_DATA_LOG(NRV_DBG, "End Creating Target...");
}

Target::~Target() = default;

void Target::inquireStandard(HBA_HANDLE handle, const HBA_WWN& port) {
  ScsiBuffers b;
  NRV_DATA_LOG(NRV_DBG, "SCSI Inquiry with 0, 0");
  const HBA_STATUS status = inquiry(handle, port, m_FcpLun, 0, 0, b);
  if (status != HBA_STATUS_OK) {
    logFailure(status);
    m_Vendor = m_Product = m_Revision = kUnknown;
    // Without an answer the unit's type is unknown, not "direct access":
    // the catalogue must not present a tape or a controller as a volume.
    m_DeviceType = kUnknownDeviceType;
    return;
  }
  m_DeviceType = b.response[0] & 0x1F;
  NRV_DATA_LOG(NRV_DBG, "DeviceType......%d", static_cast<int>(m_DeviceType));
  m_Vendor = field(b.response + 8, 8);
  m_Product = field(b.response + 16, 16);
  m_Revision = field(b.response + 32, 4);
}

void Target::inquireSerial(HBA_HANDLE handle, const HBA_WWN& port) {
  ScsiBuffers b;
  NRV_DATA_LOG(NRV_DBG, "SCSI Inquiry with 1, 0x80");
  const HBA_STATUS status = inquiry(handle, port, m_FcpLun, 1, 0x80, b);
  if (status != HBA_STATUS_OK) {
    logFailure(status);
    m_SerialNumber = kUnknown;
    return;
  }
  // Bounded by the page length and the response buffer: a serial number
  // that fills the page carries no terminator.
  size_t length = b.response[3];
  if (length > kResponseSize - 4) length = kResponseSize - 4;
  m_SerialNumber = field(b.response + 4, length);
}

void Target::inquireIdentifier(HBA_HANDLE handle, const HBA_WWN& port) {
  ScsiBuffers b;
  NRV_DATA_LOG(NRV_DBG, "SCSI Inquiry with 1, 0x83");
  const HBA_STATUS status = inquiry(handle, port, m_FcpLun, 1, 0x83, b);
  if (status == HBA_STATUS_OK) {
    parseDeviceIdentifier(b.response, kResponseSize, &m_DeviceId);
    return;
  }
  logFailure(status);
  if (status == HBA_STATUS_SCSI_CHECK_CONDITION) {
    std::string line = "Sense Data: ";
    char pair[4];
    for (size_t i = 0; i < kSenseBytesLogged; ++i) {
      snprintf(pair, sizeof pair, "%02x ", b.sense[i]);
      line += pair;
    }
    NRV_DATA_LOG(NRV_DBG, "%s", line.c_str());
  }
}

void Target::readCapacity(HBA_HANDLE handle, const HBA_WWN& port) {
  ScsiBuffers b;
  NRV_DATA_LOG(NRV_DBG, "Send Read Capacity");
  const HBA_STATUS status = sendScsi(b, [&](ScsiBuffers& x) {
    return HBA_SendReadCapacity(handle, port, m_FcpLun, x.response, kResponseSize, x.sense,
                                kSenseSize);
  });
  if (status != HBA_STATUS_OK) {
    logFailure(status);
    m_LastLBA = m_BlockLength = 0;
    return;
  }
  m_LastLBA = bigEndian32(b.response);
  m_BlockLength = bigEndian32(b.response + 4);
}

}  // namespace cimple
