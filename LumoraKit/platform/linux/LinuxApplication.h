#pragma once

#include <LumoraKit/platform/Application.h>

#include <string_view>

namespace lumora::backend {

/// Identifier and name are the program's file name unless Application::setIdentity gave better ones. The language is
/// read from the environment at each call, as gettext(3) does.
class LUMORA_INTERNAL LinuxApplication final : public Application {
public:
  std::string identifier() const override;
  std::string name() const override;
  std::string language() const override;
};

/// The BCP 47 tag of a locale's name: "pt-BR" of "pt_BR.UTF-8@abnt", "en" of "C", "POSIX" and what is no locale's name.
LUMORA_INTERNAL std::string languageTag(std::string_view locale);

} // namespace lumora::backend
