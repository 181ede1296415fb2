// Process-wide simulated site.
#include "sim/SimSite.h"

#include <cstdio>
#include <cstdlib>

#include "sim/SiteLoader.h"

#ifndef NRVSIM_DEFAULT_SITE
#define NRVSIM_DEFAULT_SITE "sim/sites/sample.json"
#endif

namespace nrvsim {

const char* default_site_path() { return NRVSIM_DEFAULT_SITE; }

SimSite& SimSite::instance() {
  // Destroyed when the libraries are unloaded (the module closes them), so
  // nothing is left behind; callers never use the site after that.
  static SimSite site;
  return site;
}

void SimSite::ensure_loaded_locked() {
  if (attempted_) return;
  const char* env = std::getenv("NRV_SITE");
  load_locked(env && *env ? env : default_site_path());
}

bool SimSite::load_locked(const std::string& path) {
  attempted_ = true;
  path_ = path;
  LoadResult r = load_site_file(path);
  handles_.clear();
  {
    std::lock_guard<std::mutex> counting(calls_mu_);
    calls_.clear();
  }
  if (!r.ok) {
    ready_ = false;
    error_ = r.error;
    site_ = Site{};
    faults_.replace({});
    std::fprintf(stderr, "nrvsim: site refused: %s\n", error_.c_str());
    return false;
  }
  ready_ = true;
  error_.clear();
  site_ = std::move(r.loaded.site);
  faults_.replace(std::move(r.loaded.faults));
  return true;
}

bool SimSite::ready() {
  std::lock_guard<std::recursive_mutex> lock(mu_);
  ensure_loaded_locked();
  return ready_;
}

std::string SimSite::error() {
  std::lock_guard<std::recursive_mutex> lock(mu_);
  ensure_loaded_locked();
  return error_;
}

std::string SimSite::path() {
  std::lock_guard<std::recursive_mutex> lock(mu_);
  ensure_loaded_locked();
  return path_;
}

bool SimSite::reload(const std::string& path) {
  std::lock_guard<std::recursive_mutex> lock(mu_);
  return load_locked(path);
}

std::optional<uint32_t> SimSite::gate(std::string_view function, uint32_t unavailable,
                                      std::optional<Wwn> adapter, std::optional<uint32_t> lun) {
  {
    std::lock_guard<std::mutex> counting(calls_mu_);
    const std::string_view op = FaultPlan::operation(function);
    auto it = calls_.find(op);
    if (it == calls_.end()) it = calls_.emplace(std::string(op), 0).first;
    ++it->second;
  }
  if (!ready()) return unavailable;
  // The plan has its own lock; the delay must not hold the site mutex, or a
  // slow call would stall every other thread of the process.
  return enact(faults_.on_call(CallSite{function, adapter, lun}));
}

uint64_t SimSite::calls(std::string_view function) {
  std::lock_guard<std::mutex> counting(calls_mu_);
  auto it = calls_.find(FaultPlan::operation(function));
  return it == calls_.end() ? 0 : it->second;
}

uint32_t SimSite::open_handle(FunctionRef ref) {
  std::lock_guard<std::recursive_mutex> lock(mu_);
  uint32_t h = next_handle_++;
  if (h == 0) h = next_handle_++;  // 0 is the invalid handle
  handles_[h] = ref;
  return h;
}

std::optional<FunctionRef> SimSite::handle_target(uint32_t handle) {
  std::lock_guard<std::recursive_mutex> lock(mu_);
  auto it = handles_.find(handle);
  if (it == handles_.end()) return std::nullopt;
  return it->second;
}

void SimSite::close_handle(uint32_t handle) {
  std::lock_guard<std::recursive_mutex> lock(mu_);
  handles_.erase(handle);
}

std::optional<FunctionRef> find_function(const Site& site, const Wwn& id) {
  for (size_t c = 0; c < site.cards.size(); ++c) {
    const auto& fns = site.cards[c].functions;
    for (size_t f = 0; f < fns.size(); ++f)
      if (fns[f].id == id) return FunctionRef{c, f};
  }
  return std::nullopt;
}

std::optional<FunctionRef> find_instance(const Site& site, uint32_t instance) {
  for (size_t c = 0; c < site.cards.size(); ++c) {
    const auto& fns = site.cards[c].functions;
    for (size_t f = 0; f < fns.size(); ++f)
      if (fns[f].instance == instance) return FunctionRef{c, f};
  }
  return std::nullopt;
}

}  // namespace nrvsim

extern "C" int nrvsim_reload(const char* path) {
  nrvsim::SimSite& site = nrvsim::SimSite::instance();
  return site.reload(path && *path ? std::string(path) : site.path()) ? 1 : 0;
}

extern "C" unsigned long long nrvsim_call_count(const char* function) {
  return function ? nrvsim::SimSite::instance().calls(function) : 0;
}
