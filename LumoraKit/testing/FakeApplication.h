#pragma once

#include <LumoraKit/platform/Application.h>
#include <LumoraKit/platform/Property.h>

namespace lumora::fakes {

/// An application by the identifier "org.vantor.lumora.test" and the name "LumoraTest" whose user reads English,
/// unless set otherwise. Any thread.
class LUMORA_EXPORT FakeApplication final : public Application {
public:
  FakeApplication();
  ~FakeApplication() override;

  std::string identifier() const override { return identifier_.get(); }
  std::string name() const override { return name_.get(); }
  std::string language() const override { return language_.get(); }

  /// From now on the application has this identifier.
  void setIdentifier(std::string identifier) { identifier_.set(std::move(identifier)); }
  /// From now on the application has this name.
  void setName(std::string name) { name_.set(std::move(name)); }
  /// From now on the user prefers this language, a BCP 47 tag.
  void setLanguage(std::string language) { language_.set(std::move(language)); }

private:
  Property<std::string> identifier_{"org.vantor.lumora.test"};
  Property<std::string> name_{"LumoraTest"};
  Property<std::string> language_{"en"};
};

} // namespace lumora::fakes
