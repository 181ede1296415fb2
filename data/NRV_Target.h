// A SCSI logical unit behind an FCoE port, as the HBA API's target mapping
// lists it, with its INQUIRY, VPD and READ CAPACITY answers.
//
// Contract: the constructor opens its own HBA API handle on the adapter's HBA
// API name and closes it before returning; it throws std::runtime_error when
// the handle cannot be opened.  SCSI failures never fail it: they leave
// "Unknown" or 0 in the members concerned.  A Target is immutable afterwards.
#pragma once

#include <stdint.h>
#include <time.h>  // hbaapi.h uses struct tm without including it

#include <hbaapi.h>

#include <string>

namespace cimple {

class Adapter;

// VPD page 0x83, first designation descriptor (272 bytes, zero when the page
// could not be read).
struct DeviceIdentifier {
  uint8_t deviceType;        // page byte 0 & 0x1F
  uint8_t pageCode;          // page byte 1
  uint32_t pageLength;       // page byte 3
  uint32_t identifierType;   // page byte 5 & 0x0F
  uint32_t identifierLength; // page byte 7, bytes valid in identifier[]
  uint8_t identifier[256];   // from page byte 8
};
static_assert(sizeof(DeviceIdentifier) == 272);

// Parses a page 0x83 answer of `size` bytes into `out`.  0, or 0x8001 for a
// null record or page.  Never reads past `size`: the identifier length is cut
// to the bytes the answer holds.
uint32_t parseDeviceIdentifier(const uint8_t* page, size_t size, DeviceIdentifier* out);

class Target {
 public:
  Target(const Adapter& adapter, const HBA_FCPSCSIENTRY& entry);
  // `hbaApiName`: the HBA API name of the adapter the entry was mapped on.
  Target(const std::string& hbaApiName, const HBA_FCPSCSIENTRY& entry);
  Target(const Target&) = delete;
  Target& operator=(const Target&) = delete;
  virtual ~Target();

  uint32_t getReserved() const { return m_Reserved; }  // always 0
  const std::string& getNodeName() const { return m_NodeName; }   // 16 hex digits
  const std::string& getPortName() const { return m_PortName; }   // 16 hex digits
  uint64_t getFcpLun() const { return m_FcpLun; }
  const std::string& getOSDeviceName() const { return m_OSDeviceName; }
  uint64_t getBlockLength() const { return m_BlockLength; }
  uint64_t getLastLogicalBlockAddress() const { return m_LastLBA; }
  // 0x1F (unknown) when the standard INQUIRY failed.
  uint32_t getDeviceType() const { return m_DeviceType; }
  const std::string& getVendor() const { return m_Vendor; }
  const std::string& getProduct() const { return m_Product; }
  const std::string& getRevision() const { return m_Revision; }
  const std::string& getSerialNumber() const { return m_SerialNumber; }
  const DeviceIdentifier& getDeviceIdentifier() const { return m_DeviceId; }

 private:
  void inquireStandard(HBA_HANDLE handle, const HBA_WWN& port);
  void inquireSerial(HBA_HANDLE handle, const HBA_WWN& port);
  void inquireIdentifier(HBA_HANDLE handle, const HBA_WWN& port);
  void readCapacity(HBA_HANDLE handle, const HBA_WWN& port);

  uint32_t m_Reserved = 0;
  std::string m_NodeName;
  std::string m_PortName;
  uint64_t m_FcpLun = 0;
  std::string m_OSDeviceName;
  uint64_t m_BlockLength = 0;
  uint64_t m_LastLBA = 0;
  uint32_t m_DeviceType = 0;
  std::string m_Vendor;
  std::string m_Product;
  std::string m_Revision;
  std::string m_SerialNumber;
  DeviceIdentifier m_DeviceId{};
};

}  // namespace cimple
