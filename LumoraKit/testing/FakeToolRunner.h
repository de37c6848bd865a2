#pragma once

#include <LumoraKit/platform/KTRunTask.h>
#include <LumoraKit/platform/Value.h>

#include <chrono>
#include <condition_variable>
#include <cstddef>
#include <deque>
#include <functional>
#include <map>
#include <mutex>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace lumora::fakes {

/// What a tool answers.
struct ToolReply {
  /// The exit status.
  int status = 0;
  /// What the tool writes to its standard output.
  std::string standardOutput;
  /// What the tool writes to its standard error.
  std::string standardError;

  /// Status 0 with a property list on standard output, as the server tools answer.
  static ToolReply success(const Dictionary& reply);
  /// A failure with its text on standard error.
  static ToolReply failure(int status, std::string standardError = "");
};

/// One run of a tool, as the runner was asked for it.
struct ToolRequest {
  /// The absolute path that was to be run.
  std::string executable;
  /// The arguments, without the program's name.
  std::vector<std::string> arguments;
  /// The standard input, byte for byte.
  std::string standardInput;
  /// The standard input read as a property list; empty when it is none or not an array.
  Array elements;

  /// The command: the first bare word of the elements, or the value of the pair "subcommand"; empty without either.
  std::string command() const;
  /// The first value of the pair with this key; nothing when there is no such pair, or no string in it.
  std::optional<std::string> value(std::string_view key) const;
  /// Whether there is a bare word, or an array that starts with the word.
  bool contains(std::string_view word) const;
};

/// A tool runner without tools: answers from a script and keeps every request. Any thread, several at once.
///
///     auto runner = std::make_shared<lumora::fakes::FakeToolRunner>();
///     runner->reply("listinfo", ToolReply::success({{"server", "lumora.example.org"}}));
///     runner->replyOnce("submit", ToolReply::failure(26));
///
/// A request is answered by, in this order: the handler; the next single reply for its command; the standing reply for
/// its command; the same two for its executable; the default reply, which is status 0 with an empty dictionary.
class LUMORA_EXPORT FakeToolRunner final : public ToolRunner {
public:
  /// Answers a request, or leaves it to the script.
  using Handler = std::function<std::optional<ToolReply>(const ToolRequest& request)>;

  FakeToolRunner();
  ~FakeToolRunner() override;

  /// The answer to every request with this command word, or with this path of the executable.
  void reply(const std::string& commandOrExecutable, ToolReply reply);
  /// The answer to one such request; several are given in their order.
  void replyOnce(const std::string& commandOrExecutable, ToolReply reply);
  /// The answer to every other request. Success with an empty dictionary unless set.
  void setDefaultReply(ToolReply reply);
  /// Called without a lock, on the thread of the request.
  void setHandler(Handler handler);

  /// From now on requests are recorded but not answered until release(): their threads wait.
  void block();
  /// Answers the requests that wait, and every later one at once.
  void release();

  /// The requests so far, in the order of their arrival.
  std::vector<ToolRequest> requests() const;
  /// How many requests have arrived.
  std::size_t requestCount() const;
  /// The commands of the requests so far.
  std::vector<std::string> commands() const;
  /// Empties the list of requests.
  void forgetRequests();
  /// Waits until so many requests have arrived. False when the time is over.
  bool waitForRequests(std::size_t count, std::chrono::milliseconds limit = std::chrono::seconds(30)) const;

  int run(const std::string& executable, const std::vector<std::string>& arguments, const std::string& standardInput,
          std::string& standardOutput, std::string& standardError) override;

private:
  struct Script {
    std::deque<ToolReply> once;
    std::optional<ToolReply> standing;
  };

  Handler record(const ToolRequest& request);
  ToolReply scripted(const ToolRequest& request);
  std::optional<ToolReply> scripted(const std::string& key);

  mutable std::mutex mutex_;
  mutable std::condition_variable changed_;
  std::map<std::string, Script> scripts_;
  ToolReply defaultReply_;
  Handler handler_;
  bool blocked_ = false;
  std::vector<ToolRequest> requests_;
};

} // namespace lumora::fakes
