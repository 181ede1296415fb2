// Must not compile: a hand-written class bound to a provider nobody wrote.
// ctest (provider_missing_test) expects the binding's own message.
#include "module/Provider_For.h"

namespace cimple {
struct NRVTAVO_Unwritten;
NRV_DECLARE_OWN_PROVIDER(NRVTAVO_Unwritten)
NRV_OWN_PROVIDER_FOR(NRVTAVO_Unwritten)
}  // namespace cimple
