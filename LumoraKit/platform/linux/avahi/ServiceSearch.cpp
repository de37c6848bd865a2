#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/linux/avahi/ServiceSearch.h>

#include <optional>
#include <utility>

namespace lumora::backend {
namespace {

constexpr const char* serverPath = "/";
constexpr const char* serverInterface = "org.freedesktop.Avahi.Server2";
constexpr const char* browserInterface = "org.freedesktop.Avahi.ServiceBrowser";
constexpr gint32 anyInterface = -1;
constexpr gint32 anyProtocol = -1;
constexpr const char* defaultDomain = "";

struct Item {
  ServiceInstance service;
  Sightings::Place place;
};

// What a service browser's signals tell of: interface, protocol, name, type, domain, flags.
std::optional<Item> itemIn(GVariant& arguments) {
  if (g_variant_is_of_type(&arguments, G_VARIANT_TYPE("(iisssu)")) == FALSE) {
    return std::nullopt;
  }
  Item item;
  const char* name = nullptr;
  const char* type = nullptr;
  const char* domain = nullptr;
  g_variant_get(&arguments, "(ii&s&s&su)", &item.place.interface, &item.place.protocol, &name, &type, &domain, nullptr);
  item.service = {name, type, domain};
  return item;
}

std::string textIn(GVariant& arguments) {
  const char* text = "";
  if (g_variant_is_of_type(&arguments, G_VARIANT_TYPE("(s)")) != FALSE) {
    g_variant_get(&arguments, "(&s)", &text);
  }
  return text;
}

std::string pathIn(GVariant& answer) {
  const char* path = "";
  if (g_variant_is_of_type(&answer, G_VARIANT_TYPE("(o)")) != FALSE) {
    g_variant_get(&answer, "(&o)", &path);
  }
  return path;
}

} // namespace

ServiceSearch::ServiceSearch(std::string type, Events events) : type_(std::move(type)), events_(std::move(events)) {}

void ServiceSearch::start(AvahiDaemon& daemon) {
  daemon_ = &daemon;
  daemon_->add(shared_from_this());
}

void ServiceSearch::stop() {
  subscriptions_.clear();
  if (!path_.empty()) {
    daemon_->call({std::exchange(path_, {}), browserInterface}, "Free", nullptr);
  }
  std::exchange(daemon_, nullptr)->remove(*this);
}

// No daemon comes before the one before it went. In two steps: signals are listened for before the first one can come.
void ServiceSearch::daemonCame() {
  const auto prepared = [self = shared_from_this(), daemon = daemon_](GVariant* answer, const LMRErrorRef& error) {
    const std::string path = answer ? pathIn(*answer) : "";
    if (!self->daemon_) {
      daemon->call({path, browserInterface}, "Free", nullptr);
    } else if (error) {
      self->failed(error->localizedDescription());
    } else {
      self->follow(path);
    }
  };
  daemon_->call({serverPath, serverInterface}, "ServiceBrowserPrepare",
                g_variant_new("(iissu)", anyInterface, anyProtocol, type_.c_str(), defaultDomain, 0U), prepared);
}

void ServiceSearch::follow(const std::string& path) {
  path_ = path;
  const AvahiObject browser{path_, browserInterface};
  const auto listen = [&](const char* signal, DBusSubscription::Handler handler) {
    subscriptions_.push_back(daemon_->listen(browser, signal, std::move(handler)));
  };
  listen("ItemNew", [this](GVariant& item) { added(item); });
  listen("ItemRemove", [this](GVariant& item) { removed(item); });
  listen("Failure", [this](GVariant& reason) { failed(textIn(reason)); });
  daemon_->call(browser, "Start", nullptr);
}

void ServiceSearch::daemonWent(const LMRErrorRef& /*reason*/) {
  path_.clear();
  subscriptions_.clear();
  loseAll();
}

void ServiceSearch::added(GVariant& arguments) {
  const auto item = itemIn(arguments);
  if (item && sightings_.add(item->service, item->place)) {
    events_.found(item->service);
  }
}

void ServiceSearch::removed(GVariant& arguments) {
  const auto item = itemIn(arguments);
  if (item && sightings_.remove(item->service, item->place)) {
    events_.lost(item->service);
  }
}

void ServiceSearch::failed(const std::string& reason) {
  log("Couldn't browse for services of type '%@': %@", {type_, reason});
  loseAll();
}

void ServiceSearch::loseAll() {
  for (const ServiceInstance& service : sightings_.takeAll()) {
    events_.lost(service);
  }
}

} // namespace lumora::backend
