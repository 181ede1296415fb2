// The runtime loader against real shared libraries: which files it opens,
// what each forwarder resolves to, and what they answer when nothing resolves.
// Each scenario runs in a child process with its own library search path.
#include <dlfcn.h>

#include <atomic>
#include <type_traits>

#include <string>
#include <thread>
#include <vector>

#include <gtest/gtest.h>

#include "TestSupport.h"
#include "access/NRV_ForwarderResolver.h"
#include "access/NRV_Runtime_Loader.h"
#include "access/RM_Api.h"

using cimple::NRV_Runtime_Loader;
using nrv_test::LogCapture;
using nrv_test::runInChild;
using nrv_test::stubDir;

namespace {

HBA_NAME name(unsigned char first, unsigned char last = 0) {
  HBA_NAME n{};
  n.wwn[0] = first;
  n.wwn[7] = last;
  return n;
}

// A search path of stub directories; the "no..." ones hold unusable files
// that hide any library of that name installed on the host.
std::string path(std::initializer_list<const char*> dirs) {
  std::string p;
  for (const char* d : dirs) p += (p.empty() ? "" : ":") + stubDir(d);
  return p;
}

void* stubSymbol(const char* file, const char* symbol) {
  void* h = dlopen(file, RTLD_NOW | RTLD_NOLOAD);
  if (h == nullptr) return nullptr;
  void* p = dlsym(h, symbol);
  dlclose(h);
  return p;
}

}  // namespace

// ---- Parents: one child process per library layout --------------------------

TEST(RuntimeLoader, PrimaryLibrariesPresent) {
  EXPECT_EQ(0, runInChild("LoaderChild.DISABLED_Primary", path({"hba2", "hba_so", "lrm", "rm_rm"})));
}
TEST(RuntimeLoader, OnlyUnversionedHbaApiAndRmapiWithLrmNames) {
  EXPECT_EQ(0, runInChild("LoaderChild.DISABLED_FallbackLrmNames", path({"nohba2", "hba_so", "nolrm", "rm_lrm"})));
}
TEST(RuntimeLoader, RmapiWithRmNamesOnly) {
  EXPECT_EQ(0, runInChild("LoaderChild.DISABLED_FallbackRmNames", path({"nohba", "nolrm", "rm_rm"})));
}
TEST(RuntimeLoader, NoLibrariesAtAll) {
  EXPECT_EQ(0, runInChild("LoaderChild.DISABLED_Nothing", path({"nohba", "nomgmt"})));
}
TEST(RuntimeLoader, ReloadAfterUnload) {
  EXPECT_EQ(0, runInChild("LoaderChild.DISABLED_Reload", path({"hba2", "lrm", "nomgmt"})));
}
TEST(RuntimeLoader, QosFunctionsComeFromTheDefaultScope) {
  EXPECT_EQ(0, runInChild("LoaderChild.DISABLED_DefaultScope", path({"lrm", "nomgmt"})));
}
TEST(RuntimeLoader, ConcurrentFirstCalls) {
  EXPECT_EQ(0, runInChild("LoaderChild.DISABLED_Concurrent", path({"nohba", "lrm", "nomgmt"})));
}

TEST(RuntimeLoader, FileNameRule) {
  EXPECT_EQ("libHBAAPI.so.2", NRV_Runtime_Loader::libraryFileName("HBAAPI.so.2"));
  EXPECT_EQ("libHBAAPI.so", NRV_Runtime_Loader::libraryFileName("HBAAPI.so"));
  EXPECT_EQ("liblrmapi.so", NRV_Runtime_Loader::libraryFileName("lrmapi"));
  EXPECT_EQ("librmapi.so", NRV_Runtime_Loader::libraryFileName("rmapi"));
}

// ---- Children (run only through the parents above) ---------------------------

