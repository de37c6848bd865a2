#pragma once

#include <QPushButton>

class QPaintEvent;

namespace lumora::qt {

/// A button that is drawn, and takes the mouse, 6 units inside of its frame on the left and on the right: the frames of
/// the login window's buttons touch, and their margins belong to them. The title is shown as it is, without a mnemonic.
class FramedButton final : public QPushButton {
public:
  explicit FramedButton(QWidget* parent = nullptr);
  FramedButton(const FramedButton&) = delete;
  FramedButton& operator=(const FramedButton&) = delete;
  ~FramedButton() override;

  void setTitle(const QString& title);
  /// The width in units that is drawn around the title: of the title alone, no style's least width.
  double fittedWidth() const;

  QSize sizeHint() const override;

protected:
  void paintEvent(QPaintEvent* event) override;
  bool hitButton(const QPoint& position) const override;

private:
  QRect drawn() const;

  QString title_;
};

} // namespace lumora::qt
