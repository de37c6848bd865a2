#include <LumoraKit/login/LMRFrameworkUserDefaults.h>
#include <LumoraKit/login/LMRKeychainAccess.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

using lumora::Array;
using lumora::CredentialError;
using lumora::Dictionary;

using lumora::Value;
using lumora::fakes::CredentialCall;
using lumora::fakes::CredentialOperation;
using lumora::fakes::StoredCredential;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

const std::string service = "Lumora: studio.example.org";
const std::string server = "studio.example.org";

class KeychainAccessTest : public testing::Test {
protected:
  static std::optional<std::string> password(const std::optional<std::string>& user) {
    return LMRKeychainAccess::passwordForUserName_server(user, server);
  }
  static void storePassword(const std::optional<std::string>& password) {
    LMRKeychainAccess::storePassword_forUserName_server(password, "ada", server);
  }
  static void removePassword() { LMRKeychainAccess::removePasswordForUserName_server("ada", server); }
  static Value credential(const std::string& user, const std::string& password) {
    return Dictionary{{"userName", user}, {"password", password}};
  }

  lumora::fakes::FakePlatform platform_;
  lumora::fakes::FakeCredentialStore& store_ = *platform_.credentialStore;
};

TEST_F(KeychainAccessTest, constants_areThoseOfEveryApplication) {
  EXPECT_EQ(LMServiceNameFormat, "Lumora: %@");
  EXPECT_EQ(LMRCredentialUserNameKey, "userName");
  EXPECT_EQ(LMRCredentialPasswordKey, "password");
}

TEST_F(KeychainAccessTest, store_makesOneItemNamedAfterTheServer) {
  storePassword("äpple");
  EXPECT_THAT(store_.items(), ElementsAre(StoredCredential{service, "ada", "\xc3\xa4pple"}));
  EXPECT_THAT(store_.calls(), ElementsAre(CredentialCall{CredentialOperation::Add, service, "ada"}));
  EXPECT_EQ(password("ada"), "äpple");
}

TEST_F(KeychainAccessTest, store_replacesThePassword_whenTheUserHasOneThere) {
  store_.put(service, "bob", "plum");
  storePassword("apple");
  store_.forgetCalls();
  storePassword("pear");
  EXPECT_EQ(password("ada"), "pear");
  EXPECT_THAT(store_.items(),
              ElementsAre(StoredCredential{service, "bob", "plum"}, StoredCredential{service, "ada", "pear"}));
}

TEST_F(KeychainAccessTest, store_addsLooksUpRemovesAndAddsAgain_whenTheItemExists) {
  store_.put(service, "ada", "apple");
  storePassword("pear");
  EXPECT_THAT(store_.calls(), ElementsAre(CredentialCall{CredentialOperation::Add, service, "ada"},
                                          CredentialCall{CredentialOperation::Find, service, "ada"},
                                          CredentialCall{CredentialOperation::Remove, "", ""},
                                          CredentialCall{CredentialOperation::Add, service, "ada"}));
}

TEST_F(KeychainAccessTest, store_looksForNoSecret_whenItReplaces) {
  store_.put(service, "ada", "apple");
  store_.failToRead(service, "ada", CredentialError::Locked);
  storePassword("pear");
  EXPECT_EQ(store_.secret(service, "ada"), "pear");
}

TEST_F(KeychainAccessTest, store_leavesTheOldPassword_whenItCannotBeRemoved) {
  store_.put(service, "ada", "apple");
  store_.fail(CredentialOperation::Remove, CredentialError::Locked);
  storePassword("pear");
  EXPECT_EQ(store_.secret(service, "ada"), "apple");
  EXPECT_EQ(store_.callCount(), 3U);
}

TEST_F(KeychainAccessTest, store_givesUp_whenTheExistingItemIsGoneMeanwhile) {
  store_.failOnce(CredentialOperation::Add, CredentialError::DuplicateItem);
  storePassword("pear");
  EXPECT_THAT(store_.items(), IsEmpty());
  EXPECT_EQ(store_.callCount(), 2U);
}

TEST_F(KeychainAccessTest, store_ignoresHowTheSecondAddEnds) {
  store_.put(service, "ada", "apple");
  store_.failOnce(CredentialOperation::Add, CredentialError::DuplicateItem);
  store_.failOnce(CredentialOperation::Add, CredentialError::Failed);
  storePassword("pear");
  EXPECT_THAT(store_.items(), IsEmpty());
  EXPECT_EQ(store_.callCount(), 4U);
  EXPECT_THAT(platform_.log->lines(), IsEmpty());
}

