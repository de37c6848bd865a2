#pragma once

#include "recorder/model/Studio.h"
#include "recorder/window/LevelView.h"
#include "recorder/window/PictureView.h"
#include "recorder/window/StateLine.h"

#include <QComboBox>
#include <QPushButton>
#include <QWidget>

namespace recorder {

/// One place of the workflow: which source is recorded there, what it shows, how loud it is and what it does.
class SourceCard final : public QWidget {
public:
  SourceCard(std::shared_ptr<Studio> studio, std::size_t place, QWidget* parent);

  /// After a change of the studio.
  void refresh();
  /// Some times a second.
  void showNow();
  /// Of the picture, in pixels of the screen.
  QSize pictureSize() const;

protected:
  void resizeEvent(QResizeEvent* event) override;

private:
  void build();
  void refreshChoices();
  void refreshState();
  std::shared_ptr<Source> source() const;
  static void fill(QComboBox& box, const SourceDescriptions& choices, const QString& chosen);

  const std::shared_ptr<Studio> studio_;
  const std::size_t place_;
  QComboBox* const sourceBox_;
  PictureView* const picture_;
  StateLine* const state_;
  QPushButton* const again_;
  QComboBox* const microphoneBox_;
  LevelView* const level_;
};

} // namespace recorder
