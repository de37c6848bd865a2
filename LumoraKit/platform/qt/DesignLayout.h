#pragma once

#include <QObject>
#include <QRectF>
#include <QSizeF>
#include <QString>
#include <vector>

class QWidget;

namespace lumora::qt {

/// Keeps the children of a widget where their Designer file has them, while the widget, its font or its direction
/// changes. A child's property "struts" names the margins that stay as they are: letters of LRTB, where two opposite
/// ones stretch the child. Lengths are units: a pixel with an ordinary font, more with a large one, so that everything
/// grows with the text. Frames have their origin in the upper left corner, and are those of a left-to-right language.
class DesignLayout final : public QObject {
public:
  /// Takes the children and the size of the widget as designed, and dies with the widget.
  explicit DesignLayout(QWidget* host);
  DesignLayout(const DesignLayout&) = delete;
  DesignLayout& operator=(const DesignLayout&) = delete;
  ~DesignLayout() override;

  /// The layout of a widget's children; null when it has none.
  static DesignLayout* of(const QWidget* host);
  /// A unit's length in (device-independent) pixels.
  static double unitOf(const QWidget* widget);

  /// Where the child lies in the host as large as it is now.
  QRectF frame(const QWidget* child) const;
  void setFrame(const QWidget* child, const QRectF& frame);

  bool eventFilter(QObject* watched, QEvent* event) override;

private:
  struct Item {
    QWidget* widget;
    QRectF designed;
    QString struts;
  };

  QRectF placed(const Item& item) const;
  QSizeF growth() const;
  void apply() const;
  const Item* item(const QWidget* child) const;

  QWidget* const host_;
  const QSizeF designSize_;
  std::vector<Item> items_;
};

} // namespace lumora::qt
