// Every paired operation of the management library under both its names,
// LRM_<op> and RM_<op>, generated from the one function table.
#include "sim/RmDispatch.h"

#define NRVSIM_EXPORT_PAIR_(op, ...)                                                           \
  extern "C" RM_STATUS LRM_##op(NRV_PP_PARAMS(__VA_ARGS__)) {                                  \
    return nrvsim::rm::enter<nrvsim::rm::Tag_##op>("LRM_" #op __VA_OPT__(, ) NRV_PP_ARGS(__VA_ARGS__)); \
  }                                                                                            \
  extern "C" RM_STATUS RM_##op(NRV_PP_PARAMS(__VA_ARGS__)) {                                   \
    return nrvsim::rm::enter<nrvsim::rm::Tag_##op>("RM_" #op __VA_OPT__(, ) NRV_PP_ARGS(__VA_ARGS__)); \
  }

NRV_RM_PAIRED_FUNCTIONS(NRVSIM_EXPORT_PAIR_)
