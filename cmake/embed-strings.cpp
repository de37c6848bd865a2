// Turns strings tables into a C++ source: lumora-embed-strings OUTPUT TABLE...
//
// A table is UTF-8, and as StringsTable.h says. Anything else is an error that names file and line.

#include "StringsTable.h"

#include <algorithm>
#include <cstdlib>
#include <fstream>
#include <iostream>
#include <iterator>
#include <map>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

namespace {

// The length of the UTF-8 sequence that a byte opens; 0 for a byte that opens none.
std::size_t sequenceLength(unsigned char byte) {
  if (byte < 0x80) {
    return 1;
  }
  if (byte >= 0xC2 && byte <= 0xF4) {
    return byte < 0xE0 ? 2 : byte < 0xF0 ? 3 : 4;
  }
  return 0;
}

bool isUTF8(std::string_view text) {
  while (!text.empty()) {
    const std::size_t length = sequenceLength(static_cast<unsigned char>(text.front()));
    if (length == 0 || length > text.size()) {
      return false;
    }
    const auto rest = text.substr(1, length - 1);
    if (!std::ranges::all_of(rest, [](char byte) { return (static_cast<unsigned char>(byte) & 0xC0) == 0x80; })) {
      return false;
    }
    text.remove_prefix(length);
  }
  return true;
}

std::string literal(std::string_view text) {
  std::string result = "\"";
  for (const char character : text) {
    if (character == '\n') {
      result += "\\n";
      continue;
    }
    if (character == '"' || character == '\\') {
      result += '\\';
    }
    result += character;
  }
  return result + "\"";
}

StringsTable::Entries readTable(const std::string& path) {
  std::ifstream file(path, std::ios::binary);
  const std::string content(std::istreambuf_iterator<char>(file), {});
  if (!file || !isUTF8(content)) {
    throw std::runtime_error(path + ": cannot be read as UTF-8");
  }
  try {
    return StringsTable(content).parse();
  } catch (const std::runtime_error& error) {
    throw std::runtime_error(path + ":" + error.what());
  }
}

// ".../de.lproj/Localizable.strings" gives "de".
std::string language(std::string_view path) {
  path = path.substr(0, path.rfind(".lproj/"));
  return std::string(path.substr(path.rfind('/') + 1));
}

void writeTables(std::ostream& output, const std::vector<std::string>& paths) {
  output << "#include <LumoraKit/login/LMRLocalizedTables.h>\n\nnamespace lumora {\nnamespace {\n\n";
  std::string list;
  for (const auto& path : paths) {
    const std::string name = "table" + std::to_string(&path - paths.data());
    output << "constexpr LocalizedEntry " << name << "[] = {\n";
    for (const auto& [key, text] : readTable(path)) {
      output << "    {" << literal(key) << ", " << literal(text) << "},\n";
    }
    output << "};\n\n";
    list += "    {" + literal(language(path)) + ", " + name + "},\n";
  }
  output << "constexpr LocalizedTable tables[] = {\n"
         << list << "};\n\n} // namespace\n\n"
         << "std::span<const LocalizedTable> localizedTables() {\n  return tables;\n}\n\n} // namespace lumora\n";
}

} // namespace

int main(int argc, char** argv) {
  if (argc < 3) {
    std::cerr << "usage: lumora-embed-strings OUTPUT TABLE...\n";
    return EXIT_FAILURE;
  }
  try {
    std::ofstream output(argv[1], std::ios::binary);
    writeTables(output, {argv + 2, argv + argc});
    return output.flush() ? EXIT_SUCCESS : EXIT_FAILURE;
  } catch (const std::runtime_error& error) {
    std::cerr << error.what() << '\n';
    return EXIT_FAILURE;
  }
}
