#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/Platform.h>

#include <algorithm>

namespace lumora {
namespace {

constexpr std::string_view absent = "(null)";
constexpr std::string_view placeHolders[] = {"@", "d", "u", "s", "ld"};

// The length of the place holder's letters at the start of a text; 0 when there is none.
std::size_t placeHolderLength(std::string_view letters) {
  const auto* const found = std::find_if(std::begin(placeHolders), std::end(placeHolders),
                                         [&](std::string_view holder) { return letters.starts_with(holder); });
  return found == std::end(placeHolders) ? 0 : found->size();
}

} // namespace

Log::~Log() = default;

std::string text(std::string_view value) {
  return std::string(value);
}

std::string text(const std::string& value) {
  return value;
}

std::string text(const char* value) {
  return std::string(value ? value : absent);
}

std::string text(const std::optional<std::string>& value) {
  return value ? *value : std::string(absent);
}

std::string text(std::int64_t number) {
  return std::to_string(number);
}

std::string text(std::uint64_t number) {
  return std::to_string(number);
}

std::string text(int number) {
  return std::to_string(number);
}

std::string text(unsigned number) {
  return std::to_string(number);
}

std::string text(double number) {
  return Value(number).description();
}

std::string text(const Value& value) {
  return value.description();
}

std::string text(const LMRErrorRef& error) {
  return error ? error->description() : std::string(absent);
}

std::string text(const std::filesystem::path& path) {
  return path.string();
}

std::string format(std::string_view format, std::initializer_list<std::string> arguments) {
  std::string filled;
  const std::string* argument = arguments.begin();
  for (std::size_t at = format.find('%'); at != std::string_view::npos; at = format.find('%')) {
    filled += format.substr(0, at);
    format.remove_prefix(at + 1);
    if (format.starts_with('%')) {
      filled += '%';
      format.remove_prefix(1);
      continue;
    }
    const std::size_t length = placeHolderLength(format);
    assertThat(length != 0, "every place holder is known", "format", "Log");
    assertThat(argument != arguments.end(), "there is a text for every place holder", "format", "Log");
    filled += *argument++;
    format.remove_prefix(length);
  }
  assertThat(argument == arguments.end(), "there is a place holder for every text", "format", "Log");
  return filled += format;
}

void log(std::string_view format, std::initializer_list<std::string> arguments) {
  Platform::current().log->write(lumora::format(format, arguments));
}

} // namespace lumora
