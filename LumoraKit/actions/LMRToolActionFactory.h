#pragma once

#include <LumoraKit/actions/LMRToolAction.h>

#include <memory>
#include <optional>
#include <string>
#include <vector>

/// Makes the actions of the auxiliary tool, ready to run. Any thread.
class LUMORA_EXPORT LMRToolActionFactory {
public:
  LMRToolActionFactory() = delete;

  /// Submits inputs to a workflow that may be protected by a master password.
  /// \param masterPassword not sent when absent
  /// \param metadataPath a file that LMRActionFactoryAdditions wrote; absent: sent as its key alone
  /// \param inputs paths of files
  static std::shared_ptr<LMRToolAction> actionToSubmitWorkflow_withMasterPassword_metadataPath_andInputs_withSession(
      const std::optional<std::string>& workflow, const std::optional<std::string>& masterPassword,
      const std::optional<std::string>& metadataPath, const std::vector<std::string>& inputs,
      std::shared_ptr<LMRSession> session);
};
