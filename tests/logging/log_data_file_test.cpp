// The logger's configuration data file: where it lives, what is written, how
// every malformed first line is reported, and the fault-data fallback.
#include <sys/stat.h>

#include <algorithm>
#include <filesystem>
#include <string>

#include <gtest/gtest.h>

#include "logging/CLogger.h"
#include "logging/NRV_CIMLogger.h"
#include "logging/NRV_FileLogger.h"
#include "LogTestSupport.h"
#include "tests/common/Special_Files.h"

namespace cimple {
namespace {

using test::CapturingSink;
using test::read_text;
using test::ScopedSysroot;
using test::split_lines;
using test::write_text;

// A logger as the agent sets it up (file sink, record sink) plus a capturing
// sink that collects the logger's own complaints.
struct Harness {
  Harness() {
    logger.registerSink(&file);
    logger.registerSink(&records);
    logger.registerSink(&capture);
  }
  CLogger logger;
  NRV_FileLogger file{logger};
  NRV_CIMLogger records{logger};
  CapturingSink capture;
};

class LogDataFileTest : public ::testing::Test {
 protected:
  ScopedSysroot root;
  const std::string dump = root.under("/etc/norvane_tavo_provider.dmp");
  const std::string trace = root.under("/var/log/provider-trace.log");
  Harness h;

