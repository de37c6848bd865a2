// The methods of LMRActionFactory that hand recordings to a workflow.
#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/actions/LMRActionFactoryAdditions.h>
#include <LumoraKit/actions/LMRFactoryParts.h>
#include <LumoraKit/actions/LMRRequest.h>

#include <utility>

using lumora::requestPair;
using lumora::requireForFactory;

namespace {

using OptionalText = std::optional<std::string>;
using OptionalMetadata = std::optional<lumora::Dictionary>;

lumora::Array flags(bool asynchronous, bool deleteAfterSubmission) {
  lumora::Array arguments;
  if (asynchronous) {
    arguments.push_back(requestPair("async", std::nullopt));
  }
  if (deleteAfterSubmission) {
    arguments.push_back(requestPair("delete", std::nullopt));
  }
  return arguments;
}

OptionalText writtenUserMetadata(const OptionalMetadata& metadata) {
  return metadata ? LMRActionFactoryAdditions::writeToApplicationSupport(*metadata) : std::nullopt;
}

std::shared_ptr<LMRAction> submitAction(lumora::Array arguments, std::shared_ptr<LMRSession> session) {
  auto action = lumora::toolAction("submit", std::move(arguments), std::move(session), "Submitting files\\U2026");
  action->setExpectXMLResponse(false);
  return action;
}

// One file's submission; the destination is the last argument.
lumora::Array fileArguments(const std::string& file, const OptionalMetadata& userMetadata,
                            const OptionalMetadata& recordingMetadata, lumora::Array flags, lumora::Value destination) {
  lumora::Array arguments = std::move(flags);
  arguments.push_back(requestPair("file", file));
  arguments.push_back(requestPair("metadata", writtenUserMetadata(userMetadata)));
  if (recordingMetadata) {
    const auto path = LMRActionFactoryAdditions::writeXMLToApplicationSupport(*recordingMetadata);
    arguments.push_back(requestPair("recording_metadata", path));
  }
  arguments.push_back(std::move(destination));
  return arguments;
}

std::shared_ptr<LMRAction> stopAction(const OptionalText& camera, const OptionalMetadata& userMetadata,
                                      lumora::Value destination, std::shared_ptr<LMRSession> session,
                                      std::string_view operation) {
  const auto metadataFilePath = writtenUserMetadata(userMetadata);
  requireForFactory(metadataFilePath.has_value(), "metadataFilePath != nil", operation);
  lumora::Array arguments{requestPair("stop", camera), requestPair("metadata", metadataFilePath),
                          std::move(destination)};
  return lumora::toolAction(std::nullopt, std::move(arguments), std::move(session),
                            "Stopping and submitting remote camera recording\\U2026");
}

} // namespace

std::shared_ptr<LMRAction> LMRActionFactory::
    actionToSubmitFile_toWorkflow_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
        const OptionalText& file, const OptionalText& workflowName, const OptionalMetadata& userMetadata,
        const OptionalMetadata& recordingMetadata, bool asynchronous, bool deleteAfterSubmission,
        std::shared_ptr<LMRSession> session) {
  requireForFactory(file.has_value(), "file != nil", __func__);
  requireForFactory(workflowName.has_value(), "workflowName != nil", __func__);
  return submitAction(fileArguments(*file, userMetadata, recordingMetadata, flags(asynchronous, deleteAfterSubmission),
                                    requestPair("workflow", *workflowName)),
                      std::move(session));
}

std::shared_ptr<LMRAction> LMRActionFactory::
    actionToSubmitFile_toSubmissionUUID_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
        const OptionalText& file, const OptionalText& submissionUUID, const OptionalMetadata& userMetadata,
        const OptionalMetadata& recordingMetadata, bool asynchronous, bool deleteAfterSubmission,
        std::shared_ptr<LMRSession> session) {
  requireForFactory(file.has_value(), "file != nil", __func__);
  requireForFactory(submissionUUID.has_value(), "submissionUUID != nil", __func__);
  return submitAction(fileArguments(*file, userMetadata, recordingMetadata, flags(asynchronous, deleteAfterSubmission),
                                    requestPair("submission_uuid", *submissionUUID)),
                      std::move(session));
}

std::shared_ptr<LMRAction>
LMRActionFactory::actionToSubmitFiles_toWorkflow_metadata_asynchronous_deleteAfterSubmission_session(
    const std::vector<std::string>& files, const OptionalText& workflowName, const OptionalMetadata& userMetadata,
    bool asynchronous, bool deleteAfterSubmission, std::shared_ptr<LMRSession> session) {
  requireForFactory(!files.empty(), "[files count] > 0", __func__);
  requireForFactory(workflowName.has_value(), "workflowName != nil", __func__);
  const auto metadataFilePath = writtenUserMetadata(userMetadata);
  const bool isLibraryServer = session && session->isLumoraLibraryServer();
  auto arguments = flags(asynchronous && !isLibraryServer, deleteAfterSubmission);
  for (const auto& file : files) {
    arguments.push_back(requestPair("file", file));
  }
  arguments.push_back(requestPair("metadata", metadataFilePath));
  arguments.push_back(requestPair("workflow", *workflowName));
  return submitAction(std::move(arguments), std::move(session));
}

std::shared_ptr<LMRAction> LMRActionFactory::actionToStopRemoteCamera_andSubmitToWorkflow_withMetadata_session(
    const OptionalText& camera, const OptionalText& workflowName, const OptionalMetadata& userMetadata,
    std::shared_ptr<LMRSession> session) {
  requireForFactory(workflowName.has_value(), "workflowName != nil", __func__);
  return stopAction(camera, userMetadata, requestPair("workflow", *workflowName), std::move(session), __func__);
}

std::shared_ptr<LMRAction> LMRActionFactory::actionToStopRemoteCamera_andSubmitToSubmissionUUID_withMetadata_session(
    const OptionalText& camera, const OptionalText& submissionUUID, const OptionalMetadata& userMetadata,
    std::shared_ptr<LMRSession> session) {
  requireForFactory(submissionUUID.has_value(), "submissionUUID != nil", __func__);
  return stopAction(camera, userMetadata, requestPair("submission_uuid", *submissionUUID), std::move(session),
                    __func__);
}
