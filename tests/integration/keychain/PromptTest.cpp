#include "KeychainTest.h"
#include "ScriptedService.h"

namespace lumora::tests {
namespace {

// What a user does who is asked to unlock the collection.
class PromptTest : public KeychainTest {
protected:
  bool start(const std::string& script) {
    scripted_ = ChildProgram::startSelf({scriptedServiceRole, script});
    return scripted_ && scripted_->readLine() == "ready";
  }
  void expectReadingFails(CredentialError code, backend::SecretServiceDeadlines deadlines = generousDeadlines) {
    backend::SecretServiceStore store(backend::userRuntimeFolder(), deadlines);
    LMRErrorRef error;
    EXPECT_EQ(secretOf(store, "ada", &error), "(none)");
    expectError(error, code);
  }

  std::unique_ptr<ChildProgram> scripted_;
};

TEST_F(PromptTest, secretIsRead_whenTheUserUnlocks) {
  ASSERT_TRUE(start("agree"));
  EXPECT_EQ(secretOf("ada"), "apple");
  EXPECT_EQ(LMRKeychainAccess::passwordForUserName_server("ada", server), "apple");
}

TEST_F(PromptTest, isThatItIsLocked_whenTheUserRefuses) {
  ASSERT_TRUE(start("refuse"));
  expectReadingFails(CredentialError::Locked);
  EXPECT_EQ(LMRKeychainAccess::passwordForUserName_server("ada", server), std::nullopt);
}

TEST_F(PromptTest, isThatItIsLocked_whenNobodyAnswersInTime) {
  ASSERT_TRUE(start("hang"));
  expectReadingFails(CredentialError::Locked, {generousDeadlines.answer, std::chrono::milliseconds(200)});
}

TEST_F(PromptTest, isThatItIsLocked_whenTheServiceDiesMeanwhile) {
  ASSERT_TRUE(start("die"));
  expectReadingFails(CredentialError::Locked, {generousDeadlines.answer, std::chrono::hours(1)});
}

TEST_F(PromptTest, itemsAreListedWithTheirError_whenTheUserRefuses) {
  ASSERT_TRUE(start("refuse"));
  std::vector<CredentialItem> items;
  EXPECT_FALSE(store_->list(service, items));
  ASSERT_EQ(items.size(), 1U);
  expectError(items.front().error, CredentialError::Locked);
}

TEST_F(PromptTest, everyCallFails_whenTheServiceAnswersNonsense) {
  ASSERT_TRUE(start("nonsense"));
  expectReadingFails(CredentialError::Damaged);
  expectError(add("ada", "apple"), CredentialError::Damaged);
  expectError(store_->remove("/org/freedesktop/secrets/collection/one/1"), CredentialError::Damaged);
  std::vector<CredentialItem> items;
  expectError(store_->list(service, items), CredentialError::Damaged);
}

} // namespace
} // namespace lumora::tests