  // Settings that a failed read must leave alone.
  void presetSettings() {
    h.logger.setMode(NRV_MODE_RECORDS);
    h.logger.setLevel(NRV_WARN);
    h.logger.enable();
  }
  void expectPresetSettings() {
    EXPECT_EQ(NRV_MODE_RECORDS, h.logger.getMode());
    EXPECT_EQ(NRV_WARN, h.logger.getLevel());
    EXPECT_TRUE(h.logger.isEnabled());
    EXPECT_FALSE(h.file.isOpen());
  }
  // The only message logged at `level`, or "" when there is not exactly one.
  std::string onlyMessageAt(int level) {
    std::vector<std::string> found;
    for (const auto& e : h.capture.entries())
      if (e.level == level) found.push_back(e.message);
    return found.size() == 1 ? found[0] : std::string();
  }
};

// --- location ------------------------------------------------------------

TEST_F(LogDataFileTest, LivesInEtcUnlessTheRootIsReadOnly) {
  EXPECT_EQ(dump, h.logger.dataFile().path());
  Harness read_only;
  int probes = 0;
  read_only.logger.dataFile().setReadOnlyRootProbe([&] {
    ++probes;
    return true;
  });
  EXPECT_EQ(root.under("/var/log/norvane_tavo_provider.dmp"), read_only.logger.dataFile().path());
  EXPECT_EQ(root.under("/var/log/norvane_tavo_provider.dmp"), read_only.logger.dataFile().path());
  EXPECT_EQ(1, probes);  // computed once, then kept

  read_only.logger.writeConfigDataFile();
  EXPECT_TRUE(std::filesystem::exists(root.under("/var/log/norvane_tavo_provider.dmp")));
  EXPECT_FALSE(std::filesystem::exists(dump));
}

TEST_F(LogDataFileTest, WriteFailureIsReported) {
  std::filesystem::remove_all(root.under("/etc"));
  h.logger.writeConfigDataFile();
  EXPECT_EQ("Unable to open dump file\n", onlyMessageAt(NRV_ERR));
}

// --- round trip ----------------------------------------------------------

TEST_F(LogDataFileTest, WritesSettingsThenTracePath) {
  ASSERT_EQ(0, h.logger.setTracePath(trace));
  h.logger.setMode(NRV_MODE_FILE);
  h.logger.setLevel(NRV_DBG);
  h.logger.enable();
  h.logger.writeConfigDataFile();
  EXPECT_EQ("2,5,1\n" + trace, read_text(dump));

  h.logger.disable();
  h.logger.setMode(NRV_MODE_OFF);  // closes the file and forgets its path
  h.logger.writeConfigDataFile();
  EXPECT_EQ("0,5,0\n", read_text(dump));
}

TEST_F(LogDataFileTest, EveryModeSurvivesWriteAndRead) {
  for (int32_t mode = 0; mode <= kNrvMaxLogMode; ++mode) {
    SCOPED_TRACE(mode);
    Harness writer;
    ASSERT_EQ(0, writer.logger.setTracePath(trace));
    writer.logger.setMode(mode);
    writer.logger.setLevel(1 + mode);
    if (mode % 2 == 0) writer.logger.enable();
    writer.logger.writeConfigDataFile();

    Harness reader;
    if (mode % 2 != 0) reader.logger.enable();  // a 0 in the file switches it off
    reader.logger.readConfigDataFile();
    EXPECT_EQ(mode, reader.logger.getMode());
    EXPECT_EQ(1 + mode, reader.logger.getLevel());
    EXPECT_EQ(mode % 2 == 0, reader.logger.isEnabled());
    EXPECT_EQ(nrv_mode_writes_file(mode) ? trace : std::string(), reader.logger.tracePath());
    EXPECT_TRUE(reader.capture.entries().empty());
  }
}

TEST_F(LogDataFileTest, FileModeAppendsOneFormattedLinePerMessage) {
  write_text(dump, "2,5,1\n" + trace + "\n");
  h.logger.readConfigDataFile();
  EXPECT_EQ(NRV_MODE_FILE, h.logger.getMode());
  EXPECT_EQ(NRV_DBG, h.logger.getLevel());
  EXPECT_TRUE(h.logger.isEnabled());
  EXPECT_EQ(trace, h.logger.tracePath());

  h.logger.log("a.cpp", nullptr, NRV_DBG, "first");
  h.logger.log("b.cpp", nullptr, NRV_WARN, "second");
  const auto lines = split_lines(read_text(trace));
  ASSERT_EQ(2u, lines.size());
  EXPECT_NE(std::string::npos, lines[0].find("] [a.cpp:0][NRV_DBG] first"));
  EXPECT_NE(std::string::npos, lines[1].find("] [b.cpp:0][NRV_WARN] second"));
}

TEST_F(LogDataFileTest, RecordModeOpensNoFile) {
  write_text(dump, "1,3,1\n" + trace + "\n");
  h.logger.readConfigDataFile();
  EXPECT_EQ(NRV_MODE_RECORDS, h.logger.getMode());
  EXPECT_EQ(NRV_ERR, h.logger.getLevel());
  EXPECT_FALSE(h.file.isOpen());
  EXPECT_FALSE(std::filesystem::exists(trace));

  h.logger.log("c.cpp", nullptr, NRV_ERR, "recorded");
  h.logger.log("c.cpp", nullptr, NRV_INFO, "not recorded");
  const auto ring = h.records.records();
  ASSERT_EQ(1u, ring.size());
  EXPECT_STREQ("[recorded]", ring[0].message);
}

TEST_F(LogDataFileTest, CarriageReturnsAndLongFirstLinesAreTolerated) {
  write_text(dump, "4,2,1\r\n" + trace + "\r\n");
  h.logger.readConfigDataFile();
  EXPECT_EQ(NRV_MODE_FILE_RECORDS, h.logger.getMode());
  EXPECT_EQ(trace, h.logger.tracePath());

  // Only 19 characters of the first line are read; the rest of it must not
  // be taken for the trace path.
  Harness other;
  write_text(dump, "2,4,1,,,,,,,,,,,,,,,,,,,,,,,,,\n" + trace);
  other.logger.readConfigDataFile();
  EXPECT_EQ(NRV_MODE_FILE, other.logger.getMode());
  EXPECT_EQ(trace, other.logger.tracePath());
}

// --- malformed files -----------------------------------------------------

TEST_F(LogDataFileTest, EachBadFirstLineHasItsOwnMessage) {
  struct Case {
    const char* content;
    std::string message;
  };
  const Case cases[] = {
      {"7,1,1\n", "Invalid value for Log Mode from config data file -" + dump + "-7"},
      {"-1,1,1\n", "Invalid value for Log Mode from config data file -" + dump + "-4294967295"},
      {",1,1\n", "Unable to read Log Mode from config data file - " + dump},
      {"\n", "Unable to read Log Mode from config data file - " + dump},
      {"1\n", "Unable to read Log Level from config data file - " + dump},
      {"1,x,1\n", "Unable to read Log Level from config data file - " + dump},
      {"1,6,1\n", "Invalid value for Log Level from config data file -" + dump + "-6"},
      {"1,-2,1\n", "Invalid value for Log Level from config data file -" + dump + "-4294967294"},
      {"1,2\n", "Unable to read Log Enabled from config data file - " + dump},
      {"1,2,-1\n", "Invalid value for Log Enabled from config data file - " + dump},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.content);
    Harness fresh;
    write_text(dump, c.content);
    fresh.logger.setMode(NRV_MODE_RECORDS);
    fresh.logger.setLevel(NRV_WARN);
    fresh.logger.enable();
    fresh.logger.readConfigDataFile();
    const auto entries = fresh.capture.entries();
    ASSERT_EQ(1u, entries.size());
    EXPECT_EQ(NRV_ERR, entries[0].level);
    EXPECT_EQ(c.message, entries[0].message);
    EXPECT_EQ(NRV_MODE_RECORDS, fresh.logger.getMode());
    EXPECT_EQ(NRV_WARN, fresh.logger.getLevel());
    EXPECT_TRUE(fresh.logger.isEnabled());
  }
}

TEST_F(LogDataFileTest, FileModeWithoutAUsablePathChangesNothing) {
  presetSettings();
  write_text(dump, "2,5,0\n");
  h.logger.readConfigDataFile();
  expectPresetSettings();

  write_text(dump, "2,5,0\n" + root.under("/no/such/dir/trace.log") + "\n");
  h.logger.readConfigDataFile();
  expectPresetSettings();
  EXPECT_TRUE(h.capture.entries().empty());
}

TEST_F(LogDataFileTest, EmptyFileChangesNothingSilently) {
  presetSettings();
  write_text(dump, "");
  h.logger.readConfigDataFile();
  expectPresetSettings();
  EXPECT_TRUE(h.capture.entries().empty());
}

TEST_F(LogDataFileTest, MissingFileIsReportedTwice) {
  presetSettings();
  h.logger.readConfigDataFile();
  expectPresetSettings();
  EXPECT_EQ("File access failed with No such file or directory", onlyMessageAt(NRV_CRIT));
  EXPECT_EQ("Unable to open config data file - " + dump, onlyMessageAt(NRV_ERR));
  EXPECT_FALSE(h.logger.checkDumpFileAccess());
}

TEST_F(LogDataFileTest, ASpecialFileAtThePathIsRefusedWithoutBlockingAndLeftAlone) {
  for (const nrv_test::Special_Case& c : nrv_test::kSpecialFiles) {
    SCOPED_TRACE(c.name);
    Harness fresh;
    ASSERT_TRUE(nrv_test::make_special(dump, c.kind));
    fresh.logger.setMode(NRV_MODE_RECORDS);
    fresh.logger.setLevel(NRV_WARN);
    {
      nrv_test::Hang_Guard guard(std::string("reading a data file that is a ") + c.name);
      fresh.logger.readConfigDataFile();
      EXPECT_TRUE(fresh.logger.dataFile().writeUnlessRejected());  // the save at unload
      EXPECT_FALSE(fresh.logger.writeConfigDataFile());           // an explicit save
    }
    const auto messages = fresh.capture.messages();
    EXPECT_EQ(1, std::count(messages.begin(), messages.end(), "Unable to open config data file - " + dump));
    EXPECT_TRUE(fresh.logger.dataFile().rejected());
    EXPECT_EQ(NRV_MODE_RECORDS, fresh.logger.getMode());
    EXPECT_EQ(NRV_WARN, fresh.logger.getLevel());
    EXPECT_TRUE(nrv_test::is_special(dump, c.kind));
  }
  std::filesystem::remove_all(dump);
}

TEST_F(LogDataFileTest, ARefusedFileIsLeftAsItWasByTheSaveAtUnload) {
  // Cut to the buffer, this path would name a file of its own.
  const std::string dir = root.under("/var/log/");
  const std::string long_trace = dir + std::string(300 - dir.size(), 'x');
  struct Case {
    std::string content;
    std::string message;  // the complaint at NRV_ERR, if any
  };
  const Case cases[] = {
      {"7,1,1\n" + trace, "Invalid value for Log Mode from config data file -" + dump + "-7"},
      {"1,x,1\n", "Unable to read Log Level from config data file - " + dump},
      {"2,5,1\n", ""},
      {"2,5,1\n" + long_trace + "\n", "Trace path too long in config data file - " + dump},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.content);
    Harness fresh;
    write_text(dump, c.content);
    fresh.logger.readConfigDataFile();
    EXPECT_TRUE(fresh.logger.dataFile().rejected());
    EXPECT_TRUE(fresh.logger.dataFile().writeUnlessRejected());
    EXPECT_EQ(c.content, read_text(dump));
    std::vector<std::string> errors;
    for (const auto& e : fresh.capture.entries())
      if (e.level == NRV_ERR) errors.push_back(e.message);
    EXPECT_EQ(c.message.empty() ? std::vector<std::string>{} : std::vector<std::string>{c.message}, errors);
  }
  EXPECT_FALSE(std::filesystem::exists(long_trace.substr(0, kNrvTracePathMax)));

