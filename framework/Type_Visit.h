// Maps a CIM type code to its C++ value type, so that code which handles a
// slot of any type is written once as a generic lambda over Tag<T>.
#pragma once

#include "framework/Instance.h"

namespace cimple {

template <class T>
struct Tag {
  using type = T;
};

// Calls f(Tag<T>{}) for the C++ type T of CIM type code `type` (0..13).
// Codes outside the table are treated as boolean; generated meta-data never
// holds them.
template <class F>
decltype(auto) visit_type(uint16_t type, F&& f) {
  switch (type) {
    case UINT8: return f(Tag<uint8>{});
    case SINT8: return f(Tag<sint8>{});
    case UINT16: return f(Tag<uint16>{});
    case SINT16: return f(Tag<sint16>{});
    case UINT32: return f(Tag<uint32>{});
    case SINT32: return f(Tag<sint32>{});
    case UINT64: return f(Tag<uint64>{});
    case SINT64: return f(Tag<sint64>{});
    case REAL32: return f(Tag<real32>{});
    case REAL64: return f(Tag<real64>{});
    case CHAR16: return f(Tag<char16>{});
    case STRING: return f(Tag<String>{});
    case DATETIME: return f(Tag<Datetime>{});
    default: return f(Tag<boolean>{});
  }
}

}  // namespace cimple
