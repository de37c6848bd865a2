#pragma once

#include <LumoraKit/actions/LMRAction.h>

#include <memory>
#include <optional>
#include <string>

/// A run of the auxiliary tool `lumaction`. It is made for a server, so it wants a session.
class LUMORA_EXPORT LMRToolAction : public LMRAction {
public:
  /// An action for a command of the auxiliary tool, with the login session of the server.
  static std::shared_ptr<LMRToolAction> actionWithCommand_arguments_session(std::optional<std::string> command,
                                                                            std::optional<lumora::Array> arguments,
                                                                            std::shared_ptr<LMRSession> session);
  /// Refuses, because there is no session: writes a warning to the log and returns null.
  static std::shared_ptr<LMRToolAction> actionWithCommand_arguments(const std::optional<std::string>& command,
                                                                    const std::optional<lumora::Array>& arguments);

  /// The same as a constructor.
  LMRToolAction(std::optional<std::string> command, std::optional<lumora::Array> arguments,
                std::shared_ptr<LMRSession> session);
  ~LMRToolAction() override;
};
