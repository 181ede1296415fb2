// The interface between this module and the adapter management library, the
// HBA API library and the QoS library: types, records, numbers and prototypes.
//
// Contract: the module and every library standing in for the real ones (the
// simulator) include this one header.  The module never links these libraries:
// its runtime loader defines a forwarder under each name below (hidden, so a
// library loaded later never binds to them), and the libraries define the real
// functions.  A management library exports, for each paired operation, the
// "LRM_" name (liblrmapi) or the "RM_" name (librmapi; it may export both),
// plus every name of the single-name table; the HBA API library exports the
// hbaapi.h names; the QoS library the "DOZER_" names.
#pragma once

#include "access/RM_Attributes.h"
#include "access/RM_Functions.h"
#include "access/RM_Types.h"

#define NRV_RM_DECLARE_PAIR_(op, ...)                             \
  RM_STATUS LRM_##op(NRV_PP_PARAMS(__VA_ARGS__));                 \
  RM_STATUS RM_##op(NRV_PP_PARAMS(__VA_ARGS__));
#define NRV_RM_DECLARE_MGMT_(ret, name, ...) ret name(NRV_PP_PARAMS(__VA_ARGS__));
#define NRV_RM_DECLARE_HBA_(ret, name, ...)  // hbaapi.h declares these
#define NRV_RM_DECLARE_QOS_(ret, name, ...) ret name(NRV_PP_PARAMS(__VA_ARGS__));
#define NRV_RM_DECLARE_QOS_CLOSE_(ret, name, ...) ret name(NRV_PP_PARAMS(__VA_ARGS__));
#define NRV_RM_DECLARE_SINGLE_(group, ret, name, fail, ...) \
  NRV_RM_DECLARE_##group##_(ret, name __VA_OPT__(, ) __VA_ARGS__)

extern "C" {
NRV_RM_PAIRED_FUNCTIONS(NRV_RM_DECLARE_PAIR_)
NRV_RM_SINGLE_FUNCTIONS(NRV_RM_DECLARE_SINGLE_)
}
