// The provider configuration file: what the reader accepts and ignores, the
// setters' bounds, the six-line rewrite, and the WebLaunch file.  Bad files
// never fail the caller; they leave the defaults or what was read so far.
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <string>

#include "AgentTestSupport.h"
#include "agent/NrvConfigFile.h"
#include "logging/Log.h"
#include "tests/common/Special_Files.h"

namespace nrv_test {
namespace {

using cimple::NrvConfigFile;

class ConfigFileTest : public ::testing::Test {
 protected:
  void SetUp() override {
    path = sysroot_path("/etc/config_file_test.conf");
    remove_file(path);
    remove_file(sysroot_path(cimple::kNrvWebLaunchFile));
    capture.reset();
  }

  // Reads `text` into a fresh configuration; the rewrite of its destructor
  // goes to the same scratch file.
  NrvConfigFile::Settings read_text(const std::string& text) {
    write_file(path, text);
    NrvConfigFile config;
    config.read(path);
    return config.settings();
  }

  std::string path;
  LogCapture capture;
};

void expect_defaults(const NrvConfigFile::Settings& s) {
  EXPECT_EQ(s.cacheTimeout, 10);
  EXPECT_FALSE(s.refreshAdapterData);
  EXPECT_TRUE(s.refreshSANData);
}

TEST_F(ConfigFileTest, AMissingFileKeepsTheDefaultsSilently) {
  NrvConfigFile config;
  config.read(path);
  expect_defaults(config.settings());
  EXPECT_EQ(config.path(), path);
  EXPECT_TRUE(capture.entries().empty());
}

TEST_F(ConfigFileTest, ReadsTheThreeKeys) {
  const auto s = read_text(
      "NRV_PROVIDER_CACHE_TIMEOUT = 25\n"
      "NRV_PROVIDER_REFRESH_ADAPTERDATA = TRUE\n"
      "NRV_PROVIDER_REFRESH_SANDATA = FALSE\n");
  EXPECT_EQ(s.cacheTimeout, 25);
  EXPECT_TRUE(s.refreshAdapterData);
  EXPECT_FALSE(s.refreshSANData);
}

TEST_F(ConfigFileTest, AnOutOfRangeValueDoesNotTakeTheKey) {
  EXPECT_EQ(read_text("NRV_PROVIDER_CACHE_TIMEOUT = 45\nNRV_PROVIDER_CACHE_TIMEOUT = 20\n").cacheTimeout, 20);
  EXPECT_EQ(read_text("NRV_PROVIDER_CACHE_TIMEOUT = 20\nNRV_PROVIDER_CACHE_TIMEOUT = 15\n").cacheTimeout, 20);
  for (const char* bad : {"0", "31", "-5", "abc", "", "99999999999999999999999"})
    EXPECT_EQ(read_text(std::string("NRV_PROVIDER_CACHE_TIMEOUT = ") + bad + "\n").cacheTimeout, 10) << bad;
  EXPECT_EQ(read_text("NRV_PROVIDER_CACHE_TIMEOUT = 7 minutes\n").cacheTimeout, 7);
  EXPECT_EQ(read_text("NRV_PROVIDER_CACHE_TIMEOUT=1\n").cacheTimeout, 1);
  EXPECT_EQ(read_text("NRV_PROVIDER_CACHE_TIMEOUT = 30\n").cacheTimeout, 30);
}

TEST_F(ConfigFileTest, FlagsAreCaseSensitiveAndTakenOnce) {
  EXPECT_TRUE(read_text("NRV_PROVIDER_REFRESH_SANDATA = true\n").refreshSANData);
  EXPECT_FALSE(read_text("NRV_PROVIDER_REFRESH_SANDATA = false\n"
                         "NRV_PROVIDER_REFRESH_SANDATA = FALSE\n"
                         "NRV_PROVIDER_REFRESH_SANDATA = TRUE\n")
                   .refreshSANData);
  EXPECT_FALSE(read_text("nrv_provider_refresh_adapterdata = TRUE\n").refreshAdapterData);
}

TEST_F(ConfigFileTest, CommentsBlanksAndGarbageAreSkipped) {
  const auto s = read_text(
      "   # NRV_PROVIDER_CACHE_TIMEOUT = 5\n"
      "\n"
      "garbage without an equals sign\n"
      "\t\x01\x02\xff binary = junk\n"
      "OTHER_KEY = 3\n"
      "  NRV_PROVIDER_CACHE_TIMEOUT   =   12  \r\n"
      "= TRUE\n");
  EXPECT_EQ(s.cacheTimeout, 12);
  EXPECT_FALSE(s.refreshAdapterData);
  EXPECT_TRUE(s.refreshSANData);
}

TEST_F(ConfigFileTest, ALongCommentIsNoSettingAndKeysPastTheThousandthLineCount) {
  const std::string key = "NRV_PROVIDER_CACHE_TIMEOUT = 9";
  // Read in 1023-character pieces, the tail of these lines would be a setting.
  EXPECT_EQ(read_text("# " + std::string(1021, 'x') + key + "\n").cacheTimeout, 10);
  EXPECT_EQ(read_text(std::string(1023, 'x') + key + "\n").cacheTimeout, 10);
  EXPECT_EQ(read_text(key + std::string(1023 - key.size(), ' ') + "\n").cacheTimeout, 9);
  std::string many;
  for (int i = 0; i < 1000; ++i) many += "# filler\n";
  EXPECT_EQ(read_text(many + key + "\n").cacheTimeout, 9);
}

TEST_F(ConfigFileTest, ASpecialFileAtEitherPathIsRefusedWithoutBlockingAndLeftAlone) {
  const std::string weblaunch = sysroot_path(cimple::kNrvWebLaunchFile);
  for (const Special_Case& c : kSpecialFiles) {
    SCOPED_TRACE(c.name);
    capture.reset();
    ASSERT_TRUE(make_special(path, c.kind));
    ASSERT_TRUE(make_special(weblaunch, c.kind));
    {
      Hang_Guard guard(std::string("reading settings from a ") + c.name);
      NrvConfigFile config;
      config.read(path);
      expect_defaults(config.settings());
      EXPECT_FALSE(config.write());
      EXPECT_EQ(NrvConfigFile::readWebLaunchAddress(), "");
    }  // nor does the save of the destructor replace it
    EXPECT_EQ(capture.count("Unable to open provider config setting file - " + path, cimple::NRV_ERR), 1);
    EXPECT_EQ(capture.count("Unable to write provider config setting file - " + path + ": not a regular file",
                            cimple::NRV_ERR),
              2);
    EXPECT_EQ(capture.count("Unable to read WebLaunch config file '" + weblaunch + "': not a regular file",
                            cimple::NRV_ERR),
              1);
    EXPECT_TRUE(is_special(path, c.kind));
    EXPECT_TRUE(is_special(weblaunch, c.kind));
  }
  remove_file(weblaunch);
  ::rmdir(path.c_str());
  remove_file(path);
}

TEST_F(ConfigFileTest, SettersCheckTheirBounds) {
  NrvConfigFile config;
  EXPECT_EQ(config.setCacheTimeout(0), -1);
  EXPECT_EQ(config.setCacheTimeout(31), -1);
  EXPECT_EQ(config.setCacheTimeout(1), 0);
  EXPECT_EQ(config.getCacheTimeout(), 1);
  EXPECT_EQ(config.setCacheTimeout(30), 0);
  EXPECT_EQ(config.setRefreshAdapterData(2), -1);
  EXPECT_EQ(config.setRefreshAdapterData(1), 0);
  EXPECT_TRUE(config.getRefreshAdapterData());
  EXPECT_EQ(config.setRefreshSANData(-1), -1);
  EXPECT_EQ(config.setRefreshSANData(0), 0);
  EXPECT_FALSE(config.getRefreshSANData());
  EXPECT_EQ(config.getCacheTimeout(), 30);
}

TEST_F(ConfigFileTest, TheDestructorRewritesTheFileInSixLinesUnlessItHoldsThemAlready) {
  write_file(path, "NRV_PROVIDER_CACHE_TIMEOUT = 3\nsomething else\n");
  {
    NrvConfigFile config;
    config.read(path);
    config.setRefreshAdapterData(1);
    EXPECT_EQ(read_file(path), "NRV_PROVIDER_CACHE_TIMEOUT = 3\nsomething else\n");  // not before the end
  }
  const std::string written = read_file(path);
  EXPECT_EQ(written,
            "##################################################\n"
            "# Norvane HBA CIM Provider Configuration Settings #\n"
            "##################################################\n"
            "NRV_PROVIDER_CACHE_TIMEOUT = 3\n"
            "NRV_PROVIDER_REFRESH_ADAPTERDATA = TRUE\n"
            "NRV_PROVIDER_REFRESH_SANDATA = TRUE\n");
  // What is written reads back the same, and is then left alone.
  struct stat before {};
  ASSERT_EQ(::stat(path.c_str(), &before), 0);
  const auto s = read_text(written);
  EXPECT_EQ(s.cacheTimeout, 3);
  EXPECT_TRUE(s.refreshAdapterData);
  EXPECT_TRUE(s.refreshSANData);
  struct stat after {};
  ASSERT_EQ(::stat(path.c_str(), &after), 0);
  EXPECT_EQ(before.st_ino, after.st_ino);
}

TEST_F(ConfigFileTest, AMissingDirectoryIsAClearErrorAndKeepsTheOldValue) {
  const std::string missing_dir = sysroot_path("/no/such/dir/provider.conf");
  {
    NrvConfigFile config;
    config.read(missing_dir);
    EXPECT_EQ(config.change(&NrvConfigFile::setCacheTimeout, 15), NrvConfigFile::Change::NotSaved);
    EXPECT_EQ(config.getCacheTimeout(), 10);
    EXPECT_EQ(config.change(&NrvConfigFile::setCacheTimeout, 45), NrvConfigFile::Change::OutOfRange);
  }
  EXPECT_EQ(capture.count("Unable to write provider config setting file - " + missing_dir + ": missing directory",
                          cimple::NRV_ERR),
            2);  // the change, then the destructor's save
  capture.reset();
  NrvConfigFile unread;  // never read: no path, nothing written
  EXPECT_TRUE(unread.write());
  EXPECT_TRUE(capture.entries().empty());
}

TEST_F(ConfigFileTest, WebLaunchIsTheFirstLineThatIsNotBlankOrAComment) {
  EXPECT_EQ(NrvConfigFile::readWebLaunchAddress(), "");
  EXPECT_EQ(capture.count("WebLaunch config file '" + sysroot_path(cimple::kNrvWebLaunchFile) + "' not found.",
                          cimple::NRV_INFO),
            1);

  write_file(sysroot_path(cimple::kNrvWebLaunchFile), "\n   \n  # comment\n   https://host:5989/ui  \nlater\n");
  EXPECT_EQ(NrvConfigFile::readWebLaunchAddress(), "https://host:5989/ui  ");
  write_file(sysroot_path(cimple::kNrvWebLaunchFile), "# only comments\n\n");
  EXPECT_EQ(NrvConfigFile::readWebLaunchAddress(), "");
  write_file(sysroot_path(cimple::kNrvWebLaunchFile), "no newline at the end");
  EXPECT_EQ(NrvConfigFile::readWebLaunchAddress(), "no newline at the end");
}

TEST_F(ConfigFileTest, AWebLaunchLineLongerThan255CharactersEndsTheReading) {
  write_file(sysroot_path(cimple::kNrvWebLaunchFile), std::string(255, 'a') + "\n");
  EXPECT_EQ(NrvConfigFile::readWebLaunchAddress(), std::string(255, 'a'));
  write_file(sysroot_path(cimple::kNrvWebLaunchFile), "#\n" + std::string(256, 'a') + "\nhttp://x\n");
  EXPECT_EQ(NrvConfigFile::readWebLaunchAddress(), "");
}

}  // namespace
}  // namespace nrv_test
