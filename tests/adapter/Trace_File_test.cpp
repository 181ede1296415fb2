// The framework trace file: written only under CIMPLE_HOME with a valid
// LOG_LEVEL, filtered by level, in the "stamp LEVEL: file(line): text" form.
// The file is configured once per process, so each case runs in a child.
#include <gtest/gtest.h>
#include <stdlib.h>
#include <sys/stat.h>

#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>

#include "framework/Trace_File.h"

namespace {

std::string scratch_dir() {
  char dir[] = "/tmp/nrv_trace_XXXXXX";
  return mkdtemp(dir) ? dir : "/tmp";
}

std::string slurp(const std::string& path) {
  std::ifstream in(path);
  std::stringstream text;
  text << in.rdbuf();
  return text.str();
}

bool exists(const std::string& path) {
  struct stat st;
  return stat(path.c_str(), &st) == 0;
}

// Ends a child: its scratch directory goes, its verdict is the exit code.
[[noreturn]] void finish(const std::string& dir, bool ok) {
  std::filesystem::remove_all(dir);
  std::exit(ok ? 0 : 1);
}

class Trace_File : public ::testing::Test {
 protected:
  static void SetUpTestSuite() { GTEST_FLAG_SET(death_test_style, "threadsafe"); }
};

TEST_F(Trace_File, WithoutCimpleHomeNothingIsWritten) {
  const std::string dir = scratch_dir();
  std::ofstream(dir + "/.cimplerc") << "LOG_LEVEL=DBG\n";
  EXPECT_EXIT(
      {
        unsetenv("CIMPLE_HOME");
        CIMPLE_ERR("never %d", 1);
        finish(dir, !exists(dir + "/.cimple"));
      },
      ::testing::ExitedWithCode(0), "");
  std::filesystem::remove_all(dir);
}

TEST_F(Trace_File, MessagesAtOrBelowTheLevelAreWrittenWithTheirOrigin) {
  const std::string dir = scratch_dir();
  std::ofstream(dir + "/.cimplerc") << "# comment\n\nLOG_LEVEL   =  warn\t \nLOG_LEVEL = DBG\n";
  EXPECT_EXIT(
      {
        setenv("CIMPLE_HOME", dir.c_str(), 1);
        CIMPLE_WARN("kept %s", "warning");
        CIMPLE_ERR("kept error\n");
        CIMPLE_DBG("dropped debug");
        std::string text = slurp(dir + "/.cimple/messages");
        bool ok = text.find(" WARN: Trace_File_test.cpp(") != std::string::npos &&
                  text.find("): kept warning\n") != std::string::npos &&
                  text.find(" ERR: ") != std::string::npos && text.find("kept error\n\n") == std::string::npos &&
                  text.find("dropped") == std::string::npos && exists(dir + "/.cimple/messages.lock") &&
                  text.size() > 20 && text[4] == '/' && text.find('.') > text.find(" WARN");
        finish(dir, ok);
      },
      ::testing::ExitedWithCode(0), "");
  std::filesystem::remove_all(dir);
}

TEST_F(Trace_File, AnUnknownLevelWritesNothing) {
  const std::string dir = scratch_dir();
  std::ofstream(dir + "/.cimplerc") << "LOG_LEVEL = LOUD\n";
  EXPECT_EXIT(
      {
        setenv("CIMPLE_HOME", dir.c_str(), 1);
        CIMPLE_ERR("nothing");
        finish(dir, !exists(dir + "/.cimple/messages"));
      },
      ::testing::ExitedWithCode(0), "");
  std::filesystem::remove_all(dir);
}

TEST_F(Trace_File, AMissingConfigurationWritesNothing) {
  const std::string dir = scratch_dir();
  EXPECT_EXIT(
      {
        setenv("CIMPLE_HOME", dir.c_str(), 1);
        CIMPLE_ERR("nothing");
        finish(dir, !exists(dir + "/.cimple/messages"));
      },
      ::testing::ExitedWithCode(0), "");
  std::filesystem::remove_all(dir);
}

TEST(Trace_Levels, NamesFollowTheLevels) {
  EXPECT_STREQ(cimple::log_level_name(cimple::LL_FATAL), "FATAL");
  EXPECT_STREQ(cimple::log_level_name(cimple::LL_DBG), "DBG");
}

}  // namespace
