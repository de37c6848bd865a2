#include "KeychainTest.h"

#include <algorithm>
#include <set>

namespace lumora::tests {
namespace {

using testing::IsEmpty;
using testing::SizeIs;

class ItemsTest : public KeychainTest {
protected:
  void SetUp() override {
    KeychainTest::SetUp();
    if (!IsSkipped()) {
      ASSERT_TRUE(keyring_.startService());
    }
  }

  std::vector<CredentialItem> list(const std::string& of = service) {
    std::vector<CredentialItem> items;
    const LMRErrorRef error = store_->list(of, items);
    EXPECT_FALSE(error) << error->description();
    return items;
  }
};

std::string everyByte() {
  std::string bytes;
  for (int byte = 0; byte < 256; ++byte) {
    bytes += static_cast<char>(byte);
  }
  return bytes;
}

TEST_F(ItemsTest, secret_comesBackWhole_whateverItsBytes) {
  const std::vector<std::pair<std::string, std::string>> secrets{{"plain", "apple"},
                                                                 {"binary", everyByte()},
                                                                 {"not UTF-8", "\xff\xfe\x80zz"},
                                                                 {"empty", ""},
                                                                 {"one null", std::string(1, '\0')},
                                                                 {"a mebibyte", std::string(1 << 20, '\xee')},
                                                                 {"\xc3\xa9\xf0\x9f\x8e\x99 account", "pear"},
                                                                 {"", "of the empty account"}};
  for (const auto& [account, secret] : secrets) {
    EXPECT_FALSE(add(account, secret)) << account;
  }
  for (const auto& [account, secret] : secrets) {
    EXPECT_EQ(secretOf(account), secret) << account;
  }
  for (const CredentialItem& item : list()) {
    EXPECT_FALSE(item.error);
    EXPECT_EQ(std::ranges::count(secrets, std::pair(item.account, item.secret.text())), 1) << item.account;
  }
  EXPECT_THAT(list(), SizeIs(secrets.size()));
}

TEST_F(ItemsTest, secret_isThereAgain_whenTheServiceWasStartedAnew) {
  ASSERT_FALSE(add("ada", everyByte()));
  keyring_.stopService();
  ASSERT_TRUE(keyring_.startService());
  EXPECT_EQ(secretOf("ada"), everyByte());
}

TEST_F(ItemsTest, add_findsTheDuplicate_andLeavesItAlone) {
  ASSERT_FALSE(add("ada", "apple"));
  const LMRErrorRef error = add("ada", "pear");
  expectError(error, CredentialError::DuplicateItem);
  EXPECT_EQ(error->code(), -25299);
  EXPECT_EQ(secretOf("ada"), "apple");
  EXPECT_EQ(keyring_.countItems("service", service), 1);
}

TEST_F(ItemsTest, items_areDistinct_byServiceAndAccount) {
  ASSERT_FALSE(add("ada", "apple"));
  ASSERT_FALSE(add("bob", "plum"));
  ASSERT_FALSE(store_->add(service + ":8171", "ada", Secret("pear")));
  EXPECT_EQ(secretOf("ada"), "apple");
  EXPECT_THAT(list(), SizeIs(2));
  EXPECT_THAT(list(service + ":8171"), SizeIs(1));
  EXPECT_THAT(list("Lumora: "), IsEmpty());
}

TEST_F(ItemsTest, find_failsWithoutASecret_whenThereIsNoSuchItem) {
  LMRErrorRef error;
  EXPECT_EQ(secretOf(*store_, "nobody", &error), "(none)");
  expectError(error, CredentialError::ItemNotFound);
}

TEST_F(ItemsTest, remove_takesTheItem_once) {
  ASSERT_FALSE(add("ada", "apple"));
  ASSERT_FALSE(add("bob", "plum"));
  std::string handle;
  ASSERT_FALSE(store_->find(service, "ada", &handle, nullptr));
  EXPECT_FALSE(store_->remove(handle));
  expectError(store_->remove(handle), CredentialError::ItemNotFound);
  EXPECT_EQ(keyring_.countItems("service", service), 1);
  EXPECT_EQ(secretOf("bob"), "plum");
}

TEST_F(ItemsTest, remove_findsNothing_whenTheHandleIsNone) {
  for (const char* const handle : {"", "apple", "/org/freedesktop/secrets/collection/login/99999", "/"}) {
    expectError(store_->remove(handle), CredentialError::ItemNotFound);
  }
}

TEST_F(ItemsTest, everyCall_refusesATextThatABusCannotCarry) {
  std::vector<CredentialItem> items;
  for (const std::string& unusable : {std::string("\xff"), std::string("a\0b", 3)}) {
    expectError(store_->add(service, unusable, Secret("apple")), CredentialError::UnusableText);
    expectError(store_->add(unusable, "ada", Secret("apple")), CredentialError::UnusableText);
    expectError(store_->find(service, unusable, nullptr, nullptr), CredentialError::UnusableText);
    expectError(store_->list(unusable, items), CredentialError::UnusableText);
  }
  EXPECT_FALSE(add("ada", "apple"));
}

TEST_F(ItemsTest, items_areOfASchemaOfTheirOwn) {
  ASSERT_FALSE(add("ada", "apple"));
  EXPECT_EQ(keyring_.countItems("xdg:schema", "org.vantor.lumora.Credential"), 1);
}

TEST_F(ItemsTest, list_hasEveryItem_whenThereAreAThousand) {
  constexpr int count = 1000;
  for (int i = 0; i < count; ++i) {
    const LMRErrorRef error = add("user " + std::to_string(i), "password " + std::to_string(i));
    ASSERT_FALSE(error) << i << ": " << error->description();
  }
  std::set<std::string> accounts;
  for (const CredentialItem& item : list()) {
    ASSERT_FALSE(item.error);
    EXPECT_EQ(item.secret.text(), "password " + item.account.substr(5));
    accounts.insert(item.account);
  }
  EXPECT_THAT(accounts, SizeIs(count));
}

TEST_F(ItemsTest, keychainAccess_storesReplacesListsAndRemoves) {
  LMRKeychainAccess::storePassword_forUserName_server("apple", "ada", server);
  LMRKeychainAccess::storePassword_forUserName_server("pear", "ada", server);
  LMRKeychainAccess::storePassword_forUserName_server("", "bob", server);
  EXPECT_EQ(LMRKeychainAccess::passwordForUserName_server("ada", server), "pear");
  EXPECT_EQ(LMRKeychainAccess::passwordForUserName_server("bob", server), "");
  EXPECT_EQ(LMRKeychainAccess::credentialsForServer(server),
            Array{(Dictionary{{"userName", "ada"}, {"password", "pear"}})});
  EXPECT_EQ(keyring_.countItems("service", service), 2);
  LMRKeychainAccess::removePasswordForUserName_server("ada", server);
  EXPECT_EQ(LMRKeychainAccess::passwordForUserName_server("ada", server), std::nullopt);
  EXPECT_EQ(LMRKeychainAccess::credentialsForServer(server), Array());
}

} // namespace
} // namespace lumora::tests
