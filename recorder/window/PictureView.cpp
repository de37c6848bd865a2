#include "recorder/window/PictureView.h"

#include <QPainter>
#include <QPainterPath>

namespace recorder {
namespace {

constexpr int proportionsWidth = 16;
constexpr int proportionsHeight = 9;
constexpr double roundness = 6;
constexpr int margin = 16;

} // namespace

PictureView::PictureView(QWidget* parent) : QWidget(parent) {
  setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Expanding);
}

void PictureView::setPicture(const lumora::Picture& picture) {
  const QImage borrowed(picture.rgb.data(), static_cast<int>(picture.width), static_cast<int>(picture.height),
                        static_cast<qsizetype>(picture.width) * 3, QImage::Format_RGB888);
  picture_ = borrowed.copy();
  update();
}

void PictureView::setPictureFile(const lumora::Data& file) {
  const QImage image = QImage::fromData(file.data(), static_cast<int>(file.size()));
  if (!image.isNull()) {
    picture_ = image;
    update();
  }
}

void PictureView::setText(const QString& text) {
  if (text != text_ || !picture_.isNull()) {
    text_ = text;
    picture_ = QImage();
    update();
  }
}

int PictureView::heightFor(int width) {
  return width * proportionsHeight / proportionsWidth;
}

QSize PictureView::sizeHint() const {
  return {480, 270};
}

QSize PictureView::minimumSizeHint() const {
  return {224, 126};
}

void PictureView::paintEvent(QPaintEvent*) {
  QPainter painter(this);
  painter.setRenderHints(QPainter::Antialiasing | QPainter::SmoothPixmapTransform);
  QPainterPath frame;
  frame.addRoundedRect(rect(), roundness, roundness);
  painter.fillPath(frame, QColor(0x18, 0x1a, 0x1d));
  if (picture_.isNull()) {
    painter.setPen(QColor(0xb8, 0xbc, 0xc2));
    painter.drawText(rect().adjusted(margin, margin, -margin, -margin), Qt::AlignCenter | Qt::TextWordWrap, text_);
    return;
  }
  painter.setClipPath(frame);
  QRectF target(QPointF(), QSizeF(picture_.size()).scaled(QSizeF(size()), Qt::KeepAspectRatio));
  target.moveCenter(QRectF(rect()).center());
  painter.drawImage(target, picture_);
}

} // namespace recorder
