// The method wrapper against a stub management library: one-time library
// initialisation under the named semaphores, and the adapter tests.
#include "access/NRV_MethodWrapper.h"

#include <dlfcn.h>
#include <fcntl.h>
#include <semaphore.h>
#include <sched.h>

#include <memory>
#include <stdexcept>
#include <thread>

#include <gtest/gtest.h>

#include "TestSupport.h"
#include "access/NRV_Runtime_Loader.h"
#include "tests/common/Special_Files.h"

using namespace cimple;
using nrv_test::LogCapture;
using nrv_test::runInChild;
using nrv_test::stubDir;

namespace {

std::string stubPath() { return stubDir("nohba") + ":" + stubDir("lrm") + ":" + stubDir("nomgmt"); }

template <class Fn>
Fn stubFunction(const char* symbol) {
  void* h = dlopen("liblrmapi.so", RTLD_NOW | RTLD_NOLOAD);
  void* p = h ? dlsym(h, symbol) : nullptr;
  if (h) dlclose(h);
  return reinterpret_cast<Fn>(p);
}

bool semaphoreExists(const std::string& name) {
  sem_t* s = sem_open(name.c_str(), 0);
  if (s == SEM_FAILED) return false;
  sem_close(s);
  return true;
}

HBA_NAME local(unsigned char feature = 0) {
  HBA_NAME n{};
  n.wwn[0] = 0x20;
  n.wwn[7] = feature;
  return n;
}

}  // namespace

TEST(MethodWrapper, InitialisesTheLibraryOnce) {
  EXPECT_EQ(0, runInChild("WrapperChild.DISABLED_InitOnce", stubPath()));
}
TEST(MethodWrapper, SecondWrapperWaitsForTheFirst) {
  EXPECT_EQ(0, runInChild("WrapperChild.DISABLED_SecondWaits", stubPath()));
}
TEST(MethodWrapper, FailedInitialisationThrows) {
  EXPECT_EQ(0, runInChild("WrapperChild.DISABLED_InitFails", stubPath()));
}
TEST(MethodWrapper, AStaleSemaphoreOfAnEarlierProcessDoesNotBlock) {
  EXPECT_EQ(0, runInChild("WrapperChild.DISABLED_StaleSemaphore", stubPath()));
}
TEST(MethodWrapper, AdapterTests) {
  EXPECT_EQ(0, runInChild("WrapperChild.DISABLED_AdapterTests", stubPath()));
}

TEST(WrapperChild, DISABLED_InitOnce) {
  ASSERT_EQ(0, NRV_Runtime_Loader::loadLibraries());
  auto initCalls = stubFunction<int (*)()>("stub_init_calls");
  ASSERT_NE(nullptr, initCalls);
  LogCapture log;
  {
    NRV_MethodWrapper wrapper;
    EXPECT_EQ(1, initCalls());
    EXPECT_TRUE(semaphoreExists(NRV_MethodWrapper::initSemaphoreName()));
    EXPECT_TRUE(log.contains("Aquired Semaphore.. Running RM_InitLib " +
                             NRV_MethodWrapper::initSemaphoreName() + " "));
    EXPECT_TRUE(log.contains("Signaled Completed Semaphore.. Running RM_InitLib"));
    EXPECT_TRUE(log.contains("RM Library initialized"));
  }
  // Taken once and given back after initialising, then given once more.
  EXPECT_TRUE(log.contains("Value of Sem in destructor=3"));
  EXPECT_TRUE(log.contains("RM Library uninitialzed"));
  // Neither semaphore outlives the wrapper.
  EXPECT_FALSE(semaphoreExists(NRV_MethodWrapper::initSemaphoreName()));
  EXPECT_FALSE(semaphoreExists(NRV_MethodWrapper::doneSemaphoreName()));
  NRV_Runtime_Loader::unloadLibraries();
}

TEST(WrapperChild, DISABLED_SecondWaits) {
  ASSERT_EQ(0, NRV_Runtime_Loader::loadLibraries());
  auto hold = stubFunction<void (*)(int)>("stub_hold_init");
  auto waitInInit = stubFunction<void (*)()>("stub_wait_in_init");
  auto initCalls = stubFunction<int (*)()>("stub_init_calls");
  ASSERT_TRUE(hold && waitInInit && initCalls);
  LogCapture log;
  hold(1);
  std::unique_ptr<NRV_MethodWrapper> first, second;
  std::thread a([&] { first = std::make_unique<NRV_MethodWrapper>(); });
  waitInInit();  // the first wrapper is inside LRM_InitLib
  std::thread b([&] { second = std::make_unique<NRV_MethodWrapper>(); });
  // Wait until the second wrapper has taken the semaphore's last unit and
  // blocks on it for the first one's signal.
  sem_t* sem = sem_open(NRV_MethodWrapper::initSemaphoreName().c_str(), 0);
  ASSERT_NE(SEM_FAILED, sem);
  for (int value = 1; value != 0; sched_yield()) sem_getvalue(sem, &value);
  sem_close(sem);
  hold(0);
  a.join();
  b.join();
  EXPECT_EQ(1, initCalls());
  EXPECT_EQ(1, log.count("Waiting on Completed Semaphore.. To issue RM Calls.."));
  EXPECT_EQ(1, log.count("Recieved signal on Completed Semaphore.. To issue RM Calls"));
  EXPECT_EQ(2, log.count("RM Library initialized"));
  second.reset();
  first.reset();
  NRV_Runtime_Loader::unloadLibraries();
}

