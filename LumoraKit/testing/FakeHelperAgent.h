#pragma once

#include <LumoraKit/platform/KTHelperAgent.h>

#include <cstddef>
#include <deque>
#include <map>
#include <mutex>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace lumora::fakes {

/// What a helper agent answers: a reply, an error, both, or neither.
struct HelperAgentReply {
  /// The agent's reply; nothing when there is none.
  std::optional<Dictionary> reply;
  /// Why there is no reply; null when there is one.
  LMRErrorRef error;

  /// The command ended with status 0 and this on its standard output.
  static HelperAgentReply success(const Dictionary& output);
  /// The command ended with another status.
  static HelperAgentReply failure(int status, std::string standardError = "");
  /// There was no reply.
  static HelperAgentReply noReply(HelperAgentError error, std::string description = "no reply");
};

/// One call of an agent, as it was asked for.
struct HelperAgentCall {
  /// The agent's identifier.
  std::string agent;
  /// The domain that the agent was looked for in.
  std::string domain;
  /// Nothing when none was given.
  std::optional<Data> authorization;
  /// The command's name.
  std::string command;
  /// The request, as the agent gets it.
  Dictionary request;
};

/// Helper agents without a bus: answers from a script and keeps every call. Any thread, several at once.
///
///     platform.helperAgent->reply("bind", HelperAgentReply::failure(35));
///     platform.helperAgent->replyOnce("bind", HelperAgentReply::noReply(lumora::HelperAgentError::AgentEnded));
///
/// A call is answered by, in this order: the next single reply for its command, the standing reply for its command, the
/// default reply, which is status 0 without an output.
class LUMORA_EXPORT FakeHelperAgent final : public HelperAgent {
public:
  FakeHelperAgent();
  ~FakeHelperAgent() override;

  /// The answer to every call with this command.
  void reply(const std::string& command, HelperAgentReply reply);
  /// The answer to one such call; several are given in their order.
  void replyOnce(const std::string& command, HelperAgentReply reply);
  /// The answer to every other call. Status 0 without an output unless set.
  void setDefaultReply(HelperAgentReply reply);
  /// What authorize() hands out; nothing refuses. One of four bytes unless set.
  void setAuthorization(std::optional<Authorization> authorization);

  /// The calls so far, in the order of their arrival.
  std::vector<HelperAgentCall> calls() const;
  /// How many calls there were.
  std::size_t callCount() const;
  /// The operations that were asked to be authorized.
  std::vector<std::string> authorizedOperations() const;
  /// Empties the list of calls.
  void forgetCalls();

  std::optional<Authorization> authorize(const std::string& agent, std::string_view domain,
                                         const std::string& operation, LMRErrorRef* error) override;
  std::optional<Dictionary> performCommand(const std::string& agent, std::string_view domain,
                                           AuthorizationRef authorization, const std::string& command,
                                           const Dictionary& request, LMRErrorRef* error) override;

private:
  struct Script {
    std::deque<HelperAgentReply> once;
    std::optional<HelperAgentReply> standing;
  };

  HelperAgentReply scripted(const std::string& command);

  mutable std::mutex mutex_;
  std::map<std::string, Script> scripts_;
  HelperAgentReply defaultReply_;
  std::optional<Authorization> authorization_;
  std::vector<HelperAgentCall> calls_;
  std::vector<std::string> authorizedOperations_;
};

} // namespace lumora::fakes
