#include "recorder/window/LineDelegate.h"

#include "Desktop.h"
#include "recorder/window/Icons.h"

#include <gtest/gtest.h>

#include <QImage>
#include <QListWidget>
#include <QPixmap>

namespace recorder {
namespace {

QImage drawn(const QString& text, int width) {
  QListWidget list;
  list.setItemDelegate(new LineDelegate(&list));
  list.setIconSize(QSize(12, 12));
  list.setSpacing(3);
  list.setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
  auto* const item = new QListWidgetItem(text, &list);
  item->setIcon(signIcon(Shape::Dot, Qt::red));
  list.resize(width, 400);
  return list.grab().toImage();
}

// The list's own way leaves out what comes after a title that just fits, or just does not.
TEST(LineDelegate, drawsTextsToTheirLastLetter_atEveryWidth) {
  if (!desktop().missing.empty()) {
    GTEST_SKIP() << desktop().missing;
  }
  constexpr int narrow = 180;
  constexpr int wide = 340;
  const QString title = "Waves and Tones – Headless camera\nArrived at the ";
  for (int width = narrow; width < wide; ++width) {
    EXPECT_NE(drawn(title + "end", width), drawn(title + "eno", width)) << width;
  }
}

} // namespace
} // namespace recorder
