#pragma once

#include <QProgressBar>
#include <QVariantAnimation>

class QHideEvent;
class QPaintEvent;
class QShowEvent;

namespace lumora::qt {

/// Turns while it is visible.
class BusyIndicator final : public QProgressBar {
public:
  explicit BusyIndicator(QWidget* parent = nullptr);
  BusyIndicator(const BusyIndicator&) = delete;
  BusyIndicator& operator=(const BusyIndicator&) = delete;
  ~BusyIndicator() override;

protected:
  void paintEvent(QPaintEvent* event) override;
  void showEvent(QShowEvent* event) override;
  void hideEvent(QHideEvent* event) override;

private:
  QVariantAnimation turn_;
};

} // namespace lumora::qt
