#include <LumoraKit/platform/linux/Backends.h>
#include <LumoraKit/platform/linux/LinuxApplication.h>

#include <algorithm>
#include <cctype>
#include <cerrno>
#include <cstdlib>
#include <mutex>
#include <utility>

namespace lumora {
namespace {

struct Identity {
  std::string identifier;
  std::string name;
};

class ProcessIdentity {
public:
  Identity get() {
    const std::lock_guard lock(mutex_);
    return identity_;
  }

  void set(Identity identity) {
    const std::lock_guard lock(mutex_);
    identity_ = std::move(identity);
  }

private:
  std::mutex mutex_;
  Identity identity_{program_invocation_short_name, program_invocation_short_name};
};

ProcessIdentity& processIdentity() {
  static ProcessIdentity identity;
  return identity;
}

std::string_view fromEnvironment(const char* variable) {
  const char* const value = std::getenv(variable);
  return value ? std::string_view(value) : std::string_view();
}

// The first that is set to something decides, as in setlocale(3).
std::string_view messagesLocale() {
  for (const char* const variable : {"LC_ALL", "LC_MESSAGES", "LANG"}) {
    const auto locale = fromEnvironment(variable);
    if (!locale.empty()) {
      return locale;
    }
  }
  return "C";
}

// The first entry of a list parted by colons that is not empty.
std::string_view firstEntry(std::string_view list) {
  list.remove_prefix(std::min(list.find_first_not_of(':'), list.size()));
  return list.substr(0, list.find(':'));
}

bool isPlainLocale(std::string_view locale) {
  return locale == "C" || locale == "POSIX";
}

bool isTag(std::string_view text) {
  return !text.empty() && std::isalpha(static_cast<unsigned char>(text.front())) != 0 &&
         std::all_of(text.begin(), text.end(),
                     [](unsigned char character) { return std::isalnum(character) != 0 || character == '-'; });
}

} // namespace

void Application::setIdentity(std::string identifier, std::string name) {
  processIdentity().set({std::move(identifier), std::move(name)});
}

namespace backend {

std::string languageTag(std::string_view locale) {
  std::string tag(locale.substr(0, locale.find_first_of(".@")));
  std::replace(tag.begin(), tag.end(), '_', '-');
  return isPlainLocale(tag) || !isTag(tag) ? "en" : tag;
}

std::string LinuxApplication::identifier() const {
  return processIdentity().get().identifier;
}

std::string LinuxApplication::name() const {
  return processIdentity().get().name;
}

std::string LinuxApplication::language() const {
  const auto locale = messagesLocale();
  // LANGUAGE ranks higher, but not for who asked for the C locale.
  const auto preferred = isPlainLocale(locale) ? std::string_view() : firstEntry(fromEnvironment("LANGUAGE"));
  return languageTag(preferred.empty() ? locale : preferred);
}

std::shared_ptr<Application> makeApplication() {
  return std::make_shared<LinuxApplication>();
}

} // namespace backend
} // namespace lumora
