#pragma once

#include <LumoraKit/platform/Value.h>

#include <filesystem>

/// \file
/// Reads the two files of metadata that a submission names. A file that cannot be read or is not as it should be is
/// refused as a failed submission.

namespace lumora::sandbox {

/// A property list holding a dictionary.
Dictionary readUserMetadata(const std::filesystem::path& path);

/// The recording-properties file:
///
///     <LumoraServerAgentRecordingProperties>
///       <RecordingProperties>
///         <RecordingProperty key="RecordingMetadata_DURATION" value="12.5"/>
///       </RecordingProperties>
///     </LumoraServerAgentRecordingProperties>
Dictionary readRecordingProperties(const std::filesystem::path& path);

} // namespace lumora::sandbox
