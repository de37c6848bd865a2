#pragma once

#include <QPushButton>

namespace recorder {

/// A button whose text stands beside its icon, also from right to left.
class IconButton final : public QPushButton {
public:
  using QPushButton::QPushButton;

protected:
  void paintEvent(QPaintEvent* event) override;
};

} // namespace recorder
