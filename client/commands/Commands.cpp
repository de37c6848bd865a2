#include "Groups.h"

#include <iterator>

namespace lumora::client {

std::span<const Command> allCommands() {
  static const auto commands = [] {
    std::vector<Command> all;
    for (auto* const group : {&serverCommands, &passwordCommands, &workflowCommands, &cameraCommands,
                              &submissionCommands, &sharingCommands}) {
      auto part = group();
      std::move(part.begin(), part.end(), std::back_inserter(all));
    }
    return all;
  }();
  return commands;
}

} // namespace lumora::client
