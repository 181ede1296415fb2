// The one simulated site of the process, shared by the HBA API library and the
// management library (both link this core, so a WWN changed through one is
// seen by the other).  Loaded on first use from $NRV_SITE, else from the sample
// site baked in at build time.  All model access goes through with(), which
// holds the site mutex; gate() applies the site's faults to one call.
#pragma once

#include <mutex>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

#include "sim/FaultPlan.h"
#include "sim/SiteModel.h"

#define NRVSIM_API __attribute__((visibility("default")))

namespace nrvsim {

// Where a function sits in the site; stable for the life of a loaded site.
struct FunctionRef {
  size_t card = 0;
  size_t function = 0;
};

class NRVSIM_API SimSite {
 public:
  static SimSite& instance();

  SimSite(const SimSite&) = delete;
  SimSite& operator=(const SimSite&) = delete;

  // True when a site is loaded; otherwise error() says why (also written to
  // stderr once per load attempt).
  bool ready();
  std::string error();
  std::string path();

  // Throws nothing.  Replaces the site (and resets fault counters and open
  // HBA API handles) with the file at `path`; returns ready().
  bool reload(const std::string& path);

  // Status this call must answer before touching the model: a fault's status,
  // or `unavailable` when no site could be loaded.  Sleeps for fault delays.
  std::optional<uint32_t> gate(std::string_view function, uint32_t unavailable,
                               std::optional<Wwn> adapter = std::nullopt,
                               std::optional<uint32_t> lun = std::nullopt);

  // How many calls of `function`'s operation ("LRM_X", "RM_X" and "X" are
  // one) have reached the site since it was loaded.
  uint64_t calls(std::string_view function);

  // Runs f(Site&) under the site mutex and returns its result.  Callers call
  // gate() first; with() on an unloaded site sees an empty Site.
  template <class F>
  auto with(F&& f) {
    std::lock_guard<std::recursive_mutex> lock(mu_);
    ensure_loaded_locked();
    return f(site_);
  }

  // HBA API handles: open returns 0 when the name is unknown.
  uint32_t open_handle(FunctionRef ref);
  std::optional<FunctionRef> handle_target(uint32_t handle);
  void close_handle(uint32_t handle);

 private:
  SimSite() = default;
  void ensure_loaded_locked();
  bool load_locked(const std::string& path);

  std::recursive_mutex mu_;
  bool attempted_ = false;
  bool ready_ = false;
  std::string path_, error_;
  Site site_;
  FaultPlan faults_;
  std::map<uint32_t, FunctionRef> handles_;
  std::mutex calls_mu_;  // apart from mu_: counted on every call, before the site lock
  std::map<std::string, uint64_t, std::less<>> calls_;
  uint32_t next_handle_ = 1;
};

// Lookups over a site; null / nullopt when absent.  Linear: sites are small
// enough that an index would cost more to keep right than it saves.
std::optional<FunctionRef> find_function(const Site& site, const Wwn& id);
std::optional<FunctionRef> find_instance(const Site& site, uint32_t instance);
inline Function& at(Site& site, FunctionRef r) { return site.cards[r.card].functions[r.function]; }
inline Card& card_of(Site& site, FunctionRef r) { return site.cards[r.card]; }

// The site used when $NRV_SITE is not set.
const char* default_site_path();

}  // namespace nrvsim

// The control entry points a test uses to change the site between reads and
// to see how often the module asked the library.
extern "C" {
// Replaces the site with the file at `path` (null or "": reads the current
// site file again); 1 when the new site is loaded, else 0.
NRVSIM_API int nrvsim_reload(const char* path);
// Calls of `function`'s operation since the site was last loaded.
NRVSIM_API unsigned long long nrvsim_call_count(const char* function);
}
