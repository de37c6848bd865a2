#include "RecordingTool.h"
#include "support/Sessions.h"
#include "support/ToolArguments.h"

#include <LumoraKit/actions/LMRActionFactory.h>

#include <gmock/gmock.h>

using lumora::Array;
using lumora::tests::pair;
using lumora::tests::requestText;
using testing::HasSubstr;
using testing::Not;

namespace {

class RequestBytesTest : public lumora::tests::RecordingToolTest {
protected:
  std::string requestOf(const std::shared_ptr<LMRAction>& action) const {
    action->runSynchronously();
    return request();
  }

  std::shared_ptr<LMRSession> session_ = lumora::tests::passwordSession();
};

TEST_F(RequestBytesTest, areServerAuthUserPassAndCommand_whenTheSessionIsByPassword) {
  EXPECT_EQ(requestOf(LMRActionFactory::actionToListWorkflowsWithSession(session_)), requestText(R"(	<array>
		<string>server</string>
		<string>lumora.example.org:8170</string>
	</array>
	<array>
		<string>auth</string>
		<string>Password</string>
	</array>
	<array>
		<string>user</string>
		<string>alice</string>
	</array>
	<array>
		<string>pass</string>
		<string>open sesame</string>
	</array>
	<string>listworkflows</string>
)"));
}

TEST_F(RequestBytesTest, areServerAuthAndCommand_whenTheSessionIsByKerberos) {
  session_->setAuthenticationType(LMRAuthenticationTypeSingleSignOn);
  EXPECT_EQ(requestOf(LMRActionFactory::actionToListWorkflowsWithSession(session_)), requestText(R"(	<array>
		<string>server</string>
		<string>lumora.example.org:8170</string>
	</array>
	<array>
		<string>auth</string>
		<string>Kerberos</string>
	</array>
	<string>listworkflows</string>
)"));
}

TEST_F(RequestBytesTest, areCommandAndArgument_whenThereIsNoSession) {
  EXPECT_EQ(requestOf(LMRAction::actionWithCommand_arguments("getconfig", Array{"plist"})),
            requestText("\t<string>getconfig</string>\n\t<string>plist</string>\n"));
}

TEST_F(RequestBytesTest, areCommandAndServer_whenAServersInformationIsAskedFor) {
  EXPECT_EQ(requestOf(LMRActionFactory::actionToGetInfoForServer_port("lumora.example.org", 0)),
            requestText(R"(	<string>listinfo</string>
	<array>
		<string>server</string>
		<string>lumora.example.org:8170</string>
	</array>
)"));
}

TEST_F(RequestBytesTest, areSubcommandAndNoAuth_whenTheToolIsAnother) {
  install("/usr/bin/lumaction");
  session_->setPassword(std::nullopt);
  const auto action = LMRAction::actionWithCommand_arguments_session("workflow", std::nullopt, session_);
  action->setTool(std::string(LMRLumoraActionToolPath));
  EXPECT_EQ(requestOf(action), requestText(R"(	<array>
		<string>server</string>
		<string>lumora.example.org:8170</string>
	</array>
	<array>
		<string>user</string>
		<string>alice</string>
	</array>
	<array>
		<string>pass</string>
	</array>
	<array>
		<string>subcommand</string>
		<string>workflow</string>
	</array>
)"));
}

TEST_F(RequestBytesTest, keepNumbersAsNumbersAndFlagsAsWords) {
  const Array arguments{pair("start", "Studio A"), pair("delay", 5), "audio_only"};
  EXPECT_EQ(requestOf(LMRAction::actionWithCommand_arguments(std::nullopt, arguments)), requestText(R"(	<array>
		<string>start</string>
		<string>Studio A</string>
	</array>
	<array>
		<string>delay</string>
		<integer>5</integer>
	</array>
	<string>audio_only</string>
)"));
}

TEST_F(RequestBytesTest, carryTextsThatXMLEscapesAndOtherScripts) {
  const Array arguments{"a<b>&\"c\"", "Übung – 講義 1 🎥", " spaces\tand\nlines "};
  EXPECT_EQ(requestOf(LMRAction::actionWithCommand_arguments(std::nullopt, arguments)),
            requestText("\t<string>a&lt;b&gt;&amp;\"c\"</string>\n"
                        "\t<string>Übung – 講義 1 🎥</string>\n"
                        "\t<string> spaces\tand\nlines </string>\n"));
}

TEST_F(RequestBytesTest, areComplete_whenTheyAreLargerThanAPipe) {
  const std::string large(3'000'000, 'x');
  EXPECT_EQ(requestOf(LMRAction::actionWithCommand_arguments("echo", Array{large})),
            requestText("\t<string>echo</string>\n\t<string>" + large + "</string>\n"));
}

TEST_F(RequestBytesTest, aloneCarryThePassword) {
  requestOf(LMRActionFactory::actionToListWorkflowsWithSession(session_));
  EXPECT_EQ(commandLine(), (folder_ / "root/usr/bin/lumctl").string() + "\n--plistin\n");
}

TEST_F(RequestBytesTest, nameTheMetadataFiles_whenAFileIsSubmitted) {
  const auto action = LMRActionFactory::
      actionToSubmitFile_toSubmissionUUID_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
          "/tmp/take.mov", "B4C1", lumora::Dictionary{{"Title", "Lecture 1"}},
          lumora::Dictionary{{"RecordingMetadata_DURATION", 12}}, true, false, nullptr);
  const auto text = requestOf(action);
  const auto arguments = *action->arguments();
  const std::string metadata = *arguments.at(2).array()->at(1).string();
  const std::string recordingMetadata = *arguments.at(3).array()->at(1).string();
  EXPECT_EQ(text, requestText(R"(	<string>submit</string>
	<array>
		<string>async</string>
	</array>
	<array>
		<string>file</string>
		<string>/tmp/take.mov</string>
	</array>
	<array>
		<string>metadata</string>
		<string>)" + metadata +
                              R"(</string>
	</array>
	<array>
		<string>recording_metadata</string>
		<string>)" + recordingMetadata +
                              R"(</string>
	</array>
	<array>
		<string>submission_uuid</string>
		<string>B4C1</string>
	</array>
)"));
  EXPECT_EQ(lumora::tests::contentOf(metadata), R"(<?xml version="1.0" encoding="UTF-8"?>
<plist version="1.0">
<dict>
	<key>Title</key>
	<string>Lecture 1</string>
</dict>
</plist>
)");
  EXPECT_EQ(lumora::tests::contentOf(recordingMetadata), R"(<?xml version="1.0"?>
<LumoraServerAgentRecordingProperties>
  <RecordingProperties>
    <RecordingProperty key="RecordingMetadata_DURATION" value="12" />
  </RecordingProperties>
</LumoraServerAgentRecordingProperties>
)");
}

} // namespace
