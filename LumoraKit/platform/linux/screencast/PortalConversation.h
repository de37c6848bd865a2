#pragma once

#include <LumoraKit/platform/MediaCapture.h>
#include <LumoraKit/platform/linux/DBusCall.h>
#include <LumoraKit/platform/linux/DBusSubscription.h>
#include <LumoraKit/platform/linux/FileDescriptor.h>
#include <LumoraKit/platform/linux/screencast/PortalReplies.h>

#include <functional>

namespace lumora::backend {

/// The talk with the desktop's portal about one screen, step by step: prepare, ask, openRemote, awaitEnd. Each step
/// may take so long as the limit says, and returns null on success; only the user may take all the time there is.
/// Ends the portal's session when it goes. All on one thread, whose default main context is the given one meanwhile.
class PortalConversation {
public:
  struct Setting {
    std::shared_ptr<DBusLink> link;
    GMainContext* context;
    /// Ends every wait at once.
    GCancellable* cancellable;
    std::chrono::milliseconds stepLimit;
  };

  explicit PortalConversation(Setting setting);
  PortalConversation(const PortalConversation&) = delete;
  PortalConversation& operator=(const PortalConversation&) = delete;
  ~PortalConversation();

  /// Whether the portal offers screens.
  LMRErrorRef learnFeatures();
  /// Makes the portal's session and says what is wanted.
  LMRErrorRef prepare(const std::string& restoreToken);
  /// Asks the user, unless the token serves. Without a limit.
  LMRErrorRef ask();
  /// Takes the way to the pictures.
  LMRErrorRef openRemote();
  /// Waits until the desktop ends the session, the portal or the bus goes, or it is cancelled.
  LMRErrorRef awaitEnd();

  std::uint32_t node() const { return node_; }
  const std::string& restoreToken() const { return restoreToken_; }
  FileDescriptor takeRemote() { return std::move(remote_); }

private:
  using Deadline = std::optional<std::chrono::steady_clock::time_point>;

  GLibPtr<GVariant> call(const char* interface, const char* method, GVariant* parameters, const char* replyType,
                         LMRErrorRef& error, GLibPtr<GUnixFDList>* descriptors = nullptr) const;
  void tell(const std::string& object, const char* interface) const;
  GLibPtr<GVariant> request(const char* method, const std::string& token, GVariant* parameters, Deadline deadline,
                            LMRErrorRef& error);
  LMRErrorRef waitFor(const std::function<bool()>& condition, Deadline deadline) const;
  Deadline endOfStep() const;
  LMRErrorRef createSession();
  LMRErrorRef selectSources(const std::string& restoreToken);
  std::string pathOf(const char* kind, const std::string& token) const;

  // Makes the context the thread's default one; what is left in it at the end is served.
  class CurrentContext {
  public:
    explicit CurrentContext(GMainContext* context);
    CurrentContext(const CurrentContext&) = delete;
    CurrentContext& operator=(const CurrentContext&) = delete;
    ~CurrentContext();

  private:
    GMainContext* const context_;
  };

  const Setting setting_;
  const CurrentContext current_;
  const GLibPtr<GSource> tick_;
  PortalFeatures features_;
  std::string session_;
  bool portalIsGone_ = false;
  bool sessionIsClosed_ = false;
  std::unique_ptr<DBusSubscription> ownerChanged_;
  std::unique_ptr<DBusSubscription> closed_;
  std::uint32_t node_ = 0;
  std::string restoreToken_;
  FileDescriptor remote_;
};

} // namespace lumora::backend
