#include "DataTestSupport.h"

#include <stdlib.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cctype>
#include <fstream>
#include <sstream>

#include "logging/CLogger.h"

namespace nrv_data_test {

using nlohmann::json;

std::string plainHex(const std::string& text) {
  std::string out;
  for (char c : text)
    if (std::isxdigit(static_cast<unsigned char>(c)))
      out += static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
  return out;
}

std::string trimmed(const std::string& text) {
  const size_t end = text.find_last_not_of(' ');
  return end == std::string::npos ? std::string() : text.substr(0, end + 1);
}

json readSite(const std::string& path) {
  std::ifstream in(path);
  return json::parse(in);
}

std::string environmentSite() {
  const char* site = getenv("NRV_SITE");
  return site != nullptr ? site : "";
}

std::vector<Function> functionsOf(const json& site) {
  std::vector<Function> out;
  for (const json& card : site.at("cards")) {
    for (const json& f : card.at("functions")) {
      Function fn;
      fn.kind = f.at("kind").get<std::string>();
      fn.model = card.at("model").get<std::string>();
      fn.serial = card.at("serial").get<std::string>();
      fn.manufacturer = card.value("manufacturer", "Norvane");
      fn.pciFunction = f.value("pci_function", 0u);
      fn.index = static_cast<uint32_t>(out.size());
      fn.mac = f.at("mac").get<std::string>();
      // The simulator names FCoE functions by their WWPN, the others by an
      // explicit identifier or their MAC followed by two zero bytes.
      if (fn.kind == "fcoe") {
        fn.identifier = plainHex(f.at("wwpn").get<std::string>());
        fn.wwnn = plainHex(f.value("wwnn", f.at("wwpn").get<std::string>()));
      } else {
        fn.identifier = f.contains("identifier") ? plainHex(f.at("identifier").get<std::string>())
                                                 : plainHex(fn.mac) + "0000";
      }
      fn.ifname = f.value("ifname", "");
      fn.ipv4 = f.value("ipv4", "");
      if (f.contains("driver")) {
        fn.driverName = f.at("driver").value("name", "");
        fn.driverVersion = f.at("driver").value("version", "");
      }
      if (f.contains("initiator")) fn.initiatorName = f.at("initiator").at("name").get<std::string>();
      if (f.contains("targets")) {
        for (const json& t : f.at("targets")) {
          uint32_t next = 0;
          for (const json& u : t.value("luns", json::array())) {
            Lun lun;
            lun.targetWwpn = plainHex(t.at("wwpn").get<std::string>());
            lun.targetWwnn = plainHex(t.value("wwnn", t.at("wwpn").get<std::string>()));
            lun.lun = u.value("lun", next);
            next = lun.lun + 1;
            lun.type = u.value("type", 0u);
            lun.vendor = u.value("vendor", "NORVANE");
            lun.product = u.value("product", "SIM DISK");
            lun.revision = u.value("revision", "0001");
            lun.serial = u.value("serial", "");
            lun.blocks = u.value("blocks", lun.type == 0 ? uint64_t{2097152} : uint64_t{0});
            lun.blockSize = u.value("block_size", 512u);
            fn.luns.push_back(lun);
          }
        }
      }
      out.push_back(fn);
    }
  }
  return out;
}

std::string writeSite(const json& site) {
  std::string dir = "/tmp";
  if (const char* build = getenv("NRV_BUILD_DIR"); build != nullptr && *build != '\0')
    dir = build;
  std::string pattern = dir + "/nrv-data-site-XXXXXX";
  const int fd = mkstemp(pattern.data());
  if (fd < 0) return std::string();
  close(fd);
  std::ofstream(pattern) << site.dump(1);
  return pattern;
}

void addFault(json& site, json rule) {
  if (!site.contains("faults")) site["faults"] = json::array();
  site["faults"].push_back(std::move(rule));
}

std::string simulatorDir(const std::string& name) {
  const char* build = getenv("NRV_BUILD_DIR");
  return std::string(build != nullptr ? build : ".") + "/lib/" + name;
}

int runInChild(const std::string& test, const std::string& site, const std::string& libraryPath) {
  char self[4096];
  const ssize_t n = readlink("/proc/self/exe", self, sizeof self - 1);
  if (n <= 0) return -1;
  self[n] = '\0';
  const std::string filter = "--gtest_filter=" + test;
  const pid_t pid = fork();
  if (pid < 0) return -1;
  if (pid == 0) {
    setenv("NRV_SITE", site.c_str(), 1);
    if (!libraryPath.empty()) setenv("LD_LIBRARY_PATH", libraryPath.c_str(), 1);
    execl(self, self, filter.c_str(), "--gtest_also_run_disabled_tests", static_cast<char*>(nullptr));
    _exit(127);
  }
  int status = 0;
  if (waitpid(pid, &status, 0) != pid) return -1;
  return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

LogCapture::LogCapture() {
  cimple::CLogger::instance().enable();
  cimple::CLogger::instance().registerSink(this);
}

LogCapture::~LogCapture() { cimple::CLogger::instance().unregisterSink(this); }

void LogCapture::log(int level, const char* file, unsigned, const char* message) {
  std::lock_guard<std::mutex> lock(m_Mutex);
  m_Entries.push_back({level, file ? file : "", message ? message : ""});
}

int LogCapture::count(const std::string& text, int level) const {
  std::lock_guard<std::mutex> lock(m_Mutex);
  return static_cast<int>(std::count_if(m_Entries.begin(), m_Entries.end(), [&](const Entry& e) {
    return e.message == text && (level < 0 || e.level == level);
  }));
}

int LogCapture::countPrefix(const std::string& prefix, int level) const {
  std::lock_guard<std::mutex> lock(m_Mutex);
  return static_cast<int>(std::count_if(m_Entries.begin(), m_Entries.end(), [&](const Entry& e) {
    return e.message.rfind(prefix, 0) == 0 && (level < 0 || e.level == level);
  }));
}

std::string LogCapture::fileOf(const std::string& text) const {
  std::lock_guard<std::mutex> lock(m_Mutex);
  for (const Entry& e : m_Entries)
    if (e.message == text) return e.file;
  return std::string();
}

}  // namespace nrv_data_test