TEST_F(KeychainAccessTest, store_triesNothingElse_afterAnyOtherFailure) {
  store_.fail(CredentialOperation::Add, CredentialError::Failed);
  storePassword("apple");
  EXPECT_EQ(store_.callCount(), 1U);
  EXPECT_THAT(platform_.log->lines(), IsEmpty());
}

TEST_F(KeychainAccessTest, store_keepsEmptyData_whenThePasswordIsEmptyOrAbsent) {
  storePassword("");
  EXPECT_EQ(store_.secret(service, "ada"), "");
  storePassword("apple");
  storePassword(std::nullopt);
  EXPECT_EQ(password("ada"), "");
  EXPECT_EQ(store_.items().size(), 1U);
}

TEST_F(KeychainAccessTest, password_isNullWithoutTouchingTheStore_whenTheUserNameIsNullOrEmpty) {
  store_.put(service, "", "apple");
  EXPECT_EQ(password(std::nullopt), std::nullopt);
  EXPECT_EQ(password(""), std::nullopt);
  EXPECT_EQ(store_.callCount(), 0U);
}

TEST_F(KeychainAccessTest, everyOperation_leavesTheStoreAlone_whenAnArgumentIsEmpty) {
  for (const auto& absent : {std::optional<std::string>(), std::optional<std::string>("")}) {
    EXPECT_EQ(LMRKeychainAccess::passwordForUserName_server("ada", absent), std::nullopt);
    LMRKeychainAccess::storePassword_forUserName_server("apple", absent, server);
    LMRKeychainAccess::storePassword_forUserName_server("apple", "ada", absent);
    LMRKeychainAccess::removePasswordForUserName_server(absent, server);
    LMRKeychainAccess::removePasswordForUserName_server("ada", absent);
    EXPECT_EQ(LMRKeychainAccess::credentialsForServer(absent), std::nullopt);
    EXPECT_EQ(LMRKeychainAccess::mostRecentUserNameForServer(absent), std::nullopt);
  }
  EXPECT_EQ(store_.callCount(), 0U);
}

TEST_F(KeychainAccessTest, password_isNull_whenThereIsNone) {
  store_.put(service, "bob", "plum");
  EXPECT_EQ(password("ada"), std::nullopt);
}

TEST_F(KeychainAccessTest, password_isNull_whenItsBytesAreNotUTF8) {
  for (const char* const bytes : {"\xff\xfe", "apple\xc3", "\xc0\x80", "\xed\xa0\x80", "\xf4\x90\x80\x80", "\x80"}) {
    store_.put(service, bytes, bytes);
    store_.put(service, "ada", bytes);
    EXPECT_EQ(password("ada"), std::nullopt) << bytes;
    removePassword();
  }
}

TEST_F(KeychainAccessTest, password_isWhole_whenItHoldsNullsAndAnyCharacters) {
  const std::string unusual("a\0\xf0\x9f\x8e\x99\xef\xbf\xbf\n", 10);
  storePassword(unusual);
  EXPECT_EQ(password("ada"), unusual);
}

TEST_F(KeychainAccessTest, password_isNullSilently_whenTheStoreFails) {
  store_.put(service, "ada", "apple");
  store_.fail(CredentialOperation::Find, CredentialError::NotAvailable);
  EXPECT_EQ(password("ada"), std::nullopt);
  EXPECT_THAT(platform_.log->lines(), IsEmpty());
}

TEST_F(KeychainAccessTest, remove_takesTheOneItemAway) {
  store_.put(service, "ada", "apple");
  store_.put(service, "bob", "plum");
  store_.put("Lumora: other.example.org", "ada", "cherry");
  removePassword();
  EXPECT_THAT(store_.items(), ElementsAre(StoredCredential{service, "bob", "plum"},
                                          StoredCredential{"Lumora: other.example.org", "ada", "cherry"}));
}

TEST_F(KeychainAccessTest, remove_hasNoEffect_whenThereIsNothingOrTheStoreFails) {
  removePassword();
  store_.put(service, "ada", "apple");
  store_.fail(CredentialOperation::Find, CredentialError::TimedOut);
  removePassword();
  store_.fail(CredentialOperation::Find, std::nullopt);
  store_.fail(CredentialOperation::Remove, CredentialError::Locked);
  removePassword();
  EXPECT_EQ(store_.items().size(), 1U);
  EXPECT_THAT(platform_.log->lines(), IsEmpty());
}

TEST_F(KeychainAccessTest, credentials_areAnEmptyArray_whenTheServerHasNoItems) {
  store_.put("Lumora: other.example.org", "ada", "apple");
  EXPECT_EQ(LMRKeychainAccess::credentialsForServer(server), Array());
}

