#pragma once

#include <LumoraKit/platform/Export.h>

#include <functional>
#include <memory>
#include <string>

/// \file
/// The user interface by role: what the framework's controllers order of a toolkit. The toolkit's side reports what
/// the user does to the controllers' public operations.
///
/// Main thread only. Lengths are device-independent units, and the origin of a frame is the lower left corner of what
/// contains it. An object whose widget is gone does nothing and is hidden.

class KTServiceComboBox;
class LMRServerLoginSheetController;
class LMRServerLoginViewController;

namespace lumora {

struct Size {
  double width = 0;
  double height = 0;

  bool operator==(const Size&) const = default;
};

struct Rect {
  double x = 0;
  double y = 0;
  double width = 0;
  double height = 0;

  bool operator==(const Rect&) const = default;
};

/// Anything in a window: a label, a check box, a marker.
class LUMORA_EXPORT View {
public:
  View();
  View(const View&) = delete;
  View& operator=(const View&) = delete;
  virtual ~View();

  virtual Rect frame() const = 0;
  virtual void setFrame(const Rect& frame) = 0;
  /// Whether the view itself was hidden, wherever it lies.
  virtual bool isHidden() const = 0;
  virtual void setHidden(bool hidden) = 0;
};

class LUMORA_EXPORT TextField : public View {
public:
  TextField();
  ~TextField() override;

  /// UTF-8.
  virtual std::string stringValue() const = 0;
  virtual void setStringValue(const std::string& text) = 0;
  /// Gives it the keyboard.
  virtual void makeFirstResponder() = 0;
  /// Ends what the user is typing, the text stays. Nothing of it is reported as the user's doing.
  virtual void endEditing() = 0;
};

/// A text field with a list to choose from. What is typed is never completed, and a change of the list never touches
/// the text.
class LUMORA_EXPORT ComboBox : public TextField {
public:
  ComboBox();
  ~ComboBox() override;

  virtual void addItem(const std::string& item) = 0;
  virtual void removeItem(const std::string& item) = 0;
};

class LUMORA_EXPORT Button : public View {
public:
  Button();
  ~Button() override;

  virtual void setTitle(const std::string& title) = 0;
  /// Makes the frame as wide as the title needs; the rest of the frame stays.
  virtual void sizeToFit() = 0;
};

enum class SystemImage { Caution };

class LUMORA_EXPORT ImageView : public View {
public:
  ImageView();
  ~ImageView() override;

  virtual void setImage(SystemImage image) = 0;
};

/// Pages of which one is shown.
class LUMORA_EXPORT TabView : public View {
public:
  TabView();
  ~TabView() override;

  /// Counted from 0.
  virtual void selectPage(int page) = 0;
};

/// An empty view that takes another one in.
class LUMORA_EXPORT ContainerView : public View {
public:
  ContainerView();
  ~ContainerView() override;

  /// Makes it the only view in here, in place of whatever was.
  virtual void setSubview(const std::shared_ptr<View>& view) = 0;
};

class LUMORA_EXPORT Window {
public:
  /// Receives the return code.
  using DidEnd = std::function<void(int returnCode)>;

  Window();
  Window(const Window&) = delete;
  Window& operator=(const Window&) = delete;
  virtual ~Window();

  /// With the title bar, if there is one.
  virtual Rect frame() const = 0;
  virtual void setFrame_display_animate(const Rect& frame, bool display, bool animate) = 0;
  /// Whether it is shown as a sheet at this moment.
  virtual bool isSheet() const = 0;
  /// Shows this window as a sheet that blocks the parent, and returns at once.
  /// \param parent null: it is shown as a window of its own
  virtual void beginSheet(const std::shared_ptr<Window>& parent, DidEnd didEnd) = 0;
  /// Closes the sheet and calls `didEnd`, once, before the return; without a sheet nothing happens.
  virtual void endSheet(int returnCode) = 0;
};

/// The interface file "ServerLoginView": its outlets, any of which may be missing. The file also says that
/// - `userNameTextField`, `passwordTextField` and `rememberPasswordInKeychainButton` are bound to the properties
///   `userName`, `password` and `rememberPasswordInKeychain` of the owner, continuously: every change by the user sets
///   the property, where an empty field is null, and every notice of the property is shown;
/// - text that the user changes in `userNameTextField` is then reported to the owner's controlTextDidChange();
/// - the action of `serverComboBox` is the owner's setServerName().
struct LUMORA_EXPORT ServerLoginView {
  std::shared_ptr<View> view;
  std::shared_ptr<KTServiceComboBox> serverComboBox;
  std::shared_ptr<View> userNameLabelTextField;
  std::shared_ptr<TextField> userNameTextField;
  std::shared_ptr<View> passwordLabelTextField;
  std::shared_ptr<TextField> passwordTextField;
  std::shared_ptr<View> rememberPasswordInKeychainButton;
  std::shared_ptr<View> serverRequiredImageView;
  std::shared_ptr<View> userNameRequiredImageView;
  std::shared_ptr<View> passwordRequiredImageView;
};

/// The interface file "ServerLoginWindow": its outlets, any of which may be missing. `progressAndErrorTabView` has the
/// pages 0, progress, 1, error, and 2, blank. The file also says that
/// - the progress page shows the description of the panel's `currentLoginAction`, the error page its error's text;
/// - the actions of the buttons are the owner's connectClicked() and cancelClicked(), that of the closing of the window
///   and of the Escape key cancelClicked();
/// - `defaultButton` is enabled as the panel's `attemptButtonEnabled` says.
struct LUMORA_EXPORT ServerLoginWindow {
  std::shared_ptr<Window> window;
  std::shared_ptr<ContainerView> serverLoginView;
  std::shared_ptr<TabView> progressAndErrorTabView;
  std::shared_ptr<ImageView> alertImageView;
  std::shared_ptr<View> errorTextField;
  std::shared_ptr<Button> defaultButton;
  std::shared_ptr<Button> alternateButton;
};

/// The toolkit. It holds a controller that it loads an interface file for weakly, or not at all.
class LUMORA_EXPORT UserInterface {
public:
  virtual ~UserInterface();

  /// A new one, invisible until it is put into a window.
  virtual ServerLoginView loadServerLoginView(const std::shared_ptr<LMRServerLoginViewController>& owner) = 0;
  /// A new one, invisible.
  virtual ServerLoginWindow loadServerLoginWindow(const std::shared_ptr<LMRServerLoginSheetController>& owner) = 0;
  /// The system's alert sound.
  virtual void beep() = 0;

  /// No user interface: no outlet and no window is there, and nothing sounds. What a process has that installed no
  /// toolkit.
  static std::shared_ptr<UserInterface> none();
};

} // namespace lumora
