// Many threads logging at once: lines never interleave, the ring stays
// consistent, readers get whole copies, and sinks may come and go safely.
#include <atomic>
#include <regex>
#include <string>
#include <thread>
#include <vector>

#include <gtest/gtest.h>

#include "logging/CLogger.h"
#include "logging/DeviceLog.h"
#include "logging/NRV_CIMLogger.h"
#include "logging/NRV_FileLogger.h"
#include "logging/NRV_SysLogger.h"
#include "LogTestSupport.h"

namespace cimple {
namespace {

constexpr int kThreads = 6;
constexpr int kPerThread = 400;

TEST(LoggerThreadsTest, ConcurrentMessagesStayWhole) {
  test::ScopedSysroot root;
  const std::string trace = root.under("/var/log/threads.log");
  CLogger logger;
  NRV_FileLogger file(logger);
  NRV_CIMLogger ring(logger);
  test::CapturingSink capture;
  logger.registerSink(&file);
  logger.registerSink(&ring);
  logger.registerSink(&capture);
  logger.enable();
  ASSERT_EQ(0, logger.setTracePath(trace));
  logger.setMode(NRV_MODE_FILE_RECORDS);

  std::atomic<bool> done{false};
  std::thread reader([&] {
    while (!done.load()) {
      for (const NRV_CIMLogEntry& e : ring.records()) ASSERT_EQ('[', e.message[0]);
      (void)logger.tracePath();
      logger.setLevel(NRV_INFO);
      (void)logger.getMode();
    }
  });
  std::vector<std::thread> writers;
  for (int t = 0; t < kThreads; ++t) {
    writers.emplace_back([&, t] {
      for (int i = 0; i < kPerThread; ++i)
        logger.log("w.cpp", nullptr, NRV_ERR, "t%d m%d %s", t, i, std::string(150, 'x').c_str());
    });
  }
  for (auto& w : writers) w.join();
  done = true;
  reader.join();

  const auto lines = test::split_lines(test::read_text(trace));
  ASSERT_EQ(static_cast<size_t>(kThreads * kPerThread), lines.size());
  const std::regex whole(R"(\[threadid =\d+l\] \[[^\]]+\] \[w\.cpp:0\]\[NRV_ERR\] t\d m\d+ x{150})");
  for (const auto& line : lines) ASSERT_TRUE(std::regex_match(line, whole)) << line;

  EXPECT_EQ(1024u, ring.records().size());
  EXPECT_EQ((kThreads * kPerThread - 1) % 1024, ring.lastIndex());

  // Each thread's messages reach a sink in the order it sent them.
  std::vector<int> next(kThreads, 0);
  for (const auto& m : capture.messages()) {
    int t = 0, i = 0;
    ASSERT_EQ(2, std::sscanf(m.c_str(), "t%d m%d", &t, &i));
    ASSERT_EQ(next[t], i);
    ++next[t];
  }
}

TEST(LoggerThreadsTest, SinksMayComeAndGoWhileOthersLog) {
  CLogger logger;
  std::atomic<bool> done{false};
  std::vector<std::thread> writers;
  for (int t = 0; t < 3; ++t) {
    writers.emplace_back([&] {
      while (!done.load()) logger.log("s.cpp", nullptr, NRV_DBG, "churn");
    });
  }
  std::thread toggler([&] {
    for (int i = 0; i < 300; ++i) {
      if (i % 2) logger.enable(); else logger.disable();
      logger.setMode(i % 5);
    }
  });
  for (int i = 0; i < 200; ++i) {
    NRV_CIMLogger ring(logger, 4);
    logger.registerSink(&ring);
    NRV_SysLogger syslog_sink(logger);  // DBG never reaches the system log
    std::this_thread::yield();
  }  // each sink leaves the logger before it dies
  toggler.join();
  done = true;
  for (auto& w : writers) w.join();
  EXPECT_EQ(0u, logger.sinkCount());
}

TEST(LoggerThreadsTest, ModuleLogCallAndDeviceLogFromManyThreads) {
  test::CapturingSink sink;
  CLogger::instance().registerSink(&sink);
  DeviceLog lines(100);
  std::atomic<int> refused{0};
  std::vector<std::thread> threads;
  for (int t = 0; t < kThreads; ++t) {
    threads.emplace_back([&, t] {
      for (int i = 0; i < 50; ++i) {
        NRV_LOG(NRV_INFO, "thread %d", t);
        if (lines.add("l" + std::to_string(t)) == 1) ++refused;
      }
    });
  }
  for (auto& t : threads) t.join();
  CLogger::instance().unregisterSink(&sink);

  EXPECT_EQ(100u, lines.size());
  EXPECT_EQ(kThreads * 50 - 100, refused.load());
  // One trace per NRV_LOG and one per DeviceLog::add.
  EXPECT_EQ(static_cast<size_t>(kThreads * 50 * 2), sink.entries().size());
}

}  // namespace
}  // namespace cimple
