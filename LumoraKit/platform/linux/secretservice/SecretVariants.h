#pragma once

#include <LumoraKit/platform/linux/GLibPtr.h>

#include <map>
#include <optional>
#include <string>
#include <vector>

/// \file
/// The values of the Secret Service's calls. Who reads one has checked its type.

namespace lumora::backend::secret_service {

/// Of the type a{ss}, floating.
GVariant* variantOf(const std::map<std::string, std::string>& attributes);
/// Of the type ao, floating.
GVariant* variantOf(const std::vector<std::string>& paths);

GLibPtr<GVariant> childOf(GVariant& value, gsize index);
/// A child of the type s or o.
std::string textIn(GVariant& value, gsize index);
/// A child of the type ao.
std::vector<std::string> pathsIn(GVariant& value, gsize index);
/// A child that is a dictionary from paths.
std::map<std::string, GLibPtr<GVariant>> dictionaryIn(GVariant& value, gsize index);

/// An attribute in the answer to a question for the property with all of them, of any type.
std::optional<std::string> attributeIn(GVariant& answer, const char* name);

} // namespace lumora::backend::secret_service
