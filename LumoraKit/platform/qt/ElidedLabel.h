#pragma once

#include <QLabel>
#include <QStringList>

class QPaintEvent;

namespace lumora::qt {

/// A label that wraps its text into its frame and elides the rest of the last line. A text that is cut is in the tool
/// tip, and the whole of it is what assistive software reads.
class ElidedLabel final : public QLabel {
public:
  explicit ElidedLabel(QWidget* parent = nullptr);
  ElidedLabel(const ElidedLabel&) = delete;
  ElidedLabel& operator=(const ElidedLabel&) = delete;
  ~ElidedLabel() override;

  void setFullText(const QString& text);

protected:
  void paintEvent(QPaintEvent* event) override;

private:
  QStringList lines() const;
};

} // namespace lumora::qt
