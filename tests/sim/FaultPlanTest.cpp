// Fault rules: which calls they hit, and that a delay is really spent.
#include <gtest/gtest.h>

#include <chrono>

#include "sim/FaultPlan.h"

namespace nrvsim {
namespace {

std::optional<uint32_t> call(FaultPlan& plan, const char* fn, std::optional<Wwn> adapter = std::nullopt,
                             std::optional<uint32_t> lun = std::nullopt) {
  return plan.on_call(CallSite{fn, adapter, lun}).status;
}

FaultRule rule(const char* fn, uint32_t status) {
  FaultRule r;
  r.function = fn;
  r.status = status;
  return r;
}

TEST(FaultPlan, EveryCallWhenNoCallIsGiven) {
  FaultPlan plan;
  plan.replace({rule("RM_GetVPD", 190)});
  for (int i = 0; i < 3; ++i) EXPECT_EQ(call(plan, "RM_GetVPD"), 190u);
  EXPECT_EQ(call(plan, "RM_GetVPDV2"), std::nullopt);
}

TEST(FaultPlan, NthCallForCountCalls) {
  FaultPlan plan;
  FaultRule r = rule("HBA_GetFcpTargetMapping", 8);
  r.first_call = 2;
  r.count = 3;
  plan.replace({r});
  std::vector<std::optional<uint32_t>> seen;
  for (int i = 0; i < 6; ++i) seen.push_back(call(plan, "HBA_GetFcpTargetMapping"));
  EXPECT_EQ(seen, (std::vector<std::optional<uint32_t>>{std::nullopt, 8u, 8u, 8u, std::nullopt, std::nullopt}));
}

TEST(FaultPlan, PrefixesNameOneManagementOperation) {
  FaultPlan plan;
  plan.replace({rule("GetHBAAttributes", 1)});
  EXPECT_EQ(call(plan, "LRM_GetHBAAttributes"), 1u);
  EXPECT_EQ(call(plan, "RM_GetHBAAttributes"), 1u);
  plan.replace({rule("RM_GetHBAAttributes", 2)});
  EXPECT_EQ(call(plan, "LRM_GetHBAAttributes"), 2u);
  EXPECT_EQ(call(plan, "HBA_GetAdapterAttributes"), std::nullopt);
}

TEST(FaultPlan, AdapterAndLunFiltersCountOnlyMatchingCalls) {
  FaultPlan plan;
  const Wwn a = *parse_wwn("1000009000000001");
  const Wwn b = *parse_wwn("1000009000000002");
  FaultRule r = rule("HBA_SendScsiInquiry", 9);
  r.adapter = a;
  r.lun = 3;
  r.first_call = 2;
  plan.replace({r});
  EXPECT_EQ(call(plan, "HBA_SendScsiInquiry", a, 3), std::nullopt);  // first matching call
  EXPECT_EQ(call(plan, "HBA_SendScsiInquiry", b, 3), std::nullopt);  // other adapter, not counted
  EXPECT_EQ(call(plan, "HBA_SendScsiInquiry", a, 2), std::nullopt);  // other LUN, not counted
  EXPECT_EQ(call(plan, "HBA_SendScsiInquiry", std::nullopt, 3), std::nullopt);
  EXPECT_EQ(call(plan, "HBA_SendScsiInquiry", a, 3), 9u);            // second matching call
}

TEST(FaultPlan, FirstFiringRuleDecidesAndDelaysAddUp) {
  FaultPlan plan;
  FaultRule slow;
  slow.function = "RM_GetSffData";
  slow.delay_ms = 20;
  plan.replace({slow, rule("RM_GetSffData", 190), rule("RM_GetSffData", 1)});
  const FaultOutcome out = plan.on_call(CallSite{"RM_GetSffData", std::nullopt, std::nullopt});
  EXPECT_EQ(out.status, 190u);
  EXPECT_EQ(out.delay_ms, 20u);
  const auto start = std::chrono::steady_clock::now();
  EXPECT_EQ(enact(out), 190u);
  EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(20));
}

TEST(FaultPlan, ReplaceResetsCounters) {
  FaultPlan plan;
  FaultRule r = rule("RM_GetVPD", 1);
  r.first_call = 1;
  plan.replace({r});
  EXPECT_EQ(call(plan, "RM_GetVPD"), 1u);
  EXPECT_EQ(call(plan, "RM_GetVPD"), std::nullopt);
  plan.replace({r});
  EXPECT_EQ(call(plan, "RM_GetVPD"), 1u);
}

}  // namespace
}  // namespace nrvsim
