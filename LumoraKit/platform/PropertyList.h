#pragma once

#include <LumoraKit/platform/LMRError.h>
#include <LumoraKit/platform/Value.h>

#include <optional>
#include <string>
#include <string_view>

/// \file
/// XML property lists (the format of the property-list document type, version 1.0): reader and writer.
/// Any thread; nothing here keeps state.

namespace lumora {

/// Domain of errors of the property-list reader and writer. The user information of a reader's error holds "line"
/// and "column" (from 1) and "byte" (offset from 0) of the place.
inline constexpr std::string_view PropertyListErrorDomain = "org.vantor.lumora.propertylist";

/// Why a text was refused (the code of the error).
enum class PropertyListError { NotWellFormed = 1, WrongStructure, BadValue, TooDeep, WrongRoot, Unrepresentable };

/// The XML property-list text of a value: UTF-8, indented with tabs, no document type declaration.
/// Nothing, with the error set, when a string holds what XML cannot carry (control characters, invalid UTF-8) or
/// the nesting is deeper than 10,000.
LUMORA_EXPORT std::optional<std::string> xmlDescription(const Value& value, LMRErrorRef* error = nullptr);
LUMORA_EXPORT std::optional<std::string> xmlDescription(const Array& array, LMRErrorRef* error = nullptr);
LUMORA_EXPORT std::optional<std::string> xmlDescription(const Dictionary& dictionary, LMRErrorRef* error = nullptr);

/// Reads a property list with any kind of root value. Strict: everything the format does not allow is an error with
/// its line, column and byte offset, and nothing is returned. UTF-8, UTF-16 and Latin-1 are read.
LUMORA_EXPORT std::optional<Value> valueWithXMLDescription(std::string_view text, LMRErrorRef* error = nullptr);

/// The same for a text whose root must be a dictionary.
LUMORA_EXPORT std::optional<Dictionary> dictionaryWithXMLDescription(std::string_view text);
/// The same, with the reason when it cannot be read.
LUMORA_EXPORT std::optional<Dictionary> dictionaryWithXMLDescription_error(std::string_view text, LMRErrorRef* error);

} // namespace lumora
