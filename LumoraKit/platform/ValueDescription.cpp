#include <LumoraKit/platform/Value.h>
#include <LumoraKit/platform/ValueText.h>
#include <LumoraKit/platform/ValueWalk.h>

namespace lumora {
namespace {

// Dates whose year has not four digits have no calendar text.
std::string describe(Date date) {
  const auto text = value_text::dateText(date, " ", " +0000");
  return text ? *text : std::to_string(date.time_since_epoch().count()) + " s after 1970-01-01";
}

std::string describe(const Data& bytes) {
  constexpr std::string_view digits = "0123456789abcdef";
  std::string text = "<";
  for (const std::uint8_t byte : bytes) {
    text += digits[byte >> 4];
    text += digits[byte & 0xf];
  }
  return text += '>';
}

std::string describeLeaf(const Value& value) {
  switch (value.type()) {
  case Value::Type::Date:
    return describe(*value.date());
  case Value::Type::Data:
    return describe(*value.data());
  case Value::Type::Real:
    return value_text::realText(*value.real());
  case Value::Type::UnsignedInteger:
    return std::to_string(*value.unsignedInteger());
  default:
    return std::to_string(*value.integer());
  }
}

class Describer {
public:
  void leaf(const Value& value) {
    separate();
    const std::string* const string = value.string();
    text_ += string ? *string : describeLeaf(value);
  }
  void emptyCollection(Collection kind) {
    separate();
    text_ += kind == Collection::Array ? "[]" : "{}";
  }
  void open(Collection kind) {
    separate();
    text_ += kind == Collection::Array ? '[' : '{';
    atStart_ = true;
  }
  void key(const std::string& key) {
    separate();
    text_ += key + ": ";
    atStart_ = true;
  }
  void close(Collection kind) {
    text_ += kind == Collection::Array ? ']' : '}';
    atStart_ = false;
  }
  static bool isDone() { return false; }

  std::string take() { return std::move(text_); }

private:
  void separate() {
    if (!atStart_) {
      text_ += ", ";
    }
    atStart_ = false;
  }

  std::string text_;
  bool atStart_ = true;
};

} // namespace

std::string Value::description() const {
  Describer describer;
  ValueWalk(describer).through(*this);
  return describer.take();
}

} // namespace lumora
