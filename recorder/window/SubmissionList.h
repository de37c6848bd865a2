#pragma once

#include "recorder/model/Studio.h"

#include <QListWidget>
#include <QPushButton>
#include <QWidget>

namespace recorder {

/// What is on its way to the server, and what has arrived there.
class SubmissionList final : public QWidget {
public:
  SubmissionList(std::shared_ptr<Studio> studio, QWidget* parent);

  /// After a change of the studio.
  void refresh();

private:
  void build();
  void addSubmission(const LMRSubmission& submission);
  void addTransfer(const Transfer& transfer);
  void addLine(const QString& title, const QString& state, const QColor& colour, const QString& identifier);
  QString selected() const;
  void selectionChanged();
  void removeSelected();

  const std::shared_ptr<Studio> studio_;
  QListWidget* const list_;
  QPushButton* const retry_;
  QPushButton* const remove_;
};

} // namespace recorder
