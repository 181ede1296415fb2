// ModuleLoader: dlopen, factory lookup and the ELF dynamic-symbol listing.
#include "host/ModuleLoader.h"

#include <dlfcn.h>
#include <elf.h>
#include <strings.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <fstream>

#include "host/Datum.h"

namespace nrv::host {

namespace {

constexpr const char* kCreate = "_Create_";
constexpr const char* kProviderSuffix = "_Provider";

bool endsWith(const std::string& s, const std::string& tail) {
  return s.size() >= tail.size() && s.compare(s.size() - tail.size(), tail.size(), tail) == 0;
}

// "<name>_Create_<suffix>" -> "<name>", else nullopt.
std::optional<std::string> factoryPrefix(const std::string& symbol, MiKind kind) {
  const std::string tail = std::string(kCreate) + miKindSuffix(kind);
  if (!endsWith(symbol, tail) || symbol.size() == tail.size()) return std::nullopt;
  return symbol.substr(0, symbol.size() - tail.size());
}

template <typename T>
bool readAt(const std::vector<char>& file, size_t offset, T& out) {
  if (offset > file.size() || file.size() - offset < sizeof(T)) return false;
  std::memcpy(&out, file.data() + offset, sizeof(T));
  return true;
}

}  // namespace

const char* miKindSuffix(MiKind kind) {
  switch (kind) {
#define NRV_HOST_MI_SUFFIX(k, suffix) \
  case MiKind::k:                     \
    return suffix;
    NRV_HOST_MI_KINDS(NRV_HOST_MI_SUFFIX)
#undef NRV_HOST_MI_SUFFIX
  }
  return "";
}

std::vector<std::string> exportedFunctions(const std::string& path) {
  // One bulk read: a sanitizer build of the module is large, and reading it
  // character by character cost seconds per load.
  std::ifstream in(path, std::ios::binary | std::ios::ate);
  std::vector<char> file(in ? static_cast<size_t>(in.tellg()) : 0);
  if (!in.seekg(0).read(file.data(), static_cast<std::streamsize>(file.size()))) file.clear();
  std::vector<std::string> names;
  Elf64_Ehdr eh;
  if (!readAt(file, 0, eh) || std::memcmp(eh.e_ident, ELFMAG, SELFMAG) != 0 ||
      eh.e_ident[EI_CLASS] != ELFCLASS64 || eh.e_shentsize != sizeof(Elf64_Shdr)) {
    return names;
  }
  for (size_t i = 0; i < eh.e_shnum; ++i) {
    Elf64_Shdr sh;
    if (!readAt(file, eh.e_shoff + i * sizeof(Elf64_Shdr), sh) || sh.sh_type != SHT_DYNSYM) {
      continue;
    }
    Elf64_Shdr strtab;
    if (!readAt(file, eh.e_shoff + sh.sh_link * sizeof(Elf64_Shdr), strtab)) continue;
    for (size_t off = sh.sh_offset; off + sizeof(Elf64_Sym) <= sh.sh_offset + sh.sh_size;
         off += sizeof(Elf64_Sym)) {
      Elf64_Sym sym;
      if (!readAt(file, off, sym)) break;
      if (sym.st_shndx == SHN_UNDEF || ELF64_ST_TYPE(sym.st_info) != STT_FUNC) continue;
      const size_t at = strtab.sh_offset + sym.st_name;
      if (at >= file.size() || sym.st_name >= strtab.sh_size) continue;
      const char* name = file.data() + at;
      const size_t max = std::min<size_t>(file.size() - at, strtab.sh_size - sym.st_name);
      names.emplace_back(name, strnlen(name, max));
    }
  }
  return names;
}

std::variant<std::unique_ptr<ModuleLoader>, std::string> ModuleLoader::open(
    const std::string& path) {
  dlerror();
  // The module stays mapped after dlclose unless NRV_HOST_UNLOAD_MODULE is set: a module thread
  // that outlives its cleanup keeps running valid code, memory the module's globals still hold
  // is not reported as leaked, and leak reports at exit can name the module's functions.
  const int keep = std::getenv("NRV_HOST_UNLOAD_MODULE") != nullptr ? 0 : RTLD_NODELETE;
  void* handle = dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL | keep);
  if (handle == nullptr) {
    const char* err = dlerror();
    return std::string(err == nullptr ? "cannot open " + path : err);
  }
  std::vector<std::string> factories;
  for (auto& name : exportedFunctions(path)) {
    if (name.find(kCreate) == std::string::npos) continue;
    for (MiKind kind : {MiKind::Instance, MiKind::Method, MiKind::Association,
                        MiKind::Indication}) {
      if (factoryPrefix(name, kind)) {
        factories.push_back(name);
        break;
      }
    }
  }
  std::sort(factories.begin(), factories.end());
  factories.erase(std::unique(factories.begin(), factories.end()), factories.end());
  return std::unique_ptr<ModuleLoader>(new ModuleLoader(path, handle, std::move(factories)));
}

ModuleLoader::ModuleLoader(std::string path, void* handle, std::vector<std::string> factories)
    : path_(std::move(path)), handle_(handle), factories_(std::move(factories)) {
  for (const auto& exported : factories_) byLowerName_.emplace(lowerName(exported), exported);
}

ModuleLoader::~ModuleLoader() { dlclose(handle_); }

void* ModuleLoader::symbol(const std::string& name) const { return dlsym(handle_, name.c_str()); }

void ModuleLoader::pin() const {
  void* extra = dlopen(path_.c_str(), RTLD_NOW | RTLD_NOLOAD | RTLD_NODELETE);
  if (extra != nullptr) dlclose(extra);
}

std::optional<std::string> ModuleLoader::factoryFor(const std::string& className,
                                                    MiKind kind) const {
  const std::string tail = std::string(kCreate) + miKindSuffix(kind);
  for (const std::string& candidate :
       {className + kProviderSuffix + tail, className + tail}) {
    // The exported spelling wins, so "nrvtavo_chip" finds "NRVTAVO_Chip_...".
    if (auto it = byLowerName_.find(lowerName(candidate)); it != byLowerName_.end()) return it->second;
    if (symbol(candidate) != nullptr) return candidate;
  }
  return std::nullopt;
}

std::vector<std::string> ModuleLoader::classesWith(MiKind kind) const {
  std::vector<std::string> classes;
  for (const auto& name : factories_) {
    auto prefix = factoryPrefix(name, kind);
    if (!prefix) continue;
    std::string cls = *prefix;
    if (endsWith(cls, kProviderSuffix)) cls.resize(cls.size() - std::strlen(kProviderSuffix));
    const bool seen = std::any_of(classes.begin(), classes.end(), [&](const std::string& c) {
      return strcasecmp(c.c_str(), cls.c_str()) == 0;
    });
    if (!seen) classes.push_back(cls);
  }
  return classes;
}

}  // namespace nrv::host
