#include "recorder/window/IconButton.h"

#include <gtest/gtest.h>

#include <QApplication>
#include <QImage>
#include <QPixmap>
#include <functional>

namespace {

constexpr int width = 300;
constexpr int frame = 10;
constexpr int iconSide = 16;

// The first and the last column inside of the frame that has such a pixel in the height of the icon.
struct Columns {
  int first = width;
  int last = -1;
};

Columns find(const QImage& image, const std::function<bool(const QColor&)>& isWanted) {
  Columns found;
  for (int x = frame; x < image.width() - frame; ++x) {
    for (int y = (image.height() - iconSide) / 2; y < (image.height() + iconSide) / 2; ++y) {
      if (isWanted(image.pixelColor(x, y))) {
        found.first = std::min(found.first, x);
        found.last = x;
      }
    }
  }
  return found;
}

QImage drawn(const char* text, Qt::LayoutDirection direction) {
  recorder::IconButton button(text);
  QPixmap icon(iconSide, iconSide);
  icon.fill(Qt::red);
  button.setIcon(icon);
  button.setIconSize(icon.size());
  QPalette palette(Qt::white);
  palette.setColor(QPalette::ButtonText, Qt::blue);
  button.setPalette(palette);
  // The whole application's: one button alone was drawn well.
  QApplication::setLayoutDirection(direction);
  button.resize(width, 40);
  return button.grab().toImage();
}

constexpr auto isIcon = [](const QColor& colour) { return colour.red() > 200 && colour.blue() < 60; };
constexpr auto isText = [](const QColor& colour) { return colour.blue() > 200 && colour.red() < 60; };

// The text stood at the button's left end, far from its icon.
TEST(IconButton, hasItsTextBesideItsIcon_fromRightToLeft) {
  const QImage image = drawn("إنهاء", Qt::RightToLeft);
  const Columns icon = find(image, isIcon);
  const Columns text = find(image, isText);
  ASSERT_GE(icon.last, 0);
  ASSERT_GE(text.last, 0);
  EXPECT_LT(text.last, icon.first);
  EXPECT_LT(icon.first - text.last, iconSide);
}

TEST(IconButton, hasItsTextBesideItsIcon_fromLeftToRight) {
  const QImage image = drawn("Stop", Qt::LeftToRight);
  const Columns icon = find(image, isIcon);
  const Columns text = find(image, isText);
  ASSERT_GE(text.last, 0);
  EXPECT_LT(icon.last, text.first);
  EXPECT_LT(text.first - icon.last, iconSide);
}

} // namespace
