#include "san_test_support.h"

#include <cstdlib>
#include <fstream>

#include "derivedObjects/Catalogue_Provider.h"
#include "schema/Classes.h"

namespace nrv_test {

using namespace cimple;

nlohmann::json sample_site() {
  std::ifstream in(std::getenv("NRV_SITE"));
  return nlohmann::json::parse(in);
}

int run_over_site(const nlohmann::json& site, const std::string& child, const std::vector<std::string>& env) {
  const std::string path = sysroot() + "/site-" + child.substr(child.rfind('.') + 1) + ".json";
  write_file(path, site.dump(1));
  // The child inherits this process's environment, so the site is swapped
  // there for the child's start.
  const std::string sample = std::getenv("NRV_SITE");
  setenv("NRV_SITE", path.c_str(), 1);
  const char* libraries = std::getenv("LD_LIBRARY_PATH");
  const int status = run_in_child(child, libraries ? libraries : "", env);
  setenv("NRV_SITE", sample.c_str(), 1);
  return status;
}

std::unique_ptr<ProviderSlot> load_san_catalogue() {
  ProviderAgent::useBuilders(ProviderAgent::defaultBuilders());
  auto slot = make_slot<Catalogue_Provider<NRVTAVO_StorageVolume>, NRVTAVO_StorageVolume>();
  if (slot->load() != LOAD_OK) return nullptr;
  Collected first;
  slot->enumerate(first);
  wait_fetch_idle(*ProviderAgent::peekInstance());
  return slot;
}

void rebuild_san(ProviderAgent& agent) {
  agent.m_bBuildSANData = true;
  agent.BuildCimpleInfo();
  wait_fetch_idle(agent);
}

}  // namespace nrv_test
