#include "FaultRun.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/platform/linux/FilePreferences.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>

namespace lumora::tests {
namespace {

using backend::FilePreferences;
using testing::ElementsAre;

const std::string domain = "org.vantor.test";
const std::vector<std::string> writingCalls{"mkdir", "open", "flock", "mkostemp", "write", "fsync", "rename", "close"};

class Setting : public FaultScenario {
public:
  using FaultScenario::FaultScenario;

  void act() override { FilePreferences(folder()).setValue(domain, "new", value_); }

  void check(const Fault& fault) override {
    const auto found = FilePreferences(folder()).value(domain, "new");
    EXPECT_TRUE(!found || *found == Value(value_));
    EXPECT_EQ(platform_.log->count("Cannot save the preference new of " + domain), found ? 0U : 1U);
    EXPECT_TRUE(found || fault.call != 0);
  }

protected:
  std::filesystem::path folder() const { return folder_ / "config"; }
  std::filesystem::path file() const { return folder() / (domain + ".plist"); }

  fakes::FakePlatform platform_;
  const std::string value_ = std::string(100'000, 'v');
};

TEST(PreferencesFaults, areLogged_whenTheFirstValueCannotBeStored) {
  expectHolds(runWithFaults<Setting>(), writingCalls);
}

class SecondSetting final : public Setting {
public:
  explicit SecondSetting(const std::filesystem::path& folder) : Setting(folder) {
    FilePreferences(this->folder()).setValue(domain, "old", "value");
  }

  void check(const Fault& fault) override {
    Setting::check(fault);
    EXPECT_EQ(FilePreferences(folder()).value(domain, "old"), Value("value"));
    EXPECT_THAT(filesBelow(folder()), ElementsAre("." + domain + ".lock", domain + ".plist"));
  }
};

TEST(PreferencesFaults, loseNothing_whenAnotherValueIsStored) {
  expectHolds(runWithFaults<SecondSetting>(), {"read", "write", "rename"});
}

class SettingBesideDamage final : public Setting {
public:
  explicit SettingBesideDamage(const std::filesystem::path& folder) : Setting(folder) {
    std::filesystem::create_directory(this->folder());
    writeFile(file(), damage_);
  }

  void check(const Fault& fault) override {
    if (contentOf(file()) != damage_) {
      Setting::check(fault);
      const auto files = filesBelow(folder());
      EXPECT_TRUE(
          std::ranges::any_of(files, [this](const auto& name) { return contentOf(folder() / name) == damage_; }));
    }
  }

private:
  const std::string damage_ = "<plist><dict><key>half";
};

TEST(PreferencesFaults, keepADamagedFile) {
  expectHolds(runWithFaults<SettingBesideDamage>(), {"read", "rename"});
}

class Reading final : public Setting {
public:
  explicit Reading(const std::filesystem::path& folder) : Setting(folder) { Setting::act(); }

  void act() override { found_ = FilePreferences(folder()).value(domain, "new"); }

  void check(const Fault& fault) override {
    EXPECT_TRUE(!found_ || *found_ == Value(value_));
    EXPECT_EQ(platform_.log->count("Cannot read the preference new of " + domain), found_ ? 0U : 1U);
    EXPECT_TRUE(found_ || fault.call != 0);
  }

private:
  std::optional<Value> found_;
};

TEST(PreferencesFaults, areLogged_whenAValueCannotBeRead) {
  expectHolds(runWithFaults<Reading>(), {"open", "read", "close"});
}

// As a list of servers is made longer.
class Appending final : public Setting {
public:
  explicit Appending(const std::filesystem::path& folder) : Setting(folder) {
    FilePreferences(this->folder()).setValue(domain, "list", Array{"one", "two"});
  }

  void act() override {
    FilePreferences preferences(folder());
    const auto found = preferences.value(domain, "list");
    auto list = found ? *found->array() : Array();
    list.emplace_back("three");
    preferences.setValue(domain, "list", list);
  }

  void check(const Fault& fault) override {
    const auto list = FilePreferences(folder()).value(domain, "list");
    const bool isLonger = list == Value(Array{"one", "two", "three"});
    EXPECT_TRUE(isLonger || list == Value(Array{"one", "two"})) << text(list ? *list : Value("nothing"));
    EXPECT_TRUE(isLonger || fault.call != 0);
    EXPECT_EQ(platform_.log->count("Cannot save the preference list of " + domain), isLonger ? 0U : 1U);
  }
};

TEST(PreferencesFaults, loseNothing_whenAValueIsMadeOfThePresentOne) {
  expectHolds(runWithFaults<Appending>(), {"open", "read", "write"});
}

} // namespace
} // namespace lumora::tests
