#pragma once

#include <LumoraKit/platform/linux/screencast/PortalConversation.h>

#include <condition_variable>
#include <mutex>

namespace lumora::backend {

class ScreenCastPortal;

/// Where the pictures of a screen come from.
struct ScreenStream {
  /// A connection to PipeWire, which stays the screen's: open until the screen is closed.
  int remote = -1;
  std::uint32_t node = 0;
};

/// One screen that is asked for and then shown by the desktop. Made by ScreenCastPortal::open; the screen is closed,
/// and a dialog that is still open goes, when the last reference is dropped. Any thread.
class LUMORA_INTERNAL ScreenCast {
public:
  using EndHandler = std::function<void(const LMRErrorRef& error)>;

  explicit ScreenCast(std::shared_ptr<ScreenCastPortal> portal);

  /// The stream, as soon as the user has allowed it. Nothing when the patience ends first (ScreenNotAllowedYet: the
  /// dialog stays open, and the answer can be waited for again) or when there will be none.
  std::optional<ScreenStream> await(std::chrono::milliseconds patience, LMRErrorRef& error);
  /// Whether the user is being asked.
  bool isAsking() const;
  /// Told once, on a worker or inside this call, when a screen that was shown ends for another reason than close();
  /// not any more once close() has returned. Must not close the screen itself.
  void whenEnded(EndHandler handler);

  /// Does not wait until the desktop has noticed.
  void close();

  /// For ScreenCastPortal: everything from the question to the end. Blocks.
  void run();

private:
  enum class Stage { Preparing, Asking, Shown, Over };

  LMRErrorRef open(PortalConversation& conversation);
  LMRErrorRef talk();
  void enter(Stage stage);
  void end(const LMRErrorRef& error);

  const std::shared_ptr<ScreenCastPortal> portal_;
  const GLibPtr<GMainContext> context_;
  const GLibPtr<GCancellable> cancellable_;

  mutable std::mutex mutex_;
  std::condition_variable changed_;
  Stage stage_ = Stage::Preparing;
  std::uint32_t node_ = 0;
  FileDescriptor remote_;
  LMRErrorRef error_;
  EndHandler endHandler_;
  // Held while the handler runs.
  std::mutex tellingMutex_;
};

} // namespace lumora::backend
