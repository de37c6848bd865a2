#pragma once

#include <LumoraKit/platform/Value.h>

#include <optional>
#include <string>

/// How metadata dictionaries are written to files for the tools. Each call writes a new file with a new UUID as its
/// name into LMRApplicationSupportDirectory(), readable by the user only, and returns its full path; absent on any
/// failure. Nobody removes the files. Any thread; blocks for as long as the disk takes.
namespace LMRActionFactoryAdditions {

/// The recording-properties file: XML with one "RecordingProperty" element for each key, in the dictionary's order,
/// with the attributes "key" and "value", the text that "%@" prints of the value.
LUMORA_EXPORT std::optional<std::string> writeXMLToApplicationSupport(const lumora::Dictionary& dictionary);

/// The dictionary as an XML property list.
LUMORA_EXPORT std::optional<std::string> writeToApplicationSupport(const lumora::Dictionary& dictionary);

} // namespace LMRActionFactoryAdditions
