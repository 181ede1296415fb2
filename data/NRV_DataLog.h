// The log call of the adapter data set: every unit of this folder logs under
// the one source name "NRV_Data.cpp", so that a trace reads as one unit's.
#pragma once

#include "logging/Log.h"

#define NRV_DATA_LOG(level, ...)                                                 \
  do {                                                                           \
    static const int nrv_data_line_ = __LINE__;                                  \
    ::cimple::nrv_log("NRV_Data.cpp", &nrv_data_line_, (level), __VA_ARGS__);    \
  } while (0)
