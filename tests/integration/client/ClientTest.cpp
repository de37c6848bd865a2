#include "ClientTest.h"

#include <LumoraKit/platform/PropertyList.h>

#include <algorithm>
#include <cstdlib>

namespace lumora::tests {

namespace fs = std::filesystem;

namespace {

const std::vector<const char*> variables{"LUMORA_SERVER", "LUMORA_USER", "LUMORA_ROOT",
                                         "XDG_DATA_HOME", "TZ",          "LC_ALL"};

Array withoutLogin(const Array& request) {
  const auto isLogin = [](const Value& element) {
    const Array* const pair = element.array();
    const std::string* const key = pair != nullptr && !pair->empty() ? pair->front().string() : nullptr;
    return key != nullptr && (*key == "server" || *key == "auth" || *key == "user" || *key == "pass");
  };
  // "listinfo" names the server behind the command.
  const auto end = request.empty() || request.front().string() != nullptr
                       ? request.begin()
                       : std::find_if_not(request.begin(), request.end(), isLogin);
  return {end, request.end()};
}

} // namespace

ClientTest::ClientTest(const std::vector<std::string>& createArguments) : server_(createArguments) {
  fs::create_directories(folder_ / "requests");
  for (const char* const tool : {"usr/bin/lumctl", "usr/bin/lumaction"}) {
    noteRequestsOf(tool);
  }
  const std::vector<std::string> values{
      SandboxServer::host, SandboxServer::userName, root_, (folder_ / "data").string(), "UTC", "C.UTF-8"};
  for (std::size_t i = 0; i < values.size(); ++i) {
    ::setenv(variables[i], values[i].c_str(), 1);
  }
  writeFile(folder_ / "password", std::string(SandboxServer::password) + "\n");
}

ClientTest::~ClientTest() {
  for (const char* const variable : variables) {
    ::unsetenv(variable);
  }
}

void ClientTest::noteRequestsOf(const std::string& tool) const {
  const fs::path path = fs::path(root_) / tool;
  fs::create_directories(path.parent_path());
  const std::string requests = (folder_ / "requests").string();
  writeFile(path, "#!/bin/sh\nnote='" + requests + "'/$(ls '" + requests + "' | wc -l)\ncat > \"$note\"\nexec '" +
                      (server_.root() / tool).string() + "' \"$@\" < \"$note\"\n");
  fs::permissions(path, fs::perms::owner_all);
}

std::vector<std::string> ClientTest::commandLine(std::vector<std::string> arguments) const {
  arguments.insert(arguments.begin(), {LUMORA_CLIENT_PROGRAM, "--password-file", (folder_ / "password").string()});
  return arguments;
}

ProgramRun ClientTest::run(std::vector<std::string> arguments, std::string_view input) const {
  return runToEnd(commandLine(std::move(arguments)), input);
}

std::string ClientTest::output(std::vector<std::string> arguments) const {
  const auto result = run(std::move(arguments));
  EXPECT_EQ(result.status, 0) << result.standardError;
  EXPECT_EQ(result.standardError, "");
  return result.standardOutput;
}

Dictionary ClientTest::reply(std::vector<std::string> arguments) const {
  arguments.insert(arguments.begin(), {"--output", "plist"});
  return dictionaryWithXMLDescription(output(std::move(arguments))).value_or(Dictionary());
}

std::string ClientTest::file(std::string_view name, std::string_view content) const {
  writeFile(folder_ / name, content);
  return (folder_ / name).string();
}

std::vector<std::string> ClientTest::filesIn(const fs::path& folder) {
  std::vector<std::string> names;
  if (fs::exists(folder)) {
    for (const auto& entry : fs::recursive_directory_iterator(folder)) {
      names.push_back(entry.path().filename());
    }
  }
  std::ranges::sort(names);
  return names;
}

std::vector<Array> ClientTest::requests() const {
  std::vector<Array> all;
  for (std::size_t i = 0; fs::exists(folder_ / ("requests/" + std::to_string(i))); ++i) {
    const auto value = valueWithXMLDescription(contentOf(folder_ / ("requests/" + std::to_string(i))));
    all.push_back(value && value->array() != nullptr ? withoutLogin(*value->array()) : Array{"no request"});
    fs::remove(folder_ / ("requests/" + std::to_string(i)));
  }
  return all;
}

Array ClientTest::request() const {
  const auto all = requests();
  EXPECT_EQ(all.size(), 1U);
  return all.size() == 1 ? all.front() : Array();
}

void ClientTest::inject(const std::string& fault, const std::vector<std::string>& arguments) const {
  EXPECT_EQ(server_.administrate({"inject", fault}, arguments).status, 0);
}

std::string ClientTest::cameraState(const std::string& camera) const {
  const auto list = server_.administrate({"camera", "list"}).standardOutput;
  const auto start = list.find(camera + "\t");
  const auto from = start + camera.size() + 1;
  return start == std::string::npos ? "" : list.substr(from, list.find_first_of("\t\n", from) - from);
}

} // namespace lumora::tests
