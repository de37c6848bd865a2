#pragma once

#include <LumoraKit/platform/Export.h>

#include <span>
#include <string_view>

/// \file
/// The tables of resources/<language>.lproj/Localizable.strings, as the build compiled them in.

namespace lumora {

struct LocalizedEntry {
  std::string_view key;
  std::string_view text;
};

/// One language's table, in the byte order of its keys.
struct LocalizedTable {
  /// A BCP 47 tag ("de", "pt-BR"), after the folder's name.
  std::string_view language;
  std::span<const LocalizedEntry> entries;
};

LUMORA_INTERNAL std::span<const LocalizedTable> localizedTables();

/// The text of a key for a language: its most specific table first ("pt-BR", then "pt"), then English; empty when
/// none has it.
LUMORA_INTERNAL std::string_view localizedText(std::string_view key, std::string_view language);

} // namespace lumora
