#include "support/Descriptors.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/linux/PosixFiles.h>

#include <gmock/gmock.h>

#include <atomic>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <set>
#include <thread>

#include <fcntl.h>
#include <pwd.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

namespace lumora::tests {
namespace {

using testing::ElementsAre;
using testing::MatchesRegex;

class PosixFilesTest : public testing::Test {
protected:
  std::size_t entries() const {
    using Iterator = std::filesystem::directory_iterator;
    return static_cast<std::size_t>(std::distance(Iterator(folder_.path()), Iterator()));
  }

  TemporaryFolder folder_;
  backend::PosixFiles files_;
};

mode_t permissionsOf(const std::filesystem::path& path) {
  struct stat status {};
  stat(path.c_str(), &status);
  return status.st_mode & 07777U;
}

TEST_F(PosixFilesTest, writesContentReadableByUserOnly) {
  const auto path = folder_ / "file";
  const std::string content("text\0with null", 14);
  EXPECT_EQ(files_.writeAtomically(path, content), nullptr);
  EXPECT_EQ(contentOf(path), content);
  EXPECT_EQ(permissionsOf(path), 0600U);
  EXPECT_EQ(entries(), 1U);
}

TEST_F(PosixFilesTest, readsFile) {
  writeFile(folder_ / "file", "content");
  LMRErrorRef error;
  EXPECT_EQ(files_.contentOfFile(folder_ / "file", &error), "content");
  EXPECT_EQ(error, nullptr);
  EXPECT_EQ(files_.contentOfFile(folder_ / "missing", &error), std::nullopt);
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->code(), ENOENT);
}

TEST_F(PosixFilesTest, listsFolder) {
  writeFile(folder_ / "b", "");
  writeFile(folder_ / "a", "");
  std::filesystem::create_directory(folder_ / "c");
  LMRErrorRef error;
  EXPECT_THAT(files_.contentsOfDirectory(folder_.path(), &error),
              ElementsAre(folder_ / "a", folder_ / "b", folder_ / "c"));
  EXPECT_EQ(error, nullptr);
  EXPECT_TRUE(files_.isFile(folder_ / "a"));
  EXPECT_FALSE(files_.isFile(folder_ / "c"));
  EXPECT_FALSE(files_.isFile(folder_ / "d"));
  EXPECT_THAT(files_.contentsOfDirectory(folder_ / "a", &error), testing::IsEmpty());
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->code(), ENOTDIR);
}

TEST_F(PosixFilesTest, locksFileForOneHolder) {
  LMRErrorRef error;
  auto lock = files_.lockFile(folder_ / "lock", &error);
  ASSERT_NE(lock, nullptr);
  EXPECT_EQ(files_.lockFile(folder_ / "lock", &error), nullptr);
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->code(), EWOULDBLOCK);
  lock.reset();
  EXPECT_NE(files_.lockFile(folder_ / "lock", &error), nullptr);
  EXPECT_EQ(files_.lockFile(folder_ / "missing" / "lock", &error), nullptr);
  EXPECT_EQ(error->code(), ENOENT);
}

TEST_F(PosixFilesTest, replacesFile) {
  const auto path = folder_ / "file";
  writeFile(path, "a longer content than the new one");
  EXPECT_EQ(files_.writeAtomically(path, ""), nullptr);
  EXPECT_EQ(contentOf(path), "");
  EXPECT_EQ(files_.writeAtomically(path, "new"), nullptr);
  EXPECT_EQ(contentOf(path), "new");
}

TEST_F(PosixFilesTest, showsOldOrNewContent_whenReadDuringWrites) {
  const auto path = folder_ / "file";
  const std::string one(50'000, '1');
  const std::string two(90'000, '2');
  files_.writeAtomically(path, one);
  std::atomic<bool> done{false};
  std::thread writer([&] {
    for (int i = 0; i < 100; ++i) {
      files_.writeAtomically(path, i % 2 == 0 ? two : one);
    }
    done = true;
  });
  int torn = 0;
  while (!done) {
    const auto content = contentOf(path);
    torn += content != one && content != two ? 1 : 0;
  }
  writer.join();
  EXPECT_EQ(torn, 0);
}

TEST_F(PosixFilesTest, givesErrnoAndPath_whenFolderIsMissing) {
  const auto path = folder_ / "missing/file";
  const auto error = files_.writeAtomically(path, "content");
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->domain(), LMRPosixErrorDomain);
  EXPECT_EQ(error->code(), ENOENT);
  EXPECT_THAT(error->localizedDescription(), testing::HasSubstr(path.string()));
}

TEST_F(PosixFilesTest, leavesNothingBehind_whenTargetIsFolder) {
  std::filesystem::create_directory(folder_ / "target");
  const auto error = files_.writeAtomically(folder_ / "target", "content");
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->code(), EISDIR);
  EXPECT_EQ(entries(), 1U);
}

// A limit on the size of files stands in for the full disk: both fail in the middle of a write.
class FileSizeLimit {
public:
  explicit FileSizeLimit(rlim_t bytes) : previousHandler_(std::signal(SIGXFSZ, SIG_IGN)) {
    getrlimit(RLIMIT_FSIZE, &previous_);
    rlimit limit = previous_;
    limit.rlim_cur = bytes;
    setrlimit(RLIMIT_FSIZE, &limit);
  }
  FileSizeLimit(const FileSizeLimit&) = delete;
  FileSizeLimit& operator=(const FileSizeLimit&) = delete;
  ~FileSizeLimit() {
    setrlimit(RLIMIT_FSIZE, &previous_);
    std::signal(SIGXFSZ, previousHandler_);
  }

private:
  sighandler_t previousHandler_;
  rlimit previous_{};
};

