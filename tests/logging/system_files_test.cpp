// The module's system files: bounded reads that refuse anything but a
// regular file without blocking, rewrites that leave the old file whole when
// they fail, and the relocating variable ignored by privileged processes.
#include <signal.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>

#include <gtest/gtest.h>

#include "logging/NRV_FileRewrite.h"
#include "logging/NRV_RegularFile.h"
#include "logging/NRV_SystemPaths.h"
#include "tests/common/Special_Files.h"

using namespace cimple;
namespace fs = std::filesystem;

namespace {

class FilesTest : public ::testing::Test {
 protected:
  void SetUp() override {
    const char* root = std::getenv("NRV_SYSROOT");
    dir = fs::path(root != nullptr ? root : fs::temp_directory_path().string()) / "files-test";
    fs::remove_all(dir);
    fs::create_directories(dir);
    path = (dir / "settings.conf").string();
  }
  void TearDown() override { fs::remove_all(dir); }

  static void write(const std::string& p, const std::string& text) {
    std::ofstream(p, std::ios::binary | std::ios::trunc) << text;
  }
  static std::string read(const std::string& p) {
    std::ifstream in(p, std::ios::binary);
    std::ostringstream text;
    text << in.rdbuf();
    return text.str();
  }
  // Everything in the folder: a failed rewrite leaves no temporary behind.
  size_t entries() const { return static_cast<size_t>(std::distance(fs::directory_iterator(dir), {})); }

