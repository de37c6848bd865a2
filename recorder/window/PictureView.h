#pragma once

#include <LumoraKit/LumoraKit.h>

#include <QImage>
#include <QString>
#include <QWidget>

namespace recorder {

/// Shows the picture of a source, or says why there is none.
class PictureView final : public QWidget {
public:
  explicit PictureView(QWidget* parent);

  void setPicture(const lumora::Picture& picture);
  /// A PNG or JPEG file; one that cannot be read is ignored.
  void setPictureFile(const lumora::Data& file);
  /// Shows the text in place of a picture.
  void setText(const QString& text);

  /// Of a picture of that width in the usual proportions.
  static int heightFor(int width);
  QSize sizeHint() const override;
  QSize minimumSizeHint() const override;

protected:
  void paintEvent(QPaintEvent* event) override;

private:
  QImage picture_;
  QString text_;
};

} // namespace recorder
