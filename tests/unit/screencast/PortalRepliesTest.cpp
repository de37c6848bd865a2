#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/linux/screencast/PortalReplies.h>

#include <gio/gio.h>
#include <gtest/gtest.h>

namespace {

using lumora::CaptureErrorCode;
using namespace lumora::backend;

// A value in the library's own text format.
GLibPtr<GVariant> value(const char* written) {
  GLibPtr<GVariant> parsed(g_variant_parse(nullptr, written, nullptr, nullptr, nullptr));
  EXPECT_NE(parsed, nullptr) << written;
  return parsed;
}

GLibPtr<GVariant> dictionary(const std::string& content) {
  return value(("@a{sv} {" + content + "}").c_str());
}

std::int64_t codeOf(GQuark domain, int code) {
  const GLibPtr<GError> error(g_error_new_literal(domain, code, "the reason"));
  return portalCallError(*error)->code();
}

std::int64_t number(CaptureErrorCode code) {
  return static_cast<std::int64_t>(code);
}

std::string printed(const PortalFeatures& features, const std::string& restoreToken) {
  const GLibPtr<GVariant> options(g_variant_ref_sink(portalSourceOptions(features, "handle1", restoreToken)));
  const GLibPtr<gchar> text(g_variant_print(options.get(), FALSE));
  return text.get();
}

TEST(PortalFeatures, areRead_whenThePortalTellsThem) {
  const auto properties =
      dictionary("'version': <uint32 4>, 'AvailableSourceTypes': <uint32 3>, 'AvailableCursorModes': <uint32 7>");
  EXPECT_EQ(portalFeatures(*properties), (PortalFeatures{4, true, true}));
  EXPECT_TRUE(portalFeatures(*properties).remembersAnswers());
}

TEST(PortalFeatures, areNone_whenThePortalOffersWindowsOnlyAndIsOld) {
  const auto properties = dictionary("'version': <uint32 1>, 'AvailableSourceTypes': <uint32 2>");
  EXPECT_EQ(portalFeatures(*properties), (PortalFeatures{1, false, false}));
  EXPECT_FALSE(portalFeatures(*properties).remembersAnswers());
}

TEST(PortalFeatures, areNone_whenTheReplyIsOfAnotherType) {
  EXPECT_EQ(portalFeatures(*value("'text'")), PortalFeatures());
  EXPECT_EQ(portalFeatures(*dictionary("'version': <'4'>, 'AvailableSourceTypes': <1>")), PortalFeatures());
}

TEST(PortalResponse, isRead_whenItIsOne) {
  const auto response = portalResponse(*value("(uint32 1, @a{sv} {'a': <1>})"));
  ASSERT_TRUE(response.has_value());
  EXPECT_EQ(response->code, 1U);
  EXPECT_EQ(g_variant_n_children(response->results.get()), 1U);
}

TEST(PortalResponse, isNone_whenItIsOfAnotherType) {
  EXPECT_FALSE(portalResponse(*value("(uint32 0,)")).has_value());
  EXPECT_FALSE(portalResponse(*value("(0, @a{sv} {})")).has_value());
  EXPECT_FALSE(portalResponse(*value("'text'")).has_value());
}

TEST(PortalRefusal, isNoError_whenTheRequestWasDone) {
  EXPECT_EQ(portalRefusal(0), nullptr);
}

TEST(PortalRefusal, saysWhoRefused_whenItWasTheUserOrTheDesktop) {
  EXPECT_EQ(portalRefusal(1)->domain(), LMRCaptureErrorDomain);
  EXPECT_EQ(portalRefusal(1)->code(), number(CaptureErrorCode::ScreenRefused));
  EXPECT_EQ(portalRefusal(1)->localizedDescription(), "The user did not allow the screen to be recorded");
  EXPECT_EQ(portalRefusal(2)->code(), number(CaptureErrorCode::DeviceFailed));
  EXPECT_EQ(portalRefusal(2)->localizedDescription(), "The desktop ended the question for a screen by itself");
  EXPECT_EQ(portalRefusal(77)->code(), number(CaptureErrorCode::DeviceFailed));
}

TEST(PortalSessionHandle, isRead_whenItIsATextOrAPath) {
  EXPECT_EQ(portalSessionHandle(*dictionary("'session_handle': <'/a/b'>")), "/a/b");
  EXPECT_EQ(portalSessionHandle(*dictionary("'session_handle': <objectpath '/a/b'>")), "/a/b");
}

TEST(PortalSessionHandle, isNone_whenItIsMissingOrNoPath) {
  EXPECT_EQ(portalSessionHandle(*dictionary("")), "");
  EXPECT_EQ(portalSessionHandle(*dictionary("'session_handle': <'a b'>")), "");
  EXPECT_EQ(portalSessionHandle(*dictionary("'session_handle': <1>")), "");
}

TEST(PortalStreamNode, isTheFirstOne_whenThereAreStreams) {
  EXPECT_EQ(portalStreamNode(*dictionary("'streams': <[(uint32 42, {'size': <(1, 2)>}), (43, {})]>")), 42U);
}

TEST(PortalStreamNode, isNone_whenThereIsNoStream) {
  EXPECT_EQ(portalStreamNode(*dictionary("")), std::nullopt);
  EXPECT_EQ(portalStreamNode(*dictionary("'streams': <@a(ua{sv}) []>")), std::nullopt);
  EXPECT_EQ(portalStreamNode(*dictionary("'streams': <[42]>")), std::nullopt);
}

TEST(PortalRestoreToken, isReadOrEmpty_whenThereIsOneOrNot) {
  EXPECT_EQ(portalRestoreToken(*dictionary("'restore_token': <'abc'>")), "abc");
  EXPECT_EQ(portalRestoreToken(*dictionary("'restore_token': <7>")), "");
  EXPECT_EQ(portalRestoreToken(*dictionary("")), "");
}

TEST(PortalSourceOptions, askForEverything_whenThePortalCanDoIt) {
  EXPECT_EQ(printed({4, true, true}, "abc"), "{'handle_token': <'handle1'>, 'types': <uint32 1>, 'multiple': <false>, "
                                             "'cursor_mode': <uint32 2>, 'persist_mode': <uint32 1>, "
                                             "'restore_token': <'abc'>}");
  EXPECT_EQ(printed({4, true, true}, "").find("restore_token"), std::string::npos);
}

TEST(PortalSourceOptions, leaveOutWhatItDoesNotKnow_whenThePortalIsOld) {
  EXPECT_EQ(printed({1, true, false}, "abc"),
            "{'handle_token': <'handle1'>, 'types': <uint32 1>, 'multiple': <false>}");
}

TEST(PortalCallError, tellsTheReasonsApart_whenACallFails) {
  const GQuark bus = G_DBUS_ERROR;
  EXPECT_EQ(codeOf(bus, G_DBUS_ERROR_SERVICE_UNKNOWN), number(CaptureErrorCode::ScreenUnavailable));
  EXPECT_EQ(codeOf(bus, G_DBUS_ERROR_INVALID_ARGS), number(CaptureErrorCode::ScreenUnavailable));
  EXPECT_EQ(codeOf(bus, G_DBUS_ERROR_UNKNOWN_METHOD), number(CaptureErrorCode::ScreenUnavailable));
  EXPECT_EQ(codeOf(bus, G_DBUS_ERROR_NO_REPLY), number(CaptureErrorCode::DeviceFailed));
  EXPECT_EQ(codeOf(bus, G_DBUS_ERROR_TIMED_OUT), number(CaptureErrorCode::DeviceTimedOut));
  EXPECT_EQ(codeOf(bus, G_DBUS_ERROR_ACCESS_DENIED), number(CaptureErrorCode::DeviceFailed));
  EXPECT_EQ(codeOf(G_IO_ERROR, G_IO_ERROR_TIMED_OUT), number(CaptureErrorCode::DeviceTimedOut));
  EXPECT_EQ(codeOf(G_IO_ERROR, G_IO_ERROR_CLOSED), number(CaptureErrorCode::DeviceFailed));
}

TEST(PortalCallError, givesThePortalsOwnReason_whenItIsAnUnknownError) {
  const GLibPtr<GError> error(g_dbus_error_new_for_dbus_error("org.freedesktop.portal.Error.NotAllowed", "no screens"));
  EXPECT_EQ(portalCallError(*error)->localizedDescription(),
            "The desktop's portal does not show the screen: no screens");
}

} // namespace
