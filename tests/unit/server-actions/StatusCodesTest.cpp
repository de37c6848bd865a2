#include "ServerActionTest.h"

#include <gmock/gmock.h>

#include <cstdlib>
#include <map>

using lumora::Dictionary;
using lumora::fakes::FakePlatform;

namespace {

LMRErrorRef errorFor(std::int64_t status, const std::optional<std::string>& standardError = std::nullopt) {
  return LMRAction::errorForStatusCode_standardError(status, standardError);
}

const std::map<std::int64_t, std::string> documentedMessages{
    {10, "Not authorized as root"},
    {11, "Invalid input"},
    {12, "Invalid arguments"},
    {20, "Server is unavailable"},
    {21, "No server at hostname"},
    {22, "No response from server"},
    {23, "Server is not running SSL"},
    {24, "Invalid server certificate"},
    {25, "Unknown server error"},
    {26, "Not authorized"},
    {30, "Submission failed"},
    {31, "Upload server is unavailable"},
    {32, "File upload failed"},
    {33, "File copy failed"},
    {34, "Failed to complete submission"},
    {35, "Couldn't start sharing"},
    {36, "Remote camera failure"},
    {37, "Unknown server error"},
};

class StatusCodesTest : public testing::Test {
protected:
  FakePlatform platform_;
};

TEST_F(StatusCodesTest, hasAMessageForEachDocumentedStatusAndTheGeneralOneForTheRest) {
  for (std::int64_t status = -2; status < 260; ++status) {
    const auto documented = documentedMessages.find(status);
    EXPECT_EQ(errorFor(status)->localizedDescription(),
              documented != documentedMessages.end() ? documented->second : "Generic podcast error")
        << status;
  }
}

TEST_F(StatusCodesTest, status26_givesNotAuthorizedAndTheStandardError) {
  const auto error = errorFor(26, "bad password");
  EXPECT_EQ(error->domain(), "org.vantor.Lumora");
  EXPECT_EQ(error->code(), 26);
  EXPECT_EQ(error->localizedDescription(), "Not authorized");
  EXPECT_EQ(error->userInfo(), (Dictionary{{"LocalizedDescription", "Not authorized"}, {"stderr", "bad password"}}));
}

TEST_F(StatusCodesTest, status25And37_giveTheSameMessage) {
  EXPECT_EQ(errorFor(25)->localizedDescription(), "Unknown server error");
  EXPECT_EQ(errorFor(37)->localizedDescription(), "Unknown server error");
}

TEST_F(StatusCodesTest, status13_givesTheGeneralMessage) {
  EXPECT_EQ(errorFor(13)->localizedDescription(), "Generic podcast error");
  EXPECT_EQ(errorFor(13)->code(), 13);
}

TEST_F(StatusCodesTest, userInformationHoldsTheDescriptionOnly_whenStandardErrorIsAbsent) {
  EXPECT_EQ(errorFor(26)->userInfo(), (Dictionary{{"LocalizedDescription", "Not authorized"}}));
}

TEST_F(StatusCodesTest, keepsAnEmptyStandardError) {
  EXPECT_EQ(errorFor(26, "")->userInfo().string("stderr"), "");
}

// The messages belong to the process, so what they are made of is tried in a process of its own.

[[noreturn]] void exitWith(bool isExpected) {
  std::_Exit(isExpected ? EXIT_SUCCESS : EXIT_FAILURE);
}

[[noreturn]] void useInTwoLanguages() {
  const FakePlatform platform;
  platform.application->setLanguage("de");
  const LMRAction firstUse("listinfo", std::nullopt);
  platform.application->setLanguage("fr");
  const bool knownStay = errorFor(26)->localizedDescription() == "Keine Berechtigung";
  const bool generalFollows = errorFor(13)->localizedDescription() == "Erreur générale de podcast";
  exitWith(knownStay && generalFollows);
}

TEST(StatusCodesDeathTest, knownMessagesAreLocalisedOnceAtFirstUseAndTheGeneralOneEachTime) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  EXPECT_EXIT(useInTwoLanguages(), testing::ExitedWithCode(EXIT_SUCCESS), "");
}

} // namespace
