#pragma once

#include <string_view>

/// \file
/// The usual entries of an episode's metadata dictionaries. Others are written as well.

/// In the user metadata: the episode's title, a string.
inline constexpr std::string_view LMREpisodeUserMetadataTitleKey = "Title";
/// In the user metadata: the episode's description, a string.
inline constexpr std::string_view LMREpisodeUserMetadataDescriptionKey = "Description";

/// In the recording metadata: when the recording began, a date.
inline constexpr std::string_view LMREpisodeRecordingMetadataStartDateKey = "RecordingMetadata_START_DATE";
/// In the recording metadata: when the recording ended, a date.
inline constexpr std::string_view LMREpisodeRecordingMetadataStopDateKey = "RecordingMetadata_END_DATE";
/// In the recording metadata: how long it is without its pauses, a number of seconds.
inline constexpr std::string_view LMREpisodeRecordingMetadataDurationKey = "RecordingMetadata_DURATION";