TEST(LoaderChild, DISABLED_Primary) {
  LogCapture log;
  ASSERT_EQ(0, NRV_Runtime_Loader::loadLibraries());
  EXPECT_EQ("libHBAAPI.so.2", NRV_Runtime_Loader::fileName(NRV_Runtime_Loader::kHbaApiSlot));
  EXPECT_EQ("liblrmapi.so", NRV_Runtime_Loader::fileName(NRV_Runtime_Loader::kLrmApiSlot));
  // librmapi is present but never opened.
  EXPECT_EQ(nullptr, NRV_Runtime_Loader::handle(NRV_Runtime_Loader::kRmApiSlot));
  EXPECT_EQ(nullptr, dlopen("librmapi.so", RTLD_NOW | RTLD_NOLOAD));
  for (int slot = 0; slot < NRV_Runtime_Loader::kSlotCount; ++slot)
    EXPECT_FALSE(NRV_Runtime_Loader::isUnavailable(slot)) << slot;
  EXPECT_EQ(0, log.count("dlopen failed :"));

  EXPECT_EQ(2u, HBA_GetNumberOfAdapters());
  HBA_UINT32 flag = 0;
  EXPECT_EQ(0u, LRM_GetHBAFeature(name(0x20, 77), 77, &flag));
  EXPECT_EQ(1u, flag);
  // The RM_ name of a paired function also reaches liblrmapi's LRM_ function.
  flag = 0;
  EXPECT_EQ(0u, RM_GetHBAFeature(name(0x20, 77), 77, &flag));
  EXPECT_EQ(1u, flag);
  // RM_-only functions are looked up in liblrmapi under their RM_ name.
  EXPECT_EQ(3u, RM_GetNumberOfLocalAdapters());
  EXPECT_EQ(7, NrvGetBoardNumber(name(0x20)));
  HBA_UINT32 size = 64;
  unsigned char table[64];
  EXPECT_EQ(0u, LRM_Ini_GetARPTable(name(0x20), table, &size));
  // A symbol liblrmapi lacks yields the failure value, every time.
  unsigned char blob[16];
  size = sizeof blob;
  EXPECT_EQ(1u, LRM_GetPortAttributes(name(0x20), blob, &size));
  EXPECT_EQ(1u, LRM_GetPortAttributes(name(0x20), blob, &size));
  EXPECT_EQ(1u, RM_ValidateWwn(name(0x20)));  // only librmapi has it, and it is not open
  HBA_UINT16 length = 0;
  HBA_UINT32 status = 0;
  EXPECT_EQ(nullptr, RM_GetAttributeValue(blob, 514, &length, &status));

  // An occupied slot is not opened again.
  void* before = NRV_Runtime_Loader::handle(NRV_Runtime_Loader::kLrmApiSlot);
  EXPECT_EQ(1, NRV_Runtime_Loader::loadLibrary(NRV_Runtime_Loader::kLrmApiSlot, "nonexistent"));
  EXPECT_EQ(before, NRV_Runtime_Loader::handle(NRV_Runtime_Loader::kLrmApiSlot));
  EXPECT_EQ(0, log.count("dlopen failed :"));
  // A file that is not there is refused and logged.
  EXPECT_EQ(0, NRV_Runtime_Loader::loadLibrary(NRV_Runtime_Loader::kQosSlot, "nonexistent"));
  EXPECT_EQ(1, log.count("dlopen failed :", "libnonexistent.so", cimple::NRV_ERR));
  EXPECT_EQ(0, NRV_Runtime_Loader::unloadLibraries());
}

TEST(LoaderChild, DISABLED_FallbackLrmNames) {
  LogCapture log;
  ASSERT_EQ(0, NRV_Runtime_Loader::loadLibraries());
  // libHBAAPI.so.2 failed (logged), libHBAAPI.so took its place.
  EXPECT_EQ("libHBAAPI.so", NRV_Runtime_Loader::fileName(NRV_Runtime_Loader::kHbaApiSlot));
  EXPECT_FALSE(NRV_Runtime_Loader::isUnavailable(NRV_Runtime_Loader::kHbaApiSlot));
  EXPECT_EQ(1, log.count("dlopen failed :", "libHBAAPI.so.2", cimple::NRV_ERR));
  EXPECT_EQ(1u, HBA_GetNumberOfAdapters());
  EXPECT_EQ(42u, HBA_OpenAdapter(const_cast<char*>("x")));

  EXPECT_TRUE(NRV_Runtime_Loader::isUnavailable(NRV_Runtime_Loader::kLrmApiSlot));
  EXPECT_FALSE(NRV_Runtime_Loader::isUnavailable(NRV_Runtime_Loader::kRmApiSlot));
  EXPECT_EQ("librmapi.so", NRV_Runtime_Loader::fileName(NRV_Runtime_Loader::kRmApiSlot));
  EXPECT_EQ(1, log.count("dlopen failed :", "liblrmapi.so", cimple::NRV_ERR));
  // librmapi's LRM_ name is preferred for both names of the pair.
  HBA_UINT32 flag = 0;
  EXPECT_EQ(11u, LRM_GetHBAFeature(name(0x20), 1, &flag));
  EXPECT_EQ(11u, RM_GetHBAFeature(name(0x20), 1, &flag));
  EXPECT_EQ(5u, RM_GetNumberOfLocalAdapters());
  EXPECT_EQ(33u, RM_ValidateWwn(name(0x20)));
  EXPECT_EQ(1u, LRM_InitLib());  // in no library
  EXPECT_EQ(0, NRV_Runtime_Loader::unloadLibraries());
}

