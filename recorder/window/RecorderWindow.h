#pragma once

#include "recorder/model/Studio.h"
#include "recorder/window/ControlBar.h"
#include "recorder/window/EpisodePanel.h"
#include "recorder/window/LoginFlow.h"
#include "recorder/window/NoticeBar.h"
#include "recorder/window/SourceCard.h"
#include "recorder/window/SubmissionList.h"

#include <QHBoxLayout>
#include <QLabel>
#include <QMainWindow>
#include <QStackedWidget>
#include <QTimer>
#include <memory>
#include <vector>

namespace recorder {

/// The one window of the recorder.
class RecorderWindow final : public QMainWindow {
public:
  RecorderWindow();
  ~RecorderWindow() override;

  /// Shows the login sheet over the window.
  void logIn();

  const std::shared_ptr<Studio>& studio() const { return studio_; }

protected:
  void closeEvent(QCloseEvent* event) override;

private:
  QWidget* buildWelcome();
  QWidget* buildRecorder();
  QWidget* buildSidebar();
  void buildMenus();
  void refresh();
  void refreshCards();
  void refreshMenus();
  void tick();
  void loggedIn(const std::shared_ptr<LMRSession>& session);
  void showSettings();
  void askToDiscard();
  void askToStopWithoutServer();
  void askAboutInterrupted();
  void stop();
  bool mayClose();
  void closeWhenDone();
  QString emptyText() const;

  const std::shared_ptr<Studio> studio_;
  const std::shared_ptr<LoginFlow> login_;
  lumora::Connection connection_;
  QTimer timer_;
  bool isRefreshWanted_ = true;
  // The user wants to leave as soon as the recording is submitted.
  bool isLeaving_ = false;
  bool wasUnderWay_ = false;
  bool isAskingAboutServer_ = false;
  bool isAskingAboutInterrupted_ = false;
  QStackedWidget* const pages_;
  NoticeBar* notice_ = nullptr;
  QLabel* empty_ = nullptr;
  QHBoxLayout* cardRow_ = nullptr;
  std::vector<SourceCard*> cards_;
  ControlBar* controls_ = nullptr;
  EpisodePanel* episode_ = nullptr;
  SubmissionList* submissions_ = nullptr;
  QLabel* user_ = nullptr;
  QAction* settingsAction_ = nullptr;
  QAction* loginAction_ = nullptr;
  QAction* recordAction_ = nullptr;
  QAction* pauseAction_ = nullptr;
  QAction* stopAction_ = nullptr;
  QAction* discardAction_ = nullptr;
};

} // namespace recorder
