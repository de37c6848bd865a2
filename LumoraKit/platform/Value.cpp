#include <LumoraKit/platform/Value.h>
#include <LumoraKit/platform/ValueInternals.h>

#include <utility>

namespace lumora {

Value::Value(std::string text) : storage_(std::move(text)) {}

Value::Value(std::string_view text) : storage_(std::string(text)) {}

Value::Value(const char* text) : storage_(std::string(text)) {}

Value::Value(bool flag) : storage_(flag) {}

Value::Value(int number) : storage_(std::int64_t{number}) {}

Value::Value(unsigned number) : storage_(std::int64_t{number}) {}

Value::Value(std::int64_t number) : storage_(number) {}

Value::Value(std::uint64_t number) : storage_(number) {
  if (std::in_range<std::int64_t>(number)) {
    storage_ = static_cast<std::int64_t>(number);
  }
}

Value::Value(double number) : storage_(number) {}

Value::Value(Date date) : storage_(date) {}

Value::Value(Data bytes) : storage_(std::move(bytes)) {}

Value::Value(Array elements) : storage_(std::move(elements)) {}

Value::Value(Dictionary entries) : storage_(std::move(entries)) {}

Value::Value(const Value& other) : storage_(false) {
  Internals::copy(other, *this);
}

Value& Value::operator=(const Value& other) {
  return *this = Value(other);
}

// The old content goes through the destructor below, which does not recurse; assigned directly, it would.
Value& Value::operator=(Value&& other) noexcept {
  Value old(std::move(*this));
  storage_ = std::move(other.storage_);
  return *this;
}

void Value::dismantle() noexcept {
  Internals::dismantle(*this);
}

// The places of a storage are in the order of the types.
Value::Type Value::type() const {
  return static_cast<Type>(storage_.index());
}

const std::string* Value::string() const {
  return std::get_if<std::string>(&storage_);
}

const Data* Value::data() const {
  return std::get_if<Data>(&storage_);
}

const Array* Value::array() const {
  return std::get_if<Array>(&storage_);
}

const Dictionary* Value::dictionary() const {
  return std::get_if<Dictionary>(&storage_);
}

std::string* Value::string() {
  return std::get_if<std::string>(&storage_);
}

Array* Value::array() {
  return std::get_if<Array>(&storage_);
}

Dictionary* Value::dictionary() {
  return std::get_if<Dictionary>(&storage_);
}

std::optional<bool> Value::boolean() const {
  const bool* const flag = std::get_if<bool>(&storage_);
  return flag ? std::optional(*flag) : std::nullopt;
}

std::optional<Date> Value::date() const {
  const Date* const date = std::get_if<Date>(&storage_);
  return date ? std::optional(*date) : std::nullopt;
}

std::optional<std::int64_t> Value::integer() const {
  if (const auto* const number = std::get_if<std::int64_t>(&storage_)) {
    return *number;
  }
  const bool* const flag = std::get_if<bool>(&storage_);
  return flag ? std::optional<std::int64_t>(*flag) : std::nullopt;
}

std::optional<std::uint64_t> Value::unsignedInteger() const {
  if (const auto* const number = std::get_if<std::uint64_t>(&storage_)) {
    return *number;
  }
  const std::optional<std::int64_t> number = integer();
  return number && *number >= 0 ? std::optional(static_cast<std::uint64_t>(*number)) : std::nullopt;
}

std::optional<double> Value::real() const {
  if (const auto* const number = std::get_if<double>(&storage_)) {
    return *number;
  }
  if (const auto* const number = std::get_if<std::uint64_t>(&storage_)) {
    return static_cast<double>(*number);
  }
  const std::optional<std::int64_t> number = integer();
  return number ? std::optional(static_cast<double>(*number)) : std::nullopt;
}

bool operator==(const Value& left, const Value& right) {
  return Value::Internals::equal(left, right);
}

} // namespace lumora
