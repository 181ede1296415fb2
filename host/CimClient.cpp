// CimClient: argument parsing, the operations and their printing.
#include "host/CimClient.h"

#include <unistd.h>

#include <cstdlib>
#include <functional>
#include <map>
#include <memory>
#include <optional>

#include "host/CimTree.h"
#include "host/Host.h"
#include "host/PathText.h"

namespace nrv::host {

namespace {

constexpr const char* kModuleFile = "libnorvane_tavo_provider.so";

struct UsageError {
  std::string message;
};

struct Command {
  std::string op;
  std::string pathText;
  std::vector<std::string> extra;  // assignments, or the method name then its arguments
  std::optional<std::string> module;
  PropertyList properties;
  AssocFilter filter;
};

// Option spellings and the field each one fills.
struct OptionSpec {
  const char* shortName;
  const char* longName;
  std::optional<std::string> AssocFilter::*field;
};

constexpr OptionSpec kFilterOptions[] = {
    {"-ac", "--assoc-class", &AssocFilter::assocClass},
    {"-rc", "--result-class", &AssocFilter::resultClass},
    {"-r", "--role", &AssocFilter::role},
    {"-rr", "--result-role", &AssocFilter::resultRole},
};

std::vector<std::string> splitCommas(const std::string& s) {
  std::vector<std::string> out;
  size_t start = 0;
  while (start <= s.size()) {
    const size_t comma = s.find(',', start);
    const std::string part = s.substr(start, comma == std::string::npos ? std::string::npos
                                                                         : comma - start);
    if (!part.empty()) out.push_back(part);
    if (comma == std::string::npos) break;
    start = comma + 1;
  }
  return out;
}

std::variant<Command, UsageError> parseCommand(const std::vector<std::string>& args) {
  Command c;
  std::vector<std::string> positional;
  for (size_t i = 0; i < args.size(); ++i) {
    const std::string& a = args[i];
    auto value = [&]() -> std::optional<std::string> {
      if (i + 1 >= args.size()) return std::nullopt;
      return args[++i];
    };
    if (a == "-m" || a == "--module") {
      c.module = value();
      if (!c.module) return UsageError{a + " needs a module path"};
    } else if (a == "-p" || a == "--properties") {
      auto v = value();
      if (!v) return UsageError{a + " needs a property list"};
      c.properties = splitCommas(*v);
    } else if (!a.empty() && a[0] == '-' && a.size() > 1) {
      bool known = false;
      for (const auto& spec : kFilterOptions) {
        if (a == spec.shortName || a == spec.longName) {
          auto v = value();
          if (!v) return UsageError{a + " needs a value"};
          c.filter.*(spec.field) = *v;
          known = true;
        }
      }
      if (!known) return UsageError{"unknown option " + a};
    } else {
      positional.push_back(a);
    }
  }
  if (positional.empty()) return UsageError{"missing operation (ei ein gi ai ain ri rin ci mi di cm tree)"};
  c.op = positional[0];
  if (positional.size() < 2) return UsageError{"missing object path"};
  c.pathText = positional[1];
  c.extra.assign(positional.begin() + 2, positional.end());
  return c;
}

std::string moduleNextToBinary() {
  char exe[4096];
  const ssize_t n = readlink("/proc/self/exe", exe, sizeof exe - 1);
  if (n <= 0) return std::string("build/lib/") + kModuleFile;
  std::string dir(exe, static_cast<size_t>(n));
  dir = dir.substr(0, dir.rfind('/'));
  return dir + "/../lib/" + kModuleFile;
}

std::string modulePath(const Command& c) {
  if (c.module) return *c.module;
  if (const char* env = std::getenv("NRV_MODULE"); env != nullptr && *env != '\0') return env;
  return moduleNextToBinary();
}

void printInstances(const Result& r, std::ostream& out) {
  for (const auto& inst : r.instances) out << formatInstance(inst);
}

void printPaths(const Result& r, std::ostream& out) {
  for (const auto& p : r.paths) out << formatPath(p) << "\n";
}

// Assignments to named values; `typeHint` gives the type a name should be read as when the
// assignment does not say, `numbersAsText` sends untyped scalars as their text.
std::variant<NamedData, UsageError> readAssignments(
    const std::vector<std::string>& texts, const std::function<std::optional<CMPIType>(
                                               const std::string&)>& typeHint,
    bool numbersAsText) {
  NamedData values;
  for (const auto& text : texts) {
    auto parsed = parseAssignment(text);
    if (auto* e = std::get_if<TextError>(&parsed)) return UsageError{e->message};
    const Assignment& a = std::get<Assignment>(parsed);
    std::optional<CMPIType> type = a.type ? a.type : typeHint(a.name);
    if (!type && numbersAsText && !a.valueText.empty() && a.valueText.front() != '"' &&
        a.valueText.front() != '{') {
      type = CMPI_string;
    }
    auto value = parseValue(a.valueText, type);
    if (auto* e = std::get_if<TextError>(&value)) return UsageError{a.name + ": " + e->message};
    setNamed(values, a.name, std::get<Datum>(std::move(value)));
  }
  return values;
}

std::optional<CMPIType> noHint(const std::string&) { return std::nullopt; }

int failed(const Result& r, std::ostream& err) {
  err << r.errorText() << "\n";
  return 1;
}

int usage(const std::string& message, std::ostream& err) {
  err << "nrv-cim: " << message << "\n";
  return 2;
}

using Operation = std::function<int(Host&, const Command&, const PathData&, std::ostream&,
                                    std::ostream&)>;

int opEnumerate(Host& h, const Command& c, const PathData& p, std::ostream& out,
                std::ostream& err) {
  Result r = h.enumerateInstances(p.nameSpace, p.className, c.properties);
  if (!r.ok()) return failed(r, err);
  printInstances(r, out);
  return 0;
}

int opEnumerateNames(Host& h, const Command&, const PathData& p, std::ostream& out,
                     std::ostream& err) {
  Result r = h.enumerateInstanceNames(p.nameSpace, p.className);
  if (!r.ok()) return failed(r, err);
  printPaths(r, out);
  return 0;
}

int opGet(Host& h, const Command& c, const PathData& p, std::ostream& out, std::ostream& err) {
  Result r = h.getInstance(p, c.properties);
  if (!r.ok()) return failed(r, err);
  printInstances(r, out);
  return 0;
}

int opAssociators(Host& h, const Command& c, const PathData& p, std::ostream& out,
                  std::ostream& err) {
  Result r = h.associators(p, c.filter, c.properties);
  if (!r.ok()) return failed(r, err);
  printInstances(r, out);
  return 0;
}

int opAssociatorNames(Host& h, const Command& c, const PathData& p, std::ostream& out,
                      std::ostream& err) {
  Result r = h.associatorNames(p, c.filter);
  if (!r.ok()) return failed(r, err);
  printPaths(r, out);
  return 0;
}

int opReferences(Host& h, const Command& c, const PathData& p, std::ostream& out,
                 std::ostream& err) {
  Result r = h.references(p, c.filter, c.properties);
  if (!r.ok()) return failed(r, err);
  printInstances(r, out);
  return 0;
}

int opReferenceNames(Host& h, const Command& c, const PathData& p, std::ostream& out,
                     std::ostream& err) {
  Result r = h.referenceNames(p, c.filter);
  if (!r.ok()) return failed(r, err);
  printPaths(r, out);
  return 0;
}

// The instance a create or modify sends: the path's keys plus the assignments.
std::variant<InstanceData, UsageError> instanceFrom(
    const PathData& p, const std::vector<std::string>& assignments,
    const std::function<std::optional<CMPIType>(const std::string&)>& hint) {
  auto values = readAssignments(assignments, hint, false);
  if (auto* e = std::get_if<UsageError>(&values)) return *e;
  InstanceData inst;
  inst.path = p;
  inst.properties = p.keys;
  for (auto& [name, value] : std::get<NamedData>(values)) {
    setNamed(inst.properties, name, std::move(value));
  }
  return inst;
}

int opCreate(Host& h, const Command& c, const PathData& p, std::ostream& out,
             std::ostream& err) {
  auto inst = instanceFrom(p, c.extra, noHint);
  if (auto* e = std::get_if<UsageError>(&inst)) return usage(e->message, err);
  Result r = h.createInstance(std::get<InstanceData>(inst));
  if (!r.ok()) return failed(r, err);
  printPaths(r, out);
  return 0;
}

int opModify(Host& h, const Command& c, const PathData& p, std::ostream&, std::ostream& err) {
  if (c.extra.empty()) return usage("mi needs Prop=value assignments", err);
  // The current instance tells the types of the properties being set.
  Result current = h.getInstance(p);
  auto hint = [&](const std::string& name) -> std::optional<CMPIType> {
    for (const auto& inst : current.instances) {
      if (const Datum* d = findNamed(inst.properties, name); d != nullptr && d->type != CMPI_null) {
        return d->type;
      }
    }
    return std::nullopt;
  };
  auto inst = instanceFrom(p, c.extra, hint);
  if (auto* e = std::get_if<UsageError>(&inst)) return usage(e->message, err);
  std::vector<std::string> changed;
  for (const auto& text : c.extra) {
    changed.push_back(std::get<Assignment>(parseAssignment(text)).name);
  }
  Result r = h.modifyInstance(std::get<InstanceData>(inst),
                              c.properties ? c.properties : PropertyList(changed));
  return r.ok() ? 0 : failed(r, err);
}

int opDelete(Host& h, const Command&, const PathData& p, std::ostream&, std::ostream& err) {
  Result r = h.deleteInstance(p);
  return r.ok() ? 0 : failed(r, err);
}

int opCallMethod(Host& h, const Command& c, const PathData& p, std::ostream& out,
                 std::ostream& err) {
  if (c.extra.empty()) return usage("cm needs a method name", err);
  std::string method = c.extra.front();
  std::vector<std::string> assignments(c.extra.begin() + 1, c.extra.end());
  // wbemcli's compact form: Method.Arg=value,Arg2=value
  if (const size_t dot = method.find('.'); dot != std::string::npos) {
    auto inline_ = splitTopLevel(std::string_view(method).substr(dot + 1));
    if (!inline_) return usage("unterminated string in method arguments", err);
    assignments.insert(assignments.begin(), inline_->begin(), inline_->end());
    method.resize(dot);
  }
  if (method.empty() || method.find('=') != std::string::npos) {
    return usage("cm needs a method name before its arguments", err);
  }
  // Untyped arguments travel as text, as a schema-less client sends them; the provider reads
  // them as its parameter types. "Name:type=value" sends an exact type.
  auto args = readAssignments(assignments, noHint, true);
  if (auto* e = std::get_if<UsageError>(&args)) return usage(e->message, err);
  Result r = h.invokeMethod(p, method, std::get<NamedData>(std::move(args)));
  if (!r.ok()) return failed(r, err);
  out << "ReturnValue = " << formatValue(r.returnValue) << ";\n";
  for (const auto& [name, value] : r.outArgs) out << name << " = " << formatValue(value) << ";\n";
  return 0;
}

// tree <path> [depth=N] [AssocClass[:Role][,AssocClass[:Role]...] ...]
int opTree(Host& h, const Command& c, const PathData& p, std::ostream& out, std::ostream& err) {
  TreeOptions options;
  for (const std::string& word : c.extra) {
    if (word.rfind("depth=", 0) == 0) {
      char* end = nullptr;
      const long depth = std::strtol(word.c_str() + 6, &end, 10);
      if (end == word.c_str() + 6 || *end != '\0' || depth < 0 || depth > 64)
        return usage("tree: depth must be 0 to 64", err);
      options.depth = static_cast<int>(depth);
    } else {
      for (std::string& assoc : splitCommas(word)) options.follow.push_back(std::move(assoc));
    }
  }
  return printTree(h, p, options, out, err);
}

const std::map<std::string, Operation>& operations() {
  static const std::map<std::string, Operation> table = {
      {"ei", opEnumerate},      {"ein", opEnumerateNames},  {"gi", opGet},
      {"ai", opAssociators},    {"ain", opAssociatorNames}, {"ri", opReferences},
      {"rin", opReferenceNames}, {"ci", opCreate},          {"mi", opModify},
      {"di", opDelete},         {"cm", opCallMethod},       {"tree", opTree},
  };
  return table;
}

}  // namespace

std::string formatInstance(const InstanceData& instance) {
  std::string out = "instance of " + instance.path.className + " {\n";
  for (const auto& [name, value] : instance.properties) {
    out += "    " + name + " = " + formatValue(value) + ";\n";
  }
  return out + "};\n";
}

int runCimClient(const std::vector<std::string>& args, std::ostream& out, std::ostream& err) {
  auto parsed = parseCommand(args);
  if (auto* e = std::get_if<UsageError>(&parsed)) return usage(e->message, err);
  const Command& c = std::get<Command>(parsed);
  auto op = operations().find(c.op);
  if (op == operations().end()) return usage("unknown operation " + c.op, err);
  auto host = std::make_unique<Host>(modulePath(c));
  if (!host->catalogError().empty()) err << "nrv-cim: warning: " << host->catalogError() << "\n";
  // Keys are read against the module's classes, as a CIMOM reads them.
  auto path = parsePath(c.pathText, kDefaultNameSpace, host->keySchema());
  if (auto* e = std::get_if<TextError>(&path)) return usage(e->message, err);
  const int status = op->second(*host, c, std::get<PathData>(path), out, err);
  // What was printed stays printed whatever the module does while it unloads.
  out.flush();
  err.flush();
  host.reset();
  return status;
}

}  // namespace nrv::host