  // An explicit save replaces a refused file, and the save at unload follows it.
  write_text(dump, "7,1,1\n");
  h.logger.readConfigDataFile();
  h.logger.setMode(NRV_MODE_RECORDS);
  EXPECT_TRUE(h.logger.writeConfigDataFile());
  EXPECT_FALSE(h.logger.dataFile().rejected());
  EXPECT_EQ("1,0,0\n", read_text(dump));
}

TEST_F(LogDataFileTest, ATracePathLongerThanTheFileCarriesIsRefused) {
  const std::string dir = root.under("/var/log/");
  const std::string fits = dir + std::string(kNrvTracePathMax - dir.size(), 'f');
  const std::string too_long = fits + "g";
  EXPECT_EQ(-1, h.logger.setTracePath(too_long));
  EXPECT_FALSE(std::filesystem::exists(too_long));
  EXPECT_EQ(0, h.logger.setTracePath(fits));
  EXPECT_EQ(fits, h.logger.tracePath());
}

TEST_F(LogDataFileTest, AnUnchangedFileIsNotRewritten) {
  write_text(dump, "1,3,1\n");
  h.logger.readConfigDataFile();
  struct stat before {};
  ASSERT_EQ(0, ::stat(dump.c_str(), &before));
  EXPECT_TRUE(h.logger.writeConfigDataFile());
  struct stat after {};
  ASSERT_EQ(0, ::stat(dump.c_str(), &after));
  EXPECT_EQ(before.st_ino, after.st_ino);
  EXPECT_EQ("1,3,1\n", read_text(dump));
}

