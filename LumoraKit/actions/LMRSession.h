#pragma once

#include <LumoraKit/platform/Export.h>
#include <LumoraKit/platform/Property.h>
#include <LumoraKit/platform/Secret.h>

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>

/// How a server tool is to prove who the user is.
enum LMRAuthenticationType : std::int32_t {
  /// Not decided: a server action must not run with such a session.
  LMRAuthenticationTypeUnknown = 0,
  /// By user name and password.
  LMRAuthenticationTypePassword = 1,
  /// By Kerberos (RFC 4120); neither user name nor password is sent.
  LMRAuthenticationTypeSingleSignOn = 2,
  /// A server that accepts both. For the login view only; never the type of a session.
  LMRAuthenticationTypePasswordOrSingleSignOn = 3,
};

/// The TCP port of a server that names none.
inline constexpr std::uint16_t LMRDefaultServerPort = 8170;

/// One logged-in connection to a Lumora server: where it is, who the user is, and what the server said of itself.
/// A record without a connection of its own; every server action reads it. Any thread.
class LUMORA_EXPORT LMRSession {
public:
  /// A new session; see LMRSession(). Always of this class.
  static std::shared_ptr<LMRSession> session();

  /// Port LMRDefaultServerPort, type LMRAuthenticationTypeUnknown, every string absent, every flag false.
  LMRSession();
  LMRSession(const LMRSession&) = delete;
  LMRSession& operator=(const LMRSession&) = delete;
  virtual ~LMRSession();

  /// A new session of the same class with the same properties, except isLumoraLibraryServer: a copy always says
  /// false, and whoever stores a copy sets the flag on it.
  /// \param zone reserved: pass null
  std::shared_ptr<LMRSession> copyWithZone(std::nullptr_t zone = nullptr) const;

  /// Host name, without a port.
  std::optional<std::string> server() const { return server_.get(); }
  void setServer(std::optional<std::string> server) { server_.set(std::move(server)); }

  /// The server's own version text.
  std::optional<std::string> version() const { return version_.get(); }
  void setVersion(std::optional<std::string> version) { version_.set(std::move(version)); }

  /// TCP port. 0 is kept as 0.
  std::uint16_t port() const { return port_; }
  void setPort(std::uint16_t port) { port_ = port; }

  /// The short name, as used to log in.
  std::optional<std::string> userName() const { return userName_.get(); }
  void setUserName(std::optional<std::string> userName) { userName_.set(std::move(userName)); }

  /// The user's name for people ("Ada Lovelace"), as the server told it at the login.
  std::optional<std::string> userFullName() const { return userFullName_.get(); }
  void setUserFullName(std::optional<std::string> userFullName) { userFullName_.set(std::move(userFullName)); }

  /// Absent with single sign-on. Overwritten in memory when it is replaced and when the session dies; a copy that the
  /// getter handed out is the caller's to wipe.
  std::optional<std::string> password() const;
  void setPassword(std::optional<std::string> password);

  /// How the session proves who the user is. LMRAuthenticationTypeUnknown unless set.
  LMRAuthenticationType authenticationType() const { return authenticationType_; }
  void setAuthenticationType(LMRAuthenticationType type) { authenticationType_ = type; }

  /// For the application: the framework carries and copies it.
  bool requiresValidCertificate() const { return requiresValidCertificate_; }
  void setRequiresValidCertificate(bool required) { requiresValidCertificate_ = required; }

  /// Whether the server called itself a library server, which takes several files of one submission synchronously
  /// only.
  bool isLumoraLibraryServer() const { return isLumoraLibraryServer_; }
  void setIsLumoraLibraryServer(bool isLibraryServer) { isLumoraLibraryServer_ = isLibraryServer; }

  /// Server and port as "host:8170"; "(null)" stands for an absent server.
  std::string description() const;

protected:
  /// A new session of the receiver's class, to be filled by copyWithZone().
  virtual std::shared_ptr<LMRSession> newSession() const;

private:
  lumora::Property<std::optional<std::string>> server_;
  lumora::Property<std::optional<std::string>> version_;
  std::atomic<std::uint16_t> port_{LMRDefaultServerPort};
  lumora::Property<std::optional<std::string>> userName_;
  lumora::Property<std::optional<std::string>> userFullName_;
  lumora::Property<std::optional<lumora::Secret>> password_;
  std::atomic<LMRAuthenticationType> authenticationType_{LMRAuthenticationTypeUnknown};
  std::atomic<bool> requiresValidCertificate_{false};
  std::atomic<bool> isLumoraLibraryServer_{false};
};
