#pragma once

#include <QLabel>

class QPaintEvent;

namespace lumora::qt {

/// The marker beside a field that is required and empty, drawn for a light or a dark window.
class RequiredMarker final : public QLabel {
public:
  explicit RequiredMarker(QWidget* parent = nullptr);
  RequiredMarker(const RequiredMarker&) = delete;
  RequiredMarker& operator=(const RequiredMarker&) = delete;
  ~RequiredMarker() override;

protected:
  void paintEvent(QPaintEvent* event) override;
};

} // namespace lumora::qt
