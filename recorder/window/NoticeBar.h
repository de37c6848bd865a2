#pragma once

#include <QFrame>
#include <QLabel>
#include <QToolButton>

namespace recorder {

/// One sentence that the user ought to read, until it is put away.
class NoticeBar final : public QFrame {
  Q_OBJECT

public:
  explicit NoticeBar(QWidget* parent);

  /// Hides itself when the text is empty.
  void setText(const QString& text);

signals:
  void dismissed();

protected:
  void changeEvent(QEvent* event) override;

private:
  void paintBackground();

  QLabel* const text_;
  QToolButton* const close_;
};

} // namespace recorder
