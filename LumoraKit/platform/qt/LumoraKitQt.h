#pragma once

#include <LumoraKit/platform/Export.h>

#include <memory>

/// \file
/// The library lumorakit-qt: the framework in an application of Qt 6 Widgets.
///
///     int main(int argc, char** argv) {
///       QApplication application(argc, argv);
///       lumora::qt::install();
///       ...
///       sheet->beginSheetModalForWindow_...(lumora::qt::windowOf(&mainWindow), ...);
///
/// Main thread only, and not without a QApplication (asserted).

class QWidget;
class QWindow;

namespace lumora {

class MainThread;
class UserInterface;
class View;
class Window;

namespace qt {

/// Makes the installed platform one of this Qt application: its user interface is makeUserInterface(), its main thread
/// makeMainThread(), with new queues of it. Before anything else of the framework is used; an application that replaces
/// other members of the platform does so before or after. A second QApplication of the process needs a second call.
LUMORA_EXPORT void install();

/// The login panel and its sheet as widgets. Their texts follow lumora::Application::language(), all else follows the
/// application: style, palette, font, direction.
LUMORA_EXPORT std::shared_ptr<UserInterface> makeUserInterface();

/// The main thread as Qt serves it, whichever event dispatcher Qt uses (with and without QT_NO_GLIB). Its tasks run in
/// every event loop, also in that of a modal dialog.
LUMORA_EXPORT std::shared_ptr<MainThread> makeMainThread();

/// A window of the application, as the parent of a sheet: the window that holds the widget, when the sheet begins. It
/// is not owned. When it is destroyed its sheet is cancelled. It is itself never shown as a sheet.
LUMORA_EXPORT std::shared_ptr<Window> windowOf(QWidget* widget);
/// The same for a window without widgets.
LUMORA_EXPORT std::shared_ptr<Window> windowOf(QWindow* window);

/// The widget of a view that this user interface loaded, to be put into a window of the application; it still goes with
/// the view. Null when the widget is gone, and for any other view.
LUMORA_EXPORT QWidget* widgetOf(const std::shared_ptr<View>& view);

} // namespace qt
} // namespace lumora
