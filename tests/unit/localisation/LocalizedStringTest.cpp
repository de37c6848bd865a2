#include <LumoraKit/login/LMRLocalizedString.h>
#include <LumoraKit/login/LMRLocalizedTables.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gtest/gtest.h>

using lumora::localizedText;

namespace {

class LocalizedStringTest : public testing::Test {
protected:
  lumora::fakes::FakePlatform platform_;
};

TEST_F(LocalizedStringTest, givesTheKey_whenThereIsNoTranslation) {
  platform_.application->setLanguage("de");
  EXPECT_EQ(LMRLocalizedString("No such text\\U2026"), "No such text\\U2026");
  EXPECT_EQ(LMRLocalizedString(""), "");
}

TEST_F(LocalizedStringTest, givesARealEllipsis) {
  EXPECT_EQ(LMRLocalizedString("Connecting\\U2026"), "Connecting…");
}

TEST_F(LocalizedStringTest, followsTheApplicationsLanguage) {
  platform_.application->setLanguage("de");
  EXPECT_EQ(LMRLocalizedString("Cancel"), "Abbrechen");
  platform_.application->setLanguage("fr");
  EXPECT_EQ(LMRLocalizedString("Cancel"), "Annuler");
  platform_.application->setLanguage("es");
  EXPECT_EQ(LMRLocalizedString("Cancel"), "Cancelar");
  platform_.application->setLanguage("ja");
  EXPECT_EQ(LMRLocalizedString("Cancel"), "キャンセル");
  platform_.application->setLanguage("en");
  EXPECT_EQ(LMRLocalizedString("Cancel"), "Cancel");
}

TEST_F(LocalizedStringTest, fallsBackFromTheRegionToTheLanguage) {
  EXPECT_EQ(localizedText("Cancel", "de-AT"), "Abbrechen");
  EXPECT_EQ(localizedText("Cancel", "ja-Jpan-JP"), "キャンセル");
}

TEST_F(LocalizedStringTest, fallsBackToEnglish_whenTheLanguageHasNoTable) {
  EXPECT_EQ(localizedText("Connecting\\U2026", "nl"), "Connecting…");
  EXPECT_EQ(localizedText("Connecting\\U2026", "pt-BR"), "Connecting…");
  EXPECT_EQ(localizedText("Connecting\\U2026", ""), "Connecting…");
}

TEST_F(LocalizedStringTest, takesLanguagesInCapitalLetters) {
  EXPECT_EQ(localizedText("Cancel", "FR-CA"), "Annuler");
}

TEST_F(LocalizedStringTest, isNoOtherLanguage_whenTheLanguageBeginsAlike) {
  EXPECT_EQ(localizedText("Cancel", "den"), "Cancel");
}

} // namespace
