// CimTree: a depth-first walk over associators with a visited set.
#include "host/CimTree.h"

#include <set>

#include "host/PathText.h"

namespace nrv::host {

namespace {

// Keys that only repeat what the class or the host system already says.
bool tellingKey(const std::string& name) {
  for (const char* dull : {"CreationClassName", "SystemCreationClassName", "SystemName"})
    if (sameName(name, dull)) return false;
  return true;
}

std::string describe(const InstanceData& instance) {
  std::string line = instance.path.className;
  for (const auto& [name, value] : instance.path.keys)
    if (tellingKey(name)) line += " " + name + "=" + formatValue(value);
  const Datum* element = findNamed(instance.properties, "ElementName");
  if (element != nullptr && !element->isNull && element->type == CMPI_string)
    line += "  (" + element->text + ")";
  return line;
}

class Walk {
 public:
  Walk(Host& host, const TreeOptions& options, std::ostream& out)
      : host_(host), options_(options), out_(out) {}

  size_t shown() const { return visited_.size(); }

  void from(const InstanceData& instance, int level) {
    visited_.insert(formatPath(instance.path));
    if (level >= options_.depth) return;
    if (options_.follow.empty()) {
      children(instance, level, std::nullopt);
    } else {
      for (const std::string& assoc : options_.follow) children(instance, level, assoc);
    }
  }

 private:
  // `assoc` is "Class" or "Class:Role", the role the parent plays.
  void children(const InstanceData& parent, int level, const std::optional<std::string>& assoc) {
    AssocFilter filter;
    if (assoc) {
      const size_t colon = assoc->find(':');
      filter.assocClass = assoc->substr(0, colon);
      if (colon != std::string::npos) filter.role = assoc->substr(colon + 1);
    }
    Result r = host_.associators(parent.path, filter);
    if (!r.ok()) return;
    for (const InstanceData& child : r.instances) {
      if (visited_.count(formatPath(child.path)) != 0) continue;
      out_ << std::string(2 * static_cast<size_t>(level + 1), ' ');
      if (filter.assocClass) out_ << "[" << *filter.assocClass << "] ";
      out_ << describe(child) << "\n";
      from(child, level + 1);
    }
  }

  Host& host_;
  const TreeOptions& options_;
  std::ostream& out_;
  std::set<std::string> visited_;
};

}  // namespace

int printTree(Host& host, const PathData& start, const TreeOptions& options, std::ostream& out,
              std::ostream& err) {
  // An object no provider serves by itself (the host's chassis) is still a
  // place to start from: its path says what it is.
  Result root = host.getInstance(start);
  InstanceData top;
  top.path = start;
  if (root.ok() && !root.instances.empty()) top = root.instances[0];
  out << describe(top) << "\n";
  Walk walk(host, options, out);
  walk.from(top, 0);
  if (root.ok() || walk.shown() > 1) return 0;
  err << root.errorText() << "\n";
  return 1;
}

}  // namespace nrv::host
