#pragma once

#include <LumoraKit/platform/ServiceDiscovery.h>
#include <LumoraKit/platform/UserInterface.h>

#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

class KTServiceComboBox;

/// Whom a combo box tells what the user does with it.
class LUMORA_EXPORT KTServiceComboBoxDelegate {
public:
  virtual ~KTServiceComboBoxDelegate();
  /// The user chose a service from the list.
  virtual void comboBoxSelectionDidChange(const std::shared_ptr<KTServiceComboBox>& comboBox) = 0;
  /// The user changed the text of the field.
  virtual void controlTextDidChange(const std::shared_ptr<lumora::TextField>& field) = 0;
};

/// An editable combo box that lists the Lumora servers of the network, as the platform's service discovery finds them.
/// Each name is listed once. Typing unselects what was chosen; services that come and go change neither the text nor
/// the choice. It wraps a toolkit's combo box, which reports to the operations named user...(). Main thread only.
class LUMORA_EXPORT KTServiceComboBox final : public lumora::TextField,
                                              public std::enable_shared_from_this<KTServiceComboBox> {
public:
  /// The type of service that is browsed for.
  static constexpr std::string_view serviceType = "_lumora._tcp";

  /// A field around the toolkit's combo box, which must be there.
  explicit KTServiceComboBox(std::shared_ptr<lumora::ComboBox> comboBox);
  ~KTServiceComboBox() override;

  /// Begins to list services, from an empty list, and returns at once. On a machine without service discovery the list
  /// stays empty, and the reason is logged. \param delegate whom to tell what the user does, from now on; held weakly
  void startBrowsing(const std::shared_ptr<KTServiceComboBoxDelegate>& delegate);
  /// Ends what was started with this delegate. The list stays, and so does the delegate.
  void stopBrowsing(const std::shared_ptr<KTServiceComboBoxDelegate>& delegate);

  /// The chosen service's name; nothing when the text was typed or set.
  std::optional<std::string> selectedServiceName() const { return selectedServiceName_; }
  /// In the order of their discovery.
  const std::vector<std::shared_ptr<lumora::NetService>>& discoveredNetServices() const { return services_; }

  /// What to do when the user has finished with the field.
  void setAction(std::function<void()> action) { action_ = std::move(action); }

  /// The frame of the toolkit's combo box.
  lumora::Rect frame() const override;
  void setFrame(const lumora::Rect& frame) override;
  bool isHidden() const override;
  void setHidden(bool hidden) override;
  std::string stringValue() const override;
  /// Unselects what was chosen.
  void setStringValue(const std::string& text) override;
  void makeFirstResponder() override;
  void endEditing() override;

  /// The user chose this item of the list.
  void userChoseItem(const std::string& item);
  /// The user changed the text.
  void userChangedText();
  /// The user pressed Return in the field, or went to another one. The action runs only when the text has been changed
  /// since it last did, a service was chosen or editing was ended.
  void userFinishedEditing();

private:
  void add(const std::shared_ptr<lumora::NetService>& service);
  void remove(const std::shared_ptr<lumora::NetService>& service);
  bool lists(const std::string& name) const;

  const std::shared_ptr<lumora::ComboBox> comboBox_;
  std::weak_ptr<KTServiceComboBoxDelegate> delegate_;
  std::unique_ptr<lumora::ServiceBrowser> browser_;
  std::vector<std::shared_ptr<lumora::NetService>> services_;
  std::optional<std::string> selectedServiceName_;
  std::function<void()> action_;
  bool isEdited_ = false;
};
