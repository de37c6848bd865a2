#pragma once

#include <LumoraKit/actions/LMRAction.h>
#include <LumoraKit/actions/LMRMetadataKeys.h>
#include <LumoraKit/actions/LMRPrivilegedAction.h>
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
/// have is asserted. Paths are taken as they are. Unless a method says otherwise its action has a result, and no reply
/// is looked into: LMRReplyKeys.h names what the tools put there.
class LUMORA_EXPORT LMRActionFactory {
public:
  LMRActionFactory() = delete;

  /// Asks a server who it is and how it authenticates; sends no credentials.
  /// \param port 0 for the default port
  static std::shared_ptr<LMRAction> actionToGetInfoForServer_port(const std::optional<std::string>& server,
                                                                  std::uint16_t port);

  /// Lists the workflows that the user may submit to; LMRWorkflowsKey in the result.
  static std::shared_ptr<LMRAction> actionToListWorkflowsWithSession(std::shared_ptr<LMRSession> session);

  /// Describes one workflow.
  static std::shared_ptr<LMRAction>
  actionToGetWorkflowInformationWithUUID_withSession(const std::optional<std::string>& uuid,
                                                     std::shared_ptr<LMRSession> session);

  /// Installs a workflow from a file of this machine.
  /// \param masterPassword of the workflow; not sent when absent
  /// \param overwrite whether it may replace an installed one
  static std::shared_ptr<LMRAction> actionToInstallWorkflowFromPath_withMasterPassword_overwrite_withSession(
      const std::optional<std::string>& path, const std::optional<std::string>& masterPassword, bool overwrite,
      std::shared_ptr<LMRSession> session);

  /// Writes a workflow into a file of this machine.
  static std::shared_ptr<LMRAction>
  actionToDownloadWorkflowWithUUID_toPath_withSession(const std::optional<std::string>& uuid,
                                                      const std::optional<std::string>& path,
                                                      std::shared_ptr<LMRSession> session);

  /// Deletes a workflow from the server. Its episodes stay.
  static std::shared_ptr<LMRAction> actionToDeleteWorkflowWithUUID_withSession(const std::optional<std::string>& uuid,
                                                                               std::shared_ptr<LMRSession> session);

  /// Makes a container for one recording of several sources; LMRRecordingContainerUUIDKey and LMRSubmissionUUIDSKey in
  /// the result.
  static std::shared_ptr<LMRAction>
  actionToCreateRecordingContainerForWorkflowUUID_session(const std::optional<std::string>& uuid,
                                                          std::shared_ptr<LMRSession> session);

  /// Lists the cameras that the server can record with; LMRCamerasKey in the result.
  static std::shared_ptr<LMRAction> actionToListRemoteCamerasWithSession(std::shared_ptr<LMRSession> session);

  /// Asks what a camera is doing: its state and the URL of its last preview image in the result.
  static std::shared_ptr<LMRAction> actionToGetStatusForRemoteCamera_session(const std::optional<std::string>& camera,
                                                                             std::shared_ptr<LMRSession> session);

  /// The status with a new picture; LMRCameraPreviewDataKey in the result.
  static std::shared_ptr<LMRAction>
  actionToUpdatePreviewImageForRemoteCamera_session(const std::optional<std::string>& camera,
                                                    std::shared_ptr<LMRSession> session);

  /// \param delay seconds that the server waits before the camera records
  static std::shared_ptr<LMRAction>
  actionToStartRemoteCamera_afterDelay_audioOnly_session(const std::optional<std::string>& camera, std::uint64_t delay,
                                                         bool audioOnly, std::shared_ptr<LMRSession> session);

  /// Pauses the recording of a camera.
  static std::shared_ptr<LMRAction> actionToPauseRemoteCamera_session(const std::optional<std::string>& camera,
                                                                      std::shared_ptr<LMRSession> session);
  /// Goes on with the paused recording of a camera.
  static std::shared_ptr<LMRAction> actionToResumeRemoteCamera_session(const std::optional<std::string>& camera,
                                                                       std::shared_ptr<LMRSession> session);
  /// Ends the recording and throws it away.
  static std::shared_ptr<LMRAction> actionToCancelRemoteCamera_session(const std::optional<std::string>& camera,
                                                                       std::shared_ptr<LMRSession> session);

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

  /// The transfers of this machine that run or have ended. Asks no server.
  static std::shared_ptr<LMRAction> actionToListCurrentTransfers();
  /// Forgets the transfers that have ended.
  static std::shared_ptr<LMRAction> actionToClearCurrentTransfersList();

  /// Whether this machine's camera is shared; LMRCameraBindingStatusKey in the result.
  static std::shared_ptr<LMRAction> actionToGetCameraBindingStatus();
  /// How this machine's camera is shared; LMRRemoteRecorder...Key in the result.
  static std::shared_ptr<LMRAction> actionToGetRemoteRecorderConfiguration();

  /// Changes one setting of this machine's shared camera.
  /// \param value required, not empty
  /// \param key required: one of LMRRemoteRecorder...Key
  /// \param authorization required; must outlive the action
  static std::shared_ptr<LMRPrivilegedAction>
  actionToSetRemoteRecorderConfigurationValue_forKey_authorization(const std::optional<std::string>& value,
                                                                   const std::optional<std::string>& key,
                                                                   lumora::AuthorizationRef authorization);

  /// Shares this machine's camera under a name with the session's server.
  /// \param session required; must authenticate by password (asserted when the action runs)
  /// \param authorization required; must outlive the action
  static std::shared_ptr<LMRPrivilegedAction>
  actionToBindCamera_session_authorization(const std::optional<std::string>& camera,
                                           std::shared_ptr<LMRSession> session, lumora::AuthorizationRef authorization);
  /// Ends the sharing; the same parameters.
  static std::shared_ptr<LMRPrivilegedAction>
  actionToUnbindCamera_session_authorization(const std::optional<std::string>& camera,
                                             std::shared_ptr<LMRSession> session,
                                             lumora::AuthorizationRef authorization);
};
