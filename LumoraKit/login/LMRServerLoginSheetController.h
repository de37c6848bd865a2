#pragma once

#include <LumoraKit/login/LMRServerLoginViewController.h>
#include <LumoraKit/platform/Observable.h>
#include <LumoraKit/platform/UserInterface.h>

#include <any>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <type_traits>

namespace lumora {
/// In a sheet's context information, a Dictionary: true for a shared station, where no password is remembered.
inline constexpr std::string_view LoginRememberPasswordDisabledKey = "LMRServerLoginRememberPasswordDisabled";
} // namespace lumora

/// A whole login dialog over a window: the login panel, a place for progress and errors, and two buttons.
///
///     sheet_ = std::make_shared<LMRServerLoginSheetController>();
///     sheet_->beginSheetModalForWindow_defaultButtonTitle_alternateButtonTitle_modalDelegate_didEndSelector_contextInfo(
///         window, std::nullopt, std::nullopt, shared_from_this(), &Owner::loginEnded, {});
///     ...
///     void Owner::loginEnded(int returnCode) {
///       if (returnCode == LMRServerLoginSheetController::LoggedIn) {
///         use(sheet_->serverLoginViewController()->loginSession());
///       }
///     }
///
/// Made for one login; when it is begun once more, the panel keeps its first kiosk mode. Held by std::shared_ptr only,
/// as long as the sheet is to react; when it dies the window goes too, and nobody is told. Main thread only.
class LUMORA_EXPORT LMRServerLoginSheetController : public std::enable_shared_from_this<LMRServerLoginSheetController> {
public:
  /// The interface file of the window.
  static constexpr std::string_view windowNibName = "ServerLoginWindow";

  /// What the delegate is told when the user closed the sheet without a login.
  static constexpr int Cancelled = 0;
  /// What the delegate is told when the login has succeeded; the session is the panel's.
  static constexpr int LoggedIn = 1;

  LMRServerLoginSheetController();
  LMRServerLoginSheetController(const LMRServerLoginSheetController&) = delete;
  LMRServerLoginSheetController& operator=(const LMRServerLoginSheetController&) = delete;
  virtual ~LMRServerLoginSheetController();

  /// Shows the sheet and returns at once. Without a user interface (see lumora::UserInterface::none()) the delegate is
  /// told of a cancellation, on a later turn of the main thread.
  /// \param window the parent; null: the dialog is a window of its own
  /// \param defaultButtonTitle,alternateButtonTitle nothing or empty: "Connect" and "Cancel" in the user's language
  /// \param delegate held weakly
  /// \param selector a member function of the delegate, or of a base class of it, that takes the return code (int), or
  ///   the sheet's window (const std::shared_ptr<lumora::Window>&), the return code and the context information
  ///   (const std::any&)
  /// \param contextInfo handed to the selector; a lumora::Dictionary may say LoginRememberPasswordDisabledKey
  template <class Delegate, class Selector>
  void beginSheetModalForWindow_defaultButtonTitle_alternateButtonTitle_modalDelegate_didEndSelector_contextInfo(
      const std::shared_ptr<lumora::Window>& window, const std::optional<std::string>& defaultButtonTitle,
      const std::optional<std::string>& alternateButtonTitle, const std::shared_ptr<Delegate>& delegate,
      Selector selector, const std::any& contextInfo) {
    beginSheet(window, defaultButtonTitle, alternateButtonTitle, didEndMessage(delegate, selector), contextInfo);
  }

  /// The connect button. \param sender who says so; not used
  void connectClicked(const void* sender);
  /// The cancel button: ends the sheet. An action under way goes on, but a success of it is not told any more.
  /// \param sender who says so; not used
  void cancelClicked(const void* sender);
  /// Ends the sheet after a login; sent by the panel.
  void loggedInToServer();

  /// The embedded panel; there from the beginning.
  const std::shared_ptr<LMRServerLoginViewController>& serverLoginViewController() const {
    return serverLoginViewController_;
  }
  /// What the first begin has loaded; nothing before.
  const lumora::ServerLoginWindow& outlets() const { return outlets_; }

  /// The title of the button that logs in; nothing: "Connect" in the user's language.
  std::optional<std::string> defaultButtonTitle() const { return defaultButtonTitle_; }
  void setDefaultButtonTitle(std::optional<std::string> title) { defaultButtonTitle_ = std::move(title); }
  /// The title of the button that closes the sheet; nothing: "Cancel" in the user's language.
  std::optional<std::string> alternateButtonTitle() const { return alternateButtonTitle_; }
  void setAlternateButtonTitle(std::optional<std::string> title) { alternateButtonTitle_ = std::move(title); }

private:
  using DidEndMessage =
      std::function<void(const std::shared_ptr<lumora::Window>& sheet, int returnCode, const std::any& contextInfo)>;

  template <class Delegate, class Selector>
  static DidEndMessage didEndMessage(const std::shared_ptr<Delegate>& delegate, Selector selector);

  void beginSheet(const std::shared_ptr<lumora::Window>& parent, const std::optional<std::string>& defaultTitle,
                  const std::optional<std::string>& alternateTitle, const DidEndMessage& didEnd,
                  const std::any& contextInfo);
  void endSheet(int returnCode);
  void loadWindow();
  void awakeFromNib();
  void windowDidLoad();
  void choosePage();
  void selectPage(int page);
  void layout();
  void layoutLowerControls();

  const std::shared_ptr<LMRServerLoginViewController> serverLoginViewController_;
  lumora::ServerLoginWindow outlets_;
  bool isWindowLoaded_ = false;
  std::optional<std::string> defaultButtonTitle_;
  std::optional<std::string> alternateButtonTitle_;
  bool kioskModeEnabled_ = false;
  lumora::Connection runningConnection_;
  lumora::Connection sizeConnection_;
};

template <class Delegate, class Selector>
LMRServerLoginSheetController::DidEndMessage
LMRServerLoginSheetController::didEndMessage(const std::shared_ptr<Delegate>& delegate, Selector selector) {
  return [weak = std::weak_ptr<Delegate>(delegate), selector](const std::shared_ptr<lumora::Window>& sheet,
                                                              int returnCode, const std::any& contextInfo) {
    const auto receiver = weak.lock();
    if (!receiver) {
      return;
    }
    if constexpr (std::is_invocable_v<Selector, Delegate&, int>) {
      ((*receiver).*selector)(returnCode);
    } else {
      ((*receiver).*selector)(sheet, returnCode, contextInfo);
    }
  };
}
