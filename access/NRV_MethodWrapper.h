// The one object through which the module calls the management library:
// constructing it initialises the library once per process; its static
// operations validate a port name, call the library and log the outcome.
//
// Contract: the provider agent owns the single instance and constructs it
// before any other management call; construction throws std::runtime_error
// when LRM_InitLib fails.  The static operations keep no state of their own
// and may run on any thread.  The runtime loader must have been started.
#pragma once

#include <semaphore.h>

#include <string>

#include "access/NRV_Common.h"
#include "access/RM_Api.h"

namespace cimple {

class NRV_MethodWrapper {
 public:
  NRV_MethodWrapper();
  ~NRV_MethodWrapper();
  NRV_MethodWrapper(const NRV_MethodWrapper&) = delete;
  NRV_MethodWrapper& operator=(const NRV_MethodWrapper&) = delete;

  // Names of the process's initialisation semaphores.
  static std::string initSemaphoreName();
  static std::string doneSemaphoreName();

  // ---- Adapter tests ----
  // 0 when the library answers that `name` is a local adapter, else 1.
  static int Validatewwpn(const HBA_NAME& name);
  // 1 for a Tarnel-family adapter (feature 201), else 0.
  static int IsTarnelCNA(const HBA_NAME& name);
  // Fills the personality flags from features 403, 412, 401, 413, 439.
  static RM_STATUS GetCNAType(const HBA_NAME& name, bool& isNicOnly, bool& isISCSI, bool& isFCoE,
                              bool& isRoCE);
  // 0 with `available` set from LRM_GetHBAFeature; the library status otherwise.
  static RM_STATUS HasFeature(const HBA_NAME& name, HBA_UINT32 feature, bool& available);

  // Logs the library's text for `status` ("Status: <%d>:%s").
  static void logStatus(RM_STATUS status);

  // ---- Library information ----
  static RM_STATUS GetLibraryVersion(std::string& version);
  static RM_STATUS GetTIROLibVersion(std::string& version);
  static RM_STATUS SetTIROTraceLevel(HBA_UINT32 mask, HBA_UINT32 level);

  // ---- Simple adapter operations (validated, logged) ----
  static RM_STATUS nrvcimReset(const HBA_NAME& name);
  static RM_STATUS nrvcimGetRetentionCount(const HBA_NAME& name, HBA_UINT32& count);
  static RM_STATUS SetRetentionCount(const HBA_NAME& name, HBA_UINT32 count);
  static RM_STATUS nrvcimDeleteDumpFiles(const HBA_NAME& name);
  static RM_STATUS nrvcimGetDumpDirectory(const HBA_NAME& name, std::string& directory);
  static RM_STATUS SetPortEnabled(const HBA_NAME& name, HBA_UINT32 enabled, HBA_UINT8& configStatus);
  static RM_STATUS SetCableNVP(const HBA_NAME& name, HBA_UINT32 nvp);
  static RM_STATUS SetiSCSIBoot(const HBA_NAME& name, HBA_UINT32 enabled);

 private:
  sem_t* m_Sem = nullptr;       // "/NRV_RM_INIT_LIB_<pid>", held while alive
  sem_t* m_DoneSem = nullptr;   // "/NRV_RM_INIT_LIB_DONE_<pid>", first initialiser only
  std::string m_SemName;
  std::string m_DoneSemName;
};

}  // namespace cimple
