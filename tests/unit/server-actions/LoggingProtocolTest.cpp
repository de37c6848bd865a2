#include "ServerActionTest.h"

#include <LumoraKit/platform/PropertyList.h>

#include <gmock/gmock.h>

using lumora::Array;
using lumora::Dictionary;
using lumora::tests::passwordSession;
using testing::HasSubstr;
using testing::Not;

namespace {

TEST(LoggingProtocolTest, serverIsThisMachine_whenThereIsNoSession) {
  EXPECT_TRUE(LMRAction("listinfo", std::nullopt).server().isCurrentHost());
}

TEST(LoggingProtocolTest, serverIsTheSessionsHost_whenThereIsASession) {
  const KTHost host = LMRAction("listinfo", std::nullopt, passwordSession()).server();
  EXPECT_FALSE(host.isCurrentHost());
  EXPECT_EQ(host.name(), "lumora.example.org");
}

TEST(LoggingProtocolTest, titleIsToolAndCommand) {
  EXPECT_EQ(LMRAction("listworkflows", std::nullopt).title(), "/usr/bin/lumctl listworkflows");
}

TEST(LoggingProtocolTest, titleShowsTheNullText_whenThereIsNoCommand) {
  EXPECT_EQ(LMRAction(std::nullopt, std::nullopt).title(), "/usr/bin/lumctl (null)");
}

TEST(LoggingProtocolTest, titleStartsWithLumexec_whenThereIsAnAuthorization) {
  const lumora::Authorization authorization;
  LMRAction action("bind", std::nullopt);
  action.setAuthorizationRef(&authorization);
  EXPECT_EQ(action.title(), "lumexec /usr/bin/lumctl bind");
}

TEST(LoggingProtocolTest, requestDescriptionIsThePropertyListOfTheArguments) {
  const Array arguments{"plist"};
  EXPECT_EQ(LMRAction("getconfig", arguments).requestDescription(), lumora::xmlDescription(arguments));
}

TEST(LoggingProtocolTest, requestDescriptionHoldsNoPassword) {
  const LMRAction action("getconfig", Array{"plist"}, passwordSession());
  EXPECT_THAT(action.requestDescription(), Not(HasSubstr("open sesame")));
}

TEST(LoggingProtocolTest, requestDescriptionIsPlain_whenNoPropertyListCanHoldTheArguments) {
  EXPECT_THAT(LMRAction("getconfig", Array{"bell\a"}).requestDescription(), HasSubstr("bell"));
}

TEST(LoggingProtocolTest, responseDescriptionIsThePropertyListOfTheResult) {
  const Dictionary reply{{"Bound", true}};
  LMRAction action("isbound", std::nullopt);
  action.setResult(std::make_shared<const Dictionary>(reply));
  EXPECT_EQ(action.responseDescription(), lumora::xmlDescription(reply));
}

TEST(LoggingProtocolTest, descriptionsAreTheNullText_whenThereIsNothing) {
  const LMRAction action("isbound", std::nullopt);
  EXPECT_EQ(action.requestDescription(), "(null)");
  EXPECT_EQ(action.responseDescription(), "(null)");
}

} // namespace
