#pragma once

#include <LumoraKit/platform/Export.h>

#include <string_view>

/// Stands for the framework where code asks which bundle a class belongs to. Empty on purpose.
class LUMORA_EXPORT LMRFrameworkStub {};

namespace lumora {

/// The identifier of the bundle that holds the class: the framework's own.
constexpr std::string_view bundleIdentifier(LMRFrameworkStub /*member*/) {
  return "org.vantor.lumora.kit";
}

} // namespace lumora
