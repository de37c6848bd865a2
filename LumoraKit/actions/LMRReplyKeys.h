#pragma once

#include <string_view>

/// \file
/// The fields of the tools' replies (LMRAction::result).

/// "listworkflows": the array of workflow descriptions.
inline constexpr std::string_view LMRWorkflowsKey = "workflows";
/// In a workflow description.
inline constexpr std::string_view LMRWorkflowNameKey = "name";
inline constexpr std::string_view LMRWorkflowTitleKey = "title";
inline constexpr std::string_view LMRWorkflowUUIDKey = "uuid";
inline constexpr std::string_view LMRWorkflowSourcesKey = "sources";
/// "listworkflows": the user's short name.
inline constexpr std::string_view LMRWorkflowUserShortNameKey = "user_shortname";

/// "listcameras": the array of camera descriptions.
inline constexpr std::string_view LMRCamerasKey = "cameras";
/// In a camera description.
inline constexpr std::string_view LMRCameraNameKey = "name";
inline constexpr std::string_view LMRCameraPreviewURLKey = "preview";
/// In a camera's status with preview.
inline constexpr std::string_view LMRCameraPreviewDataKey = "preview_image_data";
/// "isbound".
inline constexpr std::string_view LMRCameraBindingStatusKey = "Bound";

/// "create_recording".
inline constexpr std::string_view LMRRecordingContainerUUIDKey = "recording_uuid";
/// "create_recording": an array with one submission identifier a source.
inline constexpr std::string_view LMRSubmissionUUIDSKey = "submission_uuids";

/// The remote recorder's configuration: in the "getconfig" reply, and the keys of "setconfig".
inline constexpr std::string_view LMRRemoteRecorderCameraName = "CameraName";
inline constexpr std::string_view LMRRemoteRecorderServerHostname = "TunnelHost";
inline constexpr std::string_view LMRRemoteRecorderQualityDeviceKey = "Capture";
inline constexpr std::string_view LMRRemoteRecorderVideoDeviceKey = "RecordingVideoInput";
inline constexpr std::string_view LMRRemoteRecorderAudioDeviceKey = "RecordingAudioInput";
inline constexpr std::string_view LMRRemoteRecorderCapturePresetKey = "RecordingCapturePreset";

/// "listinfo": the authentication methods of the server, and the values in that list.
inline constexpr std::string_view LMRServerAuthenticationTypeKey = "http_auth_type";
inline constexpr std::string_view LMRServerAuthenticationTypeBasic = "basic";
inline constexpr std::string_view LMRServerAuthenticationTypeDigest = "digest";
inline constexpr std::string_view LMRServerAuthenticationTypeKerberos = "kerberos";
