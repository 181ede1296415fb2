// SCSI response and sense data of simulated logical units.
#include "sim/ScsiData.h"

#include <algorithm>
#include <cstring>
#include <optional>

namespace nrvsim {
namespace {

void put_text(std::vector<uint8_t>& d, size_t at, size_t width, const std::string& s) {
  for (size_t i = 0; i < width; ++i) d[at + i] = i < s.size() ? static_cast<uint8_t>(s[i]) : ' ';
}

ScsiReply sense(uint8_t key, uint8_t asc, uint8_t ascq) {
  ScsiReply r;
  r.check_condition = true;
  r.sense.assign(18, 0);
  r.sense[0] = 0x70;  // current error, fixed format
  r.sense[2] = key;
  r.sense[7] = 10;  // additional length
  r.sense[12] = asc;
  r.sense[13] = ascq;
  return r;
}

// NAA 6 (registered extended) from the target port name and the LUN, so every
// unit of a site has a distinct, stable designator.
std::vector<uint8_t> derived_naa(const Wwn& target, uint32_t lun) {
  std::vector<uint8_t> id(16, 0);
  id[0] = static_cast<uint8_t>(0x60 | (target[2] >> 4));
  id[1] = static_cast<uint8_t>((target[2] << 4) | (target[3] >> 4));
  id[2] = static_cast<uint8_t>((target[3] << 4) | (target[4] >> 4));
  id[3] = static_cast<uint8_t>(target[4] << 4);
  for (size_t i = 0; i < 8; ++i) id[4 + i] = target[i];
  id[12] = static_cast<uint8_t>(lun >> 24);
  id[13] = static_cast<uint8_t>(lun >> 16);
  id[14] = static_cast<uint8_t>(lun >> 8);
  id[15] = static_cast<uint8_t>(lun);
  return id;
}

}  // namespace

ScsiReply scsi_inquiry(const ScsiUnit& unit, const Wwn& target, bool evpd, uint32_t page) {
  ScsiReply r;
  const uint8_t type = unit.device_type & 0x1F;
  if (!evpd) {
    if (page != 0) return sense(0x05, 0x24, 0x00);  // invalid field in CDB
    r.data.assign(96, 0);
    r.data[0] = type;
    r.data[1] = type == 0x01 || type == 0x08 ? 0x80 : 0x00;  // tapes and changers are removable
    r.data[2] = 0x06;                                         // SPC-4
    r.data[3] = 0x02;                                         // response data format 2
    r.data[4] = static_cast<uint8_t>(r.data.size() - 5);
    r.data[7] = 0x02;  // CMDQUE
    put_text(r.data, 8, 8, unit.vendor);
    put_text(r.data, 16, 16, unit.product);
    put_text(r.data, 32, 4, unit.revision);
    return r;
  }
  switch (page) {
    case 0x00: {
      r.data = {type, 0x00, 0x00, 3, 0x00, 0x80, 0x83};
      return r;
    }
    case 0x80: {
      const std::string& sn = unit.serial;
      r.data.assign(4 + sn.size(), 0);
      r.data[0] = type;
      r.data[1] = 0x80;
      r.data[3] = static_cast<uint8_t>(std::min<size_t>(sn.size(), 251));
      std::memcpy(r.data.data() + 4, sn.data(), r.data[3]);
      r.data.resize(4 + r.data[3]);
      return r;
    }
    case 0x83: {
      const std::vector<uint8_t> id = unit.naa.empty() ? derived_naa(target, unit.lun) : unit.naa;
      r.data.assign(8 + id.size(), 0);
      r.data[0] = type;
      r.data[1] = 0x83;
      r.data[3] = static_cast<uint8_t>(4 + id.size());  // page length
      r.data[4] = 0x01;                                  // binary code set
      r.data[5] = 0x03;                                  // LU association, NAA designator
      r.data[7] = static_cast<uint8_t>(id.size());
      std::memcpy(r.data.data() + 8, id.data(), id.size());
      return r;
    }
    default:
      return sense(0x05, 0x24, 0x00);
  }
}

ScsiReply scsi_read_capacity(const ScsiUnit& unit) {
  // Only block devices answer READ CAPACITY; a tape or a controller refuses
  // the operation code the way real ones do.
  const uint8_t type = unit.device_type & 0x1F;
  const bool block = type == 0x00 || type == 0x05 || type == 0x07 || type == 0x0E;
  if (!block || unit.blocks == 0) return sense(0x05, 0x20, 0x00);  // invalid command operation code
  ScsiReply r;
  r.data.assign(8, 0);
  const uint64_t last = unit.blocks - 1;
  const uint32_t last32 = last > 0xFFFFFFFFull ? 0xFFFFFFFFu : static_cast<uint32_t>(last);
  for (int i = 0; i < 4; ++i) {
    r.data[static_cast<size_t>(i)] = static_cast<uint8_t>(last32 >> (24 - 8 * i));
    r.data[static_cast<size_t>(4 + i)] = static_cast<uint8_t>(unit.block_size >> (24 - 8 * i));
  }
  return r;
}

ScsiReply scsi_no_such_lun() { return sense(0x05, 0x25, 0x00); }

void copy_reply(const std::vector<uint8_t>& from, void* buffer, uint32_t size) {
  if (buffer == nullptr || size == 0) return;
  std::memset(buffer, 0, size);
  std::memcpy(buffer, from.data(), std::min<size_t>(from.size(), size));
}

uint64_t fcp_lun(uint32_t lun) {
  // SAM: LUNs below 256 use peripheral device addressing, larger ones flat
  // space; the site loader refuses LUNs that neither can carry.
  if (lun < 256) return static_cast<uint64_t>(lun) << 48;
  return (static_cast<uint64_t>(0x4000 | lun)) << 48;
}

std::optional<uint32_t> scsi_lun(uint64_t fcp) {
  const uint16_t first = static_cast<uint16_t>(fcp >> 48);
  if ((fcp & 0x0000FFFFFFFFFFFFull) != 0) return std::nullopt;
  switch (first >> 14) {
    case 0: return first & 0xFF;
    case 1: return first & 0x3FFF;
    default: return std::nullopt;
  }
}

}  // namespace nrvsim
