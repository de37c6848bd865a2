#include "Require.h"
#include "cmake/StringsTable.h"

#include <cstdint>
#include <optional>

/// \file
/// Takes any bytes for a strings table. What is read is a table again when it is written as one.

namespace {

std::optional<StringsTable::Entries> read(std::string_view text) {
  try {
    return StringsTable(text).parse();
  } catch (const std::runtime_error&) {
    return std::nullopt;
  }
}

std::string quoted(const std::string& text) {
  std::string result = "\"";
  for (const char character : text) {
    const bool isEscaped = character == '"' || character == '\\';
    result += character == '\n' ? "\\n" : isEscaped ? std::string{'\\', character} : std::string(1, character);
  }
  return result + "\"";
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* bytes, std::size_t size) {
  const auto entries = read({reinterpret_cast<const char*>(bytes), size});
  std::string written;
  for (const auto& [key, text] : entries.value_or(StringsTable::Entries())) {
    require(!key.empty() && !text.empty());
    written += quoted(key) + " = " + quoted(text) + ";\n";
  }
  require(!entries || read(written) == entries);
  return 0;
}
