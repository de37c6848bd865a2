#pragma once

#include "recorder/model/Studio.h"

#include <QComboBox>
#include <QLineEdit>
#include <QPlainTextEdit>
#include <QWidget>

namespace recorder {

/// Which workflow the recording is for, and what its viewers are told.
class EpisodePanel final : public QWidget {
public:
  EpisodePanel(std::shared_ptr<Studio> studio, QWidget* parent);

  /// After a change of the studio.
  void refresh();
  /// For the next recording.
  void clear();
  /// What was typed; without a title, one with the date.
  Episode episode() const;

private:
  void build();
  static QString titleOfToday();

  const std::shared_ptr<Studio> studio_;
  QComboBox* const workflow_;
  QLineEdit* const title_;
  QPlainTextEdit* const description_;
};

} // namespace recorder
