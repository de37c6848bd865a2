#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/EmbeddedCredentialStore.h>
#include <LumoraKit/platform/linux/FileLock.h>
#include <LumoraKit/platform/linux/embedded/SealedFileStore.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <csignal>
#include <filesystem>
#include <vector>

#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

namespace fs = std::filesystem;

namespace lumora::tests {
namespace {

using backend::SealedFileStore;
using testing::HasSubstr;
using testing::Not;

// As little work as there may be: these tests are not about the work.
constexpr backend::SealCost cheap{1, 8192};

class SealedFileTest : public testing::Test {
protected:
  std::shared_ptr<SealedFileStore> open(const std::string& passphrase = "passphrase") {
    return SealedFileStore::open(file_, Secret(passphrase), cheap, error_, std::chrono::milliseconds(100));
  }
  void expectError(CredentialError code) const {
    ASSERT_TRUE(error_);
    EXPECT_TRUE(isCredentialError(error_, code)) << error_->description();
  }
  static std::string secret(CredentialStore& store, const std::string& account) {
    Secret secret("(none)");
    store.find("service", account, nullptr, &secret);
    return secret.text();
  }
  std::size_t filesInFolder() const {
    return static_cast<std::size_t>(std::distance(fs::directory_iterator(folder_.path()), fs::directory_iterator()));
  }

