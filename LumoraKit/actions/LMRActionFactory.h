#pragma once

#include <LumoraKit/actions/LMRAction.h>
#include <LumoraKit/actions/LMRMetadataKeys.h>
#include <LumoraKit/actions/LMRReplyKeys.h>
#include <LumoraKit/actions/LMRSession.h>
#include <LumoraKit/platform/Value.h>

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

/// Makes the actions of the server's commands, ready to run: the caller attaches targets and starts them. Any thread.
///
/// A word that is absent is sent as its key alone, and the tool answers with an error of its own; what a method must
/// have is asserted. Paths are taken as they are.
class LUMORA_EXPORT LMRActionFactory {
public:
  LMRActionFactory() = delete;

  /// Asks a server who it is and how it authenticates; sends no credentials.
  /// \param port 0 for the default port
  static std::shared_ptr<LMRAction> actionToGetInfoForServer_port(const std::optional<std::string>& server,
                                                                  std::uint16_t port);

  /// Lists the workflows that the user may submit to; LMRWorkflowsKey in the result.
  static std::shared_ptr<LMRAction> actionToListWorkflowsWithSession(std::shared_ptr<LMRSession> session);

  /// Submits one file. The metadata are written to files at once (LMRActionFactoryAdditions); one that cannot be
  /// written is sent as its key alone. The action has no result.
  /// \param file path, required
  /// \param workflowName required
  /// \param userMetadata for the viewers; LMREpisodeUserMetadata...Key
  /// \param recordingMetadata about the recording; LMREpisodeRecordingMetadata...Key; not sent when absent
  /// \param asynchronous whether the tool may end before the file has been transferred
  /// \param deleteAfterSubmission whether the tool removes the file once it has been transferred
  static std::shared_ptr<LMRAction>
  actionToSubmitFile_toWorkflow_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
      const std::optional<std::string>& file, const std::optional<std::string>& workflowName,
      const std::optional<lumora::Dictionary>& userMetadata, const std::optional<lumora::Dictionary>& recordingMetadata,
      bool asynchronous, bool deleteAfterSubmission, std::shared_ptr<LMRSession> session);

  /// The same for a source of a recording container.
  /// \param submissionUUID required; one of LMRSubmissionUUIDSKey
  static std::shared_ptr<LMRAction>
  actionToSubmitFile_toSubmissionUUID_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
      const std::optional<std::string>& file, const std::optional<std::string>& submissionUUID,
      const std::optional<lumora::Dictionary>& userMetadata, const std::optional<lumora::Dictionary>& recordingMetadata,
      bool asynchronous, bool deleteAfterSubmission, std::shared_ptr<LMRSession> session);

  /// Submits several files as one episode, without recording metadata. A library server gets them synchronously,
  /// whatever is asked for.
  /// \param files paths, at least one
  static std::shared_ptr<LMRAction> actionToSubmitFiles_toWorkflow_metadata_asynchronous_deleteAfterSubmission_session(
      const std::vector<std::string>& files, const std::optional<std::string>& workflowName,
      const std::optional<lumora::Dictionary>& userMetadata, bool asynchronous, bool deleteAfterSubmission,
      std::shared_ptr<LMRSession> session);

  /// Stops a remote camera and has the server submit what it recorded. The metadata are required and must be writable
  /// (asserted).
  static std::shared_ptr<LMRAction> actionToStopRemoteCamera_andSubmitToWorkflow_withMetadata_session(
      const std::optional<std::string>& camera, const std::optional<std::string>& workflowName,
      const std::optional<lumora::Dictionary>& userMetadata, std::shared_ptr<LMRSession> session);

  /// The same for a source of a recording container.
  static std::shared_ptr<LMRAction> actionToStopRemoteCamera_andSubmitToSubmissionUUID_withMetadata_session(
      const std::optional<std::string>& camera, const std::optional<std::string>& submissionUUID,
      const std::optional<lumora::Dictionary>& userMetadata, std::shared_ptr<LMRSession> session);
};
