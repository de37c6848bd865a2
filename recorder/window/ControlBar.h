#pragma once

#include "recorder/model/Studio.h"
#include "recorder/window/Words.h"

#include <QLabel>
#include <QPushButton>
#include <QWidget>

namespace recorder {

/// The buttons that record, the time, and the room that is left.
class ControlBar final : public QWidget {
  Q_OBJECT

public:
  ControlBar(std::shared_ptr<Studio> studio, QWidget* parent);

  /// After a change of the studio.
  void refresh();
  /// Some times a second: the times.
  void showNow();

signals:
  void stopWanted();
  void cancelWanted();

protected:
  void changeEvent(QEvent* event) override;

private:
  void build();
  void drawSigns();
  void togglePause();
  QPushButton* makeButton(const char* name, Text label);

  const std::shared_ptr<Studio> studio_;
  QPushButton* const record_;
  QPushButton* const stop_;
  QPushButton* const pause_;
  QPushButton* const cancel_;
  QLabel* const elapsed_;
  QLabel* const state_;
  QLabel* const room_;
};

} // namespace recorder
