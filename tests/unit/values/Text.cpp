#include <LumoraKit/platform/Log.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>

#include <cerrno>

using namespace lumora;

namespace {

TEST(Text, isNull_whenTheValueIsAbsent) {
  EXPECT_EQ(text(std::optional<std::string>()), "(null)");
  EXPECT_EQ(text(static_cast<const char*>(nullptr)), "(null)");
  EXPECT_EQ(text(LMRErrorRef()), "(null)");
}

TEST(Text, isTheValuesOwn_whenThereIsOne) {
  EXPECT_EQ(text("a"), "a");
  EXPECT_EQ(text(std::string("a")), "a");
  EXPECT_EQ(text(std::string_view("a")), "a");
  EXPECT_EQ(text(std::optional<std::string>("a")), "a");
  EXPECT_EQ(text(-1), "-1");
  EXPECT_EQ(text(1U), "1");
  EXPECT_EQ(text(std::int64_t{-1} << 63), "-9223372036854775808");
  EXPECT_EQ(text(~std::uint64_t{0}), "18446744073709551615");
  EXPECT_EQ(text(std::uint16_t{8170}), "8170");
  EXPECT_EQ(text(0.25), "0.25");
  EXPECT_EQ(text(Value(Array{1, "a"})), "[1, a]");
  EXPECT_EQ(text(std::filesystem::path("/tmp/a b")), "/tmp/a b");
  EXPECT_EQ(text(LMRError::make(LMRErrorDomain, 26, "No such workflow")), "org.vantor.Lumora 26: No such workflow");
}

TEST(Format, fillsEveryPlaceHolder_whenTextsAgree) {
  EXPECT_EQ(format("Error %d for %@: %@", {text(26), text("submit"), text(std::optional<std::string>())}),
            "Error 26 for submit: (null)");
  EXPECT_EQ(format("%u%s%ld", {"1", "2", "3"}), "123");
  EXPECT_EQ(format("100%% of %@", {"all"}), "100% of all");
  EXPECT_EQ(format("%%@", {}), "%@");
  EXPECT_EQ(format("", {}), "");
  EXPECT_EQ(format("plain", {}), "plain");
}

TEST(Format, doesNotFillAgain_whenATextLooksLikeAFormat) {
  EXPECT_EQ(format("%@ and %@", {"%@", "%%"}), "%@ and %%");
}

using FormatDeathTest = testing::Test;

TEST(FormatDeathTest, stopsTheProcess_whenTextsAndPlaceHoldersDiffer) {
  EXPECT_DEATH(format("%@ %@", {"one"}), "there is a text for every place holder");
  EXPECT_DEATH(format("%@", {"one", "two"}), "there is a place holder for every text");
  EXPECT_DEATH(format("%f", {"one"}), "every place holder is known");
  EXPECT_DEATH(format("100%", {}), "every place holder is known");
}

TEST(LMRError, describesItself_whenItHasADescriptionOrNone) {
  const LMRErrorRef error = LMRError::make("domain", -3, "What happened");
  EXPECT_EQ(error->domain(), "domain");
  EXPECT_EQ(error->code(), -3);
  EXPECT_EQ(error->localizedDescription(), "What happened");
  EXPECT_EQ(error->description(), "domain -3: What happened");
  EXPECT_EQ(error->userInfo().string(LMRLocalizedDescriptionKey), "What happened");
  EXPECT_EQ(LMRError("domain", 5, {}).localizedDescription(), "Error 5 in domain");
}

TEST(LMRError, keepsItsUserInformation_whenMadeWithMore) {
  const LMRError error("domain", 1, {{"stderr", "text"}});
  EXPECT_EQ(error.userInfo().string("stderr"), "text");
}

TEST(LMRError, namesTheReason_whenMadeFromErrno) {
  const LMRErrorRef error = LMRError::fromErrno(ENOENT, "open");
  EXPECT_EQ(error->domain(), LMRPosixErrorDomain);
  EXPECT_EQ(error->code(), ENOENT);
  EXPECT_EQ(error->localizedDescription(), "open: No such file or directory");
}

TEST(Log, receivesTheFilledLine_whenSomethingIsLogged) {
  // Stays installed: nothing else in this program logs.
  static const auto* const platform = new fakes::FakePlatform;
  log("Error %d for %@", {text(26), text("submit")});
  EXPECT_THAT(platform->log->lines(), testing::ElementsAre("Error 26 for submit"));
}

} // namespace