TEST_F(KeychainAccessTest, credentials_areNull_whenTheServerIsEmpty) {
  EXPECT_EQ(LMRKeychainAccess::credentialsForServer(""), std::nullopt);
  EXPECT_EQ(LMRKeychainAccess::credentialsForServer(std::nullopt), std::nullopt);
}

TEST_F(KeychainAccessTest, credentials_areInTheStoresOrderWithEveryDuplicate) {
  store_.put(service, "zoe", "plum");
  store_.put(service, "ada", "apple");
  store_.put(service, "zoe", "pear");
  EXPECT_EQ(LMRKeychainAccess::credentialsForServer(server),
            (Array{credential("zoe", "plum"), credential("ada", "apple"), credential("zoe", "pear")}));
}

TEST_F(KeychainAccessTest, credentials_leaveOutAnItem_whenItsAccountOrPasswordIsEmpty) {
  store_.put(service, "", "plum");
  store_.put(service, "bob", "");
  store_.put(service, "ada", "apple");
  EXPECT_EQ(LMRKeychainAccess::credentialsForServer(server), Array{credential("ada", "apple")});
  EXPECT_THAT(platform_.log->lines(), IsEmpty());
}

TEST_F(KeychainAccessTest, credentials_leaveOutAnItem_whenItIsNotUTF8) {
  store_.put(service, "ada", "\xff");
  store_.put(service, "\xff", "apple");
  EXPECT_EQ(LMRKeychainAccess::credentialsForServer(server), Array());
}

TEST_F(KeychainAccessTest, credentials_logAndLeaveOutAnItem_whenItCannotBeRead) {
  store_.put(service, "bob", "plum");
  store_.put(service, "ada", "apple");
  store_.failToRead(service, "bob", CredentialError::DuplicateItem);
  EXPECT_EQ(LMRKeychainAccess::credentialsForServer(server), Array{credential("ada", "apple")});
  EXPECT_THAT(platform_.log->lines(),
              ElementsAre("Reading the account and the password of a keychain item failed: -25299"));
}

TEST_F(KeychainAccessTest, credentials_areAnEmptyArray_whenTheSearchCannotBeStarted) {
  store_.put(service, "ada", "apple");
  store_.fail(CredentialOperation::List, CredentialError::NotAvailable);
  EXPECT_EQ(LMRKeychainAccess::credentialsForServer(server), Array());
  EXPECT_THAT(platform_.log->lines(), IsEmpty());
}

TEST_F(KeychainAccessTest, items_areDistinct_onlyIfTheServerStringsDiffer) {
  LMRKeychainAccess::storePassword_forUserName_server("apple", "ada", "host");
  LMRKeychainAccess::storePassword_forUserName_server("pear", "ada", "host:8171");
  EXPECT_EQ(LMRKeychainAccess::passwordForUserName_server("ada", "host"), "apple");
  EXPECT_EQ(LMRKeychainAccess::passwordForUserName_server("ada", "host:8171"), "pear");
  // One name for both ports is one item.
  LMRKeychainAccess::storePassword_forUserName_server("plum", "ada", "host");
  EXPECT_EQ(store_.items().size(), 2U);
}

TEST_F(KeychainAccessTest, server_isTakenAsItIs_whenItHoldsAPlaceHolder) {
  LMRKeychainAccess::storePassword_forUserName_server("apple", "ada", "%@%d");
  EXPECT_EQ(store_.secret("Lumora: %@%d", "ada"), "apple");
}

TEST_F(KeychainAccessTest, mostRecentUserName_isThatOfTheConnectionInPreferences) {
  const auto recent = [] { return LMRKeychainAccess::mostRecentUserNameForServer(server); };
  const auto defaults = LMRFrameworkUserDefaults::standardFrameworkUserDefaults();
  for (const Value& absent :
       {Value("text"), Value(Dictionary{}), Value(Dictionary{{server, "text"}}),
        Value(Dictionary{{server, Dictionary{}}}), Value(Dictionary{{server, Dictionary{{"userName", 1}}}}),
        Value(Dictionary{{"other", Dictionary{{"userName", "ada"}}}})}) {
    defaults->setObject_forKey(absent, "RecentConnections");
    EXPECT_EQ(recent(), std::nullopt) << absent.description();
  }
  defaults->removeObjectForKey("RecentConnections");
  EXPECT_EQ(recent(), std::nullopt);
  defaults->setObject_forKey(Dictionary{{server, Dictionary{{"userName", "ada"}}}}, "RecentConnections");
  EXPECT_EQ(recent(), "ada");
  EXPECT_EQ(store_.callCount(), 0U);
}

} // namespace
