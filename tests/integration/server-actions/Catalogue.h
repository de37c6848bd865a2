#pragma once

#include <LumoraKit/actions/LMRAction.h>

#include <functional>
#include <ostream>
#include <string>
#include <vector>

namespace lumora::tests {

/// One factory method, called once.
struct CatalogueEntry {
  using Make =
      std::function<std::shared_ptr<LMRAction>(std::shared_ptr<LMRSession> session, AuthorizationRef authorization)>;

  std::string name;
  Make make;
  /// What follows the login: the command, when there is one, and the arguments. A value "*.plist" or "*.xml" stands for
  /// the path of the file that the method writes.
  Array words;
  std::string progress;
  bool takesSession = true;
  bool expectsReply = true;
  bool isPrivileged = false;
  std::string tool = "/usr/bin/lumctl";
};

inline void PrintTo(const CatalogueEntry& entry, std::ostream* out) {
  *out << entry.name;
}

/// Every factory method.
std::vector<CatalogueEntry> catalogue();

} // namespace lumora::tests
