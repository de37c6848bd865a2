#pragma once

#include <LumoraKit/platform/Export.h>

#include <string>

/// The record of a host by name, as an action's log shows it. A value; nothing is looked up.
class LUMORA_EXPORT KTHost {
public:
  /// This machine, under its own host name.
  static KTHost currentHost();
  /// A host by its name; nothing is looked up.
  static KTHost hostWithName(std::string name);

  /// The host name, as it was given.
  const std::string& name() const { return name_; }
  /// Whether it was made by currentHost(). A host by name never is.
  bool isCurrentHost() const { return isCurrentHost_; }

private:
  KTHost(std::string name, bool isCurrentHost);
  std::string name_;
  bool isCurrentHost_;
};
