#pragma once

#include "recorder/window/Colours.h"

#include <QLabel>
#include <QString>
#include <QWidget>

namespace recorder {

/// A coloured dot and what it means.
class StateLine final : public QWidget {
public:
  explicit StateLine(QWidget* parent);

  void set(Signal signal, const QString& text);
  QString text() const { return text_->text(); }

protected:
  void changeEvent(QEvent* event) override;

private:
  void drawDot();

  Signal signal_ = Signal::Quiet;
  QLabel* const dot_;
  QLabel* const text_;
};

} // namespace recorder
