#pragma once

#include <LumoraKit/actions/LMRSession.h>
#include <LumoraKit/actions/LMRToolPaths.h>
#include <LumoraKit/platform/Authorization.h>
#include <LumoraKit/platform/KTAction.h>
#include <LumoraKit/platform/KTActionLoggingProtocol.h>
#include <LumoraKit/platform/LMRError.h>
#include <LumoraKit/platform/Property.h>
#include <LumoraKit/platform/Value.h>

#include <atomic>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>

/// One server operation: a single run of a server tool with the whole request on its standard input.
///
/// LMRActionFactory makes them ready to run. Targets, start and the synchronous run are those of KTAction; after the
/// end either error() or result() tells the outcome.
///
/// The request is an XML property list, an array of bare words and of ("key", value) pairs:
///   1. ("server", "host:port"), when there is a session;
///   2. ("auth", "Password" or "Kerberos"), when there is a session and the tool is `lumctl` or `lumexec`;
///   3. ("user", name) and ("pass", password), when the session authenticates by password;
///   4. the command word, for other tools ("subcommand", command), when there is a command;
///   5. the arguments.
/// A pair whose value is absent is sent as its key alone.
///
/// Errors are of the domain LMRErrorDomain with the tool's exit status as their code; see
/// errorForStatusCode_standardError(). A request that no property list can carry (invalid UTF-8, a control character)
/// fails with code 11, the reason under "stderr", and no tool is run. A reply that is not a property list is no
/// failure: it is logged, and the result is absent.
///
/// Properties: any thread; what is set after the start has no effect on the run.
class LUMORA_EXPORT LMRAction : public KTAction, public KTActionLoggingProtocol {
public:
  /// An action that runs `lumctl`.
  static std::shared_ptr<LMRAction> actionWithCommand_arguments_session(std::optional<std::string> command,
                                                                        std::optional<lumora::Array> arguments,
                                                                        std::shared_ptr<LMRSession> session);
  /// The same without a session: no address and no credentials are sent.
  static std::shared_ptr<LMRAction> actionWithCommand_arguments(std::optional<std::string> command,
                                                                std::optional<lumora::Array> arguments);

  /// An action for a command of the main tool; see the factory functions.
  LMRAction(std::optional<std::string> command, std::optional<lumora::Array> arguments,
            std::shared_ptr<LMRSession> session);
  /// The same without a session.
  LMRAction(std::optional<std::string> command, std::optional<lumora::Array> arguments);
  ~LMRAction() override;

  /// Whose server and credentials are sent. The action holds the session itself, not a copy.
  std::shared_ptr<LMRSession> session() const { return session_.get(); }
  void setSession(std::shared_ptr<LMRSession> session) { session_.set(std::move(session)); }

  /// Absolute path of the executable.
  std::optional<std::string> tool() const { return tool_.get(); }
  void setTool(std::optional<std::string> tool) { tool_.set(std::move(tool)); }

  /// The command word of the request ("listworkflows"); nothing sends none.
  std::optional<std::string> command() const { return command_.get(); }
  void setCommand(std::optional<std::string> command) { command_.set(std::move(command)); }

  /// Bare words, and arrays of a key word and its values.
  std::optional<lumora::Array> arguments() const { return arguments_.get(); }
  void setArguments(std::optional<lumora::Array> arguments) { arguments_.set(std::move(arguments)); }

  /// Set on privileged actions only; not owned.
  lumora::AuthorizationRef authorizationRef() const { return authorizationRef_; }
  void setAuthorizationRef(lumora::AuthorizationRef authorization) { authorizationRef_ = authorization; }

  /// The decoded reply; null until a run that expected one has succeeded.
  std::shared_ptr<const lumora::Dictionary> result() const { return result_.get(); }
  void setResult(std::shared_ptr<const lumora::Dictionary> result) { result_.set(std::move(result)); }

  /// Whether standard output is decoded into the result. True unless set.
  bool expectXMLResponse() const { return expectXMLResponse_; }
  void setExpectXMLResponse(bool expected) { expectXMLResponse_ = expected; }

  /// The error of a tool's exit status: domain LMRErrorDomain, the status as code, the message for the user as
  /// localised description, and the tool's standard error, unless absent, under "stderr". Any thread.
  static LMRErrorRef errorForStatusCode_standardError(std::int64_t status,
                                                      const std::optional<std::string>& standardError);

  /// The session's server, this machine without a session.
  KTHost server() const override;
  /// Tool and command ("/usr/bin/lumctl listworkflows"), with "lumexec " before them when there is an authorization.
  std::string title() const override;
  /// The arguments as an XML property list. The session's credentials are not among them, but a master password may
  /// be: not for a log.
  std::string requestDescription() const override;
  /// The result as an XML property list.
  std::string responseDescription() const override;

protected:
  void startExecution() override;

private:
  void runTool(const std::string& tool, const std::string& request);
  void decodeReply(const std::string& standardOutput);
  void fail(std::int64_t status, const std::string& standardError);

  // Members die in the reverse of this order, so the session goes first.
  lumora::Property<std::shared_ptr<const lumora::Dictionary>> result_;
  lumora::Property<std::optional<std::string>> command_;
  lumora::Property<std::optional<lumora::Array>> arguments_;
  lumora::Property<std::optional<std::string>> tool_;
  lumora::Property<std::shared_ptr<LMRSession>> session_;
  std::atomic<lumora::AuthorizationRef> authorizationRef_{nullptr};
  std::atomic<bool> expectXMLResponse_{true};
};
