// Function_View: one PCI function of the adapter data set (an adapter and
// its port) as the catalogue builders see it: the texts and numbers that name
// the physical card, chip and port it sits on.
//
// Contract: a view only; the adapter and port (and so the attribute sets) must
// outlive it.  A function whose attribute sets could not be read shows empty
// texts and zeros.
#pragma once

#include <cstdint>
#include <string>

#include "access/RM_Attributes.h"
#include "data/NRV_Adapter.h"
#include "data/NRV_Port.h"

namespace cimple {

struct Function_View {
  Function_View(const Adapter& adapter, const Port& port, size_t index)
      : adapter(adapter), port(port), index(index), a(*adapter.getAttributes()), p(*port.getAttributes()) {}

  const Adapter& adapter;
  const Port& port;
  size_t index;  // position of the adapter in the data set
  const AdapterAttributes& a;
  const PortAttributes& p;

  const std::string& serial() const { return a.text(RM_HA_SERIAL_NUMBER); }
  const std::string& sub_adapter() const { return a.text(RM_HA_SUBADAPTER_NUMBER); }
  const std::string& model() const { return a.text(RM_HA_MODEL); }
  const std::string& model_description() const { return a.text(RM_HA_MODEL_DESCRIPTION); }
  const std::string& manufacturer() const { return a.text(RM_HA_MANUFACTURER); }
  uint32_t physical_port() const { return a.integer(RM_HA_PORT_NUMBER); }
  // The identifier that names the function and its port (16 hex digits).
  const std::string& name() const { return port.getPortName(); }

  // The chip's tag: the serial number, and ":" with the sub-adapter number
  // when there is one.
  std::string chip_tag() const { return sub_adapter().empty() ? serial() : serial() + ":" + sub_adapter(); }
  // "SerialNumber:PhysicalPortNumber", the key of the physical port.
  std::string port_key() const { return serial() + ":" + std::to_string(physical_port()); }
};

// The management library's handle of the port named `device_id` (its
// identifier text), through the colon form.  False, after logging
// `id_failure` or `str_failure` at NRV_ERR, when the text does not convert.
bool port_handle(const std::string& device_id, HBA_NAME& handle, const char* id_failure, const char* str_failure);

}  // namespace cimple
