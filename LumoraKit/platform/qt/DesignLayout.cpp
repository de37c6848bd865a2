#include <LumoraKit/platform/qt/DesignLayout.h>

#include <QChildEvent>
#include <QEvent>
#include <QFontMetricsF>
#include <QStyle>
#include <QVariant>
#include <QWidget>
#include <algorithm>

namespace lumora::qt {
namespace {

// The fields of the design hold a line of 16 pixels, and have room for one of 18.
constexpr double designedLineHeight = 16;
constexpr double ordinaryLineHeight = 18;

QRect scaled(const QRectF& frame, double unit) {
  return {qRound(frame.x() * unit), qRound(frame.y() * unit), qRound(frame.width() * unit),
          qRound(frame.height() * unit)};
}

// How a child moves and stretches along one side when its host grows.
void follow(double& start, double& length, double growth, bool keepsStart, bool keepsEnd) {
  if (keepsEnd && keepsStart) {
    length += growth;
  } else if (keepsEnd) {
    start += growth;
  }
}

QRectF moved(const QRectF& frame, const QString& struts, const QSizeF& growth) {
  double x = frame.x();
  double y = frame.y();
  double width = frame.width();
  double height = frame.height();
  follow(x, width, growth.width(), struts.contains(u'L'), struts.contains(u'R'));
  follow(y, height, growth.height(), struts.contains(u'T'), struts.contains(u'B'));
  return {x, y, width, height};
}

} // namespace

DesignLayout::DesignLayout(QWidget* host) : QObject(host), host_(host), designSize_(host->size()) {
  for (QObject* const child : host->children()) {
    if (auto* const widget = qobject_cast<QWidget*>(child)) {
      items_.push_back({widget, widget->geometry(), widget->property("struts").toString()});
    }
  }
  host->installEventFilter(this);
}

DesignLayout::~DesignLayout() = default;

DesignLayout* DesignLayout::of(const QWidget* host) {
  for (QObject* const child : host ? host->children() : QObjectList()) {
    if (auto* const layout = dynamic_cast<DesignLayout*>(child)) {
      return layout;
    }
  }
  return nullptr;
}

double DesignLayout::unitOf(const QWidget* widget) {
  const double height = QFontMetricsF(widget->font()).height();
  return height <= ordinaryLineHeight ? 1.0 : height / designedLineHeight;
}

QSizeF DesignLayout::growth() const {
  return QSizeF(host_->size()) / unitOf(host_) - designSize_;
}

QRectF DesignLayout::placed(const Item& item) const {
  return moved(item.designed, item.struts, growth());
}

const DesignLayout::Item* DesignLayout::item(const QWidget* child) const {
  const auto found = std::ranges::find(items_, child, &Item::widget);
  return found == items_.end() ? nullptr : &*found;
}

QRectF DesignLayout::frame(const QWidget* child) const {
  const Item* const found = item(child);
  return found ? placed(*found) : QRectF();
}

void DesignLayout::setFrame(const QWidget* child, const QRectF& frame) {
  const auto found = std::ranges::find(items_, child, &Item::widget);
  if (found != items_.end()) {
    found->designed = moved(frame, found->struts, QSizeF(0, 0) - growth());
    apply();
  }
}

void DesignLayout::apply() const {
  const double unit = unitOf(host_);
  for (const Item& item : items_) {
    const QRect frame = scaled(placed(item), unit);
    item.widget->setGeometry(QStyle::visualRect(host_->layoutDirection(), host_->rect(), frame));
  }
}

bool DesignLayout::eventFilter(QObject* /*watched*/, QEvent* event) {
  switch (event->type()) {
  case QEvent::Resize:
  case QEvent::LayoutDirectionChange:
  case QEvent::FontChange:
  case QEvent::Show:
    apply();
    break;
  case QEvent::ChildRemoved:
    std::erase_if(items_, [child = dynamic_cast<QChildEvent&>(*event).child()](const Item& item) {
      return item.widget == child;
    });
    break;
  default:
    break;
  }
  return false;
}

} // namespace lumora::qt
