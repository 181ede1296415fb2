// The logger itself and its three sinks: registration, mode and level
// handling, the trace-file line, the record ring and the syslog table.
#include <sys/stat.h>
#include <syslog.h>
#include <unistd.h>

#include <cstring>
#include <filesystem>
#include <regex>
#include <string>

#include <gtest/gtest.h>

#include "logging/CLogger.h"
#include "logging/NRV_CIMLogger.h"
#include "logging/NRV_FileLogger.h"
#include "logging/NRV_SysLogger.h"
#include "LogTestSupport.h"

namespace cimple {
namespace {

using test::CapturingSink;
using test::read_text;
using test::ScopedSysroot;
using test::split_lines;

// A private logger with the three real sinks registered in the agent's order
// (file, record log) plus a capturing one, and a trace file in a scratch root.
class LoggerTest : public ::testing::Test {
 protected:
  void SetUp() override {
    ASSERT_EQ(1, logger.registerSink(&file));
    ASSERT_EQ(1, logger.registerSink(&records));
    ASSERT_EQ(1, logger.registerSink(&capture));
    logger.enable();
  }

  void log(int level, const char* text) {
    static const int line = 7;
    logger.log("source.cpp", &line, level, "%s", text);
  }

  ScopedSysroot root;
  const std::string trace = root.under("/var/log/trace.log");
  CLogger logger;
  NRV_FileLogger file{logger};
  NRV_CIMLogger records{logger};
  CapturingSink capture;
};

// --- registration and the log call -------------------------------------

TEST_F(LoggerTest, RegisteringTwiceKeepsOneEntry) {
  EXPECT_EQ(0, logger.registerSink(&file));
  EXPECT_EQ(3u, logger.sinkCount());
  EXPECT_EQ(0, logger.registerSink(nullptr));

  EXPECT_EQ(1, logger.unregisterSink(&capture));
  EXPECT_EQ(0, logger.unregisterSink(&capture));
  EXPECT_EQ(2u, logger.sinkCount());
  logger.unregisterAll();
  EXPECT_EQ(0u, logger.sinkCount());
}

TEST_F(LoggerTest, FormatsTextOfAnyLengthWithFileAndLine) {
  const std::string big(5000, 'q');
  static const int line = 1234;
  logger.log("unit.cpp", &line, NRV_INFO, "%s-%d-%s", "a", 42, big.c_str());
  logger.log("unit.cpp", nullptr, NRV_DBG, "no line");

  const auto entries = capture.entries();
  ASSERT_EQ(2u, entries.size());
  EXPECT_EQ(NRV_INFO, entries[0].level);
  EXPECT_EQ("unit.cpp", entries[0].file);
  EXPECT_EQ(1234u, entries[0].line);
  EXPECT_EQ("a-42-" + big, entries[0].message);
  EXPECT_EQ(0u, entries[1].line);
}

TEST_F(LoggerTest, ModuleLogCallUsesBaseNameAndCallLine) {
  CLogger& shared = CLogger::instance();
  CapturingSink sink;
  ASSERT_EQ(1, shared.registerSink(&sink));
  const unsigned expected_line = __LINE__ + 1;
  NRV_LOG(NRV_ERR, "value %d", 9);
  shared.unregisterSink(&sink);

  const auto entries = sink.entries();
  ASSERT_EQ(1u, entries.size());
  EXPECT_EQ("logger_test.cpp", entries[0].file);
  EXPECT_EQ(expected_line, entries[0].line);
  EXPECT_EQ(NRV_ERR, entries[0].level);
  EXPECT_EQ("value 9", entries[0].message);
}

TEST_F(LoggerTest, ModeChangesStartOrStopEverySink) {
  logger.setMode(NRV_MODE_FILE);
  logger.setMode(NRV_MODE_RECORDS);
  EXPECT_EQ(2, capture.starts());
  EXPECT_EQ(0, capture.stops());
  logger.setMode(NRV_MODE_OFF);
  EXPECT_EQ(1, capture.stops());
  EXPECT_EQ(NRV_MODE_OFF, logger.getMode());

  logger.setModeQuietly(NRV_MODE_FILE);
  EXPECT_EQ(NRV_MODE_FILE, logger.getMode());
  EXPECT_EQ(2, capture.starts());
}

TEST_F(LoggerTest, LevelChangesOnlyWithinOneToFive) {
  for (int rejected : {0, 6, -1, 100}) {
    logger.setLevel(rejected);
    EXPECT_EQ(0, logger.getLevel()) << rejected;
  }
  logger.setLevel(NRV_ERR);
  EXPECT_EQ(NRV_ERR, logger.getLevel());
  logger.setLevel(0);
  EXPECT_EQ(NRV_ERR, logger.getLevel());
}

TEST_F(LoggerTest, ClearAllLogsReachesEverySink) {
  logger.setMode(NRV_MODE_RECORDS);
  log(NRV_ERR, "kept until cleared");
  ASSERT_EQ(1u, records.records().size());
  logger.clearAllLogs();
  EXPECT_EQ(1, capture.clears());
  EXPECT_TRUE(records.records().empty());
}

TEST_F(LoggerTest, DisabledLoggingReachesOnlyTheSyslogSink) {
  logger.disable();
  log(NRV_ERR, "no syslog sink: everyone hears it");
  EXPECT_EQ(1u, capture.entries().size());
  {
    NRV_SysLogger syslog_sink(logger);  // registers itself
    EXPECT_EQ(4u, logger.sinkCount());
    log(NRV_DBG, "only syslog hears this");
    EXPECT_EQ(1u, capture.entries().size());
    // What no sink keeps is not even formatted; what syslog keeps is.
    EXPECT_FALSE(logger.wants(NRV_DBG));
    EXPECT_FALSE(logger.wants(NRV_INFO));
    EXPECT_TRUE(logger.wants(NRV_ERR));
    logger.enable();
    EXPECT_TRUE(logger.wants(NRV_DBG));  // the capturing sink keeps everything
    log(NRV_DBG, "enabled: everyone");
    EXPECT_EQ(2u, capture.entries().size());
    logger.disable();
  }
  // The dead syslog sink must no longer be designated.
  EXPECT_EQ(3u, logger.sinkCount());
  log(NRV_ERR, "after the syslog sink died");
  EXPECT_EQ(3u, capture.entries().size());
}

TEST(SysLoggerTest, PassesOnCriticalWarningsAndErrorsOnly) {
  EXPECT_EQ(LOG_CRIT, NRV_SysLogger::priorityFor(NRV_CRIT));
  EXPECT_EQ(LOG_WARNING, NRV_SysLogger::priorityFor(NRV_WARN));
  EXPECT_EQ(LOG_ERR, NRV_SysLogger::priorityFor(NRV_ERR));
  // Not NRV_INFO: every catalogue read logs " Entering BuildCimpleInfo()",
  // which would land in the file the driver-log readers scan.
  for (int level : {0, 4, 5, -1, 6, 1 << 30}) EXPECT_EQ(-1, NRV_SysLogger::priorityFor(level));
}

// --- file sink -----------------------------------------------------------

TEST_F(LoggerTest, FileLineHasTheEstablishedFormat) {
  ASSERT_EQ(0, logger.setTracePath(trace));
  logger.setMode(NRV_MODE_FILE);
  static const int line = 321;
  logger.log("NRV_Data.cpp", &line, NRV_ERR, "adapter %s failed", "A0");

  const std::string text = read_text(trace);
  const std::regex format(
      R"(\[threadid =(\d+)l\] \[\d{4}/\d{2}/\d{2} \d{2}:\d{2}:\d{2}\.\d{6}[+-]\d{3}\] )"
      R"(\[NRV_Data\.cpp:321\]\[NRV_ERR\] adapter A0 failed\n)");
  std::smatch match;
  ASSERT_TRUE(std::regex_match(text, match, format)) << text;
  EXPECT_EQ(std::to_string(gettid()), match[1].str());
}

TEST_F(LoggerTest, LogModeSelectsFileAndRecordSinks) {
  struct Case {
    int32_t mode;
    bool file;
    bool record;
  };
  for (const Case& c : {Case{0, false, false}, Case{1, false, true}, Case{2, true, false},
                        Case{3, false, false}, Case{4, true, true}}) {
    SCOPED_TRACE(c.mode);
    std::filesystem::remove(trace);
    logger.clearAllLogs();
    ASSERT_EQ(0, logger.setTracePath(trace));
    logger.setMode(c.mode);
    log(NRV_ERR, "selected");
    EXPECT_EQ(c.file, !read_text(trace).empty());
    EXPECT_EQ(c.record, records.records().size() == 1u);
  }
}

TEST_F(LoggerTest, SinksWantOnlyWhatTheyWouldWrite) {
  logger.unregisterSink(&capture);
  logger.setMode(0);
  for (int level : {NRV_CRIT, NRV_ERR, NRV_DBG}) EXPECT_FALSE(logger.wants(level)) << level;
  ASSERT_EQ(0, logger.setTracePath(trace));
  logger.setMode(NRV_MODE_FILE);
  EXPECT_TRUE(logger.wants(NRV_DBG));
  EXPECT_FALSE(logger.wants(6));
  logger.setErrorsOnly();
  ASSERT_EQ(0, logger.setTracePath(trace));
  EXPECT_FALSE(logger.wants(NRV_DBG));
  EXPECT_TRUE(logger.wants(NRV_ERR));
}

TEST_F(LoggerTest, FileTakesEveryDefinedLevelButNoOther) {
  ASSERT_EQ(0, logger.setTracePath(trace));
  logger.setMode(NRV_MODE_FILE);
  for (int level : {-1, 0, 1, 2, 3, 4, 5, 6}) log(level, "x");
  const auto lines = split_lines(read_text(trace));
  ASSERT_EQ(6u, lines.size());
  EXPECT_NE(std::string::npos, lines[0].find("[NRV_INVALID] x"));
  EXPECT_NE(std::string::npos, lines[5].find("[NRV_DBG] x"));
}

TEST_F(LoggerTest, ErrorsOnlyKeepsCriticalAndErrors) {
  logger.setErrorsOnly();
  ASSERT_EQ(0, logger.setTracePath(trace));
  EXPECT_TRUE(file.errorsOnly());
  logger.setMode(NRV_MODE_FILE);
  log(NRV_WARN, "warning");
  log(NRV_CRIT, "critical");
  log(NRV_INFO, "info");
  log(NRV_ERR, "error");
  const auto lines = split_lines(read_text(trace));
  ASSERT_EQ(2u, lines.size());
  EXPECT_NE(std::string::npos, lines[0].find("[NRV_CRIT] critical"));
  EXPECT_NE(std::string::npos, lines[1].find("[NRV_ERR] error"));
}

TEST_F(LoggerTest, OpenRefusesUnusablePathsAndKeepsTheCurrentFile) {
  ASSERT_EQ(0, file.open(trace.c_str(), false));
  const std::string read_only = root.under("/etc/read-only.log");
  test::write_text(read_only, "");
  ::chmod(read_only.c_str(), 0444);

  EXPECT_EQ(-1, file.open(nullptr, false));
  EXPECT_EQ(-1, file.open(read_only.c_str(), false));
  EXPECT_EQ(-1, file.open(root.under("/missing/dir/x.log").c_str(), false));
  EXPECT_EQ(-1, logger.setTracePath(root.under("/missing/dir/x.log")));
  // A FIFO would block every logging thread once its buffer filled.
  const std::string fifo = root.under("/etc/trace.fifo");
  ASSERT_EQ(0, ::mkfifo(fifo.c_str(), 0644));
  EXPECT_EQ(-1, file.open(fifo.c_str(), false));
  EXPECT_EQ(-1, file.open("/dev/null", false));

  EXPECT_EQ(trace, logger.tracePath());
  logger.setMode(NRV_MODE_FILE);
  log(NRV_ERR, "still here");
  EXPECT_EQ(1u, split_lines(read_text(trace)).size());
}

TEST_F(LoggerTest, StopClosesAndForgetsStartReopens) {
  ASSERT_EQ(0, logger.setTracePath(trace));
  logger.setMode(NRV_MODE_FILE_RECORDS);
  log(NRV_ERR, "one");
  std::filesystem::remove(trace);
  logger.setMode(NRV_MODE_FILE);  // start reopens the stored path
  log(NRV_ERR, "two");
  EXPECT_EQ(1u, split_lines(read_text(trace)).size());

  logger.setMode(NRV_MODE_OFF);
  EXPECT_FALSE(file.isOpen());
  EXPECT_EQ("", logger.tracePath());
  logger.setMode(NRV_MODE_FILE);
  EXPECT_FALSE(file.isOpen());
}

TEST_F(LoggerTest, ClearEmptiesTheFileAndKeepsAppending) {
  ASSERT_EQ(0, logger.setTracePath(trace));
  logger.setMode(NRV_MODE_FILE);
  log(NRV_ERR, "before");
  logger.clearAllLogs();
  EXPECT_EQ("", read_text(trace));
  log(NRV_ERR, "after");
  const auto lines = split_lines(read_text(trace));
  ASSERT_EQ(1u, lines.size());
  EXPECT_NE(std::string::npos, lines[0].find("after"));
}

// --- record ring ---------------------------------------------------------

TEST_F(LoggerTest, RingKeepsOnlyErrorsAndMoreSevere) {
  logger.setMode(NRV_MODE_RECORDS);
  for (int level : {-1, 0, 1, 2, 3, 4, 5, 6}) log(level, "m");
  records.log(NRV_ERR, "f.cpp", 1, nullptr);
  log(NRV_ERR, "");

  const auto ring = records.records();
  ASSERT_EQ(5u, ring.size());
  for (int i = 0; i < 4; ++i) {
    EXPECT_EQ(i, ring[i].level);
    EXPECT_STREQ("[m]", ring[i].message);
    EXPECT_TRUE(ring[i].timestamp.is_timestamp());
  }
  EXPECT_STREQ("[]", ring[4].message);
}

TEST_F(LoggerTest, RingOverwritesTheFirstSlotWithRecord1025) {
  logger.setMode(NRV_MODE_RECORDS);
  for (int i = 0; i < 1024; ++i) log(NRV_ERR, ("m" + std::to_string(i)).c_str());
  EXPECT_EQ(1023, records.lastIndex());
  ASSERT_EQ(1024u, records.records().size());

  log(NRV_ERR, "m1024");
  auto ring = records.records();
  ASSERT_EQ(1024u, ring.size());
  EXPECT_EQ(0, records.lastIndex());
  EXPECT_STREQ("[m1024]", ring[0].message);
  EXPECT_STREQ("[m1]", ring[1].message);
  EXPECT_STREQ("[m1023]", ring[1023].message);

  records.clear();
  EXPECT_TRUE(records.records().empty());
  EXPECT_EQ(-1, records.lastIndex());
  log(NRV_ERR, "fresh");
  ring = records.records();
  ASSERT_EQ(1u, ring.size());
  EXPECT_STREQ("[fresh]", ring[0].message);
}

TEST(CIMLoggerTest, SmallRingStaysInSlotOrderAcrossWraps) {
  CLogger logger;
  NRV_CIMLogger ring(logger, 3);
  logger.registerSink(&ring);
  logger.enable();
  logger.setMode(NRV_MODE_FILE_RECORDS);
  for (int i = 0; i < 8; ++i) logger.log("f", nullptr, NRV_WARN, "%d", i);
  // Slots after 8 records in a ring of 3: 6, 7, 5.
  const auto records = ring.records();
  ASSERT_EQ(3u, records.size());
  EXPECT_STREQ("[6]", records[0].message);
  EXPECT_STREQ("[7]", records[1].message);
  EXPECT_STREQ("[5]", records[2].message);
  EXPECT_EQ(1, ring.lastIndex());
}

TEST(CIMLoggerTest, ZeroCapacityRecordsNothing) {
  CLogger logger;
  NRV_CIMLogger ring(logger, 0);
  logger.registerSink(&ring);
  logger.setMode(NRV_MODE_RECORDS);
  logger.log("f", nullptr, NRV_ERR, "x");
  EXPECT_TRUE(ring.records().empty());
}

TEST_F(LoggerTest, LongMessagesAreCutToFitTheRecord) {
  logger.setMode(NRV_MODE_RECORDS);
  const std::string fits(197, 'a');
  const std::string too_long(198, 'b');
  const std::string huge(10000, 'c');
  log(NRV_ERR, fits.c_str());
  log(NRV_ERR, too_long.c_str());
  log(NRV_ERR, huge.c_str());

  const auto ring = records.records();
  ASSERT_EQ(3u, ring.size());
  EXPECT_EQ("[" + fits + "]", std::string(ring[0].message));
  EXPECT_EQ("[" + std::string(197, 'b') + "]", std::string(ring[1].message));
  EXPECT_EQ("[" + std::string(197, 'c') + "]", std::string(ring[2].message));
  EXPECT_EQ(199u, std::strlen(ring[2].message));
}

}  // namespace
}  // namespace cimple
