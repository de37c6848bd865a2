#pragma once

#include <LumoraKit/platform/Export.h>

#include <string>

namespace lumora {

/// Who the running application is.
class LUMORA_EXPORT Application {
public:
  virtual ~Application();

  /// Reverse-domain identifier ("org.vantor.lumora.recorder"): names the application's preferences.
  virtual std::string identifier() const = 0;
  /// The application's plain name: names its folder for files.
  virtual std::string name() const = 0;
  /// The user's preferred language as a BCP 47 tag ("de", "pt-BR"); "en" for the C locale.
  virtual std::string language() const = 0;

  /// Sets both for this process, in place of what is derived from the program's file name. Call before anything else
  /// of the framework.
  static void setIdentity(std::string identifier, std::string name);
};

} // namespace lumora
