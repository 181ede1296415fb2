// An adapter function's field-replaceable-unit record: its FRU VPD read
// with LRM_GetVPDV2 and laid out by keyword, and the texts of its codes.
//
// Contract: a record is plain data, cleared before each read.  Text members
// hold at most their size in characters (a longer value is cut) and are not
// always terminated: read them only through text(), which never reads past
// the member.  Every text keeps printable ASCII only.
#pragma once

#include <stddef.h>
#include <stdint.h>

#include <string>
#include <vector>

#include "access/NRV_VpdWalk.h"

namespace cimple {

struct NRV_FruRecord {
  char MN[256];           //    0 manufacturer
  char PA[256];           //  256 product name
  char PN[256];           //  512 part number
  char SN[256];           //  768 serial number
  char UU[256];           // 1024 the first 16 value bytes as 32 lower-case hex digits
  char FW[40];            // 1280 firmware detail text
  char FN[16];            // 1320 FRU number
  char FWVersion[16];     // 1336 the FW piece after "V:"
  char FWDate[16];        // 1352 the FW piece after "D:"
  char reserved[128];     // 1368
  char DM[16];            // 1496 date (WWYY)
  uint32_t CF;            // 1512 card function (the first value byte)
  uint32_t RI;            // 1516 revision identifier (the first value byte)

  // A text member up to its terminator or its end.
  template <size_t N>
  static std::string text(const char (&member)[N]) {
    size_t n = 0;
    while (n < N && member[n] != '\0') ++n;
    return std::string(member, n);
  }

  // Clears the record and fills it from the walked entries; entries whose
  // keyword is not a FRU keyword are skipped.
  void fill(const std::vector<Vpd_Entry>& entries);
};
static_assert(sizeof(NRV_FruRecord) == 1520);
static_assert(offsetof(NRV_FruRecord, FW) == 1280);
static_assert(offsetof(NRV_FruRecord, FWDate) == 1352);
static_assert(offsetof(NRV_FruRecord, DM) == 1496);
static_assert(offsetof(NRV_FruRecord, RI) == 1516);

// The FRU keywords with their descriptions, in table order.
struct Fru_Keyword {
  const char* keyword;
  const char* description;
};
extern const Fru_Keyword kFruKeywords[10];

// Reads the FRU record of the function named by `deviceId` (16 hex digits).
// 0; 4 for a null argument; 1 when the name does not convert; else the
// library's status (the record is then left cleared).
uint32_t GetFRUVPD(const char* deviceId, NRV_FruRecord* out);

// 0 "Reserved", 16 "Infiniband", 64 "Ethernet", 80 "Fibre Channel", 96
// "iSCSI": 0 with `text` set; kNrvNotFound ("" in `text`) for other values.
uint32_t CardFunctionText(uint32_t value, std::string& text);
// 2 "Driver", 10 "Firmware", 11 "BIOD/Fcode", 32775 "CIM Provider";
// kNrvNotFound otherwise.
uint32_t SoftwareClassificationText(uint32_t value, std::string& text);

}  // namespace cimple
