#pragma once

#include <LumoraKit/actions/LMRAction.h>

#include <memory>
#include <optional>
#include <string>

/// A run of the auxiliary tool `lumaction`. It is made for a server, so it wants a session.
class LUMORA_EXPORT LMRToolAction : public LMRAction {
public:
  static std::shared_ptr<LMRToolAction> actionWithCommand_arguments_session(std::optional<std::string> command,
                                                                            std::optional<lumora::Array> arguments,
                                                                            std::shared_ptr<LMRSession> session);
  /// Refuses, because there is no session: writes a warning to the log and returns null.
  static std::shared_ptr<LMRToolAction> actionWithCommand_arguments(const std::optional<std::string>& command,
                                                                    const std::optional<lumora::Array>& arguments);

  LMRToolAction(std::optional<std::string> command, std::optional<lumora::Array> arguments,
                std::shared_ptr<LMRSession> session);
  ~LMRToolAction() override;
};
