// Fault rules of a site file, matched against each library call.
#include "sim/FaultPlan.h"

#include <chrono>
#include <thread>

namespace nrvsim {

std::string_view FaultPlan::operation(std::string_view function) {
  for (std::string_view prefix : {"LRM_", "RM_"}) {
    if (function.substr(0, prefix.size()) == prefix) return function.substr(prefix.size());
  }
  return function;
}

void FaultPlan::replace(std::vector<FaultRule> rules) {
  std::lock_guard<std::mutex> lock(mu_);
  rules_.clear();
  for (auto& r : rules) rules_.push_back(Armed{std::move(r), 0});
}

FaultOutcome FaultPlan::on_call(const CallSite& call) {
  FaultOutcome out;
  const std::string_view op = operation(call.function);
  std::lock_guard<std::mutex> lock(mu_);
  for (Armed& armed : rules_) {
    const FaultRule& r = armed.rule;
    if (operation(r.function) != op) continue;
    if (r.adapter && (!call.adapter || *call.adapter != *r.adapter)) continue;
    if (r.lun && (!call.lun || *call.lun != *r.lun)) continue;
    const uint64_t n = ++armed.seen;
    const bool fires = r.first_call == 0 || (n >= r.first_call && n - r.first_call < r.count);
    if (!fires) continue;
    out.delay_ms += r.delay_ms;
    if (r.status && !out.status) out.status = r.status;
  }
  return out;
}

std::optional<uint32_t> enact(const FaultOutcome& outcome) {
  if (outcome.delay_ms > 0) std::this_thread::sleep_for(std::chrono::milliseconds(outcome.delay_ms));
  return outcome.status;
}

}  // namespace nrvsim
