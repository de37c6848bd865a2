#include <LumoraKit/login/LMRFrameworkStub.h>
#include <LumoraKit/login/LMRFrameworkUserDefaults.h>
#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/Preferences.h>

#include <utility>

std::shared_ptr<LMRFrameworkUserDefaults> LMRFrameworkUserDefaults::standardFrameworkUserDefaults() {
  return std::make_shared<LMRFrameworkUserDefaults>(std::string(lumora::bundleIdentifier(LMRFrameworkStub())));
}

LMRFrameworkUserDefaults::LMRFrameworkUserDefaults(std::optional<std::string> bundleIdentifier)
    : bundleIdentifier_(std::move(bundleIdentifier)) {}

std::optional<lumora::Value> LMRFrameworkUserDefaults::objectForKey(std::string_view key) const {
  return lumora::Platform::current().preferences->value(domain(__func__), key);
}

void LMRFrameworkUserDefaults::setObject_forKey(const std::optional<lumora::Value>& value, std::string_view key) {
  lumora::Platform::current().preferences->setValue(domain(__func__), key, value);
}

void LMRFrameworkUserDefaults::removeObjectForKey(std::string_view key) {
  lumora::Platform::current().preferences->setValue(domain(__func__), key, std::nullopt);
}

std::string LMRFrameworkUserDefaults::domain(std::string_view operation) const {
  auto identifier = bundleIdentifier();
  lumora::assertThat(identifier.has_value(), "_bundleIdentifier != nil", operation, "LMRFrameworkUserDefaults");
  return std::move(*identifier);
}