TEST_F(PosixFilesTest, keepsOldFileAndLeavesNothingElse_whenContentDoesNotFit) {
  const auto path = folder_ / "file";
  files_.writeAtomically(path, "old");
  const auto descriptors = openDescriptors();
  LMRErrorRef error;
  {
    const FileSizeLimit limit(10'000);
    error = files_.writeAtomically(path, std::string(20'000, 'x'));
  }
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->code(), EFBIG);
  EXPECT_EQ(contentOf(path), "old");
  EXPECT_EQ(entries(), 1U);
  EXPECT_EQ(openDescriptors(), descriptors);
}

TEST_F(PosixFilesTest, leavesNothingBehind_whenNameIsTooLong) {
  EXPECT_EQ(files_.writeAtomically(folder_ / std::string(256, 'x'), "content")->code(), ENAMETOOLONG);
  EXPECT_EQ(entries(), 0U);
}

TEST_F(PosixFilesTest, writesFile_whenNameIsAsLongAsNamesMayBe) {
  EXPECT_EQ(files_.writeAtomically(folder_ / std::string(255, 'x'), "content"), nullptr);
}

TEST_F(PosixFilesTest, createsFolderWithParents) {
  const auto path = folder_ / "a/b/c";
  EXPECT_EQ(files_.createDirectory(path), nullptr);
  EXPECT_TRUE(files_.isDirectory(path));
  EXPECT_EQ(files_.createDirectory(path), nullptr);
  EXPECT_EQ(files_.createDirectory(folder_ / "a/./b/../b/d/"), nullptr);
  EXPECT_TRUE(files_.isDirectory(folder_ / "a/b/d"));
}

TEST_F(PosixFilesTest, createsFolderOnce_whenManyAskAtOnce) {
  std::atomic<int> failures{0};
  std::vector<std::thread> threads;
  for (int i = 0; i < 8; ++i) {
    threads.emplace_back([&] { failures += files_.createDirectory(folder_ / "a/b/c/d/e/f") ? 1 : 0; });
  }
  for (auto& thread : threads) {
    thread.join();
  }
  EXPECT_EQ(failures, 0);
}

TEST_F(PosixFilesTest, failsToCreateFolder_whenFileStandsThere) {
  writeFile(folder_ / "file", "");
  EXPECT_FALSE(files_.isDirectory(folder_ / "file"));
  EXPECT_EQ(files_.createDirectory(folder_ / "file")->code(), EEXIST);
  EXPECT_EQ(files_.createDirectory(folder_ / "file/below")->code(), EEXIST);
}

TEST_F(PosixFilesTest, removesFile) {
  writeFile(folder_ / "file", "");
  EXPECT_EQ(files_.removeFile(folder_ / "file"), nullptr);
  EXPECT_EQ(entries(), 0U);
  EXPECT_EQ(files_.removeFile(folder_ / "file")->code(), ENOENT);
  EXPECT_EQ(files_.removeFile(folder_.path())->code(), EISDIR);
}

class UserFolder : public testing::Test {
protected:
  static std::vector<std::filesystem::path> folders() { return backend::PosixFiles().applicationSupportDirectories(); }
};

TEST_F(UserFolder, isXDGFolder_whenThatIsAbsolute) {
  setenv("HOME", "/home/anna", 1);
  setenv("XDG_DATA_HOME", "/data/anna", 1);
  EXPECT_THAT(folders(), ElementsAre("/data/anna"));
  setenv("XDG_DATA_HOME", "relative", 1);
  EXPECT_THAT(folders(), ElementsAre("/home/anna/.local/share"));
  setenv("XDG_DATA_HOME", "", 1);
  EXPECT_THAT(folders(), ElementsAre("/home/anna/.local/share"));
}

TEST_F(UserFolder, comesFromUserDatabase_whenEnvironmentIsEmpty) {
  unsetenv("HOME");
  unsetenv("XDG_DATA_HOME");
  const passwd* const user = getpwuid(getuid());
  if (!user) {
    GTEST_SKIP() << "this user is not in the user database";
  }
  EXPECT_THAT(folders(), ElementsAre(std::filesystem::path(user->pw_dir) / ".local/share"));
}

TEST(AvailableSpace, isTold_forAFolderThatIsThere) {
  const TemporaryFolder folder;
  const auto space = backend::PosixFiles().availableSpace(folder.path());
  ASSERT_TRUE(space.has_value());
  EXPECT_GT(*space, 0U);
}

TEST(AvailableSpace, isNotTold_forAFolderThatIsMissing) {
  const TemporaryFolder folder;
  EXPECT_EQ(backend::PosixFiles().availableSpace(folder / "missing"), std::nullopt);
}

TEST(UUIDString, hasFormOfRandomUUIDInCapitals) {
  for (int i = 0; i < 1000; ++i) {
    EXPECT_THAT(makeUUIDString(), MatchesRegex("[0-9A-F]{8}-[0-9A-F]{4}-4[0-9A-F]{3}-[89AB][0-9A-F]{3}-[0-9A-F]{12}"));
  }
}

TEST(UUIDString, isNewEachTime) {
  std::set<std::string> strings;
  for (int i = 0; i < 10'000; ++i) {
    strings.insert(makeUUIDString());
  }
  EXPECT_EQ(strings.size(), 10'000U);
}

} // namespace
} // namespace lumora::tests
