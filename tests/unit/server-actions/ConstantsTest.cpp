#include <LumoraKit/actions/LMRMetadataKeys.h>
#include <LumoraKit/actions/LMRReplyKeys.h>
#include <LumoraKit/actions/LMRToolPaths.h>

#include <gtest/gtest.h>

namespace {

// Both sides of the tools' protocol are written down once more, as the servers know it.
TEST(ConstantsTest, areTheWordsOfTheTools) {
  EXPECT_EQ(LMRLumoraToolPath, "/usr/bin/lumctl");
  EXPECT_EQ(LMRLumoraExecToolPath, "/usr/libexec/lumora/lumexec");
  EXPECT_EQ(LMRLumoraActionToolPath, "/usr/bin/lumaction");
  EXPECT_EQ(LMRLumoraToolPropertyListIn, "--plistin");
}

TEST(ConstantsTest, areTheFieldsOfWorkflowReplies) {
  EXPECT_EQ(LMRWorkflowsKey, "workflows");
  EXPECT_EQ(LMRWorkflowNameKey, "name");
  EXPECT_EQ(LMRWorkflowTitleKey, "title");
  EXPECT_EQ(LMRWorkflowUUIDKey, "uuid");
  EXPECT_EQ(LMRWorkflowSourcesKey, "sources");
  EXPECT_EQ(LMRWorkflowUserShortNameKey, "user_shortname");
  EXPECT_EQ(LMRRecordingContainerUUIDKey, "recording_uuid");
  EXPECT_EQ(LMRSubmissionUUIDSKey, "submission_uuids");
}

TEST(ConstantsTest, areTheFieldsOfCameraReplies) {
  EXPECT_EQ(LMRCamerasKey, "cameras");
  EXPECT_EQ(LMRCameraNameKey, "name");
  EXPECT_EQ(LMRCameraPreviewURLKey, "preview");
  EXPECT_EQ(LMRCameraPreviewDataKey, "preview_image_data");
  EXPECT_EQ(LMRCameraBindingStatusKey, "Bound");
}

TEST(ConstantsTest, areTheKeysOfTheRemoteRecordersConfiguration) {
  EXPECT_EQ(LMRRemoteRecorderCameraName, "CameraName");
  EXPECT_EQ(LMRRemoteRecorderServerHostname, "TunnelHost");
  EXPECT_EQ(LMRRemoteRecorderQualityDeviceKey, "Capture");
  EXPECT_EQ(LMRRemoteRecorderVideoDeviceKey, "RecordingVideoInput");
  EXPECT_EQ(LMRRemoteRecorderAudioDeviceKey, "RecordingAudioInput");
  EXPECT_EQ(LMRRemoteRecorderCapturePresetKey, "RecordingCapturePreset");
}

TEST(ConstantsTest, areTheAuthenticationMethodsOfServers) {
  EXPECT_EQ(LMRServerAuthenticationTypeKey, "http_auth_type");
  EXPECT_EQ(LMRServerAuthenticationTypeBasic, "basic");
  EXPECT_EQ(LMRServerAuthenticationTypeDigest, "digest");
  EXPECT_EQ(LMRServerAuthenticationTypeKerberos, "kerberos");
}

TEST(ConstantsTest, areTheMetadataOfEpisodes) {
  EXPECT_EQ(LMREpisodeUserMetadataTitleKey, "Title");
  EXPECT_EQ(LMREpisodeUserMetadataDescriptionKey, "Description");
  EXPECT_EQ(LMREpisodeRecordingMetadataStartDateKey, "RecordingMetadata_START_DATE");
  EXPECT_EQ(LMREpisodeRecordingMetadataStopDateKey, "RecordingMetadata_END_DATE");
  EXPECT_EQ(LMREpisodeRecordingMetadataDurationKey, "RecordingMetadata_DURATION");
}

} // namespace