  fs::path dir;
  std::string path;
};

TEST_F(FilesTest, OnlyARegularFileWithinTheBoundIsRead) {
  EXPECT_EQ(File_Status::Missing, read_regular_file(path, 100).status);
  EXPECT_EQ(File_Status::Missing, read_regular_file((dir / "no/such/file").string(), 100).status);
  write(path, "a\nb");
  const File_Text whole = read_regular_file(path, 3);
  EXPECT_EQ(File_Status::Ok, whole.status);
  EXPECT_EQ("a\nb", whole.text);
  EXPECT_EQ(File_Status::TooLarge, read_regular_file(path, 2).status);
  for (const nrv_test::Special_Case& c : nrv_test::kSpecialFiles) {
    ASSERT_TRUE(nrv_test::make_special(path, c.kind));
    nrv_test::Hang_Guard guard(std::string("reading a ") + c.name);
    const File_Text special = read_regular_file(path, 100);
    EXPECT_EQ(File_Status::NotRegular, special.status) << c.name;
    EXPECT_EQ("not a regular file", file_status_text(special.status, special.error));
  }
  EXPECT_EQ((std::vector<std::string_view>{"a", "", "b"}), split_lines("a\n\nb\n"));
  EXPECT_TRUE(split_lines("").empty());
}

TEST_F(FilesTest, ARewriteReplacesTheFileWholeAndSkipsAnUnchangedOne) {
  EXPECT_EQ(Rewrite_Status::Written, rewrite_file(path, "one\n").status);
  EXPECT_EQ("one\n", read(path));
  struct stat st {};
  ASSERT_EQ(0, ::stat(path.c_str(), &st));
  EXPECT_EQ(0644u, st.st_mode & 07777);

  ASSERT_EQ(0, ::chmod(path.c_str(), 0600));
  const ino_t before = st.st_ino;
  EXPECT_EQ(Rewrite_Status::Unchanged, rewrite_file(path, "one\n").status);
  ASSERT_EQ(0, ::stat(path.c_str(), &st));
  EXPECT_EQ(before, st.st_ino);

  // A shorter or longer content is a change; the mode is kept.
  EXPECT_EQ(Rewrite_Status::Written, rewrite_file(path, "one").status);
  EXPECT_EQ(Rewrite_Status::Written, rewrite_file(path, "one\ntwo\n").status);
  EXPECT_EQ("one\ntwo\n", read(path));
  ASSERT_EQ(0, ::stat(path.c_str(), &st));
  EXPECT_EQ(0600u, st.st_mode & 07777);

  // A link is followed: its target changes, the link stays.
  const std::string link = (dir / "link.conf").string();
  ASSERT_EQ(0, ::symlink(path.c_str(), link.c_str()));
  EXPECT_EQ(Rewrite_Status::Written, rewrite_file(link, "three\n").status);
  EXPECT_EQ("three\n", read(path));
  EXPECT_TRUE(fs::is_symlink(link));
  EXPECT_EQ(2u, entries());
}

TEST_F(FilesTest, NothingButARegularFileInAnExistingFolderIsReplaced) {
  const Rewrite_Result missing = rewrite_file((dir / "no/such/settings.conf").string(), "x");
  EXPECT_EQ(Rewrite_Status::MissingDirectory, missing.status);
  EXPECT_EQ("missing directory", rewrite_failure_text(missing));
  for (const nrv_test::Special_Case& c : nrv_test::kSpecialFiles) {
    ASSERT_TRUE(nrv_test::make_special(path, c.kind));
    nrv_test::Hang_Guard guard(std::string("rewriting a ") + c.name);
    EXPECT_EQ(Rewrite_Status::NotRegular, rewrite_file(path, "x").status) << c.name;
    EXPECT_TRUE(nrv_test::is_special(path, c.kind)) << c.name;
    EXPECT_EQ(1u, entries()) << c.name;
  }
}

// A file-size limit makes the write fail after the old file was opened for
// writing in the old scheme: the old content must survive, and the process
// (SIGXFSZ left at its default, which ends it) must too.
TEST_F(FilesTest, AFailedWriteLeavesTheOldFileWholeAndTheProcessAlive) {
  const std::string old_content = "NRV_PROVIDER_CACHE_TIMEOUT = 20\n";
  write(path, old_content);
  const pid_t pid = ::fork();
  ASSERT_GE(pid, 0);
  if (pid == 0) {
    ::signal(SIGXFSZ, SIG_DFL);
    const struct rlimit tiny = {8, 8};
    ::setrlimit(RLIMIT_FSIZE, &tiny);
    const Rewrite_Result r = rewrite_file(path, std::string(64, 'x'));
    ::_exit(r.status == Rewrite_Status::Failed && r.error == EFBIG && std::string(r.step) == "write" ? 0 : 2);
  }
  int status = 0;
  ASSERT_EQ(pid, ::waitpid(pid, &status, 0));
  ASSERT_TRUE(WIFEXITED(status)) << "ended by signal " << WTERMSIG(status);
  EXPECT_EQ(0, WEXITSTATUS(status));
  EXPECT_EQ(old_content, read(path));
  EXPECT_EQ(1u, entries());
}

// Started with a real user that is not root and root as the effective one,
// the process runs in secure-execution mode, as a set-user-ID program does.
TEST(SystemPaths, ThePrivilegedProcessIgnoresTheRelocatingVariable) {
  ASSERT_EQ(0u, ::geteuid()) << "needs root to start a privileged child";
  const pid_t pid = ::fork();
  ASSERT_GE(pid, 0);
  if (pid == 0) {
    ::setenv("NRV_SYSROOT", "/relocated", 1);
    if (::setresuid(65534, 0, 0) != 0) ::_exit(3);
    std::string filter = "--gtest_filter=SystemPathsChild.DISABLED_SecureExecution";
    std::string disabled = "--gtest_also_run_disabled_tests";
    char exe[] = "/proc/self/exe";
    char* argv[] = {exe, filter.data(), disabled.data(), nullptr};
    ::execv(exe, argv);
    ::_exit(127);
  }
  int status = 0;
  ASSERT_EQ(pid, ::waitpid(pid, &status, 0));
  ASSERT_TRUE(WIFEXITED(status));
  EXPECT_EQ(0, WEXITSTATUS(status));
  const char* outer = std::getenv("NRV_SYSROOT");
  const std::string saved = outer != nullptr ? outer : "";
  ::setenv("NRV_SYSROOT", "/relocated", 1);
  EXPECT_EQ("/relocated/etc/x.conf", system_path("/etc/x.conf"));  // an ordinary process follows it
  ::setenv("NRV_SYSROOT", saved.c_str(), 1);
}

TEST(SystemPathsChild, DISABLED_SecureExecution) {
  ASSERT_STREQ("/relocated", std::getenv("NRV_SYSROOT"));
  EXPECT_EQ("/etc/x.conf", system_path("/etc/x.conf"));
}

}  // namespace
