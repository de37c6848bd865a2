#pragma once

#include <LumoraKit/platform/Export.h>

#include <optional>
#include <string>
#include <string_view>

/// \file
/// Text as the content of an element (XML 1.0, fifth edition, sections 2.2 and 2.4). Not for applications.

namespace lumora::xml_text {

/// Appends UTF-8 text so that a parser reads exactly this text: "&", "<" and ">" as entities, a carriage return as a
/// character reference. What XML cannot carry ends it: then the answer says what was met, and where.
LUMORA_INTERNAL std::optional<std::string> appendEscaped(std::string& xml, std::string_view text);

} // namespace lumora::xml_text
