// The on-demand refresh through the CIMOM stand-in: the site changes under a
// built catalogue (a link goes down, a card warms up, counters move) and the
// six refreshing classes show it on their next read, while a second read
// within the interval asks the library nothing.
#include <dlfcn.h>
#include <gtest/gtest.h>

#include <chrono>
#include <cstdlib>
#include <fstream>
#include <memory>
#include <string>
#include <thread>

#include <nlohmann/json.hpp>

#include "host/Host.h"

namespace {

using namespace nrv::host;

constexpr const char* kNs = "root/norvane";
constexpr const char* kNicPort = "0090FA5C2E100000";  // card 0, physical port 0
constexpr const char* kFCoEPort = "10000090FA5C2E12";  // the FCoE function on the same port

// The simulator's control entry points, from the copy the module loaded.
struct Sim_Control {
  Sim_Control() {
    void* lib = dlopen(NRV_SIM_CORE, RTLD_NOW);
    reload = reinterpret_cast<int (*)(const char*)>(dlsym(lib, "nrvsim_reload"));
    calls = reinterpret_cast<unsigned long long (*)(const char*)>(dlsym(lib, "nrvsim_call_count"));
  }
  int (*reload)(const char*) = nullptr;
  unsigned long long (*calls)(const char*) = nullptr;
};

std::string site_file() { return std::string(std::getenv("NRV_SYSROOT")) + "/site.json"; }

void write_site(const nlohmann::json& site) { std::ofstream(site_file()) << site.dump(2); }

nlohmann::json sample() { return nlohmann::json::parse(std::ifstream(NRV_SAMPLE_SITE)); }

const Datum* property(const HostInstance& instance, const char* name) { return findNamed(instance.properties, name); }
std::string text(const HostInstance& instance, const char* name) {
  const Datum* d = property(instance, name);
  return d && !d->isNull ? d->text : std::string();
}

class Refresh : public ::testing::Test {
 protected:
  void SetUp() override {
    write_site(sample());
    setenv("NRV_SITE", site_file().c_str(), 1);
    host_ = std::make_unique<Host>(Host::defaultModulePath(), Host::Options{std::nullopt});
    // A class that refreshes nothing builds the catalogue over the sample.
    ASSERT_TRUE(host_->enumerateInstances(kNs, "NRVTAVO_Chip").ok());
    ASSERT_TRUE(sim_.reload && sim_.calls);
  }
  void TearDown() override { host_.reset(); }

  // Rewrites the site: card 0's first port goes down (physical state 4),
  // the card reads 77 degrees, and the FCoE function counts 1000 bytes
  // received and a NOS count the library did not deliver.
  void change_site() {
    nlohmann::json site = sample();
    nlohmann::json& card = site["cards"][0];
    card["temperature"] = 77;
    card["ports"][0]["link_up"] = false;
    card["ports"][0]["link_down_reason"] = 5;
    for (nlohmann::json& fn : card["functions"]) {
      if (fn["port"] != 0) continue;
      if (fn["kind"] == "nic") fn["port_attributes"] = {{"802", 4}};
      if (fn["kind"] == "fcoe") fn["statistics"] = {{"1033", 1000}, {"1037", 4294967295ull}};
    }
    write_site(site);
    ASSERT_EQ(sim_.reload(nullptr), 1);
  }

  HostInstance find(const char* class_name, const char* key, const std::string& value) {
    Result r = host_->enumerateInstances(kNs, class_name);
    EXPECT_TRUE(r.ok()) << class_name << ": " << r.errorText();
    for (const HostInstance& i : r.instances)
      if (text(i, key).find(value) != std::string::npos) return i;
    ADD_FAILURE() << class_name << " without " << key << " " << value;
    return {};
  }

  Sim_Control sim_;
  std::unique_ptr<Host> host_;
};

TEST_F(Refresh, ALinkGoingDownShowsOnTheNextReadAndASecondReadAsksNothing) {
  change_site();
  const HostInstance port = find("NRVTAVO_EthernetPort", "DeviceID", kNicPort);
  ASSERT_NE(property(port, "EnabledState"), nullptr);
  EXPECT_EQ(property(port, "EnabledState")->scalar.uint16, 1);
  EXPECT_EQ(property(port, "Speed")->scalar.uint64, 0u);
  EXPECT_EQ(text(port, "FunctionalPortSpeed"), "Not Available");
  const unsigned long long reads = sim_.calls("RM_GetPortState");
  EXPECT_EQ(reads, 8u);  // one per Ethernet port
  std::this_thread::sleep_for(std::chrono::seconds(3));
  find("NRVTAVO_EthernetPort", "DeviceID", kNicPort);
  EXPECT_EQ(sim_.calls("RM_GetPortState"), reads);
}

TEST_F(Refresh, CardPortControllerAndFCPortFollowTheSite) {
  const HostInstance nic = find("NRVTAVO_EthernetPort", "DeviceID", kNicPort);
  const std::string port_key = property(nic, "OtherIdentifyingInfo")->array()->elements[1].text;
  change_site();
  const HostInstance card = find("NRVTAVO_Card", "SerialNumber", "NV52C4213A07719");
  EXPECT_EQ(property(card, "BoardTemperature")->scalar.sint32, 77);
  EXPECT_EQ(sim_.calls("RM_GetHBAAttributes"), 2u);  // one per card
  const HostInstance controller = find("NRVTAVO_PortController", "DeviceID", port_key);
  EXPECT_EQ(property(controller, "PhyLinkDownReason")->scalar.uint32, 5u);
  const HostInstance fc = find("NRVTAVO_FCPort", "DeviceID", kFCoEPort);
  EXPECT_EQ(property(fc, "Speed")->scalar.uint64, 0u);
  EXPECT_EQ(property(fc, "StatusDescriptions")->array()->elements[0].text, "Other");  // state 6, FCoE reading
}

TEST_F(Refresh, StatisticsCountBytesInWordsAndKeepUndeliveredCounters) {
  change_site();
  const HostInstance stats = find("NRVTAVO_FCPortStatistics", "InstanceID", kFCoEPort);
  ASSERT_NE(property(stats, "BytesReceived"), nullptr);
  EXPECT_EQ(property(stats, "BytesReceived")->scalar.uint64, 4000u);
  const Datum* nos = property(stats, "NOSCount");
  EXPECT_TRUE(nos == nullptr || nos->isNull);  // never read before: stays unset
  EXPECT_FALSE(property(stats, "StatisticTime")->isNull);
}

}  // namespace
