#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/linux/embedded/SealedFileStore.h>
#include <LumoraKit/testing/FakeCredentialStore.h>

#include <gmock/gmock.h>

namespace lumora::tests {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

// One contract for the embedded store and for the fake.
class CredentialStoreContract : public testing::TestWithParam<const char*> {
protected:
  std::shared_ptr<CredentialStore> make() const {
    if (std::string(GetParam()) == "fake") {
      return std::make_shared<fakes::FakeCredentialStore>();
    }
    LMRErrorRef error;
    return backend::SealedFileStore::open(folder_ / "passwords", Secret("passphrase"), {1, 8192}, error);
  }

  LMRErrorRef add(const std::string& account, const std::string& secret) {
    return store_->add("service", account, Secret(secret));
  }
  std::optional<std::string> secret(const std::string& account) {
    Secret secret("");
    return store_->find("service", account, nullptr, &secret) ? std::nullopt : std::optional(secret.text());
  }
  std::vector<std::string> accounts(const std::string& service) {
    std::vector<CredentialItem> items(1);
    EXPECT_EQ(store_->list(service, items), nullptr);
    std::vector<std::string> accounts;
    for (const CredentialItem& item : items) {
      accounts.push_back(item.account);
    }
    return accounts;
  }

  TemporaryFolder folder_;
  std::shared_ptr<CredentialStore> store_ = make();
};

INSTANTIATE_TEST_SUITE_P(All, CredentialStoreContract, testing::Values("embedded", "fake"),
                         [](const auto& subject) { return subject.param; });

TEST_P(CredentialStoreContract, keepsAnyBytes) {
  for (const std::string& bytes : {std::string(), std::string("a\0\xff", 3), std::string(100'000, 'x')}) {
    const std::string account = "of " + std::to_string(bytes.size());
    EXPECT_EQ(add(account, bytes), nullptr);
    EXPECT_EQ(secret(account), bytes);
  }
  EXPECT_EQ(add("", "of the empty account"), nullptr);
  EXPECT_EQ(secret(""), "of the empty account");
}

TEST_P(CredentialStoreContract, refusesASecondItem_ofTheSameServiceAndAccount) {
  EXPECT_EQ(add("ada", "apple"), nullptr);
  EXPECT_TRUE(isCredentialError(add("ada", "pear"), CredentialError::DuplicateItem));
  EXPECT_EQ(store_->add("other", "ada", Secret("plum")), nullptr);
  EXPECT_EQ(secret("ada"), "apple");
}

TEST_P(CredentialStoreContract, findsNothing_whenThereIsNoSuchItem) {
  EXPECT_EQ(add("ada", "apple"), nullptr);
  Secret secret("untouched");
  std::string handle = "untouched";
  EXPECT_TRUE(isCredentialError(store_->find("service", "bob", &handle, &secret), CredentialError::ItemNotFound));
  EXPECT_EQ(secret.text(), "untouched");
  EXPECT_EQ(handle, "untouched");
}

TEST_P(CredentialStoreContract, removesAnItemOnce_andGivesItsHandleToNoOther) {
  EXPECT_EQ(add("ada", "apple"), nullptr);
  std::string handle;
  EXPECT_EQ(store_->find("service", "ada", &handle, nullptr), nullptr);
  EXPECT_EQ(store_->remove(handle), nullptr);
  EXPECT_EQ(add("ada", "pear"), nullptr);
  EXPECT_TRUE(isCredentialError(store_->remove(handle), CredentialError::ItemNotFound));
  EXPECT_TRUE(isCredentialError(store_->remove("none"), CredentialError::ItemNotFound));
  EXPECT_EQ(secret("ada"), "pear");
}

TEST_P(CredentialStoreContract, listsTheItemsOfAService_inTheirOrder) {
  EXPECT_EQ(add("zoe", "plum"), nullptr);
  EXPECT_EQ(store_->add("other", "bob", Secret("cherry")), nullptr);
  EXPECT_EQ(add("ada", "apple"), nullptr);
  EXPECT_THAT(accounts("service"), ElementsAre("zoe", "ada"));
  EXPECT_THAT(accounts("none"), IsEmpty());
}

TEST_P(CredentialStoreContract, refusesWhatIsNoText) {
  for (const std::string& unusable : {std::string("\xff"), std::string("a\0b", 3)}) {
    std::vector<CredentialItem> items;
    EXPECT_TRUE(isCredentialError(add(unusable, "apple"), CredentialError::UnusableText));
    EXPECT_TRUE(isCredentialError(store_->add(unusable, "ada", Secret("")), CredentialError::UnusableText));
    EXPECT_TRUE(isCredentialError(store_->find("service", unusable, nullptr, nullptr), CredentialError::UnusableText));
    EXPECT_TRUE(isCredentialError(store_->list(unusable, items), CredentialError::UnusableText));
  }
}

TEST(FakeCredentialStore, failsAsOftenAsToldTo) {
  fakes::FakeCredentialStore store;
  store.failOnce(fakes::CredentialOperation::Add, CredentialError::TimedOut);
  store.fail(fakes::CredentialOperation::Add, CredentialError::Locked);
  EXPECT_TRUE(isCredentialError(store.add("service", "ada", Secret("")), CredentialError::TimedOut));
  EXPECT_TRUE(isCredentialError(store.add("service", "ada", Secret("")), CredentialError::Locked));
  EXPECT_TRUE(isCredentialError(store.add("service", "ada", Secret("")), CredentialError::Locked));
  EXPECT_THAT(store.items(), IsEmpty());
  store.fail(fakes::CredentialOperation::Add, std::nullopt);
  EXPECT_EQ(store.add("service", "ada", Secret("")), nullptr);
}

TEST(FakeCredentialStore, keepsItsCalls) {
  using fakes::CredentialCall;
  using fakes::CredentialOperation;
  fakes::FakeCredentialStore store;
  std::vector<CredentialItem> items;
  store.list("service", items);
  store.find("service", "ada", nullptr, nullptr);
  EXPECT_THAT(store.calls(), ElementsAre(CredentialCall{CredentialOperation::List, "service", ""},
                                         CredentialCall{CredentialOperation::Find, "service", "ada"}));
  store.forgetCalls();
  EXPECT_EQ(store.callCount(), 0U);
}

TEST(FakeCredentialStore, holdsWhatOtherProgramsPut_alsoTwice) {
  fakes::FakeCredentialStore store;
  store.put("service", "ada", "apple");
  store.put("service", "ada", "pear");
  EXPECT_EQ(store.items().size(), 2U);
  EXPECT_EQ(store.secret("service", "ada"), "apple");
  EXPECT_EQ(store.secret("service", "bob"), std::nullopt);
}

TEST(FakeCredentialStore, doesNotRead_whatItWasToldNotTo) {
  fakes::FakeCredentialStore store;
  store.put("service", "ada", "apple");
  store.failToRead("service", "ada", CredentialError::Locked);
  Secret secret("untouched");
  EXPECT_TRUE(isCredentialError(store.find("service", "ada", nullptr, &secret), CredentialError::Locked));
  EXPECT_EQ(secret.text(), "untouched");
  std::vector<CredentialItem> items;
  EXPECT_EQ(store.list("service", items), nullptr);
  ASSERT_EQ(items.size(), 1U);
  EXPECT_TRUE(isCredentialError(items.front().error, CredentialError::Locked));
  EXPECT_EQ(items.front().account, "");
}

} // namespace
} // namespace lumora::tests
