// The adapter catalogue's part of every iSCSI function (the last step of
// updateAdapterMaps): the iSCSI profiles, the SCSI protocol controller of the
// function with its port and host associations, and its IP and TCP
// endpoints, which the SAN catalogue's sessions and connections refer to.
//
// Contract: a Feature_Builder (Catalogue_Features.h), run with m_DataMutex
// held after the iSCSI Ethernet ports exist.  Answers 0; what cannot be made
// is logged and skipped.
#pragma once

#include "agent/Catalogue_Build.h"
#include "agent/Catalogue_Function.h"

namespace cimple {

int build_iscsi_functions(Catalogue_Build& build, const Function_View* unused);

}  // namespace cimple
