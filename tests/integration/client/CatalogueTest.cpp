// The whole catalogue: which command line makes which request. A factory method that no command runs, and a command
// that is not tried here, are noticed.
#include "ClientTest.h"

#include <LumoraKit/platform/PropertyList.h>

#include <regex>
#include <set>

#include <client/grammar/Command.h>

using lumora::Array;
using lumora::Value;
using lumora::tests::FailedWith;
using lumora::tests::pair;

namespace {

struct Entry {
  /// The factory method that the command runs.
  std::string method;
  std::vector<std::string> arguments;
  /// What the tool receives behind the login; a path of written metadata as "*". Empty for what goes to the helper
  /// agent.
  Array request;
};

void PrintTo(const Entry& entry, std::ostream* out) {
  *out << entry.method;
}

constexpr const char* uuid = "419D1A54-0E66-4B57-ADE7-62480A41CAA2";
constexpr const char* file = LUMORA_CLIENT_PROGRAM;

std::vector<Entry> serverEntries() {
  return {
      {"actionToGetInfoForServer_port", {"info"}, {"listinfo", pair("server", "localhost:8170")}},
      {"actionToListWorkflowsWithSession", {"workflows"}, {"listworkflows"}},
      {"actionToGetWorkflowInformationWithUUID_withSession",
       {"workflow", "info", uuid},
       {"infoworkflow", pair("workflow_uuid", uuid)}},
      {"actionToInstallWorkflowFromPath_withMasterPassword_overwrite_withSession",
       {"workflow", "install", file, "--overwrite"},
       {"installworkflow", pair("path", file), "overwrite"}},
      {"actionToDownloadWorkflowWithUUID_toPath_withSession",
       {"workflow", "download", uuid, "out"},
       {"downloadworkflow", pair("workflow_uuid", uuid), pair("path", "*")}},
      {"actionToDeleteWorkflowWithUUID_withSession",
       {"workflow", "delete", uuid},
       {"deleteworkflow", pair("workflow_uuid", uuid)}},
      {"actionToCreateRecordingContainerForWorkflowUUID_session",
       {"recording", "create", uuid},
       {"create_recording", pair("workflow_uuid", uuid)}},
      {"actionToSubmitWorkflow_withMasterPassword_metadataPath_andInputs_withSession",
       {"workflow", "submit", "w", file},
       {pair("subcommand", "workflow"), pair("workflow", "w"), pair("metadata", "*"), pair("basedir", "/tmp"),
        pair("input", file)}},
  };
}

std::vector<Entry> cameraEntries() {
  return {
      {"actionToListRemoteCamerasWithSession", {"cameras"}, {"listcameras"}},
      {"actionToGetStatusForRemoteCamera_session", {"camera", "status", "A"}, {pair("status", "A")}},
      {"actionToUpdatePreviewImageForRemoteCamera_session",
       {"camera", "preview", "A", "out"},
       {pair("status", "A"), "update_preview_image", "include_preview_image"}},
      {"actionToStartRemoteCamera_afterDelay_audioOnly_session",
       {"camera", "start", "A", "--delay", "5"},
       {pair("start", "A"), pair("delay", 5)}},
      {"actionToPauseRemoteCamera_session", {"camera", "pause", "A"}, {pair("pause", "A")}},
      {"actionToResumeRemoteCamera_session", {"camera", "resume", "A"}, {pair("resume", "A")}},
      {"actionToCancelRemoteCamera_session", {"camera", "cancel", "A"}, {pair("cancel", "A")}},
      {"actionToStopRemoteCamera_andSubmitToWorkflow_withMetadata_session",
       {"camera", "stop", "A", "--workflow", "w"},
       {pair("stop", "A"), pair("metadata", "*"), pair("workflow", "w")}},
      {"actionToStopRemoteCamera_andSubmitToSubmissionUUID_withMetadata_session",
       {"camera", "stop", "A", "--submission", "u"},
       {pair("stop", "A"), pair("metadata", "*"), pair("submission_uuid", "u")}},
  };
}

std::vector<Entry> submissionEntries() {
  return {
      {"actionToSubmitFile_toWorkflow_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session",
       {"submit", file, "--workflow", "w", "--recording-duration", "2", "--async", "--delete"},
       {"submit", pair("async"), pair("delete"), pair("file", file), pair("metadata", "*"),
        pair("recording_metadata", "*"), pair("workflow", "w")}},
      {"actionToSubmitFile_toSubmissionUUID_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session",
       {"submit", file, "--submission", "u"},
       {"submit", pair("file", file), pair("metadata", "*"), pair("submission_uuid", "u")}},
      {"actionToSubmitFiles_toWorkflow_metadata_asynchronous_deleteAfterSubmission_session",
       {"submit", file, "--workflow", "w", file},
       {"submit", pair("file", file), pair("file", file), pair("metadata", "*"), pair("workflow", "w")}},
      {"actionToListCurrentTransfers", {"transfers"}, {"list_uploads"}},
      {"actionToClearCurrentTransfersList", {"transfers", "clear"}, {"clear_completed_uploads"}},
  };
}

std::vector<Entry> sharingEntries() {
  return {
      {"actionToGetCameraBindingStatus", {"sharing"}, {"isbound", "plist"}},
      {"actionToGetRemoteRecorderConfiguration", {"config", "get"}, {"getconfig", "plist"}},
      {"actionToSetRemoteRecorderConfigurationValue_forKey_authorization", {"config", "set", "Capture", "high"}, {}},
      {"actionToBindCamera_session_authorization", {"bind", "A"}, {}},
      {"actionToUnbindCamera_session_authorization", {"unbind", "A"}, {}},
  };
}

std::vector<Entry> allEntries() {
  std::vector<Entry> all;
  for (auto* const part : {&serverEntries, &cameraEntries, &submissionEntries, &sharingEntries}) {
    const auto entries = part();
    all.insert(all.end(), entries.begin(), entries.end());
  }
  return all;
}

Value withoutWrittenPath(const Value& word) {
  const Array* const elements = word.array();
  const std::string* const last = elements != nullptr && elements->size() == 2 ? elements->back().string() : nullptr;
  const bool isWritten =
      last != nullptr && (last->ends_with(".plist") || last->ends_with(".xml") || last->ends_with("/out"));
  return isWritten ? pair(elements->front(), "*") : word;
}

class CatalogueTest : public lumora::tests::ClientTest, public testing::WithParamInterface<Entry> {};

TEST_P(CatalogueTest, commandMakesTheRequest) {
  ::setenv("DBUS_SYSTEM_BUS_ADDRESS", ("unix:path=" + (folder_ / "bus").string()).c_str(), 1);
  auto arguments = GetParam().arguments;
  std::ranges::replace(arguments, "out", (folder_ / "out").string());
  const auto result = run(arguments);
  ::unsetenv("DBUS_SYSTEM_BUS_ADDRESS");
  if (GetParam().request.empty()) {
    EXPECT_THAT(result, FailedWith(69, "The system bus cannot be reached"));
    EXPECT_THAT(requests(), testing::IsEmpty());
    return;
  }
  // What it is good for is tried elsewhere; here it may be refused.
  auto words = request();
  std::ranges::transform(words, words.begin(), withoutWrittenPath);
  EXPECT_EQ(words, GetParam().request);
}

INSTANTIATE_TEST_SUITE_P(Every, CatalogueTest, testing::ValuesIn(allEntries()),
                         [](const auto& entry) { return entry.param.method; });

std::set<std::string> methodsOf(const std::string& header) {
  const auto text = lumora::tests::contentOf(std::filesystem::path(LUMORA_SOURCE_DIR) / "LumoraKit/actions" / header);
  const std::regex declaration(R"(\b(actionTo\w+)\()");
  std::set<std::string> methods;
  for (auto found = std::sregex_iterator(text.begin(), text.end(), declaration); found != std::sregex_iterator();
       ++found) {
    methods.insert((*found)[1]);
  }
  return methods;
}

TEST(CatalogueCoverage, everyFactoryMethodHasACommand) {
  auto declared = methodsOf("LMRActionFactory.h");
  declared.merge(methodsOf("LMRToolActionFactory.h"));
  ASSERT_FALSE(declared.empty());
  std::set<std::string> tried;
  for (const auto& entry : allEntries()) {
    tried.insert(entry.method);
  }
  EXPECT_EQ(tried, declared);
}

TEST(CatalogueCoverage, everyCommandIsTried) {
  // The login runs two methods of the catalogue, and is tried by itself; so are the commands about the keychain.
  std::set<std::string> tried{"login", "password store", "password forget"};
  for (const auto& entry : allEntries()) {
    tried.insert(entry.arguments[0]);
    tried.insert(entry.arguments[0] + " " + (entry.arguments.size() > 1 ? entry.arguments[1] : ""));
  }
  for (const auto& command : lumora::client::allCommands()) {
    EXPECT_TRUE(tried.contains(std::string(command.words))) << command.words;
  }
}

} // namespace
