#include "Values.h"

#include <glib.h>

#include <algorithm>
#include <charconv>
#include <cmath>

namespace lumora::client {

namespace {

std::string listed(const std::vector<std::string_view>& words) {
  std::string list;
  for (const auto word : words) {
    list += (list.empty() ? "" : ", ") + std::string(word);
  }
  return list;
}

template <class Result> std::optional<std::string> unless(const Result& result, const char* complaint) {
  return result ? std::nullopt : std::optional<std::string>(complaint);
}

} // namespace

std::optional<std::uint64_t> number(std::string_view text) {
  std::uint64_t value = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
  return error == std::errc() && end == text.data() + text.size() ? std::optional(value) : std::nullopt;
}

std::optional<double> seconds(const std::string& text) {
  double value = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value, std::chars_format::fixed);
  const bool isWhole = error == std::errc() && end == text.data() + text.size();
  return isWhole && std::isfinite(value) && value >= 0 ? std::optional(value) : std::nullopt;
}

std::optional<Date> date(const std::string& text) {
  // Without a default time zone a text that does not name its own is refused.
  GDateTime* const moment = g_date_time_new_from_iso8601(text.c_str(), nullptr);
  if (moment == nullptr) {
    return std::nullopt;
  }
  const auto unixSeconds = g_date_time_to_unix(moment);
  g_date_time_unref(moment);
  return Date(std::chrono::seconds(unixSeconds));
}

std::optional<std::pair<std::string, std::string>> pair(const std::string& text) {
  const auto equals = text.find('=');
  if (equals == 0 || equals == std::string::npos) {
    return std::nullopt;
  }
  return std::pair(text.substr(0, equals), text.substr(equals + 1));
}

std::optional<std::string> fault(Kind kind, const std::vector<std::string_view>& words, const std::string& text) {
  switch (kind) {
  case Kind::Number:
    return unless(number(text), "is not a whole number of zero or more");
  case Kind::Seconds:
    return unless(seconds(text), "is not a number of seconds");
  case Kind::Date:
    return unless(date(text), "is not a date like 2026-11-21T09:30:00Z");
  case Kind::Pair:
    return unless(pair(text), "is not of the form KEY=VALUE");
  case Kind::Word:
    return std::ranges::find(words, text) == words.end() ? std::optional("is none of " + listed(words)) : std::nullopt;
  default:
    return std::nullopt;
  }
}

} // namespace lumora::client
