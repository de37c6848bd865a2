#pragma once

#include <LumoraKit/login/LMRServerLoginViewController.h>
#include <LumoraKit/platform/Observable.h>
#include <LumoraKit/platform/UserInterface.h>

#include <QString>
#include <QWidget>
#include <array>
#include <memory>
#include <vector>

class QEvent;
class QLabel;

namespace Ui {
class ServerLoginView;
}

namespace lumora::qt {

/// The interface file "ServerLoginView" with its bindings. The panel of an owner that died stays, and reports nothing.
class LoginPanel final : public QWidget {
public:
  explicit LoginPanel(const std::shared_ptr<LMRServerLoginViewController>& owner);
  LoginPanel(const LoginPanel&) = delete;
  LoginPanel& operator=(const LoginPanel&) = delete;
  ~LoginPanel() override;

  /// The views of the widgets. To be called once.
  ServerLoginView makeOutlets();

  /// The width in units that every text has room in.
  double neededWidth() const;

protected:
  void changeEvent(QEvent* event) override;

private:
  void describe();
  void bindUserName();
  void bindPassword();
  void bindRememberPassword();
  void report(const std::shared_ptr<KTServiceComboBox>& comboBox);
  void reportUserName(const std::shared_ptr<TextField>& field);
  std::array<QLabel*, 3> labels() const;
  void alignLabels();
  void fitLabelColumn();

  const std::weak_ptr<LMRServerLoginViewController> owner_;
  const std::unique_ptr<Ui::ServerLoginView> ui_;
  std::vector<Connection> bindings_;
};

/// A new panel and its views; it goes with the view `view`.
ServerLoginView loadLoginPanel(const std::shared_ptr<LMRServerLoginViewController>& owner);

} // namespace lumora::qt
