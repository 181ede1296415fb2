// Faults a site file asks for: per library function, a status to answer
// instead of the real result (always, from the n-th matching call on for a
// number of calls, or only for one adapter or LUN) and a delay per call.
// Thread-safe: the library's entry points consult it from any thread.
#pragma once

#include <cstdint>
#include <mutex>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "sim/Names.h"

namespace nrvsim {

struct FaultRule {
  std::string function;             // "HBA_SendReadCapacity", "LRM_GetVPD", "GetVPD", ...
  std::optional<uint32_t> status;   // answer instead of the real result
  uint64_t first_call = 0;          // 0: every matching call; n: the n-th one (1-based) ...
  uint64_t count = 1;               // ... and this many calls from it
  std::optional<Wwn> adapter;       // only calls addressed to this function/port
  std::optional<uint32_t> lun;      // only calls addressed to this LUN
  uint32_t delay_ms = 0;            // sleep before answering
};

// What one call is addressed to, as far as the entry point knows.
struct CallSite {
  std::string_view function;
  std::optional<Wwn> adapter;
  std::optional<uint32_t> lun;
};

struct FaultOutcome {
  uint32_t delay_ms = 0;
  std::optional<uint32_t> status;
};

class FaultPlan {
 public:
  FaultPlan() = default;
  FaultPlan(const FaultPlan&) = delete;
  FaultPlan& operator=(const FaultPlan&) = delete;

  void replace(std::vector<FaultRule> rules);
  // Counts the call against every matching rule and says what to do.  The
  // first rule that fires decides the status; delays of all matching rules add up.
  FaultOutcome on_call(const CallSite& call);

  // The operation a name stands for: "LRM_X", "RM_X" and "X" are one function
  // of the management library; HBA API names stay as they are.
  static std::string_view operation(std::string_view function);

 private:
  struct Armed {
    FaultRule rule;
    uint64_t seen = 0;
  };
  std::mutex mu_;
  std::vector<Armed> rules_;
};

// Applies an outcome's delay (outside any lock) and returns its status.
std::optional<uint32_t> enact(const FaultOutcome& outcome);

}  // namespace nrvsim
