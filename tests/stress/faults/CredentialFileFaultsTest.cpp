#include "FaultRun.h"

#include <LumoraKit/platform/linux/embedded/SealedFileStore.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <memory>
#include <string>

#include <unistd.h>

namespace lumora::tests {
namespace {

using backend::SealCost;
using backend::SealedFileStore;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Not;

constexpr SealCost cheap{1, 8192};

// The file, in the folder "config" of each try.
class CredentialFile : public FaultScenario {
public:
  using FaultScenario::FaultScenario;

  void check(const Fault& fault) override {
    EXPECT_TRUE(!error_ || fault.call != 0) << error_->localizedDescription();
    EXPECT_TRUE(!error_ || !error_->localizedDescription().empty());
    EXPECT_THAT(filesBelow(folder_), testing::IsSubsetOf({"config/passwords", "config/passwords.lock"}));
  }

protected:
  std::filesystem::path file() const { return folder_ / "config/passwords"; }

  std::shared_ptr<SealedFileStore> open(LMRErrorRef& error) const {
    return SealedFileStore::open(file(), Secret("passphrase"), cheap, error);
  }

  // What a new store finds; "(none)" when there is no such item.
  std::string secretOf(const std::string& account) const {
    LMRErrorRef error;
    const auto store = open(error);
    EXPECT_TRUE(store) << error->localizedDescription();
    Secret secret{std::string()};
    error = store ? store->find("service", account, nullptr, &secret) : error;
    return error ? "(none)" : secret.text();
  }

  LMRErrorRef error_;
};

class Opening final : public CredentialFile {
public:
  using CredentialFile::CredentialFile;
  void act() override { opened_ = open(error_) != nullptr; }
  void check(const Fault& fault) override {
    CredentialFile::check(fault);
    EXPECT_EQ(opened_, !error_);
    EXPECT_EQ(secretOf("ada"), "(none)");
  }

private:
  bool opened_ = false;
};

TEST(CredentialFileFaults, leaveAFileThatCanBeOpened_whenItIsMade) {
  expectHolds(runWithFaults<Opening>(),
              {"mkdir", "open", "flock", "mmap", "mkostemp", "write", "fsync", "rename", "close", "read"});
}

class RelativeOpening final : public CredentialFile {
public:
  explicit RelativeOpening(const std::filesystem::path& folder) : CredentialFile(folder) {
    EXPECT_EQ(chdir(folder.c_str()), 0);
  }
  void act() override {
    store_ = SealedFileStore::open("config/passwords", Secret("passphrase"), cheap, error_);
    opened_ = store_ != nullptr;
  }
  void check(const Fault& fault) override {
    CredentialFile::check(fault);
    EXPECT_EQ(opened_, !error_);
    if (opened_) {
      EXPECT_FALSE(store_->add("service", "ada", Secret("apple")));
      EXPECT_EQ(secretOf("ada"), "apple");
    }
  }

private:
  std::shared_ptr<SealedFileStore> store_;
  bool opened_ = false;
};

TEST(CredentialFileFaults, makeNoFileElsewhere_whenThePathIsRelative) {
  expectHolds(runWithFaults<RelativeOpening>(), {"getcwd", "mkdir"});
}

class WithOneItem : public CredentialFile {
public:
  explicit WithOneItem(const std::filesystem::path& folder) : CredentialFile(folder), store_(open(error_)) {
    EXPECT_FALSE(store_->add("service", "ada", Secret("apple")));
  }

protected:
  std::shared_ptr<SealedFileStore> store_;
};

class Adding final : public WithOneItem {
public:
  using WithOneItem::WithOneItem;
  void act() override { error_ = store_->add("service", "bob", Secret(secret_)); }
  void check(const Fault& fault) override {
    CredentialFile::check(fault);
    EXPECT_EQ(secretOf("ada"), "apple");
    EXPECT_EQ(secretOf("bob"), error_ ? "(none)" : secret_);
  }

private:
  const std::string secret_ = std::string(50'000, 's');
};

TEST(CredentialFileFaults, loseNothing_whenAPasswordIsAdded) {
  expectHolds(runWithFaults<Adding>(), {"open", "flock", "read", "mkostemp", "write", "fsync", "rename", "close"});
}

class Removing final : public WithOneItem {
public:
  explicit Removing(const std::filesystem::path& folder) : WithOneItem(folder) {
    EXPECT_FALSE(store_->add("service", "bob", Secret("plum")));
    EXPECT_FALSE(store_->find("service", "bob", &handle_, nullptr));
  }
  void act() override { error_ = store_->remove(handle_); }
  void check(const Fault& fault) override {
    CredentialFile::check(fault);
    EXPECT_EQ(secretOf("ada"), "apple");
    EXPECT_EQ(secretOf("bob"), error_ ? "plum" : "(none)");
  }

private:
  std::string handle_;
};

TEST(CredentialFileFaults, loseNothingElse_whenAPasswordIsRemoved) {
  expectHolds(runWithFaults<Removing>(), {"read", "write", "rename"});
}

class Listing final : public WithOneItem {
public:
  using WithOneItem::WithOneItem;
  void act() override {
    error_ = store_->list("service", items_);
    foundError_ = store_->find("service", "ada", nullptr, &secret_);
  }
  void check(const Fault& fault) override {
    CredentialFile::check(fault);
    EXPECT_EQ(items_.size(), error_ ? 0U : 1U);
    EXPECT_EQ(secret_.text(), foundError_ ? "" : "apple");
    EXPECT_FALSE(isCredentialError(foundError_, CredentialError::ItemNotFound)) << "it is there";
    EXPECT_EQ(secretOf("ada"), "apple");
  }

private:
  std::vector<CredentialItem> items_;
  Secret secret_{std::string()};
  LMRErrorRef foundError_;
};

TEST(CredentialFileFaults, areErrors_whenPasswordsAreRead) {
  expectHolds(runWithFaults<Listing>(), {"open", "read", "close"});
}

} // namespace
} // namespace lumora::tests
