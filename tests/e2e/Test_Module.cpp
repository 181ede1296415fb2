// The test module: the adapter tests' provider set registered with the
// module entry macros, exactly as the real module registers its providers,
// so the host loads it through the same factories and adapter records.
// Hooks let a test reach the module's store across dlopen.
#include <chrono>
#include <cstdlib>
#include <memory>

#include "framework/cimom.h"
#include "framework/Module_Entry.h"
#include "tests/adapter/Test_Provider_Classes.h"

namespace test {
namespace {

// The cards the CIMOM enumerates for the current thread's context, or -1.
int count_cards() {
  Instance* model = NRVTAVO_Card::create(false);
  std::unique_ptr<Instance_Cursor> cursor = cimom::enum_instances("root/norvane", model);
  unref(model);
  if (!cursor) return -1;
  int count = 0;
  for (Instance* card = cursor->next(); card != nullptr; card = cursor->next(), ++count) unref(card);
  return count;
}

void* fetch_cards(void*) {
  Store::Fetch& fetch = store().fetch;
  const int before = count_cards();
  std::unique_lock<std::mutex> lock(fetch.mutex);
  fetch.cards_before = before;
  fetch.counted_before = true;
  fetch.changed.notify_all();
  fetch.changed.wait_for(lock, std::chrono::seconds(60), [&] { return fetch.go_on; });
  lock.unlock();
  const int after = count_cards();
  lock.lock();
  fetch.cards_after = after;
  return nullptr;
}

// The chip provider, starting the background fetch when the test asks.
class Fetching_Chip_Provider : public Chip_Provider {
 public:
  int enum_instances(const Instance* model, const Handler& handler) {
    Store::Fetch& fetch = store().fetch;
    if (fetch.requested && !fetch.thread.joinable()) Thread::create_joinable(fetch.thread, fetch_cards, nullptr);
    return Chip_Provider::enum_instances(model, handler);
  }
};

}  // namespace
}  // namespace test

NRV_PLAIN_MODULE_PROVIDER(NRVTAVO_Card, test::Card_Provider)
NRV_PLAIN_MODULE_PROVIDER(NRVTAVO_Chip, test::Fetching_Chip_Provider)
NRV_ASSOCIATION_MODULE_PROVIDER(NRVTAVO_CardContainsChip, test::Link_Provider)
NRV_PLAIN_MODULE_PROVIDER(NRVTAVO_ChannelMgmtService, test::Service_Provider)
NRV_PLAIN_MODULE_PROVIDER(NRVTAVO_ConcreteJob, test::Job_Provider)
NRV_PLAIN_MODULE_PROVIDER(NRVTAVO_EnabledLogicalElementCapabilities, test::Capabilities_Provider)

// Fresh store with cards A and B, chips X and Y (both on card A) and one
// service; with NRV_TEST_MODULE_FAULTS set (for a client in another
// process) every operation throws.  Only while no operation runs.
extern "C" void nrv_test_module_reset() {
  using namespace test;
  reset_store();
  store().throw_in_operations = std::getenv("NRV_TEST_MODULE_FAULTS") != nullptr;
  store().cards.insert(make_card("A"));
  store().cards.insert(make_card("B", "OCe"));
  store().chips.insert(make_chip("X"));
  store().chips.insert(make_chip("Y"));
  store().links.insert(make_link("A", "X"));
  store().links.insert(make_link("A", "Y"));
  store().services.insert(make_service("svc"));
}

extern "C" test::Store* nrv_test_module_store() { return &test::store(); }

// Joins the background fetch: 0, or the join error.
extern "C" int nrv_test_module_join_fetch() {
  void* value = nullptr;
  return cimple::Thread::join(test::store().fetch.thread, value);
}

namespace {
// A CIMOM may call a factory as soon as the module is loaded.
const bool seeded = (nrv_test_module_reset(), true);
}  // namespace
