#include "recorder/window/LineDelegate.h"

#include <QApplication>
#include <QListView>
#include <QPainter>
#include <QStyle>

namespace recorder {
namespace {

constexpr int margin = 3;
constexpr int gap = 6;

// A list's option has the width of the list only when it is painted.
int widthOf(const QStyleOptionViewItem& option) {
  const auto* const view = qobject_cast<const QListView*>(option.widget);
  return view ? view->viewport()->width() - 2 * view->spacing() : option.rect.width();
}

int indentOf(const QStyleOptionViewItem& option) {
  return option.icon.isNull() ? margin : margin + option.decorationSize.width() + gap;
}

QRect textRect(const QStyleOptionViewItem& option, const QRect& rect) {
  return QStyle::visualRect(option.direction, rect, rect.adjusted(indentOf(option), 1, -margin, -1));
}

// At the first line.
QRect signRect(const QStyleOptionViewItem& option) {
  const QSize size = option.decorationSize;
  const int down = 1 + (option.fontMetrics.height() - size.height()) / 2;
  return QStyle::visualRect(option.direction, option.rect, QRect(option.rect.topLeft() + QPoint(margin, down), size));
}

int flags() {
  return static_cast<int>(Qt::AlignLeading | Qt::AlignTop) | Qt::TextWordWrap;
}

} // namespace

void LineDelegate::paint(QPainter* painter, const QStyleOptionViewItem& option, const QModelIndex& index) const {
  QStyleOptionViewItem line = option;
  initStyleOption(&line, index);
  const QStyle* const style = line.widget ? line.widget->style() : QApplication::style();
  style->drawPrimitive(QStyle::PE_PanelItemViewItem, &line, painter, line.widget);
  line.icon.paint(painter, signRect(line));
  const auto group = line.state.testFlag(QStyle::State_Enabled) ? QPalette::Normal : QPalette::Disabled;
  const auto role = line.state.testFlag(QStyle::State_Selected) ? QPalette::HighlightedText : QPalette::Text;
  painter->save();
  painter->setFont(line.font);
  painter->setPen(line.palette.color(group, role));
  painter->drawText(textRect(line, line.rect), flags(), line.text);
  painter->restore();
  if (line.state.testFlag(QStyle::State_HasFocus)) {
    QStyleOptionFocusRect focus;
    focus.QStyleOption::operator=(line);
    focus.backgroundColor = line.palette.color(group, QPalette::Base);
    style->drawPrimitive(QStyle::PE_FrameFocusRect, &focus, painter, line.widget);
  }
}

QSize LineDelegate::sizeHint(const QStyleOptionViewItem& option, const QModelIndex& index) const {
  QStyleOptionViewItem line = option;
  initStyleOption(&line, index);
  constexpr int anyHeight = 10'000;
  const QRect room = textRect(line, QRect(0, 0, widthOf(line), anyHeight));
  return {widthOf(line), line.fontMetrics.boundingRect(room, flags(), line.text).height() + 2};
}

} // namespace recorder
