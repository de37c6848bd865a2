#pragma once

#include <string_view>

/// \file
/// The fields of the tools' replies (LMRAction::result).

/// "listworkflows": the array of workflow descriptions.
inline constexpr std::string_view LMRWorkflowsKey = "workflows";
/// In a workflow description: the plain name, which is unique on the server.
inline constexpr std::string_view LMRWorkflowNameKey = "name";
/// In a workflow description: the title for users.
inline constexpr std::string_view LMRWorkflowTitleKey = "title";
/// In a workflow description: its identifier, by which submissions and containers name it.
inline constexpr std::string_view LMRWorkflowUUIDKey = "uuid";
/// In a workflow description: an array of dictionaries, one a source; see LMRWorkflowAdditions.
inline constexpr std::string_view LMRWorkflowSourcesKey = "sources";
/// "listworkflows": the user's short name.
inline constexpr std::string_view LMRWorkflowUserShortNameKey = "user_shortname";

/// "listcameras": the array of camera descriptions.
inline constexpr std::string_view LMRCamerasKey = "cameras";
/// In a camera description: the name, by which every remote-camera command names it.
inline constexpr std::string_view LMRCameraNameKey = "name";
/// In a camera description: the URL of its last preview image.
inline constexpr std::string_view LMRCameraPreviewURLKey = "preview";
/// In a camera's status with preview.
inline constexpr std::string_view LMRCameraPreviewDataKey = "preview_image_data";
/// "isbound".
inline constexpr std::string_view LMRCameraBindingStatusKey = "Bound";

/// "create_recording".
inline constexpr std::string_view LMRRecordingContainerUUIDKey = "recording_uuid";
/// "create_recording": an array with one submission identifier a source.
inline constexpr std::string_view LMRSubmissionUUIDSKey = "submission_uuids";

/// In the "getconfig" reply, and a key of "setconfig": the name under which this machine's camera is shared.
inline constexpr std::string_view LMRRemoteRecorderCameraName = "CameraName";
/// The same: the host name of the server that the camera is shared with.
inline constexpr std::string_view LMRRemoteRecorderServerHostname = "TunnelHost";
/// The same: the quality of the recordings ("high").
inline constexpr std::string_view LMRRemoteRecorderQualityDeviceKey = "Capture";
/// The same: the video device that is recorded.
inline constexpr std::string_view LMRRemoteRecorderVideoDeviceKey = "RecordingVideoInput";
/// The same: the sound device that is recorded.
inline constexpr std::string_view LMRRemoteRecorderAudioDeviceKey = "RecordingAudioInput";
/// The same: the preset that the recordings are made with.
inline constexpr std::string_view LMRRemoteRecorderCapturePresetKey = "RecordingCapturePreset";

/// "listinfo": the authentication methods that the server takes, an array of strings.
inline constexpr std::string_view LMRServerAuthenticationTypeKey = "http_auth_type";
/// A value in that list: a user name and a password.
inline constexpr std::string_view LMRServerAuthenticationTypeBasic = "basic";
/// A value in that list: a user name and a password, which is not sent itself (RFC 7616).
inline constexpr std::string_view LMRServerAuthenticationTypeDigest = "digest";
/// A value in that list: single sign-on with a Kerberos ticket.
inline constexpr std::string_view LMRServerAuthenticationTypeKerberos = "kerberos";
