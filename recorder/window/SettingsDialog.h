#pragma once

#include "recorder/model/Studio.h"

#include <QComboBox>
#include <QDialog>
#include <QLineEdit>

namespace recorder {

/// What the user sets once: the folder, the quality, the encoder, and the devices to begin with.
class SettingsDialog final : public QDialog {
public:
  SettingsDialog(const Studio& studio, QWidget* parent);

  Settings settings() const;

private:
  void build();
  void fillEncoders(const std::string& chosen);
  void fillDevices(QComboBox& box, const SourceDescriptions& devices, const std::string& chosen);
  void chooseFolder();

  const Studio& studio_;
  QLineEdit* const folder_;
  QComboBox* const quality_;
  QComboBox* const encoder_;
  QComboBox* const camera_;
  QComboBox* const microphone_;
};

} // namespace recorder
