#pragma once

#include <string_view>

/// \file
/// The usual entries of an episode's metadata dictionaries. Others are written as well.

/// In the user metadata: strings.
inline constexpr std::string_view LMREpisodeUserMetadataTitleKey = "Title";
inline constexpr std::string_view LMREpisodeUserMetadataDescriptionKey = "Description";

/// In the recording metadata: two dates, and a number of seconds.
inline constexpr std::string_view LMREpisodeRecordingMetadataStartDateKey = "RecordingMetadata_START_DATE";
inline constexpr std::string_view LMREpisodeRecordingMetadataStopDateKey = "RecordingMetadata_END_DATE";
inline constexpr std::string_view LMREpisodeRecordingMetadataDurationKey = "RecordingMetadata_DURATION";
