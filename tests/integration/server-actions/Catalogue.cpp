#include "Catalogue.h"

#include "support/ToolArguments.h"

#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/actions/LMRToolActionFactory.h>

#include <iterator>

namespace lumora::tests {
namespace {

using Factory = LMRActionFactory;
using Session = std::shared_ptr<LMRSession>;
using Entries = std::vector<CatalogueEntry>;

const Dictionary userMetadata{{"Title", "Lecture 1"}};
const Dictionary recordingMetadata{{"RecordingMetadata_DURATION", 12}};

// A method of a session alone, or of nothing.
template <class Method> CatalogueEntry::Make ofSession(Method method) {
  return [method](const Session& session, AuthorizationRef) { return method(session); };
}
template <class Method> CatalogueEntry::Make ofNothing(Method method) {
  return [method](const Session&, AuthorizationRef) { return method(); };
}
// A method of one text and a session.
template <class Method> CatalogueEntry::Make ofText(Method method, const char* text) {
  return [method, text](const Session& session, AuthorizationRef) { return method(text, session); };
}
template <class Method> CatalogueEntry::Make ofTextAndAuthorization(Method method, const char* text) {
  return [method, text](const Session& session, AuthorizationRef authorization) {
    return method(text, session, authorization);
  };
}

Entries workflowEntries() {
  return {
      {"listinfo",
       [](const Session&, AuthorizationRef) {
         return Factory::actionToGetInfoForServer_port("lumora.example.org", 8080);
       },
       {"listinfo", pair("server", "lumora.example.org:8080")},
       "Connecting…",
       false},
      {"listinfo_onTheDefaultPort",
       [](const Session&, AuthorizationRef) { return Factory::actionToGetInfoForServer_port("lumora.example.org", 0); },
       {"listinfo", pair("server", "lumora.example.org:8170")},
       "Connecting…",
       false},
      {"listworkflows", ofSession(&Factory::actionToListWorkflowsWithSession), {"listworkflows"}, "Getting workflows…"},
      {"infoworkflow",
       ofText(&Factory::actionToGetWorkflowInformationWithUUID_withSession, "W-1"),
       {"infoworkflow", pair("workflow_uuid", "W-1")},
       "Getting workflow information…"},
      {"downloadworkflow",
       [](const Session& session, AuthorizationRef) {
         return Factory::actionToDownloadWorkflowWithUUID_toPath_withSession("W-1", "/tmp/w", session);
       },
       {"downloadworkflow", pair("workflow_uuid", "W-1"), pair("path", "/tmp/w")},
       "Downloading workflow…"},
      {"deleteworkflow",
       ofText(&Factory::actionToDeleteWorkflowWithUUID_withSession, "W-1"),
       {"deleteworkflow", pair("workflow_uuid", "W-1")},
       "Deleting workflow…"},
      {"create_recording",
       ofText(&Factory::actionToCreateRecordingContainerForWorkflowUUID_session, "W-1"),
       {"create_recording", pair("workflow_uuid", "W-1")},
       "Creating recording container…"},
  };
}

CatalogueEntry installation(std::string name, std::optional<std::string> masterPassword, bool overwrite, Array words) {
  return {std::move(name),
          [masterPassword, overwrite](const Session& session, AuthorizationRef) {
            return Factory::actionToInstallWorkflowFromPath_withMasterPassword_overwrite_withSession(
                "/tmp/w", masterPassword, overwrite, session);
          },
          std::move(words), "Installing workflow…"};
}

Entries installationEntries() {
  const Value path = pair("path", "/tmp/w");
  const Value password = pair("master_password", "sesame");
  return {
      installation("installworkflow", std::nullopt, false, {"installworkflow", path}),
      installation("installworkflow_overwriting", std::nullopt, true, {"installworkflow", path, "overwrite"}),
      installation("installworkflow_withMasterPassword", "sesame", false, {"installworkflow", path, password}),
      installation("installworkflow_withBoth", "sesame", true, {"installworkflow", path, password, "overwrite"}),
  };
}

CatalogueEntry cameraStart(std::string name, std::uint64_t delay, bool audioOnly, Array words) {
  return {std::move(name),
          [delay, audioOnly](const Session& session, AuthorizationRef) {
            return Factory::actionToStartRemoteCamera_afterDelay_audioOnly_session("Studio A", delay, audioOnly,
                                                                                   session);
          },
          std::move(words), "Starting remote camera recording…"};
}

Entries cameraEntries() {
  return {
      {"listcameras",
       ofSession(&Factory::actionToListRemoteCamerasWithSession),
       {"listcameras"},
       "Getting remote cameras…"},
      {"status",
       ofText(&Factory::actionToGetStatusForRemoteCamera_session, "Studio A"),
       {pair("status", "Studio A")},
       "Getting remote camera status…"},
      {"status_withPreview",
       ofText(&Factory::actionToUpdatePreviewImageForRemoteCamera_session, "Studio A"),
       {pair("status", "Studio A"), "update_preview_image", "include_preview_image"},
       "Getting remote camera preview…"},
      cameraStart("start", 5, false, {pair("start", "Studio A"), pair("delay", 5)}),
      cameraStart("start_ofSound", 0, true, {pair("start", "Studio A"), pair("delay", 0), "audio_only"}),
      cameraStart("start_afterTheLongestDelay", UINT64_MAX, false,
                  {pair("start", "Studio A"), pair("delay", std::uint64_t{UINT64_MAX})}),
      {"pause",
       ofText(&Factory::actionToPauseRemoteCamera_session, "Studio A"),
       {pair("pause", "Studio A")},
       "Pausing remote camera recording…"},
      {"resume",
       ofText(&Factory::actionToResumeRemoteCamera_session, "Studio A"),
       {pair("resume", "Studio A")},
       "Resuming remote camera recording…"},
      {"cancel",
       ofText(&Factory::actionToCancelRemoteCamera_session, "Studio A"),
       {pair("cancel", "Studio A")},
       "Cancelling remote camera recording…"},
      {"stop_intoAWorkflow",
       [](const Session& session, AuthorizationRef) {
         return Factory::actionToStopRemoteCamera_andSubmitToWorkflow_withMetadata_session("Studio A", "Lectures",
                                                                                           userMetadata, session);
       },
       {pair("stop", "Studio A"), pair("metadata", "*.plist"), pair("workflow", "Lectures")},
       "Stopping and submitting remote camera recording…"},
      {"stop_intoASubmission",
       [](const Session& session, AuthorizationRef) {
         return Factory::actionToStopRemoteCamera_andSubmitToSubmissionUUID_withMetadata_session("Studio A", "S-1",
                                                                                                 userMetadata, session);
       },
       {pair("stop", "Studio A"), pair("metadata", "*.plist"), pair("submission_uuid", "S-1")},
       "Stopping and submitting remote camera recording…"},
  };
}

CatalogueEntry submission(std::string name, CatalogueEntry::Make make, Array words) {
  words.insert(words.begin(), "submit");
  return {std::move(name), std::move(make), std::move(words), "Submitting files…", true, false};
}

Entries submissionEntries() {
  return {
      submission(
          "submit_intoAWorkflow",
          [](const Session& session, AuthorizationRef) {
            return Factory::
                actionToSubmitFile_toWorkflow_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
                    "/tmp/a.mov", "Lectures", userMetadata, recordingMetadata, true, true, session);
          },
          {pair("async"), pair("delete"), pair("file", "/tmp/a.mov"), pair("metadata", "*.plist"),
           pair("recording_metadata", "*.xml"), pair("workflow", "Lectures")}),
      submission(
          "submit_intoASubmission",
          [](const Session& session, AuthorizationRef) {
            return Factory::
                actionToSubmitFile_toSubmissionUUID_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
                    "/tmp/a.mov", "S-1", userMetadata, std::nullopt, false, false, session);
          },
          {pair("file", "/tmp/a.mov"), pair("metadata", "*.plist"), pair("submission_uuid", "S-1")}),
      submission("submit_severalFiles",
                 [](const Session& session, AuthorizationRef) {
                   return Factory::actionToSubmitFiles_toWorkflow_metadata_asynchronous_deleteAfterSubmission_session(
                       {"/tmp/a.mov", "/tmp/b.mov"}, "Lectures", userMetadata, true, false, session);
                 },
                 {pair("async"), pair("file", "/tmp/a.mov"), pair("file", "/tmp/b.mov"), pair("metadata", "*.plist"),
                  pair("workflow", "Lectures")}),
  };
}

