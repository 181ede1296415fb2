// The forwarders: one hidden function per library function of RM_Functions.h,
// generated from the function tables, all sharing the lookup of
// NRV_ForwarderResolver.h.  Hidden so that a library opened later (or a
// default-scope lookup) can never bind to the module's own names.
#include "access/NRV_ForwarderResolver.h"
#include "access/RM_Api.h"

namespace cimple::loader_detail {
namespace {

enum ForwarderId : int {
#define NRV_FWD_ID_PAIR_(op, ...) kFwd_LRM_##op, kFwd_RM_##op,
#define NRV_FWD_ID_SINGLE_(group, ret, name, ...) kFwd_##name,
  NRV_RM_PAIRED_FUNCTIONS(NRV_FWD_ID_PAIR_) NRV_RM_SINGLE_FUNCTIONS(NRV_FWD_ID_SINGLE_)
#undef NRV_FWD_ID_PAIR_
#undef NRV_FWD_ID_SINGLE_
  kForwarderCount
};

constexpr int kPrimary_MGMT = kMgmtPrimary;
constexpr int kPrimary_HBA = kHbaPrimary;
constexpr int kPrimary_QOS = kQosPrimary;
constexpr int kPrimary_QOS_CLOSE = kNoPrimary;

}  // namespace

// Constant-initialised, so a forwarder called during another unit's static
// initialisation already finds its record.
constinit Forwarder g_forwarders[kForwarderCount] = {
#define NRV_FWD_REC_PAIR_(op, ...)                                                      \
  {kMgmtPrimary, "LRM_" #op, "RM_" #op, {}}, {kMgmtPrimary, "LRM_" #op, "RM_" #op, {}},
#define NRV_FWD_REC_SINGLE_(group, ret, name, ...) \
  {kPrimary_##group, #name, #name, {}},
    NRV_RM_PAIRED_FUNCTIONS(NRV_FWD_REC_PAIR_) NRV_RM_SINGLE_FUNCTIONS(NRV_FWD_REC_SINGLE_)
#undef NRV_FWD_REC_PAIR_
#undef NRV_FWD_REC_SINGLE_
};

Forwarder* forwarders() noexcept { return g_forwarders; }
int forwarderCount() noexcept { return kForwarderCount; }

}  // namespace cimple::loader_detail

// One body for all: resolve, answer the failure value when unavailable, else
// call through (a tail call on the fast path).
#define NRV_FWD_DEFINE_(ret, name, fail, ...)                                          \
  extern "C" __attribute__((visibility("hidden"))) ret name(NRV_PP_PARAMS(__VA_ARGS__)) { \
    using Fn = ret (*)(NRV_PP_PARAMS(__VA_ARGS__));                                   \
    auto fn = reinterpret_cast<Fn>(::cimple::loader_detail::target(                    \
        ::cimple::loader_detail::g_forwarders[::cimple::loader_detail::kFwd_##name],   \
        reinterpret_cast<const void*>(&name)));                                        \
    if (fn == nullptr) return static_cast<ret>(fail);                                  \
    return fn(NRV_PP_ARGS(__VA_ARGS__));                                               \
  }
#define NRV_FWD_PAIR_(op, ...)                                       \
  NRV_FWD_DEFINE_(RM_STATUS, LRM_##op, 1 __VA_OPT__(, ) __VA_ARGS__) \
  NRV_FWD_DEFINE_(RM_STATUS, RM_##op, 1 __VA_OPT__(, ) __VA_ARGS__)
#define NRV_FWD_SINGLE_(group, ret, name, fail, ...) \
  NRV_FWD_DEFINE_(ret, name, fail __VA_OPT__(, ) __VA_ARGS__)

NRV_RM_PAIRED_FUNCTIONS(NRV_FWD_PAIR_)
NRV_RM_SINGLE_FUNCTIONS(NRV_FWD_SINGLE_)
