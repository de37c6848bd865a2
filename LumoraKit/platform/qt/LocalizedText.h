#pragma once

#include <LumoraKit/login/LMRLocalizedString.h>

#include <QString>

namespace lumora::qt {

/// What the compiled Designer files call for each of their texts: the text for the user, from the framework's tables.
inline QString localizedText(const char* key, const char* /*comment*/ = nullptr) {
  return QString::fromStdString(LMRLocalizedString(key));
}

} // namespace lumora::qt
