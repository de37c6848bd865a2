#include <LumoraKit/platform/qt/DesignLayout.h>
#include <LumoraKit/platform/qt/FramedButton.h>

#include <QFontMetricsF>
#include <QStyle>
#include <QStyleOptionButton>
#include <QStylePainter>
#include <cmath>

namespace lumora::qt {
namespace {

constexpr double margin = 6;
constexpr double padding = 10;

} // namespace

FramedButton::FramedButton(QWidget* parent) : QPushButton(parent) {}

FramedButton::~FramedButton() = default;

void FramedButton::setTitle(const QString& title) {
  title_ = title;
  setText(QString(title).replace(u'&', QStringLiteral("&&")));
}

double FramedButton::fittedWidth() const {
  return std::ceil(QFontMetricsF(font()).horizontalAdvance(title_) / DesignLayout::unitOf(this)) + 2 * padding;
}

QRect FramedButton::drawn() const {
  const int inset = qRound(margin * DesignLayout::unitOf(this));
  return rect().adjusted(inset, 1, -inset, -1);
}

QSize FramedButton::sizeHint() const {
  const double width = (fittedWidth() + 2 * margin) * DesignLayout::unitOf(this);
  return {static_cast<int>(std::ceil(width)), QPushButton::sizeHint().height()};
}

void FramedButton::paintEvent(QPaintEvent* /*event*/) {
  QStylePainter painter(this);
  QStyleOptionButton option;
  initStyleOption(&option);
  option.rect = drawn();
  painter.drawControl(QStyle::CE_PushButton, option);
}

bool FramedButton::hitButton(const QPoint& position) const {
  return drawn().contains(position);
}

} // namespace lumora::qt
