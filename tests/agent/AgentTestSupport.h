// Helpers of the agent tests: a relocated system root, a log capture sink,
// a controllable fake catalogue installed as the agent's builders, and
// providers driven through their provider procedure as the adapter drives them.
#pragma once

#include <atomic>
#include <condition_variable>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "agent/ProviderAgent.h"
#include "framework/Provider_Handle.h"
#include "framework/Provider_Proc.h"
#include "logging/NRV_LoggerInterface.h"

namespace nrv_test {

// $NRV_SYSROOT (made up under /tmp when the test runs outside ctest) with
// the directories the agent writes to.
std::string sysroot();
std::string sysroot_path(const char* fixed_path);
void write_file(const std::string& path, const std::string& text);
std::string read_file(const std::string& path);
void remove_file(const std::string& path);

// Records every message while registered.  The agent's destruction empties
// the logger's sink list, so arm() again after an agent has gone.
class LogCapture : public cimple::NRV_LoggerInterface {
 public:
  struct Entry {
    int level;
    std::string file;
    std::string message;
  };
  LogCapture() { arm(); }
  ~LogCapture() override;
  void arm();

  void log(int level, const char* file, unsigned, const char* message) override;
  void start() override {}
  void stop() override {}
  void clear() override {}

  std::vector<Entry> entries() const;
  int count(const std::string& message, int level = -1) const;
  bool contains(const std::string& message) const { return count(message) > 0; }
  // Position of the first entry equal to `message` at or after `from`; -1 if none.
  long find(const std::string& message, long from = 0) const;
  void reset();

 private:
  mutable std::mutex m_Mutex;
  std::vector<Entry> m_Entries;
};

// A gate a builder passes only while it is open; counts who arrived.
class Gate {
 public:
  void close();
  void open();
  // Open, and no arrivals counted: each test counts its own.
  void reset();
  void pass();
  // Blocks until `n` callers have arrived at the gate in total.
  void await_arrivals(int n);

 private:
  std::mutex m_Mutex;
  std::condition_variable m_Cond;
  bool m_Open = true;
  int m_Arrived = 0;
};

// The fake site behind the agent's builders: each adapter-maps update fills
// `chips` NRVTAVO_Chip instances, each SAN-maps update `disks`
// NRVTAVO_LogicalDisk instances, all tagged with the update's generation in
// ElementName and inserted one by one so a reader could catch a half-filled map.
struct FakeCatalogue {
  std::atomic<int> adapterDataBuilds{0};
  std::atomic<int> adapterMapUpdates{0};
  std::atomic<int> sanDataBuilds{0};
  std::atomic<int> sanMapUpdates{0};
  std::atomic<int> generation{0};
  std::atomic<int> chips{6};
  std::atomic<int> disks{4};
  Gate adapterDataGate;
  Gate sanDataGate;

  void reset();
  static FakeCatalogue& get();
  static cimple::Catalogue_Builders builders();
};

// Runs the (usually disabled) test `test` of this executable in a child
// process whose environment has LD_LIBRARY_PATH = `library_path` plus the
// extra "NAME=value" entries; answers its exit status (0: passed).
int run_in_child(const std::string& test, const std::string& library_path,
                 const std::vector<std::string>& extra_env = {});

// Waits until no data fetch is running.
void wait_fetch_idle(cimple::ProviderAgent& agent);

// The instances an enumeration delivered (owned), and its closing status.
struct Collected {
  std::vector<cimple::Instance*> instances;
  int closing = -1;
  Collected() = default;
  Collected(const Collected&) = delete;
  Collected& operator=(const Collected&) = delete;
  ~Collected();
  static bool handler(cimple::Instance* instance, int status, void* data);
};

// True when the instances are `expected` in number and all carry the same
// ElementName (one generation of the fake catalogue).
bool one_generation(const Collected& c, size_t expected);

// One provider of class C served by provider class P, created, loaded and
// called through its provider procedure like the CMPI adapter does.
class ProviderSlot {
 public:
  ProviderSlot(const char* provider_name, cimple::Provider_Proc proc, const cimple::Meta_Class* meta_class);
  ~ProviderSlot();
  ProviderSlot(const ProviderSlot&) = delete;
  ProviderSlot& operator=(const ProviderSlot&) = delete;

  int load() { return m_Handle.load(); }
  int unload() { return m_Handle.unload(); }
  int enumerate(Collected& out) { return m_Handle.enum_instances(nullptr, &Collected::handler, &out); }
  cimple::Provider_Handle& handle() { return m_Handle; }

 private:
  cimple::Provider_Registration m_Registration;
  cimple::Provider_Handle m_Handle;
};

template <class P, class C>
std::unique_ptr<ProviderSlot> make_slot() {
  static const std::string name = std::string(C::static_meta_class.name) + "_Provider";
  return std::make_unique<ProviderSlot>(name.c_str(), &cimple::provider_proc<P>, &C::static_meta_class);
}

}  // namespace nrv_test
