// An HBA API adapter handle opened by name and closed when it goes out of
// scope, so no discovery path leaves a handle open behind an exception.
//
// Contract: the HBA API library must stay loaded for the handle's lifetime.
#pragma once

#include <string>

#include "access/RM_Api.h"

namespace cimple {

class HbaAdapterHandle {
 public:
  explicit HbaAdapterHandle(std::string name) {
    m_Handle = HBA_OpenAdapter(name.data());  // the API takes a mutable name
  }
  HbaAdapterHandle(const HbaAdapterHandle&) = delete;
  HbaAdapterHandle& operator=(const HbaAdapterHandle&) = delete;
  ~HbaAdapterHandle() {
    if (m_Handle != 0) HBA_CloseAdapter(m_Handle);
  }

  // 0 when the adapter could not be opened.
  HBA_HANDLE get() const { return m_Handle; }

 private:
  HBA_HANDLE m_Handle = 0;
};

}  // namespace cimple