CatalogueEntry workflowSubmission(std::string name, std::optional<std::string> masterPassword,
                                  std::vector<std::string> inputs, Array words) {
  CatalogueEntry entry{
      std::move(name),
      [masterPassword, inputs = std::move(inputs)](const Session& session, AuthorizationRef) {
        return LMRToolActionFactory::actionToSubmitWorkflow_withMasterPassword_metadataPath_andInputs_withSession(
            "Lectures", masterPassword, "/tmp/m.plist", inputs, session);
      },
      std::move(words), "Submitting workflow…"};
  entry.tool = "/usr/bin/lumaction";
  return entry;
}

Entries workflowSubmissionEntries() {
  const Array common{pair("subcommand", "workflow"), pair("workflow", "Lectures"), pair("metadata", "/tmp/m.plist"),
                     pair("basedir", "/tmp")};
  Array withInputs = common;
  withInputs.insert(withInputs.end(), {pair("input", "/tmp/a.mov"), pair("input", "/tmp/b.mov")});
  Array withPassword = common;
  withPassword.push_back(pair("master_password", "sesame"));
  return {workflowSubmission("workflow", std::nullopt, {"/tmp/a.mov", "/tmp/b.mov"}, std::move(withInputs)),
          workflowSubmission("workflow_withMasterPassword", "sesame", {}, std::move(withPassword))};
}