TEST(WrapperChild, DISABLED_InitFails) {
  ASSERT_EQ(0, NRV_Runtime_Loader::loadLibraries());
  void* h = dlopen("liblrmapi.so", RTLD_NOW | RTLD_NOLOAD);
  ASSERT_NE(nullptr, h);
  auto* result = static_cast<RM_STATUS*>(dlsym(h, "g_stub_init_result"));
  ASSERT_NE(nullptr, result);
  *result = 4;
  LogCapture log;
  EXPECT_THROW(NRV_MethodWrapper wrapper, std::runtime_error);
  EXPECT_EQ(1, log.count("Error : Initialization of RMLib:: RM_InitLib failed with[4]", NRV_CRIT));
  EXPECT_FALSE(semaphoreExists(NRV_MethodWrapper::initSemaphoreName()));
  EXPECT_FALSE(semaphoreExists(NRV_MethodWrapper::doneSemaphoreName()));
  // A later attempt initialises afresh.
  *result = 0;
  { NRV_MethodWrapper wrapper; }
  dlclose(h);
  NRV_Runtime_Loader::unloadLibraries();
}

// An earlier process with this process's id died inside the initialisation
// (value 1) or while a second wrapper waited (value 0).
TEST(WrapperChild, DISABLED_StaleSemaphore) {
  ASSERT_EQ(0, NRV_Runtime_Loader::loadLibraries());
  auto initCalls = stubFunction<int (*)()>("stub_init_calls");
  ASSERT_NE(nullptr, initCalls);
  int expected_calls = 0;
  for (unsigned stale_value : {0u, 1u}) {
    SCOPED_TRACE(stale_value);
    sem_t* stale = sem_open(NRV_MethodWrapper::initSemaphoreName().c_str(), O_CREAT, 0644, stale_value);
    ASSERT_NE(SEM_FAILED, stale);
    sem_close(stale);
    LogCapture log;
    {
      nrv_test::Hang_Guard guard("a wrapper over a stale semaphore");
      NRV_MethodWrapper wrapper;
    }
    EXPECT_EQ(++expected_calls, initCalls());
    EXPECT_EQ(1, log.count("Removed stale semaphore " + NRV_MethodWrapper::initSemaphoreName(), NRV_WARN));
    EXPECT_TRUE(log.contains("RM Library initialized"));
    EXPECT_FALSE(semaphoreExists(NRV_MethodWrapper::initSemaphoreName()));
  }
  NRV_Runtime_Loader::unloadLibraries();
}

TEST(WrapperChild, DISABLED_AdapterTests) {
  ASSERT_EQ(0, NRV_Runtime_Loader::loadLibraries());
  NRV_MethodWrapper wrapper;
  LogCapture log;
  EXPECT_EQ(0, NRV_MethodWrapper::Validatewwpn(local()));
  HBA_NAME remote{};
  remote.wwn[0] = 0x10;
  EXPECT_EQ(1, NRV_MethodWrapper::Validatewwpn(remote));
  EXPECT_EQ(1, log.count("HBA IS NOT LOCAL", NRV_ERR));

  EXPECT_EQ(1, NRV_MethodWrapper::IsTarnelCNA(local()));
  EXPECT_EQ(0, NRV_MethodWrapper::IsTarnelCNA(remote));
  EXPECT_EQ(1, log.count("INVALID wwpn", NRV_ERR));

  // The stub offers 403 on every port: FCoE, asked first.
  bool nic = false, iscsi = true, fcoe = false, roce = true;
  EXPECT_EQ(0u, NRV_MethodWrapper::GetCNAType(local(), nic, iscsi, fcoe, roce));
  EXPECT_FALSE(nic);
  EXPECT_TRUE(fcoe);
  EXPECT_FALSE(iscsi);
  EXPECT_FALSE(roce);
  // A failing feature call stops the scan and reports its status.
  HBA_NAME failing = local();
  failing.wwn[6] = 0xEE;
  EXPECT_EQ(190u, NRV_MethodWrapper::GetCNAType(failing, nic, iscsi, fcoe, roce));
  EXPECT_FALSE(nic);
  EXPECT_EQ(1, log.count("RM_GetHBAFeature call failed with 190", NRV_ERR));

  log.reset();
  NRV_MethodWrapper::logStatus(12);
  NRV_MethodWrapper::logStatus(99);
  EXPECT_TRUE(log.contains("Status: <12>:stub status 12"));
  EXPECT_TRUE(log.contains("Status: <99>"));

  std::string version;
  EXPECT_EQ(0u, NRV_MethodWrapper::GetLibraryVersion(102, version));
  EXPECT_EQ("12.4.270.9", version);
  // Not in the stub: the forwarder's failure value comes back as the status.
  EXPECT_EQ(1u, NRV_MethodWrapper::nrvcimReset(local()));
  EXPECT_EQ(1u, NRV_MethodWrapper::nrvcimReset(remote));
  NRV_Runtime_Loader::unloadLibraries();
}
