// The walk over a vital-product-data image that the management library
// answers (general VPD and FRU VPD alike), entry by entry with its
// RM_GetNextVpdEntry, kept inside the image whatever the library does.
//
// Contract: the walk works on its own copy of the image, padded so that an
// entry read at any cursor inside it stays inside the copy; it stops at the
// library's end, at a cursor outside the image or not beyond the previous
// one, and after at most one entry per three bytes of image (an entry takes
// at least three).  Nothing is kept between calls.
#pragma once

#include <stdint.h>

#include <string>
#include <vector>

#include "access/RM_Types.h"

namespace cimple {

struct Vpd_Entry {
  std::string keyword;  // the two keyword bytes as they stand (0x82 0x82: the identifier string)
  std::string value;    // the library's whole value buffer, RM_VPD_VALUE_SIZE bytes

  // The value up to its first NUL (at most RM_VPD_VALUE_SIZE characters).
  std::string text() const;
};

// RM_GetNextVpdEntry's shape: fills keyword (4 bytes) and value (256 bytes)
// from the entry at `cursor` and answers the next cursor, or null at the end.
using Vpd_Next = void* (*)(void* cursor, char* keyword, char* value);

// The entries of `image` (the bytes the library delivered), in order.
// `next` defaults to the library's own walk.
std::vector<Vpd_Entry> walkVpd(const std::vector<uint8_t>& image, Vpd_Next next = nullptr);

// The text with every byte outside printable ASCII replaced by '?', so that
// bytes a card stores never reach a CIM string as broken text.
std::string printableText(const std::string& text);

}  // namespace cimple
