#include <LumoraKit/platform/KTServiceComboBox.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/Platform.h>

#include <algorithm>
#include <utility>

using lumora::NetService;

KTServiceComboBoxDelegate::~KTServiceComboBoxDelegate() = default;

KTServiceComboBox::KTServiceComboBox(std::shared_ptr<lumora::ComboBox> comboBox) : comboBox_(std::move(comboBox)) {}

KTServiceComboBox::~KTServiceComboBox() = default;

void KTServiceComboBox::startBrowsing(const std::shared_ptr<KTServiceComboBoxDelegate>& delegate) {
  browser_.reset();
  while (!services_.empty()) {
    remove(std::shared_ptr<NetService>(services_.back()));
  }
  delegate_ = delegate;
  LMRErrorRef error;
  // The browser dies with this object, and tells nothing after that.
  browser_ =
      lumora::Platform::current().serviceDiscovery->browse(serviceType,
                                                           {.found = [this](const auto& service) { add(service); },
                                                            .lost = [this](const auto& service) { remove(service); }},
                                                           &error);
  if (error) {
    lumora::log("Couldn't browse for services of type '%@': %@", {lumora::text(serviceType), lumora::text(error)});
  }
}

void KTServiceComboBox::stopBrowsing(const std::shared_ptr<KTServiceComboBoxDelegate>& delegate) {
  if (delegate == delegate_.lock()) {
    browser_.reset();
  }
}

bool KTServiceComboBox::lists(const std::string& name) const {
  return std::ranges::any_of(services_, [&](const auto& service) { return service->name() == name; });
}

void KTServiceComboBox::add(const std::shared_ptr<NetService>& service) {
  if (!lists(service->name())) {
    comboBox_->addItem(service->name());
  }
  services_.push_back(service);
}

void KTServiceComboBox::remove(const std::shared_ptr<NetService>& service) {
  if (std::erase(services_, service) > 0 && !lists(service->name())) {
    comboBox_->removeItem(service->name());
  }
}

lumora::Rect KTServiceComboBox::frame() const {
  return comboBox_->frame();
}

void KTServiceComboBox::setFrame(const lumora::Rect& frame) {
  comboBox_->setFrame(frame);
}

bool KTServiceComboBox::isHidden() const {
  return comboBox_->isHidden();
}

void KTServiceComboBox::setHidden(bool hidden) {
  comboBox_->setHidden(hidden);
}

std::string KTServiceComboBox::stringValue() const {
  return comboBox_->stringValue();
}

void KTServiceComboBox::setStringValue(const std::string& text) {
  selectedServiceName_.reset();
  comboBox_->setStringValue(text);
}

void KTServiceComboBox::makeFirstResponder() {
  comboBox_->makeFirstResponder();
}

void KTServiceComboBox::endEditing() {
  isEdited_ = false;
  comboBox_->endEditing();
}

void KTServiceComboBox::userChoseItem(const std::string& item) {
  isEdited_ = false;
  selectedServiceName_ = item;
  comboBox_->setStringValue(item);
  if (const auto delegate = delegate_.lock()) {
    delegate->comboBoxSelectionDidChange(shared_from_this());
  }
}

void KTServiceComboBox::userChangedText() {
  isEdited_ = true;
  selectedServiceName_.reset();
  if (const auto delegate = delegate_.lock()) {
    delegate->controlTextDidChange(shared_from_this());
  }
}

void KTServiceComboBox::userFinishedEditing() {
  if (std::exchange(isEdited_, false) && action_) {
    action_();
  }
}
