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

/// A width and a height, in device-independent units.
struct Size {
  /// To the right.
  double width = 0;
  /// Upwards.
  double height = 0;

  bool operator==(const Size&) const = default;
};

/// A place and a size, in device-independent units.
struct Rect {
  /// Of the lower left corner, to the right of the container's.
  double x = 0;
  /// Of the lower left corner, above the container's.
  double y = 0;
  /// To the right of the corner.
  double width = 0;
  /// Upwards from the corner.
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

  /// Where it lies in what contains it.
  virtual Rect frame() const = 0;
  virtual void setFrame(const Rect& frame) = 0;
  /// Whether the view itself was hidden, wherever it lies.
  virtual bool isHidden() const = 0;
  virtual void setHidden(bool hidden) = 0;
};

/// A line of text that the user may edit, or that is only shown.
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

  /// Appends an entry to the list.
  virtual void addItem(const std::string& item) = 0;
  /// Removes an entry of that text from the list.
  virtual void removeItem(const std::string& item) = 0;
};

/// A button that is pressed.
class LUMORA_EXPORT Button : public View {
public:
  Button();
  ~Button() override;

  /// Sets its text, in the user's language.
  virtual void setTitle(const std::string& title) = 0;
  /// Makes the frame as wide as the title needs; the rest of the frame stays.
  virtual void sizeToFit() = 0;
};

/// A picture that the toolkit brings.
enum class SystemImage { Caution };

/// A picture.
class LUMORA_EXPORT ImageView : public View {
public:
  ImageView();
  ~ImageView() override;

  /// Shows the toolkit's picture of that meaning.
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

/// A window with a title bar, or a sheet.
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
  /// Moves and resizes it. `display`: it is drawn at once. `animate`: it gets there visibly, where the toolkit can.
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
  /// The whole panel.
  std::shared_ptr<View> view;
  /// Where a server is typed or chosen.
  std::shared_ptr<KTServiceComboBox> serverComboBox;
  /// The label beside the user name.
  std::shared_ptr<View> userNameLabelTextField;
  /// Where the user name is typed.
  std::shared_ptr<TextField> userNameTextField;
  /// The label beside the password.
  std::shared_ptr<View> passwordLabelTextField;
  /// Where the password is typed; it is not shown.
  std::shared_ptr<TextField> passwordTextField;
  /// The check box that remembers the password.
  std::shared_ptr<View> rememberPasswordInKeychainButton;
  /// Marks the server field as empty.
  std::shared_ptr<View> serverRequiredImageView;
  /// Marks the user name as empty.
  std::shared_ptr<View> userNameRequiredImageView;
  /// Marks the password as empty.
  std::shared_ptr<View> passwordRequiredImageView;
};

/// The interface file "ServerLoginWindow": its outlets, any of which may be missing. `progressAndErrorTabView` has the
/// pages 0, progress, 1, error, and 2, blank. The file also says that
/// - the progress page shows the description of the panel's `currentLoginAction`, the error page its error's text;
/// - the actions of the buttons are the owner's connectClicked() and cancelClicked(), that of the closing of the window
///   and of the Escape key cancelClicked();
/// - `defaultButton` is enabled as the panel's `attemptButtonEnabled` says.
struct LUMORA_EXPORT ServerLoginWindow {
  /// The sheet itself.
  std::shared_ptr<Window> window;
  /// Where the panel goes.
  std::shared_ptr<ContainerView> serverLoginView;
  /// The page of the progress, of the error, and the blank one.
  std::shared_ptr<TabView> progressAndErrorTabView;
  /// The picture beside an error.
  std::shared_ptr<ImageView> alertImageView;
  /// The text of the error.
  std::shared_ptr<View> errorTextField;
  /// The button that logs in.
  std::shared_ptr<Button> defaultButton;
  /// The button that closes the sheet.
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