Entries machineEntries() {
  return {
      {"list_uploads",
       ofNothing(&Factory::actionToListCurrentTransfers),
       {"list_uploads"},
       "Listing current transfers…",
       false},
      {"clear_completed_uploads",
       ofNothing(&Factory::actionToClearCurrentTransfersList),
       {"clear_completed_uploads"},
       "Clearing current transfers…",
       false},
      {"isbound",
       ofNothing(&Factory::actionToGetCameraBindingStatus),
       {"isbound", "plist"},
       "Getting sharing status…",
       false},
      {"getconfig",
       ofNothing(&Factory::actionToGetRemoteRecorderConfiguration),
       {"getconfig", "plist"},
       "Getting sharing settings…",
       false},
      {"setconfig",
       [](const Session&, AuthorizationRef authorization) {
         return Factory::actionToSetRemoteRecorderConfigurationValue_forKey_authorization("high", "Capture",
                                                                                          authorization);
       },
       {"setconfig", "Capture=high"},
       "Configuring sharing settings…",
       false,
       true,
       true},
      {"bind",
       ofTextAndAuthorization(&Factory::actionToBindCamera_session_authorization, "Studio A"),
       {"bind", "Studio A"},
       "Starting camera sharing…",
       true,
       true,
       true},
      {"unbind",
       ofTextAndAuthorization(&Factory::actionToUnbindCamera_session_authorization, "Studio A"),
       {"unbind", "Studio A"},
       "Stopping camera sharing…",
       true,
       true,
       true},
  };
}

} // namespace

std::vector<CatalogueEntry> catalogue() {
  Entries all;
  for (const auto entries : {&workflowEntries, &installationEntries, &cameraEntries, &submissionEntries,
                             &workflowSubmissionEntries, &machineEntries}) {
    auto part = entries();
    std::ranges::move(part, std::back_inserter(all));
  }
  return all;
}

} // namespace lumora::tests
