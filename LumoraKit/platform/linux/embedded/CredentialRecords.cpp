#include "CredentialRecords.h"

#include "LittleEndian.h"

#include <algorithm>
#include <string_view>

namespace lumora::backend {
namespace {

using Length = std::uint32_t;

void appendText(std::string& plain, const std::string& text) {
  appendNumber(plain, static_cast<Length>(text.size()));
  plain += text;
}

std::size_t encodedSize(const CredentialRecord& item) {
  return sizeof(item.number) + 3 * sizeof(Length) + item.service.size() + item.account.size() +
         item.secret.text().size();
}

class Reader {
public:
  explicit Reader(std::string_view plain) : rest_(plain) {}

  bool isAtEnd() const { return rest_.empty(); }

  template <class Number> std::optional<Number> number() {
    if (rest_.size() < sizeof(Number)) {
      return std::nullopt;
    }
    const auto number = numberAt<Number>(rest_, 0);
    rest_.remove_prefix(sizeof(Number));
    return number;
  }

  std::optional<std::string> text() {
    const auto length = number<Length>();
    if (!length || rest_.size() < *length) {
      return std::nullopt;
    }
    std::string text(rest_.substr(0, *length));
    rest_.remove_prefix(*length);
    return text;
  }

private:
  std::string_view rest_;
};

} // namespace

// Reserved in advance: growing would leave copies behind.
Secret CredentialRecords::encoded() const {
  std::size_t size = sizeof(lastNumber);
  for (const CredentialRecord& item : items) {
    size += encodedSize(item);
  }
  std::string plain;
  plain.reserve(size);
  appendNumber(plain, lastNumber);
  for (const CredentialRecord& item : items) {
    appendNumber(plain, item.number);
    appendText(plain, item.service);
    appendText(plain, item.account);
    appendText(plain, item.secret.text());
  }
  return Secret(std::move(plain));
}

std::optional<CredentialRecords> CredentialRecords::decoded(const Secret& plain) {
  Reader reader(plain.text());
  const auto lastNumber = reader.number<std::uint64_t>();
  if (!lastNumber) {
    return std::nullopt;
  }
  CredentialRecords records{*lastNumber, {}};
  while (!reader.isAtEnd()) {
    const auto number = reader.number<std::uint64_t>();
    auto service = reader.text();
    auto account = reader.text();
    auto secret = reader.text();
    if (!number || !service || !account || !secret) {
      return std::nullopt;
    }
    records.items.push_back({*number, std::move(*service), std::move(*account), Secret(std::move(*secret))});
  }
  return records;
}

const CredentialRecord* CredentialRecords::find(const std::string& service, const std::string& account) const {
  const auto found = std::ranges::find_if(
      items, [&](const CredentialRecord& item) { return item.service == service && item.account == account; });
  return found == items.end() ? nullptr : &*found;
}

} // namespace lumora::backend
