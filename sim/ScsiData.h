// SCSI answers of a simulated logical unit: standard INQUIRY, the VPD pages
// 0x00, 0x80 and 0x83, READ CAPACITY(10), and fixed-format sense data for the
// commands a unit refuses.  Byte layouts are SCSI's (SPC/SBC), big-endian.
#pragma once

#include <cstdint>
#include <optional>
#include <vector>

#include "sim/Names.h"
#include "sim/SiteModel.h"

namespace nrvsim {

struct ScsiReply {
  bool check_condition = false;
  std::vector<uint8_t> data;   // response when !check_condition
  std::vector<uint8_t> sense;  // fixed-format sense when check_condition
};

// `target` names the unit's port for the derived NAA identifier when the site
// gives none.
ScsiReply scsi_inquiry(const ScsiUnit& unit, const Wwn& target, bool evpd, uint32_t page);
ScsiReply scsi_read_capacity(const ScsiUnit& unit);
// Sense for a LUN that does not exist (ILLEGAL REQUEST, 25/00).
ScsiReply scsi_no_such_lun();

// Copies as much of `from` as fits; clears the rest of the buffer.
void copy_reply(const std::vector<uint8_t>& from, void* buffer, uint32_t size);

// The largest LUN a single-level SAM LUN field carries (flat space addressing).
inline constexpr uint32_t kMaxFlatSpaceLun = 16383;
// The FCP LUN field of `lun` (at most kMaxFlatSpaceLun): single level,
// peripheral device addressing below 256, flat space above.
uint64_t fcp_lun(uint32_t lun);
// Inverse of fcp_lun; nullopt for a field this site never hands out.
std::optional<uint32_t> scsi_lun(uint64_t fcp);

}  // namespace nrvsim