TEST(LoaderChild, DISABLED_FallbackRmNames) {
  LogCapture log;
  ASSERT_EQ(0, NRV_Runtime_Loader::loadLibraries());
  EXPECT_TRUE(NRV_Runtime_Loader::isUnavailable(NRV_Runtime_Loader::kHbaApiSlot));
  EXPECT_EQ(2, log.count("dlopen failed :", "libHBAAPI.so"));
  HBA_UINT32 flag = 0;
  // No LRM_ name in librmapi: the RM_ name answers.
  EXPECT_EQ(22u, LRM_GetHBAFeature(name(0x20), 1, &flag));
  EXPECT_EQ(22u, RM_GetHBAFeature(name(0x20), 1, &flag));
  EXPECT_EQ(6u, RM_GetNumberOfLocalAdapters());
  // HBA API missing: its forwarders try librmapi, which has none of them.
  EXPECT_EQ(0u, HBA_GetNumberOfAdapters());
  EXPECT_EQ(0u, HBA_OpenAdapter(const_cast<char*>("x")));
  EXPECT_EQ(0, NRV_Runtime_Loader::unloadLibraries());
}

namespace {

// Calls every forwarder with value-initialised arguments and checks that it
// answers its table's failure value.
template <class T>
T zero() {
  return T{};
}

template <class Call, class Fail>
void expectFailure(const char* fn, Call call, Fail failValue) {
  if constexpr (std::is_void_v<decltype(call())>) {
    call();
  } else {
    EXPECT_TRUE(call() == failValue()) << fn;
  }
}

#define NRV_T_CALL_(ret, fn, fail, ...)                                   \
  expectFailure(                                                          \
      #fn, [] { return fn(NRV_T_ZEROS_(__VA_ARGS__)); },                  \
      [] { return static_cast<ret>(fail); });
#define NRV_T_ZEROS_0()
#define NRV_T_ZEROS_1(t1) zero<t1>()
#define NRV_T_ZEROS_2(t1, t2) zero<t1>(), zero<t2>()
#define NRV_T_ZEROS_3(t1, t2, t3) zero<t1>(), zero<t2>(), zero<t3>()
#define NRV_T_ZEROS_4(t1, t2, t3, t4) zero<t1>(), zero<t2>(), zero<t3>(), zero<t4>()
#define NRV_T_ZEROS_5(t1, t2, t3, t4, t5) \
  zero<t1>(), zero<t2>(), zero<t3>(), zero<t4>(), zero<t5>()
#define NRV_T_ZEROS_6(t1, t2, t3, t4, t5, t6) \
  zero<t1>(), zero<t2>(), zero<t3>(), zero<t4>(), zero<t5>(), zero<t6>()
#define NRV_T_ZEROS_7(t1, t2, t3, t4, t5, t6, t7) \
  zero<t1>(), zero<t2>(), zero<t3>(), zero<t4>(), zero<t5>(), zero<t6>(), zero<t7>()
#define NRV_T_ZEROS_8(t1, t2, t3, t4, t5, t6, t7, t8)                                  \
  zero<t1>(), zero<t2>(), zero<t3>(), zero<t4>(), zero<t5>(), zero<t6>(), zero<t7>(), \
      zero<t8>()
#define NRV_T_ZEROS_9(t1, t2, t3, t4, t5, t6, t7, t8, t9)                              \
  zero<t1>(), zero<t2>(), zero<t3>(), zero<t4>(), zero<t5>(), zero<t6>(), zero<t7>(), \
      zero<t8>(), zero<t9>()
#define NRV_T_ZEROS_(...) NRV_PP_CAT(NRV_T_ZEROS_, NRV_PP_NARGS(__VA_ARGS__))(__VA_ARGS__)
#define NRV_T_PAIR_(op, ...)                                \
  NRV_T_CALL_(RM_STATUS, LRM_##op, 1 __VA_OPT__(, ) __VA_ARGS__) \
  NRV_T_CALL_(RM_STATUS, RM_##op, 1 __VA_OPT__(, ) __VA_ARGS__)
#define NRV_T_SINGLE_(group, ret, fn, fail, ...) \
  NRV_T_CALL_(ret, fn, fail __VA_OPT__(, ) __VA_ARGS__)

void callEveryForwarder() {
  NRV_RM_PAIRED_FUNCTIONS(NRV_T_PAIR_)
  NRV_RM_SINGLE_FUNCTIONS(NRV_T_SINGLE_)
}

}  // namespace

TEST(LoaderChild, DISABLED_Nothing) {
  LogCapture log;
  EXPECT_EQ(1, NRV_Runtime_Loader::loadLibraries());
  EXPECT_EQ(4, log.count("dlopen failed :", cimple::NRV_ERR));
  EXPECT_EQ(1, log.count("dlopen failed :", "libHBAAPI.so.2"));
  EXPECT_EQ(1, log.count("dlopen failed :", "liblrmapi.so"));
  EXPECT_EQ(1, log.count("dlopen failed :", "librmapi.so"));
  for (int slot = 0; slot < 3; ++slot) EXPECT_TRUE(NRV_Runtime_Loader::isUnavailable(slot));
  // The QoS flag is never set.
  EXPECT_FALSE(NRV_Runtime_Loader::isUnavailable(NRV_Runtime_Loader::kQosSlot));
  callEveryForwarder();
  callEveryForwarder();  // and again, now that caches hold their null results
  // With both management libraries missing nothing was looked up: no cache
  // slot outside the QoS group ever received a value.
  auto* all = cimple::loader_detail::forwarders();
  for (int i = 0; i < cimple::loader_detail::forwarderCount(); ++i)
    EXPECT_EQ(nullptr, all[i].cache.load()) << all[i].firstName;
  EXPECT_EQ(0, NRV_Runtime_Loader::unloadLibraries());
}

TEST(LoaderChild, DISABLED_Reload) {
  ASSERT_EQ(0, NRV_Runtime_Loader::loadLibraries());
  HBA_UINT32 flag = 0;
  ASSERT_EQ(0u, LRM_GetHBAFeature(name(0x20, 5), 5, &flag));
  ASSERT_EQ(2u, HBA_GetNumberOfAdapters());
  ASSERT_NE(nullptr, stubSymbol("liblrmapi.so", "LRM_GetHBAFeature"));

  EXPECT_EQ(0, NRV_Runtime_Loader::unloadLibraries());
  for (int slot = 0; slot < NRV_Runtime_Loader::kSlotCount; ++slot)
    EXPECT_EQ(nullptr, NRV_Runtime_Loader::handle(slot));
  // The libraries are really gone, so a stale pointer would crash here.
  EXPECT_EQ(nullptr, dlopen("liblrmapi.so", RTLD_NOW | RTLD_NOLOAD));
  EXPECT_EQ(1u, LRM_GetHBAFeature(name(0x20, 5), 5, &flag));
  EXPECT_EQ(0u, HBA_GetNumberOfAdapters());

  ASSERT_EQ(0, NRV_Runtime_Loader::loadLibraries());
  flag = 0;
  EXPECT_EQ(0u, LRM_GetHBAFeature(name(0x20, 5), 5, &flag));
  EXPECT_EQ(1u, flag);
  EXPECT_EQ(2u, HBA_GetNumberOfAdapters());
  EXPECT_EQ(0, NRV_Runtime_Loader::unloadLibraries());
}

TEST(LoaderChild, DISABLED_DefaultScope) {
  ASSERT_EQ(0, NRV_Runtime_Loader::loadLibraries());
  HBA_UINT32 flag = 0;
  // Nothing in the process exports the QoS functions yet.
  EXPECT_EQ(1u, DOZER_QoSGetGlobalFlag(4, &flag));
  DOZER_CloseAdapter(4);

  const std::string qos = stubDir("dozer") + "/libnrvdozerstub.so";
  void* h = dlopen(qos.c_str(), RTLD_NOW | RTLD_GLOBAL);
  ASSERT_NE(nullptr, h) << dlerror();
  // A null cached result is looked up again, now in the default scope.
  EXPECT_EQ(0u, DOZER_QoSGetGlobalFlag(4, &flag));
  EXPECT_EQ(5u, flag);
  // DOZER_CloseAdapter looks in the librmapi slot, empty here: default scope.
  auto closed = reinterpret_cast<int (*)()>(dlsym(h, "stub_dozer_closed"));
  ASSERT_NE(nullptr, closed);
  DOZER_CloseAdapter(4);
  DOZER_CloseAdapter(4);
  EXPECT_EQ(2, closed());
  // The module's own hidden forwarders never answer a default-scope lookup.
  EXPECT_EQ(nullptr, dlsym(RTLD_DEFAULT, "LRM_GetHBAFeature"));
  EXPECT_EQ(0, NRV_Runtime_Loader::unloadLibraries());
  dlclose(h);
}

TEST(LoaderChild, DISABLED_Concurrent) {
  ASSERT_EQ(0, NRV_Runtime_Loader::loadLibraries());
  std::vector<std::thread> threads;
  std::atomic<int> failures{0};
  for (int t = 0; t < 8; ++t) {
    threads.emplace_back([&failures, t] {
      for (int i = 0; i < 200; ++i) {
        HBA_UINT32 flag = 0;
        const unsigned char feature = static_cast<unsigned char>(t + i % 3);
        if (LRM_GetHBAFeature(name(0x20, feature), feature, &flag) != 0 || flag != 1) ++failures;
        if (RM_GetNumberOfLocalAdapters() != 3) ++failures;
        if (HBA_GetNumberOfAdapters() != 0) ++failures;  // no HBA API on this path
      }
    });
  }
  for (auto& t : threads) t.join();
  EXPECT_EQ(0, failures.load());
  EXPECT_EQ(0, NRV_Runtime_Loader::unloadLibraries());
}
