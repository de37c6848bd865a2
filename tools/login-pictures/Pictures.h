#pragma once

#include <LumoraKit/login/LMRServerLoginSheetController.h>
#include <LumoraKit/testing/FakePlatform.h>
#include <LumoraKit/testing/ManualQueues.h>

#include <QMainWindow>
#include <QPixmap>
#include <QString>
#include <QStringList>
#include <QWidget>
#include <any>
#include <memory>
#include <string>

class QLineEdit;

namespace pictures {

struct Order {
  QString folder;
  QString name;
  std::string language;
  /// All of them when it is empty.
  QStringList states;
};

/// The states of the login sheet, each brought about on fakes as a user and a server would do it.
class Pictures {
public:
  explicit Pictures(Order order);

  /// False when a picture could not be written.
  bool draw();

private:
  using State = void (Pictures::*)();

  bool draw(const char* name, State state);
  void begin(const std::any& contextInfo = {}, bool hasParent = true);
  void settle();
  void type(const char* field, const QString& text);
  void ask();
  void fillIn();
  void failWith(const std::string& message);
  template <class Widget> Widget* find(const char* name) const { return window_->findChild<Widget*>(name); }

  void start();
  void list();
  void serverRequired();
  void connecting();
  void serverFailed();
  void password();
  void remembered();
  void userNameRequired();
  void passwordRequired();
  void loggingIn();
  void loginFailed();
  void longError();
  void kiosk();
  void dialog();
  void overAWindow();

  const Order order_;
  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<lumora::fakes::ManualQueues> queues_;
  std::unique_ptr<QMainWindow> parent_;
  std::shared_ptr<LMRServerLoginSheetController> sheet_;
  QWidget* window_ = nullptr;
  QPixmap picture_;
};

} // namespace pictures
