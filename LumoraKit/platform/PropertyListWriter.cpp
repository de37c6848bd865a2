#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/platform/PropertyListBuilder.h>
#include <LumoraKit/platform/ValueText.h>
#include <LumoraKit/platform/ValueWalk.h>
#include <LumoraKit/platform/XMLText.h>

#include <algorithm>
#include <utility>

namespace lumora {
namespace {

class Writer {
public:
  template <class Root> std::optional<std::string> write(const Root& root, LMRErrorRef* error) {
    // Enough for a tool's request: one that holds a password leaves no copy behind by growing.
    text_.reserve(4096);
    text_ = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<plist version=\"1.0\">\n";
    ValueWalk(*this).through(root);
    text_ += "</plist>\n";
    if (error) {
      *error = error_;
    }
    return error_ ? std::nullopt : std::optional(std::move(text_));
  }

  void leaf(const Value& value);
  void key(const std::string& key);
  void emptyCollection(Collection kind);
  void open(Collection kind);
  void close(Collection kind);
  bool isDone() const { return error_ != nullptr; }

private:
  void indent();
  void element(std::string_view name, std::string_view content);
  void escapedElement(std::string_view name, std::string_view content);
  void date(Date date);
  void data(const Data& bytes);
  void checkDepth();
  void fail(PropertyListError code, std::string problem);

  std::string text_;
  std::size_t depth_ = 0;
  LMRErrorRef error_;
};

std::string_view elementName(Collection kind) {
  return kind == Collection::Array ? "array" : "dict";
}

void Writer::leaf(const Value& value) {
  switch (value.type()) {
  case Value::Type::String:
    return escapedElement("string", *value.string());
  case Value::Type::Integer:
    return element("integer", std::to_string(*value.integer()));
  case Value::Type::UnsignedInteger:
    return element("integer", std::to_string(*value.unsignedInteger()));
  case Value::Type::Real:
    return element("real", value_text::realText(*value.real()));
  case Value::Type::Boolean:
    indent();
    text_ += *value.boolean() ? "<true/>\n" : "<false/>\n";
    return;
  case Value::Type::Date:
    return date(*value.date());
  default:
    return data(*value.data());
  }
}

void Writer::key(const std::string& key) {
  escapedElement("key", key);
}

void Writer::emptyCollection(Collection kind) {
  checkDepth();
  indent();
  text_.append("<").append(elementName(kind)).append("/>\n");
}

void Writer::open(Collection kind) {
  checkDepth();
  indent();
  text_.append("<").append(elementName(kind)).append(">\n");
  ++depth_;
}

void Writer::close(Collection kind) {
  --depth_;
  indent();
  text_.append("</").append(elementName(kind)).append(">\n");
}

// Deep nesting is not indented further: the tabs would grow with the square of the depth.
void Writer::indent() {
  constexpr std::size_t most = 32;
  text_.append(std::min(depth_, most), '\t');
}

void Writer::element(std::string_view name, std::string_view content) {
  indent();
  text_.append("<").append(name).append(">").append(content);
  text_.append("</").append(name).append(">\n");
}

void Writer::escapedElement(std::string_view name, std::string_view content) {
  indent();
  text_.append("<").append(name).append(">");
  if (const auto bad = xml_text::appendEscaped(text_, content)) {
    fail(PropertyListError::Unrepresentable, *bad);
  }
  text_.append("</").append(name).append(">\n");
}

void Writer::date(Date date) {
  if (const auto text = value_text::dateText(date, "T", "Z")) {
    element("date", *text);
  } else {
    fail(PropertyListError::Unrepresentable, "a date outside the years 0001 to 9999");
  }
}

void Writer::data(const Data& bytes) {
  constexpr std::size_t bytesInLine = std::size_t{76} / 4 * 3;
  indent();
  text_ += "<data>\n";
  for (std::size_t at = 0; at < bytes.size(); at += bytesInLine) {
    indent();
    value_text::appendBase64(text_, bytes.data() + at, std::min(bytesInLine, bytes.size() - at));
    text_ += '\n';
  }
  indent();
  text_ += "</data>\n";
}

void Writer::checkDepth() {
  if (depth_ == propertyListDepthLimit) {
    fail(PropertyListError::TooDeep, format("nested deeper than %@ levels", {text(propertyListDepthLimit)}));
  }
}

void Writer::fail(PropertyListError code, std::string problem) {
  error_ = LMRError::make(PropertyListErrorDomain, static_cast<std::int64_t>(code), std::move(problem));
}

} // namespace

std::optional<std::string> xmlDescription(const Value& value, LMRErrorRef* error) {
  return Writer().write(value, error);
}

std::optional<std::string> xmlDescription(const Array& array, LMRErrorRef* error) {
  return Writer().write(array, error);
}

std::optional<std::string> xmlDescription(const Dictionary& dictionary, LMRErrorRef* error) {
  return Writer().write(dictionary, error);
}

} // namespace lumora
