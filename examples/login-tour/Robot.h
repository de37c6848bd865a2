#pragma once

#include <LumoraKit/login/LMRServerLoginSheetController.h>

#include <QDialog>
#include <filesystem>
#include <string>

class QLineEdit;

namespace tour {

class Machine;

/// Uses the sheet where nobody sits before the screen: with keys and clicks, reading what it shows. Saves pictures of
/// the screen where the window is. What does not appear in the sheet is a stage::Failure.
class Robot {
public:
  Robot(const Machine& machine, std::filesystem::path folder);

  /// Where the pictures are.
  const std::filesystem::path& folder() const { return folder_; }

  /// Each to be called when the sheet has begun, with the beginning of its pictures' names; returns having pressed
  /// connect.
  void chooseServerAndTypePassword(const std::string& name, LMRServerLoginSheetController& sheet);
  void useRememberedPassword(const std::string& name, LMRServerLoginSheetController& sheet);
  void useTicket(const std::string& name, LMRServerLoginSheetController& sheet);

private:
  void watch(const std::string& name, const LMRServerLoginSheetController& sheet);
  void chooseServer();
  void typeServer();
  void waitForPasswordField();
  void tickRememberPassword();
  void savePicture(const std::string& state);
  template <class Widget> Widget& find(const char* name) const;
  QLineEdit& serverField() const;

  const Machine& machine_;
  const std::filesystem::path folder_;
  std::string name_;
  QDialog* dialog_ = nullptr;
};

} // namespace tour
