#include "recorder/window/SettingsDialog.h"

#include "recorder/window/Words.h"

#include <QDialogButtonBox>
#include <QFileDialog>
#include <QFormLayout>
#include <QHBoxLayout>
#include <QLabel>
#include <QPushButton>
#include <QVBoxLayout>

namespace recorder {

SettingsDialog::SettingsDialog(const Studio& studio, QWidget* parent)
    : QDialog(parent), studio_(studio), folder_(new QLineEdit(this)), quality_(new QComboBox(this)),
      encoder_(new QComboBox(this)), camera_(new QComboBox(this)), microphone_(new QComboBox(this)) {
  setWindowTitle(words("Settings"));
  build();
  const Settings& now = studio.settings();
  folder_->setText(now.folder ? QString::fromStdString(now.folder->string()) : QString());
  quality_->setCurrentIndex(quality_->findData(static_cast<int>(now.quality)));
  fillEncoders(now.encoder);
  fillDevices(*camera_, studio.devices().cameras(), now.camera);
  fillDevices(*microphone_, studio.devices().microphones(), now.microphone);
}

void SettingsDialog::build() {
  folder_->setObjectName("folder");
  folder_->setPlaceholderText(words("The recorder's own folder"));
  folder_->setMinimumWidth(fontMetrics().averageCharWidth() * 36);
  auto* const browse = new QPushButton(words("Choose…"), this);
  browse->setAutoDefault(false);
  connect(browse, &QPushButton::clicked, this, [this] { chooseFolder(); });
  auto* const folderRow = new QHBoxLayout;
  folderRow->addWidget(folder_, 1);
  folderRow->addWidget(browse);
  quality_->setObjectName("quality");
  quality_->addItem(words("Small files"), static_cast<int>(Quality::Small));
  quality_->addItem(words("Standard"), static_cast<int>(Quality::Standard));
  quality_->addItem(words("High"), static_cast<int>(Quality::High));
  encoder_->setObjectName("encoder");
  camera_->setObjectName("defaultCamera");
  microphone_->setObjectName("defaultMicrophone");
  auto* const form = new QFormLayout;
  const auto add = [&](Text label, QWidget* field, auto row) {
    form->addRow(words(label), row);
    auto* const text = qobject_cast<QLabel*>(form->labelForField(row));
    text->setBuddy(field);
    field->setAccessibleName(text->text().remove('&').remove(':'));
  };
  add("&Folder for recordings:", folder_, folderRow);
  add("&Quality:", quality_, quality_);
  add("&Encoder:", encoder_, encoder_);
  add("&Camera:", camera_, camera_);
  add("&Microphone:", microphone_, microphone_);
  auto* const buttons = new QDialogButtonBox(this);
  buttons->addButton(words("OK"), QDialogButtonBox::AcceptRole);
  buttons->addButton(words("Cancel"), QDialogButtonBox::RejectRole);
  connect(buttons, &QDialogButtonBox::accepted, this, &QDialog::accept);
  connect(buttons, &QDialogButtonBox::rejected, this, &QDialog::reject);
  auto* const layout = new QVBoxLayout(this);
  layout->addLayout(form);
  layout->addWidget(buttons);
}

// One that does not work at the moment stays chosen.
void SettingsDialog::fillEncoders(const std::string& chosen) {
  encoder_->addItem(words("Automatic"), QString());
  for (const lumora::MediaEncoder& each : studio_.devices().encoders()) {
    const QString name = QString::fromStdString(each.name);
    encoder_->addItem(each.isHardware ? words("%1 (hardware)").arg(name) : name,
                      QString::fromStdString(each.identifier));
  }
  const QString identifier = QString::fromStdString(chosen);
  if (encoder_->findData(identifier) < 0) {
    encoder_->addItem(words("%1 (not available)").arg(identifier), identifier);
  }
  encoder_->setCurrentIndex(encoder_->findData(identifier));
}

// One that is not connected at the moment stays chosen.
void SettingsDialog::fillDevices(QComboBox& box, const SourceDescriptions& devices, const std::string& chosen) {
  box.addItem(words("The system's choice"), QString());
  for (const SourceDescription& device : devices) {
    box.addItem(QString::fromStdString(device.name), QString::fromStdString(device.identifier));
  }
  const QString identifier = QString::fromStdString(chosen);
  if (box.findData(identifier) < 0) {
    box.addItem(words("%1 (not connected)").arg(identifier), identifier);
  }
  box.setCurrentIndex(box.findData(identifier));
}

void SettingsDialog::chooseFolder() {
  const QString chosen = QFileDialog::getExistingDirectory(this, words("Folder for Recordings"), folder_->text());
  if (!chosen.isEmpty()) {
    folder_->setText(chosen);
  }
}

Settings SettingsDialog::settings() const {
  Settings settings = studio_.settings();
  const std::string folder = folder_->text().trimmed().toStdString();
  settings.folder = folder.empty() ? std::nullopt : std::optional<std::filesystem::path>(folder);
  settings.quality = static_cast<Quality>(quality_->currentData().toInt());
  settings.encoder = encoder_->currentData().toString().toStdString();
  settings.camera = camera_->currentData().toString().toStdString();
  settings.microphone = microphone_->currentData().toString().toStdString();
  return settings;
}

} // namespace recorder
