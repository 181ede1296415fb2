// ClassRepository: reading repository.json and the hierarchy look-ups.
#include "host/ClassRepository.h"

#include <algorithm>
#include <fstream>
#include <memory>

#include <nlohmann/json.hpp>

namespace nrv::host {

namespace {

std::variant<KeyDecl, std::string> keyFrom(const nlohmann::json& k, const std::string& owner) {
  KeyDecl key;
  key.name = k.at("name").get<std::string>();
  const std::string type = k.at("type").get<std::string>();
  if (type == "ref") {
    key.type = CMPI_ref;
    key.refClass = k.value("class", std::string());
    return key;
  }
  auto code = typeFromName(type);
  if (!code) return owner + "." + key.name + ": unknown key type " + type;
  key.type = *code;
  return key;
}

}  // namespace

std::variant<ClassRepository, std::string> ClassRepository::read(const std::string& path) {
  std::ifstream in(path);
  if (!in) return "cannot read class repository " + path;
  ClassRepository repo;
  try {
    const nlohmann::json doc = nlohmann::json::parse(in);
    for (const auto& c : doc.at("classes")) {
      auto decl = std::make_unique<ClassDecl>();
      decl->name = c.at("name").get<std::string>();
      if (const auto& sup = c.at("superclass"); !sup.is_null()) {
        decl->superclass = repo.find(sup.get<std::string>());
        if (decl->superclass == nullptr) {
          return path + ": superclass " + sup.get<std::string>() + " of " + decl->name +
                 " is not listed before it";
        }
      }
      decl->association = c.at("association").get<bool>();
      for (const auto& k : c.at("keys")) {
        auto key = keyFrom(k, decl->name);
        if (auto* error = std::get_if<std::string>(&key)) return path + ": " + *error;
        decl->keys.push_back(std::get<KeyDecl>(std::move(key)));
      }
      decl->namespaces = c.at("namespaces").get<std::vector<std::string>>();
      repo.byName_[lowerName(decl->name)] = decl.get();
      repo.classes_.push_back(std::move(decl));
    }
  } catch (const nlohmann::json::exception& e) {
    return path + ": " + e.what();
  }
  return repo;
}

const ClassDecl* ClassRepository::find(const std::string& className) const {
  auto it = byName_.find(lowerName(className));
  return it == byName_.end() ? nullptr : it->second;
}

bool ClassRepository::declaredIn(const std::string& className,
                                 const std::string& nameSpace) const {
  const ClassDecl* c = find(className);
  return c != nullptr && std::any_of(c->namespaces.begin(), c->namespaces.end(),
                                     [&](const std::string& n) { return sameName(n, nameSpace); });
}

bool ClassRepository::isA(const std::string& className, const std::string& ancestor) const {
  const ClassDecl* target = find(ancestor);
  for (const ClassDecl* c = find(className); c != nullptr && target != nullptr; c = c->superclass) {
    if (c == target) return true;
  }
  return false;
}

KeySchema ClassRepository::keySchema() const {
  return [this](const std::string& className) -> std::optional<std::vector<KeyDecl>> {
    const ClassDecl* c = find(className);
    if (c == nullptr) return std::nullopt;
    return c->keys;
  };
}

}  // namespace nrv::host
