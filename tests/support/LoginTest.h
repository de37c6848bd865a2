#pragma once

#include <LumoraKit/login/LMRServerLoginViewController.h>
#include <LumoraKit/testing/FakePlatform.h>
#include <LumoraKit/testing/ManualQueues.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace lumora::tests {

/// The success target of a panel.
struct LoginTarget {
  void succeeded(const std::shared_ptr<LMRAuthenticationAction>& action) { actions.push_back(action); }
  std::vector<std::shared_ptr<LMRAuthenticationAction>> actions;
};

/// A login panel on fakes, and queues that run when the test says so. The server "studio" takes passwords unless told
/// otherwise, and knows Alice.
class LoginTest : public testing::Test {
protected:
  LoginTest() {
    auto platform = Platform::current();
    platform.queues = queues_;
    platform.mainThread = queues_->mainThread();
    Platform::install(platform);
    serverTakes({"basic"});
    tools().reply("listworkflows",
                  fakes::ToolReply::success(
                      {{"user_shortname", "alice"}, {"user_fullname", "Alice Smith"}, {"server", "Lumora"}}));
  }

  fakes::FakeToolRunner& tools() { return *platform_.toolRunner; }
  fakes::FakeUserInterface& ui() { return *platform_.userInterface; }
  fakes::FakeLoginPanel& panel() { return *ui().panel(); }
  fakes::FakeCredentialStore& keychain() { return *platform_.credentialStore; }
  fakes::RecordingLog& log() { return *platform_.log; }

  void serverTakes(const Array& methods) { serverSays({{"http_auth_type", methods}}); }
  void serverSays(const Dictionary& reply) { tools().reply("listinfo", fakes::ToolReply::success(reply)); }
  void setRealm(const std::string& name) { platform_.kerberos->setDefaultRealm(name); }

  void setFrameworkPreference(const std::string& key, const Value& value) {
    platform_.preferences->setValue("org.vantor.lumora.kit", key, value);
  }
  std::optional<Value> frameworkPreference(const std::string& key) {
    return platform_.preferences->value("org.vantor.lumora.kit", key);
  }
  std::optional<Value> applicationPreference(const std::string& key) {
    return platform_.preferences->value("org.vantor.lumora.test", key);
  }
  void saveConnection(const Dictionary& record) {
    platform_.preferences->setValue("org.vantor.lumora.test", "LMRSavedConnection", record);
  }

  /// Runs whatever is queued, to the end.
  void run() { queues_->runAll(); }

  /// The addresses that "listinfo" went to.
  std::vector<std::string> interrogated() {
    std::vector<std::string> addresses;
    for (const auto& request : tools().requests()) {
      if (request.command() == "listinfo") {
        addresses.push_back(request.value("server").value_or(""));
      }
    }
    return addresses;
  }

  fakes::FakePlatform platform_;
  std::shared_ptr<fakes::ManualQueues> queues_ = std::make_shared<fakes::ManualQueues>();
  std::shared_ptr<LoginTarget> target_ = std::make_shared<LoginTarget>();
};

/// The same with a panel that is embedded by itself.
class LoginViewTest : public LoginTest {
protected:
  void load() { controller_->loadView(); }

  /// Loads it, types a server, presses Return and waits for the answer.
  void ask(const std::string& server = "studio") {
    load();
    panel().typeServer(server);
    panel().finishServer();
    run();
  }

  void connect() { controller_->attemptToLogInToServerWithTarget_selector(target_, &LoginTarget::succeeded); }

  /// Fills in what the fields ask for, and presses connect.
  void connectAsAlice() {
    panel().typeUserName("alice");
    panel().typePassword("sesame");
    connect();
  }

  bool areFieldsShown() { return !controller_->passwordControlsHidden(); }
  LMRAuthenticationType type() { return controller_->currentAuthenticationType(); }

  std::shared_ptr<LMRServerLoginViewController> controller_ = std::make_shared<LMRServerLoginViewController>();
};

} // namespace lumora::tests
