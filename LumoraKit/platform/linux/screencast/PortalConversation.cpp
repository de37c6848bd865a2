#include <LumoraKit/platform/linux/screencast/PortalConversation.h>

#include <gio/gunixfdlist.h>

#include <algorithm>
#include <atomic>

namespace lumora::backend {
namespace {

constexpr const char* portalName = "org.freedesktop.portal.Desktop";
constexpr const char* portalObject = "/org/freedesktop/portal/desktop";
constexpr const char* screenCastInterface = "org.freedesktop.portal.ScreenCast";
constexpr const char* requestInterface = "org.freedesktop.portal.Request";
constexpr const char* sessionInterface = "org.freedesktop.portal.Session";
constexpr const char* propertiesInterface = "org.freedesktop.DBus.Properties";

// How soon a passed limit or a lost bus, which nobody tells of, is noticed.
constexpr guint tickMilliseconds = 200;

GLibPtr<GSource> attachTick(GMainContext* context) {
  GLibPtr<GSource> tick(g_timeout_source_new(tickMilliseconds));
  g_source_set_callback(
      tick.get(), [](gpointer) -> gboolean { return G_SOURCE_CONTINUE; }, nullptr, nullptr);
  g_source_attach(tick.get(), context);
  return tick;
}

// Requests and sessions of one connection are told apart by their names.
std::string newToken() {
  static std::atomic<unsigned> count{0};
  return "lumora" + std::to_string(count.fetch_add(1));
}

GVariant* options(const std::string& handleToken, const std::string& sessionToken = {}) {
  GVariantBuilder builder;
  g_variant_builder_init(&builder, G_VARIANT_TYPE_VARDICT);
  if (!handleToken.empty()) {
    g_variant_builder_add(&builder, "{sv}", "handle_token", g_variant_new_string(handleToken.c_str()));
  }
  if (!sessionToken.empty()) {
    g_variant_builder_add(&builder, "{sv}", "session_handle_token", g_variant_new_string(sessionToken.c_str()));
  }
  return g_variant_builder_end(&builder);
}

} // namespace

PortalConversation::CurrentContext::CurrentContext(GMainContext* context) : context_(context) {
  g_main_context_push_thread_default(context_);
}

PortalConversation::CurrentContext::~CurrentContext() {
  while (g_main_context_iteration(context_, FALSE) != FALSE) {
  }
  g_main_context_pop_thread_default(context_);
}

PortalConversation::PortalConversation(Setting setting)
    : setting_(std::move(setting)), current_(setting_.context), tick_(attachTick(setting_.context)) {
  const DBusSignal ownerChanged{"org.freedesktop.DBus", "org.freedesktop.DBus", "NameOwnerChanged",
                                "/org/freedesktop/DBus", portalName};
  ownerChanged_ =
      std::make_unique<DBusSubscription>(setting_.link->connection(), ownerChanged, [this](GVariant& arguments) {
        const char* before = "";
        g_variant_get_child(&arguments, 1, "&s", &before);
        portalIsGone_ = portalIsGone_ || *before != '\0';
      });
}

PortalConversation::~PortalConversation() {
  closed_.reset();
  ownerChanged_.reset();
  if (!session_.empty() && !sessionIsClosed_ && !portalIsGone_) {
    tell(session_, sessionInterface);
  }
}

GLibPtr<GVariant> PortalConversation::call(const char* interface, const char* method, GVariant* parameters,
                                           const char* replyType, LMRErrorRef& error,
                                           GLibPtr<GUnixFDList>* descriptors) const {
  GUnixFDList* list = nullptr;
  GError* reason = nullptr;
  GLibPtr<GVariant> answer(g_dbus_connection_call_with_unix_fd_list_sync(
      setting_.link->connection(), portalName, portalObject, interface, method, parameters, G_VARIANT_TYPE(replyType),
      G_DBUS_CALL_FLAGS_NONE, static_cast<gint>(setting_.stepLimit.count()), nullptr, &list, setting_.cancellable,
      &reason));
  GLibPtr<GUnixFDList> received(list);
  if (const GLibPtr<GError> failure(reason); failure) {
    error = portalCallError(*failure);
  }
  if (descriptors) {
    *descriptors = std::move(received);
  }
  return answer;
}

// Nobody waits for the answer: the portal may be frozen.
void PortalConversation::tell(const std::string& object, const char* interface) const {
  g_dbus_connection_call(setting_.link->connection(), portalName, object.c_str(), interface, "Close", nullptr, nullptr,
                         G_DBUS_CALL_FLAGS_NO_AUTO_START, -1, nullptr, nullptr, nullptr);
}

std::string PortalConversation::pathOf(const char* kind, const std::string& token) const {
  std::string sender = g_dbus_connection_get_unique_name(setting_.link->connection()) + 1;
  std::ranges::replace(sender, '.', '_');
  return std::string(portalObject) + "/" + kind + "/" + sender + "/" + token;
}

// The response may come before the call's own reply, so it is listened for before the call. Old portals choose another
// path than they are asked to.
GLibPtr<GVariant> PortalConversation::request(const char* method, const std::string& token, GVariant* parameters,
                                              Deadline deadline, LMRErrorRef& error) {
  std::optional<PortalResponse> response;
  const auto keep = [&](GVariant& arguments) { response = portalResponse(arguments); };
  const auto listen = [&](const std::string& path) {
    const DBusSignal signal{portalName, requestInterface, "Response", path.c_str(), nullptr};
    return std::make_unique<DBusSubscription>(setting_.link->connection(), signal, keep);
  };
  const std::string expectedPath = pathOf("request", token);
  auto subscription = listen(expectedPath);
  const auto answer = call(screenCastInterface, method, parameters, "(o)", error);
  if (!answer) {
    // Not waited for any longer; the request may be there all the same.
    tell(expectedPath, requestInterface);
    return nullptr;
  }
  const char* path = nullptr;
  g_variant_get(answer.get(), "(&o)", &path);
  if (path != expectedPath) {
    subscription = listen(path);
  }
  error = waitFor([&] { return response.has_value(); }, deadline);
  if (error) {
    tell(path, requestInterface);
    return nullptr;
  }
  error = portalRefusal(response->code);
  return error ? nullptr : std::move(response->results);
}

PortalConversation::Deadline PortalConversation::endOfStep() const {
  return std::chrono::steady_clock::now() + setting_.stepLimit;
}

LMRErrorRef PortalConversation::waitFor(const std::function<bool()>& condition, Deadline deadline) const {
  while (!condition()) {
    if (g_cancellable_is_cancelled(setting_.cancellable) != FALSE) {
      return screenError(CaptureErrorCode::DeviceFailed, "The screen was closed");
    }
    if (!setting_.link->isOpen()) {
      return sessionBusLost();
    }
    if (portalIsGone_) {
      return portalEnded();
    }
    if (sessionIsClosed_) {
      return screenError(CaptureErrorCode::DeviceFailed, "The desktop ended the capture of the screen");
    }
    if (deadline && std::chrono::steady_clock::now() >= *deadline) {
      return portalTimedOut();
    }
    g_main_context_iteration(setting_.context, TRUE);
  }
  return nullptr;
}

LMRErrorRef PortalConversation::learnFeatures() {
  LMRErrorRef error;
  const auto answer = call(propertiesInterface, "GetAll", g_variant_new("(s)", screenCastInterface), "(a{sv})", error);
  if (!answer) {
    return error;
  }
  const GLibPtr<GVariant> properties(g_variant_get_child_value(answer.get(), 0));
  features_ = portalFeatures(*properties);
  return features_.offersScreens ? nullptr : screensNotOffered();
}

LMRErrorRef PortalConversation::prepare(const std::string& restoreToken) {
  LMRErrorRef error = learnFeatures();
  error = error ? error : createSession();
  return error ? error : selectSources(restoreToken);
}

LMRErrorRef PortalConversation::createSession() {
  const std::string token = newToken();
  const std::string sessionToken = newToken();
  // Known before the answer, so that a session that comes too late is closed as well.
  session_ = pathOf("session", sessionToken);
  LMRErrorRef error;
  const auto results =
      request("CreateSession", token, g_variant_new("(@a{sv})", options(token, sessionToken)), endOfStep(), error);
  if (!results) {
    return error;
  }
  session_ = portalSessionHandle(*results);
  if (session_.empty()) {
    return screenError(CaptureErrorCode::DeviceFailed, "The desktop's portal did not name its session");
  }
  const DBusSignal closed{portalName, sessionInterface, "Closed", session_.c_str(), nullptr};
  closed_ = std::make_unique<DBusSubscription>(setting_.link->connection(), closed,
                                               [this](GVariant& /*arguments*/) { sessionIsClosed_ = true; });
  return nullptr;
}

LMRErrorRef PortalConversation::selectSources(const std::string& restoreToken) {
  const std::string token = newToken();
  GVariant* const wanted = portalSourceOptions(features_, token, restoreToken);
  LMRErrorRef error;
  request("SelectSources", token, g_variant_new("(o@a{sv})", session_.c_str(), wanted), endOfStep(), error);
  return error;
}

LMRErrorRef PortalConversation::ask() {
  const std::string token = newToken();
  LMRErrorRef error;
  const auto results =
      request("Start", token, g_variant_new("(os@a{sv})", session_.c_str(), "", options(token)), std::nullopt, error);
  if (!results) {
    return error;
  }
  const auto node = portalStreamNode(*results);
  if (!node) {
    return screenError(CaptureErrorCode::DeviceFailed, "The desktop's portal shows no screen");
  }
  node_ = *node;
  restoreToken_ = portalRestoreToken(*results);
  return nullptr;
}

LMRErrorRef PortalConversation::openRemote() {
  LMRErrorRef error;
  GLibPtr<GUnixFDList> descriptors;
  const auto answer = call(screenCastInterface, "OpenPipeWireRemote",
                           g_variant_new("(o@a{sv})", session_.c_str(), options({})), "(h)", error, &descriptors);
  if (!answer) {
    return error;
  }
  gint32 index = 0;
  g_variant_get(answer.get(), "(h)", &index);
  // A duplicate: the list closes its own.
  remote_ = FileDescriptor(descriptors ? g_unix_fd_list_get(descriptors.get(), index, nullptr) : -1);
  return remote_.isOpen()
             ? nullptr
             : screenError(CaptureErrorCode::DeviceFailed, "The desktop's portal gave no way to the pictures");
}

LMRErrorRef PortalConversation::awaitEnd() {
  return waitFor([] { return false; }, std::nullopt);
}

} // namespace lumora::backend
