#include "agent/Catalogue_Build.h"

#include <cstdarg>

#include "access/NRV_Catalogue.h"

namespace cimple {

Catalogue_Build::Catalogue_Build(ProviderAgent& a) : agent(a) {}

Catalogue_Build::~Catalogue_Build() {
  for (auto& [source, copy] : endpoints_) unref(copy);
}

Instance* Catalogue_Build::endpoint(const Instance* end) {
  if (end == nullptr) return nullptr;
  auto [it, fresh] = endpoints_.try_emplace(end, nullptr);
  if (fresh) {
    // Sharing one key copy per end keeps a large catalogue's associations small.
    it->second = makeEnd(end);
  }
  return it->second;
}

Instance* insert_into(Instance_Map& map, Instance* instance, const char* failure) {
  if (instance == nullptr) return nullptr;
  if (map.insert(instance) >= 0) return instance;
  if (failure)
    NRV_LOG(NRV_CRIT, "%s", failure);
  else
    NRV_LOG(NRV_CRIT, "Insert Failed : m_%s_map", instance->meta_class->name);
  destroy(instance);
  return nullptr;
}

std::string format_text(const char* format, ...) {
  char small[256];
  va_list args;
  va_start(args, format);
  va_list again;
  va_copy(again, args);
  const int n = std::vsnprintf(small, sizeof small, format, args);
  va_end(args);
  std::string out;
  if (n < 0) {
    va_end(again);
    return out;
  }
  if (static_cast<size_t>(n) < sizeof small) {
    out.assign(small, static_cast<size_t>(n));
  } else {
    out.resize(static_cast<size_t>(n));
    std::vsnprintf(out.data(), out.size() + 1, format, again);
  }
  va_end(again);
  return out;
}

}  // namespace cimple
