// Driver-log line holders: bounded, refusing lines once full, ignoring empty ones.
#include <string>

#include <gtest/gtest.h>

#include "logging/CLogger.h"
#include "logging/DeviceLog.h"
#include "LogTestSupport.h"

namespace cimple {
namespace {

TEST(DeviceLogTest, RefusesLinesOnceFull) {
  DeviceLog log(200);
  EXPECT_EQ(200, log.maxCount());
  for (int i = 0; i < 200; ++i) ASSERT_EQ(0, log.add("line " + std::to_string(i)));
  EXPECT_EQ(1, log.add("one too many"));
  EXPECT_EQ(1, log.add(""));  // fullness is checked before emptiness
  const auto lines = log.lines();
  ASSERT_EQ(200u, lines.size());
  EXPECT_EQ("line 0", lines.front());
  EXPECT_EQ("line 199", lines.back());

  log.clear();
  EXPECT_EQ(0u, log.size());
  EXPECT_EQ(0, log.add("again"));
}

TEST(DeviceLogTest, IgnoresEmptyLines) {
  DeviceLog log(2);
  EXPECT_EQ(0, log.add(""));
  EXPECT_EQ(0u, log.size());
  EXPECT_EQ(0, log.add("a"));
  EXPECT_EQ(0, log.add(""));
  EXPECT_EQ(0, log.add("b"));
  EXPECT_EQ(1, log.add("c"));
  EXPECT_EQ((std::vector<std::string>{"a", "b"}), log.lines());
}

TEST(DeviceLogTest, ZeroOrNegativeCapacityHoldsNothing) {
  DeviceLog none(0);
  EXPECT_EQ(1, none.add("x"));
  DeviceLog negative(-5);
  EXPECT_EQ(1, negative.add("x"));
  EXPECT_EQ(0u, negative.size());
}

TEST(DeviceLogTest, TracesEveryInsertionAtDebugLevel) {
  test::CapturingSink sink;
  CLogger::instance().registerSink(&sink);
  DeviceLog log(1);
  log.add("x");
  log.add("y");
  CLogger::instance().unregisterSink(&sink);

  const auto entries = sink.entries();
  ASSERT_EQ(2u, entries.size());
  for (const auto& e : entries) {
    EXPECT_EQ(NRV_DBG, e.level);
    EXPECT_EQ("DeviceLog.cpp", e.file);
    EXPECT_EQ("Handlelog ---  Prior to Inserting into DeviceLog Vector", e.message);
  }
}

}  // namespace
}  // namespace cimple
