#include "AgentTestSupport.h"

#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <sstream>
#include <thread>

#include "logging/NRV_SystemPaths.h"
#include "agent/NRVTAVO_ProviderConfigSetting_Provider.h"
#include "logging/CLogger.h"
#include "logging/Log.h"
#include "schema/NRVTAVO_Chip.h"
#include "schema/NRVTAVO_LogicalDisk.h"

extern char** environ;

namespace nrv_test {

using namespace cimple;

namespace {

void make_dirs(const std::string& path) {
  for (size_t pos = 1; pos != std::string::npos;) {
    pos = path.find('/', pos + 1);
    ::mkdir(path.substr(0, pos).c_str(), 0755);
  }
}

// Runs before any test: never let a test touch the real /etc.
const bool kSysrootReady = [] {
  const char* root = std::getenv(kSysrootVariable);
  if (root == nullptr || *root == '\0') {
    const std::string made = "/tmp/nrv_agent_test_root_" + std::to_string(::getpid());
    ::setenv(kSysrootVariable, made.c_str(), 1);
  }
  for (const char* dir : {"/etc", "/var/log", "/opt/kelvar/platform/log"}) make_dirs(system_path(dir));
  return true;
}();

}  // namespace

std::string sysroot() { return std::getenv(kSysrootVariable); }
std::string sysroot_path(const char* fixed_path) { return system_path(fixed_path); }

void write_file(const std::string& path, const std::string& text) {
  std::ofstream out(path, std::ios::trunc);
  out << text;
}

std::string read_file(const std::string& path) {
  std::ifstream in(path);
  std::stringstream text;
  text << in.rdbuf();
  return text.str();
}

void remove_file(const std::string& path) { std::remove(path.c_str()); }

// ---- LogCapture ------------------------------------------------------------------

LogCapture::~LogCapture() { CLogger::instance().unregisterSink(this); }

void LogCapture::arm() {
  CLogger::instance().registerSink(this);
  // The syslog-only path of a disabled logger would bypass this sink.
  CLogger::instance().enable();
}

void LogCapture::log(int level, const char* file, unsigned, const char* message) {
  std::lock_guard<std::mutex> lock(m_Mutex);
  m_Entries.push_back({level, file ? file : "", message ? message : ""});
}

std::vector<LogCapture::Entry> LogCapture::entries() const {
  std::lock_guard<std::mutex> lock(m_Mutex);
  return m_Entries;
}

int LogCapture::count(const std::string& message, int level) const {
  int n = 0;
  for (const Entry& e : entries())
    if (e.message == message && (level < 0 || e.level == level)) ++n;
  return n;
}

long LogCapture::find(const std::string& message, long from) const {
  const std::vector<Entry> all = entries();
  for (size_t i = static_cast<size_t>(from); i < all.size(); ++i)
    if (all[i].message == message) return static_cast<long>(i);
  return -1;
}

void LogCapture::reset() {
  std::lock_guard<std::mutex> lock(m_Mutex);
  m_Entries.clear();
}

// ---- Gate ------------------------------------------------------------------------

void Gate::close() {
  std::lock_guard<std::mutex> lock(m_Mutex);
  m_Open = false;
}

void Gate::open() {
  std::lock_guard<std::mutex> lock(m_Mutex);
  m_Open = true;
  m_Cond.notify_all();
}

void Gate::reset() {
  std::lock_guard<std::mutex> lock(m_Mutex);
  m_Open = true;
  m_Arrived = 0;
  m_Cond.notify_all();
}

void Gate::pass() {
  std::unique_lock<std::mutex> lock(m_Mutex);
  ++m_Arrived;
  m_Cond.notify_all();
  m_Cond.wait(lock, [this] { return m_Open; });
}

void Gate::await_arrivals(int n) {
  std::unique_lock<std::mutex> lock(m_Mutex);
  m_Cond.wait(lock, [&] { return m_Arrived >= n; });
}

// ---- the fake catalogue ------------------------------------------------------------

namespace {

String generation_tag(int generation) { return String("gen-" + std::to_string(generation)); }

void fill_chips(ProviderAgent& agent, int generation) {
  for (int i = 0; i < FakeCatalogue::get().chips; ++i) {
    NRVTAVO_Chip* chip = NRVTAVO_Chip::create();
    chip->CreationClassName.set("NRVTAVO_Chip");
    chip->Tag.set(String("chip-" + std::to_string(i)));
    chip->ElementName.set(generation_tag(generation));
    if (agent.m_NRVTAVO_Chip_map.insert(chip) < 0) destroy(chip);
    std::this_thread::yield();
  }
}

void fill_disks(ProviderAgent& agent, int generation) {
  for (int i = 0; i < FakeCatalogue::get().disks; ++i) {
    NRVTAVO_LogicalDisk* disk = NRVTAVO_LogicalDisk::create();
    disk->SystemCreationClassName.set("CIM_ComputerSystem");
    disk->SystemName.set("host");
    disk->CreationClassName.set("NRVTAVO_LogicalDisk");
    disk->DeviceID.set(String("disk-" + std::to_string(i)));
    disk->ElementName.set(generation_tag(generation));
    if (agent.m_NRVTAVO_LogicalDisk_map.insert(disk) < 0) destroy(disk);
    std::this_thread::yield();
  }
}

void fake_build_adapter_data(ProviderAgent&) {
  FakeCatalogue& fake = FakeCatalogue::get();
  fake.adapterDataGate.pass();
  ++fake.adapterDataBuilds;
  NRV_LOG(NRV_DBG, "fake: adapter data built");
}

void fake_update_adapter_maps(ProviderAgent& agent) {
  FakeCatalogue& fake = FakeCatalogue::get();
  agent.clearAdapterMaps();
  fill_chips(agent, ++fake.generation);
  insertProviderConfigSettings(agent);
  ++fake.adapterMapUpdates;
}

void fake_build_san_data(ProviderAgent&) {
  FakeCatalogue& fake = FakeCatalogue::get();
  fake.sanDataGate.pass();
  ++fake.sanDataBuilds;
}

void fake_update_san_maps(ProviderAgent& agent) {
  FakeCatalogue& fake = FakeCatalogue::get();
  agent.clearSANMaps();
  fill_disks(agent, ++fake.generation);
  ++fake.sanMapUpdates;
}

void fake_release_jobs(ProviderAgent&) {}

}  // namespace

FakeCatalogue& FakeCatalogue::get() {
  static FakeCatalogue fake;
  return fake;
}

void FakeCatalogue::reset() {
  adapterDataBuilds = adapterMapUpdates = sanDataBuilds = sanMapUpdates = generation = 0;
  chips = 6;
  disks = 4;
  adapterDataGate.reset();
  sanDataGate.reset();
}

Catalogue_Builders FakeCatalogue::builders() {
  // The fake SAN maps are filled where the real ones are published.
  return {fake_build_adapter_data, fake_update_adapter_maps, fake_build_san_data, nullptr, fake_update_san_maps,
          fake_release_jobs};
}

int run_in_child(const std::string& test, const std::string& library_path,
                 const std::vector<std::string>& extra_env) {
  std::vector<std::string> env;
  for (char** e = environ; *e; ++e)
    if (std::string(*e).rfind("LD_LIBRARY_PATH=", 0) != 0) env.emplace_back(*e);
  env.push_back("LD_LIBRARY_PATH=" + library_path);
  env.insert(env.end(), extra_env.begin(), extra_env.end());
  std::vector<char*> envp;
  for (std::string& s : env) envp.push_back(s.data());
  envp.push_back(nullptr);

  std::string filter = "--gtest_filter=" + test;
  std::string disabled = "--gtest_also_run_disabled_tests";
  char exe[] = "/proc/self/exe";
  char* argv[] = {exe, filter.data(), disabled.data(), nullptr};
  const pid_t pid = ::fork();
  if (pid < 0) return -1;
  if (pid == 0) {
    ::execve(exe, argv, envp.data());
    ::_exit(127);
  }
  int status = 0;
  if (::waitpid(pid, &status, 0) != pid) return -1;
  return WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
}

void wait_fetch_idle(ProviderAgent& agent) {
  for (;;) {
    {
      std::lock_guard<std::mutex> lock(agent.m_BuildMutex);
      if (!agent.m_bIsDataFetchRunning) return;
    }
    std::this_thread::yield();
  }
}

// ---- enumeration results and provider slots ----------------------------------------------

Collected::~Collected() {
  for (Instance* i : instances) unref(i);
}

bool Collected::handler(Instance* instance, int status, void* data) {
  auto* c = static_cast<Collected*>(data);
  if (instance == nullptr)
    c->closing = status;
  else
    c->instances.push_back(instance);
  return true;
}

bool one_generation(const Collected& c, size_t expected) {
  if (c.instances.size() != expected) return false;
  if (expected == 0) return true;
  const Meta_Property* mp = find_property(c.instances[0]->meta_class, "ElementName");
  const auto first = static_cast<const Property<String>*>(slot(c.instances[0], mp->offset))->value;
  for (const Instance* i : c.instances)
    if (!(static_cast<const Property<String>*>(slot(i, mp->offset))->value == first)) return false;
  return true;
}

ProviderSlot::ProviderSlot(const char* provider_name, Provider_Proc proc, const Meta_Class* meta_class)
    : m_Registration{kModuleName, provider_name, proc, meta_class, nullptr}, m_Handle(&m_Registration) {
  m_Handle.create_provider();
}

ProviderSlot::~ProviderSlot() { m_Handle.destroy_provider(); }

}  // namespace nrv_test
