// The test module: the adapter tests' provider set registered with the
// module entry macros, exactly as the real module registers its providers,
// so the host loads it through the same factories and adapter records.
// Two hooks let a test reach the module's store across dlopen.
#include "framework/Module_Entry.h"
#include "tests/adapter/Test_Provider_Classes.h"

NRV_PLAIN_MODULE_PROVIDER(NRVTAVO_Card, test::Card_Provider)
NRV_PLAIN_MODULE_PROVIDER(NRVTAVO_Chip, test::Chip_Provider)
NRV_ASSOCIATION_MODULE_PROVIDER(NRVTAVO_CardContainsChip, test::Link_Provider)
NRV_PLAIN_MODULE_PROVIDER(NRVTAVO_ChannelMgmtService, test::Service_Provider)

// Fresh store with cards A and B, chips X and Y (both on card A) and one
// service.  Only while no operation runs.
extern "C" void nrv_test_module_reset() {
  using namespace test;
  reset_store();
  store().cards.insert(make_card("A"));
  store().cards.insert(make_card("B", "OCe"));
  store().chips.insert(make_chip("X"));
  store().chips.insert(make_chip("Y"));
  store().links.insert(make_link("A", "X"));
  store().links.insert(make_link("A", "Y"));
  store().services.insert(make_service("svc"));
}

extern "C" test::Store* nrv_test_module_store() { return &test::store(); }

namespace {
// A CIMOM may call a factory as soon as the module is loaded.
const bool seeded = (nrv_test_module_reset(), true);
}  // namespace
