#include "HelperAgentTest.h"
#include "support/SilentSocket.h"
#include "support/ValuePrinter.h"

#include <gmock/gmock.h>

#include <cstdlib>
#include <thread>

using lumora::Dictionary;
using lumora::HelperAgentError;
using testing::HasSubstr;

namespace {

class FailureTest : public lumora::tests::HelperAgentTest {
protected:
  static void expectFailure(const Answer& answer, HelperAgentError code, const char* text) {
    EXPECT_EQ(answer.reply, std::nullopt);
    ASSERT_TRUE(answer.error);
    EXPECT_EQ(answer.error->domain(), lumora::HelperAgentErrorDomain);
    EXPECT_EQ(answer.error->code(), static_cast<int>(code)) << answer.error->description();
    EXPECT_THAT(answer.error->localizedDescription(), HasSubstr(text));
  }
};

TEST_F(FailureTest, isThatThereIsNoBus_whenNobodyListens) {
  ::setenv("DBUS_SYSTEM_BUS_ADDRESS", "unix:path=/nonexistent/bus", 1);
  expectFailure(perform("echo"), HelperAgentError::NoBus, "The system bus cannot be reached: ");
}

TEST_F(FailureTest, isThatThereIsNoBus_whenTheAddressIsNone) {
  ::setenv("DBUS_SYSTEM_BUS_ADDRESS", "no address", 1);
  expectFailure(perform("echo"), HelperAgentError::NoBus, "The system bus cannot be reached: ");
}

TEST_F(FailureTest, isThatThereIsNoBus_whenItNeverAnswersWithinTheDeadline) {
  const lumora::tests::TemporaryFolder folder;
  const std::string path = folder / "bus";
  const lumora::tests::SilentSocket bus(path);
  ::setenv("DBUS_SYSTEM_BUS_ADDRESS", ("unix:path=" + path).c_str(), 1);
  lumora::backend::DBusHelperAgent impatient(std::chrono::milliseconds(200));
  expectFailure(perform(impatient, "echo", {}, nullptr), HelperAgentError::NoBus, "The system bus cannot be reached: ");
}

TEST_F(FailureTest, isThatThereIsNoAgent_whenNobodyServes) {
  agent_->kill();
  expectFailure(perform("echo"), HelperAgentError::NoAgent, "There is no helper agent org.vantor.lumagentconfigd: ");
}

TEST_F(FailureTest, isThatThereIsNoAgent_whenTheDomainOrTheNameIsNone) {
  for (const auto& [agent, domain] : {std::pair("org.vantor.lumagentconfigd", "user"), std::pair("no name", "system"),
                                      std::pair("", "system"), std::pair("\xff.\xff", "system")}) {
    Answer answer;
    answer.reply = agents_.performCommand(agent, domain, nullptr, "echo", {}, &answer.error);
    expectFailure(answer, HelperAgentError::NoAgent, "There is no such helper agent");
  }
}

TEST_F(FailureTest, isThatTheAgentEnded_whenItCrashesInMidCall) {
  expectFailure(perform("crash"), HelperAgentError::AgentEnded, "org.vantor.lumagentconfigd ended without a reply: ");
}

TEST_F(FailureTest, isOver_whenTheAgentIsStartedAgain) {
  perform("crash");
  ASSERT_TRUE(startAgent());
  EXPECT_EQ(perform("echo").reply, Dictionary());
}

TEST_F(FailureTest, isThatTheDeadlineHasPassed_whenTheAgentHangs) {
  lumora::backend::DBusHelperAgent impatient(std::chrono::milliseconds(200));
  expectFailure(perform(impatient, "hang"), HelperAgentError::TimedOut,
                "org.vantor.lumagentconfigd did not reply in time: ");
}

TEST_F(FailureTest, isThatTheRequestIsTooLarge_beforeAnythingIsSent) {
  const Dictionary tooLarge{{"text", std::string(lumora::MaximumHelperAgentRequest, 'x')}};
  expectFailure(perform("echo", tooLarge), HelperAgentError::RequestTooLarge, "takes no more than 16777216");
  EXPECT_EQ(perform("echo").reply, Dictionary());
  EXPECT_EQ(agent_->readLine(), "echo");
}

TEST_F(FailureTest, isNone_whenTheRequestIsJustNotTooLarge) {
  const Dictionary large{{"text", std::string(lumora::MaximumHelperAgentRequest - 1024, 'x')}};
  const auto [reply, error] = perform("echo", large);
  ASSERT_FALSE(error) << error->description();
  EXPECT_TRUE(reply == large);
}

TEST_F(FailureTest, isThatTheRequestIsUnwritable_whenNoPropertyListCarriesIt) {
  for (const std::string& text : {std::string("\xff"), std::string("bell\a"), std::string("zero\0", 5)}) {
    expectFailure(perform("echo", {{"text", text}}), HelperAgentError::RequestUnwritable, "cannot be written");
  }
  for (const std::string& command : {std::string("\xff"), std::string("zero\0", 5)}) {
    expectFailure(perform(command), HelperAgentError::RequestUnwritable, "The command is not a text");
  }
}

TEST_F(FailureTest, isThatTheReplyIsMalformed_whenItIsNoPropertyListOfADictionary) {
  for (const char* const command : {"garbage", "array", "number"}) {
    expectFailure(perform(command), HelperAgentError::MalformedReply, "The helper agent's reply cannot be read: ");
  }
}

TEST_F(FailureTest, isTheAgentsOwn_whenItSaysWhatIsWrong) {
  expectFailure(perform("fail"), HelperAgentError::Refused, "org.vantor.lumagentconfigd refused: disk on fire");
}

TEST_F(FailureTest, isThatTheBusIsLost_whenItEndsInMidCall) {
  const auto authorization = authorize(agents_);
  ASSERT_TRUE(authorization);
  Answer answer;
  std::jthread caller([&] { answer = perform(agents_, "hang", {}, &*authorization); });
  ASSERT_EQ(agent_->readLine(), "hang");
  bus_.stop();
  caller.join();
  expectFailure(answer, HelperAgentError::NoBus, "The connection to the system bus was lost");
}

TEST_F(FailureTest, isOver_whenTheBusIsStartedAgain) {
  EXPECT_EQ(perform("echo").reply, Dictionary());
  bus_.stop();
  EXPECT_EQ(perform("echo").reply, std::nullopt);
  ASSERT_TRUE(bus_.start());
  ASSERT_TRUE(startAgent());
  EXPECT_EQ(perform("echo").reply, Dictionary());
}

TEST_F(FailureTest, needsNoPlaceForTheError) {
  agent_->kill();
  EXPECT_EQ(agents_.performCommand(identifier, KTHelperAgentDomainSystem, nullptr, "echo", {}, nullptr), std::nullopt);
  EXPECT_EQ(authorize(agents_), std::nullopt);
}

} // namespace
