#pragma once

#include <QStyledItemDelegate>

namespace recorder {

/// Draws a line of a list: its sign, and its whole text, wrapped to the list's width. (The style's own way cuts some
/// texts off where they just fit.)
class LineDelegate final : public QStyledItemDelegate {
public:
  using QStyledItemDelegate::QStyledItemDelegate;

  void paint(QPainter* painter, const QStyleOptionViewItem& option, const QModelIndex& index) const override;
  QSize sizeHint(const QStyleOptionViewItem& option, const QModelIndex& index) const override;
};

} // namespace recorder