// --- fault-data fallback -------------------------------------------------

TEST_F(LogDataFileTest, MissingFileFallsBackToErrorsOnlyFaultDataFile) {
  const std::string fault = root.under("/opt/kelvar/platform/log/norvane_tavo_provider_ffdc.log");
  EXPECT_EQ(fault, nrv_fault_data_file());
  EXPECT_TRUE(h.logger.dataFile().applyDefaultIfMissing());
  const std::vector<std::string> expected = {
      "File access failed with No such file or directory",
      " Please see the default log: " + fault};
  EXPECT_EQ(expected, h.capture.messages());
  EXPECT_TRUE(h.logger.isErrorsOnly());
  EXPECT_TRUE(h.logger.isEnabled());
  EXPECT_EQ(NRV_MODE_FILE, h.logger.getMode());
  EXPECT_EQ(0, h.capture.starts());  // the mode is set without telling the sinks
  EXPECT_EQ(fault, h.logger.tracePath());

  h.logger.log("d.cpp", nullptr, NRV_WARN, "dropped");
  h.logger.log("d.cpp", nullptr, NRV_ERR, "kept");
  const auto lines = split_lines(read_text(fault));
  ASSERT_EQ(1u, lines.size());
  EXPECT_NE(std::string::npos, lines[0].find("[NRV_ERR] kept"));
}

TEST_F(LogDataFileTest, UnopenableFaultDataFileIsReported) {
  std::filesystem::remove_all(root.under("/opt"));
  EXPECT_TRUE(h.logger.dataFile().applyDefaultIfMissing());
  EXPECT_EQ("validateAndSetPath() failed", onlyMessageAt(NRV_ERR));
  EXPECT_FALSE(h.file.isOpen());
}

TEST_F(LogDataFileTest, ReadableFileKeepsTheConfiguredLogging) {
  write_text(dump, "1,3,1\n");
  EXPECT_FALSE(h.logger.dataFile().applyDefaultIfMissing());
  EXPECT_EQ(" Continuing logs in Norvane log provider. ", onlyMessageAt(NRV_CRIT));
  EXPECT_FALSE(h.logger.isErrorsOnly());
  EXPECT_FALSE(h.file.isOpen());
}

}  // namespace
}  // namespace cimple
