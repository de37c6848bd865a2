#pragma once

#include <LumoraKit/LumoraKit.h>

#include <QWidget>
#include <vector>

namespace recorder {

/// How loud a microphone is: a bar a channel, from -60 dB to full scale, which falls back slowly.
class LevelView final : public QWidget {
public:
  explicit LevelView(QWidget* parent);

  /// None when nothing was heard since the last call.
  void setLevels(const std::vector<lumora::SoundLevel>& levels);
  void clear();

  QSize sizeHint() const override;
  QSize minimumSizeHint() const override { return sizeHint(); }

protected:
  void paintEvent(QPaintEvent* event) override;

private:
  // 0 to 1, one a channel.
  std::vector<double> heights_;
};

} // namespace recorder
