#include "agent/Catalogue_Values.h"

#include <iterator>

namespace cimple {

namespace {

template <class Row, class Key>
const Row* find_row(const Row* rows, size_t count, Key key) {
  for (size_t i = 0; i < count; ++i)
    if (rows[i].key == key) return &rows[i];
  return nullptr;
}

struct Status_Row {
  uint32_t key;
  Port_Status status;
};
constexpr Status_Row kStatus[] = {
    {2, {2, "OK"}},
    {3, {10, "Stopped"}},
    {4, {1, "Other"}},
    {5, {11, "InService"}},
    {6, {3, "Link Down"}},
    {7, {6, "Error"}},
    {8, {32776, "InService"}},
    {20, {32788, "Operational. Need RESET"}},
    {21, {32789, "Link down. Need RESET"}},
    {22, {32790, "Disable"}},
};

struct Speed_Row {
  uint32_t key;
  uint64_t bps;
};
constexpr Speed_Row kSpeeds[] = {
    {1, 1000000000ull}, {2, 2000000000ull}, {4, 10000000000ull}, {8, 4000000000ull}, {16, 8000000000ull},
};

struct Type_Row {
  uint32_t key;
  FC_Port_Type type;
};
constexpr Type_Row kTypes[] = {
    {2, {1, "Other"}}, {5, {10, "N"}}, {6, {11, "NL"}}, {7, {16, "FL"}}, {8, {15, "F"}},
    {9, {14, "E"}},    {10, {18, "G"}}, {20, {1, "Private Loop"}}, {21, {1, "Point to Point"}},
};

}  // namespace

Port_Status port_status(uint32_t port_state, bool fcoe) {
  if (fcoe && port_state == 6) return {1, "Other"};
  const Status_Row* row = find_row(kStatus, std::size(kStatus), port_state);
  return row ? row->status : Port_Status{0, "Unknown"};
}

uint16_t enabled_state(uint32_t physical_port_state) {
  switch (physical_port_state) {
    case 2: return 2;
    case 5: return 7;
    case 1: return 0;
    case 3: case 6: case 21: case 22: return 3;
    default: return 1;
  }
}

uint64_t speed_bps(uint32_t speed_code) {
  const Speed_Row* row = find_row(kSpeeds, std::size(kSpeeds), speed_code);
  return row ? row->bps : 0;
}

FC_Port_Type fc_port_type(uint32_t hba_port_type) {
  const Type_Row* row = find_row(kTypes, std::size(kTypes), hba_port_type);
  return row ? row->type : FC_Port_Type{0, "Unknown"};
}

}  // namespace cimple
