#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/linux/avahi/ServiceResolution.h>

#include <algorithm>
#include <climits>
#include <cstdint>
#include <string>
#include <utility>
#include <vector>

namespace lumora::backend {
namespace {

constexpr const char* serverPath = "/";
constexpr const char* serverInterface = "org.freedesktop.Avahi.Server";
constexpr gint32 anyInterface = -1;
constexpr gint32 anyProtocol = -1;

// Interface, protocol, name, type, domain, host, address protocol, address, port, text record, flags.
constexpr const char* answerType = "(iissssisqaayu)";
constexpr gsize textRecordIndex = 9;

std::string bytes(GVariant& value) {
  gsize length = 0;
  const auto* const data = static_cast<const char*>(g_variant_get_fixed_array(&value, &length, 1));
  return {data, length};
}

// A record of nothing but empty strings is none (RFC 6763, section 6.1).
std::optional<TextRecord> recordIn(GVariant& answer) {
  const GLibPtr<GVariant> strings(g_variant_get_child_value(&answer, textRecordIndex));
  std::vector<std::string> list;
  for (gsize i = 0; i < g_variant_n_children(strings.get()); ++i) {
    const GLibPtr<GVariant> string(g_variant_get_child_value(strings.get(), i));
    list.push_back(bytes(*string));
  }
  const bool isEmpty = std::ranges::all_of(list, [](const std::string& string) { return string.empty(); });
  return isEmpty ? std::nullopt : std::optional(textRecordWithStrings(list));
}

} // namespace

ServiceResolution::ServiceResolution(ServiceInstance service, std::chrono::milliseconds limit, Report report)
    : service_(std::move(service)), limit_(limit), report_(std::move(report)) {}

void ServiceResolution::start(AvahiDaemon& daemon) {
  daemon_ = &daemon;
  timer_.reset(g_timeout_source_new(static_cast<guint>(std::clamp<std::int64_t>(limit_.count(), 0, UINT_MAX))));
  g_source_set_callback(timer_.get(), &timedOut, this, nullptr);
  g_source_attach(timer_.get(), g_main_context_get_thread_default());
  daemon_->add(shared_from_this());
}

void ServiceResolution::stop() {
  timer_.reset();
  if (daemon_) {
    std::exchange(daemon_, nullptr)->remove(*this);
  }
}

void ServiceResolution::daemonCame() {
  daemon_->call(
      {serverPath, serverInterface}, "ResolveService",
      g_variant_new("(iisssiu)", anyInterface, anyProtocol, service_.name.c_str(), service_.type.c_str(),
                    service_.domain.c_str(), anyProtocol, 0U),
      [self = shared_from_this()](GVariant* answer, const LMRErrorRef& error) { self->answered(answer, error); });
}

// The daemon gives up after a time of its own, which may be shorter than the limit.
void ServiceResolution::answered(GVariant* answer, const LMRErrorRef& error) {
  if (!daemon_) {
    return;
  }
  if (answer && g_variant_is_of_type(answer, G_VARIANT_TYPE(answerType)) != FALSE) {
    finish(nullptr, recordIn(*answer));
  } else if (error && error->code() == static_cast<int>(DiscoveryErrorCode::TimedOut)) {
    daemonCame();
  } else {
    finish(error ? error : discoveryError(DiscoveryErrorCode::Refused, "The discovery daemon's answer makes no sense"),
           std::nullopt);
  }
}

void ServiceResolution::daemonWent(const LMRErrorRef& reason) {
  finish(reason, std::nullopt);
}

gboolean ServiceResolution::timedOut(gpointer self) {
  auto& resolution = *static_cast<ServiceResolution*>(self);
  const auto reason = format("'%@' did not answer within %d ms",
                             {resolution.service_.name, text(std::int64_t{resolution.limit_.count()})});
  resolution.finish(discoveryError(DiscoveryErrorCode::TimedOut, reason), std::nullopt);
  return G_SOURCE_REMOVE;
}

void ServiceResolution::finish(const LMRErrorRef& error, std::optional<TextRecord> record) {
  if (daemon_) {
    const auto self = shared_from_this();
    stop();
    report_(error, std::move(record));
  }
}

} // namespace lumora::backend