  TemporaryFolder folder_;
  const fs::path file_ = folder_ / "passwords";
  LMRErrorRef error_;
};

TEST_F(SealedFileTest, holdsWhatWasStored_forWhoOpensItNext) {
  const auto store = open();
  ASSERT_TRUE(store) << error_->description();
  ASSERT_FALSE(store->add("service", "ada", Secret("apple")));
  const auto next = open();
  ASSERT_TRUE(next);
  EXPECT_EQ(secret(*next, "ada"), "apple");
  ASSERT_FALSE(next->add("service", "bob", Secret("plum")));
  EXPECT_EQ(secret(*store, "bob"), "plum");
}

TEST_F(SealedFileTest, showsNothing_andIsTheUsersOnly) {
  const auto store = open();
  ASSERT_FALSE(store->add("a long service name", "a long account name", Secret("a long password")));
  const std::string content = contentOf(file_);
  for (const char* const text : {"service", "account", "password", "passphrase"}) {
    EXPECT_THAT(content, Not(HasSubstr(text)));
  }
  EXPECT_EQ(fs::status(file_).permissions(), fs::perms::owner_read | fs::perms::owner_write);
}

TEST_F(SealedFileTest, isMadeWithItsFolders) {
  error_ = nullptr;
  const fs::path file = folder_ / "a/b/passwords";
  EXPECT_TRUE(SealedFileStore::open(file, Secret(""), cheap, error_));
  EXPECT_TRUE(fs::exists(file));
}

TEST_F(SealedFileTest, isRefused_andLeftAlone_whenThePassphraseIsWrong) {
  ASSERT_FALSE(open()->add("service", "ada", Secret("apple")));
  const std::string before = contentOf(file_);
  for (const char* const wrong : {"Passphrase", "", "passphrase "}) {
    EXPECT_FALSE(open(wrong));
    expectError(CredentialError::WrongPassphrase);
  }
  EXPECT_EQ(contentOf(file_), before);
  EXPECT_EQ(secret(*open(), "ada"), "apple");
}

TEST_F(SealedFileTest, isRefused_andLeftAlone_whenItIsCutOffAnywhere) {
  ASSERT_FALSE(open()->add("service", "ada", Secret("apple")));
  const std::string whole = contentOf(file_);
  for (std::size_t size = 0; size < whole.size(); ++size) {
    writeFile(file_, whole.substr(0, size));
    EXPECT_FALSE(open()) << size;
    expectError(CredentialError::Damaged);
    EXPECT_EQ(contentOf(file_), whole.substr(0, size));
  }
}

TEST_F(SealedFileTest, isRefused_andLeftAlone_whenAnyByteIsAnother) {
  ASSERT_FALSE(open()->add("service", "ada", Secret("apple")));
  const std::string whole = contentOf(file_);
  for (std::size_t at = 0; at < whole.size(); ++at) {
    std::string damaged = whole;
    damaged[at] = static_cast<char>(damaged[at] ^ 1);
    writeFile(file_, damaged);
    EXPECT_FALSE(open()) << at;
    expectError(CredentialError::Damaged);
    EXPECT_EQ(contentOf(file_), damaged);
  }
  writeFile(file_, whole + "x");
  EXPECT_FALSE(open());
  expectError(CredentialError::Damaged);
  writeFile(file_, whole);
  EXPECT_TRUE(open());
}

TEST_F(SealedFileTest, changesNothing_whenItIsDamagedWhileInUse) {
  const auto store = open();
  ASSERT_FALSE(store->add("service", "ada", Secret("apple")));
  writeFile(file_, "something else");
  error_ = store->add("service", "bob", Secret("plum"));
  expectError(CredentialError::Damaged);
  std::vector<CredentialItem> items(1);
  error_ = store->list("service", items);
  expectError(CredentialError::Damaged);
  EXPECT_TRUE(items.empty());
  error_ = store->remove("1");
  expectError(CredentialError::Damaged);
  EXPECT_EQ(contentOf(file_), "something else");
}

TEST_F(SealedFileTest, isEmptyAgain_whenItWasRemovedWhileInUse) {
  const auto store = open();
  ASSERT_FALSE(store->add("service", "ada", Secret("apple")));
  fs::remove(file_);
  EXPECT_EQ(secret(*store, "ada"), "(none)");
  EXPECT_FALSE(store->add("service", "bob", Secret("plum")));
  EXPECT_EQ(secret(*open(), "bob"), "plum");
}

TEST_F(SealedFileTest, tellsWhy_whenItCannotBeRead) {
  fs::create_directory(file_);
  EXPECT_FALSE(open());
  expectError(CredentialError::Failed);
  EXPECT_THAT(error_->localizedDescription(), HasSubstr(file_.string()));
  fs::remove(file_);
  if (getuid() == 0) {
    GTEST_SKIP() << "root may read every file";
  }
  ASSERT_TRUE(open());
  fs::permissions(file_, fs::perms::none);
  EXPECT_FALSE(open());
  expectError(CredentialError::Failed);
  EXPECT_THAT(error_->localizedDescription(), HasSubstr(file_.string()));
}

TEST_F(SealedFileTest, tellsWhy_whenThereCanBeNoFolder) {
  writeFile(folder_ / "file", "");
  EXPECT_FALSE(SealedFileStore::open(folder_ / "file/passwords", Secret(""), cheap, error_));
  expectError(CredentialError::Failed);
}

TEST_F(SealedFileTest, tellsThatTimeIsUp_whileAnotherHasTheTurn) {
  const auto store = open();
  backend::FileLock turn;
  ASSERT_FALSE(turn.take(folder_ / "passwords.lock"));
  error_ = store->add("service", "ada", Secret("apple"));
  expectError(CredentialError::TimedOut);
  EXPECT_EQ(secret(*store, "ada"), "(none)") << "reading needs no turn";
  EXPECT_FALSE(open());
  expectError(CredentialError::TimedOut);
}

// The limit on the size of files stands for a full disk; it is the child's own.
TEST_F(SealedFileTest, losesNothing_whenTheDiskIsFull) {
  const auto store = open();
  ASSERT_FALSE(store->add("service", "ada", Secret("apple")));
  const std::string before = contentOf(file_);
  const pid_t child = fork();
  if (child == 0) {
    std::signal(SIGXFSZ, SIG_IGN);
    const rlimit tiny{1000, 1000};
    setrlimit(RLIMIT_FSIZE, &tiny);
    const LMRErrorRef error = store->add("service", "bob", Secret(std::string(5000, 'x')));
    _exit(isCredentialError(error, CredentialError::Failed) ? EXIT_SUCCESS : EXIT_FAILURE);
  }
  int status = -1;
  waitpid(child, &status, 0);
  EXPECT_EQ(status, 0);
  EXPECT_EQ(contentOf(file_), before);
  EXPECT_EQ(filesInFolder(), 2U) << "the file and its lock";
  EXPECT_EQ(secret(*store, "ada"), "apple");
}

TEST_F(SealedFileTest, keepsEveryItem_whenProcessesStoreAtOnce) {
  constexpr int processes = 4;
  constexpr int items = 25;
  std::vector<pid_t> children;
  for (int process = 0; process < processes; ++process) {
    children.push_back(fork());
    if (children.back() == 0) {
      // Each opens it itself, so that several make it at once.
      const auto store = SealedFileStore::open(file_, Secret("passphrase"), cheap, error_, std::chrono::minutes(1));
      bool isGood = store != nullptr;
      for (int item = 0; item < items && isGood; ++item) {
        isGood = !store->add("service", std::to_string(process * items + item), Secret("apple"));
      }
      _exit(isGood ? EXIT_SUCCESS : EXIT_FAILURE);
    }
  }
  for (const pid_t child : children) {
    int status = -1;
    waitpid(child, &status, 0);
    EXPECT_EQ(status, 0);
  }
  std::vector<CredentialItem> found;
  ASSERT_FALSE(open()->list("service", found));
  EXPECT_EQ(found.size(), std::size_t{processes * items});
}

TEST_F(SealedFileTest, isWhole_whenItsWriterIsKilled) {
  const auto store = open();
  for (int round = 0; round < 10; ++round) {
    const pid_t writer = fork();
    if (writer == 0) {
      for (int i = 0;; ++i) {
        store->add("service", std::to_string(round) + "-" + std::to_string(i), Secret("apple"));
      }
    }
    while (secret(*store, std::to_string(round) + "-3") == "(none)") {
    }
    kill(writer, SIGKILL);
    waitpid(writer, nullptr, 0);
    EXPECT_EQ(secret(*open(), std::to_string(round) + "-3"), "apple");
    ASSERT_FALSE(store->add("service", "after " + std::to_string(round), Secret("plum")));
  }
}

TEST_F(SealedFileTest, isMadeByThePublicFactory_withItsWork) {
  const auto store = makeEmbeddedCredentialStore(file_, Secret("passphrase"), &error_);
  ASSERT_TRUE(store) << error_->description();
  EXPECT_FALSE(error_);
  ASSERT_FALSE(store->add("service", "ada", Secret("apple")));
  EXPECT_FALSE(makeEmbeddedCredentialStore(file_, Secret("wrong"), &error_));
  expectError(CredentialError::WrongPassphrase);
  EXPECT_FALSE(makeEmbeddedCredentialStore(file_, Secret("wrong"), nullptr));
}

} // namespace
} // namespace lumora::tests
