#pragma once

#include "Machine.h"
#include "Robot.h"

#include <LumoraKit/LumoraKit.h>

#include <QLabel>
#include <QMainWindow>
#include <string>

namespace tour {

/// One opening of the sheet.
struct Opening {
  /// Begins the names of its pictures.
  std::string name;
  /// What the user is told to do.
  std::string task;
  /// How the login is expected to come about.
  LMRAuthenticationType type;
  /// How the robot does it.
  void (Robot::*act)(const std::string& name, LMRServerLoginSheetController& sheet);
};

/// Opens the sheet several times over one window, and tells what came of each login and what is remembered of it.
class Tour {
public:
  /// \param robot null: a user does what is told
  Tour(Machine& machine, Robot* robot);

  /// Returns after the last login. A login that did not come about as it should is a stage::Failure.
  void run();

private:
  void runByPassword();
  void runByTicket();
  void open(const Opening& opening);
  void tell(const LMRServerLoginViewController& panel, const Opening& opening) const;
  std::string rememberedPassword(const LMRServerLoginViewController& panel, const LMRSession& session) const;

  Machine& machine_;
  Robot* const robot_;
  QMainWindow window_;
  QLabel* const label_;
};

} // namespace tour
