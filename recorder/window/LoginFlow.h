#pragma once

#include <LumoraKit/LumoraKit.h>

#include <QWidget>
#include <functional>
#include <memory>

namespace recorder {

/// Shows the login sheet over a window, and hands the session on.
class LoginFlow : public std::enable_shared_from_this<LoginFlow> {
public:
  /// Null when the user has cancelled.
  using Outcome = std::function<void(std::shared_ptr<LMRSession> session)>;

  explicit LoginFlow(Outcome outcome);

  /// Without effect while it is shown.
  void begin(QWidget* window);

private:
  void ended(int returnCode);

  const Outcome outcome_;
  std::shared_ptr<LMRServerLoginSheetController> sheet_;
};

} // namespace recorder
