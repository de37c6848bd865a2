#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/testing/FakeToolRunner.h>

#include <algorithm>
#include <utility>

namespace lumora::fakes {
namespace {

Array elementsOf(const std::string& standardInput) {
  auto value = valueWithXMLDescription(standardInput);
  Array* const elements = value ? value->array() : nullptr;
  return elements ? std::move(*elements) : Array();
}

// The key word of an array element; nothing for a bare word.
const std::string* keyOf(const Value& element) {
  const Array* const pair = element.array();
  return pair && !pair->empty() ? pair->front().string() : nullptr;
}

} // namespace

ToolReply ToolReply::success(const Dictionary& reply) {
  return {0, xmlDescription(reply).value_or(""), ""};
}

ToolReply ToolReply::failure(int status, std::string standardError) {
  return {status, "", std::move(standardError)};
}

std::string ToolRequest::command() const {
  for (const Value& element : elements) {
    if (const std::string* const word = element.string()) {
      return *word;
    }
  }
  return value("subcommand").value_or("");
}

std::optional<std::string> ToolRequest::value(std::string_view key) const {
  for (const Value& element : elements) {
    const std::string* const found = keyOf(element);
    if (found && *found == key && element.array()->size() > 1) {
      const std::string* const text = (*element.array())[1].string();
      return text ? std::optional(*text) : std::nullopt;
    }
  }
  return std::nullopt;
}

bool ToolRequest::contains(std::string_view word) const {
  return std::any_of(elements.begin(), elements.end(), [word](const Value& element) {
    const std::string* const text = element.string() ? element.string() : keyOf(element);
    return text && *text == word;
  });
}

FakeToolRunner::FakeToolRunner() : defaultReply_(ToolReply::success({})) {}

FakeToolRunner::~FakeToolRunner() = default;

void FakeToolRunner::reply(const std::string& commandOrExecutable, ToolReply reply) {
  const std::lock_guard lock(mutex_);
  scripts_[commandOrExecutable].standing = std::move(reply);
}

void FakeToolRunner::replyOnce(const std::string& commandOrExecutable, ToolReply reply) {
  const std::lock_guard lock(mutex_);
  scripts_[commandOrExecutable].once.push_back(std::move(reply));
}

void FakeToolRunner::setDefaultReply(ToolReply reply) {
  const std::lock_guard lock(mutex_);
  defaultReply_ = std::move(reply);
}

void FakeToolRunner::setHandler(Handler handler) {
  const std::lock_guard lock(mutex_);
  handler_ = std::move(handler);
}

void FakeToolRunner::block() {
  const std::lock_guard lock(mutex_);
  blocked_ = true;
}

void FakeToolRunner::release() {
  const std::lock_guard lock(mutex_);
  blocked_ = false;
  changed_.notify_all();
}

std::vector<ToolRequest> FakeToolRunner::requests() const {
  const std::lock_guard lock(mutex_);
  return requests_;
}

std::size_t FakeToolRunner::requestCount() const {
  const std::lock_guard lock(mutex_);
  return requests_.size();
}

std::vector<std::string> FakeToolRunner::commands() const {
  std::vector<std::string> commands;
  for (const ToolRequest& request : requests()) {
    commands.push_back(request.command());
  }
  return commands;
}

void FakeToolRunner::forgetRequests() {
  const std::lock_guard lock(mutex_);
  requests_.clear();
}

bool FakeToolRunner::waitForRequests(std::size_t count, std::chrono::milliseconds limit) const {
  std::unique_lock lock(mutex_);
  return changed_.wait_for(lock, limit, [&] { return requests_.size() >= count; });
}

int FakeToolRunner::run(const std::string& executable, const std::vector<std::string>& arguments,
                        const std::string& standardInput, std::string& standardOutput, std::string& standardError) {
  const ToolRequest request{executable, arguments, standardInput, elementsOf(standardInput)};
  const Handler handler = record(request);
  auto handled = handler ? handler(request) : std::nullopt;
  ToolReply reply = handled ? std::move(*handled) : scripted(request);
  standardOutput = std::move(reply.standardOutput);
  standardError = std::move(reply.standardError);
  return reply.status;
}

FakeToolRunner::Handler FakeToolRunner::record(const ToolRequest& request) {
  std::unique_lock lock(mutex_);
  requests_.push_back(request);
  changed_.notify_all();
  changed_.wait(lock, [this] { return !blocked_; });
  return handler_;
}

ToolReply FakeToolRunner::scripted(const ToolRequest& request) {
  const std::lock_guard lock(mutex_);
  for (const std::string& key : {request.command(), request.executable}) {
    if (auto reply = scripted(key)) {
      return std::move(*reply);
    }
  }
  return defaultReply_;
}

std::optional<ToolReply> FakeToolRunner::scripted(const std::string& key) {
  const auto found = scripts_.find(key);
  if (found == scripts_.end()) {
    return std::nullopt;
  }
  auto& [once, standing] = found->second;
  if (once.empty()) {
    return standing;
  }
  ToolReply reply = std::move(once.front());
  once.pop_front();
  return reply;
}

} // namespace lumora::fakes
