#include <LumoraKit/platform/Clock.h>
#include <LumoraKit/platform/KTHost.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/linux/LinuxApplication.h>

#include <gmock/gmock.h>

#include <array>
#include <cerrno>
#include <cstdlib>
#include <string>

#include <unistd.h>

namespace lumora::tests {
namespace {

using backend::languageTag;
using backend::LinuxApplication;

class ApplicationLanguage : public testing::Test {
protected:
  void SetUp() override {
    for (const char* const variable : {"LC_ALL", "LC_MESSAGES", "LANG", "LANGUAGE"}) {
      unsetenv(variable);
    }
  }

  static void set(const char* variable, const char* value) { setenv(variable, value, 1); }
  static std::string language() { return LinuxApplication().language(); }
};

TEST_F(ApplicationLanguage, isEnglish_whenNothingIsSet) {
  EXPECT_EQ(language(), "en");
}

TEST_F(ApplicationLanguage, isEnglish_inTheCLocale) {
  for (const char* const locale : {"C", "POSIX", "C.UTF-8"}) {
    set("LANG", locale);
    EXPECT_EQ(language(), "en");
  }
}

TEST_F(ApplicationLanguage, comesFromTheStrongestVariable) {
  set("LANG", "de_DE.UTF-8");
  EXPECT_EQ(language(), "de-DE");
  set("LC_MESSAGES", "fr_FR.UTF-8");
  EXPECT_EQ(language(), "fr-FR");
  set("LC_ALL", "ja_JP.UTF-8");
  EXPECT_EQ(language(), "ja-JP");
  set("LC_ALL", "");
  EXPECT_EQ(language(), "fr-FR");
}

TEST_F(ApplicationLanguage, isFirstEntryOfList_whenLocaleIsNotC) {
  set("LANG", "de_DE.UTF-8");
  set("LANGUAGE", "es_MX:fr");
  EXPECT_EQ(language(), "es-MX");
  set("LANGUAGE", "::fr:de");
  EXPECT_EQ(language(), "fr");
  set("LANGUAGE", "");
  EXPECT_EQ(language(), "de-DE");
}

TEST_F(ApplicationLanguage, passesListOver_inTheCLocale) {
  set("LANGUAGE", "de");
  EXPECT_EQ(language(), "en");
  set("LC_ALL", "C");
  set("LANG", "fr_FR.UTF-8");
  EXPECT_EQ(language(), "en");
}

TEST(LanguageTag, isMadeFromLocalesName) {
  EXPECT_EQ(languageTag("de"), "de");
  EXPECT_EQ(languageTag("pt_BR"), "pt-BR");
  EXPECT_EQ(languageTag("de_AT.UTF-8@euro"), "de-AT");
  EXPECT_EQ(languageTag("sr_RS@latin"), "sr-RS");
  EXPECT_EQ(languageTag("POSIX"), "en");
  EXPECT_EQ(languageTag("C.UTF-8"), "en");
}

TEST(LanguageTag, isEnglish_whenNameMakesNoSense) {
  for (const char* const name : {"", ".UTF-8", "@euro", "../de", "/usr/share/locale", "1de", "de DE"}) {
    EXPECT_EQ(languageTag(name), "en") << name;
  }
}

TEST(ApplicationIdentity, isProgramsFileName_untilItIsSet) {
  const LinuxApplication application;
  EXPECT_EQ(application.identifier(), program_invocation_short_name);
  EXPECT_EQ(application.name(), "unit-platform-linux");
  Application::setIdentity("org.vantor.lumora.recorder", "Lumora Recorder");
  EXPECT_EQ(application.identifier(), "org.vantor.lumora.recorder");
  EXPECT_EQ(application.name(), "Lumora Recorder");
}

TEST(Host, hasMachinesName_whenItIsTheCurrentOne) {
  std::array<char, 256> name{};
  gethostname(name.data(), name.size() - 1);
  EXPECT_EQ(KTHost::currentHost().name(), name.data());
  EXPECT_TRUE(KTHost::currentHost().isCurrentHost());
}

TEST(Host, hasGivenName) {
  const auto host = KTHost::hostWithName("lumora.example.org");
  EXPECT_EQ(host.name(), "lumora.example.org");
  EXPECT_FALSE(host.isCurrentHost());
}

TEST(WallClock, goesWithTheSystem) {
  const auto clock = Platform::current().wallClock;
  const auto before = std::chrono::system_clock::now();
  const auto now = clock->now();
  EXPECT_LE(before, now);
  EXPECT_LE(now, std::chrono::system_clock::now());
}

} // namespace
} // namespace lumora::tests
