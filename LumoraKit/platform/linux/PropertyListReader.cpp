#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/platform/PropertyListBuilder.h>

#include <expat.h>

#include <algorithm>
#include <memory>
#include <utility>

namespace lumora {
namespace {

// Expat finds elements and texts, refuses what is not well-formed and knows the place; the builder does the rest.
class Reader {
public:
  explicit Reader(bool dictionaryOnly);

  std::optional<Value> read(std::string_view text, LMRErrorRef* error);

private:
  struct Free {
    void operator()(XML_Parser parser) const { XML_ParserFree(parser); }
  };

  static void XMLCALL onStart(void* reader, const XML_Char* name, const XML_Char** attributes);
  static void XMLCALL onEnd(void* reader, const XML_Char* name);
  static void XMLCALL onText(void* reader, const XML_Char* text, int length);
  static void XMLCALL onEntityDeclaration(void* reader, const XML_Char* name, int isParameter, const XML_Char* value,
                                          int length, const XML_Char* base, const XML_Char* systemId,
                                          const XML_Char* publicId, const XML_Char* notation);
  static void XMLCALL onSkippedEntity(void* reader, const XML_Char* name, int isParameter);

  bool feed(std::string_view text);
  void check(bool well);
  void fail(PropertyListError code, const std::string& problem);

  std::unique_ptr<XML_ParserStruct, Free> parser_;
  PropertyListBuilder builder_;
  LMRErrorRef error_;
};

Reader& readerAt(void* reader) {
  return *static_cast<Reader*>(reader);
}

Reader::Reader(bool dictionaryOnly) : parser_(XML_ParserCreate(nullptr)), builder_(dictionaryOnly) {
  XML_SetUserData(parser_.get(), this);
  XML_SetElementHandler(parser_.get(), &onStart, &onEnd);
  XML_SetCharacterDataHandler(parser_.get(), &onText);
  XML_SetEntityDeclHandler(parser_.get(), &onEntityDeclaration);
  XML_SetSkippedEntityHandler(parser_.get(), &onSkippedEntity);
  // Else a parameter entity would be passed over silently, with every declaration behind it.
  XML_SetParamEntityParsing(parser_.get(), XML_PARAM_ENTITY_PARSING_ALWAYS);
}

std::optional<Value> Reader::read(std::string_view text, LMRErrorRef* error) {
  const bool well = feed(text);
  if (!well && !error_) {
    fail(PropertyListError::NotWellFormed, XML_ErrorString(XML_GetErrorCode(parser_.get())));
  }
  if (error) {
    *error = error_;
  }
  return error_ ? std::nullopt : std::optional(builder_.take());
}

// In one piece when it fits Expat's int: it then parses in place, without a copy.
bool Reader::feed(std::string_view text) {
  constexpr std::size_t most = std::size_t{1} << 28;
  bool well = true;
  do {
    const std::string_view piece = text.substr(0, most);
    text.remove_prefix(piece.size());
    well = XML_Parse(parser_.get(), piece.data(), static_cast<int>(piece.size()), text.empty()) == XML_STATUS_OK;
  } while (well && !text.empty());
  return well;
}

// Expat may call once more after it was stopped.
void XMLCALL Reader::onStart(void* reader, const XML_Char* name, const XML_Char** attributes) {
  Reader& self = readerAt(reader);
  self.check(self.error_ || self.builder_.startElement(name, attributes));
}

void XMLCALL Reader::onEnd(void* reader, const XML_Char*) {
  Reader& self = readerAt(reader);
  self.check(self.error_ || self.builder_.endElement());
}

void XMLCALL Reader::onText(void* reader, const XML_Char* text, int length) {
  Reader& self = readerAt(reader);
  self.check(self.error_ || self.builder_.characters({text, static_cast<std::size_t>(length)}));
}

void XMLCALL Reader::onEntityDeclaration(void* reader, const XML_Char* name, int, const XML_Char*, int, const XML_Char*,
                                         const XML_Char*, const XML_Char*, const XML_Char*) {
  readerAt(reader).fail(PropertyListError::NotWellFormed, format("the entity \"%@\" is declared", {text(name)}));
}

// Reached only with a document type declaration that points elsewhere: what it declares is never fetched.
void XMLCALL Reader::onSkippedEntity(void* reader, const XML_Char* name, int) {
  readerAt(reader).fail(PropertyListError::NotWellFormed, format("the entity \"%@\" is not known", {text(name)}));
}

void Reader::check(bool well) {
  if (!well) {
    fail(builder_.problem().code, builder_.problem().text);
  }
}

void Reader::fail(PropertyListError code, const std::string& problem) {
  if (error_) {
    return;
  }
  const std::uint64_t line = XML_GetCurrentLineNumber(parser_.get());
  const std::uint64_t column = XML_GetCurrentColumnNumber(parser_.get()) + 1;
  const std::int64_t byte = XML_GetCurrentByteIndex(parser_.get());
  const std::string description =
      format("Line %u, column %u (byte %d): %@", {text(line), text(column), text(byte), problem});
  error_ = std::make_shared<LMRError>(
      std::string(PropertyListErrorDomain), static_cast<std::int64_t>(code),
      Dictionary{
          {std::string(LMRLocalizedDescriptionKey), description}, {"line", line}, {"column", column}, {"byte", byte}});
  XML_StopParser(parser_.get(), XML_FALSE);
}

} // namespace

std::optional<Value> valueWithXMLDescription(std::string_view text, LMRErrorRef* error) {
  return Reader(false).read(text, error);
}

std::optional<Dictionary> dictionaryWithXMLDescription(std::string_view text) {
  return dictionaryWithXMLDescription_error(text, nullptr);
}

std::optional<Dictionary> dictionaryWithXMLDescription_error(std::string_view text, LMRErrorRef* error) {
  std::optional<Value> value = Reader(true).read(text, error);
  return value ? std::optional(std::move(*value->dictionary())) : std::nullopt;
}

} // namespace lumora
