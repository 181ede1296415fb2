#include "agent/Catalogue_RecordLogs.h"

#include "agent/Association_Builder.h"
#include "agent/Catalogue_Profiles.h"
#include "agent/ProviderAgent.h"
#include "logging/CLogger.h"
#include "schema/Classes.h"

namespace cimple {

namespace {

NRVTAVO_RecordLog* provider_log(const std::string& host) {
  const CLogger& logger = CLogger::instance();
  auto* log = NRVTAVO_RecordLog::create(true);
  log->InstanceID.set("NRVTAVO:ProviderLog:" + host);
  log->Name.set("Record logs for Norvane CIM Provider");
  log->ElementName.set("Record logs for Norvane CIM Provider");
  const bool enabled = logger.isEnabled();
  log->EnabledState.set(enabled ? 2 : 3);
  log->RequestedState.set(enabled ? 2 : 5);
  log->CurrentNumberOfRecords.set(0);
  log->OperationalStatus.set({2});
  log->HealthState.set(5);
  log->LogLevel.set(static_cast<uint16>(logger.getLevel()));
  log->LogMode.set(static_cast<uint16>(logger.getMode()));
  log->TracePath.set(logger.tracePath());
  return log;
}

NRVTAVO_RecordLog* library_log(const std::string& host) {
  auto* log = NRVTAVO_RecordLog::create(true);
  log->InstanceID.set("NRV:TAVO TIRO Record Log:" + host);
  log->Name.set("TIRO logs for Norvane CIM Provider");
  log->ElementName.set("TIRO logs for Norvane CIM Provider");
  log->OperationalStatus.set({2});
  log->TracePath.set("/tmp/tiro2d.log");
  return log;
}

std::string instance_id(const Instance* log) { return static_cast<const NRVTAVO_RecordLog*>(log)->InstanceID.value.str(); }

}  // namespace

bool create_record_logs(Catalogue_Build& build) {
  ProviderAgent& agent = build.agent;
  Instance* logs[2] = {insert_instance(agent, provider_log(agent.m_HostName),
                                       "Insert Failed : m_NRVTAVO_NRVTAVO_RecordLog_map"),
                       insert_instance(agent, library_log(agent.m_HostName))};
  if (logs[0] == nullptr) {
    NRV_LOG(NRV_CRIT, "Failed to allocate memory to create NRVTAVO_RecordLog");
    return false;
  }
  Instance* profile = register_host_profile(build, Profile::kRecordLog);
  if (find_profile(agent, Profile::kProfileRegistration) == nullptr) {
    NRV_LOG(NRV_CRIT, "Missing Profile Registration Profile instance");
    return false;
  }
  auto* capabilities = NRVTAVO_EnabledRecordLogCapabilities::create(true);
  capabilities->InstanceID.set("NRVTAVO provider log capabilities");
  capabilities->RequestedStatesSupported.set({2, 3});
  capabilities->LogParamsSupported.set({2, 3});
  Instance* caps = insert_instance(agent, capabilities);
  if (build.provider_identity == nullptr) {
    NRV_LOG(NRV_CRIT, "Missing Provider Software Identity");
    return false;
  }
  for (Instance* log : logs) {
    if (log == nullptr) continue;
    const std::string id = instance_id(log);
    associate<NRVTAVO_RecordLogConformsToProfile>(build, format_text("%s conformant to %s profile", id.c_str(),
                                                                     profile_row(Profile::kRecordLog).name),
                                                  profile, log);
    associate<NRVTAVO_RecordLogCapabilities>(build, id + " : Logging capabilities", log, caps);
    associate<NRVTAVO_ProviderUseOfLog>(build, format_text("%s uses log : %s", "Norvane CMPI TAVO Provider",
                                                           id.c_str()),
                                        log, build.provider_identity);
  }
  return true;
}

}  // namespace cimple
