// CimTree: the "tree" view of nrv-cim — the objects reachable from one object by
// association, printed as an indented tree, one line per instance: the association that led
// there, the class, the key values and the element name.
//
// Contract: the walk follows only the association classes given (every association when
// none is), visits each object once (a cycle or a second route prints nothing more) and
// stops at `depth` levels below the start.  A failing request ends nothing: its branch is
// left out.  A start object that cannot be read is shown by its path; the answer is 1 (after
// the error line) only when it cannot be read and nothing is associated with it.
#ifndef NRV_HOST_CIMTREE_H
#define NRV_HOST_CIMTREE_H

#include <ostream>
#include <string>
#include <vector>

#include "host/Host.h"

namespace nrv::host {

struct TreeOptions {
  // Association classes, each as "Class" or "Class:Role" (followed only from an object in
  // that role); empty: every association.
  std::vector<std::string> follow;
  int depth = 6;
};

int printTree(Host& host, const PathData& start, const TreeOptions& options, std::ostream& out,
              std::ostream& err);

}  // namespace nrv::host

#endif  // NRV_HOST_CIMTREE_H
