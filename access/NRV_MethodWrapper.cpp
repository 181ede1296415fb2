// Library initialisation under the process's named semaphores, and the
// wrapper operations that validate, call and log.
#include "access/NRV_MethodWrapper.h"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <mutex>
#include <stdexcept>

#include "access/NRV_WrapperCall.h"
#include "logging/Log.h"

namespace cimple {
namespace {

// Reading the semaphore's value and taking it must be one step, or two
// wrappers constructed at once could both see the initial value.
std::mutex g_initMutex;
// Wrappers of this process that hold the initialisation semaphore; guarded
// by g_initMutex.  While none does, a semaphore carrying this process's id
// was left by an earlier process that had the same id and died holding it:
// opened as it is, it would block every provider load for ever.
int g_liveWrappers = 0;

void removeStale(const std::string& name) {
  if (sem_unlink(name.c_str()) == 0) NRV_LOG(NRV_WARN, "Removed stale semaphore %s", name.c_str());
}

// The initialisation semaphore, made afresh unless a live wrapper of this
// process has it; SEM_FAILED when it can be neither made nor opened.
sem_t* openInitSemaphore(const std::string& name, const std::string& doneName) {
  if (g_liveWrappers == 0) {
    removeStale(name);
    removeStale(doneName);
  }
  sem_t* sem = sem_open(name.c_str(), O_CREAT | O_EXCL, 0644, 2);
  if (sem == SEM_FAILED && errno == EEXIST) sem = sem_open(name.c_str(), 0);
  return sem;
}

void waitOn(sem_t* sem) {
  while (sem_wait(sem) != 0 && errno == EINTR) {
  }
}

void closeAndUnlink(sem_t*& sem, const std::string& name) {
  if (sem == nullptr) return;
  sem_close(sem);
  sem_unlink(name.c_str());
  sem = nullptr;
}

}  // namespace

std::string NRV_MethodWrapper::initSemaphoreName() {
  return "/NRV_RM_INIT_LIB_" + std::to_string(getpid());
}

std::string NRV_MethodWrapper::doneSemaphoreName() {
  return "/NRV_RM_INIT_LIB_DONE_" + std::to_string(getpid());
}

NRV_MethodWrapper::NRV_MethodWrapper()
    : m_SemName(initSemaphoreName()), m_DoneSemName(doneSemaphoreName()) {
  NRV_LOG(NRV_DBG, "NRV_MethodWrapper::Constructor");
  NRV_LOG(NRV_DBG, "Setting Up for FIFO.. ");
  bool first = false;
  {
    std::lock_guard<std::mutex> lock(g_initMutex);
    sem_t* sem = openInitSemaphore(m_SemName, m_DoneSemName);
    if (sem == SEM_FAILED) {
      NRV_LOG(NRV_DBG, "RM Library initialized");
      return;
    }
    m_Sem = sem;
    ++g_liveWrappers;
    int value = 0;
    sem_getvalue(m_Sem, &value);
    first = value == 2;
    waitOn(m_Sem);
  }
  if (first) {
    NRV_LOG(NRV_DBG, "Aquired Semaphore.. Running RM_InitLib %s ", m_SemName.c_str());
    sem_t* done = sem_open(m_DoneSemName.c_str(), O_CREAT, 0644, 0);
    m_DoneSem = done == SEM_FAILED ? nullptr : done;
    NRV_LOG(NRV_DBG, "Aquired Completed Semaphore.. Running RM_InitLib %s", m_DoneSemName.c_str());
    const RM_STATUS status = LRM_InitLib();
    if (static_cast<int>(status) > 0) {
      NRV_LOG(NRV_CRIT, "Error : Initialization of RMLib:: RM_InitLib failed with[%d]",
              static_cast<int>(status));
      sem_post(m_Sem);
      releaseSemaphores();
      throw std::runtime_error("RM_InitLib failed");
    }
    NRV_LOG(NRV_DBG, "Signalling Completed Semaphore.. Running RM_InitLib");
    sem_post(m_Sem);
    NRV_LOG(NRV_DBG, "Signaled Completed Semaphore.. Running RM_InitLib");
  } else {
    NRV_LOG(NRV_DBG, "Waiting on Completed Semaphore.. To issue RM Calls..%s.. sem = %p",
            m_SemName.c_str(), static_cast<void*>(m_Sem));
    waitOn(m_Sem);
    NRV_LOG(NRV_DBG, "Recieved signal on Completed Semaphore.. To issue RM Calls");
  }
  NRV_LOG(NRV_DBG, "RM Library initialized");
}

NRV_MethodWrapper::~NRV_MethodWrapper() {
  NRV_LOG(NRV_DBG, "NRV_MethodWrapper::Destructor");
  if (m_Sem != nullptr) {
    sem_post(m_Sem);
    int value = 0;
    sem_getvalue(m_Sem, &value);
    NRV_LOG(NRV_DBG, "Value of Sem in destructor=%d", value);
  }
  releaseSemaphores();
  NRV_LOG(NRV_DBG, "RM Library uninitialzed");
}

void NRV_MethodWrapper::releaseSemaphores() {
  std::lock_guard<std::mutex> lock(g_initMutex);
  if (m_Sem != nullptr) --g_liveWrappers;
  closeAndUnlink(m_Sem, m_SemName);
  // The completion semaphore would otherwise outlive the process in /dev/shm.
  closeAndUnlink(m_DoneSem, m_DoneSemName);
}

// ---- Adapter tests ------------------------------------------------------------

int NRV_MethodWrapper::Validatewwpn(const HBA_NAME& name) {
  NRV_LOG(NRV_DBG, "Entering NRV_MethodWrapper::Validatewwpn()");
  HBA_UINT32 isLocal = 0;
  const RM_STATUS status = RM_IsLocalHBA(name, &isLocal);
  NRV_LOG(NRV_DBG, "RM_IsLocalHBA: status=%d", static_cast<int>(status));
  if (status == RM_STATUS_SUCCESS && isLocal != 0) return 0;
  NRV_LOG(NRV_ERR, "HBA IS NOT LOCAL");
  return 1;
}

RM_STATUS NRV_MethodWrapper::HasFeature(const HBA_NAME& name, HBA_UINT32 feature, bool& available) {
  HBA_UINT32 flag = 0;
  const RM_STATUS status = LRM_GetHBAFeature(name, feature, &flag);
  available = status == RM_STATUS_SUCCESS && flag == 1;
  return status;
}

int NRV_MethodWrapper::IsTarnelCNA(const HBA_NAME& name) {
  NRV_LOG(NRV_DBG, "NRV_MethodWrapper::IsTarnelCNA");
  if (Validatewwpn(name) != 0) {
    NRV_LOG(NRV_ERR, "INVALID wwpn");
    return 0;
  }
  bool tarnel = false;
  HasFeature(name, RM_FEATURE_TARNEL_CNA, tarnel);
  if (!tarnel) return 0;
  NRV_LOG(NRV_DBG, "Tarnel CNA Port ");
  return 1;
}

RM_STATUS NRV_MethodWrapper::GetCNAType(const HBA_NAME& name, bool& isNicOnly, bool& isISCSI,
                                        bool& isFCoE, bool& isRoCE) {
  NRV_LOG(NRV_DBG, "Entering the GetCNAType");
  isNicOnly = true;
  isISCSI = isFCoE = isRoCE = false;
  static const HBA_UINT32 kOrder[] = {RM_FEATURE_FCOE, RM_FEATURE_FCOE_ALT, RM_FEATURE_ISCSI,
                                      RM_FEATURE_ISCSI_ALT, RM_FEATURE_ROCE};
  RM_STATUS status = RM_STATUS_SUCCESS;
  for (HBA_UINT32 feature : kOrder) {
    bool has = false;
    status = HasFeature(name, feature, has);
    if (status != RM_STATUS_SUCCESS) {
      NRV_LOG(NRV_ERR, "RM_GetHBAFeature call failed with %d", static_cast<int>(status));
      isNicOnly = false;
      return status;
    }
    if (!has) continue;
    if (feature == RM_FEATURE_ISCSI || feature == RM_FEATURE_ISCSI_ALT) isISCSI = true;
    if (feature == RM_FEATURE_FCOE || feature == RM_FEATURE_FCOE_ALT) isFCoE = true;
    if (feature == RM_FEATURE_ROCE) isRoCE = true;
    isNicOnly = false;
    break;
  }
  NRV_LOG(NRV_DBG, "Exiting the GetCNAType");
  return status;
}

void NRV_MethodWrapper::logStatus(RM_STATUS status) {
  char text[RM_STATUS_STRING_SIZE] = {};
  RM_StatusString(status, text, sizeof text);
  text[sizeof text - 1] = '\0';
  if (text[0] != '\0')
    NRV_LOG(NRV_DBG, "Status: <%d>:%s", static_cast<int>(status), text);
  else
    NRV_LOG(NRV_DBG, "Status: <%d>", static_cast<int>(status));
}

// ---- Library information ----------------------------------------------------------

namespace {
RM_STATUS keepVersion(RM_STATUS status, const char* what, const char* text, std::string& version) {
  if (status != RM_STATUS_SUCCESS) {
    NRV_LOG(NRV_ERR, "%s failed with %d", what, static_cast<int>(status));
    NRV_MethodWrapper::logStatus(status);
    return status;
  }
  version = text;
  return status;
}
}  // namespace

RM_STATUS NRV_MethodWrapper::GetLibraryVersion(HBA_UINT32 library, std::string& version) {
  char text[256] = {};
  const RM_STATUS status = RM_GetVersion(library, text, sizeof text - 1);
  return keepVersion(status, "RM_GetVersion", text, version);
}

RM_STATUS NRV_MethodWrapper::GetTIROLibVersion(std::string& version) {
  char text[256] = {};
  const RM_STATUS status = RM_TiroVersion(text, sizeof text - 1);
  return keepVersion(status, "RM_TiroVersion", text, version);
}

RM_STATUS NRV_MethodWrapper::SetTIROTraceLevel(HBA_UINT32 mask, HBA_UINT32 level) {
  NRV_LOG(NRV_DBG, "Entering NRV_MethodWrapper::SetTIROTraceLevel");
  const RM_STATUS status = LRM_SetDebugTraces(mask, level);
  if (status != RM_STATUS_SUCCESS) logStatus(status);
  return status;
}

RM_STATUS NRV_MethodWrapper::getTargetOS_info(std::string& os) {
  NRV_LOG(NRV_DBG, "Entering NRV_MethodWrapper::getTargetOS_info");
  // The server's attributes belong to no adapter; the library takes the null name.
  const HBA_NAME server{};
  std::vector<uint8_t> record;
  const RM_STATUS status =
      wrapper::readSized(record, RM_SERVER_ATTRIBUTES_SIZE, [&](void* buffer, HBA_UINT32* size) {
        return LRM_GetServerAttributes(server, buffer, size);
      });
  if (status != RM_STATUS_SUCCESS) {
    logStatus(status);
    return status;
  }
  const size_t limit = std::min(record.size(), RM_TARGET_OS_TEXT_SIZE - 1);
  os = wrapper::fieldText(reinterpret_cast<const char*>(record.data()), limit);
  return status;
}

// ---- Helpers shared by the operations ------------------------------------------------

namespace wrapper {

bool offers(const HBA_NAME& name, HBA_UINT32 feature, const char* absentText) {
  bool available = false;
  const RM_STATUS status = NRV_MethodWrapper::HasFeature(name, feature, available);
  if (!available && absentText != nullptr)
    NRV_LOG(NRV_ERR, "%s: Return value: %d, Feature: %u", absentText, static_cast<int>(status),
            static_cast<unsigned>(feature));
  return available;
}

bool blobInteger(void* blob, HBA_UINT16 attribute, HBA_UINT32& value) {
  HBA_UINT16 length = 0;
  HBA_UINT32 status = 0;
  const void* p = RM_GetAttributeValue(blob, attribute, &length, &status);
  if (p == nullptr || status != RM_STATUS_SUCCESS || length < sizeof value) return false;
  std::memcpy(&value, p, sizeof value);
  return true;
}

bool blobText(void* blob, HBA_UINT16 attribute, std::string& value) {
  HBA_UINT16 length = 0;
  HBA_UINT32 status = 0;
  const void* p = RM_GetAttributeValue(blob, attribute, &length, &status);
  if (p == nullptr || status != RM_STATUS_SUCCESS) return false;
  value = fieldText(static_cast<const char*>(p), length);
  return true;
}

}  // namespace wrapper
}  // namespace cimple
