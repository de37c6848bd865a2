#pragma once

#include <LumoraKit/platform/Export.h>

#include <string>
#include <string_view>

/// The text for the user of a key of the framework's "Localizable" table, in the language of the application
/// (lumora::Application::language), else in English; the key itself when no table has it. Keys are English texts in
/// which the six characters \U2026 stand for an ellipsis. The tables are part of the library. Any thread.
LUMORA_EXPORT std::string LMRLocalizedString(std::string_view key);
