// PlatformProvider: JSON platform instances and their read operations.
#include "host/PlatformProvider.h"

#include <cstdlib>
#include <fstream>

#include <nlohmann/json.hpp>

#include "host/PathText.h"

namespace nrv::host {

namespace {

using Json = nlohmann::json;

struct PlatformClass {
  const char* name;
  const char* nameSpace;
  const char* keys[2];  // a null entry ends the list early
};

constexpr PlatformClass kClasses[] = {
    {"KVLD_ComputerSystem", kPlatformNameSpace, {"CreationClassName", "Name"}},
    {"KVLD_Chassis", kPlatformNameSpace, {"CreationClassName", "Tag"}},
    {"PG_RegisteredProfile", kInteropNameSpace, {"InstanceID", nullptr}},
};

const PlatformClass* platformClass(const std::string& name) {
  for (const auto& c : kClasses) {
    if (sameName(c.name, name)) return &c;
  }
  return nullptr;
}

std::optional<Datum> untyped(const Json& v) {
  if (v.is_string()) return Datum::string(v.get<std::string>());
  if (v.is_boolean()) return Datum::boolean(v.get<bool>());
  if (v.is_number_unsigned() && v.get<unsigned long long>() <= 0xffffffffULL) {
    return Datum::unsignedInt(CMPI_uint32, v.get<unsigned long long>());
  }
  if (v.is_number_integer()) return Datum::signedInt(CMPI_sint64, v.get<long long>());
  if (v.is_number_float()) return Datum::real(CMPI_real64, v.get<double>());
  return std::nullopt;
}

// JSON to the text form parseValue reads for the given type.
std::string asText(const Json& v) {
  if (v.is_string()) return "\"" + v.get<std::string>() + "\"";
  if (v.is_array()) {
    std::string out = "{";
    const char* sep = "";
    for (const auto& e : v) {
      out += sep + asText(e);
      sep = ",";
    }
    return out + "}";
  }
  return v.dump();
}

std::optional<Datum> toDatum(const Json& v) {
  if (v.is_object()) {
    if (!v.contains("type") || !v["type"].is_string() || !v.contains("value")) return std::nullopt;
    auto type = typeFromName(v["type"].get<std::string>());
    if (!type) return std::nullopt;
    auto parsed = parseValue(asText(v["value"]), type);
    if (auto* d = std::get_if<Datum>(&parsed)) return std::move(*d);
    return std::nullopt;
  }
  if (v.is_array()) {
    std::vector<Datum> elements;
    for (const auto& e : v) {
      auto d = untyped(e);
      if (!d || (!elements.empty() && d->type != elements.front().type)) return std::nullopt;
      elements.push_back(std::move(*d));
    }
    const CMPIType element = elements.empty() ? CMPIType(CMPI_string) : elements.front().type;
    return Datum::arrayOf(element, std::move(elements));
  }
  return untyped(v);
}

bool matchesKeys(const InstanceData& inst, const PathData& path) {
  for (const auto& [name, value] : path.keys) {
    const Datum* own = findNamed(inst.path.keys, name);
    if (own == nullptr) return false;
    // Key values compare by text, so "3" and 3 name the same instance.
    if (!(*own == value) && formatValue(*own) != formatValue(value)) return false;
  }
  return true;
}

InstanceData filtered(const InstanceData& inst, const PropertyList& properties) {
  if (!properties) return inst;
  InstanceData out = inst;
  out.properties.clear();
  for (const auto& [name, value] : inst.properties) {
    bool wanted = findNamed(inst.path.keys, name) != nullptr;
    for (const auto& p : *properties) wanted = wanted || sameName(p, name);
    if (wanted) out.properties.emplace_back(name, value);
  }
  return out;
}

}  // namespace

std::optional<std::string> PlatformProvider::pathFromEnvironment() {
  const char* p = std::getenv("NRV_HOST_PLATFORM");
  if (p == nullptr || *p == '\0') return std::nullopt;
  return std::string(p);
}

PlatformProvider::PlatformProvider(const std::optional<std::string>& jsonPath) {
  if (!jsonPath) return;
  std::ifstream in(*jsonPath);
  if (!in) {
    error_ = "cannot read platform file " + *jsonPath;
    return;
  }
  const Json doc = Json::parse(in, nullptr, false);
  if (doc.is_discarded() || !doc.is_object()) {
    error_ = "platform file is not a JSON object: " + *jsonPath;
    return;
  }
  for (const auto& cls : kClasses) {
    if (!doc.contains(cls.name) || !doc[cls.name].is_array()) continue;
    for (const auto& entry : doc[cls.name]) {
      if (!entry.is_object()) continue;
      InstanceData inst;
      inst.path.nameSpace = cls.nameSpace;
      inst.path.className = cls.name;
      for (const auto& [name, value] : entry.items()) {
        auto d = toDatum(value);
        if (!d) {
          error_ = std::string("bad value of ") + cls.name + "." + name;
          continue;
        }
        setNamed(inst.properties, name, std::move(*d));
      }
      for (const char* key : cls.keys) {
        if (key == nullptr) break;
        if (const Datum* v = findNamed(inst.properties, key)) inst.path.keys.emplace_back(key, *v);
      }
      instances_.push_back(std::move(inst));
    }
  }
}

bool PlatformProvider::serves(const PathData& path) const {
  const PlatformClass* cls = platformClass(path.className);
  return cls != nullptr && path.nameSpace == cls->nameSpace;
}

Outcome PlatformProvider::serve(const Request& r) const {
  Outcome out;
  switch (r.op) {
    case Operation::EnumerateInstances:
    case Operation::EnumerateInstanceNames:
      for (const auto& inst : instances_) {
        if (!sameName(inst.path.className, r.path.className)) continue;
        if (r.op == Operation::EnumerateInstanceNames) {
          out.items.push_back(Datum::reference(inst.path));
        } else {
          out.items.push_back(Datum::embedded(filtered(inst, r.properties)));
        }
      }
      out.done = true;
      return out;
    case Operation::GetInstance:
      for (const auto& inst : instances_) {
        if (!r.path.keys.empty() && sameName(inst.path.className, r.path.className) &&
            matchesKeys(inst, r.path)) {
          out.items.push_back(Datum::embedded(filtered(inst, r.properties)));
          out.done = true;
          return out;
        }
      }
      return Outcome::failure(CMPI_RC_ERR_NOT_FOUND, "no such instance: " + formatPath(r.path));
    case Operation::AssociatorNames:
    case Operation::Associators:
    case Operation::References:
    case Operation::ReferenceNames:
      // The platform's own associations are not modelled; none is an empty answer.
      return out;
    default:
      return Outcome::failure(CMPI_RC_ERR_NOT_SUPPORTED,
                              std::string(operationName(r.op)) + " is not supported on " +
                                  r.path.className);
  }
}

}  // namespace nrv::host
