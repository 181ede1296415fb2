// CimClient: the nrv-cim command line — a wbemcli-like client that runs CIM operations against
// a provider module loaded into an in-process Host.
//
//   nrv-cim [options] <op> <path> [Name=value ...]
//   nrv-cim [options] cm <path> <Method> [Arg=value ...]   (or <Method>.Arg=value,Arg2=value)
//   nrv-cim [options] tree <path> [depth=N] [AssocClass[:Role],...]   (see host/CimTree.h)
//   ops: ei ein gi ai ain ri rin ci mi di cm tree
//   values: "text", true/false, numbers, {a,b} arrays; Name:type=value gives the CIM type
//   (uint16, string[], datetime, ref ...). Untyped method arguments are sent as strings;
//   mi reads the types of the current instance. Default namespace "root/norvane".
//   options: -m <module>, -p <prop,prop>, -ac|--assoc-class <C>, -rc|--result-class <C>,
//            -r|--role <R>, -rr|--result-role <R>
//
// Contract: runCimClient never throws and never exits the process; it writes results to `out`,
// errors to `err` and returns the exit status: 0 success, 1 failed CIM call (the line
// "CMPI_RC_ERR_... : message"), 2 malformed path, argument or usage (one line).
#ifndef NRV_HOST_CIMCLIENT_H
#define NRV_HOST_CIMCLIENT_H

#include <ostream>
#include <string>
#include <vector>

#include "host/Datum.h"

namespace nrv::host {

int runCimClient(const std::vector<std::string>& args, std::ostream& out, std::ostream& err);

// The MOF-like text of one instance: "instance of C {", one "    P = v;" line per property,
// "};".
std::string formatInstance(const InstanceData& instance);

}  // namespace nrv::host

#endif  // NRV_HOST_CIMCLIENT_H
