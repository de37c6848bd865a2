#pragma once

#include <LumoraKit/login/LMRServerLoginSheetController.h>
#include <LumoraKit/login/LMRServerLoginViewController.h>
#include <LumoraKit/platform/KTServiceComboBox.h>
#include <LumoraKit/platform/Observable.h>
#include <LumoraKit/platform/UserInterface.h>
#include <LumoraKit/testing/FakeViews.h>

#include <cstddef>
#include <memory>
#include <set>
#include <string>
#include <vector>

namespace lumora::fakes {

/// The login panel as a user meets it: shows what the controller says, and takes what the test types and chooses.
class LUMORA_EXPORT FakeLoginPanel {
public:
  /// Made by FakeUserInterface when the controller loads its interface file.
  FakeLoginPanel(const std::shared_ptr<LMRServerLoginViewController>& owner, const std::shared_ptr<OrderList>& orders);
  FakeLoginPanel(const FakeLoginPanel&) = delete;
  FakeLoginPanel& operator=(const FakeLoginPanel&) = delete;
  ~FakeLoginPanel();

  /// Replaces the text of the server field, letter by letter unless it is emptied.
  void typeServer(const std::string& text);
  /// Return in the server field, or a change to another one.
  void finishServer();
  /// Takes a server from the list; false when it is not listed.
  bool chooseServer(const std::string& name);
  /// Replaces the text of a field, which must be visible: false when it is not.
  bool typeUserName(const std::string& text);
  /// The same for the password.
  bool typePassword(const std::string& text);
  /// Clicks the check box; false when it is not visible.
  bool setRememberPassword(bool remember);

  /// Whether the check box is ticked.
  bool isRememberPasswordTicked() const { return isTicked_; }

  /// @{
  /// The outlets of the panel, as lumora::ServerLoginView names them.
  const std::shared_ptr<FakeView> view;
  const std::shared_ptr<FakeComboBox> serverField;
  const std::shared_ptr<KTServiceComboBox> serverComboBox;
  const std::shared_ptr<FakeView> userNameLabelTextField;
  const std::shared_ptr<FakeTextField> userNameTextField;
  const std::shared_ptr<FakeView> passwordLabelTextField;
  const std::shared_ptr<FakeTextField> passwordTextField;
  const std::shared_ptr<FakeView> rememberPasswordInKeychainButton;
  const std::shared_ptr<FakeView> serverRequiredImageView;
  const std::shared_ptr<FakeView> userNameRequiredImageView;
  const std::shared_ptr<FakeView> passwordRequiredImageView;
  /// @}

private:
  void bindTo(LMRServerLoginViewController& owner);

  const std::weak_ptr<LMRServerLoginViewController> owner_;
  bool isTicked_ = false;
  std::vector<Connection> bindings_;
};

/// The window of the login sheet as a user meets it.
class LUMORA_EXPORT FakeLoginWindow {
public:
  /// Made by FakeUserInterface when the controller loads its interface file.
  FakeLoginWindow(const std::shared_ptr<LMRServerLoginSheetController>& owner,
                  const std::shared_ptr<OrderList>& orders);
  FakeLoginWindow(const FakeLoginWindow&) = delete;
  FakeLoginWindow& operator=(const FakeLoginWindow&) = delete;
  ~FakeLoginWindow();

  /// Clicks the button that logs in; false when the window is not shown or the button is disabled.
  bool clickDefaultButton();
  /// Clicks the button that closes the sheet; false when the window is not shown.
  bool clickAlternateButton();
  /// Whether the button that logs in can be clicked.
  bool isDefaultButtonEnabled() const { return isDefaultButtonEnabled_; }
  /// What the page that is shown says: the progress, the error, or nothing.
  std::string visibleText() const;

  /// @{
  /// The outlets of the window, as lumora::ServerLoginWindow names them.
  const std::shared_ptr<FakeWindow> window;
  const std::shared_ptr<FakeContainerView> serverLoginView;
  const std::shared_ptr<FakeTabView> progressAndErrorTabView;
  const std::shared_ptr<FakeImageView> alertImageView;
  const std::shared_ptr<FakeView> errorTextField;
  const std::shared_ptr<FakeButton> defaultButton;
  const std::shared_ptr<FakeButton> alternateButton;
  /// @}

private:
  const std::weak_ptr<LMRServerLoginSheetController> owner_;
  bool isDefaultButtonEnabled_ = false;
  Connection enabledBinding_;
};

/// A user interface without a screen: keeps every order, and lets a test type and click. The fields of a panel that it
/// loads are visible, the markers too. Main thread only.
///
///     platform.userInterface->panel()->typeServer("studio.example.org");
///     platform.userInterface->window()->clickDefaultButton();
class LUMORA_EXPORT FakeUserInterface final : public UserInterface {
public:
  FakeUserInterface();
  ~FakeUserInterface() override;

  /// The panel that was loaded last; null before.
  const std::shared_ptr<FakeLoginPanel>& panel() const { return panel_; }
  /// The window that was loaded last; null before.
  const std::shared_ptr<FakeLoginWindow>& window() const { return window_; }
  /// Lets go of both, as a toolkit does whose windows were destroyed.
  void forgetViews();

  /// From now on this outlet is missing in what is loaded.
  void leaveOut(const std::string& outlet) { missing_.insert(outlet); }

  /// The orders of everything loaded here, and "beep".
  const std::vector<std::string>& orders() const { return orders_->all(); }
  /// Empties the list of orders.
  void forgetOrders() { orders_->clear(); }

  ServerLoginView loadServerLoginView(const std::shared_ptr<LMRServerLoginViewController>& owner) override;
  ServerLoginWindow loadServerLoginWindow(const std::shared_ptr<LMRServerLoginSheetController>& owner) override;
  void beep() override;

private:
  template <class Outlet> std::shared_ptr<Outlet> unlessMissing(const char* name, std::shared_ptr<Outlet> outlet) const;

  const std::shared_ptr<OrderList> orders_ = std::make_shared<OrderList>();
  std::set<std::string> missing_;
  std::shared_ptr<FakeLoginPanel> panel_;
  std::shared_ptr<FakeLoginWindow> window_;
};

} // namespace lumora::fakes
